#include "core/text_stream.h"

#include <random>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

using zt_core::TextStream;

TEST(TextStream, ReadsTheTextUpToItsEnd)
{
    TextStream in("ab");

    EXPECT_EQ(in.get(), 'a');
    EXPECT_EQ(in.get(), 'b');
    EXPECT_TRUE(in.good());
    EXPECT_EQ(in.get(), std::char_traits<char>::eof());
    EXPECT_TRUE(in.eof());
    EXPECT_TRUE(in.fail());
}

TEST(TextStream, OfNullAndOfTheEmptyTextIsAtItsEnd)
{
    for (const char* text : {static_cast<const char*>(nullptr), ""}) {
        TextStream in(text);

        EXPECT_TRUE(in.good());
        EXPECT_EQ(in.get(), std::char_traits<char>::eof());
    }
}

TEST(TextStream, TakesACharacterBackThatItGave)
{
    TextStream in("ab");

    in.get();
    in.putback('a');

    EXPECT_TRUE(in.good());
    EXPECT_EQ(in.get(), 'a');
}

TEST(TextStream, TakesNoOtherCharacterBackAndLeavesTheTextAlone)
{
    char text[] = "ab";
    TextStream in(text);

    in.get();
    in.putback('x');

    EXPECT_TRUE(in.bad());
    EXPECT_STREQ(text, "ab");
}

TEST(TextStream, CannotGoBackBeforeTheText)
{
    TextStream in("ab");

    in.unget();

    EXPECT_TRUE(in.bad());
}

TEST(TextStream, ReadsBytesFrom128Up)
{
    TextStream in("\xff\x80");

    EXPECT_EQ(in.get(), 0xff);
    EXPECT_EQ(in.get(), 0x80);
}

TEST(TextStream, ReadsLikeAStringStream)
{
    std::mt19937 random(20260101);
    std::string text(2000, ' ');
    for (char& c : text)
        c = static_cast<char>(1 + random() % 255);
    TextStream in(text.c_str());
    std::istringstream model(text);

    for (int step = 0; step < 5000; ++step) {
        if (random() % 3 == 0) {
            in.unget();
            model.unget();
        } else {
            EXPECT_EQ(in.get(), model.get());
        }
        EXPECT_EQ(in.rdstate(), model.rdstate());
    }
}
