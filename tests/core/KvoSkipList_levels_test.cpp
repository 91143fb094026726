#include "KvoSkipList_support.h"

#include "support/FakeRandom.h"

#include <memory>
#include <stdlib.h>

namespace {

const int twenty = 20;

/// The number whose low bits give a node this height.
long Bits(int height)
{
    return (1L << (height + 1)) - 1;
}

} // namespace

TEST(KvoSkipList, ObjectsOfEqualKeysStandOldestFirstOnEveryLevel)
{
    FakeRandom dice;
    dice.numbers = {Bits(3), Bits(1), Bits(2), Bits(3), Bits(1), Bits(4)};
    Number before(0), a1(1), a2(1), a3(1), behind(2), a4(1);
    KvoSkipList list;

    for (Number* number : {&before, &a1, &a2, &a3, &behind, &a4})
        list.Insert(number);

    EXPECT_EQ(ObjectsOf(list), (Objects{&before, &a1, &a2, &a3, &a4, &behind}));
}

TEST(KvoSkipList, SplitLowersTheLevelsOfBoth)
{
    FakeRandom dice;
    dice.numbers = {Bits(1), Bits(2), Bits(3)};
    Number one(1), two(2), three(3);
    KvoSkipList list;
    for (Number* number : {&one, &two, &three})
        list.Insert(number);
    int before = list.levels;
    int key = 2;

    std::unique_ptr<KvoSkipList> rest(list.Split(&key));
    key = 3;
    std::unique_ptr<KvoSkipList> last(rest->Split(&key));

    EXPECT_EQ(before, 4);
    EXPECT_EQ(list.levels, 2);
    EXPECT_EQ(rest->levels, 3);
    EXPECT_EQ(last->levels, 4);
    EXPECT_EQ(ObjectsOf(*last), (Objects{&three}));
}

TEST(KvoSkipList, CopyKeepsOrderAndHeights)
{
    FakeRandom dice;
    dice.numbers = {Bits(1), Bits(0), Bits(2)};
    Tens tens;
    tens.list.SetModified();
    const int draws = dice.draws;

    KvoSkipList copy(tens.list);

    EXPECT_EQ(ObjectsOf(copy), ObjectsOf(tens.list));
    EXPECT_EQ(HeightsOf(copy), (std::vector<int>{0, 1, 2}));
    EXPECT_EQ(copy.levels, 3);
    EXPECT_EQ(copy.current, nullptr);
    EXPECT_EQ(copy.IsModified(), 0);
    EXPECT_EQ(dice.draws, draws);
    copy.Clear();
    EXPECT_EQ(tens.list.count, 3);
}

TEST(KvoSkipList, AssignmentTakesOrderAndHeights)
{
    FakeRandom dice;
    dice.numbers = {Bits(1), Bits(0), Bits(2), Bits(1), Bits(2), Bits(3)};
    Tens tens, others;

    KvoSkipList& result = others.list = tens.list;

    EXPECT_EQ(&result, &others.list);
    EXPECT_EQ(ObjectsOf(others.list), ObjectsOf(tens.list));
    EXPECT_EQ(HeightsOf(others.list), (std::vector<int>{0, 1, 2}));
    EXPECT_EQ(others.list.current, nullptr);
}

TEST(KvoSkipList, AssignmentToItselfChangesNothing)
{
    Tens tens;
    KvoSkipList& same = tens.list;
    tens.list.Head();

    tens.list = same;

    EXPECT_EQ(tens.list.count, 3);
    EXPECT_EQ(UnderCursor(tens.list), &tens.ten);
}

TEST(KvoSkipList, HeightFollowsTheLowOneBits)
{
    FakeRandom dice;
    // The first one makes room: a list grows by one level at a time.
    dice.numbers = {Bits(1), Bits(2), Bits(3), 0x7ffffff0, 1, 2, 3, 11, 7, 15};
    std::vector<std::unique_ptr<Number>> numbers;
    KvoSkipList list;
    for (int i = 0; i < 10; ++i) {
        numbers.push_back(std::make_unique<Number>(i));
        list.Insert(numbers.back().get());
    }

    EXPECT_EQ(HeightsOf(list),
              (std::vector<int>{1, 2, 3, 0, 0, 0, 1, 1, 2, 3}));
}

TEST(KvoSkipList, LevelsGrowByOneANodeUpToTwentyFour)
{
    FakeRandom dice;
    std::vector<std::unique_ptr<Number>> numbers;
    KvoSkipList list;

    for (int i = 0; i < 30; ++i) {
        dice.numbers.push_back(0x7fffffff);
        numbers.push_back(std::make_unique<Number>(i));
        list.Insert(numbers.back().get());
        ASSERT_EQ(list.levels, std::min(i + 2, 24));
        ASSERT_EQ(HeightsOf(list).back(), std::min(i + 1, 23));
    }
    EXPECT_EQ(ObjectsOf(list).size(), 30u);
}

TEST(KvoSkipList, LevelsDropWithTheTallestNodes)
{
    FakeRandom dice;
    dice.numbers = {Bits(1), Bits(2), Bits(3)};
    Tens tens;
    int all = tens.list.levels;

    tens.list.Remove(&tens.thirty);
    int without_tallest = tens.list.levels;
    tens.list.RemoveKey(&twenty);
    int one_left = tens.list.levels;
    tens.list.Remove(&tens.ten);

    EXPECT_EQ(all, 4);
    EXPECT_EQ(without_tallest, 3);
    EXPECT_EQ(one_left, 3);
    EXPECT_EQ(tens.list.levels, 1);
}

TEST(KvoSkipList, DrawsOnceForEachInsertionAndNeverElse)
{
    FakeRandom dice;
    Tens tens;
    const int inserted = dice.draws;
    Number second(20);

    tens.list.InsertUnique(&second);
    tens.list.Search(&twenty);
    tens.list.Remove(&tens.ten);
    KvoSkipList copy(tens.list);
    delete tens.list.Split(&twenty);
    tens.list.Clear();

    EXPECT_EQ(inserted, 3);
    EXPECT_EQ(dice.draws, 3);
}

TEST(KvoSkipList, DrawsFromTheSystemsSequence)
{
    KvoSkipList list;
    srandom(11);
    long sequence[4];
    for (long& number : sequence)
        number = random();
    srandom(11);
    Number one(1), two(2), three(3);

    list.Insert(&one);
    list.InsertUnique(&two);
    list.InsertUnique(&two);
    list.Insert(&three);

    EXPECT_EQ(random(), sequence[3]);
}

TEST(KvoSkipList, ForwardsLieBehindTheirNode)
{
    Tens tens;

    for (KvoSkipList::SLNode* node = tens.list.header; node;
         node = node->forward[0])
        EXPECT_EQ(static_cast<void*>(node->forward),
                  static_cast<void*>(node + 1));
}
