#include "image/frame_store.h"

#include <KVO/KvoPrefs.h>
#include <ZT/image_sgi.h>

#include <filesystem>
#include <fstream>
#include <functional>
#include <iostream>

#include <gtest/gtest.h>

#include "image/frame_message.h"
#include "image/pictures.h"
#include "support/CapturedStderr.h"
#include "support/FailingMalloc.h"
#include "support/FakeClock.h"
#include "support/FakeSockets.h"
#include "support/FaultyFiles.h"
#include "support/TempDir.h"
#include "support/ThrowingStderr.h"

namespace {

constexpr char host[] = "framehost";

PixelList Picture()
{
    std::mt19937 random(31);
    return RandomPicture(random, 648, 486, Texture::Noise);
}

/// A clock that calls a function after each sleep.
class WatchedClock : public FakeClock
{
public:
    void sleep_nanoseconds(std::uint64_t nanoseconds) override
    {
        FakeClock::sleep_nanoseconds(nanoseconds);
        sleeps.push_back(nanoseconds);
        after_sleep();
    }

    std::vector<std::uint64_t> sleeps;
    std::function<void()> after_sleep = [] {};
};

/// A frame store that exists in the test only, with a lock file of its own.
class FrameStore : public testing::Test
{
protected:
    FrameStore()
    {
        KvoPrefs::SetVariable(zt_image::frame_store_host, host);
        zt_image::use_frame_store_lock(lock.c_str());
        sockets.Expect(sizeof(zt_image::FrameMessage));
    }
    ~FrameStore() override { zt_image::use_frame_store_lock(nullptr); }

    /// Sends a picture and gives what was printed.
    std::string Send(ZtImageSGI& image, int number)
    {
        CapturedStderr errors;
        image.ToDDR(number);
        return errors.Text();
    }

    std::string Send(int number = 7)
    {
        ZtImageSGI image(648, 486, NewPixels(pixels));
        return Send(image, number);
    }

    const PixelList pixels = Picture();
    TempDir directory;
    const std::string lock = directory.Path("ddr_lock");
    WatchedClock clock;
    FakeSockets sockets;
};

const std::string started = "Writing to ddr frame 7\n";

TEST_F(FrameStore, AFrameGoesOutAndNothingIsSaidButItsNumber)
{
    EXPECT_EQ(Send(), started);

    EXPECT_EQ(sockets.asked_host, host);
    EXPECT_EQ(sockets.asked_port, 5333);
    EXPECT_TRUE(sockets.sent == MessageOf("workstation", 7, pixels));
    EXPECT_EQ(sockets.answered, 4u);
    EXPECT_EQ(sockets.closed, 1);
}

TEST_F(FrameStore, AnyNumberIsSentAndSaid)
{
    for (int number : {0, -1, 0x01020304, -2147483647 - 1, 2147483647}) {
        sockets.sent.clear();
        sockets.answered = 0;

        EXPECT_EQ(Send(number),
                  "Writing to ddr frame " + std::to_string(number) + "\n");

        EXPECT_EQ(sockets.sent.substr(0, 68),
                  MessageOf("workstation", number, pixels).substr(0, 68));
    }
}

TEST_F(FrameStore, APictureOf720By486IsRefusedAndNothingIsSent)
{
    ZtImageSGI image(720, 486, nullptr);

    EXPECT_EQ(Send(image, 7), started + "Image is wrong size ...\n");

    EXPECT_EQ(sockets.opened, 0);
}

TEST_F(FrameStore, PicturesOfOtherSizesAreRefused)
{
    for (auto [width, height] : {std::pair{648, 485},
                                 {648, 487},
                                 {647, 486},
                                 {649, 486},
                                 {486, 648},
                                 {0, 0},
                                 {-648, -486}}) {
        ZtImageSGI image(width, height, nullptr);

        EXPECT_EQ(Send(image, 7), started + "Image is wrong size ...\n");
    }
    EXPECT_EQ(sockets.opened, 0);
}

TEST_F(FrameStore, APictureWithoutPixelsIsRefused)
{
    ZtImageSGI image(0, 0, nullptr);
    std::free(image.pixels);
    image.pixels = nullptr;
    image.width = 648;
    image.height = 486;

    EXPECT_EQ(Send(image, 7), started + "Image is wrong size ...\n");
}

TEST_F(FrameStore, ThePictureIsNotChanged)
{
    ZtImageSGI image(648, 486, NewPixels(pixels));

    Send(image, 7);

    EXPECT_EQ(PixelsOf(image), pixels);
}

TEST_F(FrameStore, WaitsFiveSecondsAtATimeWhileTheLockFileExists)
{
    directory.Write("ddr_lock", "");
    clock.after_sleep = [this] {
        EXPECT_EQ(sockets.opened, 0);
        if (clock.sleeps.size() == 3)
            std::filesystem::remove(lock);
    };

    EXPECT_EQ(Send(), started + "Sleeping ...\nSleeping ...\nSleeping ...\n");

    EXPECT_EQ(clock.sleeps, (std::vector<std::uint64_t>(3, 5000000000)));
    EXPECT_EQ(sockets.sent.size(), 699908u);
}

TEST_F(FrameStore, ALockFileThatComesAfterTheFirstLookIsNotSeen)
{
    clock.after_sleep = [] { FAIL(); };

    EXPECT_EQ(Send(), started);
    directory.Write("ddr_lock", "");
    ZtImageSGI wrong(1, 1, nullptr);
    EXPECT_EQ(Send(wrong, 7), started + "Image is wrong size ...\n");
}

TEST_F(FrameStore, TheLockFileIsNeitherMadeNorRemoved)
{
    Send();
    EXPECT_FALSE(std::filesystem::exists(lock));

    directory.Write("ddr_lock", "somebody's");
    clock.after_sleep = [this] {
        EXPECT_EQ(directory.Read("ddr_lock"), "somebody's");
        std::filesystem::rename(lock, directory.Path("kept"));
    };
    Send();
    EXPECT_EQ(directory.Read("kept"), "somebody's");
}

TEST_F(FrameStore, ADirectoryIsALockFileToo)
{
    std::filesystem::create_directory(lock);
    clock.after_sleep = [this] { std::filesystem::remove(lock); };

    EXPECT_EQ(Send(), started + "Sleeping ...\n");
}

/// Notes which file is asked for.
class LookedFor : public FaultyFiles
{
public:
    bool accessible(const char* path, zt_platform::Access access) override
    {
        EXPECT_EQ(access, zt_platform::Access::Exists);
        paths.push_back(path);
        return false;
    }

    std::vector<std::string> paths;
};

TEST_F(FrameStore, TheLockFileIsAtItsPlaceUnlessATestMovesIt)
{
    zt_image::use_frame_store_lock(nullptr);
    LookedFor files;

    Send();

    EXPECT_EQ(files.paths, (std::vector<std::string>{"/ddr/ddr_lock"}));
}

TEST_F(FrameStore, NoSocketIsAFailure)
{
    sockets.opens_fail = true;

    EXPECT_EQ(Send(), started + "ERROR: Failed to open socket.\n");

    EXPECT_EQ(sockets.asked_host, "");
}

TEST_F(FrameStore, AnUnknownHostIsAFailure)
{
    sockets.host_is_known = false;

    EXPECT_EQ(Send(), started + "ERROR: Failed to get host information.\n");

    EXPECT_EQ(sockets.closed, 1);
    EXPECT_EQ(sockets.sent, "");
}

TEST_F(FrameStore, ARefusedConnectionIsAFailure)
{
    sockets.connects_fail = true;

    EXPECT_EQ(Send(), started + "ERROR: Failed to connect to server\n");

    EXPECT_EQ(sockets.closed, 1);
    EXPECT_EQ(sockets.sent, "");
}

const std::string write_error = "ERROR: QuickFrame write error.\n";

TEST_F(FrameStore, TheAnswerBadIsAFailure)
{
    sockets.answer = std::string("BAD\0", 4);

    EXPECT_EQ(Send(), started + write_error);

    EXPECT_EQ(sockets.closed, 1);
}

TEST_F(FrameStore, AnyOtherFourBytesAreSuccess)
{
    for (const std::string& answer :
         {std::string("OK\0\0", 4), std::string("BAD "), std::string("BADX"),
          std::string("BA\0D", 4), std::string("bad\0", 4),
          std::string(4, '\0'), std::string("\xFF\xFF\xFF\xFF")}) {
        sockets.answer = answer;
        sockets.answered = 0;

        EXPECT_EQ(Send(), started) << answer;
    }
}

TEST_F(FrameStore, NoMoreThanFourBytesAreRead)
{
    sockets.answer = std::string("OK\0\0BAD\0", 8);

    EXPECT_EQ(Send(), started);

    EXPECT_EQ(sockets.answered, 4u);
}

TEST_F(FrameStore, AnAnswerThatEndsTooSoonIsAFailure)
{
    for (const char* answer : {"", "O", "OK", "BAD"})
        for (bool fault : {false, true}) {
            sockets.answer = answer;
            sockets.answered = 0;
            sockets.receive_fails = fault;

            EXPECT_EQ(Send(), started + write_error) << answer;
        }
}

TEST_F(FrameStore, ShortAndInterruptedTransfersAreGoneOnWith)
{
    sockets.most_at_once = 1000;
    sockets.interrupts = true;
    EXPECT_EQ(Send(), started);
    EXPECT_TRUE(sockets.sent == MessageOf("workstation", 7, pixels));

    sockets.sent.clear();
    sockets.answered = 0;
    sockets.answer = std::string("BAD\0", 4);
    sockets.most_at_once = 1;
    EXPECT_EQ(Send(), started + write_error);
    EXPECT_TRUE(sockets.sent == MessageOf("workstation", 7, pixels));
}

// A server that has heard enough may answer and close.
TEST_F(FrameStore, TheAnswerCountsAlsoWhenNotAllCouldBeSent)
{
    for (std::size_t ends : {0ul, 64ul, 68ul, 100000ul}) {
        sockets.sent.clear();
        sockets.send_ends = ends;
        sockets.answered = 0;
        sockets.answer = std::string("OK\0\0", 4);
        EXPECT_EQ(Send(), started);

        sockets.sent.clear();
        sockets.answered = 0;
        sockets.answer = "";
        EXPECT_EQ(Send(), started + write_error);
        EXPECT_EQ(sockets.sent.size(), ends);
    }
}

TEST_F(FrameStore, TheNameOfThisMachineIsPaddedWithZeros)
{
    sockets.name = std::string(63, 'n');

    Send();

    EXPECT_EQ(sockets.sent.substr(0, 64),
              std::string(63, 'n') + std::string(1, '\0'));
}

TEST_F(FrameStore, EveryCallLooksTheHostUpAnew)
{
    Send();
    KvoPrefs::SetVariable(zt_image::frame_store_host, "another");
    sockets.answered = 0;

    Send();

    EXPECT_EQ(sockets.asked_host, "another");
    EXPECT_EQ(sockets.opened, 2);
    EXPECT_EQ(sockets.closed, 2);
}

TEST_F(FrameStore, NothingIsAllocated)
{
    ZtImageSGI image(648, 486, NewPixels(pixels));
    Send(image, 7);
    sockets.sent.clear();
    sockets.answered = 0;
    int requests = -1;
    {
        CapturedStderr errors;
        FailingMalloc memory(0);
        image.ToDDR(7);
        requests = memory.Requests();
    }

    EXPECT_EQ(requests, 0);
    EXPECT_TRUE(sockets.sent == MessageOf("workstation", 7, pixels));
}

TEST_F(FrameStore, AStandardErrorThatThrowsChangesNothing)
{
    ZtImageSGI image(648, 486, NewPixels(pixels));
    {
        ThrowingStderr throwing;
        image.ToDDR(7);
    }

    EXPECT_EQ(sockets.sent.size(), 699908u);
    EXPECT_EQ(sockets.closed, 1);
}

} // namespace
