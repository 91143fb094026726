#include "KVO/KvoSkipList.h"

#include <algorithm>
#include <new>

#include "core/skip_nodes.h"

namespace {

using SLNode = KvoSkipList::SLNode;

constexpr int max_levels = KvoSkipList::max_levels;

using Nodes = zt_core::NodeStore<SLNode, max_levels>;

constinit bool random_seeded = false;

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
        SLNode* node = Nodes::take(from->level, from->object);
        if (!node)
            break;
        for (int i = 0; i <= node->level; ++i)
            last[i] = last[i]->forward[i] = node;
        ++count;
    }
    for (int i = 0; i < levels; ++i)
        last[i]->forward[i] = nullptr;
    zt_core::drop_empty_levels(header, levels);
}

void KvoSkipList::Clear()
{
    SLNode* node = header->forward[0];
    while (node) {
        SLNode* next = node->forward[0];
        Nodes::give_back(node);
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
    const auto place =
        zt_core::walk(header, levels, update, [wanted](const SLNode* node) {
            return compare(node, wanted);
        });
    current = place.before;
    return place.equal ? place.node : nullptr;
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

int KvoSkipList::insert_after(SLNode** update, KvoObject* object)
{
    SLNode* node =
        zt_core::link_node<max_levels>(header, levels, update, object);
    if (!node)
        return 0;
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
    zt_core::unlink_node(header, levels, update, node);
    current = update[0];
    KvoObject* object = node->object;
    Nodes::give_back(node);
    --count;
    return object;
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
    zt_core::drop_empty_levels(header, levels);
    zt_core::drop_empty_levels(rest->header, rest->levels);
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
    current = zt_core::last_node(header, levels);
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
