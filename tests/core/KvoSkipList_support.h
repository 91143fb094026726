#ifndef ZT_TESTS_KVOSKIPLIST_SUPPORT_H
#define ZT_TESTS_KVOSKIPLIST_SUPPORT_H

#include "KVO/KvoSkipList.h"

#include <algorithm>
#include <vector>

#include <gtest/gtest.h>

/// An object that is ordered by a number and counts how often it is asked.
class Number : public KvoObject
{
public:
    explicit Number(int number) : key(number) { ++alive; }
    ~Number() override { --alive; }

    KvoObject* Clone() override { return new Number(key); }
    void* Key() override { return &key; }
    int Compare(void* other) override
    {
        ++asked;
        const int number = *static_cast<int*>(other);
        return key < number ? -1 : key > number;
    }

    int key;
    int asked = 0;

    static inline int alive = 0;
};

using Objects = std::vector<KvoObject*>;

/// Gives the objects in order and checks that the nodes are chained as they
/// must be: on every level those that are tall enough, in the same order, and
/// no level without a node but the lowest.
inline Objects ObjectsOf(const KvoSkipList& list)
{
    Objects objects;
    int tallest = 0;
    const KvoSkipList::SLNode* last[KvoSkipList::max_levels];
    std::fill(std::begin(last), std::end(last), list.header);
    for (KvoSkipList::SLNode* node = list.header->forward[0]; node;
         node = node->forward[0]) {
        objects.push_back(node->object);
        tallest = std::max(tallest, node->level);
        for (int i = 0; i <= node->level; ++i) {
            EXPECT_EQ(last[i]->forward[i], node) << "level " << i;
            last[i] = node;
        }
    }
    for (int i = 0; i < KvoSkipList::max_levels; ++i)
        EXPECT_EQ(last[i]->forward[i], nullptr) << "level " << i;
    EXPECT_EQ(list.levels, tallest + 1);
    EXPECT_EQ(list.count, static_cast<int>(objects.size()));
    return objects;
}

/// Gives how high each node stands, in order.
inline std::vector<int> HeightsOf(const KvoSkipList& list)
{
    std::vector<int> heights;
    for (KvoSkipList::SLNode* node = list.header->forward[0]; node;
         node = node->forward[0])
        heights.push_back(node->level);
    return heights;
}

/// Objects of 10, 20 and 30 in a list.
struct Tens
{
    Tens()
    {
        for (Number* number : {&twenty, &ten, &thirty})
            list.Insert(number);
    }

    Number ten{10}, twenty{20}, thirty{30};
    KvoSkipList list;
};

/// Gives the object under the cursor, null also for the header.
inline KvoObject* UnderCursor(const KvoSkipList& list)
{
    return list.current ? list.current->object : nullptr;
}

#endif
