#include "image/sgi_header.h"

#include <ZT/image_sgi.h>

#include <gtest/gtest.h>

#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "support/TempDir.h"

namespace {

TEST(sgi_header, SizeIsReadFromAnImageFile)
{
    TempDir directory;
    std::string path = directory.Write(
        "a", SgiHeaderBytes({.width = 0x0123, .height = 0xFFFE}));
    int width = 0;
    int height = 0;

    int known = sizeofimage(path.c_str(), width, height);

    EXPECT_EQ(known, 1);
    EXPECT_EQ(width, 0x0123);
    EXPECT_EQ(height, 0xFFFE);
}

TEST(sgi_header, SizeIsReadThroughPointersToo)
{
    TempDir directory;
    std::string path = directory.Write("a", SgiHeaderBytes({.width = 7}));
    int width = 0;
    int height = 0;

    int known = sizeofimage(path.c_str(), &width, &height);

    EXPECT_EQ(known, 1);
    EXPECT_EQ(width, 7);
    EXPECT_EQ(height, 4);
}

TEST(sgi_header, AFileWithAnotherMagicNumberHasNoSize)
{
    TempDir directory;
    std::string path = directory.Write("a", SgiHeaderBytes({.magic = 0xDA01}));
    int width = -5;
    int height = -6;

    int known = sizeofimage(path.c_str(), width, height);

    EXPECT_EQ(known, 0);
    EXPECT_EQ(width, -5);
    EXPECT_EQ(height, -6);
}

TEST(sgi_header, AFileThatCannotBeOpenedHasNoSize)
{
    TempDir directory;
    int width = -5;
    int height = -6;

    int known = sizeofimage(directory.Path("none").c_str(), width, height);
    int known_of_null = sizeofimage(nullptr, width, height);

    EXPECT_EQ(known, 0);
    EXPECT_EQ(known_of_null, 0);
    EXPECT_EQ(width, -5);
    EXPECT_EQ(height, -6);
}

TEST(sgi_header, SizeIsGivenForAFileWhosePixelsAreRefused)
{
    TempDir directory;
    std::string path =
        directory.Write("a", SgiHeaderBytes({.bytes_a_channel = 2}));
    int width = 0;
    int height = 0;

    int known = sizeofimage(path.c_str(), width, height);

    EXPECT_EQ(known, 1);
    EXPECT_EQ(width, 4);
}

TEST(sgi_header, BytesThatAShortHeaderLacksAreZero)
{
    TempDir directory;
    std::string path = directory.Write("a", Bytes({0x01, 0xDA}));
    int width = -5;
    int height = -6;

    int known = sizeofimage(path.c_str(), width, height);

    EXPECT_EQ(known, 1);
    EXPECT_EQ(width, 0);
    EXPECT_EQ(height, 0);
}

TEST(sgi_header, AFileThatIsReadIsClosed)
{
    TempDir directory;
    std::string path =
        directory.Write("a", SgiFile({}, {.rows = PlainRows({})}));

    LoadSgi(path);

    EXPECT_FALSE(IsOpen(path));
}

TEST(sgi_header, ARefusedFileStaysOpen)
{
    TempDir directory;
    std::string first = directory.Write("a", "no picture");
    std::string second =
        directory.Write("b", SgiHeaderBytes({.bytes_a_channel = 2}));
    std::string third = directory.Write("c", "");
    int width = 0;
    int height = 0;

    sizeofimage(first.c_str(), width, height);
    EXPECT_TRUE(IsOpen(first));

    longimagedata(second.c_str());
    EXPECT_FALSE(IsOpen(first));
    EXPECT_TRUE(IsOpen(second));

    longimagedata(third.c_str());
    EXPECT_FALSE(IsOpen(second));
    EXPECT_TRUE(IsOpen(third));
}

TEST(sgi_header, AFileRefusedForItsChannelsIsClosed)
{
    TempDir directory;
    std::string path = directory.Write("a", SgiHeaderBytes({.channels = 5}));

    longimagedata(path.c_str());

    EXPECT_FALSE(IsOpen(path));
}

TEST(sgi_header, RowBoundIsOneAndATwentiethOfTheWidthAndTenMore)
{
    for (int width = 0; width <= 65535; ++width)
        ASSERT_EQ(zt_image::row_bound(static_cast<std::size_t>(width)),
                  static_cast<std::size_t>(static_cast<int>(1.05 * width + 10)))
            << width;
}

int overlong_rows = 0;

void CountOverlongRow()
{
    ++overlong_rows;
}

TEST(sgi_header, AnOverlongRowEndsTheProcessUnlessAHandlerIsInstalled)
{
    EXPECT_EXIT(zt_image::overlong_row(), testing::ExitedWithCode(1), "^$");

    EXPECT_EQ(ZtSetOverlongRowHandler(CountOverlongRow), nullptr);
    zt_image::overlong_row();
    EXPECT_EQ(overlong_rows, 1);

    EXPECT_EQ(ZtSetOverlongRowHandler(nullptr), &CountOverlongRow);
    EXPECT_EXIT(zt_image::overlong_row(), testing::ExitedWithCode(1), "^$");
}

} // namespace
