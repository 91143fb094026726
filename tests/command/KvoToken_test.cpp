#include "KVO/KvoToken.h"

#include <cstring>
#include <iomanip>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ZT/token.h"
#include "support/OddStreams.h"

namespace {
using Table = KvoToken::ActionTable;

/// A token as it was read, and what the stream held behind it.
struct Read
{
    std::string text;
    char quote;
    std::string rest;

    bool operator==(const Read&) const = default;
    friend std::ostream& operator<<(std::ostream& out, const Read& read)
    {
        return out << "text <" << read.text << "> quote <" << int{read.quote}
                   << "> rest <" << read.rest << ">";
    }
};

Read read_one(const std::string& input, const char* special = "")
{
    std::istringstream in(input);
    KvoToken token(special);
    token.Read(in);
    return {token.Text(), token.Quote(), RestOf(in)};
}

std::vector<std::string> read_all(const std::string& input, const char* special)
{
    std::istringstream in(input);
    KvoToken token(special);
    std::vector<std::string> texts;
    for (token.Read(in); token.Text()[0] || token.Quote(); token.Read(in))
        texts.emplace_back(token.Text());
    return texts;
}

std::string written(KvoToken& token)
{
    std::ostringstream out;
    token.Write(out);
    return out.str();
}

std::string written_quoted(KvoToken& token)
{
    std::ostringstream out;
    token.WriteQuoted(out);
    return out.str();
}

std::string read_and_written_quoted(const std::string& input,
                                    const char* special = ";")
{
    std::istringstream in(input);
    KvoToken token(special);
    token.Read(in);
    return written_quoted(token);
}

// Made before `main`, as a host's own static tokens are.
KvoToken early_token("early;");

TEST(ActionTable, GivesEachCharacterItsActions)
{
    const Table table("!;\n'");

    for (int code = 0; code < 256; ++code) {
        int expected = code <= ' ' ? Table::Blank : 0;
        if (code != 0 && std::strchr("!;\n'", code))
            expected |= Table::Special;
        if (code == '"' || code == '\'' || code == '\\')
            expected |= Table::QuoteOrEscape;
        EXPECT_EQ(table.ActionOf(static_cast<char>(code)), expected) << code;
    }
}

TEST(ActionTable, IsNamedByItsSpecialCharacters)
{
    Table table("!;\n");

    EXPECT_STREQ(table.name, "!;\n");
    EXPECT_STREQ(static_cast<const char*>(table.Key()), "!;\n");
    EXPECT_EQ(table.Compare(const_cast<char*>("!;\n")), 0);
    EXPECT_STREQ(table.ClassName(), "KvoNamedObject");
}

TEST(ActionTable, OfNullHasNoSpecialCharacters)
{
    const Table table(nullptr);

    EXPECT_STREQ(table.name, "");
    EXPECT_EQ(table.ActionOf(';'), 0);
    EXPECT_EQ(table.ActionOf(' '), Table::Blank);
}

TEST(ActionTable, ReadsTheSameWithMoreSpecialCharactersThanAScanCompares)
{
    const char* const many = "abcdefgh";

    EXPECT_EQ(read_all("xxxxxxxxxxxxxxxxxxxxxxaxxhx zb", many),
              (std::vector<std::string>{"xxxxxxxxxxxxxxxxxxxxxx", "a", "xx",
                                        "h", "x", "z", "b"}));
}

TEST(KvoToken, BlanksAreTheSixOfTheLanguage)
{
    EXPECT_STREQ(KvoToken::Blanks(), " \t\f\n\r\v");
}

TEST(KvoToken, StartsEmptyAndUnquoted)
{
    KvoToken token(";");
    KvoToken with_null(NULL);
    KvoToken with_zero(0);
    KvoToken plain;

    EXPECT_STREQ(token.Text(), "");
    EXPECT_EQ(token.Quote(), 0);
    EXPECT_EQ(written_quoted(token), "");
    EXPECT_STREQ(with_null.Text(), "");
    EXPECT_STREQ(with_zero.Text(), "");
    EXPECT_STREQ(plain.Text(), "");
}

TEST(KvoToken, IsAPlainObjectToClassInformation)
{
    KvoToken token;

    KvoObject* clone = token.Clone();

    EXPECT_STREQ(token.ClassName(), "KvoObject");
    EXPECT_STREQ(clone->ClassName(), "KvoObject");
    EXPECT_EQ(dynamic_cast<KvoToken*>(clone), nullptr);
    EXPECT_EQ(token.Key(), static_cast<KvoObject*>(&token));
    delete clone;
}

TEST(KvoToken, TokensOfTheSameSpecialCharactersShareATable)
{
    KvoToken first("shared-by-two");
    const int tables = KvoToken::actionList.count;

    KvoToken second("shared-by-two");
    KvoToken third("shared-by-none");

    EXPECT_EQ(KvoToken::actionList.count, tables + 1);
    EXPECT_NE(KvoToken::actionList.Search("shared-by-two"), nullptr);
    EXPECT_NE(KvoToken::actionList.Search("shared-by-none"), nullptr);
}

TEST(KvoToken, TablesOutliveTheirTokens)
{
    {
        KvoToken token("gone-soon");
    }

    EXPECT_NE(KvoToken::actionList.Search("gone-soon"), nullptr);
}

TEST(KvoToken, CanBeMadeBeforeMain)
{
    std::istringstream in("word early");

    early_token.Read(in);

    EXPECT_STREQ(early_token.Text(), "wo");
    EXPECT_NE(KvoToken::actionList.Search("early;"), nullptr);
}

TEST(KvoToken, SetSpecialChangesTheTableNotTheText)
{
    std::istringstream in("a;b");
    KvoToken token;
    token.Set("text");

    token.SetSpecial(";");

    EXPECT_STREQ(token.Text(), "text");
    token.Read(in);
    EXPECT_STREQ(token.Text(), "a");
    token.SetSpecial(nullptr);
    token.Read(in);
    EXPECT_STREQ(token.Text(), ";b");
}

TEST(KvoToken, SetCopiesTheTextAndForgetsTheQuote)
{
    std::istringstream in("'quoted'");
    KvoToken token;
    token.Read(in);
    std::string text = "new";

    token.Set(text.c_str());
    text = "other";

    EXPECT_STREQ(token.Text(), "new");
    EXPECT_EQ(token.Quote(), 0);
}

TEST(KvoToken, SetOfNullIsTheEmptyText)
{
    KvoToken token;
    token.Set("text");

    token.Set(nullptr);

    EXPECT_STREQ(token.Text(), "");
}

TEST(KvoToken, SetTakesItsOwnText)
{
    const std::string long_text(1000, 'x');
    KvoToken short_one;
    KvoToken long_one;
    short_one.Set("short");
    long_one.Set((long_text + "end").c_str());

    short_one.Set(short_one.Text());
    long_one.Set(long_one.Text());
    long_one.Set(long_one.Text() + 1000);

    EXPECT_STREQ(short_one.Text(), "short");
    EXPECT_STREQ(long_one.Text(), "end");
}

TEST(KvoToken, SetTakesTextsOfEveryLength)
{
    for (std::size_t bytes = 0; bytes < 200; ++bytes) {
        const std::string text(bytes, 'x');
        KvoToken token;
        token.Set("a");

        token.Set(text.c_str());

        EXPECT_EQ(token.Text(), text);
    }
}

TEST(KvoToken, CopiesAndAssignsTextQuoteAndTable)
{
    for (const std::string text :
         {"short", "a text that needs a block of its own"}) {
        std::istringstream in("'" + text + "' a;b");
        KvoToken token(";");
        token.Read(in);
        token.SetModified();

        KvoToken copy(token);
        KvoToken assigned;
        assigned = token;
        assigned = *&assigned;
        token.Set("changed");

        EXPECT_EQ(copy.Text(), text);
        EXPECT_EQ(copy.Quote(), '\'');
        EXPECT_EQ(copy.IsModified(), 0);
        EXPECT_EQ(assigned.Text(), text);
        EXPECT_EQ(assigned.Quote(), '\'');
        assigned.Read(in);
        EXPECT_STREQ(assigned.Text(), "a");
    }
}

TEST(KvoToken, SkipsBlanksAndTakesTheOneBehind)
{
    EXPECT_EQ(read_one(" \t abc def"), (Read{"abc", 0, "def"}));
}

TEST(KvoToken, EveryControlCharacterIsABlank)
{
    std::string input = "a";
    std::vector<std::string> words = {"a"};
    for (char code = 0; code < ' '; ++code) {
        input += code;
        input += "w";
        words.emplace_back("w");
    }

    EXPECT_EQ(read_all(input, ""), words);
}

TEST(KvoToken, EveryOtherByteIsOrdinary)
{
    std::string input;
    for (int code = '!'; code < 256; ++code)
        if (code != '"' && code != '\'' && code != '\\')
            input += static_cast<char>(code);

    EXPECT_EQ(read_one(input + " "), (Read{input, 0, ""}));
}

TEST(KvoToken, ASpecialCharacterIsATokenAndEndsTheOneBefore)
{
    EXPECT_EQ(read_one("a;b", ";"), (Read{"a", 0, ";b"}));
    EXPECT_EQ(read_one(";b", ";"), (Read{";", 0, "b"}));
    EXPECT_EQ(read_all("a;b", ";"), (std::vector<std::string>{"a", ";", "b"}));
}

TEST(KvoToken, TwoSpecialCharactersAreTwoTokens)
{
    EXPECT_EQ(read_all(";;", ";"), (std::vector<std::string>{";", ";"}));
    EXPECT_EQ(read_all("  ; ;a;;", ";"),
              (std::vector<std::string>{";", ";", "a", ";", ";"}));
}

TEST(KvoToken, SpecialWinsOverBlank)
{
    EXPECT_EQ(read_one(" \t\na", "\n"), (Read{"\n", 0, "a"}));
    EXPECT_EQ(read_one("a\nb", "\n"), (Read{"a", 0, "\nb"}));
}

TEST(KvoToken, SpecialWinsOverQuoteAndEscape)
{
    EXPECT_EQ(read_one("'a'", "'"), (Read{"'", 0, "a'"}));
    EXPECT_EQ(read_one("a\\b", "\\"), (Read{"a", 0, "\\b"}));
}

TEST(KvoToken, ASpecialCharacterEndsAQuotedTokenThatIsStillEmpty)
{
    EXPECT_EQ(read_one("\"\";a", ";"), (Read{"", '"', ";a"}));
}

TEST(KvoToken, NothingIsSpecialBetweenQuotes)
{
    EXPECT_EQ(read_one("\"a;b c\" d", ";"), (Read{"a;b c", '"', "d"}));
    EXPECT_EQ(read_one("\"a\\n\nb\" d"), (Read{"a\\n\nb", '"', "d"}));
}

TEST(KvoToken, TheOtherQuoteIsLiteralBetweenQuotes)
{
    EXPECT_EQ(read_one("'it\"s'"), (Read{"it\"s", '\'', ""}));
    EXPECT_EQ(read_one("\"it's\""), (Read{"it's", '"', ""}));
}

TEST(KvoToken, ABackslashMakesAnyCharacterLiteral)
{
    EXPECT_EQ(read_one("\\\"x"), (Read{"\"x", '\\', ""}));
    EXPECT_EQ(read_one("\\ x y"), (Read{" x", '\\', "y"}));
    EXPECT_EQ(read_one("\\;;", ";"), (Read{";", '\\', ";"}));
    EXPECT_EQ(read_one("\\\\ y"), (Read{"\\", '\\', "y"}));
    EXPECT_EQ(read_one("a\\\nb c", "\n"), (Read{"a\nb", '\\', "c"}));
}

TEST(KvoToken, ABackslashAtTheEndOfInputIsAnEmptyEscapedToken)
{
    EXPECT_EQ(read_one("\\"), (Read{"", '\\', ""}));
    EXPECT_EQ(read_one("a\\"), (Read{"a", '\\', ""}));
}

TEST(KvoToken, QuotedPiecesJoinWhatStandsBesideThem)
{
    EXPECT_EQ(read_one("ab\"c d\"e f"), (Read{"abc de", '"', "f"}));
    EXPECT_EQ(read_one("\"a\"'b'\\c d"), (Read{"abc", '\\', "d"}));
    EXPECT_EQ(read_one("\\a'b'\"c\" d"), (Read{"abc", '"', "d"}));
}

TEST(KvoToken, TwoQuotesInARowAreAnEmptyQuotedToken)
{
    EXPECT_EQ(read_one("\"\" a"), (Read{"", '"', "a"}));
    EXPECT_EQ(read_one("''"), (Read{"", '\'', ""}));
}

TEST(KvoToken, BlanksOnlyAreAnEmptyTokenAtTheEndOfInput)
{
    std::istringstream in("  \t\n ");
    KvoToken token;

    token.Read(in);

    EXPECT_STREQ(token.Text(), "");
    EXPECT_EQ(token.Quote(), 0);
    EXPECT_EQ(in.rdstate(), std::ios::eofbit | std::ios::failbit);
}

TEST(KvoToken, AnUnterminatedQuoteRunsToTheEndOfInput)
{
    EXPECT_EQ(read_one("\"abc"), (Read{"abc", '"', ""}));
    EXPECT_EQ(read_one("\"a b;\nc", ";\n"), (Read{"a b;\nc", '"', ""}));
}

TEST(KvoToken, TheStreamIsGoodUntilReadingRunsIntoItsEnd)
{
    std::istringstream ends_with_blank("abc ");
    std::istringstream ends_with_special("abc;");
    std::istringstream ends_with_quote("'abc'");
    KvoToken token(";");

    token.Read(ends_with_blank);
    EXPECT_TRUE(ends_with_blank.good());
    token.Read(ends_with_special);
    EXPECT_TRUE(ends_with_special.good());
    token.Read(ends_with_special);
    EXPECT_TRUE(ends_with_special.good());
    token.Read(ends_with_quote);
    EXPECT_EQ(ends_with_quote.rdstate(), std::ios::eofbit | std::ios::failbit);
}

TEST(KvoToken, ReadingForgetsTheTextAndQuoteBefore)
{
    std::istringstream in("'a long quoted text of forty characters' b");
    KvoToken token;

    token.Read(in);
    token.Read(in);

    EXPECT_STREQ(token.Text(), "b");
    EXPECT_EQ(token.Quote(), 0);
}

TEST(KvoToken, ReadsTokensOfEveryLength)
{
    for (std::size_t bytes = 1; bytes < 300; ++bytes) {
        const std::string word(bytes, 'x');

        EXPECT_EQ(read_one(word + " rest"), (Read{word, 0, "rest"}));
        EXPECT_EQ(read_one(word + ";rest", ";"), (Read{word, 0, ";rest"}));
        EXPECT_EQ(read_one("'" + word + "' rest"), (Read{word, '\'', "rest"}));
    }
}

TEST(KvoToken, WriteGivesTheTextAsItStands)
{
    std::istringstream in("'a b'");
    KvoToken token;
    token.Read(in);
    std::ostringstream out;

    out << std::setw(10) << std::setfill('*');
    token.Write(out);

    EXPECT_EQ(out.str(), "a b");
}

TEST(KvoToken, TextBehindANulIsNeitherWrittenNorSeen)
{
    const std::string input("'ab\0cd' e", 9);
    std::istringstream in(input);
    KvoToken token;

    token.Read(in);

    EXPECT_STREQ(token.Text(), "ab");
    EXPECT_EQ(written(token), "ab");
    EXPECT_EQ(written_quoted(token), "'ab'");
    EXPECT_EQ(RestOf(in), "e");
}

TEST(KvoToken, WriteQuotedUsesTheQuotesItWasReadWith)
{
    EXPECT_EQ(read_and_written_quoted("\"a;b c\""), "\"a;b c\"");
    EXPECT_EQ(read_and_written_quoted("'it\"s'"), "'it\"s'");
    EXPECT_EQ(read_and_written_quoted("plain"), "plain");
    EXPECT_EQ(read_and_written_quoted("\"\""), "\"\"");
}

TEST(KvoToken, WriteQuotedPutsABackslashInFrontOnly)
{
    EXPECT_EQ(read_and_written_quoted("\\;"), "\\;");
    EXPECT_EQ(read_and_written_quoted("\\\"x"), "\\\"x");
    EXPECT_EQ(read_and_written_quoted("a\\;b"), "\\a;b");
}

TEST(KvoToken, WriteQuotedQuotesATextThatHoldsABlank)
{
    for (const char* text : {"b c", "b\tc", "\x01", " ", "line\n"}) {
        KvoToken token(";\n");
        token.Set(text);

        EXPECT_EQ(written_quoted(token), "\"" + std::string(text) + "\"");
    }
}

TEST(KvoToken, WriteQuotedKeepsTheQuoteItChose)
{
    KvoToken token;
    token.Set("a b");
    written_quoted(token);

    EXPECT_EQ(token.Quote(), '"');
    KvoToken unchanged;
    unchanged.Set("ab");
    written_quoted(unchanged);
    EXPECT_EQ(unchanged.Quote(), 0);
}

TEST(KvoToken, WriteQuotedNeverEscapes)
{
    KvoToken token;
    token.Set("a \"b\"");

    EXPECT_EQ(written_quoted(token), "\"a \"b\"\"");
}

TEST(KvoToken, WriteQuotedLeavesSpecialCharactersBare)
{
    KvoToken token(";");
    token.Set("a;b");

    EXPECT_EQ(written_quoted(token), "a;b");
}

TEST(KvoToken, WritingToAStreamThatWasToldToThrowOnlySetsItsState)
{
    std::ostream out(nullptr);
    out.clear(std::ios::badbit);
    KvoToken token;
    token.Set("a b");
    try {
        out.exceptions(std::ios::badbit);
    } catch (const std::ios::failure&) {
        // It is bad from the start.
    }

    EXPECT_NO_THROW(token.Write(out));
    EXPECT_NO_THROW(token.WriteQuoted(out));
    EXPECT_TRUE(out.bad());
}

TEST(KvoToken, ReadsWhatWriteQuotedWroteOfQuotedTexts)
{
    for (const std::string text : {"", "a", "a b", "a;b", "#", "!", "\n"})
        for (const char quote : {'"', '\''}) {
            std::istringstream in(quote + text + quote);
            KvoToken token("!;\n");
            token.Read(in);

            EXPECT_EQ(read_one(written_quoted(token), "!;\n"),
                      (Read{text, quote, ""}));
        }
}

TEST(KvoToken, AQuoteThatIsNeverClosedTakesTimeInProportionToItsLength)
{
    std::string input(64'000'000, 'x');
    input[0] = '"';
    StreamOf<ChunkBuffer> in(input, std::size_t{4000});
    KvoToken token;

    token.Read(in);

    EXPECT_EQ(std::strlen(token.Text()), input.size() - 1);
}

TEST(KvoToken, AVeryLongWordTakesTimeInProportionToItsLength)
{
    const std::string input(64'000'000, 'x');
    StreamOf<ChunkBuffer> in(input, std::size_t{4000});
    KvoToken token;

    token.Read(in);

    EXPECT_EQ(std::strlen(token.Text()), input.size());
}
} // namespace
