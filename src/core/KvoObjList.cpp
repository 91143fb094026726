#include "KVO/KvoObjList.h"

KvoObjList::KvoObjList() = default;

KvoObjList::KvoObjList(const KvoObjList& other) = default;

KvoObjList::~KvoObjList() = default;

KvoObjList& KvoObjList::operator=(const KvoObjList& other) = default;

void KvoObjList::DeleteContents()
{
    Link* kept = current;
    KvoList::DeleteContents(
        [](void* item) { delete static_cast<KvoObject*>(item); });
    current = kept;
}

void KvoObjList::CloneContents()
{
    KvoList::CloneContents([](void* item) -> void* {
        auto* object = static_cast<KvoObject*>(item);
        return object ? object->Clone() : nullptr;
    });
}
