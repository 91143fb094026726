#include "image/picture.h"

#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "support/FaultyFiles.h"
#include "support/InAChild.h"
#include "support/TempDir.h"

namespace {

using zt_image::ChannelOrder;

/// Writes a picture and gives the file; empty when the writing fails.
std::string Written(const PixelList& pixels, int width, int height,
                    int channels)
{
    TempDir directory;
    if (!longstoimage(pixels.data(), width, height, channels,
                      directory.Path("a").c_str()))
        return "";
    return directory.Read("a");
}

TEST(sgi_writer, TheHeaderIsSpelledOut)
{
    std::string file = Written({0x44332211, 0x44332211}, 2, 1, 4);

    std::string header = Bytes({0x01, 0xDA, 1, 1, 0, 3, 0, 2,   0, 1, 0, 4,
                                0,    0,    0, 0, 0, 0, 0, 255, 0, 0, 0, 0}) +
                         "no name" + Fill(481, 0);
    EXPECT_EQ(file.substr(0, 512), header);
}

TEST(sgi_writer, TablesAndRowsFollowTheHeader)
{
    std::string file = Written({0x44332211, 0x55332211}, 1, 2, 4);

    // Eight rows of three bytes, row by row, behind tables of 64 bytes.
    std::string tables = Big32(576) + Big32(588) + Big32(579) + Big32(591) +
                         Big32(582) + Big32(594) + Big32(585) + Big32(597);
    for (int i = 0; i < 8; ++i)
        tables += Big32(3);
    std::string rows = Bytes({1, 0x11, 0, 1, 0x22, 0, 1, 0x33, 0, 1, 0x44, 0,
                              1, 0x11, 0, 1, 0x22, 0, 1, 0x33, 0, 1, 0x55, 0});
    EXPECT_EQ(file.substr(512), tables + rows);
}

TEST(sgi_writer, OneChannelIsTwoDimensionalAndHoldsLuminance)
{
    std::string file = Written({0x44332211}, 1, 1, 1);

    int luminance = (79 * 0x11 + 156 * 0x22 + 21 * 0x33) >> 8;
    EXPECT_EQ(file.substr(4, 8), Bytes({0, 2, 0, 1, 0, 1, 0, 1}));
    EXPECT_EQ(file.substr(520), Bytes({1, luminance, 0}));
}

TEST(sgi_writer, TwoChannelsAreRedAndGreen)
{
    std::string file = Written({0x44332211}, 1, 1, 2);

    EXPECT_EQ(file.substr(4, 8), Bytes({0, 3, 0, 1, 0, 1, 0, 2}));
    EXPECT_EQ(file.substr(528), Bytes({1, 0x11, 0, 1, 0x22, 0}));
}

TEST(sgi_writer, ObjectOrderGivesTheSameFile)
{
    TempDir directory;
    const ZtPixel object_pixel = 0x11223344;

    zt_image::write_sgi(&object_pixel, 1, 1, 4, directory.Path("a").c_str(),
                        ChannelOrder::Object);

    EXPECT_EQ(directory.Read("a"), Written({0x44332211}, 1, 1, 4));
}

TEST(sgi_writer, SizesAndChannelsOutOfRangeAreNotWritten)
{
    TempDir directory;
    std::string path = directory.Path("a");
    PixelList pixels(4);
    auto result = [&](int width, int height, int channels) {
        return longstoimage(pixels.data(), width, height, channels,
                            path.c_str());
    };

    EXPECT_EQ(result(0, 1, 3), 0);
    EXPECT_EQ(result(1, 0, 3), 0);
    EXPECT_EQ(result(-1, 1, 3), 0);
    EXPECT_EQ(result(65536, 1, 3), 0);
    EXPECT_EQ(result(1, 65536, 3), 0);
    EXPECT_EQ(result(1, 1, 0), 0);
    EXPECT_EQ(result(1, 1, 5), 0);
    EXPECT_EQ(longstoimage(nullptr, 1, 1, 3, path.c_str()), 0);
    EXPECT_EQ(longstoimage(pixels.data(), 1, 1, 3, nullptr), 0);
    EXPECT_FALSE(std::filesystem::exists(path));
}

TEST(sgi_writer, TheWidestAndTheHighestPicturesAreWritten)
{
    PixelList pixels(65535);
    for (std::size_t i = 0; i < pixels.size(); ++i)
        pixels[i] = static_cast<ZtPixel>(i * 0x010307);

    std::string wide = Written(pixels, 65535, 1, 3);
    std::string high = Written(pixels, 1, 65535, 3);

    EXPECT_EQ(wide, literal::WriteSgi(pixels, 65535, 1, 3));
    EXPECT_EQ(high, literal::WriteSgi(pixels, 1, 65535, 3));
}

TEST(sgi_writer, RandomPicturesAgreeWithAPlainWriter)
{
    std::mt19937 random(6);
    for (int i = 0; i < 300; ++i) {
        int width = static_cast<int>(random() % 200 + 1);
        int height = static_cast<int>(random() % 8 + 1);
        int channels = i % 4 + 1;
        PixelList pixels =
            RandomPicture(random, width, height, TextureNumber(i / 4));

        ASSERT_EQ(Written(pixels, width, height, channels),
                  literal::WriteSgi(pixels, width, height, channels))
            << i;
    }
}

TEST(sgi_writer, PicturesLargerThanOneWriteAgreeWithAPlainWriter)
{
    std::mt19937 random(7);
    PixelList pixels = RandomPicture(random, 600, 400, Texture::Noise);

    EXPECT_EQ(Written(pixels, 600, 400, 4),
              literal::WriteSgi(pixels, 600, 400, 4));
}

TEST(sgi_writer, WhatIsWrittenIsReadBack)
{
    std::mt19937 random(8);
    TempDir directory;
    std::string path = directory.Path("a");
    for (int i = 0; i < 100; ++i) {
        int width = static_cast<int>(random() % 300 + 1);
        int height = static_cast<int>(random() % 9 + 1);
        PixelList pixels =
            RandomPicture(random, width, height, TextureNumber(i));

        ASSERT_EQ(longstoimage(pixels.data(), width, height, 4, path.c_str()),
                  1);

        ASSERT_EQ(LoadSgi(path), pixels) << i;
    }
}

TEST(sgi_writer, AFileThatIsThereIsReplaced)
{
    TempDir directory;
    std::string path = directory.Write("a", Fill(5000, 0x7F));
    const ZtPixel pixel = 0x44332211;

    EXPECT_EQ(longstoimage(&pixel, 1, 1, 4, path.c_str()), 1);

    EXPECT_EQ(directory.Read("a"), Written({pixel}, 1, 1, 4));
}

TEST(sgi_writer, ShortWritesAndInterruptionsGiveTheSameFile)
{
    PixelList pixels(60, 0x44332211);
    std::string expected = Written(pixels, 10, 6, 3);
    FaultyFiles files;
    files.most_at_once = 1;
    files.interrupts = true;

    EXPECT_EQ(Written(pixels, 10, 6, 3), expected);
}

TEST(sgi_writer, AWriteFaultAtAnyByteIsAFailure)
{
    TempDir directory;
    std::string path = directory.Path("a");
    PixelList pixels(6, 0x44332211);
    std::size_t size = Written(pixels, 3, 2, 3).size();
    ASSERT_EQ(size % 3, 2u);
    for (int error : {ENOSPC, EDQUOT, EFBIG})
        for (std::size_t left = 0; left <= size; left += 3) {
            FaultyFiles files;
            files.bytes_left = left;
            files.write_error = error;

            int result = longstoimage(pixels.data(), 3, 2, 3, path.c_str());

            ASSERT_EQ(result, 0) << left;
            ASSERT_EQ(files.open_count, 0);
        }
}

TEST(sgi_writer, NothingMoreIsWrittenAfterAFault)
{
    TempDir directory;
    std::mt19937 random(9);
    PixelList pixels = RandomPicture(random, 600, 600, Texture::Noise);
    FaultyFiles files;
    files.bytes_left = 0;

    longstoimage(pixels.data(), 600, 600, 3, directory.Path("a").c_str());

    EXPECT_EQ(files.writes, 0);
    EXPECT_EQ(directory.Read("a"), "");
}

TEST(sgi_writer, AFailingCloseIsAFailure)
{
    TempDir directory;
    const ZtPixel pixel = 0;
    FaultyFiles files;
    files.close_fails = true;

    EXPECT_EQ(longstoimage(&pixel, 1, 1, 3, directory.Path("a").c_str()), 0);
    EXPECT_EQ(files.open_count, 0);
}

TEST(sgi_writer, AFullDeviceIsAFailure)
{
    const ZtPixel pixel = 0;

    EXPECT_EQ(longstoimage(&pixel, 1, 1, 3, "/dev/full"), 0);
}

TEST(sgi_writer, APlaceThatCannotBeWrittenIsAFailure)
{
    TempDir directory;
    const ZtPixel pixel = 0;

    EXPECT_EQ(longstoimage(&pixel, 1, 1, 3, directory.Path("").c_str()), 0);
    EXPECT_EQ(longstoimage(&pixel, 1, 1, 3, directory.Path("x/y").c_str()), 0);
}

TEST(sgi_writer, ALimitOnFilesIsAFailureAndNoSignalInAChild)
{
    TempDir directory;
    std::string path = directory.Path("a");
    RunInAChild([&] {
        rlimit short_files = {600, 600};
        setrlimit(RLIMIT_FSIZE, &short_files);
        PixelList pixels(400, 0x12345678);

        EXPECT_EQ(longstoimage(pixels.data(), 20, 20, 3, path.c_str()), 0);

        sigset_t pending;
        sigpending(&pending);
        EXPECT_FALSE(sigismember(&pending, SIGXFSZ));
        sigset_t blocked;
        sigprocmask(SIG_BLOCK, nullptr, &blocked);
        EXPECT_FALSE(sigismember(&blocked, SIGXFSZ));
    });
}

TEST(sgi_writer, APipeIsAFailureAndNeverAWaitInAChild)
{
    TempDir directory;
    std::string path = directory.Path("fifo");
    ASSERT_EQ(mkfifo(path.c_str(), 0600), 0);
    RunInAChild([&] {
        const ZtPixel pixel = 0;

        EXPECT_EQ(longstoimage(&pixel, 1, 1, 3, path.c_str()), 0);

        int reader = open(path.c_str(), O_RDONLY | O_NONBLOCK);
        EXPECT_EQ(longstoimage(&pixel, 1, 1, 3, path.c_str()), 0);
        close(reader);
    });
}

TEST(sgi_writer, ThePicturesOfAReadOnlyDirectoryStayAsTheyAreInAChild)
{
    TempDir directory;
    std::filesystem::create_directory(directory.Path("d"));
    std::filesystem::permissions(directory.Path("d"),
                                 std::filesystem::perms::owner_read |
                                     std::filesystem::perms::owner_exec);
    std::filesystem::permissions(directory.Path(""),
                                 std::filesystem::perms::all);
    RunInAChild([&] {
        if (geteuid() == 0) { // Root may write anywhere.
            EXPECT_EQ(seteuid(65534), 0);
        }
        const ZtPixel pixel = 0;

        EXPECT_EQ(longstoimage(&pixel, 1, 1, 3, directory.Path("d/a").c_str()),
                  0);
    });
    std::filesystem::permissions(directory.Path("d"),
                                 std::filesystem::perms::owner_all);
}

} // namespace
