#include <clocale>
#include <cstring>
#include <malloc.h>
#include <new>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "KVO/KvoToken.h"
#include "support/FailingMemory.h"
#include "support/OddStreams.h"
#include "support/OtherLocale.h"

namespace {
std::vector<std::string> texts_of(const KvoTokenList& list)
{
    std::vector<std::string> texts;
    for (int i = 0; i < list.Count(); ++i)
        texts.emplace_back(list.ArgText(i));
    return texts;
}

using Texts = std::vector<std::string>;

Texts read(const std::string& input, const char* special, const char* end)
{
    std::istringstream in(input);
    KvoTokenList list(special, end);
    list.Read(in);
    return texts_of(list);
}

KvoTokenList list_of(const std::string& input)
{
    std::istringstream in(input);
    KvoTokenList list("!", ";");
    list.Read(in);
    return list;
}

std::string written(KvoTokenList& list)
{
    std::ostringstream out;
    list.Write(out);
    return out.str();
}

std::string written_quoted(KvoTokenList& list)
{
    std::ostringstream out;
    list.WriteQuoted(out);
    return out.str();
}

TEST(KvoTokenList, StartsEmptyWhateverItIsMadeOf)
{
    EXPECT_EQ(KvoTokenList().Count(), 0);
    EXPECT_EQ(KvoTokenList(NULL, NULL).Count(), 0);
    EXPECT_EQ(KvoTokenList(0, 0).Count(), 0);
    EXPECT_EQ(KvoTokenList("a", nullptr).Count(), 0);
}

TEST(KvoTokenList, IsAPlainObjectToClassInformation)
{
    KvoTokenList list = list_of("a b");

    KvoObject* clone = list.Clone();

    EXPECT_STREQ(list.ClassName(), "KvoObject");
    EXPECT_EQ(dynamic_cast<KvoTokenList*>(clone), nullptr);
    EXPECT_EQ(list.Key(), static_cast<KvoObject*>(&list));
    delete clone;
}

TEST(KvoTokenList, ReadsUpToAnEndCharacterAndTakesIt)
{
    std::istringstream in("a b; c");
    KvoTokenList list("", ";");

    list.Read(in);

    EXPECT_EQ(texts_of(list), (Texts{"a", "b"}));
    EXPECT_TRUE(in.good());
    EXPECT_EQ(RestOf(in), " c");
}

TEST(KvoTokenList, ReadsToTheEndOfInputAndKeepsTheLastToken)
{
    EXPECT_EQ(read("a b", "", ";"), (Texts{"a", "b"}));
    EXPECT_EQ(read("a b ", "", ";"), (Texts{"a", "b"}));
}

TEST(KvoTokenList, AnyEndCharacterEndsTheRun)
{
    EXPECT_EQ(read("a\nb;c", "", ";\n"), (Texts{"a"}));
    EXPECT_EQ(read("a;b\nc", "", ";\n"), (Texts{"a"}));
    EXPECT_EQ(read(";a", "", ";\n"), Texts{});
}

TEST(KvoTokenList, EndAndSpecialCharactersAreTokensOfTheirOwn)
{
    EXPECT_EQ(read("a/b:c;d", "/:", ";"), (Texts{"a", "/", "b", ":", "c"}));
}

TEST(KvoTokenList, WithoutEndCharactersReadsEverything)
{
    EXPECT_EQ(read("/usr/quarn", "/", ""), (Texts{"/", "usr", "/", "quarn"}));
    EXPECT_EQ(read("a;\nb", nullptr, nullptr), (Texts{"a;", "b"}));
}

TEST(KvoTokenList, AQuotedOrEscapedEndCharacterIsAnArgument)
{
    EXPECT_EQ(read("a \";\" b;c", "", ";"), (Texts{"a", ";", "b"}));
    EXPECT_EQ(read("a \\; b;c", "", ";"), (Texts{"a", ";", "b"}));
}

TEST(KvoTokenList, KeepsEmptyQuotedTokens)
{
    EXPECT_EQ(read("a \"\" '' b", "", ";"), (Texts{"a", "", "", "b"}));
}

TEST(KvoTokenList, AppendAddsBehindWhatItHolds)
{
    std::istringstream in("a b; c d; e");
    KvoTokenList list("", ";");

    list.Append(in);
    list.Append(in);

    EXPECT_EQ(texts_of(list), (Texts{"a", "b", "c", "d"}));
}

TEST(KvoTokenList, ReadReplacesWhatItHolds)
{
    std::istringstream in("a b; c");
    KvoTokenList list("", ";");

    list.Read(in);
    list.Read(in);

    EXPECT_EQ(texts_of(list), (Texts{"c"}));
}

TEST(KvoTokenList, ReadOfAStreamAtItsEndLeavesItEmpty)
{
    std::istringstream in("a");
    KvoTokenList list("", ";");
    list.Read(in);

    list.Read(in);

    EXPECT_EQ(list.Count(), 0);
}

TEST(KvoTokenList, AppendTouchesNothingOfAStreamThatIsNotGood)
{
    std::istringstream in("a b");
    in.setstate(std::ios::eofbit);
    KvoTokenList list = list_of("x");

    list.Append(in);

    EXPECT_EQ(texts_of(list), (Texts{"x"}));
    EXPECT_EQ(in.rdstate(), std::ios::eofbit);
    in.clear();
    EXPECT_EQ(RestOf(in), "a b");
}

TEST(KvoTokenList, ReadIsReachedThroughTheBaseClass)
{
    std::istringstream in("a b; c");
    KvoTokenList list("", ";");

    static_cast<KvoObject&>(list).Read(in);

    EXPECT_EQ(list.Count(), 2);
}

TEST(KvoTokenList, WritePutsOneSpaceBetweenTwoTokens)
{
    KvoTokenList list = list_of("a   'b c';");
    KvoTokenList empty;

    EXPECT_EQ(written(list), "a b c");
    EXPECT_EQ(written(empty), "");
}

TEST(KvoTokenList, WriteQuotedQuotesEachTokenByItself)
{
    KvoTokenList list = list_of("a \"b c\" 'd' \\;;");
    KvoTokenList set = list_of("a b");
    set.Replace(1, "b c");

    EXPECT_EQ(written_quoted(list), "a \"b c\" 'd' \\;");
    EXPECT_EQ(written_quoted(set), "a \"b c\"");
}

TEST(KvoTokenList, AnEmptyUnquotedTokenIsWrittenAsNothing)
{
    KvoTokenList list = list_of("a b c");
    list.Replace(1, "");

    EXPECT_EQ(written(list), "a  c");
}

TEST(KvoTokenList, FindsTheFirstTokenOfATextCaseIncluded)
{
    const KvoTokenList list = list_of("a B b b");

    EXPECT_EQ(list.FindPos("b"), 2);
    EXPECT_EQ(list.Find("b"), list.Find(2));
    EXPECT_EQ(list.FindPos("B"), 1);
    EXPECT_EQ(list.FindPos("c"), -1);
    EXPECT_EQ(list.Find("c"), nullptr);
    EXPECT_EQ(list.FindPos(nullptr), -1);
    EXPECT_EQ(list.Find(static_cast<const char*>(nullptr)), nullptr);
}

TEST(KvoTokenList, FindsNothingOutsideItsPositions)
{
    const KvoTokenList list = list_of("a b");

    EXPECT_STREQ(list.Find(0)->Text(), "a");
    EXPECT_STREQ(list.Find(1)->Text(), "b");
    EXPECT_EQ(list.Find(-1), nullptr);
    EXPECT_EQ(list.Find(2), nullptr);
}

TEST(KvoTokenList, ReplaceSetsTheFirstTokenOfAText)
{
    KvoTokenList list = list_of("a 'b' b");

    EXPECT_EQ(list.Replace("b", "x y"), 1);
    EXPECT_EQ(list.Replace("none", "z"), 0);
    EXPECT_EQ(list.Replace(nullptr, "z"), 0);

    EXPECT_EQ(texts_of(list), (Texts{"a", "x y", "b"}));
    EXPECT_EQ(list.Find(1)->Quote(), 0);
}

TEST(KvoTokenList, ReplaceSetsTheTokenAtAPosition)
{
    KvoTokenList list = list_of("a 'b'");

    EXPECT_EQ(list.Replace(0, "x"), 1);
    EXPECT_EQ(list.Replace(1, nullptr), 1);
    EXPECT_EQ(list.Replace(2, "z"), 0);
    EXPECT_EQ(list.Replace(-1, "z"), 0);

    EXPECT_EQ(texts_of(list), (Texts{"x", ""}));
    EXPECT_EQ(list.Find(1)->Quote(), 0);
}

TEST(KvoTokenList, GivesTextsAndNumbersOrNothing)
{
    const KvoTokenList list = list_of("12abc -7 2.5 1e2x word \"\"");

    EXPECT_STREQ(list.ArgText(0), "12abc");
    EXPECT_EQ(list.ArgText(-1), nullptr);
    EXPECT_EQ(list.ArgText(6), nullptr);
    EXPECT_EQ(list.ArgInt(0), 12);
    EXPECT_EQ(list.ArgInt(1), -7);
    EXPECT_EQ(list.ArgInt(2), 2);
    EXPECT_EQ(list.ArgInt(4), 0);
    EXPECT_EQ(list.ArgInt(5), 0);
    EXPECT_EQ(list.ArgInt(6), 0);
    EXPECT_EQ(list.ArgInt(-1), 0);
    EXPECT_EQ(list.ArgFloat(2), 2.5f);
    EXPECT_EQ(list.ArgFloat(3), 100.0f);
    EXPECT_EQ(list.ArgFloat(4), 0.0f);
    EXPECT_EQ(list.ArgFloat(6), 0.0f);
    EXPECT_EQ(list.ArgFloat(-1), 0.0f);
}

TEST(KvoTokenList, ReadsNumbersTheSameInEveryLocale)
{
    const OtherLocale locale("de_DE");
    const KvoTokenList list = list_of("2.5 1.234");

    EXPECT_EQ(list.ArgFloat(0), 2.5f);
    EXPECT_EQ(list.ArgFloat(1), 1.234f);
}

TEST(KvoTokenList, ClearLeavesNothing)
{
    KvoTokenList list = list_of("a b c");

    list.Clear();

    EXPECT_EQ(list.Count(), 0);
    EXPECT_EQ(list.Find(0), nullptr);
    EXPECT_EQ(written(list), "");
    list.Clear();
    EXPECT_EQ(list.Count(), 0);
}

TEST(KvoTokenList, ATokenThatIsUsedAgainIsLikeANewOne)
{
    std::istringstream in("a 'b'; c;d !;");
    KvoTokenList list("!", ";");
    list.Read(in);
    list.Find(0)->SetSpecial("c");
    list.Find(0)->SetModified();
    list.Find(1)->Set("a text that needs a block of its own");

    list.Read(in);
    list.Append(in);

    EXPECT_EQ(texts_of(list), (Texts{"c", "d", "!"}));
    for (int i = 0; i < list.Count(); ++i) {
        EXPECT_EQ(list.Find(i)->IsModified(), 0);
        EXPECT_EQ(list.Find(i)->Quote(), 0);
    }
    std::istringstream more("xcx!");
    list.Find(0)->Read(more);
    EXPECT_STREQ(list.Find(0)->Text(), "xcx");
}

TEST(KvoTokenList, CopiesAndAssignsItsTokens)
{
    std::istringstream in("e;f");
    KvoTokenList list = list_of("a 'b c' d");
    list.SetModified();

    KvoTokenList copy(list);
    KvoTokenList assigned;
    assigned = list;
    assigned = *&assigned;
    list.Replace(0, "changed");

    EXPECT_EQ(texts_of(copy), (Texts{"a", "b c", "d"}));
    EXPECT_EQ(copy.Find(1)->Quote(), '\'');
    EXPECT_EQ(copy.IsModified(), 0);
    EXPECT_EQ(texts_of(assigned), (Texts{"a", "b c", "d"}));
    assigned.Append(in);
    EXPECT_EQ(texts_of(assigned), (Texts{"a", "b c", "d", "e"}));
}

TEST(KvoTokenList, ACopyOfAnEmptyListTakesNothingFromTheMemoryItIsMadeIn)
{
    alignas(KvoTokenList) unsigned char room[sizeof(KvoTokenList)];
    std::memset(room, 0xA5, sizeof room);
    const KvoTokenList empty("", ";");
    std::istringstream in("a b;c");

    KvoTokenList* copy = new (room) KvoTokenList(empty);
    copy->Read(in);

    EXPECT_EQ(texts_of(*copy), (Texts{"a", "b"}));
    copy->~KvoTokenList();
}

TEST(KvoTokenList, AnAssignedListForgetsItsOwnTokens)
{
    KvoTokenList list = list_of("a b c d e f");

    list = list_of("x");

    EXPECT_EQ(texts_of(list), (Texts{"x"}));
}

TEST(KvoTokenList, HoldsManyTokensAndFewAgain)
{
    std::string input;
    for (int i = 0; i < 100000; ++i)
        input += std::to_string(i) + " ";
    std::istringstream in(input + "; a b ;");
    KvoTokenList list("", ";");

    list.Read(in);
    EXPECT_EQ(list.Count(), 100000);
    EXPECT_EQ(list.ArgInt(77777), 77777);
    list.Read(in);

    EXPECT_EQ(texts_of(list), (Texts{"a", "b"}));
}

// Counts what the allocator of the system has given out, which is none at all
// where another one stands in for it.
TEST(KvoTokenList, GivesBackWhatTheNextRunWillNotNeed)
{
    constexpr std::size_t megabyte = std::size_t{1} << 20;
    std::string many;
    for (int i = 0; i < 100000; ++i)
        many += "x ";
    std::istringstream short_ones(many + ";");
    std::istringstream long_one(std::string(4 * megabyte, 'x') + " ;");
    KvoTokenList list("", ";");
    const auto given_out = [] {
        const auto info = mallinfo2();
        return info.uordblks + info.hblkhd;
    };
    const std::size_t before = given_out();

    list.Read(short_ones);
    list.Clear();
    EXPECT_LT(given_out(), before + 2 * megabyte);
    list.Read(long_one);
    list.Clear();
    EXPECT_LT(given_out(), before + 2 * megabyte);
}

TEST(KvoTokenList, RunsOfAllSortsInOneListLeaveTheOneBehind)
{
    std::mt19937 dice(7);
    const std::vector<std::string> words = {
        "a", "word", "twenty_three_characters", "exactly_twenty_four_of_c",
        "a_word_of_more_characters_than_fit_into_a_token_itself"};
    KvoTokenList list("", ";");

    for (int round = 0; round < 2000; ++round) {
        Texts expected;
        std::string input;
        for (auto i = dice() % 90; i > 0; --i) {
            expected.push_back(words[dice() % words.size()]);
            input += expected.back() + " ";
        }
        std::istringstream in(input + ";");

        list.Read(in);

        ASSERT_EQ(texts_of(list), expected);
    }
}

TEST(KvoTokenList, WithoutMemoryForATokenTheRestOfTheRunIsDropped)
{
    std::istringstream in("a b 'c d' e; f; g");
    KvoTokenList list("", ";");
    list.Read(in);
    in.seekg(0);
    KvoTokenList small("", ";");
    {
        const FailingMemory memory(2);
        small.Read(in);
    }

    EXPECT_TRUE(FailingMemory::Failed());
    EXPECT_EQ(texts_of(small), (Texts{"a", "b"}));
    EXPECT_TRUE(in.good());
    small.Read(in);
    EXPECT_EQ(texts_of(small), (Texts{"f"}));
}

TEST(KvoTokenList, WithoutMemoryACopyHoldsWhatThereWasRoomFor)
{
    const KvoTokenList list = list_of("a b c d");
    int copied = -1;
    {
        const FailingMemory memory(3);
        const KvoTokenList copy(list);
        copied = copy.Count();
    }

    EXPECT_TRUE(FailingMemory::Failed());
    EXPECT_EQ(copied, 2);
}
} // namespace
