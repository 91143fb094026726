#include "KVO/KvoObjArr.h"

#include <algorithm>

int KvoObjArray::Find(KvoObject* object) const
{
    KvoObject** end = elements() + held();
    KvoObject** found = std::find(elements(), end, object);
    return found == end ? -1 : static_cast<int>(found - elements());
}

void KvoObjArray::Insert(KvoObject* object, int index)
{
    const int old_size = size;
    (*this)[old_size] = object;
    if (size == old_size || index >= old_size)
        return;
    index = std::max(index, 0);
    CopyElements(data, data, index + 1, index, old_size - index);
    elements()[index] = object;
}

KvoObject* KvoObjArray::Remove(int index)
{
    if (size > capacity)
        Allocate(size);
    if (!holds(index))
        return nullptr;
    KvoObject* object = elements()[index];
    CopyElements(data, data, index, index + 1, held() - 1 - index);
    BumpSize(-1);
    return object;
}

KvoObject* KvoObjArray::Pop()
{
    return Remove(size - 1);
}

void KvoObjArray::DeleteContents()
{
    for (int i = 0; i < held(); ++i)
        delete elements()[i];
    SetSize(0);
}

void KvoObjArray::CloneContents()
{
    for (int i = 0; i < held(); ++i)
        if (KvoObject* object = elements()[i])
            elements()[i] = object->Clone();
}
