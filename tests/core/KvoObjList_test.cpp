#include "KVO/KvoObjList.h"

#include <string>
#include <type_traits>

#include <gtest/gtest.h>

namespace {

/// An object that counts how many of its kind are alive.
class Counted : public KvoNamedObject
{
public:
    explicit Counted(const char* text) : KvoNamedObject(text) { ++alive; }
    ~Counted() override { --alive; }
    KvoObject* Clone() override { return new Counted(name); }

    static int alive;
};

int Counted::alive = 0;

void* seen = nullptr;

void NoteItem(void* item)
{
    seen = item;
}

void* SameItem(void* item)
{
    seen = item;
    return item;
}

const char* NameOf(void* item)
{
    return static_cast<KvoNamedObject*>(static_cast<KvoObject*>(item))->name;
}

} // namespace

TEST(KvoObjList, DestroyingItLeavesTheObjectsAlive)
{
    Counted object("a");
    {
        KvoObjList list;
        list.Push(&object);
    }

    EXPECT_EQ(Counted::alive, 1);
}

TEST(KvoObjList, DestroyingItThroughItsBaseFreesTheLinks)
{
    Counted object("a");
    auto* list = new KvoObjList;
    list->Push(&object);
    KvoList* base = list;

    delete base;

    EXPECT_EQ(Counted::alive, 1);
    EXPECT_FALSE((std::is_base_of_v<KvoObject, KvoObjList>));
}

TEST(KvoObjList, CopyAndAssignmentShareTheObjects)
{
    Counted a("a"), b("b");
    KvoObjList list;
    list.PushTail(&a);
    list.PushTail(&b);

    KvoObjList copy(list);
    KvoObjList assigned;
    assigned = list;

    EXPECT_EQ(copy.Pop(), &a);
    EXPECT_EQ(copy.Pop(), &b);
    EXPECT_EQ(assigned.Pop(), &a);
    EXPECT_EQ(assigned.count, 1);
    EXPECT_EQ(list.count, 2);
    EXPECT_EQ(Counted::alive, 2);
}

TEST(KvoObjList, DeleteContentsDeletesEveryObjectAndEmptiesTheList)
{
    KvoObjList list;
    list.PushTail(new Counted("a"));
    list.PushTail(nullptr);
    list.PushTail(new Counted("b"));
    ASSERT_EQ(Counted::alive, 2);

    list.DeleteContents();

    EXPECT_EQ(Counted::alive, 0);
    EXPECT_EQ(list.head, nullptr);
    EXPECT_EQ(list.tail, nullptr);
    EXPECT_EQ(list.count, 0);
    EXPECT_EQ(list.Head(), nullptr);
}

TEST(KvoObjList, DeleteContentsLeavesTheCursorAlone)
{
    KvoObjList list;
    list.Push(new Counted("a"));
    KvoList::Link* cursor = list.current;

    list.DeleteContents();

    EXPECT_EQ(list.current, cursor);
}

TEST(KvoObjList, DeleteContentsOfAnEmptyListDoesNothing)
{
    KvoObjList list;

    list.DeleteContents();

    EXPECT_EQ(list.count, 0);
    EXPECT_EQ(list.current, nullptr);
}

TEST(KvoObjList, CloneContentsLeavesTheOldObjectsToOthers)
{
    Counted a("a"), b("b");
    KvoObjList list;
    list.PushTail(&a);
    list.PushTail(nullptr);
    list.PushTail(&b);

    list.CloneContents();

    EXPECT_EQ(Counted::alive, 4);
    EXPECT_NE(list[0], &a);
    EXPECT_STREQ(NameOf(list[0]), "a");
    EXPECT_EQ(list[1], nullptr);
    EXPECT_STREQ(NameOf(list[2]), "b");
    list.DeleteContents();
    EXPECT_EQ(Counted::alive, 2);
}

TEST(KvoObjList, CloneContentsGoesFromHeadToTailAndLeavesTheCursorAlone)
{
    static std::string cloned;
    class Noting : public Counted
    {
    public:
        using Counted::Counted;
        KvoObject* Clone() override
        {
            cloned += name;
            return new Counted(name);
        }
    };
    Noting a("a"), b("b"), c("c");
    KvoObjList list;
    for (KvoObject* object : {&a, &b, &c})
        list.PushTail(object);
    list.Head();
    list.Next();
    KvoList::Link* cursor = list.current;

    list.CloneContents();

    EXPECT_EQ(cloned, "abc");
    EXPECT_EQ(list.current, cursor);
    list.DeleteContents();
}

TEST(KvoObjList, FormsWithAFunctionAreThereToo)
{
    Counted a("a");
    KvoObjList list;
    list.Push(&a);

    list.CloneContents(SameItem);
    void* cloned = seen;
    seen = nullptr;
    list.DeleteContents(NoteItem);

    EXPECT_EQ(cloned, &a);
    EXPECT_EQ(seen, &a);
    EXPECT_EQ(Counted::alive, 1);
    EXPECT_EQ(list.current, nullptr);
}
