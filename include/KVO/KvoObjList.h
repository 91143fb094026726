#ifndef KVO_KVOOBJLIST_H
#define KVO_KVOOBJLIST_H

/// \file
/// A list of objects that can delete or clone them all.
///
/// It owns no object until `DeleteContents` is called. Items stay `void*`: a
/// class that is stored here has KvoObject as its first and non-virtual base,
/// or is converted to `KvoObject*` before it is pushed.

#include <KVO/KvoList.h>
#include <KVO/KvoObject.h>

/// Keeps objects in order.
class ZT_API KvoObjList : public KvoList
{
public:
    KvoObjList();

    /// Makes a list of the same objects in the same order.
    KvoObjList(const KvoObjList& other);

    /// Frees the links; the objects live on.
    ~KvoObjList() override;

    /// Drops the own objects for those of `other`, in the same order.
    KvoObjList& operator=(const KvoObjList& other);

    using KvoList::CloneContents;
    using KvoList::DeleteContents;

    /// Deletes every object and empties the list.
    ///
    /// Requires:  no object is held twice, nor deleted elsewhere.
    /// Cursor:    dead; the next walk starts with `Head` or `Tail`.
    /// By design: the cursor is not reset
    ///            (KvoObjList.DeleteContentsLeavesTheCursorAlone).
    void DeleteContents();

    /// Replaces every object by its `Clone()`, from head to tail; null items
    /// stay null.
    ///
    /// Owner: the replaced objects are left to whoever else holds them.
    void CloneContents();
};

#endif
