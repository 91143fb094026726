#ifndef KVO_KVOOBJECT_H
#define KVO_KVOOBJECT_H

/// \file
/// The base of everything that is listed, keyed, cloned or streamed, and the
/// class information that casts between such classes.
///
/// Class information compares by name: a class that is defined both in a host
/// and in a plug-in still casts. Ordering by key (`Compare`, `Key`) is what
/// KvoSkipList sorts by.

#include <KVO/KvoCommon.h>

#include <istream>
#include <ostream>

class KvoObject;

/// Names a class and its direct bases, so that an object can be asked at run
/// time what it is.
///
/// Records live for the whole process and are never freed. Those that the
/// macros below define are ready before any code runs.
class ZT_API KvoClassInfo
{
public:
    /// Makes a record for the class `class_name`.
    ///
    /// Owner: a record made at run time keeps a copy of `class_name`, a
    ///        constant points at it; `base_records` is not copied, ends with
    ///        null and must outlive the record. Null means no base.
    constexpr KvoClassInfo(const char* class_name, KvoClassInfo** base_records)
        : name(__builtin_is_constant_evaluated() ? const_cast<char*>(class_name)
                                                 : KvoNewString(class_name)),
          bases(base_records)
    {}

    /// Tells whether `other` is this record or one with the same name.
    ///
    /// Returns: 1 or 0; 0 for null.
    int Match(KvoClassInfo* other);

    /// Tells whether `other` is among the bases of this class, at any depth.
    ///
    /// A class is not its own base. Records that name each other as bases in
    /// a circle are walked once.
    ///
    /// Returns: 1 or 0; 0 for null.
    int HasBase(KvoClassInfo* other);

    /// Tells whether an object of class `from` may be treated as this class.
    ///
    /// Returns: 1 or 0; 0 for null.
    int CanCast(KvoClassInfo* from);

    /// Casts `object` to this class.
    ///
    /// Returns: `object` itself when it is of this class or derives from it;
    ///          null otherwise, also for null.
    KvoObject* Cast(KvoObject* object);

    char* name;           ///< The class name.
    KvoClassInfo** bases; ///< Direct bases, ended by null.
};

/// Declares the class information of a class: its record and the operation
/// that answers it. Stands in the public part of the class.
#define KVO_DECLARE_CLASS_INFO()                                               \
    static KvoClassInfo classInfo;                                             \
    KvoClassInfo* ClassInfo() override

/// Defines the class information of `Class`. The further arguments, at least
/// one, are the addresses of the direct bases' records.
///
/// The record is copied from a constant, so that it is ready before any code
/// runs; compilers may leave the construction of a variable for later.
#define KVO_DEFINE_CLASS_INFO(Class, ...)                                      \
    static KvoClassInfo* Class##_base[] = {__VA_ARGS__, nullptr};              \
    static constexpr KvoClassInfo Class##_record(#Class, Class##_base);        \
    KvoClassInfo* Class::ClassInfo()                                           \
    {                                                                          \
        return &Class::classInfo;                                              \
    }                                                                          \
    KvoClassInfo Class::classInfo = Class##_record

/// The base object: a modified flag, a key to sort by, a stream form, a clone
/// and class information.
///
/// The operations are declared in the order in which plug-ins find them; it
/// is part of the binary interface.
class ZT_API KvoObject
{
public:
    /// Makes an unmodified object.
    KvoObject();

    /// Makes an unmodified object, whatever the other's flag is.
    KvoObject(const KvoObject& other);

    /// Leaves the modified flag as it is.
    KvoObject& operator=(const KvoObject& other);

    virtual ~KvoObject();

    /// Makes a plain `KvoObject`, not a copy of a derived class; a class that
    /// wants a true copy overrides this.
    ///
    /// Owner: the caller.
    /// By design: a class that does not override this loses its data
    ///        (KvoObject.CloneOfAnyObjectIsAPlainObject).
    virtual KvoObject* Clone();

    /// Compares this object with a key of its own kind; the base compares the
    /// two addresses.
    ///
    /// Returns: below 0, 0 or above 0 as this object's key is less than,
    ///          equal to or greater than `key`.
    virtual int Compare(void* key);

    /// Gives the key that `Compare` of a sibling takes; the base gives the
    /// object's own address.
    ///
    /// Owner: this object.
    virtual void* Key();

    /// Reads the object's stream form; the base reads nothing.
    virtual void Read(std::istream& in);

    /// Writes the object's stream form; the base writes nothing.
    virtual void Write(std::ostream& out);

    /// Returns: 1 after `SetModified`, 0 after construction and
    ///          `ClearModified`.
    virtual int IsModified();

    /// Sets the modified flag. No operation of the library does so by itself.
    virtual void SetModified();

    /// Clears the modified flag.
    virtual void ClearModified();

    /// Gives the record of the most derived class that declares one.
    virtual KvoClassInfo* ClassInfo();

    /// Gives the name in `ClassInfo()`.
    ///
    /// Owner: the class record; lives for the whole process.
    const char* ClassName();

    static KvoClassInfo classInfo; ///< The record of `KvoObject`.

    int modified; ///< 0 or 1.
};

/// An object that is identified by a name.
class ZT_API KvoNamedObject : public KvoObject
{
public:
    /// Names the object "NoName".
    KvoNamedObject();

    /// Names the object with a copy of `object_name`; null is the empty name.
    explicit KvoNamedObject(const char* object_name);

    /// Copies the name, not the modified flag.
    KvoNamedObject(const KvoNamedObject& other);

    /// Copies the name, not the modified flag.
    KvoNamedObject& operator=(const KvoNamedObject& other);

    ~KvoNamedObject() override;

    /// Replaces the name by a copy of `object_name`, which may be the present
    /// name itself; null is the empty name.
    void SetName(const char* object_name);

    /// Makes a plain named object of the same name, not a copy of a derived
    /// class.
    ///
    /// Owner: the caller.
    KvoObject* Clone() override;

    /// Compares the name with `key`, a NUL-terminated string, byte by byte;
    /// a null key is the empty text.
    int Compare(void* key) override;

    /// Gives the name.
    ///
    /// Owner:   this object, until the name is set again.
    /// Returns: never null.
    void* Key() override;

    /// Reads nothing.
    void Read(std::istream& in) override;

    /// Writes the name, with no quotes, separator or newline.
    void Write(std::ostream& out) override;

    KVO_DECLARE_CLASS_INFO();

    char* name; ///< The object's own copy, never null.
};

#endif
