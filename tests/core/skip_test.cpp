#include "skip_support.h"

#include "support/FakeRandom.h"

#include <algorithm>
#include <stdlib.h>

namespace {

const Record five{5}, twenty{20}, twenty_five{25}, forty{40};

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
    tens.list[&five] = &other;
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
