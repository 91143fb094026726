#ifndef ZT_PLATFORM_DYNLIB_H
#define ZT_PLATFORM_DYNLIB_H

/// \file
/// The loader of shared objects, and what one wants to know about a file
/// before it is handed to the loader.
///
/// The loader maps files without a look at their length: one that was cut
/// short kills the process when a missing page is touched, and a FIFO keeps it
/// waiting for ever. `is_special_file` and `object_extent` are asked first.

#include <cstddef>

namespace zt_platform {

/// Names, oldest first, in one block of memory. Growing never throws.
class NameList
{
public:
    NameList() = default;
    ~NameList();
    NameList(const NameList&) = delete;
    NameList& operator=(const NameList&) = delete;

    /// Adds a copy of `name`.
    ///
    /// Returns: false, with the list as it was, when there is no memory.
    bool add(const char* name);

    /// Gives the first name; null when there is none.
    const char* first() const;

    /// Gives the name behind `name`, which came from this list; null at the
    /// end.
    const char* next(const char* name) const;

private:
    char* block = nullptr;
    std::size_t used = 0;
    std::size_t room = 0;
};

/// When the references of a shared object to functions are looked up.
enum class Binding : int {
    Lazy = 1, ///< At the first call, which ends the process if it is missing.
    Now = 2   ///< When it is opened, which fails if one is missing.
};

/// The system's loader and its listing of directories.
class Dynlib
{
public:
    /// Opens the shared object at `path`; its names stay its own. Opening one
    /// that is open already gives the same handle once more.
    ///
    /// A name without a slash is looked for where the system keeps libraries.
    ///
    /// Returns:  a handle, or null with the reason in `error_text`.
    virtual void* open(const char* path, Binding binding) = 0;

    /// Gives the address of what `name` means in the shared object; null if it
    /// means nothing.
    virtual void* symbol(void* handle, const char* name) = 0;

    /// Tells whether exactly at `address` a shared object has a variable, not
    /// a function, and of how many bytes.
    ///
    /// Returns: false, with 0 `bytes`, if it has not or nothing is known.
    virtual bool is_variable(const void* address, std::size_t& bytes) = 0;

    /// Gives the handle back. With the last one the code may go.
    virtual void close(void* handle) = 0;

    /// Gives the reason of the latest failure and forgets it.
    ///
    /// Owner:   the loader, until its next call.
    /// Returns: never null.
    virtual const char* error_text() = 0;

    /// Tells whether there is something at `path`, links followed, that must
    /// not be opened to find out that it is no shared object: a FIFO, a device
    /// or a socket. What cannot be examined is not.
    virtual bool is_special_file(const char* path) = 0;

    /// Lists the names of the directory at `path` that `wanted` accepts, in
    /// the directory's own order.
    ///
    /// Returns: false with `errno` set when it cannot all be listed.
    virtual bool list_directory(const char* path,
                                bool (*wanted)(const char* name),
                                NameList& names) = 0;

    /// Gives the calls in use: the system's, or those that a test installed.
    static Dynlib& current();

    /// Installs other calls; null restores the system's.
    ///
    /// Owner:   the caller, who installs others before destroying them.
    /// Returns: what was installed before, null for the system's.
    static Dynlib* install(Dynlib* other);

protected:
    ~Dynlib() = default;
};

/// Whether a file holds all of the shared object that it begins.
enum class ObjectExtent : int {
    Unknown = 0, ///< Unreadable, or no shared object: the loader says why.
    Whole = 1,   ///< Every segment that is loaded lies inside the file.
    Cut = 2      ///< The file ends before the header or a segment does.
};

/// Reads the header and the segment table of the shared object at `path`, of
/// either word size and byte order, and compares them with the file's length.
ObjectExtent object_extent(const char* path);

} // namespace zt_platform

#endif
