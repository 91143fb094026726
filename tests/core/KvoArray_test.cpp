#include "KVO/KvoArray.h"

#include <climits>
#include <cstring>
#include <string>
#include <vector>

#include <gtest/gtest.h>

namespace {

KvoIntArray ArrayOf(const std::vector<int>& values)
{
    KvoIntArray array(static_cast<int>(values.size()));
    for (std::size_t i = 0; i < values.size(); ++i)
        array[static_cast<int>(i)] = values[i];
    return array;
}

std::vector<int> ValuesOf(const KvoIntArray& array)
{
    std::vector<int> values;
    for (int i = 0; i < array.size; ++i)
        values.push_back(array[i]);
    return values;
}

/// An array of `size` elements in a block of `capacity`.
KvoIntArray ArrayInBlock(int size, int capacity)
{
    KvoIntArray array(size);
    array.Allocate(capacity);
    return array;
}

using Ints = std::vector<int>;

} // namespace

TEST(KvoArray, NewOneOfSizeZeroHasNoBlock)
{
    KvoIntArray array;

    EXPECT_EQ(array.size, 0);
    EXPECT_EQ(array.capacity, 0);
    EXPECT_EQ(array.data, nullptr);
}

TEST(KvoArray, NewOneHoldsZerosInABlockThatFits)
{
    KvoArray array(3, 5);

    EXPECT_EQ(array.elementSize, 3);
    EXPECT_EQ(array.size, 5);
    EXPECT_EQ(array.capacity, 5);
    EXPECT_EQ(std::memcmp(array.data, "\0\0\0\0\0\0\0\0\0\0\0\0\0\0\0", 15), 0);
}

TEST(KvoArray, NewOneOfNegativeSizeIsEmpty)
{
    KvoArray array(4, -7);

    EXPECT_EQ(array.size, 0);
    EXPECT_EQ(array.data, nullptr);
}

TEST(KvoArray, ElementsOfNoSizeCountAsBytes)
{
    KvoArray none(0, 3);
    KvoArray negative(-8, 3);

    EXPECT_EQ(none.elementSize, 1);
    EXPECT_EQ(negative.elementSize, 1);
    EXPECT_EQ(negative.size, 3);
}

TEST(KvoArray, IsAnObjectWithoutClassInformationOfItsOwn)
{
    KvoIntArray array(3);

    KvoObject* clone = array.Clone();

    EXPECT_STREQ(array.ClassName(), "KvoObject");
    EXPECT_STREQ(clone->ClassName(), "KvoObject");
    delete clone;
}

TEST(KvoArray, ElementPastTheEndGrowsTheArrayWithZeros)
{
    KvoIntArray array;

    int& element = array[3];

    EXPECT_EQ(element, 0);
    EXPECT_EQ(array.size, 4);
    EXPECT_EQ(array.capacity, 5);
    EXPECT_EQ(ValuesOf(array), (Ints{0, 0, 0, 0}));
}

TEST(KvoArray, ElementBehindTheLastIsAnAppend)
{
    KvoIntArray array = ArrayOf({1, 2});

    array[2] = 3;

    EXPECT_EQ(ValuesOf(array), (Ints{1, 2, 3}));
}

TEST(KvoArray, ElementWithinTheSizeDoesNotGrow)
{
    KvoIntArray array = ArrayOf({1, 2});
    void* block = array.data;

    array[1] = 5;

    EXPECT_EQ(ValuesOf(array), (Ints{1, 5}));
    EXPECT_EQ(array.data, block);
    EXPECT_EQ(array.capacity, 2);
}

TEST(KvoArray, NegativeIndexGivesAZeroElementOutside)
{
    KvoIntArray array = ArrayOf({1, 2});

    array[-1] = 7;

    EXPECT_EQ(array[-1], 0);
    EXPECT_EQ(array[INT_MIN], 0);
    EXPECT_EQ(ValuesOf(array), (Ints{1, 2}));
}

TEST(KvoArray, ConstAccessNeverGrows)
{
    const KvoIntArray array = ArrayOf({1, 2});

    EXPECT_EQ(array[1], 2);
    EXPECT_EQ(array[2], 0);
    EXPECT_EQ(array[INT_MAX], 0);
    EXPECT_EQ(array[-1], 0);
    EXPECT_EQ(array.size, 2);
}

TEST(KvoArray, GrowthByOneLeavesAQuarterOfSlack)
{
    KvoIntArray bumped;
    KvoIntArray indexed;
    Ints bumped_capacities;
    Ints indexed_capacities;

    for (int i = 0; i < 32; ++i) {
        bumped.BumpSize(1);
        indexed[i] = i;
        if (bumped_capacities.empty() ||
            bumped.capacity != bumped_capacities.back())
            bumped_capacities.push_back(bumped.capacity);
        if (indexed_capacities.empty() ||
            indexed.capacity != indexed_capacities.back())
            indexed_capacities.push_back(indexed.capacity);
    }

    const Ints expected = {1, 2, 3, 5, 7, 10, 13, 17, 22, 28, 36};
    EXPECT_EQ(bumped_capacities, expected);
    EXPECT_EQ(indexed_capacities, expected);
}

TEST(KvoArray, BumpSizeBelowZeroLeavesAnEmptyArray)
{
    KvoIntArray array = ArrayOf({1, 2});

    array.BumpSize(-5);

    EXPECT_EQ(array.size, 0);
    EXPECT_EQ(array.capacity, 0);
    EXPECT_EQ(array.data, nullptr);
}

TEST(KvoArray, BumpSizeByNothingLeavesTheBlockAlone)
{
    KvoIntArray array = ArrayInBlock(2, 100);
    KvoIntArray empty = ArrayInBlock(0, 100);

    array.BumpSize(0);
    empty.BumpSize(-3);

    EXPECT_EQ(array.size, 2);
    EXPECT_EQ(array.capacity, 100);
    EXPECT_EQ(empty.capacity, 100);
}

TEST(KvoArray, BumpSizeAboveThreeQuartersLeavesTheBlockAlone)
{
    KvoIntArray array = ArrayInBlock(9, 10);
    void* block = array.data;

    array.BumpSize(-1);

    EXPECT_EQ(array.size, 8);
    EXPECT_EQ(array.capacity, 10);
    EXPECT_EQ(array.data, block);
}

TEST(KvoArray, BumpSizeBelowThreeQuartersFitsTheBlock)
{
    KvoIntArray array = ArrayInBlock(9, 10);

    array.BumpSize(-2);

    EXPECT_EQ(array.size, 7);
    EXPECT_EQ(array.capacity, 7);
}

TEST(KvoArray, BumpSizeToExactlyThreeQuartersFitsTheBlock)
{
    KvoIntArray array = ArrayInBlock(10, 12);

    array.BumpSize(-1);

    EXPECT_EQ(array.size, 9);
    EXPECT_EQ(array.capacity, 9);
}

TEST(KvoArray, BumpSizeGivesAReserveBackWhenGrowing)
{
    KvoIntArray bumped = ArrayInBlock(2, 100);
    KvoIntArray indexed = ArrayInBlock(2, 100);

    bumped.BumpSize(1);
    indexed[2] = 7;

    EXPECT_EQ(bumped.size, 3);
    EXPECT_EQ(bumped.capacity, 3);
    EXPECT_EQ(indexed.size, 3);
    EXPECT_EQ(indexed.capacity, 3);
    EXPECT_EQ(indexed[2], 7);
}

TEST(KvoArray, BumpSizeByMuchGrowsFromTheNewSize)
{
    KvoIntArray array = ArrayOf({1, 2});

    array.BumpSize(10);

    EXPECT_EQ(array.size, 12);
    EXPECT_EQ(array.capacity, 15);
    EXPECT_EQ(ValuesOf(array), (Ints{1, 2, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}));
}

TEST(KvoArray, ElementsThatComeBackIntoUseAreZero)
{
    KvoIntArray bumped = ArrayInBlock(8, 10);
    KvoIntArray by_two = ArrayInBlock(8, 10);
    KvoIntArray indexed = ArrayInBlock(8, 10);
    KvoIntArray sized = ArrayInBlock(8, 10);
    for (KvoIntArray* array : {&bumped, &by_two, &indexed, &sized})
        static_cast<int*>(array->data)[8] = 9;

    bumped.BumpSize(1);
    by_two.BumpSize(2);
    int element = indexed[8];
    sized.SetSize(10);

    EXPECT_EQ(bumped[8], 0);
    EXPECT_EQ(by_two[8], 0);
    EXPECT_EQ(element, 0);
    EXPECT_EQ(sized[8], 0);
    for (KvoIntArray* array : {&bumped, &by_two, &indexed, &sized})
        EXPECT_EQ(array->capacity, 10);
}

TEST(KvoArray, SetSizeFitsTheBlockExactly)
{
    KvoIntArray array = ArrayOf({1, 2, 3});

    array.SetSize(7);
    Ints grown = ValuesOf(array);
    int grown_capacity = array.capacity;
    array.SetSize(2);

    EXPECT_EQ(grown, (Ints{1, 2, 3, 0, 0, 0, 0}));
    EXPECT_EQ(grown_capacity, 7);
    EXPECT_EQ(ValuesOf(array), (Ints{1, 2}));
    EXPECT_EQ(array.capacity, 2);
}

TEST(KvoArray, SetSizeToTheCapacityKeepsTheBlock)
{
    KvoIntArray array = ArrayInBlock(3, 8);
    void* block = array.data;

    array.SetSize(8);

    EXPECT_EQ(array.size, 8);
    EXPECT_EQ(array.data, block);
}

TEST(KvoArray, SetSizeBelowOneFreesTheBlock)
{
    KvoIntArray array = ArrayOf({1, 2});
    KvoIntArray other = ArrayOf({1, 2});

    array.SetSize(-3);
    other.SetSize(0);

    EXPECT_EQ(array.size, 0);
    EXPECT_EQ(array.capacity, 0);
    EXPECT_EQ(array.data, nullptr);
    EXPECT_EQ(other.data, nullptr);
}

TEST(KvoArray, AllocateKeepsTheElementsAndZeroesTheRest)
{
    KvoIntArray array = ArrayOf({1, 2});

    array.Allocate(5);

    const int* block = static_cast<int*>(array.data);
    EXPECT_EQ(Ints(block, block + 5), (Ints{1, 2, 0, 0, 0}));
    EXPECT_EQ(array.capacity, 5);
    EXPECT_EQ(array.size, 2);
}

TEST(KvoArray, AllocateZeroesWhatWasLeftBehindTheSize)
{
    KvoIntArray array = ArrayInBlock(2, 4);
    static_cast<int*>(array.data)[3] = 9;

    array.Allocate(6);

    EXPECT_EQ(static_cast<int*>(array.data)[3], 0);
}

TEST(KvoArray, AllocateBelowOneFreesTheBlock)
{
    KvoIntArray array = ArrayOf({1, 2});

    array.Allocate(-1);

    EXPECT_EQ(array.data, nullptr);
    EXPECT_EQ(array.capacity, 0);
    EXPECT_EQ(array.size, 2);
    EXPECT_EQ(ValuesOf(array), (Ints{0, 0}));
}

TEST(KvoArray, AllocateLeavesTheSizeAlone)
{
    KvoIntArray array = ArrayOf({1, 2, 3, 4, 5});

    array.Allocate(2);
    array[3] = 9;

    EXPECT_EQ(array.size, 5);
    EXPECT_EQ(array.capacity, 2);
    EXPECT_EQ(ValuesOf(array), (Ints{1, 2, 0, 0, 0}));
}

TEST(KvoArray, GrowsBackFromABlockThatIsTooSmall)
{
    KvoIntArray sized = ArrayOf({1, 2, 3, 4, 5});
    KvoIntArray bumped = ArrayOf({1, 2, 3, 4, 5});
    sized.Allocate(2);
    bumped.Allocate(2);

    sized.SetSize(4);
    bumped.BumpSize(1);

    EXPECT_EQ(ValuesOf(sized), (Ints{1, 2, 0, 0}));
    EXPECT_EQ(ValuesOf(bumped), (Ints{1, 2, 0, 0, 0, 0}));
}

TEST(KvoArray, CopiesOnlyWhatItsBlockHolds)
{
    KvoIntArray array = ArrayOf({1, 2, 3, 4, 5});
    array.Allocate(2);

    KvoIntArray copy(array);
    KvoIntArray assigned;
    assigned = array;
    KvoIntArray added;
    added += array;
    array += array;

    EXPECT_EQ(ValuesOf(copy), (Ints{1, 2, 0, 0, 0}));
    EXPECT_EQ(ValuesOf(assigned), (Ints{1, 2, 0, 0, 0}));
    EXPECT_EQ(ValuesOf(added), (Ints{1, 2, 0, 0, 0}));
    EXPECT_EQ(ValuesOf(array), (Ints{1, 2, 0, 0, 0, 1, 2, 0, 0, 0}));
}

TEST(KvoArray, CopyElementsMovesWithOverlap)
{
    KvoIntArray array = ArrayOf({1, 2, 3, 4, 5});

    array.CopyElements(array.data, array.data, 1, 0, 4);

    EXPECT_EQ(ValuesOf(array), (Ints{1, 1, 2, 3, 4}));
}

TEST(KvoArray, CopyElementsGoesByTheElementSize)
{
    KvoArray array(3, 0);
    char to[] = "------";

    array.CopyElements(to, "abcdef", 1, 0, 1);

    EXPECT_STREQ(to, "---abc");
}

TEST(KvoArray, CopyElementsDoesNothingWithoutBlocksOrElements)
{
    KvoCharArray array;
    char block[] = "block";

    array.CopyElements(nullptr, block, 0, 0, 3);
    array.CopyElements(block, nullptr, 0, 0, 3);
    array.CopyElements(block, "other", 0, 0, 0);
    array.CopyElements(block, "other", 0, 0, -1);

    EXPECT_STREQ(block, "block");
}

TEST(KvoArray, ZeroElementsGoesByTheElementSize)
{
    KvoArray array(2, 0);
    char block[] = "abcdef";

    array.ZeroElements(block, 1, 1);

    EXPECT_EQ(std::string(block, 6), std::string("ab\0\0ef", 6));
}

TEST(KvoArray, ZeroElementsDoesNothingWithoutABlockOrElements)
{
    KvoCharArray array;
    char block[] = "block";

    array.ZeroElements(nullptr, 0, 3);
    array.ZeroElements(block, 0, 0);
    array.ZeroElements(block, 0, -1);

    EXPECT_STREQ(block, "block");
}

TEST(KvoArray, CopyHasItsOwnBlockThatFits)
{
    KvoIntArray array = ArrayInBlock(2, 9);
    array[0] = 1;
    array.SetModified();

    KvoIntArray copy(array);
    array[0] = 5;

    EXPECT_EQ(ValuesOf(copy), (Ints{1, 0}));
    EXPECT_EQ(copy.capacity, 2);
    EXPECT_EQ(copy.IsModified(), 0);
}

TEST(KvoArray, CopyOfAnEmptyOneHasNoBlock)
{
    KvoIntArray array = ArrayInBlock(0, 9);

    KvoIntArray copy(array);

    EXPECT_EQ(copy.data, nullptr);
    EXPECT_EQ(copy.elementSize, 4);
}

TEST(KvoArray, AssignmentTakesTheElementsInABlockThatFits)
{
    KvoIntArray array = ArrayOf({7, 8, 9, 10});
    KvoIntArray other = ArrayInBlock(2, 9);
    other[1] = 2;
    array.SetModified();

    KvoArray& result = array = other;

    EXPECT_EQ(&result, &array);
    EXPECT_EQ(ValuesOf(array), (Ints{0, 2}));
    EXPECT_EQ(array.capacity, 2);
    EXPECT_EQ(array.IsModified(), 1);
}

TEST(KvoArray, AssignmentOfAnEmptyOneFreesTheBlock)
{
    KvoIntArray array = ArrayOf({7, 8});

    array = KvoIntArray();

    EXPECT_EQ(array.size, 0);
    EXPECT_EQ(array.capacity, 0);
    EXPECT_EQ(array.data, nullptr);
}

TEST(KvoArray, AssignmentToItselfChangesNothing)
{
    KvoIntArray array = ArrayInBlock(2, 9);
    array[1] = 2;
    void* block = array.data;
    KvoIntArray& same = array;

    array = same;

    EXPECT_EQ(ValuesOf(array), (Ints{0, 2}));
    EXPECT_EQ(array.data, block);
    EXPECT_EQ(array.capacity, 9);
}

TEST(KvoArray, AssignmentKeepsTheElementSize)
{
    KvoArray pairs(2, 3);
    std::memcpy(pairs.data, "aAbBcC", 6);
    KvoArray singles(1, 0);
    KvoArray triples(3, 0);

    singles = pairs;
    triples = pairs;

    EXPECT_EQ(singles.elementSize, 1);
    EXPECT_EQ(std::string(static_cast<char*>(singles.data), 3), "abc");
    EXPECT_EQ(triples.elementSize, 3);
    EXPECT_EQ(std::string(static_cast<char*>(triples.data), 9),
              std::string("aA\0bB\0cC\0", 9));
}

TEST(KvoArray, AppendingAnArrayFitsTheBlock)
{
    KvoIntArray array = ArrayOf({1, 2});

    KvoArray& result = array += ArrayOf({3, 4, 5});

    EXPECT_EQ(&result, &array);
    EXPECT_EQ(ValuesOf(array), (Ints{1, 2, 3, 4, 5}));
    EXPECT_EQ(array.capacity, 5);
}

TEST(KvoArray, AppendingAnEmptyArrayChangesNothing)
{
    KvoIntArray array = ArrayInBlock(2, 9);

    array += KvoIntArray();

    EXPECT_EQ(array.size, 2);
    EXPECT_EQ(array.capacity, 9);
}

TEST(KvoArray, AppendingAnArrayToItselfDoublesIt)
{
    KvoIntArray array = ArrayOf({1, 2, 3});

    array += array;

    EXPECT_EQ(ValuesOf(array), (Ints{1, 2, 3, 1, 2, 3}));
}

TEST(KvoArray, AppendingElementsOfAnotherSizeFitsEachOne)
{
    KvoArray pairs(2, 1);
    std::memcpy(pairs.data, "xX", 2);
    KvoArray triples(3, 2);
    std::memcpy(triples.data, "abcdef", 6);

    pairs += triples;

    EXPECT_EQ(pairs.size, 3);
    EXPECT_EQ(std::string(static_cast<char*>(pairs.data), 6), "xXabde");
}

TEST(KvoArray, ALargeBlockKeepsItsElementsAndReadsAsZeroBehindThem)
{
    KvoIntArray array(100000);
    for (int i = 0; i < array.size; ++i)
        array[i] = i + 1;

    array.BumpSize(1000000);
    array.SetSize(700000);
    array.Allocate(900000);

    const int* elements = static_cast<const int*>(array.data);
    for (int i = 0; i < 900000; ++i)
        ASSERT_EQ(elements[i], i < 100000 ? i + 1 : 0) << i;
}
