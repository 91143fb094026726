#include "reception.h"

#include <filesystem>
#include <random>

#include <gtest/gtest.h>

#include "support/TempDir.h"

using framestore::message_bytes;
using framestore::Reception;
using framestore::Storage;

namespace {

const std::string ok("OK\0\0", 4);
const std::string bad("BAD\0", 4);

std::string Message(std::string name, const std::string& number)
{
    name.resize(64, '\0');
    std::string message = name + number;
    while (message.size() < message_bytes)
        message += static_cast<char>(message.size() * 7 >> 3);
    return message;
}

const std::string seven("\0\0\0\7", 4);

class ReceptionTest : public testing::Test
{
protected:
    ReceptionTest() { storage.directory = directory.Path("."); }

    std::string Answer(const Reception& reception) const
    {
        return std::string(reception.Answer(), 4);
    }

    std::string LineOf(const std::string& message)
    {
        Reception reception(storage);
        reception.Take(message.data(), message.size());
        return reception.Line("1.2.3.4");
    }

    TempDir directory;
    Storage storage;
};

TEST_F(ReceptionTest, AMessageInOnePieceIsAFrame)
{
    const std::string message = Message("host", seven);
    Reception reception(storage);

    reception.Take(message.data(), message.size());

    EXPECT_TRUE(reception.Complete());
    EXPECT_EQ(Answer(reception), ok);
    EXPECT_EQ(reception.Line("1.2.3.4"), "frame 7 from host (1.2.3.4): wrote " +
                                             storage.directory +
                                             "/frame.000007.yuv");
    EXPECT_TRUE(directory.Read("frame.000007.yuv") == message.substr(68));
}

TEST_F(ReceptionTest, PiecesMayBeOfAnySize)
{
    const std::string message = Message("host", seven);
    std::mt19937 random(5333);
    for (std::size_t most : {1ul, 3ul, 65ul, 70ul, 5000ul, 200000ul}) {
        Reception reception(storage);
        std::size_t at = 0;
        while (at < message.size()) {
            EXPECT_FALSE(reception.Complete());
            EXPECT_EQ(reception.Count(), at);
            const std::size_t part =
                std::min(1 + random() % most, message.size() - at);
            reception.Take(message.data() + at, part);
            at += part;
        }

        EXPECT_TRUE(reception.Complete());
        EXPECT_EQ(Answer(reception), ok);
        EXPECT_TRUE(directory.Read("frame.000007.yuv") == message.substr(68));
        std::filesystem::remove(directory.Path("frame.000007.yuv"));
    }
}

TEST_F(ReceptionTest, WhatComesBehindTheFrameIsDropped)
{
    const std::string message = Message("host", seven) + "and more";
    Reception reception(storage);

    reception.Take(message.data(), message.size());
    reception.Take(message.data(), 1000);

    EXPECT_EQ(reception.Count(), message_bytes);
    EXPECT_EQ(directory.Read("frame.000007.yuv").size(), 699840u);
}

TEST_F(ReceptionTest, AnIncompleteMessageLeavesNothing)
{
    const std::string message = Message("host", seven);
    for (std::size_t count : {0ul, 1ul, 64ul, 67ul, 68ul, 69ul, 699907ul}) {
        Reception reception(storage);
        reception.Take(message.data(), count);
        EXPECT_FALSE(reception.Complete());
    }
    EXPECT_TRUE(std::filesystem::is_empty(directory.Path(".")));
}

TEST_F(ReceptionTest, NumbersAreSignedAndHaveTheMostSignificantByteFirst)
{
    LineOf(Message("host", std::string("\x01\x02\x03\x04")));
    LineOf(Message("host", std::string("\xFF\xFF\xFF\xFE")));

    EXPECT_TRUE(std::filesystem::exists(directory.Path("frame.16909060.yuv")));
    EXPECT_TRUE(std::filesystem::exists(directory.Path("frame.-000002.yuv")));
}

TEST_F(ReceptionTest, TheNameIsMadeFitToBeShown)
{
    EXPECT_TRUE(LineOf(Message("a b\n\x1B[2J\xFF%s", seven))
                    .starts_with("frame 7 from a?b??[2J?%s (1.2.3.4): "));
    EXPECT_TRUE(LineOf(Message("", seven))
                    .starts_with("frame 7 from a nameless host (1.2.3.4): "));
    EXPECT_TRUE(LineOf(Message(std::string(64, 'h'), seven))
                    .starts_with("frame 7 from " + std::string(64, 'h') +
                                 " (1.2.3.4): "));
}

TEST_F(ReceptionTest, AFrameThatCannotBeWrittenIsTakenWholeAndRefused)
{
    storage.directory = directory.Path("none");
    const std::string message = Message("host", seven);
    Reception reception(storage);

    reception.Take(message.data(), message.size() - 1);
    EXPECT_FALSE(reception.Complete());
    reception.Take(message.data(), 1);

    EXPECT_TRUE(reception.Complete());
    EXPECT_EQ(Answer(reception), bad);
    EXPECT_EQ(reception.Line("1.2.3.4"),
              "frame 7 from host (1.2.3.4): refused: its directory: No such "
              "file or directory");
}

} // namespace
