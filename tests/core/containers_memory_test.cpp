#include "KVO/KvoArray.h"
#include "KVO/KvoObjArr.h"
#include "KVO/KvoObjList.h"
#include "KvoSkipList_support.h"

#include "core/slab.h"
#include "support/FailingMalloc.h"
#include "support/FailingMemory.h"
#include "support/FakeRandom.h"

#include <climits>
#include <vector>

// What the containers hold when memory runs out. Links and nodes come out of a
// store that keeps what it has, so it is used up first.

namespace {

using Ints = std::vector<int>;

KvoIntArray ArrayOf(const Ints& values)
{
    KvoIntArray array;
    for (int value : values)
        array[array.size] = value;
    return array;
}

Ints ValuesOf(const KvoIntArray& array)
{
    Ints values;
    for (int i = 0; i < array.size; ++i)
        values.push_back(array[i]);
    return values;
}

/// While it lives neither `new` nor `malloc` gives anything.
struct NoMemory
{
    FailingMemory no_new;
    FailingMalloc no_malloc{0};
};

/// An object that stands before every other and itself.
class Foremost : public KvoObject
{
public:
    int Compare(void*) override { return 1; }
};

void Add(KvoList& list, void* item)
{
    list.Push(item);
}

void Add(KvoSkipList& list, KvoObject* object)
{
    list.Insert(object);
}

/// Adds to the list until it refuses. A node that is too tall for what is left
/// of a slab may leave room for a lower one, so nodes are all of one height.
template <typename List, typename Item>
void FillUp(List& list, Item* item)
{
    int before;
    do {
        before = list.count;
        Add(list, item);
    } while (list.count != before);
}

/// Leaves links or nodes in the store for the time when memory has run out.
template <typename List, typename Item>
void Stock(List& list, Item* item)
{
    for (int i = 0; i < 5000; ++i)
        Add(list, item);
    list.Clear();
}

/// Counts the links from both ends.
void CheckLinks(const KvoList& list)
{
    int forward = 0;
    int backward = 0;
    for (KvoList::Link* link = list.head; link; link = link->next)
        ++forward;
    for (KvoList::Link* link = list.tail; link; link = link->prev)
        ++backward;
    EXPECT_EQ(forward, list.count);
    EXPECT_EQ(backward, list.count);
}

} // namespace

TEST(ContainersWithoutMemory, ArrayKeepsWhatItHad)
{
    KvoIntArray array = ArrayOf({1, 2, 3});
    const int capacity = array.capacity;
    const KvoIntArray other = ArrayOf({4, 5});
    {
        NoMemory now;
        array.SetSize(1000);
        array.BumpSize(1000);
        array.Allocate(1000);
        array[999] = 7;
        array += other;
        array = other;
        KvoIntArray copy(other);
        EXPECT_EQ(copy.size, 0);
        EXPECT_EQ(copy.data, nullptr);
        EXPECT_GT(now.no_malloc.Requests(), 0);
    }

    EXPECT_EQ(ValuesOf(array), (Ints{1, 2, 3}));
    EXPECT_EQ(array.capacity, capacity);
    EXPECT_EQ(array[2], 3);
}

TEST(ContainersWithoutMemory, ArrayShrinksInTheBlockItHas)
{
    KvoIntArray sized = ArrayOf({1, 2, 3, 4, 5, 6, 7, 8});
    KvoIntArray bumped = sized;
    {
        NoMemory now;
        sized.SetSize(2);
        bumped.BumpSize(-6);
    }

    EXPECT_EQ(ValuesOf(sized), (Ints{1, 2}));
    EXPECT_EQ(ValuesOf(bumped), (Ints{1, 2}));
}

TEST(ContainersWithoutMemory, ArrayRefusesMoreElementsThanThereCanBe)
{
    KvoIntArray array = ArrayOf({1, 2});
    KvoArray wide(INT_MAX, 0);

    {
        NoMemory now;
        array.BumpSize(INT_MAX);
        array[INT_MAX] = 7;
        wide.SetSize(INT_MAX);
        wide.BumpSize(INT_MAX);
        wide.Allocate(INT_MAX);
    }

    EXPECT_EQ(ValuesOf(array), (Ints{1, 2}));
    EXPECT_EQ(array[INT_MAX], 0);
    EXPECT_EQ(wide.size, 0);
    EXPECT_EQ(wide.data, nullptr);
}

TEST(ContainersWithoutMemory, ObjectArrayKeepsWhatItHad)
{
    KvoObject object;
    KvoObjArray array;
    array.Insert(&object, 0);
    {
        NoMemory now;
        array.Insert(&object, 0);
        array[5] = &object;
    }

    EXPECT_EQ(array.size, 1);
    EXPECT_EQ(array[0], &object);
}

TEST(ContainersWithoutMemory, ListStaysAsItWas)
{
    int item;
    KvoList list;
    Stock(list, &item);
    {
        NoMemory now;
        FillUp(list, &item);
    }
    const int held = list.count;
    list.Head();
    {
        NoMemory now;
        list.Push(&item);
        list.PushTail(&item);
        list.Insert(&item, 1);
        list.Insert(&item, &item);
        list.Float(-1);
        list.Sink(-1);
    }

    EXPECT_EQ(list.count, held);
    EXPECT_EQ(list.current, list.head);
    CheckLinks(list);
}

TEST(ContainersWithoutMemory, ListMovesItemsAllTheSame)
{
    int items[3];
    KvoList list, rest;
    for (int& item : items)
        list.PushTail(&item);
    {
        NoMemory now;
        FillUp(rest, items);
        list.Float(&items[2]);
        list.Float(1);
        list.Sink(&items[0]);
        list.Sink(0);
    }

    EXPECT_EQ(list.count, 3);
    EXPECT_EQ(list[0], &items[1]);
    EXPECT_EQ(list[1], &items[0]);
    EXPECT_EQ(list[2], &items[2]);
    CheckLinks(list);
}

TEST(ContainersWithoutMemory, CopyOfAListEndsEarly)
{
    int items[5];
    KvoList list, rest, three, copy;
    for (int& item : items)
        list.PushTail(&item);
    for (int i = 0; i < 3; ++i)
        three.Push(items);
    {
        NoMemory now;
        FillUp(rest, items);
        three.Clear();
        copy = list;
    }

    EXPECT_EQ(copy.count, zt_core::pieces_are_separate ? 0 : 3);
    for (int i = 0; i < copy.count; ++i)
        EXPECT_EQ(copy[i], &items[i]);
    CheckLinks(copy);
}

TEST(ContainersWithoutMemory, SkipListStaysAsItWas)
{
    FakeRandom dice;
    Foremost object;
    KvoSkipList list;
    int inserted;
    Stock(list, &object);
    {
        NoMemory now;
        FillUp(list, &object);
    }
    const int held = list.count;
    {
        NoMemory now;
        list.Insert(&object);
        inserted = list.InsertUnique(&object);
    }

    EXPECT_EQ(inserted, 0);
    EXPECT_EQ(list.current, list.header);
    EXPECT_EQ(ObjectsOf(list).size(), static_cast<std::size_t>(held));
}

TEST(ContainersWithoutMemory, SkipListDoesNotGrowLevelsForARefusedNode)
{
    FakeRandom dice;
    Foremost object;
    KvoSkipList list, rest;
    Stock(rest, &object);
    list.Insert(&object);
    {
        NoMemory now;
        FillUp(rest, &object);
    }
    dice.numbers.assign(100, 3);
    {
        NoMemory now;
        FillUp(rest, &object);
        list.Insert(&object);
    }

    EXPECT_EQ(ObjectsOf(list), (Objects{&object}));
}

TEST(ContainersWithoutMemory, RefusedNodeLeavesTheCursorBeforeItsPlace)
{
    FakeRandom dice;
    Foremost object;
    Number first(1), second(1), other(1);
    KvoSkipList list, rest;
    list.Insert(&first);
    list.Insert(&second);
    Stock(rest, &object);
    {
        NoMemory now;
        FillUp(rest, &object);
        list.Insert(&other);
    }

    EXPECT_EQ(ObjectsOf(list), (Objects{&first, &second}));
    EXPECT_EQ(list.current->object, &second);
}

TEST(ContainersWithoutMemory, CopyOfASkipListEndsEarly)
{
    FakeRandom dice;
    Foremost object;
    KvoSkipList list, rest, two, copy;
    dice.numbers = {3, 7};
    for (int i = 0; i < 6; ++i)
        list.Insert(&object);
    for (int i = 0; i < 2; ++i)
        two.Insert(&object);
    {
        NoMemory now;
        FillUp(rest, &object);
        two.Clear();
        copy = list;
    }

    EXPECT_EQ(list.levels, 3);
    EXPECT_EQ(ObjectsOf(copy).size(), zt_core::pieces_are_separate ? 0u : 2u);
}

TEST(ContainersWithoutMemory, SplitChangesNothing)
{
    Number one(1), two(2);
    KvoSkipList list;
    list.Insert(&one);
    list.Insert(&two);
    KvoSkipList* rest;
    {
        NoMemory now;
        rest = list.Split(two.Key());
    }

    EXPECT_EQ(rest, nullptr);
    EXPECT_EQ(ObjectsOf(list), (Objects{&one, &two}));
    EXPECT_EQ(list.Peek(), nullptr);
}
