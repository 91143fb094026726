#include "image/zoom.h"

#include <climits>

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"

namespace {

PixelList Zoomed(const PixelList& source, int ax, int ay, int bx, int by)
{
    PixelList out(static_cast<std::size_t>(bx) * static_cast<std::size_t>(by));
    fastzoom(source.data(), out.data(), ax, ay, bx, by);
    return out;
}

TEST(fastzoom, TheSameSizeIsTheSamePicture)
{
    PixelList picture = {1, 2, 3, 4, 5, 6};

    EXPECT_EQ(Zoomed(picture, 3, 2, 3, 2), picture);
}

TEST(fastzoom, TakesTheNearestPixel)
{
    PixelList picture = {1, 2, 3, 4};

    EXPECT_EQ(Zoomed(picture, 2, 2, 4, 4),
              (PixelList{1, 1, 2, 2, 1, 1, 2, 2, 3, 3, 4, 4, 3, 3, 4, 4}));
    EXPECT_EQ(Zoomed(picture, 4, 1, 2, 1), (PixelList{2, 4}));
    EXPECT_EQ(Zoomed(picture, 4, 1, 1, 1), (PixelList{3}));
    EXPECT_EQ(Zoomed(picture, 1, 4, 1, 3), (PixelList{1, 3, 4}));
}

TEST(fastzoom, WholeWordsAreCopied)
{
    EXPECT_EQ(Zoomed({0x89ABCDEF}, 1, 1, 2, 1),
              (PixelList{0x89ABCDEF, 0x89ABCDEF}));
}

TEST(fastzoom, ASizeBelowOneDoesNothing)
{
    PixelList out = {7, 7};
    const ZtPixel pixel = 1;

    fastzoom(&pixel, out.data(), 0, 1, 1, 1);
    fastzoom(&pixel, out.data(), 1, 0, 1, 1);
    fastzoom(&pixel, out.data(), 1, 1, 0, 1);
    fastzoom(&pixel, out.data(), 1, 1, 1, -1);

    EXPECT_EQ(out, (PixelList{7, 7}));
}

TEST(fastzoom, RandomSizesAgreeWithAPlainZoom)
{
    std::mt19937 random(10);
    for (int i = 0; i < 1000; ++i) {
        auto size = [&random] { return static_cast<int>(random() % 60 + 1); };
        int ax = size();
        int ay = size();
        int bx = size();
        int by = size();
        PixelList picture = RandomPicture(random, ax, ay, Texture::Noise);

        ASSERT_EQ(Zoomed(picture, ax, ay, bx, by),
                  literal::Zoom(picture, ax, ay, bx, by))
            << ax << "x" << ay << " to " << bx << "x" << by;
    }
}

TEST(fastzoom, LargePicturesAgreeWithAPlainZoom)
{
    std::mt19937 random(11);
    PixelList picture = RandomPicture(random, 1000, 70, Texture::Noise);

    EXPECT_EQ(Zoomed(picture, 1000, 70, 2500, 33),
              literal::Zoom(picture, 1000, 70, 2500, 33));
    EXPECT_EQ(Zoomed(picture, 1000, 70, 777, 150),
              literal::Zoom(picture, 1000, 70, 777, 150));
}

TEST(zoom, TheLastPositionIsNeverPassed)
{
    EXPECT_EQ(zt_image::nearest_position(65535, 16777217, 16777216), 65534);
    EXPECT_EQ(zt_image::nearest_position(1, 16777217, 16777216), 0);
    EXPECT_EQ(zt_image::nearest_position(16777217, 1 << 25, (1 << 25) - 1),
              16777216);
    EXPECT_EQ(zt_image::nearest_position(INT_MAX, INT_MAX, INT_MAX - 1),
              INT_MAX - 1);
    EXPECT_EQ(zt_image::nearest_position(1, 1, 0), 0);
}

TEST(zoom, EnormousWidthsStayInTheSource)
{
    PixelList picture(65535);
    for (std::size_t i = 0; i < picture.size(); ++i)
        picture[i] = static_cast<ZtPixel>(i + 1);

    PixelList wide = Zoomed(picture, 65535, 1, 16777217, 1);

    EXPECT_EQ(wide.front(), 1u);
    EXPECT_EQ(wide.back(), 65535u);
    EXPECT_EQ(Zoomed(wide, 16777217, 1, 1, 1), (PixelList{wide[16777217 / 2]}));
}

TEST(zoom, TheColumnMapSurvivesBetweenCallsOfEqualWidths)
{
    static zt_image::ColumnMap map; // Its memory is never released.

    const int* first = map.columns(10, 5);
    EXPECT_EQ(std::vector<int>(first, first + 5),
              (std::vector<int>{1, 3, 5, 7, 9}));
    map.columns(10, 5);
    EXPECT_EQ(map.times_built(), 1);

    map.columns(11, 5);
    EXPECT_EQ(map.times_built(), 2);
    const int* last = map.columns(11, 3);
    EXPECT_EQ(map.times_built(), 3);
    EXPECT_EQ(std::vector<int>(last, last + 3), (std::vector<int>{1, 5, 9}));
    map.columns(11, 4);
    EXPECT_EQ(map.times_built(), 4);
}

TEST(fastzoom, ChangingWidthsInTurnNeedsNoOrder)
{
    PixelList picture = {1, 2, 3, 4, 5, 6, 7, 8};
    for (int bx : {3, 8, 2, 8, 3, 16, 1, 3})
        for (int ax : {8, 4})
            ASSERT_EQ(Zoomed(picture, ax, 1, bx, 1),
                      literal::Zoom(picture, ax, 1, bx, 1));
}

} // namespace
