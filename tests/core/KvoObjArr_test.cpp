#include "KVO/KvoObjArr.h"

#include <vector>

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

using Objects = std::vector<KvoObject*>;

Objects ObjectsOf(KvoObjArray& array)
{
    Objects objects;
    for (int i = 0; i < array.size; ++i)
        objects.push_back(array[i]);
    return objects;
}

/// Three objects in an array, and one that is not.
struct Three
{
    Three()
    {
        array[0] = &a;
        array[1] = &b;
        array[2] = &c;
    }

    Counted a{"a"}, b{"b"}, c{"c"}, x{"x"};
    KvoObjArray array;
};

} // namespace

TEST(KvoObjArray, NewOneIsEmpty)
{
    KvoObjArray array;

    EXPECT_EQ(array.size, 0);
    EXPECT_EQ(array.data, nullptr);
    EXPECT_EQ(array.elementSize, static_cast<int>(sizeof(KvoObject*)));
    EXPECT_STREQ(array.ClassName(), "KvoObject");
}

TEST(KvoObjArray, NewElementsAreNull)
{
    KvoObjArray array;

    KvoObject* object = array[2];

    EXPECT_EQ(object, nullptr);
    EXPECT_EQ(ObjectsOf(array), (Objects{nullptr, nullptr, nullptr}));
}

TEST(KvoObjArray, FindGivesTheLowerIndexOfAnObjectStoredTwice)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    array[3] = &b;

    EXPECT_EQ(array.Find(&b), 1);
}

TEST(KvoObjArray, FindGoesByIdentityNotByKey)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    Counted same_name("b");

    EXPECT_EQ(array.Find(&same_name), -1);
    EXPECT_EQ(array.Find(nullptr), -1);
}

TEST(KvoObjArray, InsertMovesTheLaterOnesUp)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    array.Insert(&x, 1);

    EXPECT_EQ(ObjectsOf(array), (Objects{&a, &x, &b, &c}));
}

TEST(KvoObjArray, InsertPastTheEndAppends)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    array.Pop();

    array.Insert(&x, 99);

    EXPECT_EQ(ObjectsOf(array), (Objects{&a, &b, &x}));
    EXPECT_EQ(array.Find(&x), 2);
}

TEST(KvoObjArray, InsertBelowZeroGoesToTheFront)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    array.Insert(&x, -4);

    EXPECT_EQ(ObjectsOf(array), (Objects{&x, &a, &b, &c}));
}

TEST(KvoObjArray, InsertAtTheSizeAppends)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    array.Insert(&x, 3);

    EXPECT_EQ(ObjectsOf(array), (Objects{&a, &b, &c, &x}));
}

TEST(KvoObjArray, InsertTakesNullLikeAnyObject)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    array.Insert(nullptr, 1);

    EXPECT_EQ(ObjectsOf(array), (Objects{&a, nullptr, &b, &c}));
}

TEST(KvoObjArray, InsertGrowsAsBumpSizeDoes)
{
    Counted a("a");
    KvoObjArray grown;
    std::vector<int> capacities;

    for (int i = 0; i < 8; ++i) {
        grown.Insert(&a, 0);
        capacities.push_back(grown.capacity);
    }

    EXPECT_EQ(capacities, (std::vector<int>{1, 2, 3, 5, 5, 7, 7, 10}));
}

TEST(KvoObjArray, RemoveClosesTheGap)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    KvoObject* removed = array.Remove(0);

    EXPECT_EQ(removed, &a);
    EXPECT_EQ(ObjectsOf(array), (Objects{&b, &c}));
    EXPECT_EQ(Counted::alive, 4);
}

TEST(KvoObjArray, RemoveShrinksAsBumpSizeDoes)
{
    KvoObjArray ten;
    ten.SetSize(9);
    ten.Allocate(10);

    ten.Remove(8);
    int capacity_at_eight = ten.capacity;
    ten.Remove(7);

    EXPECT_EQ(capacity_at_eight, 10);
    EXPECT_EQ(ten.capacity, 7);
}

TEST(KvoObjArray, RemoveOutsideTheArrayChangesNothing)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    EXPECT_EQ(array.Remove(5), nullptr);
    EXPECT_EQ(array.Remove(3), nullptr);
    EXPECT_EQ(array.Remove(-1), nullptr);
    EXPECT_EQ(ObjectsOf(array), (Objects{&a, &b, &c}));
}

TEST(KvoObjArray, RemoveFromABlockThatIsTooSmallShiftsZeros)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    array.Allocate(2);

    KvoObject* removed = array.Remove(0);

    EXPECT_EQ(removed, &a);
    EXPECT_EQ(ObjectsOf(array), (Objects{&b, nullptr}));
}

TEST(KvoObjArray, PopTakesTheLast)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    KvoObject* last = array.Pop();

    EXPECT_EQ(last, &c);
    EXPECT_EQ(ObjectsOf(array), (Objects{&a, &b}));
}

TEST(KvoObjArray, PopOfAnEmptyOneGivesNull)
{
    KvoObjArray array;

    EXPECT_EQ(array.Pop(), nullptr);
    EXPECT_EQ(array.size, 0);
}

TEST(KvoObjArray, DeleteContentsDeletesEveryObjectAndFreesTheBlock)
{
    KvoObjArray array;
    array[0] = new Counted("a");
    array[2] = new Counted("c");
    ASSERT_EQ(Counted::alive, 2);

    array.DeleteContents();

    EXPECT_EQ(Counted::alive, 0);
    EXPECT_EQ(array.size, 0);
    EXPECT_EQ(array.capacity, 0);
    EXPECT_EQ(array.data, nullptr);
}

TEST(KvoObjArray, DestroyingItLeavesTheObjectsAlive)
{
    Counted object("a");
    {
        KvoObjArray array;
        array[0] = &object;
    }

    EXPECT_EQ(Counted::alive, 1);
}

TEST(KvoObjArray, CloneContentsLeavesTheOldObjectsToOthers)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    array.CloneContents();

    EXPECT_EQ(Counted::alive, 7);
    EXPECT_NE(array[0], &a);
    EXPECT_STREQ(static_cast<KvoNamedObject*>(array[0])->name, "a");
    EXPECT_STREQ(static_cast<KvoNamedObject*>(array[2])->name, "c");
    array.DeleteContents();
    EXPECT_EQ(Counted::alive, 4);
}

TEST(KvoObjArray, CloneContentsLeavesNullElementsNull)
{
    KvoObjArray array(2);

    array.CloneContents();

    EXPECT_EQ(ObjectsOf(array), (Objects{nullptr, nullptr}));
}

TEST(KvoObjArray, CopySharesTheObjects)
{
    Three three;
    auto& [a, b, c, x, array] = three;
    KvoObjArray copy(array);

    EXPECT_EQ(ObjectsOf(copy), ObjectsOf(array));
    EXPECT_EQ(Counted::alive, 4);
}
