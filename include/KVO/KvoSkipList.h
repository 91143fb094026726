#ifndef KVO_KVOSKIPLIST_H
#define KVO_KVOSKIPLIST_H

/// \file
/// Objects in the ascending order of their keys, found in logarithmic time.
///
/// Every search asks the objects' own `Compare` anew, so a key must not change
/// its order while its object is stored. The cursor is shared by everybody who
/// uses the list and is moved by every search, also in a const list.

#include <KVO/KvoObject.h>

/// Keeps objects ordered by key, objects with equal keys oldest first.
///
/// A node stands on level 0 and, as the dice fall, on some of the levels
/// above; a search runs along the sparse upper levels first. The dice are the
/// system's `random()`, drawn once for every node that is inserted and never
/// else; the first list of the process seeds it with the time.
///
/// The list owns its nodes, not its objects. The nodes of all lists come from
/// one store, which is never given back to the system. When memory runs out an
/// insertion leaves the list as it was and a copy ends early, without a report.
///
/// Context: one thread; never inside the beat or a signal.
class ZT_API KvoSkipList : public KvoObject
{
public:
    static constexpr int max_levels = 24; ///< Levels that a list may use.

    /// One object's place in a list.
    struct SLNode
    {
        KvoObject* object; ///< Not owned; null in the header.
        SLNode** forward;  ///< The next node on each level, null at the end.
        int level;         ///< The highest level that the node stands on.
    };

    /// Makes an empty list.
    ///
    /// Cursor: null.
    KvoSkipList();

    /// Makes a list of the same objects on the same levels.
    ///
    /// Cursor: null.
    KvoSkipList(const KvoSkipList& other);

    /// Frees the nodes; the objects live on.
    ~KvoSkipList() override;

    /// Drops the own objects for those of `other`, on the same levels.
    ///
    /// Cursor: null; assigning a list to itself changes nothing.
    KvoSkipList& operator=(const KvoSkipList& other);

    /// Drops every object.
    ///
    /// Cursor: null.
    void Clear();

    /// Deletes every object and empties the list.
    ///
    /// Requires: no object is held twice, nor deleted elsewhere.
    /// Cursor:   null.
    void DeleteContents();

    /// Replaces every object by its `Clone()`, in order.
    ///
    /// Requires: a clone's key stands where the object's did.
    /// Owner:    the replaced objects are left to whoever else holds them.
    void CloneContents();

    /// Inserts `object` behind every object of an equal key; null is not
    /// inserted.
    ///
    /// Cursor: on the new node.
    void Insert(KvoObject* object);

    /// Inserts `object` unless an object of an equal key is there.
    ///
    /// Cursor:  on the new node; if refused, on the node before the place.
    /// Returns: 1 if inserted, else 0.
    int InsertUnique(KvoObject* object);

    /// Removes this very object, not another of an equal key.
    ///
    /// Cursor:  on the node before the removed one, or the header; it may have
    ///          moved if there is none.
    /// Owner:   the caller, as before.
    /// Returns: `object`; null if it is not in the list.
    KvoObject* Remove(KvoObject* object);

    /// Removes the oldest object whose key equals `key`.
    ///
    /// Cursor:  as for `Remove`.
    /// Owner:   the caller.
    /// Returns: the object; null if there is none.
    KvoObject* RemoveKey(const void* key);

    /// Moves every object whose key is not less than `key` into a new list.
    ///
    /// Cursor:  on the last node that is kept, or the header.
    /// Owner:   the caller deletes the new list.
    /// Returns: the new list, with a null cursor; null, with nothing changed,
    ///          when memory runs out.
    KvoSkipList* Split(const void* key);

    /// Finds the oldest object whose key equals `key`.
    ///
    /// Cursor:  on its node; if there is none, on the node before the place,
    ///          or the header.
    /// Returns: null if there is none.
    KvoObject* Search(const void* key) const;

    /// Finds the oldest object whose key equals `key`, or else the last one of
    /// a smaller key.
    ///
    /// Cursor:  on its node; the header if there is neither.
    /// Returns: null if there is neither.
    KvoObject* SearchAlmost(const void* key) const;

    /// Gives the first object.
    ///
    /// Cursor:  on its node; null when the list is empty.
    /// Returns: null when the list is empty.
    KvoObject* Head() const;

    /// Gives the last object.
    ///
    /// Cursor:  on its node; the header when the list is empty.
    /// Returns: null when the list is empty.
    KvoObject* Tail() const;

    /// Gives the object behind the cursor.
    ///
    /// Cursor:  one node on; null past the end, where it stays.
    /// Returns: null past the end.
    KvoObject* Next() const;

    /// Gives the object behind the cursor.
    ///
    /// Cursor:  unmoved.
    /// Returns: null at the end and without a cursor.
    KvoObject* Peek() const;

    /// Gives the slot of the object that `SearchAlmost` finds, to read or
    /// replace it.
    ///
    /// Requires:  a replacement is not null and its key stands where the
    ///            object's did; nothing is sorted again.
    /// Cursor:    as for `SearchAlmost`.
    /// Owner:     the list, until the node is removed.
    /// Returns:   a slot that holds null if there is no object; what is
    ///            written there is lost.
    KvoObject*& operator[](const void* key);

    /// Gives what `SearchAlmost` gives.
    ///
    /// Cursor: as for `SearchAlmost`.
    KvoObject* operator[](const void* key) const;

    SLNode* header;          ///< Stands before the first node on every level.
    mutable SLNode* current; ///< The cursor.
    int levels;              ///< Levels in use, 1 to `max_levels`.
    int count;               ///< Objects in the list.

private:
    /// The header's storage: a node and the forwards that lie behind it.
    struct Header
    {
        SLNode node;
        SLNode* forward[max_levels];
    };

    void reset();
    void copy_nodes(const KvoSkipList& other);
    SLNode* walk(const void* key, SLNode** update) const;
    SLNode* step_over(SLNode* node, void* key, SLNode** update) const;
    int insert_after(SLNode** update, KvoObject* object);
    KvoObject* take_out(SLNode* node, SLNode** update);

    Header first;
};

inline KvoObject* KvoSkipList::Next() const
{
    if (current)
        current = current->forward[0];
    if (!current)
        return nullptr;
    // The next node of this height stands some nodes ahead: it is on its way
    // while the walk waits for those in between.
    __builtin_prefetch(current->forward[current->level]);
    return current->object;
}

#endif
