#include "skip_support.h"

#include "core/slab.h"
#include "support/FailingMemory.h"
#include "support/FakeRandom.h"

#include <climits>
#include <stdlib.h>

namespace {

const Record twenty{20}, twenty_five{25}, thirty{30};

/// The number whose low bits give a node this height.
long Bits(int height)
{
    return (1L << (height + 1)) - 1;
}

} // namespace

TEST(ZtSkipList, EqualItemsStandNewestFirstOnEveryLevel)
{
    FakeRandom dice;
    dice.numbers = {Bits(3), Bits(1), Bits(2), Bits(3), Bits(1), Bits(4)};
    Record before{0}, a1{1}, a2{1}, a3{1}, behind{2}, a4{1};
    ZtSkipList list(ZtSkipList::CompareInt, ZtSkipList::NotUnique);

    for (Record* record : {&before, &a1, &a2, &a3, &behind, &a4})
        list.Insert(record);

    EXPECT_EQ(ItemsOf(list), (Items{&before, &a4, &a3, &a2, &a1, &behind}));
}

TEST(ZtSkipList, RemoveLowersTheLevels)
{
    FakeRandom dice;
    dice.numbers = {Bits(1), Bits(2), Bits(3)}; // of 20, 10, 30
    Tens tens;
    const int all = tens.list.levels;

    tens.list.Remove(&thirty);
    const int without_tallest = tens.list.levels;
    tens.list.Remove(&tens.low);
    const int one_left = tens.list.levels;
    tens.list.Remove(&twenty);

    EXPECT_EQ(all, 4);
    EXPECT_EQ(without_tallest, 3);
    EXPECT_EQ(one_left, 2);
    EXPECT_EQ(tens.list.levels, 1);
}

TEST(ZtSkipList, KeySearchGivesTheNodesBeforeThePlaceOnEveryLevel)
{
    FakeRandom dice;
    dice.numbers = {Bits(1), Bits(2), Bits(0)}; // of 20, 10, 30
    Tens tens;
    ZtSkipList::SLNode* untouched = &tens.list.header;
    ZtSkipList::SLNode* update[ZtSkipList::max_levels];
    std::fill(std::begin(update), std::end(update), untouched);
    ZtSkipList::SLNode* low = tens.list.header.forward[0];

    ZtSkipList::SLNode* found = tens.list.KeySearch(&twenty_five, update);

    EXPECT_EQ(found->item, &tens.high);
    EXPECT_EQ(UnderCursor(tens.list), &tens.middle);
    EXPECT_EQ(update[0], low->forward[0]);
    EXPECT_EQ(update[1], low->forward[0]);
    EXPECT_EQ(update[2], low);
    EXPECT_EQ(update[3], untouched);
}

TEST(ZtSkipList, CopyInsertsInOrderWithHeightsDrawnAfresh)
{
    FakeRandom dice;
    dice.numbers = {Bits(1), Bits(0), Bits(2), Bits(0), Bits(1), Bits(1)};
    Tens tens(ZtSkipList::NotUnique);
    tens.list.SetModified();

    ZtSkipList copy(tens.list);

    EXPECT_EQ(ItemsOf(copy), ItemsOf(tens.list));
    EXPECT_EQ(HeightsOf(tens.list), (std::vector<int>{0, 1, 2}));
    EXPECT_EQ(HeightsOf(copy), (std::vector<int>{0, 1, 1}));
    EXPECT_EQ(copy.compare, tens.list.compare);
    EXPECT_EQ(copy.unique, ZtSkipList::NotUnique);
    EXPECT_EQ(UnderCursor(copy), &tens.high);
    EXPECT_EQ(copy.IsModified(), 0);
    EXPECT_EQ(dice.draws, 6);
}

TEST(ZtSkipList, LevelsGrowByOneANodeUpToThirtyTwo)
{
    FakeRandom dice;
    std::vector<Record> records;
    for (int i = 0; i < 40; ++i)
        records.push_back(Record{i});
    ZtSkipList list(ZtSkipList::CompareInt, ZtSkipList::Unique);

    for (int i = 0; i < 40; ++i) {
        dice.numbers.push_back(LONG_MAX);
        list.Insert(&records[static_cast<std::size_t>(i)]);
        ASSERT_EQ(list.levels, std::min(i + 2, 32));
        ASSERT_EQ(HeightsOf(list).back(), std::min(i + 1, 31));
    }

    EXPECT_EQ(ItemsOf(list).size(), 40u);
}

TEST(ZtSkipList, HeightFollowsTheLowOneBits)
{
    FakeRandom dice;
    // The first ones make room: a list grows by one level at a time.
    dice.numbers = {Bits(1), Bits(2), Bits(3), 0x7ffffff0, 1, 2, 3, 11, 7, 15};
    std::vector<Record> records;
    for (int i = 0; i < 10; ++i)
        records.push_back(Record{i});
    ZtSkipList list(ZtSkipList::CompareInt, ZtSkipList::Unique);

    for (Record& record : records)
        list.Insert(&record);

    EXPECT_EQ(HeightsOf(list),
              (std::vector<int>{1, 2, 3, 0, 0, 0, 1, 1, 2, 3}));
}

TEST(ZtSkipList, DrawsFromTheSystemsSequence)
{
    Tens tens;
    Record between{25};
    srandom(11);
    random();
    const long second = random();
    srandom(11);

    tens.list.Insert(&between);
    tens.list.Insert(&between);

    EXPECT_EQ(random(), second);
}

// Nodes come out of a store that keeps what it has, so it is used up first.
TEST(ZtSkipList, StaysAsItWasWithoutMemory)
{
    FakeRandom dice;
    Record low{1}, high{3}, middle{2}, filler{0};
    ZtSkipList list(ZtSkipList::CompareInt, ZtSkipList::Unique);
    ZtSkipList rest(ZtSkipList::CompareInt, ZtSkipList::NotUnique);
    list.Insert(&low);
    list.Insert(&high);
    int inserted;
    {
        FailingMemory now;
        while (rest.Insert(&filler))
            ;
    }
    dice.numbers.assign(5000, Bits(1));
    {
        FailingMemory now;
        while (rest.Insert(&filler))
            ;
        inserted = list.Insert(&middle);
    }

    EXPECT_EQ(inserted, 0);
    EXPECT_EQ(ItemsOf(list), (Items{&low, &high}));
    EXPECT_EQ(UnderCursor(list), &low);
    EXPECT_EQ(list.Insert(&middle), 1);
}

TEST(ZtSkipList, CopyHoldsWhatThereIsMemoryFor)
{
    FakeRandom dice;
    Record filler{0};
    Tens tens;
    ZtSkipList two(ZtSkipList::CompareInt, ZtSkipList::NotUnique), rest(two);
    ZtSkipList copy(two);
    two.Insert(&filler);
    two.Insert(&filler);
    {
        FailingMemory now;
        while (rest.Insert(&filler))
            ;
        two.Clear();
        copy = tens.list;
    }

    if (zt_core::pieces_are_separate)
        EXPECT_EQ(ItemsOf(copy), Items());
    else
        EXPECT_EQ(ItemsOf(copy), (Items{&tens.low, &tens.middle}));
}
