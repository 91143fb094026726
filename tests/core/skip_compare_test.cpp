#include "ZT/skip.h"

#include <climits>
#include <cmath>
#include <limits>

#include <gtest/gtest.h>

namespace {

int CompareInts(int a, int b)
{
    return ZtSkipList::CompareInt(&a, &b);
}

int CompareFloats(float a, float b)
{
    return ZtSkipList::CompareFloat(&a, &b);
}

} // namespace

TEST(ZtSkipList, CompareStringTakesNullForTheEmptyText)
{
    const char* empty = "";
    const char* word = "word";
    const char* null = nullptr;

    EXPECT_LT(ZtSkipList::CompareString(&empty, &word), 0);
    EXPECT_GT(ZtSkipList::CompareString(&word, &null), 0);
    EXPECT_EQ(ZtSkipList::CompareString(&word, &word), 0);
    EXPECT_EQ(ZtSkipList::CompareString(&null, &empty), 0);
    EXPECT_EQ(ZtSkipList::CompareString(nullptr, &empty), 0);
}

TEST(ZtSkipList, CompareIntIsTheDifference)
{
    EXPECT_EQ(CompareInts(7, 5), 2);
    EXPECT_EQ(CompareInts(-7, 5), -12);
    EXPECT_EQ(CompareInts(5, 5), 0);
}

TEST(ZtSkipList, CompareIntWrapsAround)
{
    EXPECT_EQ(CompareInts(INT_MAX, -1), INT_MIN);
    EXPECT_EQ(CompareInts(INT_MIN, 1), INT_MAX);
}

TEST(ZtSkipList, CompareFloatTakesLessThanOneForEqual)
{
    EXPECT_EQ(CompareFloats(1.2f, 1.9f), 0);
    EXPECT_EQ(CompareFloats(1.9f, 1.2f), 0);
    EXPECT_EQ(CompareFloats(1.2f, 2.3f), -1);
    EXPECT_EQ(CompareFloats(5.9f, 1.2f), 4);
}

TEST(ZtSkipList, CompareFloatStaysInTheRangeOfInt)
{
    const float infinity = std::numeric_limits<float>::infinity();

    EXPECT_EQ(CompareFloats(3e38f, -3e38f), INT_MAX);
    EXPECT_EQ(CompareFloats(-1e20f, 0), INT_MIN);
    EXPECT_EQ(CompareFloats(1, infinity), INT_MIN);
    EXPECT_EQ(CompareFloats(infinity, infinity), 0);
    EXPECT_EQ(CompareFloats(std::nanf(""), 1), 0);
}

TEST(ZtSkipList, NumberOfANullRecordIsZero)
{
    const int one = 1;
    const float two = 2;

    EXPECT_EQ(ZtSkipList::CompareInt(nullptr, &one), -1);
    EXPECT_EQ(ZtSkipList::CompareFloat(&two, nullptr), 2);
}
