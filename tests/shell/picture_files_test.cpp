#include "pictures/picture_files.h"
#include "support/TempDir.h"

#include <csignal>
#include <filesystem>
#include <sys/resource.h>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

ZtImageSGI NoisePicture(int width, int height)
{
    ZtImageSGI image(width, height, nullptr);
    unsigned seed = 5;
    for (int i = 0; i < width * height; ++i)
        image.pixels[i] = seed = seed * 1664525U + 1013904223U;
    return image;
}

long FilesIn(const TempDir& dir)
{
    return std::distance(std::filesystem::directory_iterator(dir.Path("")),
                         std::filesystem::directory_iterator());
}

} // namespace

TEST(KindOf, KnowsTheFourWords)
{
    PictureKind kind = Auto;

    EXPECT_TRUE(KindOf("sgi", kind));
    EXPECT_EQ(kind, Sgi);
    EXPECT_TRUE(KindOf("yuv", kind));
    EXPECT_EQ(kind, Yuv);
    EXPECT_TRUE(KindOf("pix", kind));
    EXPECT_EQ(kind, Pix);
    EXPECT_TRUE(KindOf("auto", kind));
    EXPECT_EQ(kind, Auto);
    EXPECT_FALSE(KindOf("SGI", kind));
    EXPECT_FALSE(KindOf("", kind));
    EXPECT_EQ(kind, Auto);
}

TEST(StorePicture, IsLoadedBackWithoutItsAlpha)
{
    TempDir dir;
    ZtImageSGI image = NoisePicture(13, 7);

    EXPECT_EQ(StorePicture(image, dir.Path("a.rgb")), "");

    std::string why;
    std::shared_ptr<Picture> back = LoadPicture(dir.Path("a.rgb"), Auto, why);
    ASSERT_NE(back, nullptr) << why;
    ASSERT_EQ(back->image.width, 13);
    ASSERT_EQ(back->image.height, 7);
    for (int i = 0; i < 13 * 7; ++i)
        EXPECT_EQ(back->image.pixels[i], image.pixels[i] | 0xFF) << i;
    EXPECT_EQ(back->origin, dir.Path("a.rgb") + " (sgi)");
}

TEST(StorePicture, LeavesTheOlderFileWhenThereIsNoRoom)
{
    TempDir dir;
    dir.Write("a.rgb", "old");
    signal(SIGXFSZ, SIG_IGN);
    struct rlimit former = {};
    getrlimit(RLIMIT_FSIZE, &former);
    struct rlimit small = {600, former.rlim_max};
    setrlimit(RLIMIT_FSIZE, &small);

    std::string why = StorePicture(NoisePicture(40, 40), dir.Path("a.rgb"));

    setrlimit(RLIMIT_FSIZE, &former);
    EXPECT_EQ(why,
              "the file could not be written whole; is there room for it?");
    EXPECT_EQ(dir.Read("a.rgb"), "old");
    EXPECT_EQ(FilesIn(dir), 1);
}

TEST(StorePicture, RefusesSizesThatTheFormatDoesNotHave)
{
    TempDir dir;

    EXPECT_EQ(StorePicture(ZtImageSGI(65536, 1, nullptr), dir.Path("a.rgb")),
              "a stored picture is at most 65535 pixels wide and high");

    EXPECT_EQ(FilesIn(dir), 0);
}

TEST(StorePicture, StoresTheWidestPicture)
{
    TempDir dir;

    EXPECT_EQ(StorePicture(NoisePicture(65535, 1), dir.Path("a.rgb")), "");
}

TEST(LoadPicture, TellsWhyTheSystemRefuses)
{
    TempDir dir;
    std::string why;

    EXPECT_EQ(LoadPicture(dir.Path("none.rgb"), Sgi, why), nullptr);

    EXPECT_EQ(why, "No such file or directory");
}

TEST(LoadPicture, SurvivesARowThatIsLongerThanItsBound)
{
    TempDir dir;
    // One channel of two rows, out of order, the first with 255 bytes.
    std::string bytes = {'\x01', '\xDA', 1, 1, 0, 2, 0, 1, 0, 2, 0, 1};
    bytes.resize(512);
    bytes += std::string("\0\0\3\0\0\0\2\x10\0\0\0\xFF\0\0\0\3", 16);
    bytes.resize(1600);
    dir.Write("a.rgb", bytes);
    SurviveOverlongRows();
    std::string why;

    EXPECT_EQ(LoadPicture(dir.Path("a.rgb"), Sgi, why), nullptr);

    EXPECT_EQ(why, "a row is stored in more bytes than such a row can take");
    ZtSetOverlongRowHandler(nullptr);
}
