#ifndef ZT_TESTS_SKIP_SUPPORT_H
#define ZT_TESTS_SKIP_SUPPORT_H

#include "ZT/skip.h"

#include <algorithm>
#include <vector>

#include <gtest/gtest.h>

/// A record that begins with its key.
struct Record
{
    int key;
};

using Items = std::vector<void*>;

/// Gives the items in order and checks that the nodes are chained as they must
/// be: on every level those that are tall enough, in the same order, and no
/// level without a node but the lowest.
inline Items ItemsOf(const ZtSkipList& list)
{
    Items items;
    int tallest = 0;
    const ZtSkipList::SLNode* last[ZtSkipList::max_levels];
    std::fill(std::begin(last), std::end(last), &list.header);
    for (ZtSkipList::SLNode* node = list.header.forward[0]; node;
         node = node->forward[0]) {
        items.push_back(node->item);
        tallest = std::max(tallest, node->level);
        for (int i = 0; i <= node->level; ++i) {
            EXPECT_EQ(last[i]->forward[i], node) << "level " << i;
            last[i] = node;
        }
    }
    for (int i = 0; i < ZtSkipList::max_levels; ++i)
        EXPECT_EQ(last[i]->forward[i], nullptr) << "level " << i;
    EXPECT_EQ(list.levels, tallest + 1);
    EXPECT_EQ(list.count, static_cast<int>(items.size()));
    return items;
}

/// Gives how high each node stands, in order.
inline std::vector<int> HeightsOf(const ZtSkipList& list)
{
    std::vector<int> heights;
    for (ZtSkipList::SLNode* node = list.header.forward[0]; node;
         node = node->forward[0])
        heights.push_back(node->level);
    return heights;
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
inline void* UnderCursor(const ZtSkipList& list)
{
    return list.current ? list.current->item : nullptr;
}

#endif
