#ifndef ZT_CORE_SKIP_NODES_H
#define ZT_CORE_SKIP_NODES_H

/// \file
/// What the two skip lists have in common: nodes of random height, the walk
/// that finds a key's place among them, and their chaining.
///
/// On every level the nodes are chained in ascending order; a walk starts on
/// the top level and goes down a level whenever the next node is not before
/// the key, so that the nodes it stopped at, one a level, are the ones to link
/// behind.
///
/// A walk is bound by the memory it waits for: a node, its object and whatever
/// the object's key is. So what can be asked next is fetched while the present
/// object is compared; `node_store.h` keeps the nodes close together.

#include <algorithm>
#include <bit>

#include "core/node_store.h"
#include "platform/random.h"

namespace zt_core {
/// Gives what `node` holds, whatever that member is called.
template <class Node>
const void* held_by(const Node* node)
{
    const auto& [held, forward, level] = *node;
    return held;
}

/// Draws the height of a new node: one less than the number of low one bits.
inline int random_level()
{
    const auto bits =
        static_cast<unsigned long>(zt_platform::Random::current().draw());
    return std::max(std::countr_one(bits) - 1, 0);
}

/// Fetches what can be asked after `next`, which follows `node` on `level`:
/// what lies below `node`, and the one behind `next`.
///
/// Always inlined, for g++ takes a function that only fetches for one without
/// any effect and drops its calls.
template <class Node>
[[gnu::always_inline]] inline void fetch_ahead(Node* node, Node* next,
                                               int level)
{
    if (level > 0) {
        Node* below = forwards_behind(node)[level - 1];
        __builtin_prefetch(held_by(below));
        __builtin_prefetch(forwards_behind(below)[level - 1]);
    }
    if (const Node* behind = forwards_behind(next)[level])
        __builtin_prefetch(held_by(behind));
    if (level > 1)
        __builtin_prefetch(forwards_behind(node)[level - 2]);
}

/// Where a key belongs.
template <class Node>
struct Place
{
    Node* before; ///< The last node before the key, or the header.
    Node* node;   ///< The first node that is not before the key; may be null.
    bool equal;   ///< Whether that node is equal to the key.
};

/// Looks for a key's place; `order(node)` compares a node with the key. No node
/// is compared twice: a level stops at the node that stopped the one above,
/// which every level below holds too, or at the end.
///
/// `update` gets the last node before the key on each level, or the header.
template <class Node, class Order>
Place<Node> walk(Node* header, int levels, Node** update, const Order& order)
{
    Node* node = header;
    Node* stopped = nullptr;
    bool equal = false;
    for (int i = levels - 1; i >= 0; --i) {
        Node* next = forwards_behind(node)[i];
        while (next != stopped) {
            fetch_ahead(node, next, i);
            const int side = order(next);
            if (side >= 0) {
                equal = side == 0;
                stopped = next;
                break;
            }
            node = next;
            next = forwards_behind(node)[i];
        }
        update[i] = node;
    }
    return {node, stopped, equal};
}

/// Puts a new node of random height behind those in `update`; a list grows by
/// at most one level a node.
///
/// Returns: the node; null, with nothing changed, when memory runs out.
template <int max_levels, class Node, class Held>
Node* link_node(Node* header, int& levels, Node** update, Held* held)
{
    const int top = std::min({random_level(), levels, max_levels - 1});
    Node* node = NodeStore<Node, max_levels>::take(top, held);
    if (!node)
        return nullptr;
    if (top == levels)
        update[levels++] = header;
    for (int i = 0; i <= top; ++i) {
        node->forward[i] = update[i]->forward[i];
        update[i]->forward[i] = node;
    }
    return node;
}

template <class Node>
void drop_empty_levels(const Node* header, int& levels)
{
    while (levels >= 2 && !header->forward[levels - 1])
        --levels;
}

/// Takes `node`, which is behind those in `update`, out of every chain.
template <class Node>
void unlink_node(const Node* header, int& levels, Node** update, Node* node)
{
    for (int i = 0; i < levels && update[i]->forward[i] == node; ++i)
        update[i]->forward[i] = node->forward[i];
    drop_empty_levels(header, levels);
}

/// Gives the last node, or the header.
template <class Node>
Node* last_node(Node* header, int levels)
{
    for (int i = levels - 1; i >= 0; --i)
        while (header->forward[i])
            header = header->forward[i];
    return header;
}
} // namespace zt_core

#endif
