#ifndef ZT_CORE_NODE_STORE_H
#define ZT_CORE_NODE_STORE_H

/// \file
/// The store from which the skip lists take their nodes.
///
/// A node has three members: what it holds, `forward` and `level`; its forwards
/// lie right behind it.
///
/// Nodes lie in blocks, and a freed node waits in its block to be used again.
/// A new list uses up one block after the other, so its nodes lie close
/// together even where those of a larger list were freed in any order; chained
/// in that order they would lie far apart, and every step would wait for
/// memory.

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <new>

#include "core/slab.h"

namespace zt_core {
template <class Node>
Node** forwards_behind(Node* node)
{
    return reinterpret_cast<Node**>(node + 1);
}

/// The nodes of all lists of a class.
template <class Node, int max_levels>
class NodeStore
{
public:
    NodeStore() = delete;

    /// Gives a node of the height `level`, its forwards unset.
    ///
    /// Returns: null when memory runs out.
    template <class Held>
    static Node* take(int level, Held* held)
    {
        void* piece = pieces_are_separate
                          ? ::operator new(bytes(level), std::nothrow)
                          : take_piece(level);
        if (!piece)
            return nullptr;
        auto* node = static_cast<Node*>(piece);
        *node = {held, forwards_behind(node), level};
        return node;
    }

    static void give_back(Node* node)
    {
        if (pieces_are_separate) {
            ::operator delete(node);
            return;
        }
        Block* block = block_of(node);
        if (--block->nodes == 0)
            empty(block);
        else
            spare(block, node);
    }

private:
    using Levels = std::uint32_t;
    static_assert(max_levels <= 32);

    /// What a block begins with; the arrays are by level.
    struct Block
    {
        int nodes;               ///< How many are in use.
        Levels chained;          ///< Levels in whose chain the block is.
        Block* next_empty;       ///< The next block without nodes.
        Block* next[max_levels]; ///< The next one with spare nodes, perhaps.
        Node* spare[max_levels]; ///< Freed nodes, chained by `forward[0]`.
    };

    static std::size_t bytes(int level)
    {
        return sizeof(Node) +
               static_cast<std::size_t>(level + 1) * sizeof(Node*);
    }

    static Block* block_of(Node* node)
    {
        const auto place = reinterpret_cast<std::uintptr_t>(node);
        char* begin = reinterpret_cast<char*>(node) - place % Slab::block_bytes;
        return reinterpret_cast<Block*>(begin);
    }

    static void spare(Block* block, Node* node)
    {
        const int level = node->level;
        const Levels bit = Levels{1} << level;
        if (!(block->chained & bit)) {
            block->chained |= bit;
            block->next[level] = with_spare[level];
            with_spare[level] = block;
        }
        node->forward[0] = block->spare[level];
        block->spare[level] = node;
    }

    // The block stays in the chains of the levels that it had spare nodes of
    // until it is met there.
    static void empty(Block* block)
    {
        std::fill_n(block->spare, max_levels, nullptr);
        if (block == newest) {
            unused = reinterpret_cast<char*>(block + 1);
            return;
        }
        block->next_empty = without_nodes;
        without_nodes = block;
    }

    static void* take_piece(int level)
    {
        const std::size_t wanted = bytes(level);
        if (has_room(wanted) || reuse_block())
            return carve(wanted);
        if (Node* node = take_spare(level)) {
            ++block_of(node)->nodes;
            return node;
        }
        return cut_block() ? carve(wanted) : nullptr;
    }

    // The node that will be next is on its way before it is asked for.
    static Node* take_spare(int level)
    {
        while (Block* block = with_spare[level]) {
            if (Node* node = block->spare[level]) {
                block->spare[level] = node->forward[0];
                __builtin_prefetch(node->forward[0], 1);
                return node;
            }
            block->chained &= ~(Levels{1} << level);
            with_spare[level] = block->next[level];
        }
        return nullptr;
    }

    static bool has_room(std::size_t wanted)
    {
        return static_cast<std::size_t>(end - unused) >= wanted;
    }

    static void* carve(std::size_t piece_bytes)
    {
        void* piece = unused;
        unused += piece_bytes;
        ++newest->nodes;
        return piece;
    }

    static bool reuse_block()
    {
        if (!without_nodes)
            return false;
        Block* block = without_nodes;
        without_nodes = block->next_empty;
        begin(block);
        return true;
    }

    static bool cut_block()
    {
        void* place = Slab::cut_block();
        if (!place)
            return false;
        begin(new (place) Block{});
        return true;
    }

    static void begin(Block* block)
    {
        newest = block;
        unused = reinterpret_cast<char*>(block + 1);
        end = reinterpret_cast<char*>(block) + Slab::block_bytes;
    }

    static constinit inline Block* with_spare[max_levels] = {};
    static constinit inline Block* without_nodes = nullptr;

    // The block that nodes are carved from, and what is left of it.
    static constinit inline Block* newest = nullptr;
    static constinit inline char* unused = nullptr;
    static constinit inline char* end = nullptr;
};
} // namespace zt_core

#endif
