#ifndef ZT_PLATFORM_LAZY_LIBRARY_H
#define ZT_PLATFORM_LAZY_LIBRARY_H

/// \file
/// A library of the system that is opened when something in it is first asked
/// for, so that programs which never ask neither need it nor pay for it.

namespace zt_platform {

/// One library, never closed again: others may have been given its functions,
/// and some libraries keep threads and handlers that outlive their last use.
///
/// Made without code running before `main`.
///
/// Context: client code only; opening takes locks and memory.
class LazyLibrary
{
public:
    /// Owner: the caller keeps the name, a literal.
    constexpr explicit LazyLibrary(const char* file_name)
        : name(file_name), handle(nullptr), tried(false)
    {}

    /// Gives the function called `symbol`, opening the library first if nobody
    /// did. A library that cannot be opened is not looked for again.
    ///
    /// Requires: `Function` is a pointer to what the library has by that name:
    ///           `decltype(&sf_open)` of the library's own header.
    /// Returns:  null if there is no such library or function.
    template <class Function>
    Function find(const char* symbol)
    {
        return reinterpret_cast<Function>(address_of(symbol));
    }

private:
    void* address_of(const char* symbol);

    const char* name;
    void* handle;
    bool tried;
};

} // namespace zt_platform

#endif
