#ifndef KVO_KVOOBJARR_H
#define KVO_KVOOBJARR_H

/// \file
/// An array of objects.
///
/// It owns no object until `DeleteContents` is called: removing an element,
/// shrinking or destroying the array leaves the object alive.

#include <KVO/KvoArray.h>

/// Keeps pointers to objects in one block.
///
/// A class that is stored here has KvoObject as its first base.
class ZT_API KvoObjArray : public KvoTypedArray<KvoObject*>
{
public:
    /// Makes an array of `initial_size` null elements.
    explicit KvoObjArray(int initial_size = 0) : KvoTypedArray(initial_size) {}

    /// Finds an object by its address.
    ///
    /// Returns: the lowest index that holds `object`, or -1.
    int Find(KvoObject* object) const;

    /// Inserts `object` so that it stands at `index` afterwards.
    ///
    /// Units: `index` counts from 0; below 0 is the front, past the end the
    ///        end.
    /// Owner: the caller, as before.
    void Insert(KvoObject* object, int index);

    /// Takes the element at `index` out and closes the gap.
    ///
    /// Owner:   the caller.
    /// Returns: the object; null, with nothing changed, for an index outside
    ///          the array.
    KvoObject* Remove(int index);

    /// Takes the last element off.
    ///
    /// Owner:   the caller.
    /// Returns: the object; null when the array is empty.
    KvoObject* Pop();

    /// Deletes every object and empties the array.
    ///
    /// Requires: no object is held twice, nor deleted elsewhere.
    void DeleteContents();

    /// Replaces every object by its `Clone()`; null elements stay null.
    ///
    /// Owner: the replaced objects are left to whoever else holds them.
    void CloneContents();
};

#endif
