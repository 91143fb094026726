#include "skip_support.h"

#include "core/slab.h"
#include "support/FailingMemory.h"
#include "support/FakeRandom.h"

#include <climits>
#include <cmath>
#include <cstring>
#include <limits>
#include <stdlib.h>

namespace {

const Record five{5}, twenty{20}, twenty_five{25}, thirty{30}, forty{40};

/// The number whose low bits give a node this height.
long Bits(int height)
{
    return (1L << (height + 1)) - 1;
}

/// Records of 10, 20 and 30 in a list.
struct Tens
{
    explicit Tens(ZtSkipList::UniqueState state = ZtSkipList::Unique)
        : list(ZtSkipList::CompareInt, state)
    {
        for (Record* record : {&middle, &low, &high})
            list.Insert(record);
    }

    Record low{10}, middle{20}, high{30};
    ZtSkipList list;
};

/// Gives the item under the cursor, null also for the header.
void* UnderCursor(const ZtSkipList& list)
{
    return list.current ? list.current->item : nullptr;
}

int CompareInts(int a, int b)
{
    return ZtSkipList::CompareInt(&a, &b);
}

int CompareFloats(float a, float b)
{
    return ZtSkipList::CompareFloat(&a, &b);
}

std::vector<void*> seen;

void Note(void* item)
{
    seen.push_back(item);
}

void* CloneRecord(void* item)
{
    seen.push_back(item);
    return new Record(*static_cast<Record*>(item));
}

void DeleteRecord(void* item)
{
    delete static_cast<Record*>(item);
}

} // namespace

TEST(ZtSkipList, NewOneIsEmpty)
{
    ZtSkipList list(ZtSkipList::CompareInt, ZtSkipList::NotUnique);

    EXPECT_EQ(ItemsOf(list), Items());
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(list.levels, 1);
    EXPECT_EQ(list.unique, ZtSkipList::NotUnique);
    EXPECT_EQ(list.compare, &ZtSkipList::CompareInt);
    EXPECT_EQ(list.header.item, nullptr);
    EXPECT_EQ(list.header.level, 31);
    EXPECT_STREQ(list.ClassName(), "KvoObject");
}

TEST(ZtSkipList, EmptyOneGivesNullForEverything)
{
    ZtSkipList list(ZtSkipList::CompareInt, ZtSkipList::Unique);

    EXPECT_EQ(list.Next(), nullptr);
    EXPECT_EQ(list.Peek(), nullptr);
    EXPECT_EQ(list.Head(), nullptr);
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(list.Tail(), nullptr);
    EXPECT_EQ(list.current, &list.header);
    EXPECT_EQ(list.Peek(), nullptr);
    EXPECT_EQ(list.Next(), nullptr);
    EXPECT_EQ(list.KeySearch(&five, nullptr), nullptr);
    EXPECT_EQ(list.current, &list.header);
    EXPECT_EQ(list.Search(&five), nullptr);
    EXPECT_EQ(list.SearchAlmost(&five), nullptr);
    EXPECT_EQ(list.Remove(&five), nullptr);
    EXPECT_EQ(list[&five], nullptr);
}

TEST(ZtSkipList, WithoutAComparisonOrdersByTheStringOfTheFirstWord)
{
    struct Named
    {
        const char* name;
        int other;
    };
    Named apple{"apple", 3}, pear{"pear", 1}, fig{"fig", 2};
    ZtSkipList list(nullptr, ZtSkipList::Unique);

    for (Named* named : {&pear, &apple, &fig})
        list.Insert(named);
    const char* key = "fig";

    EXPECT_EQ(list.compare, &ZtSkipList::CompareString);
    EXPECT_EQ(ItemsOf(list), (Items{&apple, &fig, &pear}));
    EXPECT_EQ(list.Search(&key), &fig);
}

TEST(ZtSkipList, CallsTheComparisonWithAStoredItemAndTheKey)
{
    static Record stored{1}, key{2};
    static int calls;
    ZtSkipList list(
        [](const void* a, const void* b) {
            ++calls;
            EXPECT_EQ(a, &stored);
            EXPECT_EQ(b, &key);
            return 0;
        },
        ZtSkipList::NotUnique);
    list.Insert(&stored);
    calls = 0;

    void* found = list.Search(&key);

    EXPECT_EQ(found, &stored);
    EXPECT_EQ(calls, 1);
}

TEST(ZtSkipList, UniqueOneRefusesAnEqualItem)
{
    FakeRandom dice;
    Record first{5}, second{5};
    ZtSkipList list(ZtSkipList::CompareInt, ZtSkipList::Unique);

    EXPECT_EQ(list.Insert(&first), 1);
    EXPECT_EQ(list.Insert(&second), 0);

    EXPECT_EQ(ItemsOf(list), (Items{&first}));
    EXPECT_EQ(list.current, &list.header);
    EXPECT_EQ(dice.draws, 1);
}

TEST(ZtSkipList, RefusalLeavesTheCursorBeforeThePlace)
{
    Tens tens;
    Record second{20};

    const int inserted = tens.list.Insert(&second);

    EXPECT_EQ(inserted, 0);
    EXPECT_EQ(UnderCursor(tens.list), &tens.low);
}

TEST(ZtSkipList, EqualItemsStandNewestFirst)
{
    Record r1{1}, r2{1};
    ZtSkipList list(ZtSkipList::CompareInt, ZtSkipList::NotUnique);
    EXPECT_EQ(list.Insert(&r1), 1);
    EXPECT_EQ(list.Insert(&r2), 1);

    EXPECT_EQ(list.Head(), &r2);
    EXPECT_EQ(list.Next(), &r1);
    EXPECT_EQ(list.Next(), nullptr);
}

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

TEST(ZtSkipList, EveryStateButZeroKeepsEqualItems)
{
    Record r1{1}, r2{1};
    ZtSkipList list(ZtSkipList::CompareInt,
                    static_cast<ZtSkipList::UniqueState>(7));

    list.Insert(&r1);

    EXPECT_EQ(list.Insert(&r2), 1);
    EXPECT_EQ(ZtSkipList::Unique, 0);
    EXPECT_EQ(ZtSkipList::NotUnique, 1);
}

TEST(ZtSkipList, InsertLeavesTheCursorOnTheNewNode)
{
    Tens tens;
    Record between{25};

    const int inserted = tens.list.Insert(&between);

    EXPECT_EQ(inserted, 1);
    EXPECT_EQ(UnderCursor(tens.list), &between);
    EXPECT_EQ(ItemsOf(tens.list),
              (Items{&tens.low, &tens.middle, &between, &tens.high}));
}

TEST(ZtSkipList, TakesNullForAnItemLikeOthers)
{
    ZtSkipList list(ZtSkipList::CompareInt, ZtSkipList::Unique);
    Record below{-1}, above{1};

    for (Record* record : {&above, static_cast<Record*>(nullptr), &below})
        EXPECT_EQ(list.Insert(record), 1);

    EXPECT_EQ(ItemsOf(list), (Items{&below, nullptr, &above}));
    EXPECT_EQ(list.Search(&above), &above);
}

TEST(ZtSkipList, RemoveTakesTheFirstOfEqualItems)
{
    Tens tens(ZtSkipList::NotUnique);
    Record second{20};
    tens.list.Insert(&second);

    void* removed = tens.list.Remove(&twenty);

    EXPECT_EQ(removed, &second);
    EXPECT_EQ(UnderCursor(tens.list), &tens.low);
    EXPECT_EQ(ItemsOf(tens.list), (Items{&tens.low, &tens.middle, &tens.high}));
}

TEST(ZtSkipList, RemoveOfTheFirstLeavesTheCursorOnTheHeader)
{
    Tens tens;

    tens.list.Remove(&tens.low);

    EXPECT_EQ(tens.list.current, &tens.list.header);
    EXPECT_EQ(tens.list.Next(), &tens.middle);
}

TEST(ZtSkipList, RemoveOfAnAbsentKeyLeavesTheCursorBeforeThePlace)
{
    Tens tens;

    void* removed = tens.list.Remove(&twenty_five);

    EXPECT_EQ(removed, nullptr);
    EXPECT_EQ(UnderCursor(tens.list), &tens.middle);
    EXPECT_EQ(tens.list.count, 3);
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

TEST(ZtSkipList, SearchLeavesTheCursorOnTheFirstEqualItem)
{
    Tens tens(ZtSkipList::NotUnique);
    Record second{20};
    tens.list.Insert(&second);

    EXPECT_EQ(tens.list.Search(&twenty), &second);
    EXPECT_EQ(UnderCursor(tens.list), &second);
    EXPECT_EQ(tens.list.Next(), &tens.middle);
}

TEST(ZtSkipList, FailedSearchLeavesTheCursorBehindThePlace)
{
    Tens tens;

    EXPECT_EQ(tens.list.Search(&twenty_five), nullptr);
    EXPECT_EQ(UnderCursor(tens.list), &tens.high);
    EXPECT_EQ(tens.list.Search(&five), nullptr);
    EXPECT_EQ(UnderCursor(tens.list), &tens.low);
}

TEST(ZtSkipList, SearchPastEveryKeyLeavesNoCursor)
{
    Tens tens;

    EXPECT_EQ(tens.list.Search(&forty), nullptr);

    EXPECT_EQ(tens.list.current, nullptr);
    EXPECT_EQ(tens.list.Next(), nullptr);
    EXPECT_EQ(tens.list.Peek(), nullptr);
}

TEST(ZtSkipList, SearchAlmostFindsTheLastSmallerKeyInstead)
{
    Tens tens;

    EXPECT_EQ(tens.list.SearchAlmost(&twenty), &tens.middle);
    EXPECT_EQ(UnderCursor(tens.list), &tens.middle);
    EXPECT_EQ(tens.list.SearchAlmost(&twenty_five), &tens.middle);
    EXPECT_EQ(UnderCursor(tens.list), &tens.middle);
    EXPECT_EQ(tens.list.SearchAlmost(&forty), &tens.high);
    EXPECT_EQ(tens.list.SearchAlmost(&five), nullptr);
    EXPECT_EQ(tens.list.current, &tens.list.header);
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

TEST(ZtSkipList, KeySearchGivesTheFirstNodeThatIsNotBeforeTheKey)
{
    Tens tens;
    const ZtSkipList& reading = tens.list;

    EXPECT_EQ(reading.KeySearch(&twenty, nullptr)->item, &tens.middle);
    EXPECT_EQ(UnderCursor(reading), &tens.low);
    EXPECT_EQ(reading.KeySearch(&five, nullptr)->item, &tens.low);
    EXPECT_EQ(reading.current, &reading.header);
    EXPECT_EQ(reading.KeySearch(&forty, nullptr), nullptr);
    EXPECT_EQ(UnderCursor(reading), &tens.high);
}

TEST(ZtSkipList, SearchNeverComparesANodeTwice)
{
    static std::vector<int> asked(1000);
    std::vector<Record> records;
    for (int i = 0; i < 1000; ++i)
        records.push_back(Record{i});
    ZtSkipList list(
        [](const void* a, const void* b) {
            ++asked[static_cast<std::size_t>(
                static_cast<const Record*>(a)->key)];
            return ZtSkipList::CompareInt(a, b);
        },
        ZtSkipList::Unique);
    srandom(3);
    for (Record& record : records)
        list.Insert(&record);

    for (int key = -1; key < 1000; ++key) {
        asked.assign(1000, 0);
        list.Search(&key);
        ASSERT_LE(*std::max_element(asked.begin(), asked.end()), 1) << key;
    }
}

TEST(ZtSkipList, IndexingReplacesWithoutSortingAgain)
{
    Tens tens;
    Record other{99};

    tens.list[&twenty_five] = &other;

    EXPECT_EQ(ItemsOf(tens.list), (Items{&tens.low, &other, &tens.high}));
    EXPECT_EQ(UnderCursor(tens.list), &other);
}

TEST(ZtSkipList, IndexingAnEqualItemGivesItsSlot)
{
    Tens tens;

    void*& slot = tens.list[&twenty];

    EXPECT_EQ(slot, &tens.middle);
    EXPECT_EQ(&slot, &tens.list.current->item);
}

TEST(ZtSkipList, HeaderNeverYieldsAnItem)
{
    Tens tens;
    Record other{99};
    tens.list[&five] = &other;

    EXPECT_EQ(tens.list.Search(&five), nullptr);
    EXPECT_EQ(tens.list.SearchAlmost(&five), nullptr);
    EXPECT_EQ(tens.list[&five], nullptr);
    EXPECT_EQ(tens.list.current, &tens.list.header);
    tens.list[&five] = &other;
    tens.list.Clear();
    EXPECT_EQ(tens.list.Tail(), nullptr);
}

TEST(ZtSkipList, ConstIndexingMovesTheCursorToo)
{
    Tens tens;
    const ZtSkipList& reading = tens.list;

    EXPECT_EQ(reading[&twenty_five], &tens.middle);
    EXPECT_EQ(UnderCursor(reading), &tens.middle);
    EXPECT_EQ(reading[&five], nullptr);
}

TEST(ZtSkipList, HeadAndNextWalkToTheEndAndStayThere)
{
    Tens tens;

    EXPECT_EQ(tens.list.Head(), &tens.low);
    EXPECT_EQ(tens.list.current, tens.list.header.forward[0]);
    EXPECT_EQ(tens.list.Peek(), &tens.middle);
    EXPECT_EQ(tens.list.Next(), &tens.middle);
    EXPECT_EQ(tens.list.Next(), &tens.high);
    EXPECT_EQ(tens.list.Peek(), nullptr);
    EXPECT_EQ(UnderCursor(tens.list), &tens.high);
    EXPECT_EQ(tens.list.Next(), nullptr);
    EXPECT_EQ(tens.list.current, nullptr);
    EXPECT_EQ(tens.list.Next(), nullptr);
}

TEST(ZtSkipList, TailIsTheLast)
{
    Tens tens;

    EXPECT_EQ(tens.list.Tail(), &tens.high);
    EXPECT_EQ(UnderCursor(tens.list), &tens.high);
}

TEST(ZtSkipList, ClearHandsEveryItemToTheDeleterInOrder)
{
    Tens tens;
    seen.clear();

    tens.list.Clear(Note);

    EXPECT_EQ(seen, (Items{&tens.low, &tens.middle, &tens.high}));
    EXPECT_EQ(ItemsOf(tens.list), Items());
    EXPECT_EQ(tens.list.current, nullptr);
}

TEST(ZtSkipList, ClearWithoutADeleterLeavesTheItemsAlone)
{
    Tens tens;

    tens.list.Clear();
    tens.list.Insert(&tens.middle);
    tens.list.Clear(nullptr);
    tens.list.Insert(&tens.high);

    EXPECT_EQ(ItemsOf(tens.list), (Items{&tens.high}));
}

TEST(ZtSkipList, CloneDataReplacesEveryItemInOrder)
{
    Tens tens;
    seen.clear();
    tens.list.Search(&twenty);
    const ZtSkipList::SLNode* cursor = tens.list.current;

    tens.list.CloneData(CloneRecord);

    EXPECT_EQ(seen, (Items{&tens.low, &tens.middle, &tens.high}));
    EXPECT_EQ(tens.list.current, cursor);
    EXPECT_NE(tens.list.Head(), &tens.low);
    EXPECT_EQ(static_cast<Record*>(tens.list.Head())->key, 10);
    EXPECT_EQ(static_cast<Record*>(tens.list.Tail())->key, 30);
    tens.list.Clear(DeleteRecord);
}

TEST(ZtSkipList, CloneDataWithoutAClonerChangesNothing)
{
    Tens tens;

    tens.list.CloneData(nullptr);

    EXPECT_EQ(ItemsOf(tens.list), (Items{&tens.low, &tens.middle, &tens.high}));
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

TEST(ZtSkipList, CopyReversesRunsOfEqualItems)
{
    Tens tens(ZtSkipList::NotUnique);
    Record second{20};
    tens.list.Insert(&second);

    ZtSkipList copy(tens.list);

    EXPECT_EQ(ItemsOf(tens.list),
              (Items{&tens.low, &second, &tens.middle, &tens.high}));
    EXPECT_EQ(ItemsOf(copy),
              (Items{&tens.low, &tens.middle, &second, &tens.high}));
}

TEST(ZtSkipList, CopyOfAnEmptyOneHasNoCursor)
{
    ZtSkipList list(nullptr, ZtSkipList::Unique);
    list.Tail();

    ZtSkipList copy(list);

    EXPECT_EQ(ItemsOf(copy), Items());
    EXPECT_EQ(copy.current, nullptr);
}

TEST(ZtSkipList, AssignmentTakesItemsComparisonAndState)
{
    Tens tens(ZtSkipList::NotUnique);
    Record second{20};
    tens.list.Insert(&second);
    ZtSkipList other(nullptr, ZtSkipList::Unique);
    const char* word = "word";
    other.Insert(&word);

    ZtSkipList& result = other = tens.list;

    EXPECT_EQ(&result, &other);
    EXPECT_EQ(ItemsOf(other),
              (Items{&tens.low, &tens.middle, &second, &tens.high}));
    EXPECT_EQ(other.compare, &ZtSkipList::CompareInt);
    EXPECT_EQ(other.unique, ZtSkipList::NotUnique);
    EXPECT_EQ(UnderCursor(other), &tens.high);
}

TEST(ZtSkipList, AssignmentToItselfChangesNothing)
{
    Tens tens;
    ZtSkipList& same = tens.list;
    tens.list.Head();

    tens.list = same;

    EXPECT_EQ(tens.list.count, 3);
    EXPECT_EQ(UnderCursor(tens.list), &tens.low);
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
