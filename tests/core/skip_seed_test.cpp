#include "KVO/KvoSkipList.h"
#include "ZT/skip.h"

#include "support/FakeRandom.h"

#include <gtest/gtest.h>

// Stands alone in its program, for only the first list of a process seeds.
TEST(ZtSkipList, FirstOneOfTheProcessSeedsTheDiceAfterTheOtherKind)
{
    FakeRandom dice;
    KvoSkipList other_kind;
    const int before = dice.seeds;

    ZtSkipList first(ZtSkipList::CompareInt, ZtSkipList::Unique);
    const int seeds_of_first = dice.seeds - before;
    ZtSkipList second(ZtSkipList::CompareInt, ZtSkipList::Unique);
    ZtSkipList copy(first);

    EXPECT_EQ(before, 1);
    EXPECT_EQ(seeds_of_first, 1);
    EXPECT_EQ(dice.seeds, 2);
    EXPECT_EQ(dice.draws, 0);
}
