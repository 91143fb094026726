#include "prompt/quote_state.h"

#include <KVO/KvoToken.h>

#include <random>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

using ztsh::QuoteState;

namespace {

bool OpenAfter(const std::string& text)
{
    QuoteState state;
    state.Add(text);
    return state.Open();
}

/// Tells whether the tokenizer finds itself inside quotes at the end of
/// `text`: a word put there does not stand alone.
bool InsideQuotes(const std::string& text)
{
    std::istringstream in(text + "\nmark\n");
    KvoTokenList tokens("!", ";\n");
    bool alone = false;
    while (in.good()) {
        tokens.Read(in);
        alone = alone || (tokens.Count() == 1 && tokens.Find("mark"));
    }
    return !alone;
}

} // namespace

TEST(QuoteState, IsOpenInsideEitherQuote)
{
    EXPECT_TRUE(OpenAfter("Echo \"a\n"));
    EXPECT_TRUE(OpenAfter("Echo 'a\n"));
    EXPECT_FALSE(OpenAfter("Echo \"a\" 'b'\n"));
    EXPECT_TRUE(OpenAfter("Echo \"a' b'\n"));
}

TEST(QuoteState, IsOpenBehindAnEscapedNewline)
{
    EXPECT_TRUE(OpenAfter("Echo a \\\n"));
    EXPECT_FALSE(OpenAfter("Echo a \\\n b\n"));
    EXPECT_FALSE(OpenAfter("Echo a \\\\\n"));
}

TEST(QuoteState, AnEscapedQuoteOpensNothing)
{
    EXPECT_FALSE(OpenAfter("Echo it\\'s\n"));
}

TEST(QuoteState, ABackslashInsideQuotesEscapesNothing)
{
    EXPECT_FALSE(OpenAfter("Echo \"a\\\"\n"));
}

TEST(QuoteState, AQuoteInACommentIsOpenToo)
{
    EXPECT_TRUE(OpenAfter("Echo a # it's\n"));
}

TEST(QuoteState, GoesOnFromLineToLine)
{
    QuoteState state;

    state.Add("Echo \"a\n");
    EXPECT_EQ(state.Quote(), '"');
    state.Add("b\"\n");

    EXPECT_FALSE(state.Open());
}

TEST(QuoteState, AgreesWithTheTokenizer)
{
    std::mt19937 random(7);
    const std::string letters = "a \"'\\;\n#!";
    for (int i = 0; i < 5000; ++i) {
        std::string text;
        for (auto length = random() % 20; length > 0; --length)
            text += letters[random() % letters.size()];
        QuoteState state;
        state.Add(text + "\n");
        // An escaped newline joins the mark to a word of its own making.
        if (state.Open() && state.Quote() == '\0')
            continue;

        ASSERT_EQ(state.Quote() != '\0', InsideQuotes(text)) << text;
    }
}
