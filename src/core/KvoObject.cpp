#include "KVO/KvoObject.h"

#include <cstdint>
#include <cstring>
#include <new>

#include "core/write_text.h"

namespace {
/// The records that lie between a walk's start and the one in hand. A record
/// that is met again below itself has nothing new to say, so that a circle of
/// bases ends the walk.
struct Step
{
    const KvoClassInfo* record;
    const Step* above;

    bool holds(const KvoClassInfo* wanted) const
    {
        for (const Step* step = this; step; step = step->above)
            if (step->record == wanted)
                return true;
        return false;
    }
};

int has_base(const Step& here, KvoClassInfo* wanted)
{
    KvoClassInfo** base = here.record->bases;
    for (; base && *base; ++base) {
        if ((*base)->Match(wanted))
            return 1;
        if (!here.holds(*base) && has_base({*base, &here}, wanted))
            return 1;
    }
    return 0;
}

// Stands in for a name that could not be copied.
char nameless[1] = "";

char* copy_of_name(const char* name)
{
    char* copy = KvoNewString(name, 0);
    return copy ? copy : nameless;
}

void free_name(char* name)
{
    if (name != nameless)
        delete[] name;
}
} // namespace

int KvoClassInfo::Match(KvoClassInfo* other)
{
    if (!other)
        return 0;
    if (this == other)
        return 1;
    return name && other->name && std::strcmp(name, other->name) == 0;
}

int KvoClassInfo::HasBase(KvoClassInfo* other)
{
    return other ? has_base({this, nullptr}, other) : 0;
}

int KvoClassInfo::CanCast(KvoClassInfo* from)
{
    return from && (Match(from) || from->HasBase(this));
}

KvoObject* KvoClassInfo::Cast(KvoObject* object)
{
    return object && CanCast(object->ClassInfo()) ? object : nullptr;
}

static KvoClassInfo* KvoObject_base[] = {nullptr};
constinit KvoClassInfo KvoObject::classInfo("KvoObject", KvoObject_base);

KvoObject::KvoObject() : modified(0) {}

KvoObject::KvoObject(const KvoObject&) : modified(0) {}

KvoObject& KvoObject::operator=(const KvoObject&)
{
    return *this;
}

KvoObject::~KvoObject() = default;

KvoObject* KvoObject::Clone()
{
    return new (std::nothrow) KvoObject;
}

int KvoObject::Compare(void* key)
{
    const auto own = reinterpret_cast<std::uintptr_t>(this);
    const auto other = reinterpret_cast<std::uintptr_t>(key);
    return own < other ? -1 : own > other;
}

void* KvoObject::Key()
{
    return this;
}

void KvoObject::Read(std::istream&) {}

void KvoObject::Write(std::ostream&) {}

int KvoObject::IsModified()
{
    return modified;
}

void KvoObject::SetModified()
{
    modified = 1;
}

void KvoObject::ClearModified()
{
    modified = 0;
}

KvoClassInfo* KvoObject::ClassInfo()
{
    return &KvoObject::classInfo;
}

const char* KvoObject::ClassName()
{
    return ClassInfo()->name;
}

KVO_DEFINE_CLASS_INFO(KvoNamedObject, &KvoObject::classInfo);

KvoNamedObject::KvoNamedObject() : name(copy_of_name("NoName")) {}

KvoNamedObject::KvoNamedObject(const char* object_name)
    : name(copy_of_name(object_name))
{}

KvoNamedObject::KvoNamedObject(const KvoNamedObject& other)
    : KvoObject(other), name(copy_of_name(other.name))
{}

KvoNamedObject& KvoNamedObject::operator=(const KvoNamedObject& other)
{
    if (this != &other)
        SetName(other.name);
    return *this;
}

KvoNamedObject::~KvoNamedObject()
{
    free_name(name);
}

void KvoNamedObject::SetName(const char* object_name)
{
    char* const former = name;
    name = copy_of_name(object_name);
    free_name(former);
}

KvoObject* KvoNamedObject::Clone()
{
    return new (std::nothrow) KvoNamedObject(name);
}

int KvoNamedObject::Compare(void* key)
{
    return std::strcmp(name, key ? static_cast<const char*>(key) : "");
}

void* KvoNamedObject::Key()
{
    return name;
}

void KvoNamedObject::Read(std::istream&) {}

void KvoNamedObject::Write(std::ostream& out)
{
    zt_core::write_text(out, name);
}
