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
/// close together in slabs, and what can be asked next is fetched while the
/// present object compares itself.

namespace {

using SLNode = KvoSkipList::SLNode;

constexpr int max_levels = KvoSkipList::max_levels;

constinit bool random_seeded = false;

// Nodes that wait to be used again, by level, chained by `forward[0]`; those
// of all lists.
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
    if (SLNode* node = spare_nodes[level]) {
        spare_nodes[level] = node->forward[0];
        node->object = object;
        return node;
    }
    void* piece = zt_core::pieces_are_separate
                      ? ::operator new(node_bytes(level), std::nothrow)
                      : zt_core::Slab::carve(node_bytes(level));
    if (!piece)
        return nullptr;
    auto* node = static_cast<SLNode*>(piece);
    *node = {object, forwards_behind(node), level};
    return node;
}

void free_node(SLNode* node)
{
    if (zt_core::pieces_are_separate) {
        ::operator delete(node);
        return;
    }
    node->forward[0] = spare_nodes[node->level];
    spare_nodes[node->level] = node;
}

int random_level()
{
    const auto bits =
        static_cast<unsigned long>(zt_platform::Random::current().draw());
    return std::max(std::countr_one(bits) - 1, 0);
}

/// Fetches what can be asked after `next`, which follows `node` on `level`: what
/// lies below `node`, and the one behind `next`.
///
/// Always inlined, for g++ takes a function that only fetches for one without
/// any effect and drops its calls.
[[gnu::always_inline]] inline void fetch_ahead(SLNode* node, SLNode* next,
                                               int level)
{
    if (level > 0) {
        SLNode* below = forwards_behind(node)[level - 1];
        __builtin_prefetch(below->object);
        __builtin_prefetch(forwards_behind(below)[level - 1]);
    }
    if (const SLNode* behind = forwards_behind(next)[level])
        __builtin_prefetch(behind->object);
    if (level > 1)
        __builtin_prefetch(forwards_behind(node)[level - 2]);
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

// Gives the first node that is equal to the key, null if there is none.
KvoSkipList::SLNode* KvoSkipList::walk(const void* key, SLNode** update) const
{
    auto* wanted = const_cast<void*>(key);
    SLNode* node = header;
    SLNode* stopped = nullptr;
    bool equal = false;
    for (int i = levels - 1; i >= 0; --i) {
        SLNode* next = forwards_behind(node)[i];
        while (next && next != stopped) {
            fetch_ahead(node, next, i);
            const int order = compare(next, wanted);
            if (order >= 0) {
                equal = order == 0;
                break;
            }
            node = next;
            next = forwards_behind(node)[i];
        }
        stopped = next;
        update[i] = node;
    }
    current = node;
    return equal ? stopped : nullptr;
}

// Steps over the node behind `update[0]` and gives the next one if that is
// equal to the key too.
KvoSkipList::SLNode* KvoSkipList::step_over(SLNode* node, void* key,
                                            SLNode** update) const
{
    for (int i = 0; i < levels && update[i]->forward[i] == node; ++i)
        update[i] = node;
    SLNode* next = node->forward[0];
    return next && compare(next, key) == 0 ? next : nullptr;
}

void KvoSkipList::Insert(KvoObject* object)
{
    if (!object)
        return;
    SLNode* update[max_levels];
    void* key = object->Key();
    SLNode* equal = walk(key, update);
    while (equal)
        equal = step_over(equal, key, update);
    current = update[0];
    insert_after(update, object);
}

int KvoSkipList::InsertUnique(KvoObject* object)
{
    SLNode* update[max_levels];
    if (!object || walk(object->Key(), update))
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
    SLNode* equal = walk(key, update);
    while (equal && equal->object != object)
        equal = step_over(equal, key, update);
    return equal ? take_out(equal, update) : nullptr;
}

KvoObject* KvoSkipList::RemoveKey(const void* key)
{
    SLNode* update[max_levels];
    SLNode* equal = walk(key, update);
    return equal ? take_out(equal, update) : nullptr;
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
    walk(key, update);
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
    SLNode* update[max_levels];
    SLNode* equal = walk(key, update);
    if (!equal)
        return nullptr;
    current = equal;
    return equal->object;
}

KvoObject* KvoSkipList::SearchAlmost(const void* key) const
{
    SLNode* update[max_levels];
    if (SLNode* equal = walk(key, update))
        current = equal;
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
