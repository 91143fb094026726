#ifndef ZT_PROPERTY_H
#define ZT_PROPERTY_H

/// \file
/// Named settings, kept as text and set and read as text, integer or float.
///
/// Nothing here fails loudly: a name that was never set reads as null or zero,
/// and so does a text that is no number. When memory runs out, a setting stays
/// as it was.

#include <KVO/KvoSkipList.h>
#include <ZT/common.h>

/// One setting: a name, which is its key, and a value kept as text.
///
/// By design: `Clone`, `Write` and the class information are those of a plain
///            named object (ZtProperty.IsAPlainNamedObjectToOthers). A copy is
///            made by the copy constructor.
class ZT_API ZtProperty : public KvoNamedObject
{
public:
    /// Makes a setting of copies of `property_name` and `value`; null is the
    /// empty text for both.
    ZtProperty(const char* property_name, const char* value);

    /// Makes a setting whose text is `value` in decimal.
    ZtProperty(const char* property_name, int value);

    /// Makes a setting whose text is `value` with six significant digits.
    ZtProperty(const char* property_name, float value);

    /// Makes a setting of `value` narrowed to single precision.
    ZtProperty(const char* property_name, double value);

    /// Copies the name and the text.
    ZtProperty(const ZtProperty& other);

    /// Copies the name and the text.
    ZtProperty& operator=(const ZtProperty& other);

    ~ZtProperty() override;

    /// Replaces the text by a copy of `value`, which may be the present text
    /// itself; null is the empty text.
    void Set(const char* value);

    /// Replaces the text by `value` in decimal.
    void Set(int value);

    /// Replaces the text by `value` with six significant digits, as a stream
    /// writes it: 2.5, 1e+06. The locale of the process does not matter.
    void Set(float value);

    /// Sets `value` narrowed to single precision.
    void Set(double value);

    /// Gives the text.
    ///
    /// Owner:   this object, until the text is set again.
    /// Returns: never null.
    const char* AsText() const;

    /// Reads the text as `atoi` does, whatever the locale.
    ///
    /// Returns: 0 for a text that begins with no number.
    int AsInt() const;

    /// Reads the text as `atof` does, whatever the locale, and narrows it to
    /// single precision.
    ///
    /// Returns: 0 for a text that begins with no number.
    float AsFloat() const;

private:
    char* text; ///< The object's own copy; null stands for the empty text.
};

/// A store of settings, ordered by name.
class ZT_API ZtPropList : public KvoObject
{
public:
    /// Makes a store without settings.
    ZtPropList();

    ZtPropList(const ZtPropList&) = delete;
    ZtPropList& operator=(const ZtPropList&) = delete;

    /// Deletes the settings.
    ~ZtPropList() override;

    /// Sets the value of `name`, which is added if it is new; a null name is
    /// the empty one, a null value the empty text.
    void Set(const char* name, const char* value);

    /// Sets the value of `name` as `ZtProperty::Set` does.
    void Set(const char* name, int value);

    /// Sets the value of `name` as `ZtProperty::Set` does.
    void Set(const char* name, float value);

    /// Sets the value of `name` as `ZtProperty::Set` does.
    void Set(const char* name, double value);

    /// Gives the text of `name`.
    ///
    /// Owner:   the store, until that name is set again.
    /// Returns: null if the name was never set.
    const char* GetText(const char* name) const;

    /// Gives the value of `name` as `ZtProperty::AsInt` does.
    ///
    /// Returns: 0 if the name was never set.
    int GetInt(const char* name) const;

    /// Gives the value of `name` as `ZtProperty::AsFloat` does.
    ///
    /// Returns: 0 if the name was never set.
    float GetFloat(const char* name) const;

private:
    ZtProperty* find(const char* name) const;

    KvoSkipList properties; ///< Owned.
};

#endif
