#include "command/directive_index.h"

#include <bit>

#include "command/fold_case.h"

namespace {
unsigned hash_folded(const char* word)
{
    unsigned hash = 0;
    for (; *word; ++word)
        hash = hash * 33 + zt_command::folded(*word);
    return hash ^ (hash >> 15);
}
} // namespace

zt_command::DirectiveIndex::DirectiveIndex()
    : state(State::Waiting), searches(0)
{}

KvoObject* zt_command::DirectiveIndex::Find(const KvoSkipList& list,
                                            const char* word)
{
    if (state == State::Waiting && ++searches >= list.count)
        build(list);
    if (state != State::Built)
        return nullptr;
    const int place = place_of(word) - 1;
    if (place < 0)
        return nullptr;
    void* key = const_cast<char*>(word);
    if (in_order[place]->Compare(key) != 0)
        return nullptr;
    if (place > 0 && in_order[place - 1]->Compare(key) >= 0)
        return nullptr;
    return in_order[place];
}

void zt_command::DirectiveIndex::Forget()
{
    state = State::Waiting;
    searches = 0;
}

// Goes through the list from its end, so that of equal names the first one in
// the list stands in the index, as the search would find it.
void zt_command::DirectiveIndex::build(const KvoSkipList& list)
{
    const auto wanted = static_cast<unsigned>(list.count) * 4;
    const int size = static_cast<int>(std::bit_ceil(wanted));
    state = State::Useless;
    in_order.SetSize(0);
    places.SetSize(0);
    if (list.count == 0 || list.count > (1 << 26))
        return;
    in_order.SetSize(list.count);
    places.SetSize(size);
    if (in_order.capacity < list.count || places.capacity < size)
        return;
    int filled = 0;
    for (const KvoSkipList::SLNode* node = list.header->forward[0]; node;
         node = node->forward[0])
        in_order[filled++] = node->object;
    for (int i = filled; i-- > 0;)
        place_of(static_cast<KvoNamedObject*>(in_order[i])->name) = i + 1;
    state = State::Built;
}

int& zt_command::DirectiveIndex::place_of(const char* word)
{
    return places[static_cast<int>(hash_folded(word) &
                                   static_cast<unsigned>(places.size - 1))];
}
