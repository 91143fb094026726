#include "platform/pixel_lanes.h"

#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>

namespace {

using zt_platform::PixelLanes;
using Words = std::vector<std::uint32_t>;
using Bytes = std::vector<unsigned char>;

/// Each test runs with the plain lanes and with the fastest.
class PixelLanesTest : public testing::TestWithParam<const PixelLanes*>
{
protected:
    const PixelLanes& lanes = *GetParam();
    std::mt19937 random{25};

    std::uint32_t Word() { return static_cast<std::uint32_t>(random()); }

    Words RandomWords(std::size_t count)
    {
        Words words(count);
        for (std::uint32_t& word : words)
            word = Word();
        return words;
    }

    Bytes RandomBytes(std::size_t count, unsigned below = 256)
    {
        Bytes bytes(count);
        for (unsigned char& byte : bytes)
            byte = static_cast<unsigned char>(Word() % below);
        return bytes;
    }
};

INSTANTIATE_TEST_SUITE_P(Plain, PixelLanesTest,
                         testing::Values(&PixelLanes::plain()));
INSTANTIATE_TEST_SUITE_P(Fastest, PixelLanesTest,
                         testing::Values(&PixelLanes::fastest()));

TEST_P(PixelLanesTest, WordsAreMadeOfBytesTheLowestFirst)
{
    for (std::size_t count = 0; count < 150; ++count) {
        Bytes rows[4];
        for (Bytes& row : rows)
            row = RandomBytes(count);
        Words words(count + 1, 0x01234567);

        lanes.join(
            {rows[0].data(), rows[1].data(), rows[2].data(), rows[3].data()},
            words.data(), count);

        for (std::size_t i = 0; i < count; ++i) {
            std::uint32_t expected = 0;
            for (std::size_t lane = 0; lane < 4; ++lane)
                expected += std::uint32_t{rows[lane][i]} << 8 * lane;
            ASSERT_EQ(words[i], expected);
        }
        ASSERT_EQ(words[count], 0x01234567u);
    }
}

TEST_P(PixelLanesTest, WordsAreTakenApartIntoBytesTheLowestFirst)
{
    for (std::size_t count = 0; count < 150; ++count) {
        Words words = RandomWords(count);
        std::vector<Bytes> rows(4, Bytes(count + 1, 0xA5));

        lanes.split(
            words.data(),
            {rows[0].data(), rows[1].data(), rows[2].data(), rows[3].data()},
            count);

        for (std::size_t lane = 0; lane < 4; ++lane) {
            for (std::size_t i = 0; i < count; ++i)
                ASSERT_EQ(rows[lane][i], words[i] >> 8 * lane & 0xFF);
            ASSERT_EQ(rows[lane][count], 0xA5);
        }
    }
}

TEST_P(PixelLanesTest, TheFirstThreeEqualBytesAreFound)
{
    for (std::size_t count = 0; count < 120; ++count)
        for (std::size_t at = 0; at < count; ++at) {
            Bytes bytes(count);
            for (std::size_t i = 0; i < count; ++i)
                bytes[i] = static_cast<unsigned char>(i);
            for (std::size_t i = at; i < std::min(at + 3, count); ++i)
                bytes[i] = 200;

            ASSERT_EQ(lanes.find_three_equal(bytes.data(), count),
                      at + 3 <= count ? at : count)
                << count << " " << at;
        }
}

TEST_P(PixelLanesTest, ThreeEqualBytesAreTheFirstOfMany)
{
    for (int i = 0; i < 3000; ++i) {
        Bytes bytes = RandomBytes(Word() % 200, 7);
        std::size_t first = bytes.size();
        for (std::size_t at = bytes.size(); at-- > 0;)
            if (at + 2 < bytes.size() && bytes[at] == bytes[at + 1] &&
                bytes[at] == bytes[at + 2])
                first = at;

        ASSERT_EQ(lanes.find_three_equal(bytes.data(), bytes.size()), first);
    }
}

TEST_P(PixelLanesTest, EqualBytesAreCounted)
{
    for (std::size_t count = 1; count < 120; ++count)
        for (std::size_t equal = 1; equal <= count; ++equal) {
            Bytes bytes(count, 7);
            if (equal < count)
                bytes[equal] = 8;

            ASSERT_EQ(lanes.count_equal(bytes.data(), count), equal);
        }
}

TEST_P(PixelLanesTest, ABlockIsTurned)
{
    Words words = RandomWords(8 * 11);
    Words columns(8 * 13, 0x01234567);

    lanes.turn(words.data(), 11, columns.data(), 13);

    for (std::size_t row = 0; row < 8; ++row)
        for (std::size_t column = 0; column < 13; ++column)
            EXPECT_EQ(columns[row * 13 + column],
                      column < 8 ? words[column * 11 + row] : 0x01234567);
}

TEST_P(PixelLanesTest, WordsArePickedFromTheirPlaces)
{
    const Words words = RandomWords(300);
    for (std::size_t count = 0; count < 100; ++count) {
        std::vector<int> places(count);
        for (int& place : places)
            place = static_cast<int>(Word() % words.size());
        Words picked(count + 1, 0x01234567);

        lanes.pick(words.data(), places.data(), picked.data(), count);

        for (std::size_t i = 0; i < count; ++i)
            ASSERT_EQ(picked[i], words[static_cast<std::size_t>(places[i])]);
        EXPECT_EQ(picked[count], 0x01234567u);
    }
}

TEST_P(PixelLanesTest, AveragesFollowTheirFormula)
{
    for (int i = 0; i < 2000; ++i) {
        std::size_t count = Word() % 40;
        std::size_t whole = Word() % 5;
        auto part = [this] {
            return Word() % 4 ? (Word() >> 1) / 2147483648.0 : 1.0;
        };
        PixelLanes::Average average = {nullptr, whole, part(), part(), 0.0};
        average.scale = 1.0 / (static_cast<double>(whole) + 1.5);
        std::vector<Words> lines;
        std::vector<const std::uint32_t*> starts;
        for (std::size_t line = 0; line <= std::max<std::size_t>(whole, 1);
             ++line)
            lines.push_back(RandomWords(count));
        for (const Words& line : lines)
            starts.push_back(line.data());
        average.lines = starts.data();
        Words averages(count + 1, 0x01234567);

        lanes.average(average, averages.data(), count);

        for (std::size_t at = 0; at < count; ++at) {
            std::uint32_t expected = 0;
            for (int shift : {0, 8, 16}) {
                double first =
                    average.head * (lines[0][at] >> shift & 0xFF) +
                    (1.0 - average.head) * (lines[1][at] >> shift & 0xFF);
                double sum = first * (whole ? average.head : average.tail);
                for (std::size_t line = 1; line < whole; ++line)
                    sum += lines[line][at] >> shift & 0xFF;
                if (whole)
                    sum += (lines[whole][at] >> shift & 0xFF) * average.tail;
                expected |= static_cast<std::uint32_t>(sum * average.scale)
                            << shift;
            }
            ASSERT_EQ(averages[at], expected) << i << " " << at;
        }
        ASSERT_EQ(averages[count], 0x01234567u);
    }
}

TEST(PixelLanes, TheFastestAreInUseUnlessOthersAreInstalled)
{
    EXPECT_EQ(&PixelLanes::current(), &PixelLanes::fastest());

    PixelLanes::install(&PixelLanes::plain());
    EXPECT_EQ(&PixelLanes::current(), &PixelLanes::plain());

    PixelLanes::install(nullptr);
    EXPECT_EQ(&PixelLanes::current(), &PixelLanes::fastest());
}

TEST(PixelLanes, TheyAreToldApartByTheirNames)
{
    EXPECT_STREQ(PixelLanes::plain().name(), "plain");
    bool same = &PixelLanes::plain() == &PixelLanes::fastest();
    EXPECT_STREQ(PixelLanes::fastest().name(), same ? "plain" : "avx2");
}

} // namespace
