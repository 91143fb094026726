#include "sequence/block.h"

#include <random>
#include <sstream>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

/// The first words of a block's statements.
std::string WordsOf(const std::vector<StoredStatement>& block)
{
    std::string words;
    for (const StoredStatement& stored : block)
        words += (words.empty() ? "" : " ") +
                 std::string(stored.statement.ArgText(0));
    return words;
}

struct Outcome
{
    BlockRead read;
    std::string words;
    std::string rest; ///< The first words that are left.
};

Outcome BlockOf(const std::string& script, bool opened)
{
    ScriptBuffer buffer(script);
    StreamSource source("script", buffer);
    std::vector<StoredStatement> block;
    Outcome outcome;
    outcome.read = ReadBlock(source, opened, block);
    outcome.words = WordsOf(block);
    KvoStatement statement;
    while (source.Read(statement) == Next::Got)
        outcome.rest += std::string(statement.ArgText(0)) + " ";
    return outcome;
}

} // namespace

TEST(ReadBlock, GivesTheStatementsUpToEnd)
{
    Outcome outcome = BlockOf("a\nb\nend\nc\n", true);

    EXPECT_EQ(outcome.read, BlockRead::Whole);
    EXPECT_EQ(outcome.words, "a b");
    EXPECT_EQ(outcome.rest, "c ");
}

TEST(ReadBlock, TakesABeginOfItsOwn)
{
    Outcome outcome = BlockOf("begin; a; end; c\n", false);

    EXPECT_EQ(outcome.read, BlockRead::Whole);
    EXPECT_EQ(outcome.words, "a");
    EXPECT_EQ(outcome.rest, "c ");
}

TEST(ReadBlock, KeepsTheBlocksInside)
{
    Outcome outcome = BlockOf("a\nbegin\nb\nend\nc\nend\nd\n", true);

    EXPECT_EQ(outcome.words, "a begin b end c");
    EXPECT_EQ(outcome.rest, "d ");
}

TEST(ReadBlock, KnowsABlockThatItsWordOpens)
{
    Outcome outcome = BlockOf(
        "frames 1 2 begin\nb\nend\nFrames 1 2\nbegin\nend\nend\nd\n", true);

    EXPECT_EQ(outcome.words, "frames b end Frames begin end");
    EXPECT_EQ(outcome.rest, "d ");
}

TEST(ReadBlock, KnowsABlockThatAClockRuns)
{
    Outcome outcome =
        BlockOf("clock a at 1:00 do begin\nb\nend\n"
                "Clock a onstop do Clock b onstop do Frames 1 2 begin\nend\n"
                "Clock a onstop do b begin\nClock a begin\nend\nd\n",
                true);

    EXPECT_EQ(outcome.words, "clock b end Clock end Clock Clock");
    EXPECT_EQ(outcome.rest, "d ");
}

TEST(ReadBlock, OtherWordsOpenNothingWithTheirLastWord)
{
    Outcome outcome = BlockOf("Echo begin\nend\nd\n", true);

    EXPECT_EQ(outcome.words, "Echo");
    EXPECT_EQ(outcome.rest, "d ");
}

TEST(ReadBlock, BeginAndEndMindTheCase)
{
    Outcome outcome = BlockOf("BEGIN\nEnd\nend\nd\n", true);

    EXPECT_EQ(outcome.words, "BEGIN End");
    EXPECT_EQ(outcome.rest, "d ");
}

TEST(ReadBlock, TellsThatTheEndIsMissing)
{
    Outcome outcome = BlockOf("a\nbegin\nend\n", true);

    EXPECT_EQ(outcome.read, BlockRead::NoEnd);
    EXPECT_EQ(outcome.words, "a begin end");
}

TEST(ReadBlock, GivesWhatStandsInThePlaceOfBegin)
{
    Outcome outcome = BlockOf("a b\nc\n", false);

    EXPECT_EQ(outcome.read, BlockRead::NoBegin);
    EXPECT_EQ(outcome.words, "a");
    EXPECT_EQ(outcome.rest, "c ");
    EXPECT_EQ(BlockOf("", false).read, BlockRead::NoBegin);
}

TEST(ReadBlock, NotesWhereEachStatementStands)
{
    ScriptBuffer buffer("a\n\n# c\nb; c\nend\n");
    StreamSource source("script", buffer);
    std::vector<StoredStatement> block;

    ReadBlock(source, true, block);

    ASSERT_EQ(block.size(), 3u);
    EXPECT_EQ(block[0].place.line, 1);
    EXPECT_EQ(block[1].place.line, 4);
    EXPECT_EQ(block[2].place.line, 4);
    EXPECT_EQ(block[2].place.name, "script");
}

// Blocks whose words open nothing are those that the library skips.
TEST(ReadBlock, EndsWhereTheLibrarySkipsTo)
{
    std::mt19937 random(11);
    static const char* const words[] = {
        "a\n", "begin\n", "end\n", "b begin\n", "; ", "END\n", "begin x; "};
    for (int i = 0; i < 3000; ++i) {
        std::string script;
        for (auto n = random() % 15; n > 0; --n)
            script += words[random() % std::size(words)];
        std::istringstream in(script);
        ZtEatBeginEndBlock(in);
        std::string rest;
        KvoStatement statement;
        for (statement.Read(in); in.good() && statement.Count() > 0;
             statement.Read(in))
            rest += std::string(statement.ArgText(0)) + " ";

        ASSERT_EQ(BlockOf(script, true).rest, rest) << script;
    }
}
