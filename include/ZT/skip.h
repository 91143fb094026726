#ifndef ZT_SKIP_H
#define ZT_SKIP_H

/// \file
/// Items of any kind in the ascending order that a comparison function gives
/// them, found in logarithmic time.
///
/// The untyped sibling of KvoSkipList. Surprising: equal items stand newest
/// first here, oldest first there. The cursor is shared by everybody who uses
/// the list and is moved by every search, also in a const list.

#include <KVO/KvoObject.h>
#include <ZT/common.h>

/// Keeps item pointers ordered by a comparison function, and refuses equal
/// items if told so.
///
/// Heights are drawn from the system's `random()`, once for every item that is
/// inserted and never else; the first list of this class in the process seeds
/// it with the time.
///
/// The list owns its nodes, not its items. The nodes of all lists come from
/// one store, which is never given back to the system. When memory runs out an
/// insertion leaves the items as they were and a copy holds fewer of them,
/// without a report.
///
/// Context: one thread; never inside the beat or a signal.
class ZT_API ZtSkipList : public KvoObject
{
public:
    static constexpr int max_levels = 32; ///< Levels that a list may use.

    /// Tells below 0, 0 or above 0 as `a` stands before, with or after `b`.
    /// A list calls it with a stored item as `a` and the key as `b`.
    typedef int (*CompareFunction)(const void* a, const void* b);

    /// Whether equal items may stand side by side; every number but 0 means
    /// that they may.
    enum UniqueState : int { Unique = 0, NotUnique = 1 };

    /// One item's place in a list.
    struct SLNode
    {
        void* item;       ///< Not owned; null in the header.
        SLNode** forward; ///< The next node on each level, null at the end.
        int level;        ///< The highest level that the node stands on.
    };

    /// Makes an empty list ordered by `comparison`; null is `CompareString`.
    ///
    /// Requires: `comparison` neither throws nor uses the list; it gets null
    ///           items too, if such are inserted.
    /// Cursor:   null.
    ZtSkipList(CompareFunction comparison, UniqueState state);

    /// Makes a list of the same comparison and state and inserts the items of
    /// `other` in order, with heights drawn afresh.
    ///
    /// Cursor:    on the last node inserted; null if there is none.
    /// By design: a run of equal items is reversed, for each is inserted before
    ///            its equals (ZtSkipList.CopyReversesRunsOfEqualItems).
    ZtSkipList(const ZtSkipList& other);

    /// Frees the nodes; the items live on.
    ~ZtSkipList() override;

    /// Drops the own items, comparison and state for those of `other`, as a
    /// copy takes them.
    ///
    /// Cursor: as for a copy; assigning a list to itself changes nothing.
    ZtSkipList& operator=(const ZtSkipList& other);

    /// Drops every item, in order, after calling `deleter` with it unless that
    /// is null.
    ///
    /// Requires: `deleter` does not use the list.
    /// Cursor:   null.
    void Clear(void (*deleter)(void*) = nullptr);

    /// Replaces every item by what `cloner` makes of it, in order; a null
    /// `cloner` changes nothing.
    ///
    /// Requires: a clone stands where the item did; `cloner` does not use the
    ///           list.
    /// Cursor:   unmoved.
    /// Owner:    the replaced items are left to whoever else holds them.
    void CloneData(void* (*cloner)(void*));

    /// Finds the first node that is not before `key`, and the last one that is
    /// before it on each level in use.
    ///
    /// Requires: `update` is null or has room for `max_levels` nodes; entries
    ///           of levels that are not in use are left as they are.
    /// Cursor:   on the last node before `key`, or the header.
    /// Owner:    the list owns the nodes; they live until they are removed.
    /// Returns:  null when every item is before `key`.
    SLNode* KeySearch(const void* key, SLNode** update) const;

    /// Inserts `item` before its equals, or refuses it if there are any and
    /// the list is `Unique`.
    ///
    /// Cursor:    on the new node; if refused, on the node before the place.
    /// Returns:   1 if inserted, 0 if refused or when memory runs out.
    /// By design: equal items stand newest first
    ///            (ZtSkipList.EqualItemsStandNewestFirst).
    int Insert(void* item);

    /// Removes the first item that equals `key`.
    ///
    /// Cursor:  on the node before the place, or the header, also if there is
    ///          no such item.
    /// Owner:   the caller.
    /// Returns: the item; null if there is none.
    void* Remove(const void* key);

    /// Finds the first item that equals `key`.
    ///
    /// Cursor:    on the first node that is not before `key`; null if there is
    ///            none.
    /// Returns:   null if there is none.
    /// By design: the cursor goes there also when the search fails
    ///            (ZtSkipList.FailedSearchLeavesTheCursorBehindThePlace).
    void* Search(const void* key) const;

    /// Finds the first item that equals `key`, or else the last one before it.
    ///
    /// Cursor:  on its node; the header if there is neither.
    /// Returns: null if there is neither.
    void* SearchAlmost(const void* key) const;

    /// Gives the first item.
    ///
    /// Cursor:  on its node; null when the list is empty.
    /// Returns: null when the list is empty.
    void* Head() const;

    /// Gives the last item.
    ///
    /// Cursor:  on its node; the header when the list is empty.
    /// Returns: null when the list is empty.
    void* Tail() const;

    /// Gives the item behind the cursor.
    ///
    /// Cursor:  one node on; null past the end, where it stays.
    /// Returns: null past the end.
    void* Next() const;

    /// Gives the item behind the cursor.
    ///
    /// Cursor:  unmoved.
    /// Returns: null at the end and without a cursor.
    void* Peek() const;

    /// Compares two records by the string that their first word points at. A
    /// null record or string is the empty one.
    ///
    /// A key is the address of such a record, not the string itself.
    static int CompareString(const void* a, const void* b);

    /// Compares two records that begin with an int by its difference, which
    /// wraps around. A null record counts as 0.
    ///
    /// By design: ints more than 2147483647 apart compare the wrong way round
    ///            (ZtSkipList.CompareIntWrapsAround).
    static int CompareInt(const void* a, const void* b);

    /// Compares two records that begin with a float by its difference, cut to
    /// the int before it on the way to 0. A null record counts as 0.
    ///
    /// Returns:   the nearest end of the range of int for a larger difference;
    ///            0 if either is not a number.
    /// By design: floats that differ by less than 1 are equal
    ///            (ZtSkipList.CompareFloatTakesLessThanOneForEqual).
    static int CompareFloat(const void* a, const void* b);

    /// Gives the slot of the item that `SearchAlmost` finds, to read or replace
    /// it.
    ///
    /// Requires: a replacement stands where the item did; nothing is sorted
    ///           again.
    /// Cursor:   as for `SearchAlmost`.
    /// Owner:    the list, until the node is removed.
    /// Returns:  a slot that holds null if there is no item; what is written
    ///           there is lost.
    void*& operator[](const void* key);

    /// Gives what `SearchAlmost` gives.
    ///
    /// Cursor: as for `SearchAlmost`.
    void* operator[](const void* key) const;

    /// A node with all its forwards behind it.
    struct Header : SLNode
    {
        SLNode* forwards[max_levels]; ///< What `forward` points at.
    };

    Header header;           ///< Stands before the first node on every level.
    UniqueState unique;      ///< Whether equal items are refused.
    mutable SLNode* current; ///< The cursor.
    int levels;              ///< Levels in use, 1 to `max_levels`.
    int count;               ///< Items in the list.
    CompareFunction compare; ///< Never null.

private:
    SLNode* walk(const void* key, SLNode** update) const;
    void reset();
    void copy_items(const ZtSkipList& other);
};

inline void* ZtSkipList::Next() const
{
    if (current)
        current = current->forward[0];
    return current ? current->item : nullptr;
}

#endif
