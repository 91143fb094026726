#include "KVO/KvoList.h"

#include "core/slab.h"

#include <new>

namespace {

using Link = KvoList::Link;

// Links that wait to be used again, chained by `next`; those of all lists.
constinit Link* spare_links = nullptr;

// What writing outside a list goes to.
constinit void* junkPtr = nullptr;

Link* take_link(void* item)
{
    Link* link = spare_links;
    if (zt_core::pieces_are_separate)
        link = new (std::nothrow) Link;
    else if (link)
        spare_links = link->next;
    else
        link = static_cast<Link*>(zt_core::Slab::carve(sizeof(Link)));
    if (link)
        link->item = item;
    return link;
}

void free_chain(Link* first, Link* last)
{
    if (!zt_core::pieces_are_separate) {
        last->next = spare_links;
        spare_links = first;
        return;
    }
    last->next = nullptr;
    while (first) {
        Link* next = first->next;
        delete first;
        first = next;
    }
}

/// Puts `link` between two neighbours, null for the ends of the list.
void link_between(KvoList& list, Link* prev, Link* link, Link* next)
{
    link->prev = prev;
    link->next = next;
    (prev ? prev->next : list.head) = link;
    (next ? next->prev : list.tail) = link;
    list.current = link;
    ++list.count;
}

/// Inserts `item` just before `next`; null is the place of the head.
void insert_before(KvoList& list, Link* next, void* item)
{
    if (!next)
        next = list.head;
    if (Link* link = take_link(item))
        link_between(list, next ? next->prev : nullptr, link, next);
}

void unlink_from(KvoList& list, Link* link)
{
    (link->prev ? link->prev->next : list.head) = link->next;
    (link->next ? link->next->prev : list.tail) = link->prev;
    --list.count;
}

/// Gives where the cursor goes when `link` is removed: to the new head or tail,
/// or to the link before.
Link* cursor_without(const Link* link)
{
    return link->prev ? link->prev : link->next;
}

/// Removes `link` and gives its item; null has none.
void* remove_link(KvoList& list, Link* link)
{
    if (!link)
        return nullptr;
    list.current = cursor_without(link);
    unlink_from(list, link);
    void* item = link->item;
    free_chain(link, link);
    return item;
}

void float_link(KvoList& list, Link* link)
{
    unlink_from(list, link);
    link_between(list, nullptr, link, list.head);
}

void sink_link(KvoList& list, Link* link)
{
    unlink_from(list, link);
    link_between(list, list.tail, link, nullptr);
}

void* item_of(const Link* link)
{
    return link ? link->item : nullptr;
}

} // namespace

KvoList::KvoList() : head(nullptr), tail(nullptr), current(nullptr), count(0) {}

KvoList::KvoList(const KvoList& other) : KvoList()
{
    for (Link* link = other.head; link; link = link->next)
        PushTail(link->item);
}

KvoList::~KvoList()
{
    Clear();
}

KvoList& KvoList::operator=(const KvoList& other)
{
    if (this == &other)
        return *this;
    Clear();
    for (Link* link = other.head; link; link = link->next)
        PushTail(link->item);
    return *this;
}

void KvoList::Clear()
{
    if (head)
        free_chain(head, tail);
    head = tail = current = nullptr;
    count = 0;
}

void KvoList::DeleteContents(void (*deleter)(void*))
{
    for (Link* link = head; link && deleter; link = link->next)
        deleter(link->item);
    Clear();
}

void KvoList::CloneContents(void* (*cloner)(void*))
{
    for (Link* link = head; link && cloner; link = link->next)
        link->item = cloner(link->item);
}

void* KvoList::Head()
{
    current = head;
    return item_of(current);
}

void* KvoList::Tail()
{
    current = tail;
    return item_of(current);
}

void* KvoList::Next()
{
    if (current)
        current = current->next;
    return item_of(current);
}

void* KvoList::Prev()
{
    if (current)
        current = current->prev;
    return item_of(current);
}

void KvoList::Push(void* item)
{
    if (Link* link = take_link(item))
        link_between(*this, nullptr, link, head);
}

void KvoList::PushTail(void* item)
{
    if (Link* link = take_link(item))
        link_between(*this, tail, link, nullptr);
}

void* KvoList::Pop()
{
    return remove_link(*this, head);
}

void* KvoList::PopTail()
{
    return remove_link(*this, tail);
}

KvoList::Link* KvoList::LinkAt(int index) const
{
    if (index < 0 || index >= count)
        return nullptr;
    Link* link;
    if (index < count / 2) {
        for (link = head; index > 0; --index)
            link = link->next;
    } else {
        link = tail;
        for (int steps = count - 1 - index; steps > 0; --steps)
            link = link->prev;
    }
    return link;
}

KvoList::Link* KvoList::LinkAt(void* item) const
{
    Link* link = head;
    while (link && link->item != item)
        link = link->next;
    return link;
}

void KvoList::Insert(void* item, void* before)
{
    insert_before(*this, LinkAt(before), item);
}

void KvoList::Insert(void* item, int index)
{
    if (index >= count)
        PushTail(item);
    else
        insert_before(*this, LinkAt(index), item);
}

void KvoList::Remove(void* item)
{
    remove_link(*this, LinkAt(item));
}

void* KvoList::Remove(int index)
{
    return remove_link(*this, LinkAt(index));
}

// An item that is in the list keeps its link, so that moving it cannot fail.

void KvoList::Float(void* item)
{
    if (Link* link = LinkAt(item))
        float_link(*this, link);
    else
        Push(item);
}

void KvoList::Float(int index)
{
    if (Link* link = LinkAt(index))
        float_link(*this, link);
    else
        Push(nullptr);
}

void KvoList::Sink(void* item)
{
    if (Link* link = LinkAt(item))
        sink_link(*this, link);
    else
        PushTail(item);
}

void KvoList::Sink(int index)
{
    if (Link* link = LinkAt(index))
        sink_link(*this, link);
    else
        PushTail(nullptr);
}

void*& KvoList::operator[](int index)
{
    current = LinkAt(index);
    if (current)
        return current->item;
    junkPtr = nullptr;
    return junkPtr;
}

void* KvoList::operator[](int index) const
{
    return item_of(LinkAt(index));
}

KvoListIter::KvoListIter(const KvoList& walked, Direction way)
    : list(const_cast<KvoList*>(&walked)), modifying(0), direction(way)
{
    Rewind();
}

KvoListIter::KvoListIter(KvoList& walked, Direction way)
    : list(&walked), modifying(1), direction(way)
{
    Rewind();
}

KvoListIter::KvoListIter(const KvoListIter& other)
{
    *this = other;
}

KvoListIter::~KvoListIter() = default;

KvoListIter& KvoListIter::operator=(const KvoListIter& other)
{
    if (this == &other)
        return *this;
    list = other.list;
    modifying = other.modifying;
    direction = other.direction;
    start = other.start;
    cursor = other.cursor == &other.start ? &start : other.cursor;
    return *this;
}

void KvoListIter::Rewind()
{
    start = {nullptr, nullptr, nullptr};
    if (direction != Forward)
        start.prev = list->tail;
    else
        start.next = list->head;
    cursor = &start;
}

void* KvoListIter::operator()()
{
    return direction != Forward ? Prev() : Next();
}

void* KvoListIter::Next()
{
    if (cursor)
        cursor = cursor->next;
    return item_of(cursor);
}

void* KvoListIter::Prev()
{
    if (cursor)
        cursor = cursor->prev;
    return item_of(cursor);
}

void KvoListIter::DeleteLast()
{
    if (!modifying || !cursor || cursor == &start)
        return;
    Link* link = cursor;
    Link* position = direction != Forward ? link->next : link->prev;
    const bool at_end = !link->prev || !link->next;
    if (at_end || list->current == link)
        list->current = cursor_without(link);
    unlink_from(*list, link);
    free_chain(link, link);
    if (at_end)
        Rewind();
    cursor = position ? position : &start;
}
