#include "image/picture.h"

#include <cstdint>
#include <cstdlib>

#include <gtest/gtest.h>

#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "support/TempDir.h"

namespace {

/// Sets ZT_MAX_PIXELS while it lives.
class PixelLimit
{
public:
    explicit PixelLimit(const char* limit)
    {
        setenv("ZT_MAX_PIXELS", limit, 1);
    }
    ~PixelLimit() { unsetenv("ZT_MAX_PIXELS"); }
    PixelLimit(const PixelLimit&) = delete;
    PixelLimit& operator=(const PixelLimit&) = delete;
};

TEST(picture, TheLimitIsTwoToThe28Pixels)
{
    EXPECT_TRUE(zt_image::within_pixel_limit(1 << 14, 1 << 14));
    EXPECT_FALSE(zt_image::within_pixel_limit((1 << 14) + 1, 1 << 14));
    EXPECT_TRUE(zt_image::within_pixel_limit(65535, 4096));
    EXPECT_FALSE(zt_image::within_pixel_limit(65535, 4097));
    EXPECT_TRUE(zt_image::within_pixel_limit(65535, 0));
    EXPECT_TRUE(zt_image::within_pixel_limit(0, 65535));
}

TEST(picture, TheLimitCanBeLoweredAndRaised)
{
    {
        PixelLimit limit("12");
        EXPECT_TRUE(zt_image::within_pixel_limit(4, 3));
        EXPECT_FALSE(zt_image::within_pixel_limit(13, 1));
    }
    PixelLimit limit("4294836225");
    EXPECT_TRUE(zt_image::within_pixel_limit(65535, 65535));
}

TEST(picture, ALimitThatIsNoNumberIsTheUsualOne)
{
    for (const char* text : {"", "many", "-1", "12k", " 12"}) {
        PixelLimit limit(text);
        EXPECT_TRUE(zt_image::within_pixel_limit(1 << 14, 1 << 14)) << text;
        EXPECT_FALSE(zt_image::within_pixel_limit(1 << 14, (1 << 14) + 1))
            << text;
    }
}

TEST(picture, TheLimitHoldsForEveryReader)
{
    TempDir directory;
    std::string sgi =
        directory.Write("sgi", SgiFile({}, {.rows = PlainRows({})}));
    std::string pix = directory.Write("pix", Big16(4) + Big16(4) + Big16(0) +
                                                 Big16(0) + Big16(24));
    std::string yuv = directory.Write("yuv", "");
    QuarnHeader header;
    {
        PixelLimit limit("15");
        EXPECT_EQ(longimagedata(sgi.c_str()), nullptr);
        EXPECT_EQ(ReadQuarnPix(pix.c_str(), header), nullptr);
        EXPECT_EQ(longimageyuvdata(yuv.c_str()), nullptr);
    }
    {
        PixelLimit limit("16");
        EXPECT_TRUE(Taken(longimagedata(sgi.c_str()), 16));
        EXPECT_TRUE(Taken(ReadQuarnPix(pix.c_str(), header), 16));
    }
    PixelLimit limit("349920");
    EXPECT_TRUE(Taken(longimageyuvdata(yuv.c_str()), 720 * 486));
}

TEST(picture, PixelsThatCannotBeCountedAreNotMade)
{
    constexpr std::size_t half = SIZE_MAX / 2;

    EXPECT_EQ(zt_image::new_pixels(half, half), nullptr);
    EXPECT_EQ(zt_image::new_pixels(half / 4 + 1, 1), nullptr);
    EXPECT_EQ(zt_image::new_pixels(half / 4, 1, 20), nullptr);
    EXPECT_EQ(zt_image::new_zeroed_pixels(half, 3), nullptr);
}

TEST(picture, NoPixelsAreNotNull)
{
    EXPECT_EQ(Taken(zt_image::new_pixels(0, 5), 0), PixelList());
    EXPECT_EQ(Taken(zt_image::new_zeroed_pixels(5, 0), 0), PixelList());
}

TEST(picture, ZeroedPixelsAreZero)
{
    EXPECT_EQ(Taken(zt_image::new_zeroed_pixels(5, 3), 15), PixelList(15, 0));
}

TEST(picture, ChannelsStandWhereTheirOrderSays)
{
    using zt_image::ChannelOrder;

    EXPECT_EQ(zt_image::make_pixel(ChannelOrder::Codec, 1, 2, 3, 4),
              0x04030201u);
    EXPECT_EQ(zt_image::make_pixel(ChannelOrder::Object, 1, 2, 3, 4),
              0x01020304u);
}

} // namespace
