#ifndef KVO_KVOARRAY_H
#define KVO_KVOARRAY_H

/// \file
/// Growable arrays: the untyped one, and thin typed ones over it.
///
/// Reading or writing `array[i]` past the end is how an array grows: the
/// elements that come into use read as zero. A const array never grows.

#include <KVO/KvoObject.h>

/// Keeps elements of one size in one block.
///
/// The block grows by a quarter more than is asked for and is given back as
/// soon as no more than three quarters of it are in use, so that appending
/// stays cheap and a shrunken array does not keep its memory.
///
/// When memory runs out the array keeps what it had, without a report.
class ZT_API KvoArray : public KvoObject
{
public:
    /// Makes an array of `initial_size` zero elements.
    ///
    /// Units: `element_bytes` below 1 counts as 1.
    KvoArray(int element_bytes, int initial_size);

    /// Copies the elements into a block that fits them exactly.
    KvoArray(const KvoArray& other);

    /// Frees the block.
    ~KvoArray() override;

    /// Takes over the elements of `other` in a block that fits them exactly.
    ///
    /// The element size stays as it was constructed: where the two differ each
    /// element takes what fits and is zero behind that.
    KvoArray& operator=(const KvoArray& other);

    /// Appends the elements of `other`, which may be this array itself, in a
    /// block that fits exactly.
    ///
    /// Element sizes that differ are treated as in the assignment.
    KvoArray& operator+=(const KvoArray& other);

    /// Changes the size to `new_size` in a block that fits exactly; below 1
    /// frees the block.
    ///
    /// Units: elements.
    void SetSize(int new_size);

    /// Changes the size by `delta`, not below 0, leaving some slack for
    /// further growth.
    ///
    /// Past the capacity the block becomes a quarter larger than is needed;
    /// while more than three quarters of it stay in use it is left alone; else
    /// it is cut to fit exactly.
    ///
    /// Units:     elements.
    /// By design: growing by little cuts a large reserve made with `Allocate`
    ///            as well (KvoArray.BumpSizeGivesAReserveBackWhenGrowing).
    void BumpSize(int delta);

    /// Replaces the block by one of exactly `new_capacity` elements, or by
    /// none below 1; elements that are not kept from the old one are zero.
    ///
    /// Units:     elements.
    /// By design: the size stays as it is, even when it no longer fits; until
    ///            `SetSize` or `BumpSize` the elements outside the block read
    ///            as zero (KvoArray.AllocateLeavesTheSizeAlone).
    void Allocate(int new_capacity);

    /// Moves `count` elements between blocks of this array's element size,
    /// which may overlap; null blocks and counts below 1 do nothing.
    ///
    /// Requires: both blocks hold the elements that are named.
    void CopyElements(void* to, const void* from, int to_index, int from_index,
                      int count) const;

    /// Zeroes `count` elements of `block` from `index` on; a null block and
    /// counts below 1 do nothing.
    ///
    /// Requires: the block holds the elements that are named.
    void ZeroElements(void* block, int index, int count) const;

    void* data;      ///< The block, from `malloc`; null when there is none.
    int capacity;    ///< Elements that the block holds.
    int size;        ///< Elements in use.
    int elementSize; ///< Bytes an element.

protected:
    /// Tells whether `index` is an element in use that lies in the block.
    bool holds(int index) const
    {
        return static_cast<unsigned>(index) < static_cast<unsigned>(size) &&
               static_cast<unsigned>(index) < static_cast<unsigned>(capacity);
    }

    /// Tells whether the size may grow by one and the block stay as it is.
    bool takes_one_more() const
    {
        return size < capacity && 3LL * capacity < 4LL * (size + 1LL);
    }

    /// Grows the array until it holds `index`.
    ///
    /// Returns: false for an index below 0, and when memory runs out.
    bool bring_into_use(int index);

    /// Gives the number of elements that are both in use and in the block.
    int held() const { return size < capacity ? size : capacity; }

private:
    void resize_with_slack(long long new_size);
    void take_elements(const KvoArray& other, int at, int count);
};

inline void KvoArray::BumpSize(int delta)
{
    if (delta == 1 && takes_one_more()) {
        ZeroElements(data, size, 1);
        ++size;
    } else {
        resize_with_slack(static_cast<long long>(size) + delta);
    }
}

/// Gives the elements of a KvoArray their type.
template <typename Element>
class ZT_API KvoTypedArray : public KvoArray
{
public:
    /// Makes an array of `initial_size` zero elements.
    explicit KvoTypedArray(int initial_size = 0)
        // NOLINTNEXTLINE(bugprone-sizeof-expression): also of a pointer
        : KvoArray(static_cast<int>(sizeof(Element)), initial_size)
    {}

    /// Gives the element at `index`; past the end the array grows first, as
    /// by `BumpSize`, so that it holds `index`.
    ///
    /// Owner:   the array, until it changes its size.
    /// Returns: a zeroed element outside the array for an index below 0, and
    ///          when memory runs out.
    Element& operator[](int index)
    {
        if (!holds(index)) {
            if (index == size && takes_one_more()) {
                elements()[index] = Element();
                size = index + 1;
            } else if (!bring_into_use(index)) {
                return scratch();
            }
        }
        return elements()[index];
    }

    /// Gives the element at `index` without growing.
    ///
    /// Returns: zero for an index outside the array.
    Element operator[](int index) const
    {
        return holds(index) ? elements()[index] : Element();
    }

protected:
    /// Gives the elements, null if there are none.
    Element* elements() const { return static_cast<Element*>(data); }

private:
    static Element& scratch()
    {
        static Element element;
        element = Element();
        return element;
    }
};

/// An array of floats.
class ZT_API KvoFloatArray : public KvoTypedArray<float>
{
public:
    /// Makes an array of so many zeros.
    explicit KvoFloatArray(int initial_size = 0) : KvoTypedArray(initial_size)
    {}
};

/// An array of ints.
class ZT_API KvoIntArray : public KvoTypedArray<int>
{
public:
    /// Makes an array of so many zeros.
    explicit KvoIntArray(int initial_size = 0) : KvoTypedArray(initial_size) {}
};

/// An array of characters; it need not end with a NUL.
class ZT_API KvoCharArray : public KvoTypedArray<char>
{
public:
    /// Makes an array of so many zeros.
    explicit KvoCharArray(int initial_size = 0) : KvoTypedArray(initial_size) {}
};

/// An array of bytes, 0 to 255.
class ZT_API KvoByteArray : public KvoTypedArray<unsigned char>
{
public:
    /// Makes an array of so many zeros.
    explicit KvoByteArray(int initial_size = 0) : KvoTypedArray(initial_size) {}
};

/// An array of texts.
///
/// Owner: the caller keeps the texts; the array never frees one.
class ZT_API KvoStringArray : public KvoTypedArray<char*>
{
public:
    /// Makes an array of so many nulls.
    explicit KvoStringArray(int initial_size = 0) : KvoTypedArray(initial_size)
    {}
};

#endif
