#include "core/node_store.h"

#include <algorithm>
#include <cstring>
#include <random>
#include <set>
#include <vector>

#include <gtest/gtest.h>

namespace {

constexpr int max_levels = 24;

/// Each test names a kind of its own, and has a store to itself.
template <int kind>
struct TestNode
{
    void* held;
    TestNode** forward;
    int level;
};

template <class Node>
using Store = zt_core::NodeStore<Node, max_levels>;

template <class Node>
std::size_t BytesOf(const Node* node)
{
    return sizeof(Node) +
           static_cast<std::size_t>(node->level + 1) * sizeof(Node*);
}

/// Takes a node and writes to all of it that is the user's.
template <class Node>
Node* TakeAndFill(int level)
{
    static int held = 0;
    Node* node = Store<Node>::take(level, &held);
    if (!node)
        return nullptr;
    EXPECT_EQ(node->held, &held);
    EXPECT_EQ(node->level, level);
    std::fill_n(node->forward, level + 1, node);
    return node;
}

/// Tells whether nobody else wrote to the node.
template <class Node>
bool IsAsFilled(const Node* node)
{
    return std::all_of(node->forward, node->forward + node->level + 1,
                       [node](const Node* next) { return next == node; });
}

/// Heights as a list draws them.
int DrawLevel(std::mt19937& dice)
{
    int level = 0;
    while (level < max_levels - 1 && dice() % 4 == 0)
        ++level;
    return level;
}

template <class Node>
std::set<std::uintptr_t> BlocksOf(const std::vector<Node*>& nodes)
{
    std::set<std::uintptr_t> blocks;
    for (const Node* node : nodes)
        blocks.insert(reinterpret_cast<std::uintptr_t>(node) /
                      zt_core::Slab::block_bytes);
    return blocks;
}

template <class Node>
std::vector<Node*> TakeMany(std::size_t count, std::mt19937& dice)
{
    std::vector<Node*> nodes;
    while (nodes.size() < count)
        nodes.push_back(TakeAndFill<Node>(DrawLevel(dice)));
    return nodes;
}

template <class Node>
void GiveBack(std::vector<Node*>& nodes)
{
    for (Node* node : nodes)
        Store<Node>::give_back(node);
    nodes.clear();
}

} // namespace

TEST(NodeStore, NodesInUseLieApartWhateverWasFreedBetween)
{
    using Node = TestNode<0>;
    std::mt19937 dice(1);
    std::vector<Node*> nodes;

    // Grows to some blocks, shrinks to next to nothing, and again.
    for (int i = 0; i < 60000; ++i) {
        const bool shrinking = i / 10000 % 2 != 0;
        if (nodes.empty() || dice() % 8 >= (shrinking ? 7u : 1u)) {
            nodes.push_back(TakeAndFill<Node>(DrawLevel(dice)));
            continue;
        }
        std::swap(nodes[dice() % nodes.size()], nodes.back());
        ASSERT_TRUE(IsAsFilled(nodes.back()));
        Store<Node>::give_back(nodes.back());
        nodes.pop_back();
    }

    const char* end = nullptr;
    std::sort(nodes.begin(), nodes.end());
    for (const Node* node : nodes) {
        const char* begin = reinterpret_cast<const char*>(node);
        EXPECT_TRUE(!end || begin >= end);
        EXPECT_TRUE(IsAsFilled(node));
        end = begin + BytesOf(node);
    }
    GiveBack(nodes);
}

TEST(NodeStore, NodesLieCloseTogetherAfterManyWereFreedInAnyOrder)
{
    using Node = TestNode<1>;
    std::mt19937 dice(2);
    std::vector<Node*> few = TakeMany<Node>(1000, dice);
    const std::size_t least = BlocksOf(few).size();
    std::vector<Node*> many = TakeMany<Node>(100000, dice);

    std::shuffle(many.begin(), many.end(), dice);
    GiveBack(many);
    std::vector<Node*> again = TakeMany<Node>(1000, dice);

    // Where each piece is an allocation of its own the heap says where.
    if (!zt_core::pieces_are_separate) {
        EXPECT_LE(BlocksOf(again).size(), least + 1);
    }
    GiveBack(few);
    GiveBack(again);
}

TEST(NodeStore, TakesNoNewBlockWhileFreedNodesWait)
{
    using Node = TestNode<2>;
    std::mt19937 dice(3);
    std::vector<Node*> nodes = TakeMany<Node>(20000, dice);
    const std::set<std::uintptr_t> before = BlocksOf(nodes);

    // Half of every block, so that none of them is empty.
    std::vector<int> levels;
    for (std::size_t i = 0; i < nodes.size(); i += 2) {
        levels.push_back(nodes[i]->level);
        Store<Node>::give_back(nodes[i]);
    }
    std::size_t freed = 0;
    for (int level : levels)
        nodes[2 * freed++] = TakeAndFill<Node>(level);

    // The rest of the last block may have given way to a node too tall for it.
    if (!zt_core::pieces_are_separate) {
        EXPECT_LE(BlocksOf(nodes).size(), before.size() + 1);
    }
    GiveBack(nodes);
}
