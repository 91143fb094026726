#include "frame_file.h"

#include "frame_layout.h"

#include <csignal>
#include <filesystem>
#include <random>
#include <sys/resource.h>

#include <ZT/image_sgi.h>
#include <gtest/gtest.h>

#include "common/png_reading.h"
#include "support/TempDir.h"

using framestore::FrameFile;
using framestore::Storage;

namespace {

std::string RandomFrame()
{
    std::mt19937 random(486);
    std::string frame(framestore::frame_bytes, '\0');
    for (char& byte : frame)
        byte = static_cast<char>(random());
    return frame;
}

/// The lines of a frame, the picture's first line first.
std::string InOrder(const std::string& frame)
{
    std::string lines;
    for (std::size_t line = 0; line < 486; ++line)
        lines += frame.substr(
            (line % 2 == 0 ? 243 + line / 2 : line / 2) * 1440, 1440);
    return lines;
}

class FrameFileTest : public testing::Test
{
protected:
    FrameFileTest() { storage.directory = directory.Path("."); }

    /// Writes the frame in three pieces.
    std::string Write(int number)
    {
        FrameFile file(storage, number);
        file.Write(frame.data(), 1000);
        file.Write(frame.data() + 1000, 1);
        file.Write(frame.data() + 1001, frame.size() - 1001);
        return file.Finish();
    }

    std::ptrdiff_t Files() const
    {
        std::filesystem::directory_iterator files(directory.Path("."));
        return std::distance(begin(files), end(files));
    }

    TempDir directory;
    Storage storage;
    const std::string frame = RandomFrame();
};

TEST(StoredLine, LinesOfTheTwoFieldsTakeTurns)
{
    EXPECT_EQ(framestore::StoredLine(0), 243);
    EXPECT_EQ(framestore::StoredLine(1), 0);
    EXPECT_EQ(framestore::StoredLine(2), 244);
    EXPECT_EQ(framestore::StoredLine(484), 485);
    EXPECT_EQ(framestore::StoredLine(485), 242);
}

TEST_F(FrameFileTest, AFrameIsWrittenAsItComes)
{
    EXPECT_EQ(Write(7), "");

    EXPECT_TRUE(directory.Read("frame.000007.yuv") == frame);
    EXPECT_EQ(Files(), 1);
}

TEST_F(FrameFileTest, NamesHaveTheNumberInSixDigitsOrMore)
{
    for (auto [number, name] : {std::pair{0, "frame.000000.yuv"},
                                {999999, "frame.999999.yuv"},
                                {2147483647, "frame.2147483647.yuv"},
                                {-1, "frame.-000001.yuv"},
                                {-2147483647 - 1, "frame.-2147483648.yuv"}})
        EXPECT_EQ(FrameFile(storage, number).Name(),
                  storage.directory + "/" + name);
}

TEST_F(FrameFileTest, AnOlderFrameIsReplaced)
{
    directory.Write("frame.000007.yuv", "old");

    EXPECT_EQ(Write(7), "");

    EXPECT_TRUE(directory.Read("frame.000007.yuv") == frame);
}

TEST_F(FrameFileTest, AFrameThatIsNotFinishedLeavesNothing)
{
    {
        FrameFile file(storage, 7);
        file.Write(frame.data(), 1000);
        EXPECT_EQ(Files(), 1);
    }
    EXPECT_EQ(Files(), 0);
}

TEST_F(FrameFileTest, LinesCanBePutInOrder)
{
    storage.interleaved = true;

    EXPECT_EQ(Write(7), "");

    EXPECT_TRUE(directory.Read("frame.000007.yuv") == InOrder(frame));
}

TEST_F(FrameFileTest, APictureHasTheLinesInOrderAndIsOpaque)
{
    storage.png = true;
    EXPECT_EQ(Write(7), "");
    directory.Write("ordered.yuv", InOrder(frame));
    const ZtImageSGI expected(directory.Path("ordered.yuv").c_str(), 1);

    ReadPicture picture = ReadPng(directory.Path("frame.000007.png"));

    ASSERT_EQ(picture.width, 720);
    ASSERT_EQ(picture.height, 486);
    EXPECT_FALSE(picture.has_alpha);
    for (std::size_t line = 0; line < 486; ++line)
        for (std::size_t i = 0; i < 720; ++i)
            ASSERT_EQ(picture.pixels[line * 720 + i] | 0xFF,
                      expected.pixels[(485 - line) * 720 + i] | 0xFF)
                << line << " " << i;
    EXPECT_TRUE(directory.Read("frame.000007.yuv") == frame);
}

TEST_F(FrameFileTest, ThePictureIsTheSameWhateverTheOrderOfTheFile)
{
    storage.png = true;
    EXPECT_EQ(Write(7), "");
    storage.interleaved = true;

    EXPECT_EQ(Write(8), "");

    EXPECT_TRUE(directory.Read("frame.000007.png") ==
                directory.Read("frame.000008.png"));
}

TEST_F(FrameFileTest, WhatStandsInThePlaceMustBeAFile)
{
    std::filesystem::create_directory(directory.Path("frame.000007.yuv"));

    EXPECT_EQ(Write(7), "it is a directory");

    EXPECT_EQ(Files(), 1);
}

TEST_F(FrameFileTest, WithoutThePictureThereIsNoFrame)
{
    storage.png = true;
    std::filesystem::create_directory(directory.Path("frame.000007.png"));

    EXPECT_EQ(Write(7),
              storage.directory + "/frame.000007.png: it is a directory");

    EXPECT_EQ(Files(), 1);
}

TEST_F(FrameFileTest, AMissingDirectoryIsAFault)
{
    storage.directory = directory.Path("none");

    EXPECT_EQ(Write(7), "its directory: No such file or directory");
}

TEST_F(FrameFileTest, ADiskWithoutRoomKeepsTheOlderFrame)
{
    directory.Write("frame.000007.yuv", "old");
    std::signal(SIGXFSZ, SIG_IGN);
    struct rlimit former = {};
    getrlimit(RLIMIT_FSIZE, &former);
    for (rlim_t room : {0ul, 1000ul, 699839ul}) {
        struct rlimit small = {room, former.rlim_max};
        setrlimit(RLIMIT_FSIZE, &small);
        std::string why = Write(7);
        setrlimit(RLIMIT_FSIZE, &former);

        EXPECT_EQ(why, "File too large") << room;
        EXPECT_EQ(directory.Read("frame.000007.yuv"), "old");
        EXPECT_EQ(Files(), 1);
    }
}

} // namespace
