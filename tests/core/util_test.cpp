#include "ZT/util.h"

#include <climits>
#include <cstring>
#include <functional>
#include <initializer_list>
#include <numeric>
#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/FailingMemory.h"
#include "support/OtherLocale.h"

namespace {

std::string Taken(char* owned)
{
    std::string text(owned);
    delete[] owned;
    return text;
}

void MakeTempStrings(int count)
{
    for (int made = 0; made < count; ++made)
        ZtNewTempString("another one");
}

} // namespace

// --- owned copies ----------------------------------------------------------

TEST(ZtNewString, CopiesTheText)
{
    const char text[] = "abc";

    char* copy = ZtNewString(text, 0);

    EXPECT_NE(copy, text);
    EXPECT_EQ(Taken(copy), "abc");
}

TEST(ZtNewString, OfNullIsTheEmptyText)
{
    EXPECT_EQ(Taken(ZtNewString(nullptr, 0)), "");
    EXPECT_EQ(Taken(ZtNewString(0, 10)), "");
}

TEST(ZtNewString, LeavesRoomForMore)
{
    char* text = ZtNewString("ab", 5);

    std::strcpy(text + 2, "cdefg"); // eight bytes in all

    EXPECT_EQ(Taken(text), "abcdefg");
}

TEST(ZtNewString, LeavesRoomBehindAnEmptyTextToo)
{
    char* text = ZtNewString(nullptr, 3);

    std::strcpy(text, "abc");

    EXPECT_EQ(Taken(text), "abc");
}

TEST(ZtNewString, TakesARoomBelowZeroAsNone)
{
    EXPECT_EQ(Taken(ZtNewString("abc", -2)), "abc");
    EXPECT_EQ(Taken(ZtNewString(nullptr, INT_MIN)), "");
}

TEST(ZtNewString, WithoutMemoryIsNull)
{
    FailingMemory none;

    EXPECT_EQ(ZtNewString("abc"), nullptr);
    EXPECT_EQ(KvoNewString("abc"), nullptr);
}

TEST(KvoNewString, DoesTheSame)
{
    char* roomy = KvoNewString("ab", 5);
    std::strcpy(roomy + 2, "cdefg");

    EXPECT_EQ(Taken(roomy), "abcdefg");
    EXPECT_EQ(Taken(KvoNewString("abc", 0)), "abc");
    EXPECT_EQ(Taken(KvoNewString(nullptr, 0)), "");
    EXPECT_EQ(Taken(KvoNewString("abc", -1)), "abc");
}

// --- temporary strings -----------------------------------------------------

TEST(ZtNewTempString, CopiesTheText)
{
    const char text[] = "abc";

    const char* copy = ZtNewTempString(text, 0);

    EXPECT_NE(copy, text);
    EXPECT_STREQ(copy, "abc");
    EXPECT_STREQ(ZtNewTempString(nullptr, 0), "");
}

TEST(ZtNewTempString, LeavesRoomForMore)
{
    char* text = ZtNewTempString("ab", 5);

    std::strcpy(text + 2, "cdefg");

    EXPECT_STREQ(text, "abcdefg");
}

TEST(ZtNewTempString, LivesThroughNinetyNineFurtherOnes)
{
    const char* first = ZtNewTempString("first");

    MakeTempStrings(99);

    EXPECT_STREQ(first, "first");
}

#if !defined(__SANITIZE_ADDRESS__)
// The freed string is looked at from inside the allocator: the next block of
// its size is the same one again.
TEST(ZtNewTempString, TheHundredthFurtherOneFreesIt)
{
    const std::string large(5000, 'x');
    const char* first = ZtNewTempString(large.c_str());
    MakeTempStrings(99);

    char* while_alive = ZtNewString(large.c_str());
    MakeTempStrings(1);
    char* when_freed = ZtNewString(large.c_str());

    EXPECT_NE(while_alive, first);
    EXPECT_EQ(when_freed, first);
    delete[] while_alive;
    delete[] when_freed;
}
#else
extern "C" int __asan_address_is_poisoned(void const volatile* address);

TEST(ZtNewTempString, TheHundredthFurtherOneFreesIt)
{
    const char* first = ZtNewTempString("first");

    MakeTempStrings(99);
    const bool alive = !__asan_address_is_poisoned(first);
    MakeTempStrings(1);

    EXPECT_TRUE(alive);
    EXPECT_TRUE(__asan_address_is_poisoned(first));
}
#endif

TEST(ZtNewTempString, TakesTheVeryStringThatItFrees)
{
    const char* first = ZtNewTempString("the oldest of all");
    MakeTempStrings(99);

    const char* copy = ZtNewTempString(first);

    EXPECT_STREQ(copy, "the oldest of all");
}

TEST(ZtNewTempString, WithoutMemoryIsEmptyOrNullIfRoomIsWanted)
{
    FailingMemory none;

    const char* empty = ZtNewTempString("abc");
    const char* roomy = ZtNewTempString("abc", 4);

    EXPECT_STREQ(empty, "");
    EXPECT_EQ(roomy, nullptr);
}

// --- formatting ------------------------------------------------------------

TEST(ZtFmt, FormatsLikePrintf)
{
    EXPECT_STREQ(ZtFmt("%s is %d, %5.2f%%", "x", -3, 2.5), "x is -3,  2.50%");
    EXPECT_STREQ(ZtFmt("plain"), "plain");
}

TEST(ZtFmt, FormatsTextOfAnyLength)
{
    for (const std::size_t length : std::initializer_list<std::size_t>{
             0, 1, 1022, 1023, 1024, 1025, 2047, 2048, 70000}) {
        const std::string text(length, 'x');
        EXPECT_EQ(ZtFmt("%s", text.c_str()), text) << length;
    }
}

TEST(ZtFmt, GivesATemporaryString)
{
    const char* first = ZtFmt("%s", "first");

    for (int made = 0; made < 99; ++made)
        ZtFmt("%d", made);

    EXPECT_STREQ(first, "first");
}

TEST(ZtFmt, TakesTheVeryStringThatItFrees)
{
    const char* first = ZtNewTempString("oldest");
    MakeTempStrings(99);

    EXPECT_STREQ(ZtFmt("<%s>", first), "<oldest>");
}

TEST(ZtFmt, TakesArgumentsThatLookLikeFormatsAsTheyStand)
{
    EXPECT_STREQ(ZtFmt("%s", "%n%s%s"), "%n%s%s");
}

TEST(ZtFmt, OfANullFormatIsEmpty)
{
    const char* no_format = nullptr;

    EXPECT_STREQ(std::invoke(ZtFmt, no_format), "");
}

TEST(ZtFmt, GivesAFormatThatTheSystemRefusesAsItStands)
{
    const wchar_t unknown[] = {wchar_t(0x7fffffff), 0}; // is no character

    EXPECT_STREQ(ZtFmt("%ls!", unknown), "%ls!");
}

TEST(ZtFmt, WithoutMemoryForALongTextIsCut)
{
    const std::string text(3000, 'x');
    const char* cut = nullptr;

    {
        FailingMemory once(0, 1);
        cut = ZtFmt("%s", text.c_str());
    }

    EXPECT_EQ(cut, std::string(1023, 'x'));
}

TEST(ZtFmt, WithoutAnyMemoryIsEmpty)
{
    FailingMemory none;

    EXPECT_STREQ(ZtFmt("%s", "abc"), "");
}

// --- quoting ---------------------------------------------------------------

TEST(ZtQuote, GivesBackWhatNeedsNoQuotes)
{
    const char word[] = "abc";

    EXPECT_EQ(ZtQuote(word, '"', '"', " \t"), word);
    EXPECT_EQ(ZtQuote(word, '"', '"', ""), word);
}

TEST(ZtQuote, WrapsWhatHoldsASpecialCharacter)
{
    EXPECT_STREQ(ZtQuote("a b", '"', '"', " \t"), "\"a b\"");
    EXPECT_STREQ(ZtQuote("a\tb", '(', ')', " \t"), "(a\tb)");
}

TEST(ZtQuote, WrapsTheEmptyText)
{
    EXPECT_STREQ(ZtQuote("", '[', ']', " "), "[]");
}

TEST(ZtQuote, WrapsEverythingWithoutSpecialCharacters)
{
    EXPECT_STREQ(ZtQuote("abc", '<', '>', nullptr), "<abc>");
}

TEST(ZtQuote, TakesNullAsTheEmptyText)
{
    EXPECT_STREQ(ZtQuote(nullptr, '[', ']', " "), "[]");
    EXPECT_STREQ(ZtQuote(nullptr, '[', ']', nullptr), "[]");
}

TEST(ZtQuote, WrapsTextOfAnyLength)
{
    for (const std::size_t length : std::initializer_list<std::size_t>{
             1020, 1021, 1022, 1023, 1024, 70000}) {
        const std::string text(length, 'x');
        EXPECT_EQ(ZtQuote(text.c_str(), '<', '>', nullptr), "<" + text + ">");
    }
}

TEST(ZtQuote, EndsAtAQuoteCharacterThatIsNone)
{
    EXPECT_STREQ(ZtQuote("abc", '\0', '>', nullptr), "");
    EXPECT_STREQ(ZtQuote("abc", '<', '\0', nullptr), "<abc");
}

TEST(ZtQuote, GivesATemporaryString)
{
    const char* first = ZtQuote("a b", '"', '"', " ");
    MakeTempStrings(99);

    EXPECT_STREQ(first, "\"a b\"");
    EXPECT_STREQ(ZtQuote(first, '<', '>', " "), "<\"a b\">");
}

TEST(ZtQuote, WithoutMemoryIsEmpty)
{
    const char word[] = "abc";
    FailingMemory none;

    EXPECT_STREQ(ZtQuote("a b", '"', '"', " "), "");
    EXPECT_EQ(ZtQuote(word, '"', '"', " "), word);
}

TEST(KvoQuote, DoesTheSame)
{
    const char word[] = "abc";

    EXPECT_EQ(KvoQuote(word, '"', '"', " \t"), word);
    EXPECT_STREQ(KvoQuote("a b", '"', '"', " \t"), "\"a b\"");
    EXPECT_STREQ(KvoQuote("", '[', ']', " "), "[]");
    EXPECT_STREQ(KvoQuote("abc", '<', '>', nullptr), "<abc>");
}

// --- integers with suffixes ------------------------------------------------

TEST(ZtScanInteger, ReadsDecimalHexadecimalAndOctal)
{
    EXPECT_EQ(ZtScanInteger("16"), 16);
    EXPECT_EQ(ZtScanInteger("0x10"), 16);
    EXPECT_EQ(ZtScanInteger("0X1f"), 31);
    EXPECT_EQ(ZtScanInteger("010"), 8);
    EXPECT_EQ(ZtScanInteger("-5"), -5);
    EXPECT_EQ(ZtScanInteger(" +5"), 5);
    EXPECT_EQ(ZtScanInteger("0"), 0);
}

TEST(ZtScanInteger, ShiftsByItsSuffixes)
{
    EXPECT_EQ(ZtScanInteger("4k"), 4096);
    EXPECT_EQ(ZtScanInteger("4K"), 4096);
    EXPECT_EQ(ZtScanInteger("3M"), 3145728);
    EXPECT_EQ(ZtScanInteger("3m"), 3145728);
    EXPECT_EQ(ZtScanInteger("2KK"), 2097152);
    EXPECT_EQ(ZtScanInteger("1kM"), 1 << 30);
    EXPECT_EQ(ZtScanInteger("-1k"), -1024);
    EXPECT_EQ(ZtScanInteger("0x10k"), 16384);
}

TEST(ZtScanInteger, CountsFromOneWhenThereIsNoDigit)
{
    EXPECT_EQ(ZtScanInteger("K"), 1024);
    EXPECT_EQ(ZtScanInteger("m"), 1 << 20);
    EXPECT_EQ(ZtScanInteger(""), 1);
    EXPECT_EQ(ZtScanInteger("abc"), 1);
    EXPECT_EQ(ZtScanInteger("-"), 1);
    EXPECT_EQ(ZtScanInteger("-k"), 1);
    EXPECT_EQ(ZtScanInteger(nullptr), 1);
}

TEST(ZtScanInteger, StopsAtTheFirstOtherCharacter)
{
    EXPECT_EQ(ZtScanInteger("7q"), 7);
    EXPECT_EQ(ZtScanInteger("7qk"), 7);
    EXPECT_EQ(ZtScanInteger("7kqk"), 7168);
    EXPECT_EQ(ZtScanInteger("7 k"), 7);
    EXPECT_EQ(ZtScanInteger("7k8k"), 7168);
    EXPECT_EQ(ZtScanInteger("0x"), 0);
    EXPECT_EQ(ZtScanInteger("08"), 0);
}

TEST(ZtScanInteger, TakesNumbersBeyondIntAsItsNearestEnd)
{
    EXPECT_EQ(ZtScanInteger("2147483647"), INT_MAX);
    EXPECT_EQ(ZtScanInteger("4294967295"), INT_MAX);
    EXPECT_EQ(ZtScanInteger("0xffffffff"), INT_MAX);
    EXPECT_EQ(ZtScanInteger("99999999999999999999"), INT_MAX);
    EXPECT_EQ(ZtScanInteger("-99999999999999999999"), INT_MIN);
}

TEST(ZtScanInteger, ShiftsBitsOutAtTheTop)
{
    EXPECT_EQ(ZtScanInteger("2M"), 2097152);
    EXPECT_EQ(ZtScanInteger("2048M"), INT_MIN);
    EXPECT_EQ(ZtScanInteger("4096M"), 0);
    EXPECT_EQ(ZtScanInteger("1KKKK"), 0);
    EXPECT_EQ(ZtScanInteger(std::string(5000, 'M').c_str()), 0);
}

TEST(ZtScanInteger, KnowsItsLettersInEveryLocale)
{
    OtherLocale turkish("tr_TR");

    EXPECT_EQ(ZtScanInteger("4k"), 4096);
    EXPECT_EQ(ZtScanInteger("4\xc4\xb1k"), 4);
}

// --- argument vectors ------------------------------------------------------

class ArgumentVector : public testing::Test
{
protected:
    char words[4][4] = {"a", "b", "c", "d"};
    char beyond[4] = "e";
    char* argv[5] = {words[0], words[1], words[2], words[3], beyond};
    int argc = 4;

    std::string Joined() const
    {
        std::string text;
        for (int place = 0; place < argc; ++place)
            text += argv[place];
        return text;
    }
};

using ZtEatArgTest = ArgumentVector;

TEST_F(ZtEatArgTest, RemovesTheFirstAMiddleAndTheLast)
{
    ZtEatArg(argc, argv, 1);
    EXPECT_EQ(Joined(), "acd");

    ZtEatArg(argc, argv, 2);
    EXPECT_EQ(Joined(), "ac");

    ZtEatArg(argc, argv, 0);
    EXPECT_EQ(Joined(), "c");

    ZtEatArg(argc, argv, 0);
    EXPECT_EQ(argc, 0);
}

TEST_F(ZtEatArgTest, EndsTheVectorWithNull)
{
    ZtEatArg(argc, argv, 0);

    EXPECT_EQ(argv[3], nullptr);
    EXPECT_EQ(argv[4], beyond);
}

TEST_F(ZtEatArgTest, ChangesNothingForAnIndexOutside)
{
    for (int index : {-1, 4, 5, INT_MAX, INT_MIN})
        ZtEatArg(argc, argv, index);

    EXPECT_EQ(argc, 4);
    EXPECT_EQ(Joined(), "abcd");
    EXPECT_EQ(argv[4], beyond);
}

TEST_F(ZtEatArgTest, ChangesNothingInAnEmptyVector)
{
    argc = 0;

    ZtEatArg(argc, argv, 0);
    ZtEatArg(argc, nullptr, 0);

    EXPECT_EQ(argc, 0);
    EXPECT_EQ(argv[0], words[0]);
}

// --- hash ------------------------------------------------------------------

TEST(ZtHash, HashesEachByteInTurn)
{
    EXPECT_EQ(ZtHash(""), 0u);
    EXPECT_EQ(ZtHash("a"), 97u);
    EXPECT_EQ(ZtHash("ab"), 3299u);
    EXPECT_EQ(ZtHash(nullptr), 0u);
}

TEST(ZtHash, TakesBytesAsUnsigned)
{
    EXPECT_EQ(ZtHash("\xff"), 255u);
    EXPECT_EQ(ZtHash("\xff\x80"), 255u * 33 + 128);
}

TEST(ZtHash, WrapsAroundAt32Bits)
{
    std::uint64_t wide = 0;
    const std::string text = "a long enough text to wrap around";
    for (char c : text)
        wide = (wide * 33 + static_cast<unsigned char>(c)) % (1ull << 32);

    EXPECT_EQ(ZtHash(text.c_str()), wide);
}

// --- divisors and multiples ------------------------------------------------

TEST(ZtGCD, FindsTheGreatestCommonDivisor)
{
    EXPECT_EQ(ZtGCD(12, 18), 6);
    EXPECT_EQ(ZtGCD(18, 12), 6);
    EXPECT_EQ(ZtGCD(5, 0), 5);
    EXPECT_EQ(ZtGCD(0, 7), 7);
    EXPECT_EQ(ZtGCD(0, 0), 0);
    EXPECT_EQ(ZtGCD(17, 5), 1);
    EXPECT_EQ(ZtGCD(6000000000l, 4000000000l), 2000000000l);
}

TEST(ZtGCD, AgreesWithTheStandardLibrary)
{
    std::mt19937 random(20260101);
    for (int round = 0; round < 5000; ++round) {
        const int a = static_cast<int>(random() >> 1);
        const int b = static_cast<int>(random() >> (1 + random() % 24));
        EXPECT_EQ(ZtGCD(a, b), std::gcd(a, b));
        EXPECT_EQ(ZtGCD(long(a) * 3, long(b) * 3),
                  std::gcd(long(a) * 3, long(b) * 3));
    }
}

TEST(ZtGCD, KeepsTheSignThatTheRemaindersGive)
{
    EXPECT_EQ(ZtGCD(-12, 18), 6);
    EXPECT_EQ(ZtGCD(12, -18), -6);
    EXPECT_EQ(ZtGCD(-12, -18), -6);
    EXPECT_EQ(ZtGCD(-5, 0), -5);
    EXPECT_EQ(ZtGCD(4, -2), -2);
}

TEST(ZtGCD, SurvivesTheMostNegativeNumber)
{
    EXPECT_EQ(ZtGCD(INT_MIN, -1), -1);
    EXPECT_EQ(ZtGCD(LONG_MIN, -1l), -1);
    EXPECT_EQ(ZtGCD(INT_MIN, INT_MIN), INT_MIN);
    EXPECT_EQ(ZtGCD(-1, INT_MIN), -1);
    EXPECT_EQ(ZtGCD(INT_MIN, 0), INT_MIN);
}

TEST(ZtLCM, FindsTheLeastCommonMultiple)
{
    EXPECT_EQ(ZtLCM(4, 6), 12);
    EXPECT_EQ(ZtLCM(7, 0), 0);
    EXPECT_EQ(ZtLCM(96000l, 44100l), 14112000l);
}

TEST(ZtLCM, OfTwoZerosIsZero)
{
    EXPECT_EQ(ZtLCM(0, 0), 0);
    EXPECT_EQ(ZtLCM(0l, 0l), 0l);
}

TEST(ZtLCM, FormsTheProductFirstAndWraps)
{
    // 96000 * 95999 is 9215904000, which leaves 625969408 in 32 bits.
    EXPECT_EQ(ZtLCM(96000, 95999), 625969408);
    EXPECT_EQ(ZtLCM(96000l, 95999l), 9215904000l);
    // 60000 * 90000 is 5400000000, which leaves 1105032704; over 30000.
    EXPECT_EQ(ZtLCM(60000, 90000), 36834);
    EXPECT_EQ(ZtLCM(1l << 62, 6l), -(1l << 62));
}

TEST(ZtLCM, SurvivesTheMostNegativeNumber)
{
    EXPECT_EQ(ZtLCM(INT_MIN, -1), INT_MIN);
    EXPECT_EQ(ZtLCM(INT_MIN, 1), INT_MIN);
    EXPECT_EQ(ZtLCM(-1, INT_MIN), INT_MIN);
    EXPECT_EQ(ZtLCM(LONG_MIN, -1l), LONG_MIN);
}
