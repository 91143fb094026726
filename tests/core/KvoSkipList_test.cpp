#include "KvoSkipList_support.h"

#include <memory>
#include <stdlib.h>

namespace {

const int five = 5, twenty = 20, twenty_five = 25, thirty = 30, forty = 40;

} // namespace

TEST(KvoSkipList, NewOneIsEmpty)
{
    KvoSkipList list;

    EXPECT_EQ(ObjectsOf(list), Objects());
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(list.levels, 1);
    EXPECT_EQ(list.header->object, nullptr);
    EXPECT_EQ(list.header->level, 23);
    EXPECT_STREQ(list.ClassName(), "KvoObject");
}

TEST(KvoSkipList, EmptyOneGivesNullForEverything)
{
    KvoSkipList list;
    int key = 1;

    EXPECT_EQ(list.Next(), nullptr);
    EXPECT_EQ(list.Peek(), nullptr);
    EXPECT_EQ(list.Head(), nullptr);
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(list.Tail(), nullptr);
    EXPECT_EQ(list.current, list.header);
    EXPECT_EQ(list.Peek(), nullptr);
    EXPECT_EQ(list.Next(), nullptr);
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(list.Search(&key), nullptr);
    EXPECT_EQ(list.SearchAlmost(&key), nullptr);
    EXPECT_EQ(list.RemoveKey(&key), nullptr);
    EXPECT_EQ(list[&key], nullptr);
}

TEST(KvoSkipList, InsertKeepsTheOrderOfTheKeys)
{
    Tens tens;

    EXPECT_EQ(ObjectsOf(tens.list),
              (Objects{&tens.ten, &tens.twenty, &tens.thirty}));
}

TEST(KvoSkipList, InsertLeavesTheCursorOnTheNewNode)
{
    Tens tens;
    Number middle(25);

    tens.list.Insert(&middle);

    EXPECT_EQ(UnderCursor(tens.list), &middle);
    EXPECT_EQ(tens.list.Next(), &tens.thirty);
}

TEST(KvoSkipList, ObjectsOfEqualKeysStandOldestFirst)
{
    Number a1(1), a2(1), a3(1);
    KvoSkipList list;
    for (Number* number : {&a1, &a2, &a3})
        list.Insert(number);

    EXPECT_EQ(list.Head(), &a1);
    EXPECT_EQ(list.Next(), &a2);
    EXPECT_EQ(list.Next(), &a3);
    EXPECT_EQ(list.Next(), nullptr);
    EXPECT_EQ(list.RemoveKey(a1.Key()), &a1);
    EXPECT_EQ(ObjectsOf(list), (Objects{&a2, &a3}));
}

TEST(KvoSkipList, InsertTakesNoNull)
{
    Tens tens;

    tens.list.Insert(nullptr);

    EXPECT_EQ(tens.list.InsertUnique(nullptr), 0);
    EXPECT_EQ(tens.list.Remove(nullptr), nullptr);
    EXPECT_EQ(tens.list.count, 3);
}

TEST(KvoSkipList, InsertUniqueInsertsANewKey)
{
    Tens tens;
    Number middle(25);

    int inserted = tens.list.InsertUnique(&middle);

    EXPECT_EQ(inserted, 1);
    EXPECT_EQ(UnderCursor(tens.list), &middle);
    EXPECT_EQ(ObjectsOf(tens.list),
              (Objects{&tens.ten, &tens.twenty, &middle, &tens.thirty}));
}

TEST(KvoSkipList, InsertUniqueRefusesAKeyThatIsThere)
{
    Tens tens;
    Number second(20);

    int inserted = tens.list.InsertUnique(&second);

    EXPECT_EQ(inserted, 0);
    EXPECT_EQ(tens.list.count, 3);
    EXPECT_EQ(UnderCursor(tens.list), &tens.ten);
}

TEST(KvoSkipList, RemoveTakesThisVeryObject)
{
    Number a1(1), a2(1), a3(1);
    KvoSkipList list;
    for (Number* number : {&a1, &a2, &a3})
        list.Insert(number);

    KvoObject* removed = list.Remove(&a2);

    EXPECT_EQ(removed, &a2);
    EXPECT_EQ(UnderCursor(list), &a1);
    EXPECT_EQ(ObjectsOf(list), (Objects{&a1, &a3}));
    EXPECT_EQ(Number::alive, 3);
}

TEST(KvoSkipList, RemoveOfTheFirstLeavesTheCursorOnTheHeader)
{
    Tens tens;

    tens.list.Remove(&tens.ten);

    EXPECT_EQ(tens.list.current, tens.list.header);
    EXPECT_EQ(tens.list.Next(), &tens.twenty);
}

TEST(KvoSkipList, RemoveOfAnotherObjectOfAnEqualKeyChangesNothing)
{
    Tens tens;
    Number second(20);
    const std::vector<int> heights = HeightsOf(tens.list);

    KvoObject* removed = tens.list.Remove(&second);

    EXPECT_EQ(removed, nullptr);
    EXPECT_EQ(ObjectsOf(tens.list),
              (Objects{&tens.ten, &tens.twenty, &tens.thirty}));
    EXPECT_EQ(HeightsOf(tens.list), heights);
}

TEST(KvoSkipList, RemoveOfAnAbsentKeyGivesNull)
{
    Tens tens;
    Number absent(25);

    EXPECT_EQ(tens.list.Remove(&absent), nullptr);
    EXPECT_EQ(tens.list.count, 3);
}

TEST(KvoSkipList, RemoveKeyTakesTheOldest)
{
    Tens tens;
    Number second(20);
    tens.list.Insert(&second);

    KvoObject* removed = tens.list.RemoveKey(&twenty);

    EXPECT_EQ(removed, &tens.twenty);
    EXPECT_EQ(UnderCursor(tens.list), &tens.ten);
    EXPECT_EQ(ObjectsOf(tens.list),
              (Objects{&tens.ten, &second, &tens.thirty}));
}

TEST(KvoSkipList, RemoveKeyOfAnAbsentKeyGivesNull)
{
    Tens tens;

    EXPECT_EQ(tens.list.RemoveKey(&twenty_five), nullptr);
    EXPECT_EQ(UnderCursor(tens.list), &tens.twenty);
    EXPECT_EQ(tens.list.count, 3);
}

TEST(KvoSkipList, SearchFindsOnlyAnEqualKey)
{
    Tens tens;

    EXPECT_EQ(tens.list.Search(&twenty), &tens.twenty);
    EXPECT_EQ(UnderCursor(tens.list), &tens.twenty);
    EXPECT_EQ(tens.list.Search(&twenty_five), nullptr);
    EXPECT_EQ(UnderCursor(tens.list), &tens.twenty);
    EXPECT_EQ(tens.list.Next(), &tens.thirty);
    EXPECT_EQ(tens.list.Search(&five), nullptr);
    EXPECT_EQ(tens.list.current, tens.list.header);
    EXPECT_EQ(tens.list.Peek(), &tens.ten);
}

TEST(KvoSkipList, SearchFindsTheOldestOfEqualKeys)
{
    Tens tens;
    Number second(20);
    tens.list.Insert(&second);

    EXPECT_EQ(tens.list.Search(&twenty), &tens.twenty);
    EXPECT_EQ(tens.list.SearchAlmost(&twenty), &tens.twenty);
    EXPECT_EQ(tens.list.SearchAlmost(&twenty_five), &second);
}

TEST(KvoSkipList, SearchAlmostFindsTheLastSmallerKeyInstead)
{
    Tens tens;

    EXPECT_EQ(tens.list.SearchAlmost(&twenty), &tens.twenty);
    EXPECT_EQ(UnderCursor(tens.list), &tens.twenty);
    EXPECT_EQ(tens.list.SearchAlmost(&twenty_five), &tens.twenty);
    EXPECT_EQ(UnderCursor(tens.list), &tens.twenty);
    EXPECT_EQ(tens.list.SearchAlmost(&forty), &tens.thirty);
    EXPECT_EQ(tens.list.SearchAlmost(&five), nullptr);
    EXPECT_EQ(tens.list.current, tens.list.header);
}

TEST(KvoSkipList, SearchesTextKeysOfEveryKind)
{
    KvoNamedObject one("one"), two("two");
    KvoSkipList list;
    list.Insert(&one);
    list.Insert(&two);
    char name[] = "two";

    EXPECT_EQ(list.Search("one"), &one);
    EXPECT_EQ(list.Search(name), &two);
    EXPECT_EQ(list.Search(two.Key()), &two);
    EXPECT_EQ(list["zzz"], &two);
}

TEST(KvoSkipList, SearchesWhatTheObjectsSayNow)
{
    Tens tens;

    tens.twenty.key = 25;

    EXPECT_EQ(tens.list.Search(&twenty), nullptr);
    EXPECT_EQ(tens.list.Search(&twenty_five), &tens.twenty);
}

TEST(KvoSkipList, SearchNeverAsksAnObjectTwice)
{
    KvoSkipList list;
    srandom(3);
    std::vector<std::unique_ptr<Number>> numbers;
    for (int i = 0; i < 1000; ++i) {
        numbers.push_back(std::make_unique<Number>(i));
        list.Insert(numbers.back().get());
    }

    for (int key = -1; key < 1000; ++key) {
        for (auto& number : numbers)
            number->asked = 0;
        list.Search(&key);
        for (auto& number : numbers)
            ASSERT_LE(number->asked, 1) << key;
    }
}

TEST(KvoSkipList, IndexingReplacesWithoutSortingAgain)
{
    Tens tens;
    Number other(99);

    tens.list[&twenty_five] = &other;

    EXPECT_EQ(ObjectsOf(tens.list), (Objects{&tens.ten, &other, &tens.thirty}));
    EXPECT_EQ(UnderCursor(tens.list), &other);
}

TEST(KvoSkipList, IndexingBeforeTheFirstGivesALostSlot)
{
    Tens tens;
    Number other(99);

    tens.list[&five] = &other;
    KvoObject* again = tens.list[&five];

    EXPECT_EQ(again, nullptr);
    EXPECT_EQ(tens.list.SearchAlmost(&five), nullptr);
    EXPECT_EQ(tens.list.current, tens.list.header);
    EXPECT_EQ(ObjectsOf(tens.list),
              (Objects{&tens.ten, &tens.twenty, &tens.thirty}));
}

TEST(KvoSkipList, HeaderNeverYieldsAnObject)
{
    Tens tens;
    Number other(99);
    tens.list[&five] = &other;

    EXPECT_EQ(tens.list.Search(&five), nullptr);
    EXPECT_EQ(tens.list.SearchAlmost(&five), nullptr);
    tens.list.Clear();
    EXPECT_EQ(tens.list.Tail(), nullptr);
    tens.list[&five] = &other;
    EXPECT_EQ(tens.list.Tail(), nullptr);
}

TEST(KvoSkipList, ConstIndexingMovesTheCursorToo)
{
    Tens tens;
    const KvoSkipList& reading = tens.list;

    EXPECT_EQ(reading[&twenty_five], &tens.twenty);
    EXPECT_EQ(UnderCursor(reading), &tens.twenty);
    EXPECT_EQ(reading[&five], nullptr);
}

TEST(KvoSkipList, EmptiedSlotStopsASearchAndIsNeverAsked)
{
    Tens tens;
    tens.list[&twenty] = nullptr;

    EXPECT_EQ(tens.list.Search(&thirty), nullptr);
    EXPECT_EQ(tens.list.Head(), &tens.ten);
    EXPECT_EQ(tens.list.Next(), nullptr);
    EXPECT_EQ(tens.list.Next(), &tens.thirty);
    tens.list.CloneContents();
    tens.list.DeleteContents();
    EXPECT_EQ(Number::alive, 3);
}

TEST(KvoSkipList, HeadAndNextWalkToTheEndAndStayThere)
{
    Tens tens;

    EXPECT_EQ(tens.list.Head(), &tens.ten);
    EXPECT_EQ(tens.list.current, tens.list.header->forward[0]);
    EXPECT_EQ(tens.list.Peek(), &tens.twenty);
    EXPECT_EQ(tens.list.Next(), &tens.twenty);
    EXPECT_EQ(tens.list.Next(), &tens.thirty);
    EXPECT_EQ(tens.list.Peek(), nullptr);
    EXPECT_EQ(UnderCursor(tens.list), &tens.thirty);
    EXPECT_EQ(tens.list.Next(), nullptr);
    EXPECT_EQ(tens.list.current, nullptr);
    EXPECT_EQ(tens.list.Next(), nullptr);
    EXPECT_EQ(tens.list.Peek(), nullptr);
}

TEST(KvoSkipList, TailIsTheLast)
{
    Tens tens;

    EXPECT_EQ(tens.list.Tail(), &tens.thirty);
    EXPECT_EQ(UnderCursor(tens.list), &tens.thirty);
}

TEST(KvoSkipList, SplitMovesWhatIsNotLessThanTheKey)
{
    Tens tens;

    std::unique_ptr<KvoSkipList> rest(tens.list.Split(&twenty));

    EXPECT_EQ(ObjectsOf(tens.list), (Objects{&tens.ten}));
    EXPECT_EQ(UnderCursor(tens.list), &tens.ten);
    EXPECT_EQ(ObjectsOf(*rest), (Objects{&tens.twenty, &tens.thirty}));
    EXPECT_EQ(rest->current, nullptr);
}

TEST(KvoSkipList, SplitBelowAllMovesEverything)
{
    Tens tens;

    std::unique_ptr<KvoSkipList> rest(tens.list.Split(&five));

    EXPECT_EQ(ObjectsOf(tens.list), Objects());
    EXPECT_EQ(tens.list.current, tens.list.header);
    EXPECT_EQ(ObjectsOf(*rest),
              (Objects{&tens.ten, &tens.twenty, &tens.thirty}));
}

TEST(KvoSkipList, SplitAboveAllMovesNothing)
{
    Tens tens;

    std::unique_ptr<KvoSkipList> rest(tens.list.Split(&forty));

    EXPECT_EQ(tens.list.count, 3);
    EXPECT_EQ(UnderCursor(tens.list), &tens.thirty);
    EXPECT_EQ(ObjectsOf(*rest), Objects());
    EXPECT_EQ(rest->levels, 1);
}

TEST(KvoSkipList, ClearDropsEveryObject)
{
    Tens tens;

    tens.list.Clear();
    bool empty = tens.list.count == 0 && !tens.list.current;
    tens.list.Insert(&tens.twenty);

    EXPECT_TRUE(empty);
    EXPECT_EQ(ObjectsOf(tens.list), (Objects{&tens.twenty}));
    EXPECT_EQ(Number::alive, 3);
}

TEST(KvoSkipList, DestroyingItLeavesTheObjectsAlive)
{
    Number number(1);
    {
        KvoSkipList list;
        list.Insert(&number);
    }

    EXPECT_EQ(Number::alive, 1);
}

TEST(KvoSkipList, DeleteContentsDeletesEveryObject)
{
    KvoSkipList list;
    list.Insert(new Number(2));
    list.Insert(new Number(1));
    ASSERT_EQ(Number::alive, 2);

    list.DeleteContents();

    EXPECT_EQ(Number::alive, 0);
    EXPECT_EQ(ObjectsOf(list), Objects());
    EXPECT_EQ(list.current, nullptr);
}

TEST(KvoSkipList, CloneContentsLeavesTheOldObjectsToOthers)
{
    Tens tens;

    tens.list.CloneContents();

    EXPECT_EQ(Number::alive, 6);
    EXPECT_NE(tens.list.Head(), &tens.ten);
    EXPECT_EQ(static_cast<Number*>(tens.list.Head())->key, 10);
    EXPECT_EQ(static_cast<Number*>(tens.list.Tail())->key, 30);
    tens.list.DeleteContents();
    EXPECT_EQ(Number::alive, 3);
}

TEST(KvoSkipList, CloneContentsGoesInOrderAndLeavesTheCursorAlone)
{
    static std::vector<int> cloned;
    class Noting : public Number
    {
    public:
        using Number::Number;
        KvoObject* Clone() override
        {
            cloned.push_back(key);
            return new Number(key);
        }
    };
    Noting two(2), three(3), one(1);
    KvoSkipList list;
    for (Number* number : {&two, &three, &one})
        list.Insert(number);
    KvoSkipList::SLNode* cursor = list.current;

    list.CloneContents();

    EXPECT_EQ(cloned, (std::vector<int>{1, 2, 3}));
    EXPECT_EQ(list.current, cursor);
    list.DeleteContents();
}

namespace {
/// Filled before `main` and dropped after it.
struct Early
{
    Early() { list.Insert(&number); }

    KvoNamedObject number{"early"};
    KvoSkipList list;
} early;
} // namespace

TEST(KvoSkipList, MayLiveBeforeMainAndAfterIt)
{
    EXPECT_EQ(early.list.Search("early"), &early.number);
}
