#ifndef KVO_KVOLIST_H
#define KVO_KVOLIST_H

/// \file
/// A doubly linked list of untyped items with a cursor inside, and an
/// iterator of its own.
///
/// The cursor is shared by everybody who uses the list and is moved by
/// whatever inserts or removes; a walk that must survive that is made with a
/// KvoListIter. Where an operation has a form for an item and one for an
/// index, a literal 0 is the index.

#include <KVO/KvoCommon.h>

/// Keeps items in order, owning its links and never its items.
///
/// The links of all lists come from one store, to which they return and which
/// is never given back to the system. When memory runs out an insertion leaves
/// the list as it was and a copy ends early, without a report.
///
/// Context: one thread; never inside the beat or a signal.
class ZT_API KvoList
{
public:
    /// One item's place in a list.
    struct Link
    {
        Link* next; ///< Null at the tail.
        Link* prev; ///< Null at the head.
        void* item; ///< Not owned; null is an item like others.
    };

    /// Makes an empty list.
    KvoList();

    /// Makes a list of the same items in the same order.
    ///
    /// Cursor: on the tail.
    KvoList(const KvoList& other);

    /// Frees the links.
    virtual ~KvoList();

    /// Drops the own items for those of `other`, in the same order.
    ///
    /// Cursor: on the tail; assigning a list to itself changes nothing.
    KvoList& operator=(const KvoList& other);

    /// Drops every item, without walking the list.
    ///
    /// Cursor: null.
    void Clear();

    /// Calls `deleter` on every item from head to tail and empties the list.
    ///
    /// A null `deleter` is not called.
    ///
    /// Cursor: null.
    void DeleteContents(void (*deleter)(void*));

    /// Replaces every item by what `cloner` gives for it, from head to tail.
    ///
    /// A null `cloner` changes nothing.
    void CloneContents(void* (*cloner)(void*));

    /// Gives the first item.
    ///
    /// Cursor:  on the head.
    /// Returns: null when the list is empty.
    void* Head();

    /// Gives the last item.
    ///
    /// Cursor:  on the tail.
    /// Returns: null when the list is empty.
    void* Tail();

    /// Gives the item behind the cursor.
    ///
    /// Cursor:  one link on; null past the tail, where it stays.
    /// Returns: null past the tail.
    void* Next();

    /// Gives the item before the cursor.
    ///
    /// Cursor:  one link back; null past the head, where it stays.
    /// Returns: null past the head.
    void* Prev();

    /// Inserts `item` at the head.
    ///
    /// Cursor: on the new link.
    void Push(void* item);

    /// Inserts `item` at the tail.
    ///
    /// Cursor: on the new link.
    void PushTail(void* item);

    /// Takes the first item off.
    ///
    /// Cursor:  on the new head.
    /// Returns: the item; null when the list is empty.
    void* Pop();

    /// Takes the last item off.
    ///
    /// Cursor:  on the new tail.
    /// Returns: the item; null when the list is empty.
    void* PopTail();

    /// Finds a link by its place, walking from the nearer end.
    ///
    /// Units:   `index` counts from 0.
    /// Owner:   the list, until the link is removed.
    /// Returns: null for an index outside the list.
    Link* LinkAt(int index) const;

    /// Finds the first link from the head that holds `item`.
    ///
    /// Owner:   the list, until the link is removed.
    /// Returns: null when there is none.
    Link* LinkAt(void* item) const;

    /// Inserts `item` just before the first link that holds `before`.
    ///
    /// Cursor:    on the new link.
    /// By design: a `before` that is not in the list means the front, not the
    ///            back (KvoList.InsertBeforeAnAbsentItemGoesToTheHead).
    void Insert(void* item, void* before);

    /// Inserts `item` so that it stands at position `index` afterwards.
    ///
    /// Units:  `index` counts from 0; below 0 is the head, past the end the
    ///         tail.
    /// Cursor: on the new link.
    void Insert(void* item, int index);

    /// Removes the first link from the head that holds `item`.
    ///
    /// Cursor: on the new head or tail if that was removed, else on the link
    ///         before the removed one; unmoved when there is none.
    void Remove(void* item);

    /// Removes the link at `index`.
    ///
    /// Cursor:  as for the other form.
    /// Returns: the item; null for an index outside the list.
    void* Remove(int index);

    /// Moves the first link that holds `item` to the head.
    ///
    /// Cursor:    on the head.
    /// By design: an item that is not in the list is pushed as well
    ///            (KvoList.FloatAndSinkOfAnAbsentItemPushIt).
    void Float(void* item);

    /// Moves the link at `index` to the head.
    ///
    /// Cursor:    on the head.
    /// By design: an index outside the list pushes a null item
    ///            (KvoList.FloatAndSinkOutsideTheListPushNull).
    void Float(int index);

    /// Moves the first link that holds `item` to the tail; the mirror image of
    /// `Float`.
    ///
    /// Cursor: on the tail.
    void Sink(void* item);

    /// Moves the link at `index` to the tail; the mirror image of `Float`.
    ///
    /// Cursor: on the tail.
    void Sink(int index);

    /// Gives the item at `index` to read or replace.
    ///
    /// Cursor:    on that link; null for an index outside the list.
    /// Owner:     the list, until the link is removed.
    /// Returns:   for an index outside the list a null item that belongs to no
    ///            list.
    /// By design: what is written to that item is lost
    ///            (KvoList.WritingOutsideTheListChangesNothing).
    void*& operator[](int index);

    /// Gives the item at `index`.
    ///
    /// Cursor:  unmoved.
    /// Returns: null for an index outside the list.
    void* operator[](int index) const;

    Link* head;    ///< Null when the list is empty.
    Link* tail;    ///< Null when the list is empty.
    Link* current; ///< The cursor.
    int count;     ///< Links in the list.
};

/// Walks a list in either direction without moving the list's cursor.
///
/// Requires: the list outlives the iterator, and only the iterator itself
///           removes links that it stands on or is about to start at.
class ZT_API KvoListIter
{
public:
    /// The direction of a walk; every value but 0 walks backward.
    enum Direction : int { Forward = 0, Backward = 1 };

    /// Makes an iterator that cannot unlink, before the first item.
    KvoListIter(const KvoList& walked, Direction way = Forward);

    /// Makes an iterator that may unlink, before the first item.
    KvoListIter(KvoList& walked, Direction way = Forward);

    /// Makes an iterator at the same place as `other`.
    KvoListIter(const KvoListIter& other);

    virtual ~KvoListIter();

    /// Moves to the list and the place of `other`.
    KvoListIter& operator=(const KvoListIter& other);

    /// Goes back before the first item in the walking direction.
    void Rewind();

    /// Steps in the walking direction.
    ///
    /// Returns: the item there; null at the end, where the walk stays until
    ///          `Rewind`.
    void* operator()();

    /// Steps toward the tail, whatever the walking direction.
    ///
    /// Returns: as `operator()`.
    void* Next();

    /// Steps toward the head, whatever the walking direction.
    ///
    /// Returns: as `operator()`.
    void* Prev();

    /// Unlinks the item that was returned last, so that the walk goes on with
    /// the one that follows it; the item itself is not deleted.
    ///
    /// A second call in a row takes the item before. Before the first item,
    /// after the end and in an iterator that cannot unlink nothing happens.
    ///
    /// Cursor: the list's own one goes to the new head or tail if that was
    ///         removed; else, if it stood on the link, to the one before.
    void DeleteLast();

    KvoList* list;         ///< The list that is walked.
    int modifying;         ///< 1 if `DeleteLast` may unlink, else 0.
    Direction direction;   ///< The walking direction.
    KvoList::Link start;   ///< The place before the first item; in no list.
    KvoList::Link* cursor; ///< The item returned last; null after the end.
};

#endif
