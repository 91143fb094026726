#include "prompt/completion.h"
#include "support/TempDir.h"

#include <filesystem>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

const std::vector<std::string> commands = {"cd", "Echo", "Help", "Resize",
                                           "ResizeBest"};

using Words = std::vector<std::string>;

} // namespace

TEST(FindWord, TheFirstWordIsACommand)
{
    for (const char* line : {"Ec", "  Ec", "Echo a; Ec", "Echo a;Ec"}) {
        WordAtCursor word = FindWord(line);
        EXPECT_EQ(word.text, "Ec") << line;
        EXPECT_EQ(word.start, std::string(line).size() - 2) << line;
        EXPECT_TRUE(word.is_command) << line;
    }
}

TEST(FindWord, AnEmptyLineWaitsForACommand)
{
    EXPECT_TRUE(FindWord("").is_command);
    EXPECT_TRUE(FindWord("  ").is_command);
    EXPECT_EQ(FindWord("  ").start, 2u);
}

TEST(FindWord, LaterWordsAreArguments)
{
    WordAtCursor word = FindWord("Echo  one tw");

    EXPECT_EQ(word.text, "tw");
    EXPECT_FALSE(word.is_command);
    EXPECT_EQ(FindWord("Echo ").text, "");
    EXPECT_FALSE(FindWord("Echo ").is_command);
}

TEST(FindWord, SeesThroughQuotesAndEscapes)
{
    EXPECT_EQ(FindWord("Echo \"my fi").text, "my fi");
    EXPECT_EQ(FindWord("Echo \"my fi").quote, '"');
    EXPECT_EQ(FindWord("Echo \"my fi").start, 5u);
    EXPECT_EQ(FindWord("Echo my\\ fi").text, "my fi");
    EXPECT_EQ(FindWord("Echo my\\ fi").start, 5u);
    EXPECT_EQ(FindWord("Echo 'a\\b;").text, "a\\b;");
    EXPECT_EQ(FindWord("Echo \"a\"b").text, "ab");
    EXPECT_EQ(FindWord("Echo \"a\"b").quote, '\0');
}

TEST(Complete, ACommandWordGetsItsOwnLettersAndABlank)
{
    Completion completion = Complete("ec", commands);

    EXPECT_EQ(completion.text, "Echo ");
    EXPECT_EQ(completion.start, 0u);
    EXPECT_EQ(completion.candidates, Words{"Echo"});
}

TEST(Complete, SeveralCandidatesGiveTheirCommonStart)
{
    Completion completion = Complete("x; r", commands);

    EXPECT_EQ(completion.text, "Resize");
    EXPECT_EQ(completion.start, 3u);
    EXPECT_EQ(completion.candidates, (Words{"Resize", "ResizeBest"}));
}

TEST(Complete, HelpTakesCommandWords)
{
    EXPECT_EQ(Complete("help c", commands).text, "cd ");
    EXPECT_EQ(Complete("Echo a;Help c", commands).text, "cd ");
}

TEST(Complete, NothingFitsNothingIsGiven)
{
    EXPECT_TRUE(Complete("xyz", commands).candidates.empty());
    EXPECT_TRUE(Complete("Echo /nonexistent/x", commands).candidates.empty());
}

TEST(Complete, ArgumentsAreFiles)
{
    TempDir dir;
    dir.Write("one file", "");
    dir.Write("other", "");
    dir.Write(".hidden", "");
    std::filesystem::create_directory(dir.Path("sub"));
    std::string load = "Load a " + dir.Path("");

    EXPECT_EQ(Complete(load + "on", commands).text, dir.Path("one\\ file "));
    EXPECT_EQ(Complete(load + "s", commands).text, dir.Path("sub/"));
    EXPECT_EQ(Complete(load + "o", commands).candidates,
              (Words{dir.Path("one file"), dir.Path("other")}));
    EXPECT_EQ(Complete(load, commands).candidates.size(), 3u);
    EXPECT_EQ(Complete(load + ".h", commands).text, dir.Path(".hidden "));
}

TEST(Complete, AnOpenQuoteIsClosed)
{
    TempDir dir;
    dir.Write("one file", "");

    Completion completion = Complete("Load a \"" + dir.Path("one f"), commands);

    EXPECT_EQ(completion.text, "\"" + dir.Path("one file") + "\" ");
    EXPECT_EQ(completion.start, 7u);
}

TEST(InColumns, GoesDownFirst)
{
    EXPECT_EQ(InColumns({"a", "b", "c", "d", "e"}, 7), "a  c  e\nb  d\n");
    EXPECT_EQ(InColumns({"a", "bb"}, 1), "a\nbb\n");
    EXPECT_EQ(InColumns({}, 80), "");
}
