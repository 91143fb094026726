#include "ZT/skip.h"

#include <algorithm>
#include <cstring>

#include "core/skip_nodes.h"
#include "core/truncate.h"

namespace {

using SLNode = ZtSkipList::SLNode;

constexpr int max_levels = ZtSkipList::max_levels;

using Nodes = zt_core::NodeStore<SLNode, max_levels>;

constinit bool random_seeded = false;

// What a record begins with; nothing for null.
template <class Value>
Value first_of(const void* record)
{
    return record ? *static_cast<const Value*>(record) : Value();
}

const char* text_of(const void* record)
{
    const char* text = first_of<const char*>(record);
    return text ? text : "";
}

} // namespace

ZtSkipList::ZtSkipList(CompareFunction comparison, UniqueState state)
    : unique(state), compare(comparison ? comparison : CompareString)
{
    static_assert(sizeof(Header) ==
                  sizeof(SLNode) + sizeof(SLNode* [max_levels]));
    if (!random_seeded) {
        random_seeded = true;
        zt_platform::Random::current().seed_from_time();
    }
    reset();
}

ZtSkipList::ZtSkipList(const ZtSkipList& other)
    : KvoObject(other), unique(other.unique), compare(other.compare)
{
    reset();
    copy_items(other);
}

ZtSkipList::~ZtSkipList()
{
    Clear(nullptr);
}

ZtSkipList& ZtSkipList::operator=(const ZtSkipList& other)
{
    if (this == &other)
        return *this;
    Clear(nullptr);
    unique = other.unique;
    compare = other.compare;
    copy_items(other);
    return *this;
}

void ZtSkipList::reset()
{
    header.item = nullptr;
    header.forward = header.forwards;
    header.level = max_levels - 1;
    std::fill_n(header.forwards, max_levels, nullptr);
    current = nullptr;
    levels = 1;
    count = 0;
}

void ZtSkipList::copy_items(const ZtSkipList& other)
{
    for (SLNode* node = other.header.forward[0]; node; node = node->forward[0])
        Insert(node->item);
}

void ZtSkipList::Clear(void (*deleter)(void*))
{
    SLNode* node = header.forward[0];
    while (node) {
        SLNode* next = node->forward[0];
        if (deleter)
            deleter(node->item);
        Nodes::give_back(node);
        node = next;
    }
    reset();
}

void ZtSkipList::CloneData(void* (*cloner)(void*))
{
    if (!cloner)
        return;
    for (SLNode* node = header.forward[0]; node; node = node->forward[0])
        node->item = cloner(node->item);
}

// Gives the first node that is equal to the key, null if there is none. The
// first that is not before the key is in any case the one behind the cursor.
//
// The cursor may stand on the header of a list that is only read, hence the
// cast.
ZtSkipList::SLNode* ZtSkipList::walk(const void* key, SLNode** update) const
{
    SLNode* first = const_cast<Header*>(&header);
    const auto place =
        zt_core::walk(first, levels, update, [this, key](const SLNode* node) {
            return compare(node->item, key);
        });
    current = place.before;
    return place.equal ? place.node : nullptr;
}

ZtSkipList::SLNode* ZtSkipList::KeySearch(const void* key,
                                          SLNode** update) const
{
    SLNode* own_update[max_levels];
    walk(key, update ? update : own_update);
    return current->forward[0];
}

int ZtSkipList::Insert(void* item)
{
    SLNode* update[max_levels];
    if (walk(item, update) && unique == Unique)
        return 0;
    SLNode* first = &header;
    SLNode* node = zt_core::link_node<max_levels>(first, levels, update, item);
    if (!node)
        return 0;
    current = node;
    ++count;
    return 1;
}

void* ZtSkipList::Remove(const void* key)
{
    SLNode* update[max_levels];
    SLNode* equal = walk(key, update);
    if (!equal)
        return nullptr;
    zt_core::unlink_node<SLNode>(&header, levels, update, equal);
    void* item = equal->item;
    Nodes::give_back(equal);
    --count;
    return item;
}

void* ZtSkipList::Search(const void* key) const
{
    SLNode* update[max_levels];
    const SLNode* equal = walk(key, update);
    current = current->forward[0];
    return equal ? equal->item : nullptr;
}

void* ZtSkipList::SearchAlmost(const void* key) const
{
    SLNode* update[max_levels];
    if (SLNode* equal = walk(key, update))
        current = equal;
    return current == &header ? nullptr : current->item;
}

void* ZtSkipList::Head() const
{
    current = header.forward[0];
    return current ? current->item : nullptr;
}

void* ZtSkipList::Tail() const
{
    current = zt_core::last_node<SLNode>(const_cast<Header*>(&header), levels);
    return current == &header ? nullptr : current->item;
}

void* ZtSkipList::Peek() const
{
    const SLNode* next = current ? current->forward[0] : nullptr;
    return next ? next->item : nullptr;
}

int ZtSkipList::CompareString(const void* a, const void* b)
{
    return std::strcmp(text_of(a), text_of(b));
}

int ZtSkipList::CompareInt(const void* a, const void* b)
{
    return static_cast<int>(first_of<unsigned>(a) - first_of<unsigned>(b));
}

int ZtSkipList::CompareFloat(const void* a, const void* b)
{
    const float difference = first_of<float>(a) - first_of<float>(b);
    return zt_core::truncate_to<int>(static_cast<double>(difference));
}

void*& ZtSkipList::operator[](const void* key)
{
    SearchAlmost(key);
    header.item = nullptr;
    return current->item;
}

void* ZtSkipList::operator[](const void* key) const
{
    return SearchAlmost(key);
}
