#include "KVO/KvoList.h"

#include <type_traits>
#include <vector>

#include <gtest/gtest.h>

#include "KVO/KvoObject.h"

namespace {

using Items = std::vector<void*>;

int a, b, c, d, x;

KvoList ListOf(const Items& items)
{
    KvoList list;
    for (void* item : items)
        list.PushTail(item);
    return list;
}

/// Gives the items from the head on, and checks every link on the way.
Items ItemsOf(const KvoList& list)
{
    Items items;
    const KvoList::Link* before = nullptr;
    for (KvoList::Link* link = list.head; link; link = link->next) {
        EXPECT_EQ(link->prev, before);
        items.push_back(link->item);
        before = link;
    }
    EXPECT_EQ(list.tail, before);
    EXPECT_EQ(list.count, static_cast<int>(items.size()));
    return items;
}

/// Gives the item under the cursor.
void* UnderCursor(const KvoList& list)
{
    return list.current ? list.current->item : nullptr;
}

Items seen;

void NoteItem(void* item)
{
    seen.push_back(item);
}

void* NextItem(void* item)
{
    seen.push_back(item);
    return static_cast<int*>(item) + 1;
}

} // namespace

TEST(KvoList, NewOneIsEmpty)
{
    KvoList list;

    EXPECT_EQ(list.head, nullptr);
    EXPECT_EQ(list.tail, nullptr);
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(list.count, 0);
    EXPECT_TRUE(std::has_virtual_destructor_v<KvoList>);
    EXPECT_FALSE((std::is_base_of_v<KvoObject, KvoList>));
}

TEST(KvoList, CopySharesTheItemsWithItsCursorOnTheTail)
{
    KvoList list = ListOf({&a, &b, &c});
    list.Head();

    KvoList copy(list);
    list.Pop();

    EXPECT_EQ(ItemsOf(copy), (Items{&a, &b, &c}));
    EXPECT_EQ(copy.current, copy.tail);
}

TEST(KvoList, AssignmentDropsTheOwnItemsForTheOthers)
{
    KvoList list = ListOf({&d});
    KvoList other = ListOf({&a, &b});
    other.Head();

    KvoList& result = list = other;

    EXPECT_EQ(&result, &list);
    EXPECT_EQ(ItemsOf(list), (Items{&a, &b}));
    EXPECT_EQ(list.current, list.tail);
    EXPECT_EQ(ItemsOf(other), (Items{&a, &b}));
}

TEST(KvoList, AssignmentToItselfChangesNothing)
{
    KvoList list = ListOf({&a, &b});
    list.Head();
    KvoList& same = list;

    list = same;

    EXPECT_EQ(ItemsOf(list), (Items{&a, &b}));
    EXPECT_EQ(list.current, list.head);
}

TEST(KvoList, ClearDropsEveryItem)
{
    KvoList list = ListOf({&a, &b});

    list.Clear();
    bool empty = !list.head && !list.tail && !list.current && list.count == 0;
    list.Clear();
    list.PushTail(&c);

    EXPECT_TRUE(empty);
    EXPECT_EQ(ItemsOf(list), (Items{&c}));
}

TEST(KvoList, DeleteContentsHandsEveryItemToTheDeleter)
{
    KvoList list = ListOf({&a, &b, nullptr});
    seen.clear();

    list.DeleteContents(NoteItem);

    EXPECT_EQ(seen, (Items{&a, &b, nullptr}));
    EXPECT_EQ(ItemsOf(list), Items());
    EXPECT_EQ(list.current, nullptr);
}

TEST(KvoList, DeleteContentsWithoutADeleterEmptiesTheList)
{
    KvoList list = ListOf({&a});

    list.DeleteContents(nullptr);

    EXPECT_EQ(ItemsOf(list), Items());
}

TEST(KvoList, CloneContentsReplacesEveryItemInOrder)
{
    int numbers[3];
    KvoList list = ListOf({&numbers[0], &numbers[1]});
    list.Head();
    seen.clear();

    list.CloneContents(NextItem);

    EXPECT_EQ(seen, (Items{&numbers[0], &numbers[1]}));
    EXPECT_EQ(ItemsOf(list), (Items{&numbers[1], &numbers[2]}));
    EXPECT_EQ(list.current, list.head);
}

TEST(KvoList, CloneContentsWithoutAClonerChangesNothing)
{
    KvoList list = ListOf({&a});

    list.CloneContents(nullptr);

    EXPECT_EQ(ItemsOf(list), (Items{&a}));
}

TEST(KvoList, EmptyOneGivesNullForEverything)
{
    KvoList list;

    EXPECT_EQ(list.Head(), nullptr);
    EXPECT_EQ(list.Tail(), nullptr);
    EXPECT_EQ(list.Next(), nullptr);
    EXPECT_EQ(list.Prev(), nullptr);
    EXPECT_EQ(list.Pop(), nullptr);
    EXPECT_EQ(list.PopTail(), nullptr);
    EXPECT_EQ(list.Remove(0), nullptr);
    EXPECT_EQ(list.LinkAt(0), nullptr);
    EXPECT_EQ(ItemsOf(list), Items());
}

TEST(KvoList, HeadAndNextWalkToTheEndAndStayThere)
{
    KvoList list = ListOf({&a, &b});

    EXPECT_EQ(list.Head(), &a);
    EXPECT_EQ(list.Next(), &b);
    EXPECT_EQ(list.current, list.tail);
    EXPECT_EQ(list.Next(), nullptr);
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(list.Next(), nullptr);
    EXPECT_EQ(list.Prev(), nullptr);
}

TEST(KvoList, TailAndPrevWalkToTheFrontAndStayThere)
{
    KvoList list = ListOf({&a, &b});

    EXPECT_EQ(list.Tail(), &b);
    EXPECT_EQ(list.Prev(), &a);
    EXPECT_EQ(list.current, list.head);
    EXPECT_EQ(list.Prev(), nullptr);
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(list.Prev(), nullptr);
}

TEST(KvoList, PushGoesToTheHead)
{
    KvoList list = ListOf({&a});

    list.Push(&x);

    EXPECT_EQ(ItemsOf(list), (Items{&x, &a}));
    EXPECT_EQ(list.current, list.head);
}

TEST(KvoList, PushTailGoesToTheTail)
{
    KvoList list = ListOf({&a});
    list.Head();

    list.PushTail(&x);

    EXPECT_EQ(ItemsOf(list), (Items{&a, &x}));
    EXPECT_EQ(list.current, list.tail);
}

TEST(KvoList, NullIsAnItemLikeOthers)
{
    KvoList list;

    list.Push(nullptr);
    KvoList::Link* link = list.LinkAt(static_cast<void*>(nullptr));

    EXPECT_EQ(ItemsOf(list), (Items{nullptr}));
    EXPECT_EQ(link, list.head);
}

TEST(KvoList, PopTakesTheHeadWithTheCursorOnTheNewOne)
{
    KvoList list = ListOf({&a, &b});

    EXPECT_EQ(list.Pop(), &a);
    EXPECT_EQ(list.current, list.head);
    EXPECT_EQ(ItemsOf(list), (Items{&b}));
    EXPECT_EQ(list.Pop(), &b);
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(ItemsOf(list), Items());
}

TEST(KvoList, PopTailTakesTheTailWithTheCursorOnTheNewOne)
{
    KvoList list = ListOf({&a, &b});

    EXPECT_EQ(list.PopTail(), &b);
    EXPECT_EQ(list.current, list.tail);
    EXPECT_EQ(ItemsOf(list), (Items{&a}));
    EXPECT_EQ(list.PopTail(), &a);
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(ItemsOf(list), Items());
}

TEST(KvoList, LinkAtCountsFromTheHead)
{
    KvoList list = ListOf({&a, &b, &c, &d});
    list.Head();

    EXPECT_EQ(list.LinkAt(0)->item, &a);
    EXPECT_EQ(list.LinkAt(1)->item, &b);
    EXPECT_EQ(list.LinkAt(2)->item, &c);
    EXPECT_EQ(list.LinkAt(3)->item, &d);
    EXPECT_EQ(list.LinkAt(4), nullptr);
    EXPECT_EQ(list.LinkAt(-1), nullptr);
    EXPECT_EQ(list.current, list.head);
}

TEST(KvoList, LinkAtWalksFromTheNearerEnd)
{
    KvoList list = ListOf({&a, &b, &c, &d, &x});
    KvoList::Link* second = list.LinkAt(1);
    KvoList::Link* middle = list.LinkAt(2);
    KvoList::Link* fourth = list.LinkAt(3);

    // With the list cut on the longer way only the nearer one leads there; the
    // middle is reached from the tail.
    middle->next = middle->prev = nullptr;
    KvoList::Link* from_head = list.LinkAt(1);
    KvoList::Link* from_tail = list.LinkAt(3);
    second->next = nullptr;
    KvoList::Link* half_way = list.LinkAt(2);
    second->next = fourth->prev = middle;
    middle->prev = second;
    middle->next = fourth;

    EXPECT_EQ(from_head, second);
    EXPECT_EQ(from_tail, fourth);
    EXPECT_EQ(half_way, middle);
}

TEST(KvoList, LinkAtFindsTheFirstOfAnItem)
{
    KvoList list = ListOf({&a, &b, &b});

    EXPECT_EQ(list.LinkAt(&b), list.head->next);
    EXPECT_EQ(list.LinkAt(&x), nullptr);
}

TEST(KvoList, IndexingMovesTheCursorAndAllowsReplacing)
{
    KvoList list = ListOf({&a, &b, &c});

    list[1] = &x;

    EXPECT_EQ(ItemsOf(list), (Items{&a, &x, &c}));
    EXPECT_EQ(UnderCursor(list), &x);
}

TEST(KvoList, WritingOutsideTheListChangesNothing)
{
    KvoList list = ListOf({&a, &b});

    list[5] = &x;
    void* after = list[5];
    list[-1] = &x;

    EXPECT_EQ(after, nullptr);
    EXPECT_EQ(list[-1], nullptr);
    EXPECT_EQ(list.current, nullptr);
    EXPECT_EQ(ItemsOf(list), (Items{&a, &b}));
}

TEST(KvoList, ConstIndexingLeavesTheCursorAlone)
{
    KvoList list = ListOf({&a, &b});
    const KvoList& reading = list;

    EXPECT_EQ(reading[0], &a);
    EXPECT_EQ(reading[2], nullptr);
    EXPECT_EQ(reading[-1], nullptr);
    EXPECT_EQ(list.current, list.tail);
}

TEST(KvoList, InsertBeforeAnItem)
{
    KvoList list = ListOf({&a, &b, &b});

    list.Insert(&x, &b);

    EXPECT_EQ(ItemsOf(list), (Items{&a, &x, &b, &b}));
    EXPECT_EQ(UnderCursor(list), &x);
}

TEST(KvoList, InsertBeforeTheHeadIsAPush)
{
    KvoList list = ListOf({&a, &b});

    list.Insert(&x, &a);

    EXPECT_EQ(ItemsOf(list), (Items{&x, &a, &b}));
    EXPECT_EQ(list.current, list.head);
}

TEST(KvoList, InsertBeforeAnAbsentItemGoesToTheHead)
{
    KvoList list = ListOf({&a, &b});
    KvoList empty;

    list.Insert(&x, &d);
    empty.Insert(&x, &d);

    EXPECT_EQ(ItemsOf(list), (Items{&x, &a, &b}));
    EXPECT_EQ(list.current, list.head);
    EXPECT_EQ(ItemsOf(empty), (Items{&x}));
}

TEST(KvoList, InsertAtAnIndexStandsThereAfterwards)
{
    KvoList list = ListOf({&a, &b, &c});

    list.Insert(&x, 1);

    EXPECT_EQ(ItemsOf(list), (Items{&a, &x, &b, &c}));
    EXPECT_EQ(UnderCursor(list), &x);
}

TEST(KvoList, InsertPastTheEndGoesToTheTail)
{
    KvoList list = ListOf({&a, &b, &c});

    list.Insert(&x, 99);
    list.Insert(&d, 4);

    EXPECT_EQ(ItemsOf(list), (Items{&a, &b, &c, &x, &d}));
    EXPECT_EQ(list.current, list.tail);
}

TEST(KvoList, InsertBelowOneGoesToTheHead)
{
    KvoList list = ListOf({&a});

    list.Insert(&x, 0);
    list.Insert(&d, -3);

    EXPECT_EQ(ItemsOf(list), (Items{&d, &x, &a}));
    EXPECT_EQ(list.current, list.head);
}

TEST(KvoList, LiteralZeroIsAnIndex)
{
    KvoList list = ListOf({&a, &b});

    list.Insert(&x, 0);
    list.Remove(0);
    list.Float(0);

    EXPECT_EQ(list.LinkAt(0), list.head);
    EXPECT_EQ(ItemsOf(list), (Items{&a, &b}));
}

TEST(KvoList, RemoveOfAnItemTakesOnlyItsFirst)
{
    KvoList list = ListOf({&a, &b, &c, &b});

    list.Remove(&b);

    EXPECT_EQ(ItemsOf(list), (Items{&a, &c, &b}));
    EXPECT_EQ(list.current, list.head);
}

TEST(KvoList, RemoveOfAnAbsentItemChangesNothing)
{
    KvoList list = ListOf({&a, &b});
    list.Head();

    list.Remove(&x);

    EXPECT_EQ(ItemsOf(list), (Items{&a, &b}));
    EXPECT_EQ(list.current, list.head);
}

TEST(KvoList, RemoveInTheMiddleLeavesTheCursorOnTheLinkBefore)
{
    KvoList list = ListOf({&a, &b, &c, &d});

    void* removed = list.Remove(2);

    EXPECT_EQ(removed, &c);
    EXPECT_EQ(ItemsOf(list), (Items{&a, &b, &d}));
    EXPECT_EQ(UnderCursor(list), &b);
}

TEST(KvoList, RemoveAtAnEndIsAPop)
{
    KvoList list = ListOf({&a, &b, &c, &d});

    void* first = list.Remove(0);
    void* new_head = UnderCursor(list);
    void* last = list.Remove(2);
    void* new_tail = UnderCursor(list);

    EXPECT_EQ(first, &a);
    EXPECT_EQ(new_head, &b);
    EXPECT_EQ(last, &d);
    EXPECT_EQ(new_tail, &c);
    EXPECT_EQ(ItemsOf(list), (Items{&b, &c}));
}

TEST(KvoList, RemoveOfAnItemAtAnEndIsAPop)
{
    KvoList list = ListOf({&a, &b, &c, &d});

    list.Remove(&a);
    void* new_head = UnderCursor(list);
    list.Remove(&d);

    EXPECT_EQ(new_head, &b);
    EXPECT_EQ(UnderCursor(list), &c);
    EXPECT_EQ(ItemsOf(list), (Items{&b, &c}));
}

TEST(KvoList, RemoveOfTheOnlyItemEmptiesTheList)
{
    KvoList list = ListOf({&a});

    list.Remove(&a);

    EXPECT_EQ(ItemsOf(list), Items());
    EXPECT_EQ(list.current, nullptr);
}

TEST(KvoList, RemoveOutsideTheListGivesNull)
{
    KvoList list = ListOf({&a, &b});
    list.Head();

    EXPECT_EQ(list.Remove(2), nullptr);
    EXPECT_EQ(list.Remove(-1), nullptr);
    EXPECT_EQ(list.current, list.head);
    EXPECT_EQ(ItemsOf(list), (Items{&a, &b}));
}

TEST(KvoList, FloatMovesToTheHead)
{
    KvoList by_index = ListOf({&a, &b, &c});
    KvoList by_item = ListOf({&a, &b, &c});

    by_index.Float(2);
    by_item.Float(&b);

    EXPECT_EQ(ItemsOf(by_index), (Items{&c, &a, &b}));
    EXPECT_EQ(by_index.current, by_index.head);
    EXPECT_EQ(ItemsOf(by_item), (Items{&b, &a, &c}));
    EXPECT_EQ(by_item.current, by_item.head);
}

TEST(KvoList, SinkMovesToTheTail)
{
    KvoList by_index = ListOf({&a, &b, &c});
    KvoList by_item = ListOf({&a, &b, &c});

    by_index.Sink(0);
    by_item.Sink(&b);

    EXPECT_EQ(ItemsOf(by_index), (Items{&b, &c, &a}));
    EXPECT_EQ(by_index.current, by_index.tail);
    EXPECT_EQ(ItemsOf(by_item), (Items{&a, &c, &b}));
    EXPECT_EQ(by_item.current, by_item.tail);
}

TEST(KvoList, FloatAndSinkOfAnItemTwiceInTheListMoveItsFirst)
{
    KvoList floated = ListOf({&a, &b, &c, &b});
    KvoList sunk = ListOf({&a, &b, &c, &b});

    floated.Float(&b);
    sunk.Sink(&b);

    EXPECT_EQ(ItemsOf(floated), (Items{&b, &a, &c, &b}));
    EXPECT_EQ(ItemsOf(sunk), (Items{&a, &c, &b, &b}));
}

TEST(KvoList, FloatAndSinkOfAnAbsentItemPushIt)
{
    KvoList list = ListOf({&a});

    list.Float(&x);
    void* under_cursor = UnderCursor(list);
    list.Sink(&d);

    EXPECT_EQ(ItemsOf(list), (Items{&x, &a, &d}));
    EXPECT_EQ(under_cursor, &x);
    EXPECT_EQ(list.current, list.tail);
}

TEST(KvoList, FloatAndSinkOutsideTheListPushNull)
{
    KvoList list = ListOf({&a});

    list.Float(7);
    bool at_head = list.current == list.head;
    list.Sink(-1);

    EXPECT_EQ(ItemsOf(list), (Items{nullptr, &a, nullptr}));
    EXPECT_TRUE(at_head);
    EXPECT_EQ(list.current, list.tail);
}

TEST(KvoList, LinksOfAClearedListServeOthers)
{
    KvoList list = ListOf({&a, &b, &c});
    list.Clear();

    KvoList first = ListOf({&a, &b});
    KvoList second = ListOf({&c, &d});

    EXPECT_EQ(ItemsOf(first), (Items{&a, &b}));
    EXPECT_EQ(ItemsOf(second), (Items{&c, &d}));
}

namespace {
// Filled before `main` and dropped after it.
KvoList early = ListOf({&a, &b});
} // namespace

TEST(KvoList, MayLiveBeforeMainAndAfterIt)
{
    early.PushTail(&c);

    EXPECT_EQ(ItemsOf(early), (Items{&a, &b, &c}));
}
