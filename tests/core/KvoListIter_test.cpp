#include "KVO/KvoList.h"

#include <memory>
#include <type_traits>
#include <vector>

#include <gtest/gtest.h>

#include "KVO/KvoObject.h"

namespace {

using Items = std::vector<void*>;

int a, b, c, d;

KvoList ListOf(const Items& items)
{
    KvoList list;
    for (void* item : items)
        list.PushTail(item);
    return list;
}

Items ItemsOf(const KvoList& list)
{
    Items items;
    for (KvoList::Link* link = list.head; link; link = link->next)
        items.push_back(link->item);
    EXPECT_EQ(list.count, static_cast<int>(items.size()));
    return items;
}

Items RestOf(KvoListIter& walk)
{
    Items items;
    while (void* item = walk())
        items.push_back(item);
    return items;
}

void* UnderCursor(const KvoList& list)
{
    return list.current ? list.current->item : nullptr;
}

} // namespace

TEST(KvoListIter, NewOneStandsBeforeTheFirstItem)
{
    KvoList list = ListOf({&a, &b});
    const KvoList& reading = list;

    KvoListIter may_unlink(list);
    KvoListIter may_not(reading, KvoListIter::Backward);

    EXPECT_EQ(may_unlink.list, &list);
    EXPECT_EQ(may_unlink.modifying, 1);
    EXPECT_EQ(may_unlink.direction, KvoListIter::Forward);
    EXPECT_EQ(may_unlink.cursor, &may_unlink.start);
    EXPECT_EQ(may_unlink.start.next, list.head);
    EXPECT_EQ(may_unlink.start.prev, nullptr);
    EXPECT_EQ(may_unlink.start.item, nullptr);
    EXPECT_EQ(may_not.list, &list);
    EXPECT_EQ(may_not.modifying, 0);
    EXPECT_EQ(may_not.direction, KvoListIter::Backward);
    EXPECT_EQ(may_not.start.prev, list.tail);
    EXPECT_EQ(may_not.start.next, nullptr);
}

TEST(KvoListIter, IsNoObjectButMayBeDestroyedThroughItsBase)
{
    class Noting : public KvoListIter
    {
    public:
        Noting(KvoList& walked, bool& noted) : KvoListIter(walked), gone(noted)
        {}
        ~Noting() override { gone = true; }

    private:
        bool& gone;
    };
    KvoList list = ListOf({&a});
    bool gone = false;

    std::unique_ptr<KvoListIter> walk = std::make_unique<Noting>(list, gone);
    walk.reset();

    EXPECT_TRUE(gone);
    EXPECT_FALSE((std::is_base_of_v<KvoObject, KvoListIter>));
}

TEST(KvoListIter, DirectionsAreStoredNumbers)
{
    EXPECT_EQ(static_cast<int>(KvoListIter::Forward), 0);
    EXPECT_EQ(static_cast<int>(KvoListIter::Backward), 1);
}

TEST(KvoListIter, WalksForwardToTheEndAndStaysThere)
{
    KvoList list = ListOf({&a, &b, &c});
    KvoListIter walk(list);

    EXPECT_EQ(RestOf(walk), (Items{&a, &b, &c}));
    EXPECT_EQ(walk.cursor, nullptr);
    EXPECT_EQ(walk(), nullptr);
    EXPECT_EQ(walk.Prev(), nullptr);
}

TEST(KvoListIter, WalksBackwardToTheFront)
{
    const KvoList list = ListOf({&a, &b, &c});
    KvoListIter walk(list, KvoListIter::Backward);

    EXPECT_EQ(RestOf(walk), (Items{&c, &b, &a}));
    EXPECT_EQ(walk(), nullptr);
}

TEST(KvoListIter, WalksBackwardForEveryOtherDirection)
{
    KvoList list = ListOf({&a, &b});
    KvoListIter walk(list, static_cast<KvoListIter::Direction>(7));

    EXPECT_EQ(RestOf(walk), (Items{&b, &a}));
}

TEST(KvoListIter, WalksAnEmptyList)
{
    KvoList list;
    KvoListIter walk(list);

    EXPECT_EQ(walk(), nullptr);
    walk.DeleteLast();
    EXPECT_EQ(walk.cursor, nullptr);
}

TEST(KvoListIter, LeavesTheListsCursorAlone)
{
    KvoList list = ListOf({&a, &b, &c});
    list.Head();
    KvoListIter walk(list);

    RestOf(walk);

    EXPECT_EQ(list.current, list.head);
}

TEST(KvoListIter, RewindStartsAgain)
{
    KvoList list = ListOf({&a, &b});
    KvoListIter walk(list);
    RestOf(walk);
    list.Push(&c);

    walk.Rewind();

    EXPECT_EQ(walk.cursor, &walk.start);
    EXPECT_EQ(RestOf(walk), (Items{&c, &a, &b}));
}

TEST(KvoListIter, RewindFollowsAChangedDirection)
{
    KvoList list = ListOf({&a, &b});
    KvoListIter walk(list);

    walk.direction = KvoListIter::Backward;
    walk.Rewind();

    EXPECT_EQ(walk.start.next, nullptr);
    EXPECT_EQ(RestOf(walk), (Items{&b, &a}));
}

TEST(KvoListIter, NextAndPrevStepWhateverTheDirection)
{
    KvoList list = ListOf({&a, &b, &c});
    KvoListIter forward(list);
    KvoListIter backward(list, KvoListIter::Backward);

    EXPECT_EQ(forward(), &a);
    EXPECT_EQ(forward.Next(), &b);
    EXPECT_EQ(forward.Prev(), &a);
    EXPECT_EQ(forward.Prev(), nullptr);
    EXPECT_EQ(forward.Next(), nullptr);
    EXPECT_EQ(backward(), &c);
    EXPECT_EQ(backward.Prev(), &b);
    EXPECT_EQ(backward.Next(), &c);
    EXPECT_EQ(backward.Next(), nullptr);
}

TEST(KvoListIter, SteppingTheOtherWayFromTheStartEndsTheWalk)
{
    KvoList list = ListOf({&a, &b});
    KvoListIter walk(list);

    EXPECT_EQ(walk.Prev(), nullptr);
    EXPECT_EQ(walk(), nullptr);
}

TEST(KvoListIter, CopyStandsAtTheSamePlace)
{
    KvoList list = ListOf({&a, &b, &c});
    KvoListIter walk(list);
    KvoListIter at_start(walk);
    walk();
    KvoListIter further(walk);

    EXPECT_EQ(at_start.cursor, &at_start.start);
    EXPECT_EQ(RestOf(at_start), (Items{&a, &b, &c}));
    EXPECT_EQ(RestOf(further), (Items{&b, &c}));
    EXPECT_EQ(RestOf(walk), (Items{&b, &c}));
}

TEST(KvoListIter, AssignmentMovesToTheOthersPlace)
{
    KvoList list = ListOf({&a, &b});
    KvoList other = ListOf({&c, &d});
    KvoListIter walk(list);
    walk();
    const KvoList& reading = other;
    KvoListIter backward(reading, KvoListIter::Backward);

    walk = backward;

    EXPECT_EQ(walk.list, &other);
    EXPECT_EQ(walk.modifying, 0);
    EXPECT_EQ(walk.cursor, &walk.start);
    EXPECT_EQ(RestOf(walk), (Items{&d, &c}));
}

TEST(KvoListIter, AssignmentToItselfKeepsThePlace)
{
    KvoList list = ListOf({&a, &b});
    KvoListIter walk(list);
    KvoListIter& same = walk;

    walk = same;

    EXPECT_EQ(walk.cursor, &walk.start);
    EXPECT_EQ(RestOf(walk), (Items{&a, &b}));
}

TEST(KvoListIter, DeleteLastGoesOnWithTheItemThatFollowed)
{
    KvoList list = ListOf({&a, &b, &c});
    KvoListIter walk(list);

    EXPECT_EQ(walk(), &a);
    walk.DeleteLast();

    EXPECT_EQ(walk(), &b);
    EXPECT_EQ(ItemsOf(list), (Items{&b, &c}));
}

TEST(KvoListIter, DeleteLastInTheMiddle)
{
    KvoList list = ListOf({&a, &b, &c});
    KvoListIter walk(list);
    walk();
    walk();

    walk.DeleteLast();

    EXPECT_EQ(walk.cursor->item, &a);
    EXPECT_EQ(walk(), &c);
    EXPECT_EQ(ItemsOf(list), (Items{&a, &c}));
}

TEST(KvoListIter, DeleteLastAtTheTailEndsTheWalk)
{
    KvoList list = ListOf({&a, &b});
    KvoListIter walk(list);
    walk();
    walk();

    walk.DeleteLast();

    EXPECT_EQ(walk(), nullptr);
    EXPECT_EQ(ItemsOf(list), (Items{&a}));
}

TEST(KvoListIter, DeleteLastBackwardAtTheTailGoesOnBeforeIt)
{
    KvoList list = ListOf({&a, &b, &c});
    KvoListIter walk(list, KvoListIter::Backward);
    walk();

    walk.DeleteLast();

    EXPECT_EQ(walk.cursor, &walk.start);
    EXPECT_EQ(walk(), &b);
    EXPECT_EQ(ItemsOf(list), (Items{&a, &b}));
}

TEST(KvoListIter, DeleteLastBackwardInTheMiddleAndAtTheHead)
{
    KvoList list = ListOf({&a, &b, &c});
    KvoListIter walk(list, KvoListIter::Backward);
    walk();
    walk();

    walk.DeleteLast();
    void* before = walk();
    walk.DeleteLast();

    EXPECT_EQ(before, &a);
    EXPECT_EQ(walk(), nullptr);
    EXPECT_EQ(ItemsOf(list), (Items{&c}));
}

TEST(KvoListIter, DeleteLastOfEveryItemEmptiesTheList)
{
    for (auto way : {KvoListIter::Forward, KvoListIter::Backward}) {
        KvoList list = ListOf({&a, &b, &c});
        KvoListIter walk(list, way);

        while (walk())
            walk.DeleteLast();

        EXPECT_EQ(ItemsOf(list), Items());
        EXPECT_EQ(list.tail, nullptr);
        EXPECT_EQ(list.current, nullptr);
    }
}

TEST(KvoListIter, DeleteLastTwiceTakesTheItemBefore)
{
    KvoList list = ListOf({&a, &b, &c, &d});
    KvoListIter walk(list);
    walk();
    walk();
    walk();

    walk.DeleteLast();
    walk.DeleteLast();
    Items after_two = ItemsOf(list);
    walk.DeleteLast();
    walk.DeleteLast();

    EXPECT_EQ(after_two, (Items{&a, &d}));
    EXPECT_EQ(ItemsOf(list), (Items{&d}));
    EXPECT_EQ(walk(), &d);
}

TEST(KvoListIter, DeleteLastDoesNothingBeforeTheFirstAndAfterTheLast)
{
    KvoList list = ListOf({&a, &b});
    KvoListIter walk(list);

    walk.DeleteLast();
    RestOf(walk);
    walk.DeleteLast();

    EXPECT_EQ(ItemsOf(list), (Items{&a, &b}));
}

TEST(KvoListIter, DeleteLastDoesNothingInAReadingIterator)
{
    const KvoList list = ListOf({&a, &b});
    KvoListIter walk(list);
    walk();

    walk.DeleteLast();

    EXPECT_EQ(ItemsOf(list), (Items{&a, &b}));
    EXPECT_EQ(walk(), &b);
}

TEST(KvoListIter, DeleteLastAtAnEndMovesTheListsCursorThere)
{
    KvoList list = ListOf({&a, &b, &c, &d});
    KvoListIter forward(list);
    forward();
    forward.DeleteLast();
    void* new_head = UnderCursor(list);

    KvoListIter backward(list, KvoListIter::Backward);
    backward();
    backward.DeleteLast();

    EXPECT_EQ(new_head, &b);
    EXPECT_EQ(UnderCursor(list), &c);
}

TEST(KvoListIter, DeleteLastInTheMiddleMovesOnlyACursorOnTheLink)
{
    KvoList list = ListOf({&a, &b, &c, &d});
    KvoListIter walk(list);
    walk();
    walk();

    list.Tail();
    walk.DeleteLast();
    void* elsewhere = UnderCursor(list);
    walk();
    list.Head();
    list.Next();
    walk.DeleteLast();

    EXPECT_EQ(elsewhere, &d);
    EXPECT_EQ(UnderCursor(list), &a);
    EXPECT_EQ(ItemsOf(list), (Items{&a, &d}));
}
