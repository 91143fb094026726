// What happens when memory runs out, at each request in turn.

#include <ZT/image_sgi.h>

#include <cstdlib>
#include <filesystem>

#include <gtest/gtest.h>

#include "image/fant.h"
#include "image/literal_codec.h"
#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "image/zoom.h"
#include "support/FailingMalloc.h"
#include "support/TempDir.h"

namespace {

TEST(image_memory, ASgiImageIsNullOrWhole)
{
    TempDir directory;
    std::string irregular =
        SgiFile({}, {.rows = EqualRows({}, Bytes({0x02, 0x07, 0x00}))});
    for (const std::string& file :
         {SgiFile({}, {.rows = PlainRows({})}), irregular,
          SgiHeaderBytes({.storage = 0}) + Fill(48, 0x22)}) {
        std::string path = directory.Write("a", file);
        PixelList expected = literal::ReadSgi(file).pixels;
        ZtPixel* pixels = nullptr;
        int nulls = 0;

        int failed = WithEveryRequestFailing(
            [&] { pixels = longimagedata(path.c_str()); },
            [&] {
                nulls += !pixels;
                EXPECT_TRUE(!pixels || Taken(pixels, 16) == expected);
            });

        EXPECT_GE(failed, 3);
        EXPECT_GE(nulls, failed);
        EXPECT_EQ(Taken(pixels, 16), expected);
    }
}

TEST(image_memory, AFileThatCannotBeMadeIsNotTouched)
{
    TempDir directory;
    std::string path = directory.Path("a");
    PixelList picture(16, 0x12345678);
    int result = 0;

    int failed = WithEveryRequestFailing(
        [&] { result = longstoimage(picture.data(), 4, 4, 3, path.c_str()); },
        [&] {
            EXPECT_EQ(result, 0);
            EXPECT_FALSE(std::filesystem::exists(path));
        });

    EXPECT_EQ(failed, 3);
    EXPECT_EQ(result, 1);
}

TEST(image_memory, AVideoFrameIsNull)
{
    TempDir directory;
    std::string path = directory.Write("a", "");
    ZtPixel* pixels = nullptr;

    int failed = WithEveryRequestFailing(
        [&] { pixels = longimageyuvdata(path.c_str()); },
        [&] { EXPECT_EQ(pixels, nullptr); });

    EXPECT_EQ(failed, 1);
    EXPECT_TRUE(Taken(pixels, 720 * 486));
}

TEST(image_memory, APixFileIsNull)
{
    TempDir directory;
    std::string path = directory.Write("a", Big16(1) + Big16(1) + Big16(0) +
                                                Big16(0) + Big16(24));
    QuarnHeader header;
    ZtPixel* pixels = nullptr;

    int failed = WithEveryRequestFailing(
        [&] { pixels = ReadQuarnPix(path.c_str(), header); },
        [&] { EXPECT_EQ(pixels, nullptr); });

    EXPECT_EQ(failed, 2);
    EXPECT_EQ(Taken(pixels, 1), PixelList(1, 0));
}

TEST(image_memory, TheNearestPixelsAreNotTaken)
{
    PixelList picture = {1, 2, 3, 4};
    PixelList out(9, 7);
    bool done = false;

    int failed = WithEveryRequestFailing(
        [&] {
            done =
                zt_image::zoom_nearest(picture.data(), out.data(), 2, 2, 3, 3);
        },
        [&] {
            EXPECT_FALSE(done);
            EXPECT_EQ(out, PixelList(9, 7));
        });

    EXPECT_EQ(failed, 1);
    EXPECT_EQ(out, literal::Zoom(picture, 2, 2, 3, 3));
}

TEST(image_memory, ANarrowerMapOfColumnsNeedsNoMore)
{
    static zt_image::ColumnMap map; // Its memory is never released.
    map.columns(10, 5);
    const int* columns = nullptr;

    int failed =
        WithEveryRequestFailing([&] { columns = map.columns(11, 3); }, [] {});

    EXPECT_EQ(failed, 0);
    EXPECT_EQ(std::vector<int>(columns, columns + 3),
              (std::vector<int>{1, 5, 9}));
}

TEST(image_memory, AreasAreNotAveraged)
{
    PixelList picture = {1, 2, 3, 4};
    PixelList out(9, 7);
    bool done = false;

    int failed = WithEveryRequestFailing(
        [&] {
            done = zt_image::zoom_fant(picture.data(), 2, 2, out.data(), 3, 3);
        },
        [&] { EXPECT_FALSE(done); });

    EXPECT_GE(failed, 4);
    EXPECT_TRUE(done);
    EXPECT_EQ(out, literal::Fant(picture, 2, 2, 3, 3));
}

TEST(image_memory, ScalingLeavesThePictureAsItIs)
{
    PixelList pixels = {1, 2, 3, 4};
    for (auto scale : {&ZtImageSGI::Resize, &ZtImageSGI::ResizeBest}) {
        ZtImageSGI image(2, 2, NewPixels(pixels));

        // A width of its own, since the map of columns is kept.
        int failed =
            WithEveryRequestFailing([&] { (image.*scale)(5, 3); },
                                    [&] {
                                        EXPECT_EQ(image.width, 2);
                                        EXPECT_EQ(PixelsOf(image), pixels);
                                    });

        EXPECT_GE(failed, 2);
        EXPECT_EQ(image.width, 5);
        EXPECT_EQ(image.height, 3);
    }
}

TEST(image_memory, APictureThatCannotBeMadeIsEmpty)
{
    for (int width : {0, 3}) {
        bool empty = false;

        int failed = WithEveryRequestFailing(
            [&] {
                ZtImageSGI image(width, 2, nullptr);
                empty = !image.pixels && !image.width && !image.height;
            },
            [&] { EXPECT_TRUE(empty); });

        EXPECT_EQ(failed, 1);
        EXPECT_FALSE(empty);
    }
}

TEST(image_memory, ACopyIsEmptyAndAnAssignmentDoesNothing)
{
    ZtImageSGI image(2, 1, NewPixels({1, 2}));
    ZtImageSGI other(1, 1, NewPixels({7}));
    bool empty = false;

    WithEveryRequestFailing(
        [&] {
            ZtImageSGI copy(image);
            empty = !copy.pixels && !copy.width && !copy.height;
        },
        [&] { EXPECT_TRUE(empty); });
    WithEveryRequestFailing(
        [&] { other = image; },
        [&] { EXPECT_EQ(PixelsOf(other), PixelList(1, 7)); });

    EXPECT_FALSE(empty);
    EXPECT_EQ(PixelsOf(other), (PixelList{1, 2}));
}

TEST(image_memory, ALoadByNameIsEmptyAndThrowsNothing)
{
    TempDir directory;
    std::string path =
        directory.Write("a.rgb", SgiFile({}, {.rows = PlainRows({})}));
    std::size_t empty = 0;
    PixelList expected(16, 0x404142FF);

    int failed = WithEveryRequestFailing(
        [&] {
            ZtImageSGI image(path.c_str(), 3);
            empty += !image.pixels && !image.width && !image.height;
        },
        [] {});

    EXPECT_GE(failed, 4);
    EXPECT_GE(empty, static_cast<std::size_t>(failed));
    EXPECT_EQ(PixelsOf(ZtImageSGI(path.c_str(), 3)), expected);
}

} // namespace
