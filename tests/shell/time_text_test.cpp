#include "support/DefaultRate.h"
#include "time/time_text.h"

#include <sstream>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

/// What came of reading the time that the words of a statement begin with.
struct Outcome
{
    bool right = false;
    int ticks = 0;
    std::string why;
    std::string rest; ///< The first word behind it.
};

Outcome Read(const std::string& words, int fps = 0)
{
    std::istringstream in(words + "\n");
    KvoStatement statement;
    statement.Read(in);
    TimeReader reader(statement, 0, fps);
    Outcome outcome;
    KvoTime time;
    outcome.right = reader.Read(time);
    outcome.ticks = time.Ticks();
    outcome.why = reader.Why();
    if (const char* rest = statement.ArgText(reader.Next()))
        outcome.rest = rest;
    return outcome;
}

int Ticks(const std::string& words, int fps = 0)
{
    Outcome outcome = Read(words, fps);
    EXPECT_TRUE(outcome.right) << words << ": " << outcome.why;
    EXPECT_EQ(outcome.rest, "") << words;
    return outcome.ticks;
}

std::string Why(const std::string& words)
{
    Outcome outcome = Read(words);
    EXPECT_FALSE(outcome.right) << words;
    return outcome.why;
}

} // namespace

TEST(TimeReader, TheFieldsOfATimecodeEndWithTheFrames)
{
    EXPECT_EQ(Ticks("1:12"), 6000 + 12 * 200);
    EXPECT_EQ(Ticks("2:1:12"), 2 * 360000 + 6000 + 12 * 200);
    EXPECT_EQ(Ticks("3:2:1:12"), 3 * 21600000 + 2 * 360000 + 6000 + 12 * 200);
    EXPECT_EQ(Ticks("0:90:100"), 90 * 6000 + 100 * 200);
    EXPECT_EQ(Ticks("-0:1:00"), -6000);
}

TEST(TimeReader, FramesAreAtTheRateThatIsGiven)
{
    DefaultRate rate(60);

    EXPECT_EQ(Ticks("0:01"), 100);
    EXPECT_EQ(Ticks("0:01", 25), 240);
    EXPECT_EQ(Ticks("3 frames", 24), 750);
    EXPECT_EQ(Ticks("1:06", 7), 6000 + 6 * 857);
}

TEST(TimeReader, ANumberHasAUnitOrCountsFrames)
{
    EXPECT_EQ(Ticks("5"), 1000);
    EXPECT_EQ(Ticks("-2.5"), -500);
    EXPECT_EQ(Ticks("1 frame"), 200);
    EXPECT_EQ(Ticks("16777217 ticks"), 16777217);
    EXPECT_EQ(Ticks("7.9 ticks"), 7);
    EXPECT_EQ(Ticks("1.5 ms"), 9);
    EXPECT_EQ(Ticks("2.5 seconds"), 15000);
    EXPECT_EQ(Ticks("1.5 min"), 540000);
    EXPECT_EQ(Ticks(".5 h"), 10800000);
}

TEST(TimeReader, ReckonsProductsBeforeSums)
{
    EXPECT_EQ(Ticks("1:00 + 0:12 - 1 tick"), 6000 + 2400 - 1);
    EXPECT_EQ(Ticks("1 s + 2 s * 3"), 7 * 6000);
    EXPECT_EQ(Ticks("1 s * 3 / 2 - 1 s / -2"), 9000 + 3000);
    EXPECT_EQ(Ticks("10 ticks / 3"), 3);
}

TEST(TimeReader, StopsBeforeTheFirstWordThatIsNotItsOwn)
{
    EXPECT_EQ(Read("1:00 at 25").rest, "at");
    EXPECT_EQ(Read("5 do Echo").rest, "do");
    EXPECT_EQ(Read("5 frames frames").rest, "frames");
    EXPECT_EQ(Read("1:00 seconds").rest, "seconds");
}

TEST(TimeReader, SaysWhatIsWrong)
{
    EXPECT_EQ(Why("1 +"), "a time is missing at the end");
    EXPECT_EQ(Why("x"), "x is neither a timecode nor a number");
    EXPECT_EQ(Why("''"), "an empty word is neither a timecode nor a number");
    EXPECT_EQ(Why("1 + +"), "+ is neither a timecode nor a number");
    EXPECT_EQ(Why("2 timecode"), "a number is no timecode");
    EXPECT_EQ(Why("1 s / 0"), "nothing can be divided by 0");
    EXPECT_EQ(Why("1 s * 1.5"),
              "1.5 is no whole number to multiply or divide by");
    EXPECT_EQ(Why("1 s /"),
              "nothing is no whole number to multiply or divide by");
}

TEST(TimeReader, RefusesWhatOnlyBeginsLikeATimecode)
{
    for (const char* text : {":", "1:", ":1", "1::2", "1:2:3:4:5", "1:-2",
                             "1:+2", "1:2.5", "--1:2", "1:x", "1:0x2"})
        EXPECT_EQ(Why(text), std::string(text) + " is no timecode");
}

TEST(TimeReader, RefusesWhatOnlyBeginsLikeANumber)
{
    for (const char* text :
         {"-", ".", "1e3", "inf", "nan", "-inf", "+1", "--1", "0x10", "1.2.3"})
        EXPECT_EQ(Why(text),
                  std::string(text) + " is neither a timecode nor a number");
}

TEST(TimeReader, ATimeHasToFit)
{
    std::string too_long = "a time goes up to 99 hours either way";

    EXPECT_EQ(Ticks("2147483647 ticks"), 2147483647);
    EXPECT_EQ(Ticks("-2147483647 ticks - 1 tick"), -2147483647 - 1);
    EXPECT_EQ(Why("2147483648 ticks"), too_long);
    EXPECT_EQ(Why("100 hours"), too_long);
    EXPECT_EQ(Why("100:0:0:0"), too_long);
    EXPECT_EQ(Why("2147483647:2147483647:2147483647:2147483647"), too_long);
    EXPECT_EQ(Why("99 h + 99 h"), too_long);
    EXPECT_EQ(Why("99 h * 2147483647"), too_long);
    EXPECT_EQ(Why("99999999999999999999999999 ticks"), too_long);
    EXPECT_EQ(Why("0:99999999999"), "0:99999999999 is no timecode");
}

TEST(TimeText, WritesTimecodeWithASign)
{
    EXPECT_EQ(TimeText(KvoTime(1, 2, 3, 4)), "01:02:03:04");
    EXPECT_EQ(TimeText(KvoTime(1, 2, 3, 4, 25), TimeUnit::Timecode, 25),
              "01:02:03:04");
    EXPECT_EQ(TimeText(-KvoTime(0, 0, 1, 2)), "-00:00:01:02");
    EXPECT_EQ(TimeText(KvoTime::FromTicks(-1)), "00:00:00:00");
    EXPECT_EQ(TimeText(KvoTime::FOREVER), "48:00:00:00");
    EXPECT_EQ(TimeText(KvoTime::FromTicks(-2147483647 - 1)), "-99:25:13:28");
}

TEST(TimeText, WritesUnitsWithTheDigitsThatCount)
{
    KvoTime time = KvoTime::FromTicks(15100);

    EXPECT_EQ(TimeText(time, TimeUnit::Ticks), "15100");
    EXPECT_EQ(TimeText(time, TimeUnit::Milliseconds), "2516.666667");
    EXPECT_EQ(TimeText(time, TimeUnit::Seconds), "2.516666667");
    EXPECT_EQ(TimeText(KvoTime(0, 90, 0, 0), TimeUnit::Minutes), "90");
    EXPECT_EQ(TimeText(KvoTime(0, 90, 0, 0), TimeUnit::Hours), "1.5");
    EXPECT_EQ(TimeText(time, TimeUnit::Frames), "75.5");
    EXPECT_EQ(TimeText(time, TimeUnit::Frames, 24), "60.4");
}

TEST(TimeText, WhatItWritesReadsBack)
{
    std::uint32_t bits = 1;
    for (int i = 0; i < 5000; ++i) {
        bits = bits * 1664525 + 1013904223;
        KvoTime time = KvoTime::FromTicks(static_cast<std::int32_t>(bits));
        for (int fps : {24, 25, 30, 60}) {
            KvoTime frame(1, fps);
            KvoTime whole =
                time - KvoTime::FromTicks(time.Ticks() % frame.Ticks());
            ASSERT_EQ(Ticks(TimeText(whole, TimeUnit::Timecode, fps), fps),
                      whole.Ticks());
            ASSERT_EQ(Ticks(TimeText(whole, TimeUnit::Frames, fps), fps),
                      whole.Ticks());
        }
        ASSERT_EQ(Ticks(TimeText(time, TimeUnit::Ticks) + " ticks"),
                  time.Ticks());
    }
}

TEST(ReadRate, TakesWholeRatesUpToATickAFrame)
{
    int fps = 5;

    EXPECT_TRUE(ReadRate("1", fps));
    EXPECT_EQ(fps, 1);
    EXPECT_TRUE(ReadRate("6000", fps));
    EXPECT_EQ(fps, 6000);
    for (const char* text : {"0", "-25", "6001", "29.97", "x", ""})
        EXPECT_FALSE(ReadRate(text, fps)) << text;
    EXPECT_FALSE(ReadRate(nullptr, fps));
    EXPECT_EQ(fps, 6000);
}

TEST(UnitOf, KnowsSingularPluralAndShortNames)
{
    TimeUnit unit = TimeUnit::Ticks;

    EXPECT_TRUE(UnitOf("h", unit));
    EXPECT_EQ(unit, TimeUnit::Hours);
    EXPECT_TRUE(UnitOf("frame", unit));
    EXPECT_EQ(unit, TimeUnit::Frames);
    EXPECT_FALSE(UnitOf("Frames", unit));
    EXPECT_FALSE(UnitOf("", unit));
    EXPECT_EQ(unit, TimeUnit::Frames);
}
