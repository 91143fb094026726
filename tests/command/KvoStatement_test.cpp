#include "KVO/KvoStatement.h"

#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ZT/statement.h"
#include "support/FailingMemory.h"
#include "support/OddStreams.h"
#include "support/OtherLocale.h"

namespace {
using Texts = std::vector<std::string>;

Texts texts_of(const KvoStatement& statement)
{
    Texts texts;
    for (int i = 0; i < statement.Count(); ++i)
        texts.emplace_back(statement.ArgText(i));
    return texts;
}

Texts read(const std::string& input)
{
    std::istringstream in(input);
    KvoStatement statement;
    statement.Read(in);
    return texts_of(statement);
}

/// Reads one statement and gives what the stream holds behind it.
std::string rest_after(const std::string& input)
{
    std::istringstream in(input);
    KvoStatement statement;
    statement.Read(in);
    return RestOf(in);
}

KvoStatement statement_of(const std::string& line)
{
    std::istringstream in(line + "\n");
    KvoStatement statement;
    statement.Read(in);
    return statement;
}

std::string written_quoted(KvoStatement& statement)
{
    std::ostringstream out;
    statement.WriteQuoted(out);
    return out.str();
}

int compared(KvoStatement statement, const char* key)
{
    return statement.Compare(const_cast<char*>(key));
}

TEST(KvoStatement, OfATextIsOneWordBlanksAndAll)
{
    KvoStatement statement("a b");

    EXPECT_EQ(texts_of(statement), (Texts{"a b"}));
    EXPECT_EQ(statement.Find(0)->Quote(), 0);
}

TEST(KvoStatement, OfNoTextIsEmpty)
{
    EXPECT_EQ(KvoStatement().Count(), 0);
    EXPECT_EQ(KvoStatement(nullptr).Count(), 0);
    EXPECT_EQ(KvoStatement(NULL).Count(), 0);
    EXPECT_EQ(KvoStatement(0).Count(), 0);
    EXPECT_EQ(KvoStatement("").Count(), 1);
}

TEST(KvoStatement, OfAnArgumentVectorHasItsWordsUnsplit)
{
    char program[] = "tool";
    char argument[] = "two words";
    char* argv[] = {program, argument, nullptr};
    const char* const fixed[] = {"one", nullptr, "!"};

    EXPECT_EQ(texts_of(KvoStatement(2, argv)), (Texts{"tool", "two words"}));
    EXPECT_EQ(texts_of(KvoStatement(3, fixed)), (Texts{"one", "", "!"}));
    EXPECT_EQ(KvoStatement(0, argv).Count(), 0);
    EXPECT_EQ(KvoStatement(-1, argv).Count(), 0);
    EXPECT_EQ(KvoStatement(1, nullptr).Count(), 0);
}

TEST(KvoStatement, IsAPlainObjectToClassInformation)
{
    KvoStatement statement("a");

    const std::unique_ptr<KvoObject> clone(statement.Clone());

    EXPECT_STREQ(statement.ClassName(), "KvoObject");
    EXPECT_EQ(dynamic_cast<KvoStatement*>(clone.get()), nullptr);
}

TEST(KvoStatement, EndsAtASemicolonOrANewline)
{
    std::istringstream in("a b; c\nd;");
    KvoStatement statement;

    statement.Read(in);
    EXPECT_EQ(texts_of(statement), (Texts{"a", "b"}));
    statement.Read(in);
    EXPECT_EQ(texts_of(statement), (Texts{"c"}));
    statement.Read(in);
    EXPECT_EQ(texts_of(statement), (Texts{"d"}));
    EXPECT_TRUE(in.good());
}

TEST(KvoStatement, TakesItsEndAndNothingBehindIt)
{
    EXPECT_EQ(rest_after("a b\n c\n"), " c\n");
    EXPECT_EQ(rest_after("a b; c\n"), " c\n");
}

TEST(KvoStatement, EveryBlankButTheNewlinePartsWords)
{
    EXPECT_EQ(read("a\tb\fc\rd\ve\x01"
                   "f g\n"),
              (Texts{"a", "b", "c", "d", "e", "f", "g"}));
}

TEST(KvoStatement, QuotedEndsAndCommentMarksInsideWordsAreText)
{
    EXPECT_EQ(read("x \"y z\";"), (Texts{"x", "y z"}));
    EXPECT_EQ(read("a ';' \"b\nc\" \\; d\n"),
              (Texts{"a", ";", "b\nc", ";", "d"}));
    EXPECT_EQ(read("echo a#b\n"), (Texts{"echo", "a#b"}));
}

TEST(KvoStatement, WritesQuotedWhatItRead)
{
    KvoStatement statement = statement_of("x \"y z\"");

    EXPECT_EQ(written_quoted(statement), "x \"y z\"");
}

TEST(KvoStatement, AnExclamationMarkBeginsAComment)
{
    EXPECT_EQ(read("echo a b ! note\n"), (Texts{"echo", "a", "b"}));
    EXPECT_EQ(read("echo a!b c\n"), (Texts{"echo", "a"}));
    EXPECT_EQ(read("a !! b\n"), (Texts{"a"}));
    EXPECT_EQ(read("! a\nb\n"), (Texts{"b"}));
}

TEST(KvoStatement, AHashAtTheStartOfAWordBeginsAComment)
{
    EXPECT_EQ(read("echo a #b c\n"), (Texts{"echo", "a"}));
    EXPECT_EQ(read("echo a # b c\n"), (Texts{"echo", "a"}));
}

TEST(KvoStatement, ACommentEndsWithItsStatement)
{
    EXPECT_EQ(rest_after("a # b; c\n"), " c\n");
    EXPECT_EQ(read("# a; b\n"), (Texts{"b"}));
}

TEST(KvoStatement, AQuotedHashBeginsACommentToo)
{
    EXPECT_EQ(read("a \"#b\" c\n"), (Texts{"a"}));
    EXPECT_EQ(read("a \\#b c\n"), (Texts{"a"}));
    EXPECT_EQ(read("a '!' c\n"), (Texts{"a"}));
    EXPECT_EQ(read("a \"\n\" c\n"), (Texts{"a", "c"}));
}

TEST(KvoStatement, AnApostropheInACommentSwallowsUpToTheNext)
{
    std::istringstream in("a # don't\nb # won't\nc\n");
    KvoStatement statement;

    statement.Read(in);
    EXPECT_EQ(texts_of(statement), (Texts{"a"}));
    statement.Read(in);
    EXPECT_EQ(texts_of(statement), (Texts{"c"}));
    EXPECT_EQ(RestOf(in), "");
}

TEST(KvoStatement, ALoneApostropheInACommentSwallowsTheRestOfTheScript)
{
    std::istringstream in("a # don't\nb\nc\n");
    KvoStatement statement;

    statement.Read(in);

    EXPECT_EQ(texts_of(statement), (Texts{"a", "#", "dont\nb\nc\n"}));
    EXPECT_EQ(in.rdstate(), std::ios::eofbit | std::ios::failbit);
}

TEST(KvoStatement, ABackslashBeforeTheNewlineContinuesTheLine)
{
    EXPECT_EQ(read("a b \\\n c;"), (Texts{"a", "b", "c"}));
    EXPECT_EQ(read("a b \\\n\tc\n"), (Texts{"a", "b", "c"}));
}

TEST(KvoStatement, WhatStandsAtTheVeryStartOfTheNextLineIsDroppedToo)
{
    EXPECT_EQ(read("a b \\\nc;"), (Texts{"a", "b"}));
    EXPECT_EQ(read("a b \\\nc d;"), (Texts{"a", "b", "d"}));
}

TEST(KvoStatement, ASpecialCharacterEndsTheContinuationItself)
{
    EXPECT_EQ(read("a \\\n! b\n"), (Texts{"a", "!", "b"}));
    EXPECT_EQ(rest_after("a \\\n;b\n"), "b\n");
    EXPECT_EQ(rest_after("a \\\n\nb\n"), "b\n");
}

TEST(KvoStatement, AContinuationBehindAWordJoinsIt)
{
    EXPECT_EQ(read("ab\\\ncd e\n"), (Texts{"ab\ncd", "e"}));
}

TEST(KvoStatement, TheSecondOfTwoContinuationsStays)
{
    EXPECT_EQ(read("a \\\n \\\n b\n"), (Texts{"a", "\n", "b"}));
    EXPECT_EQ(read("a \\\n\\\n b\n"), (Texts{"a", "b"}));
    EXPECT_EQ(read("a \\\n \\\n \\\n b\n"), (Texts{"a", "\n", "b"}));
}

TEST(KvoStatement, WhatStandsBehindAContinuationIsNotLookedAt)
{
    EXPECT_EQ(read("a \\\n #b c\n"), (Texts{"a", "#b", "c"}));
    EXPECT_EQ(read("a \\\n # b # c\n"), (Texts{"a", "#", "b"}));
}

TEST(KvoStatement, SkipsEmptyStatements)
{
    std::istringstream in(
        "\n  \n\n# a comment\n ; ;! another\n \\\n \n x\ny\n");
    KvoStatement statement;

    statement.Read(in);

    EXPECT_EQ(texts_of(statement), (Texts{"x"}));
    EXPECT_EQ(RestOf(in), "y\n");
}

TEST(KvoStatement, AScriptOfCommentsOnlyIsAnEmptyStatementAtItsEnd)
{
    std::istringstream in("# one\n! two\n");
    KvoStatement statement;

    statement.Read(in);

    EXPECT_EQ(statement.Count(), 0);
    EXPECT_EQ(in.rdstate(), std::ios::eofbit | std::ios::failbit);
}

TEST(KvoStatement, AtTheEndOfInputCommentsStay)
{
    EXPECT_EQ(read("x # c"), (Texts{"x", "#", "c"}));
    EXPECT_EQ(read("x ! c"), (Texts{"x", "!", "c"}));
    EXPECT_EQ(read("x \\\n y"), (Texts{"x", "\n", "y"}));
    EXPECT_EQ(read("x \\\n"), (Texts{"x", "\n"}));
}

TEST(KvoStatement, ALastStatementWithoutItsEndLeavesTheStreamFailed)
{
    std::istringstream in("a b");
    KvoStatement statement;

    statement.Read(in);

    EXPECT_EQ(texts_of(statement), (Texts{"a", "b"}));
    EXPECT_EQ(in.rdstate(), std::ios::eofbit | std::ios::failbit);
}

TEST(KvoStatement, AppendAddsAStatementBehindWhatItHolds)
{
    std::istringstream in("\n# nothing\nb c\nd\n");
    KvoStatement statement("a");

    statement.Append(in);

    EXPECT_EQ(texts_of(statement), (Texts{"a", "b", "c"}));
    EXPECT_EQ(RestOf(in), "d\n");
}

// With much in view behind a statement it is read in another way, so these are
// read with nothing and with something behind them.
TEST(KvoStatement, AppendCleansWhatItHeldAsWell)
{
    for (const std::size_t behind : {0u, 200u}) {
        std::istringstream in("b\n" + std::string(behind, '\n'));
        std::istringstream more("c d\n" + std::string(behind, '\n'));
        KvoStatement statement("#a");
        KvoStatement continued("\n");
        continued.AddArg("b");

        statement.Append(in);
        EXPECT_EQ(statement.Count(), 0);
        continued.Append(more);
        EXPECT_EQ(texts_of(continued), (Texts{"b", "c", "d"}));
    }
}

TEST(KvoStatement, AppendCleansAgainWhatAPassHasPassedOver)
{
    for (const std::size_t behind : {0u, 200u}) {
        std::istringstream in(";;b;" + std::string(behind, ';') + "c\n");
        KvoStatement statement("a");
        statement.AddArg("\n");
        statement.AddArg("\n");

        statement.Append(in);

        EXPECT_EQ(texts_of(statement), (Texts{"a", "\n"}));
        statement.Append(in);
        EXPECT_EQ(texts_of(statement), (Texts{"a"}));
        statement.Append(in);
        EXPECT_EQ(texts_of(statement), (Texts{"a", "b"}));
    }
}

TEST(KvoStatement, AppendReadsOnWhenCleaningLeavesAsManyWordsAsBefore)
{
    std::istringstream in("b\nc\nd\n");
    KvoStatement statement("\n");

    statement.Append(in);

    EXPECT_EQ(texts_of(statement), (Texts{"b", "c"}));
    EXPECT_EQ(RestOf(in), "d\n");
}

TEST(KvoStatement, AppendReadsOnAndCleansAgainWhatItPassedOver)
{
    for (const std::size_t behind : {0u, 200u}) {
        std::istringstream in("b;c;d;" + std::string(behind, ';'));
        KvoStatement statement("\n");
        statement.AddArg("\n");

        statement.Append(in);

        EXPECT_EQ(texts_of(statement), (Texts{"b", "c", "d"}));
    }
}

TEST(KvoStatement, AppendOfAStreamAtItsEndReadsNothing)
{
    std::istringstream in("a");
    in.setstate(std::ios::eofbit);
    KvoStatement statement("held");

    statement.Append(in);

    EXPECT_EQ(texts_of(statement), (Texts{"held"}));
    EXPECT_EQ(in.rdstate(), std::ios::eofbit);
}

TEST(KvoStatement, ReadReplacesWhatItHeldAlsoThroughTheBaseClass)
{
    std::istringstream in("# note\na b # c\n");
    KvoStatement statement("held");

    static_cast<KvoObject&>(statement).Read(in);

    EXPECT_EQ(texts_of(statement), (Texts{"a", "b"}));
}

TEST(KvoStatement, KeyIsTheCommandWordOrTheEmptyText)
{
    KvoStatement statement("Echo");
    KvoStatement empty;

    EXPECT_STREQ(static_cast<const char*>(statement.Key()), "Echo");
    ASSERT_NE(empty.Key(), nullptr);
    EXPECT_STREQ(static_cast<const char*>(empty.Key()), "");
    EXPECT_EQ(empty.Key(), KvoStatement().Key());
}

TEST(KvoStatement, ComparesCommandWordsWithoutRegardToCase)
{
    KvoStatement one("A");
    KvoStatement other("a");

    EXPECT_EQ(one.Compare(other.Key()), 0);
    EXPECT_LT(compared(KvoStatement("abc"), "ABD"), 0);
    EXPECT_GT(compared(KvoStatement("ABD"), "abc"), 0);
    EXPECT_LT(compared(KvoStatement("ab"), "abc"), 0);
    EXPECT_GT(compared(KvoStatement("abc"), "ab"), 0);
    EXPECT_EQ(compared(KvoStatement(), ""), 0);
    EXPECT_EQ(compared(KvoStatement(), nullptr), 0);
    EXPECT_GT(compared(KvoStatement("a"), nullptr), 0);
}

TEST(KvoStatement, ComparesOtherCharactersByTheirSmallLettersCodes)
{
    EXPECT_LT(compared(KvoStatement("_"), "A"), 0);
    EXPECT_LT(compared(KvoStatement("@"), "A"), 0);
    EXPECT_GT(compared(KvoStatement("["), "9"), 0);
    EXPECT_LT(compared(KvoStatement("["), "a"), 0);
    EXPECT_GT(compared(KvoStatement("\xe4"), "z"), 0);
    EXPECT_NE(compared(KvoStatement("\xe4"), "\xc4"), 0);
}

TEST(KvoStatement, ComparesTheSameInEveryLocale)
{
    const OtherLocale locale("tr_TR");

    EXPECT_EQ(compared(KvoStatement("INCLUDE"), "include"), 0);
}

TEST(KvoStatement, MatchesMindsTheCase)
{
    KvoStatement statement = statement_of("A b");

    EXPECT_EQ(statement.Matches("A", 0), 1);
    EXPECT_EQ(statement.Matches("a", 0), 0);
    EXPECT_EQ(statement.Matches("b", 1), 1);
    EXPECT_EQ(statement.Matches("b", 2), 0);
    EXPECT_EQ(statement.Matches("b", -1), 0);
    EXPECT_EQ(statement.Matches(nullptr, 0), 0);
}

TEST(KvoStatement, AddsTextsAsSingleWords)
{
    char writable[] = "writable";
    KvoStatement statement;

    statement.AddArg("two words");
    statement.AddArg(writable);
    statement.AddArg(static_cast<const char*>(nullptr));

    EXPECT_EQ(texts_of(statement), (Texts{"two words", "writable", ""}));
    EXPECT_EQ(written_quoted(statement), "\"two words\" writable ");
}

TEST(KvoStatement, AddsNumbersAsAStreamWritesThem)
{
    KvoStatement statement;

    statement.AddArg(0);
    statement.AddArg(-2147483647 - 1);
    statement.AddArg(2.5f);
    statement.AddArg(0.1f);
    statement.AddArg(1000000.0f);
    statement.AddArg(123456.7f);
    statement.AddArg(-0.00001f);
    statement.AddArg(0.1);
    statement.AddArg(16777217.0);

    EXPECT_EQ(texts_of(statement),
              (Texts{"0", "-2147483648", "2.5", "0.1", "1e+06", "123457",
                     "-1e-05", "0.1", "1.67772e+07"}));
}

TEST(KvoStatement, AddsNumbersTheSameInEveryLocale)
{
    const OtherLocale locale("de_DE");
    KvoStatement statement;

    statement.AddArg(1234567);
    statement.AddArg(2.5f);

    EXPECT_EQ(texts_of(statement), (Texts{"1234567", "2.5"}));
    EXPECT_EQ(statement.ExtractFloat(1), 2.5f);
}

TEST(KvoStatement, ExtractRemovesTheFirstWordOfAText)
{
    KvoStatement statement = statement_of("cmd -x b -x");

    EXPECT_EQ(statement.Extract("-x"), 1);
    EXPECT_EQ(statement.Extract("-X"), -1);
    EXPECT_EQ(statement.Extract(nullptr), -1);

    EXPECT_EQ(texts_of(statement), (Texts{"cmd", "b", "-x"}));
}

TEST(KvoStatement, ExtractTextGivesACopyAndRemovesTheWord)
{
    KvoStatement statement = statement_of("cmd one two");

    const std::unique_ptr<char[]> text(statement.ExtractText(1));

    EXPECT_STREQ(text.get(), "one");
    EXPECT_EQ(texts_of(statement), (Texts{"cmd", "two"}));
    EXPECT_EQ(statement.ExtractText(2), nullptr);
    EXPECT_EQ(statement.ExtractText(-1), nullptr);
    EXPECT_EQ(statement.Count(), 2);
}

TEST(KvoStatement, ExtractsNumbersOrZero)
{
    KvoStatement statement = statement_of("cmd 12abc 2.5e1 word 7");

    EXPECT_EQ(statement.ExtractInt(1), 12);
    EXPECT_EQ(statement.ExtractFloat(1), 25.0f);
    EXPECT_EQ(statement.ExtractInt(1), 0);
    EXPECT_EQ(statement.ExtractInt(5), 0);
    EXPECT_EQ(statement.ExtractFloat(-1), 0.0f);

    EXPECT_EQ(texts_of(statement), (Texts{"cmd", "7"}));
}

TEST(KvoStatement, EatArgRemovesAWordOrNothing)
{
    KvoStatement statement = statement_of("a b c");

    statement.EatArg(3);
    statement.EatArg(-1);
    EXPECT_EQ(statement.Count(), 3);
    statement.EatArg(0);
    EXPECT_EQ(texts_of(statement), (Texts{"b", "c"}));
    statement.EatArg(1);
    EXPECT_EQ(texts_of(statement), (Texts{"b"}));
    statement.EatArg(0);
    EXPECT_EQ(statement.Count(), 0);
    statement.EatArg(0);
    EXPECT_EQ(statement.Count(), 0);
}

TEST(KvoStatement, WithoutMemoryForAWordItReadsOneStatementAndNoMore)
{
    std::istringstream in("a # b\nc\n");
    KvoStatement statement;
    {
        const FailingMemory none;
        statement.Read(in);
    }

    EXPECT_TRUE(FailingMemory::Failed());
    EXPECT_EQ(statement.Count(), 0);
    EXPECT_EQ(RestOf(in), "c\n");
}

TEST(KvoStatement, CopiesKeepReadingAsStatements)
{
    std::istringstream in("b ! note\n");
    const KvoStatement statement("a");

    KvoStatement copy(statement);
    KvoStatement assigned;
    assigned = statement;
    copy.Append(in);

    EXPECT_EQ(texts_of(copy), (Texts{"a", "b"}));
    EXPECT_EQ(texts_of(assigned), (Texts{"a"}));
}

TEST(ZtEatBeginEndBlock, SkipsToTheEndThatBelongsToTheBlock)
{
    std::istringstream in("a\nbegin\nb\nend\nc\nend\nd\n");

    ZtEatBeginEndBlock(in);

    EXPECT_EQ(RestOf(in), "d\n");
}

TEST(ZtEatBeginEndBlock, OnlyTheFirstWordOfAStatementCounts)
{
    std::istringstream in("a begin; a end; begin x; end x; end y z; d\n");

    ZtEatBeginEndBlock(in);

    EXPECT_EQ(RestOf(in), " d\n");
}

TEST(ZtEatBeginEndBlock, MindsTheCase)
{
    std::istringstream in("Begin; END; end; d\n");

    ZtEatBeginEndBlock(in);

    EXPECT_EQ(RestOf(in), " d\n");
}

TEST(ZtEatBeginEndBlock, EndsWithTheInput)
{
    std::istringstream unfinished("a\nbegin\nb\n");
    std::istringstream no_newline("begin\nend\nend");
    std::istringstream failed("end\n");
    failed.setstate(std::ios::failbit);

    ZtEatBeginEndBlock(unfinished);
    ZtEatBeginEndBlock(no_newline);
    ZtEatBeginEndBlock(failed);

    EXPECT_TRUE(unfinished.eof());
    EXPECT_TRUE(no_newline.eof());
    failed.clear();
    EXPECT_EQ(RestOf(failed), "end\n");
}

TEST(ZtEatBeginEndBlock, SkipsBlocksOfAnyDepth)
{
    std::string input;
    for (int i = 0; i < 200000; ++i)
        input += "begin\n";
    for (int i = 0; i < 200001; ++i)
        input += "end\n";
    std::istringstream in(input + "d\n");

    ZtEatBeginEndBlock(in);

    EXPECT_EQ(RestOf(in), "d\n");
}

// What follows would take hours if the time grew with the square of the size.

TEST(KvoStatement, AMillionEmptyStatementsBehindManyWordsTakeLinearTime)
{
    KvoStatement statement;
    for (int i = 0; i < 100000; ++i)
        statement.AddArg("word");
    std::istringstream in(std::string(1000000, ';') + "end\n");

    statement.Append(in);

    EXPECT_EQ(statement.Count(), 100001);
    EXPECT_STREQ(statement.ArgText(100000), "end");
}

TEST(KvoStatement, AMillionContinuationsInAStatementTakeLinearTime)
{
    std::string input;
    for (int i = 0; i < 1000000; ++i)
        input += "\\\n w ";
    std::istringstream in(input + "\n");
    KvoStatement statement;

    statement.Read(in);

    EXPECT_EQ(statement.Count(), 1000000);
    EXPECT_STREQ(statement.ArgText(999999), "w");
}

TEST(KvoStatement, AMillionCommentsTakeLinearTime)
{
    std::string input;
    for (int i = 0; i < 1000000; ++i)
        input += "# x\n";
    std::istringstream in(input + "end\n");
    KvoStatement statement;

    statement.Read(in);

    EXPECT_EQ(texts_of(statement), (Texts{"end"}));
}
} // namespace
