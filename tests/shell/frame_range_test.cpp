#include "sequence/frame_range.h"

#include <ZT/filepath.h>

#include <optional>
#include <sstream>

#include <gtest/gtest.h>

using ztsh::FrameRange;

namespace {

/// The range that a statement names, and nothing if it names none.
std::optional<FrameRange> RangeOf(const std::string& words)
{
    std::istringstream in("Frames " + words + "\n");
    KvoStatement statement;
    statement.Read(in);
    FrameRange range;
    if (!range.Read(statement, statement.Count()))
        return std::nullopt;
    return range;
}

std::string NamesOf(const std::string& words)
{
    std::optional<FrameRange> range = RangeOf(words);
    std::string names;
    for (long i = 0; range && i < range->Count(); ++i)
        names += (i > 0 ? " " : "") + range->Name(i);
    return names;
}

} // namespace

TEST(FrameRange, CountsFromFirstToLast)
{
    EXPECT_EQ(NamesOf("9 11"), "0009 0010 0011");
    EXPECT_EQ(NamesOf("7 7"), "0007");
}

TEST(FrameRange, CountsDown)
{
    EXPECT_EQ(NamesOf("2 0"), "0002 0001 0000");
}

TEST(FrameRange, TakesAStep)
{
    EXPECT_EQ(NamesOf("1 6 2"), "0001 0003 0005");
    EXPECT_EQ(NamesOf("6 1 -3"), "0006 0003");
    EXPECT_EQ(NamesOf("5 5 -3"), "0005");
}

TEST(FrameRange, TakesAWidth)
{
    EXPECT_EQ(NamesOf("9 10 pad 1"), "9 10");
    EXPECT_EQ(NamesOf("9 10 1 pad 9"), "000000009 000000010");
    EXPECT_EQ(NamesOf("12345 12345"), "12345");
}

TEST(FrameRange, RefusesEverythingElse)
{
    for (const char* words : {"",
                              "1",
                              "1 x",
                              "x 1",
                              "-1 2",
                              "1 -2",
                              "1 2 0",
                              "1 2 -1",
                              "2 1 1",
                              "1 2 pad",
                              "1 2 pad 0",
                              "1 2 pad 10",
                              "1 2 pad x",
                              "1 2 3 4",
                              "1 2 pad 3 4",
                              "1 2 pad 3 pad 3",
                              "1.5 2",
                              "1 999999999",
                              "1 99999999999999999999",
                              "0x1 2",
                              "1 2 1 padx 3"})
        EXPECT_FALSE(RangeOf(words)) << words;
}

TEST(FrameRange, MakesNamesWhoseNumberFilePathsFind)
{
    std::optional<FrameRange> range = RangeOf("41 43");
    for (long i = 0; i < range->Count(); ++i) {
        std::string name = "dir/shot." + range->Name(i) + ".rgb";
        EXPECT_EQ(ZtFilePath(name.c_str()).Number(), 41 + i) << name;
    }
}

TEST(FrameRange, GoesUpToTheLastFrameThatHasANumber)
{
    EXPECT_EQ(NamesOf("999999998 999999998"), "999999998");
}
