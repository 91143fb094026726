#include "platform/pixel_lanes.h"

#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "platform/x86/pixel_lanes_avx2.h"

namespace {

using zt_platform::Joining;
using zt_platform::PackedRow;
using zt_platform::PixelLanes;
using Words = std::vector<std::uint32_t>;
using Bytes = std::vector<unsigned char>;

/// Each test runs with all the lanes that this processor has.
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

std::vector<const PixelLanes*> AllLanes()
{
    std::vector<const PixelLanes*> all = {&PixelLanes::plain()};
    if (const PixelLanes* wide = zt_platform::avx2_pixel_lanes())
        all.push_back(wide);
    return all;
}

INSTANTIATE_TEST_SUITE_P(Lanes, PixelLanesTest, testing::ValuesIn(AllLanes()),
                         [](const auto& about) {
                             return std::string(about.param->name());
                         });

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

/// A row in packets, with a buffer for what is in them, both with their slack.
class Packed
{
public:
    Packed(const Bytes& row_packets, std::size_t width)
        : packets(row_packets), values(width + PixelLanes::packet_slack, 0xAA)
    {
        packets.insert(packets.end(), PixelLanes::packet_slack, 0x7F);
    }

    PackedRow Row()
    {
        return {packets.data(),
                packets.data() + packets.size() - PixelLanes::packet_slack,
                values.data(),
                values.data() + values.size() - PixelLanes::packet_slack};
    }

    Bytes Values() const
    {
        return {values.begin(),
                values.end() - static_cast<long>(PixelLanes::packet_slack)};
    }

private:
    Bytes packets;
    Bytes values;
};

constexpr PixelLanes::Packets guesses[] = {PixelLanes::Packets::Short,
                                           PixelLanes::Packets::Long};

/// Unpacks one row, first guessed at one way, then the other.
testing::AssertionResult Unpacks(const PixelLanes& lanes, const Bytes& packets,
                                 const Bytes& expected)
{
    for (PixelLanes::Packets guess : guesses)
        for (std::size_t at = 0; at < 4; ++at) {
            Packed packed(packets, expected.size());
            PackedRow rows[4] = {};
            rows[at] = packed.Row();
            if (!lanes.unpack(rows, guess, {}))
                return testing::AssertionFailure() << "is not exact";
            if (packed.Values() != expected)
                return testing::AssertionFailure() << "has other values";
        }
    return testing::AssertionSuccess();
}

bool IsExact(const PixelLanes& lanes, const Bytes& packets, std::size_t width)
{
    int exact = 0;
    for (PixelLanes::Packets guess : guesses) {
        Packed packed(packets, width);
        const PackedRow rows[4] = {{}, packed.Row(), {}, {}};
        exact += lanes.unpack(rows, guess, {});
    }
    EXPECT_NE(exact, 1);
    return exact == 2;
}

TEST_P(PixelLanesTest, PacketsHoldLiteralsAndRepeats)
{
    EXPECT_TRUE(
        Unpacks(lanes, {0x83, 1, 2, 3, 0x04, 9, 0x00}, {1, 2, 3, 9, 9, 9, 9}));
    EXPECT_TRUE(Unpacks(lanes, {0x02, 5, 0x81, 6}, {5, 5, 6}));
    EXPECT_TRUE(Unpacks(lanes, {0x00}, {}));
    EXPECT_TRUE(Unpacks(lanes, {}, {}));
}

TEST_P(PixelLanesTest, PacketsOfEveryLengthAreUnpacked)
{
    for (unsigned count = 1; count < 128; ++count) {
        Bytes literal = RandomBytes(count);
        Bytes packets = {static_cast<unsigned char>(0x80 | count)};
        packets.insert(packets.end(), literal.begin(), literal.end());
        packets.insert(packets.end(),
                       {static_cast<unsigned char>(count), 0x77, 0x00});
        Bytes expected = literal;
        expected.insert(expected.end(), count, 0x77);

        EXPECT_TRUE(Unpacks(lanes, packets, expected)) << count;
    }
}

TEST_P(PixelLanesTest, RowsThatAreTooLongOrTooShortAreNotExact)
{
    EXPECT_FALSE(IsExact(lanes, {0x03, 1, 0x00}, 4));
    EXPECT_FALSE(IsExact(lanes, {0x05, 1, 0x00}, 4));
    EXPECT_FALSE(IsExact(lanes, {0x04, 1, 0x01, 2}, 4));
    EXPECT_FALSE(IsExact(lanes, {0x84, 1, 2, 3}, 4));
    EXPECT_FALSE(IsExact(lanes, {0x04}, 4));
    EXPECT_FALSE(IsExact(lanes, {0x02, 1, 0x00, 0x02, 1}, 4));
    EXPECT_FALSE(IsExact(lanes, {0x02, 1, 0x80, 0x02, 1}, 4));
    EXPECT_FALSE(IsExact(lanes, {}, 4));
    EXPECT_FALSE(IsExact(lanes, {0x01, 1}, 0));
}

TEST_P(PixelLanesTest, OneRowThatIsNotExactIsEnough)
{
    for (PixelLanes::Packets guess : guesses)
        for (std::size_t wrong = 0; wrong < 5; ++wrong) {
            std::vector<Packed> packed;
            PackedRow rows[4];
            for (std::size_t i = 0; i < 4; ++i)
                packed.emplace_back(Bytes{0x04, 1}, i == wrong ? 5 : 4);
            for (std::size_t i = 0; i < 4; ++i)
                rows[i] = packed[i].Row();

            EXPECT_EQ(lanes.unpack(rows, guess, {}), wrong == 4);
        }
}

/// Makes packets at random, and says what is in them.
Bytes RandomPackets(std::mt19937& random, std::size_t width, Bytes& values)
{
    Bytes packets;
    while (values.size() < width) {
        std::size_t most = random() % 4 ? 127 : 9;
        std::size_t count =
            std::min(random() % most + 1, width - values.size());
        auto value = [&] { return static_cast<unsigned char>(random()); };
        if (random() % 2) {
            packets.push_back(static_cast<unsigned char>(count));
            packets.push_back(value());
            values.insert(values.end(), count, packets.back());
        } else {
            packets.push_back(static_cast<unsigned char>(0x80 | count));
            for (; count; --count) {
                packets.push_back(value());
                values.push_back(packets.back());
            }
        }
    }
    return packets;
}

TEST_P(PixelLanesTest, FourRowsAreUnpackedWhileFourOthersAreJoined)
{
    for (int i = 0; i < 1000; ++i) {
        std::vector<Packed> packed;
        Bytes expected[4];
        PackedRow rows[4];
        for (Bytes& values : expected) {
            std::size_t width = Word() % 3 ? 1500 : Word() % 300;
            Bytes packets = RandomPackets(random, width, values);
            packed.emplace_back(packets, width);
        }
        for (std::size_t row = 0; row < 4; ++row)
            rows[row] = packed[row].Row();
        std::size_t count = Word() % 3 ? 1500 : Word() % 300;
        Bytes bytes[4];
        for (Bytes& row : bytes)
            row = RandomBytes(count);
        Words words(count + 1, 0x01234567);
        Joining joining = {{bytes[0].data(), bytes[1].data(), bytes[2].data(),
                            bytes[3].data()},
                           words.data(),
                           count};

        bool exact = lanes.unpack(rows, guesses[i % 2], joining);

        ASSERT_TRUE(exact);
        for (std::size_t row = 0; row < 4; ++row)
            ASSERT_EQ(packed[row].Values(), expected[row]) << i;
        Words joined(count + 1, 0x01234567);
        PixelLanes::plain().join(joining.bytes, joined.data(), count);
        ASSERT_EQ(words, joined) << i;
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
    // A step of 0 leaves all places the same, steps up to 2 keep eight of them
    // close together, longer ones spread them.
    for (int step : {0, 1, 2, 3, 40})
        for (std::size_t count = 0; count < 100; ++count) {
            std::vector<int> places(count);
            int place = static_cast<int>(Word() % 20);
            for (int& next : places)
                next = place +=
                    static_cast<int>(Word() % static_cast<unsigned>(step + 1));
            // Not one word behind the last place, so that a reader past it
            // is found out.
            const Words words =
                RandomWords(static_cast<std::size_t>(place) + 1);
            Words picked(count + 1, 0x01234567);

            lanes.pick(words.data(), places.data(), picked.data(), count);

            for (std::size_t i = 0; i < count; ++i)
                ASSERT_EQ(picked[i],
                          words[static_cast<std::size_t>(places[i])]);
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

TEST(PixelLanes, TheWidestAreTheFastest)
{
    EXPECT_EQ(&PixelLanes::fastest(), AllLanes().back());
}

} // namespace
