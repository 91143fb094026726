#include "KVO/KvoSkipList.h"

#include "core/slab.h"
#include "platform/random.h"

#include <algorithm>
#include <bit>
#include <new>

/// A skip list with nodes of random height. On every level the nodes are
/// chained in ascending order; a walk starts on the top level and goes down a
/// level whenever the next node is not before the key, so that the nodes it
/// stopped at, one a level, are the ones to link behind.
///
/// A walk is bound by the memory it waits for: a node, its object and whatever
/// the object's key is. So a node's forwards lie right behind it, nodes lie
/// close together in slabs, and the two nodes that can be asked next are
/// fetched while the present one is compared.

namespace {

using SLNode = KvoSkipList::SLNode;

constexpr int max_levels = KvoSkipList::max_levels;

constinit bool random_seeded = false;

// Nodes that wait to be used again, by level, chained by `forward`; those of
// all lists.
constinit SLNode* spare_nodes[max_levels] = {};

SLNode** forwards_behind(SLNode* node)
{
    return reinterpret_cast<SLNode**>(node + 1);
}

std::size_t node_bytes(int level)
{
    return sizeof(SLNode) +
           static_cast<std::size_t>(level + 1) * sizeof(SLNode*);
}

SLNode* take_node(int level, KvoObject* object)
{
    SLNode*& spare = spare_nodes[level];
    void* piece = spare;
    if (zt_core::pieces_are_separate)
        piece = ::operator new(node_bytes(level), std::nothrow);
    else if (piece)
        spare = reinterpret_cast<SLNode*>(spare->forward);
    else
        piece = zt_core::Slab::carve(node_bytes(level));
    if (!piece)
        return nullptr;
    auto* node = static_cast<SLNode*>(piece);
    node->object = object;
    node->forward = forwards_behind(node);
    node->level = level;
    return node;
}

void free_node(SLNode* node)
{
    if (zt_core::pieces_are_separate) {
        ::operator delete(node);
        return;
    }
    SLNode*& spare = spare_nodes[node->level];
    node->forward = reinterpret_cast<SLNode**>(spare);
    spare = node;
}

int random_level()
{
    const auto bits =
        static_cast<unsigned long>(zt_platform::Random::current().draw());
    return std::max(std::countr_one(bits) - 1, 0);
}

/// Compares the object of `node` with `key`; an empty slot is after every key.
int compare(const SLNode* node, void* key)
{
    return node->object ? node->object->Compare(key) : 1;
}

} // namespace

KvoSkipList::KvoSkipList() : header(&first.node)
{
    static_assert(offsetof(Header, forward) == sizeof(SLNode));
    if (!random_seeded) {
        random_seeded = true;
        zt_platform::Random::current().seed_from_time();
    }
    *header = {nullptr, first.forward, max_levels - 1};
    reset();
}

KvoSkipList::KvoSkipList(const KvoSkipList& other)
    : KvoObject(other), header(&first.node)
{
    *header = {nullptr, first.forward, max_levels - 1};
    reset();
    copy_nodes(other);
}

KvoSkipList::~KvoSkipList()
{
    Clear();
}

KvoSkipList& KvoSkipList::operator=(const KvoSkipList& other)
{
    if (this == &other)
        return *this;
    Clear();
    copy_nodes(other);
    return *this;
}

void KvoSkipList::reset()
{
    std::fill_n(first.forward, max_levels, nullptr);
    current = nullptr;
    levels = 1;
    count = 0;
}

// Expects an empty list. If memory runs out the copy ends early.
void KvoSkipList::copy_nodes(const KvoSkipList& other)
{
    SLNode* last[max_levels];
    std::fill_n(last, max_levels, header);
    levels = other.levels;
    for (SLNode* from = other.header->forward[0]; from;
         from = from->forward[0]) {
        SLNode* node = take_node(from->level, from->object);
        if (!node)
            break;
        for (int i = 0; i <= node->level; ++i)
            last[i] = last[i]->forward[i] = node;
        ++count;
    }
    for (int i = 0; i < levels; ++i)
        last[i]->forward[i] = nullptr;
    drop_empty_levels();
}

void KvoSkipList::Clear()
{
    SLNode* node = header->forward[0];
    while (node) {
        SLNode* next = node->forward[0];
        free_node(node);
        node = next;
    }
    reset();
}

void KvoSkipList::DeleteContents()
{
    for (SLNode* node = header->forward[0]; node; node = node->forward[0])
        delete node->object;
    Clear();
}

void KvoSkipList::CloneContents()
{
    for (SLNode* node = header->forward[0]; node; node = node->forward[0])
        if (node->object)
            node->object = node->object->Clone();
}

void KvoSkipList::walk(void* key, SLNode** update) const
{
    SLNode* node = header;
    const SLNode* stopped = nullptr;
    for (int i = levels - 1; i >= 0; --i) {
        SLNode* next = node->forward[i];
        while (next && next != stopped && compare(next, key) < 0) {
            node = next;
            next = node->forward[i];
        }
        stopped = next;
        update[i] = node;
    }
    current = update[0];
}

// Moves the cursor to where the walk ends.
KvoSkipList::SLNode* KvoSkipList::first_equal(const void* key) const
{
    SLNode* update[max_levels];
    void* wanted = const_cast<void*>(key);
    walk(wanted, update);
    SLNode* next = current->forward[0];
    return next && compare(next, wanted) == 0 ? next : nullptr;
}

// Steps over `next`, the node behind `update[0]`, on every level.
void KvoSkipList::step_over(SLNode* next, SLNode** update) const
{
    for (int i = 0; i < levels && update[i]->forward[i] == next; ++i)
        update[i] = next;
}

void KvoSkipList::Insert(KvoObject* object)
{
    if (!object)
        return;
    SLNode* update[max_levels];
    void* key = object->Key();
    walk(key, update);
    SLNode* next;
    while ((next = update[0]->forward[0]) && compare(next, key) == 0)
        step_over(next, update);
    current = update[0];
    insert_after(update, object);
}

int KvoSkipList::InsertUnique(KvoObject* object)
{
    if (!object)
        return 0;
    SLNode* update[max_levels];
    void* key = object->Key();
    walk(key, update);
    SLNode* next = update[0]->forward[0];
    if (next && compare(next, key) == 0)
        return 0;
    return insert_after(update, object);
}

// A list grows by at most one level a node.
int KvoSkipList::insert_after(SLNode** update, KvoObject* object)
{
    const int top = std::min({random_level(), levels, max_levels - 1});
    SLNode* node = take_node(top, object);
    if (!node)
        return 0;
    if (top == levels)
        update[levels++] = header;
    for (int i = 0; i <= top; ++i) {
        node->forward[i] = update[i]->forward[i];
        update[i]->forward[i] = node;
    }
    current = node;
    ++count;
    return 1;
}

KvoObject* KvoSkipList::Remove(KvoObject* object)
{
    if (!object)
        return nullptr;
    SLNode* update[max_levels];
    void* key = object->Key();
    walk(key, update);
    SLNode* next;
    while ((next = update[0]->forward[0]) && compare(next, key) == 0) {
        if (next->object == object)
            return take_out(next, update);
        step_over(next, update);
    }
    return nullptr;
}

KvoObject* KvoSkipList::RemoveKey(const void* key)
{
    SLNode* update[max_levels];
    void* wanted = const_cast<void*>(key);
    walk(wanted, update);
    SLNode* next = update[0]->forward[0];
    return next && compare(next, wanted) == 0 ? take_out(next, update)
                                              : nullptr;
}

KvoObject* KvoSkipList::take_out(SLNode* node, SLNode** update)
{
    for (int i = 0; i < levels && update[i]->forward[i] == node; ++i)
        update[i]->forward[i] = node->forward[i];
    current = update[0];
    KvoObject* object = node->object;
    free_node(node);
    --count;
    drop_empty_levels();
    return object;
}

void KvoSkipList::drop_empty_levels()
{
    while (levels >= 2 && !header->forward[levels - 1])
        --levels;
}

KvoSkipList* KvoSkipList::Split(const void* key)
{
    auto* rest = new (std::nothrow) KvoSkipList;
    if (!rest)
        return nullptr;
    SLNode* update[max_levels];
    walk(const_cast<void*>(key), update);
    for (int i = 0; i < levels; ++i) {
        rest->header->forward[i] = update[i]->forward[i];
        update[i]->forward[i] = nullptr;
    }
    const int total = count;
    count = 0;
    for (SLNode* node = header->forward[0]; node; node = node->forward[0])
        ++count;
    rest->count = total - count;
    rest->levels = levels;
    drop_empty_levels();
    rest->drop_empty_levels();
    return rest;
}

KvoObject* KvoSkipList::Search(const void* key) const
{
    SLNode* found = first_equal(key);
    if (!found)
        return nullptr;
    current = found;
    return found->object;
}

KvoObject* KvoSkipList::SearchAlmost(const void* key) const
{
    if (SLNode* found = first_equal(key))
        current = found;
    return current == header ? nullptr : current->object;
}

KvoObject* KvoSkipList::Head() const
{
    current = header->forward[0];
    return current ? current->object : nullptr;
}

KvoObject* KvoSkipList::Tail() const
{
    current = header;
    for (int i = levels - 1; i >= 0; --i)
        while (current->forward[i])
            current = current->forward[i];
    return current == header ? nullptr : current->object;
}

KvoObject* KvoSkipList::Next() const
{
    if (current)
        current = current->forward[0];
    return current ? current->object : nullptr;
}

KvoObject* KvoSkipList::Peek() const
{
    SLNode* next = current ? current->forward[0] : nullptr;
    return next ? next->object : nullptr;
}

KvoObject*& KvoSkipList::operator[](const void* key)
{
    SearchAlmost(key);
    header->object = nullptr;
    return current->object;
}

KvoObject* KvoSkipList::operator[](const void* key) const
{
    return SearchAlmost(key);
}
