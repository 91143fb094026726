#include "common/png_file.h"

#include <algorithm>
#include <csignal>
#include <filesystem>
#include <initializer_list>
#include <sys/resource.h>

#include <gtest/gtest.h>

#include "common/png_reading.h"
#include "support/TempDir.h"

using zt_tools::WritePng;

namespace {

/// A picture of the pixels as they stand in memory, bottom row first.
ZtImageSGI PictureOf(int width, int height,
                     std::initializer_list<ZtPixel> pixels)
{
    ZtImageSGI image(width, height, nullptr);
    std::copy(pixels.begin(), pixels.end(), image.pixels);
    return image;
}

} // namespace

TEST(WritePng, WritesTheTopRowFirstAndRedInTheFirstByte)
{
    TempDir dir;
    ZtImageSGI image =
        PictureOf(2, 2, {0x010203FF, 0x040506FF, 0xF0E0D0FF, 0x102030FF});

    EXPECT_EQ(WritePng(image, dir.Path("a.png")), "");

    ReadPicture read = ReadPng(dir.Path("a.png"));
    EXPECT_EQ(read.width, 2);
    EXPECT_EQ(read.height, 2);
    EXPECT_EQ(read.pixels,
              (std::vector<std::uint32_t>{0xF0E0D0FF, 0x102030FF, 0x010203FF,
                                          0x040506FF}));
}

TEST(WritePng, LeavesAlphaOutOfAnOpaquePicture)
{
    TempDir dir;

    WritePng(PictureOf(1, 1, {0x010203FF}), dir.Path("a.png"));

    EXPECT_FALSE(ReadPng(dir.Path("a.png")).has_alpha);
}

TEST(WritePng, KeepsAlphaAndTheColoursUnderIt)
{
    TempDir dir;

    WritePng(PictureOf(2, 1, {0x01020380, 0xFFFFFF00}), dir.Path("a.png"));

    ReadPicture read = ReadPng(dir.Path("a.png"));
    EXPECT_TRUE(read.has_alpha);
    EXPECT_EQ(read.pixels,
              (std::vector<std::uint32_t>{0x01020380, 0xFFFFFF00}));
}

TEST(WritePng, RefusesAPictureWithoutPixels)
{
    TempDir dir;

    EXPECT_EQ(WritePng(ZtImageSGI(0, 0, nullptr), dir.Path("a.png")),
              "the picture has no pixels");

    EXPECT_FALSE(std::filesystem::exists(dir.Path("a.png")));
}

TEST(WritePng, ReplacesThePictureThatALinkPointsTo)
{
    TempDir dir;
    std::string real = dir.Write("real.png", "old");
    std::filesystem::create_symlink(real, dir.Path("link.png"));

    EXPECT_EQ(WritePng(PictureOf(1, 1, {0x0A0B0CFF}), dir.Path("link.png")),
              "");

    EXPECT_TRUE(std::filesystem::is_symlink(dir.Path("link.png")));
    EXPECT_EQ(ReadPng(real).At(0, 0), 0x0A0B0CFFu);
}

TEST(WritePng, KeepsThePermissionsOfTheFileItReplaces)
{
    TempDir dir;
    std::string name = dir.Write("a.png", "old");
    std::filesystem::permissions(name, std::filesystem::perms(0640));

    EXPECT_EQ(WritePng(PictureOf(1, 1, {0x0A0B0CFF}), name), "");

    EXPECT_EQ(std::filesystem::status(name).permissions(),
              std::filesystem::perms(0640));
}

TEST(WritePng, LeavesTheOlderFileWhenThereIsNoRoom)
{
    TempDir dir;
    std::string name = dir.Write("a.png", "old");
    ZtImageSGI image(200, 200, nullptr);
    unsigned seed = 1;
    for (int i = 0; i < 200 * 200; ++i) // noise, which does not compress
        image.pixels[i] = (seed = seed * 1664525U + 1013904223U) | 0xFF;
    signal(SIGXFSZ, SIG_IGN);
    struct rlimit former = {};
    getrlimit(RLIMIT_FSIZE, &former);
    struct rlimit small = {600, former.rlim_max};
    setrlimit(RLIMIT_FSIZE, &small);

    std::string why = WritePng(image, name);

    setrlimit(RLIMIT_FSIZE, &former);
    EXPECT_NE(why, "");
    EXPECT_EQ(dir.Read("a.png"), "old");
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(dir.Path("")),
                            std::filesystem::directory_iterator()),
              1);
}
