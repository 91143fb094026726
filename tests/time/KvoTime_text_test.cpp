// Time values as text and as bytes: the text constructor, Write and Read, the
// binary form.

#include <KVO/KvoTime.h>

#include <climits>
#include <cstring>
#include <iomanip>
#include <locale>
#include <random>
#include <sstream>
#include <streambuf>
#include <string>

#include <gtest/gtest.h>

#include "support/DefaultRate.h"
#include "support/FailingMemory.h"
#include "support/LiteralTimecode.h"
#include "support/OtherLocale.h"
#include "support/PrintTime.h"

namespace {
std::string TextOf(KvoTime time)
{
    std::ostringstream out;
    time.Write(out);
    return out.str();
}

/// The time that a text reads as, from a time of 77 ticks.
std::int32_t TicksRead(const std::string& text)
{
    std::istringstream in(text);
    auto time = KvoTime::FromTicks(77);
    time.Read(in);
    return time.Ticks();
}

std::int32_t Ticks(int hh, int mm, int ss, int ff)
{
    return KvoTime(hh, mm, ss, ff, 30).Ticks();
}

/// A place that takes so many characters and no more.
class NarrowBuffer : public std::streambuf
{
public:
    explicit NarrowBuffer(std::size_t room) : left(room) {}

    std::string taken;

protected:
    int_type overflow(int_type character) override
    {
        if (left == 0)
            return traits_type::eof();
        --left;
        taken.push_back(traits_type::to_char_type(character));
        return character;
    }

private:
    std::size_t left;
};
} // namespace

// From text.

TEST(KvoTime, ATextOfFourFields)
{
    EXPECT_EQ(KvoTime("1:2:3:4").Ticks(), Ticks(1, 2, 3, 4));
    EXPECT_EQ(KvoTime("01:02:03:04", 25).Ticks(),
              KvoTime(1, 2, 3, 4, 25).Ticks());
    EXPECT_EQ(KvoTime("-1:2:-3:+4").Ticks(), Ticks(-1, 2, -3, 4));
    EXPECT_EQ(KvoTime(" 1: 2:\t3:\n4").Ticks(), Ticks(1, 2, 3, 4));
    EXPECT_EQ(KvoTime("0:0:90:100").Ticks(), Ticks(0, 0, 90, 100));
}

TEST(KvoTime, WhatFollowsTheFourthFieldIsIgnored)
{
    EXPECT_EQ(KvoTime("1:2:3:4:5").Ticks(), Ticks(1, 2, 3, 4));
    EXPECT_EQ(KvoTime("1:2:3:4x").Ticks(), Ticks(1, 2, 3, 4));
    EXPECT_EQ(KvoTime("1:2:3:4.5").Ticks(), Ticks(1, 2, 3, 4));
}

TEST(KvoTime, FieldsThatATextLacksAreZero)
{
    EXPECT_EQ(KvoTime("").Ticks(), 0);
    EXPECT_EQ(KvoTime(nullptr).Ticks(), 0);
    EXPECT_EQ(KvoTime("x").Ticks(), 0);
    EXPECT_EQ(KvoTime("::::").Ticks(), 0);
    EXPECT_EQ(KvoTime("-").Ticks(), 0);
    EXPECT_EQ(KvoTime("1").Ticks(), Ticks(1, 0, 0, 0));
    EXPECT_EQ(KvoTime("1:").Ticks(), Ticks(1, 0, 0, 0));
    EXPECT_EQ(KvoTime("1:2").Ticks(), Ticks(1, 2, 0, 0));
    EXPECT_EQ(KvoTime("1:2:3").Ticks(), Ticks(1, 2, 3, 0));
    EXPECT_EQ(KvoTime("1:2:x:4").Ticks(), Ticks(1, 2, 0, 0));
    EXPECT_EQ(KvoTime("1 :2:3:4").Ticks(), Ticks(1, 0, 0, 0));
    EXPECT_EQ(KvoTime("1.2.3.4").Ticks(), Ticks(1, 0, 0, 0));
    EXPECT_EQ(KvoTime("-1:-1").Ticks(), Ticks(-1, -1, 0, 0));
    EXPECT_EQ(KvoTime("1e400:0:0:1").Ticks(), Ticks(1, 0, 0, 0));
}

TEST(KvoTime, NumbersOfATextBeyondIntAreItsEnds)
{
    EXPECT_EQ(KvoTime("99999999999:0:0:0"), KvoTime(INT_MAX, 0, 0, 0));
    EXPECT_EQ(KvoTime("0:0:-99999999999:0"), KvoTime(0, 0, INT_MIN, 0));
    EXPECT_EQ(KvoTime("0:0:0:2147483647"), KvoTime(INT_MAX));
    EXPECT_EQ(KvoTime("0:0:0:2147483648"), KvoTime(INT_MAX));
    EXPECT_EQ(KvoTime("0:0:0:-2147483648"), KvoTime(INT_MIN));
    EXPECT_EQ(KvoTime("0:0:0:-2147483649"), KvoTime(INT_MIN));
    EXPECT_EQ(KvoTime(("0:0:0:" + std::string(10000, '9')).c_str()),
              KvoTime(INT_MAX));
}

// To text.

TEST(KvoTime, WriteGivesTwoDigitsToEveryField)
{
    EXPECT_EQ(TextOf(KvoTime(1, 0, 0, 2, 30)), "01:00:00:02");
    EXPECT_EQ(TextOf(KvoTime::ZERO), "00:00:00:00");
    EXPECT_EQ(TextOf(KvoTime(23, 59, 59, 29)), "23:59:59:29");
}

TEST(KvoTime, WriteWrapsIntoOneDay)
{
    EXPECT_EQ(TextOf(KvoTime(25, 0, 0, 0)), "01:00:00:00");
    EXPECT_EQ(TextOf(KvoTime::FOREVER), "00:00:00:00");
    EXPECT_EQ(TextOf(KvoTime::FromTicks(-1)), "23:59:59:29");
    EXPECT_EQ(TextOf(KvoTime::FromTicks(INT_MIN)), "20:34:46:01");
    EXPECT_EQ(TextOf(KvoTime::FromTicks(INT_MAX)), "03:25:13:28");
}

TEST(KvoTime, WriteUsesTheDefaultRate)
{
    const auto time = KvoTime::FromTicks(7000);

    const DefaultRate rate(25);
    EXPECT_EQ(TextOf(time), "00:00:01:04");
    KvoTime::default_fps = 1000;
    EXPECT_EQ(TextOf(time), "00:00:01:166");
    KvoTime::default_fps = 6000;
    EXPECT_EQ(TextOf(time), "00:00:01:1000");
    KvoTime::default_fps = 0;
    EXPECT_EQ(TextOf(time), "00:00:01:00");
    KvoTime::default_fps = 6001;
    EXPECT_EQ(TextOf(time), "00:00:01:00");
    KvoTime::default_fps = -30;
    EXPECT_EQ(TextOf(time), "00:00:01:-5");
    KvoTime::default_fps = -6000;
    EXPECT_EQ(TextOf(time), "00:00:01:-1000");
}

TEST(KvoTime, WriteEqualsTheLiteralFormEverywhere)
{
    std::mt19937 random(5);
    std::uniform_int_distribution<std::int32_t> any(INT_MIN, INT_MAX);
    const int rates[] = {30, 24, 25, 60, 7, 1, 6000, 1000, -30, -6000};
    for (int round = 0; round < 50000; ++round) {
        const DefaultRate rate(rates[round % 10]);
        const auto time = KvoTime::FromTicks(any(random));
        std::ostringstream literal;
        LiteralWrite(literal,
                     LiteralSplit(time.Wrap().Ticks(), KvoTime::default_fps));
        ASSERT_EQ(TextOf(time), literal.str())
            << time.Ticks() << " at " << KvoTime::default_fps;
    }
}

TEST(KvoTime, WriteTakesNothingFromTheStreamsSettingsAndLeavesThem)
{
    std::ostringstream out;
    out << std::hex << std::showpos << std::showbase << std::left
        << std::setfill('*') << std::setw(40);
    const auto flags = out.flags();

    KvoTime(1, 2, 3, 14).Write(out);

    EXPECT_EQ(out.str(), "01:02:03:14");
    EXPECT_EQ(out.flags(), flags);
    EXPECT_EQ(out.fill(), '*');
    EXPECT_EQ(out.width(), 0);
}

TEST(KvoTime, TextFormsTakeNothingFromALocale)
{
    const OtherLocale german("de_DE");
    std::ostringstream out;
    const DefaultRate rate(6000);

    KvoTime(1, 2, 3, 4567).Write(out);

    EXPECT_EQ(out.str(), "01:02:03:4567");
    KvoTime::default_fps = 30;
    EXPECT_EQ(TicksRead("\"2.5\""), 500);
    EXPECT_EQ(TicksRead("\"2,5\""), 400);
    EXPECT_EQ(TicksRead("10.12"), Ticks(0, 0, 10, 12));
}

TEST(KvoTime, WriteToAStreamThatHasFailedWritesNothing)
{
    std::ostringstream out;
    out.setstate(std::ios_base::failbit);

    KvoTime(1).Write(out);

    EXPECT_EQ(out.str(), "");
}

TEST(KvoTime, AStreamToldToThrowDoesNotThrowFromHere)
{
    NarrowBuffer narrow(2);
    std::ostream out(&narrow);
    out.exceptions(std::ios_base::badbit | std::ios_base::failbit);
    std::istringstream in("abc");
    in.exceptions(std::ios_base::eofbit | std::ios_base::failbit);
    auto time = KvoTime::FromTicks(77);

    EXPECT_NO_THROW(time.Write(out));
    EXPECT_TRUE(out.bad());
    EXPECT_NO_THROW(time.WriteBinary(out));
    EXPECT_NO_THROW(time.ReadBinary(in));
    EXPECT_TRUE(in.fail());
    EXPECT_EQ(time.Ticks(), 77);
}

// Reading.

TEST(KvoTime, ReadTakesOneWordAsFrames)
{
    EXPECT_EQ(TicksRead("5"), 1000);
    EXPECT_EQ(TicksRead("45"), 9000);
    EXPECT_EQ(TicksRead("-3"), -600);
    EXPECT_EQ(TicksRead("\"2.5\""), 500);
    EXPECT_EQ(TicksRead("\"-0.9999\""), -199);
    EXPECT_EQ(TicksRead("1e2"), 20000);
    EXPECT_EQ(TicksRead("word"), 0);
    EXPECT_EQ(TicksRead("\"\""), 0);
    EXPECT_EQ(TicksRead(":"), 0);
    EXPECT_EQ(TicksRead("."), 0);
}

TEST(KvoTime, ReadTakesTheLastWordsAsFramesSecondsMinutesHours)
{
    EXPECT_EQ(TicksRead("1:2:3:4"), Ticks(1, 2, 3, 4));
    EXPECT_EQ(TicksRead("2:3:4"), Ticks(0, 2, 3, 4));
    EXPECT_EQ(TicksRead("3:4"), Ticks(0, 0, 3, 4));
    EXPECT_EQ(TicksRead("1:00"), 6000);
    EXPECT_EQ(TicksRead("9:9:9:1:2:3:4"), Ticks(1, 2, 3, 4));
    EXPECT_EQ(TicksRead("1:2:3:4\n"), Ticks(1, 2, 3, 4));
    EXPECT_EQ(TicksRead("0:90:0:100"), Ticks(0, 90, 0, 100));
}

TEST(KvoTime, ReadTakesPointsAndColonsAlike)
{
    EXPECT_EQ(TicksRead("10.12"), Ticks(0, 0, 10, 12));
    EXPECT_EQ(TicksRead("2.5"), Ticks(0, 0, 2, 5));
    EXPECT_EQ(TicksRead("1.2:3.4"), Ticks(1, 2, 3, 4));
    EXPECT_EQ(TicksRead("1 : 2 . 3 : 4"), Ticks(1, 2, 3, 4));
}

TEST(KvoTime, ReadSkipsSeparatorsWithNoFieldBeforeThem)
{
    EXPECT_EQ(TicksRead("3:"), Ticks(0, 0, 0, 3));
    EXPECT_EQ(TicksRead("3."), Ticks(0, 0, 0, 3));
    EXPECT_EQ(TicksRead(":3"), Ticks(0, 0, 0, 3));
    EXPECT_EQ(TicksRead("1:::4"), Ticks(0, 0, 1, 4));
    EXPECT_EQ(TicksRead("::::"), 0);
    EXPECT_EQ(TicksRead(".."), 0);
}

TEST(KvoTime, ReadSkipsTheWordBeforeAField)
{
    EXPECT_EQ(TicksRead("1 2 3"), Ticks(0, 0, 1, 3));
    EXPECT_EQ(TicksRead("1 2"), Ticks(0, 0, 0, 2));
}

TEST(KvoTime, ReadTakesAQuotedSeparatorAsAField)
{
    EXPECT_EQ(TicksRead("7:\":\":3"), Ticks(0, 7, 0, 3));
}

TEST(KvoTime, ReadTakesWhatIsNoNumberAsZero)
{
    EXPECT_EQ(TicksRead("x:2"), Ticks(0, 0, 0, 2));
    EXPECT_EQ(TicksRead("2:x"), Ticks(0, 0, 2, 0));
    EXPECT_EQ(TicksRead("12abc:3"), Ticks(0, 0, 12, 3));
    EXPECT_EQ(TicksRead("1e3:4"), Ticks(0, 0, 1, 4));
}

TEST(KvoTime, ReadTakesSigns)
{
    EXPECT_EQ(TicksRead("-1:-1"), Ticks(0, 0, -1, -1));
    EXPECT_EQ(TicksRead("+1:-2"), Ticks(0, 0, 1, -2));
}

TEST(KvoTime, ReadTakesNumbersBeyondTheRangeAsItsEnds)
{
    EXPECT_EQ(TicksRead("99999999999:0:0:0"), Ticks(INT_MAX, 0, 0, 0));
    EXPECT_EQ(TicksRead("0:-99999999999"), Ticks(0, 0, 0, INT_MIN));
    EXPECT_EQ(TicksRead("1e400"), INT_MAX);
    EXPECT_EQ(TicksRead("-1e400"), INT_MIN);
    EXPECT_EQ(TicksRead("nan"), 0);
}

TEST(KvoTime, ReadOfNoWordsLeavesTheTime)
{
    EXPECT_EQ(TicksRead(""), 77);
    EXPECT_EQ(TicksRead("   "), 77);
    EXPECT_EQ(TicksRead("\n5"), 77);
    EXPECT_EQ(TicksRead(";5"), 77);
}

TEST(KvoTime, ReadEndsAfterANewlineOrASemicolon)
{
    std::istringstream in("1:0;2:0\n3:0 x");
    KvoTime first;
    KvoTime second;

    first.Read(in);
    second.Read(in);

    EXPECT_EQ(first, KvoTime(0, 0, 1, 0));
    EXPECT_EQ(second, KvoTime(0, 0, 2, 0));
    EXPECT_TRUE(in.good());
    std::string rest;
    std::getline(in, rest);
    EXPECT_EQ(rest, "3:0 x");
}

TEST(KvoTime, ReadFromAStreamThatHasFailedLeavesTheTime)
{
    std::istringstream in("5");
    in.setstate(std::ios_base::failbit);
    auto time = KvoTime::FromTicks(77);

    time.Read(in);

    EXPECT_EQ(time.Ticks(), 77);
}

TEST(KvoTime, ReadUsesTheDefaultRate)
{
    const DefaultRate rate(25);

    EXPECT_EQ(TicksRead("5"), 1200);
    EXPECT_EQ(TicksRead("1:5"), 7200);
    KvoTime::default_fps = 0;
    EXPECT_EQ(TicksRead("5"), 0);
    EXPECT_EQ(TicksRead("1:5"), 6000);
}

TEST(KvoTime, ReadWithoutMemoryDoesNoHarm)
{
    std::istringstream in;
    for (long spared = 0; spared < 40; ++spared) {
        in.clear();
        in.str("1:2:3:4 and a word that is too long for any room in a token");
        auto time = KvoTime::FromTicks(77);

        {
            const FailingMemory memory(spared);
            EXPECT_NO_THROW(time.Read(in));
        }

        if (spared == 0) {
            EXPECT_EQ(time.Ticks(), 77);
        }
    }
    EXPECT_EQ(TicksRead("1:2:3:4"), Ticks(1, 2, 3, 4));
}

TEST(KvoTime, WhatIsWrittenReadsBack)
{
    std::mt19937 random(6);
    std::uniform_int_distribution<std::int32_t> any(0, 518400000 - 1);
    for (const int fps : {24, 25, 30, 60, 1000}) {
        const DefaultRate rate(fps);
        const std::int32_t frame = 6000 / fps;
        for (int round = 0; round < 500; ++round) {
            const std::int32_t ticks = any(random) / frame * frame;
            ASSERT_EQ(TicksRead(TextOf(KvoTime::FromTicks(ticks))), ticks);
        }
    }
}

// Bytes.

TEST(KvoTime, BinaryFormIsTheTicksAsTheyLieInMemory)
{
    const auto time = KvoTime::FromTicks(0x01020304);
    std::ostringstream out;

    time.WriteBinary(out);

    const std::string form = out.str();
    ASSERT_EQ(form.size(), 4u);
    EXPECT_EQ(std::memcmp(form.data(), &time.tick_count, 4), 0);
    const bool little = form[0] == 4;
    EXPECT_EQ(form, little ? "\4\3\2\1" : "\1\2\3\4");
}

TEST(KvoTime, BinaryFormGoesRound)
{
    for (const std::int32_t ticks : {0, 1, -1, 0x0a0d1a00, INT_MAX, INT_MIN}) {
        std::stringstream stream;
        KvoTime back;

        KvoTime::FromTicks(ticks).WriteBinary(stream);
        back.ReadBinary(stream);

        EXPECT_EQ(back.Ticks(), ticks);
        EXPECT_TRUE(stream.good());
    }
}

TEST(KvoTime, BinaryFormIsNotWrittenToAStreamThatHasFailed)
{
    for (const auto state : {std::ios_base::failbit, std::ios_base::badbit}) {
        std::ostringstream out;
        out.setstate(state);

        KvoTime(1).WriteBinary(out);

        EXPECT_EQ(out.str(), "");
        EXPECT_EQ(out.rdstate(), state);
    }
}

TEST(KvoTime, AShortWriteSetsFailAndBad)
{
    NarrowBuffer narrow(3);
    std::ostream out(&narrow);

    KvoTime(1).WriteBinary(out);

    EXPECT_EQ(narrow.taken.size(), 3u);
    EXPECT_EQ(out.rdstate(), std::ios_base::failbit | std::ios_base::badbit);
}

TEST(KvoTime, AShortReadLeavesTheTime)
{
    for (const std::size_t bytes : {0u, 1u, 3u}) {
        std::istringstream in(std::string(bytes, 'x'));
        auto time = KvoTime::FromTicks(77);

        time.ReadBinary(in);

        EXPECT_EQ(time.Ticks(), 77);
        EXPECT_TRUE(in.fail());
    }
}

TEST(KvoTime, BinaryReadTakesFourBytesAndNoMore)
{
    std::istringstream in("abcdefgh");
    KvoTime first;
    KvoTime second;

    first.ReadBinary(in);
    second.ReadBinary(in);

    EXPECT_EQ(std::memcmp(&first.tick_count, "abcd", 4), 0);
    EXPECT_EQ(std::memcmp(&second.tick_count, "efgh", 4), 0);
    EXPECT_TRUE(in.good());
}

TEST(KvoTime, TheBinarySwitchIsReadByNobody)
{
    KvoTime::binaryIO = 1;
    const std::string text = TextOf(KvoTime(1, 0, 0, 2, 30));
    KvoTime::binaryIO = 0;

    EXPECT_EQ(text, "01:00:00:02");
}
