#include "KVO/KvoSkipList.h"

#include "support/FakeRandom.h"

#include <gtest/gtest.h>

// Stands alone in its program, for only the first list of a process seeds.
TEST(KvoSkipList, FirstOneOfTheProcessSeedsTheDice)
{
    FakeRandom dice;

    KvoSkipList first;
    int seeds_of_first = dice.seeds;
    KvoSkipList second;
    KvoSkipList copy(first);

    EXPECT_EQ(seeds_of_first, 1);
    EXPECT_EQ(dice.seeds, 1);
    EXPECT_EQ(dice.draws, 0);
}
