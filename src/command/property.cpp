#include "ZT/property.h"

#include <cstring>
#include <new>

#include "ZT/util.h"

#include "core/number_text.h"

namespace {
bool same_text(const char* copy, const char* original)
{
    return std::strcmp(copy, original ? original : "") == 0;
}
} // namespace

ZtProperty::ZtProperty(const char* property_name, const char* value)
    : KvoNamedObject(property_name), text(ZtNewString(value))
{}

ZtProperty::ZtProperty(const char* property_name, int value)
    : ZtProperty(property_name, zt_core::int_to_text(value).c_str())
{}

ZtProperty::ZtProperty(const char* property_name, float value)
    : ZtProperty(property_name,
                 zt_core::float_to_text(static_cast<double>(value)).c_str())
{}

ZtProperty::ZtProperty(const char* property_name, double value)
    : ZtProperty(property_name, static_cast<float>(value))
{}

ZtProperty::ZtProperty(const ZtProperty& other)
    : KvoNamedObject(other), text(ZtNewString(other.text))
{}

ZtProperty& ZtProperty::operator=(const ZtProperty& other)
{
    if (this == &other)
        return *this;
    KvoNamedObject::operator=(other);
    Set(other.text);
    return *this;
}

ZtProperty::~ZtProperty()
{
    delete[] text;
}

void ZtProperty::Set(const char* value)
{
    char* copy = ZtNewString(value);
    if (!copy)
        return;
    delete[] text;
    text = copy;
}

void ZtProperty::Set(int value)
{
    Set(zt_core::int_to_text(value).c_str());
}

void ZtProperty::Set(float value)
{
    Set(zt_core::float_to_text(static_cast<double>(value)).c_str());
}

void ZtProperty::Set(double value)
{
    Set(static_cast<float>(value));
}

const char* ZtProperty::AsText() const
{
    return text ? text : "";
}

int ZtProperty::AsInt() const
{
    return zt_core::text_to_int(text);
}

float ZtProperty::AsFloat() const
{
    return static_cast<float>(zt_core::text_to_float(text));
}

ZtPropList::ZtPropList() = default;

ZtPropList::~ZtPropList()
{
    properties.DeleteContents();
}

// A property that lacks a part for want of memory is not kept.
void ZtPropList::Set(const char* name, const char* value)
{
    if (ZtProperty* property = find(name)) {
        property->Set(value);
        return;
    }
    auto* property = new (std::nothrow) ZtProperty(name, value);
    if (!property)
        return;
    const bool whole =
        same_text(property->name, name) && same_text(property->AsText(), value);
    if (!whole || !properties.InsertUnique(property))
        delete property;
}

void ZtPropList::Set(const char* name, int value)
{
    Set(name, zt_core::int_to_text(value).c_str());
}

void ZtPropList::Set(const char* name, float value)
{
    Set(name, zt_core::float_to_text(static_cast<double>(value)).c_str());
}

void ZtPropList::Set(const char* name, double value)
{
    Set(name, static_cast<float>(value));
}

const char* ZtPropList::GetText(const char* name) const
{
    const ZtProperty* property = find(name);
    return property ? property->AsText() : nullptr;
}

int ZtPropList::GetInt(const char* name) const
{
    const ZtProperty* property = find(name);
    return property ? property->AsInt() : 0;
}

float ZtPropList::GetFloat(const char* name) const
{
    const ZtProperty* property = find(name);
    return property ? property->AsFloat() : 0.0f;
}

ZtProperty* ZtPropList::find(const char* name) const
{
    return static_cast<ZtProperty*>(properties.Search(name));
}
