#ifndef ZT_PLATFORM_PAGES_H
#define ZT_PLATFORM_PAGES_H

/// \file
/// Memory straight from the system, for what must be had inside a signal,
/// where no allocator may be asked.

#include <cstddef>

namespace zt_platform {

/// The system's calls that give and take whole pages.
class Pages
{
public:
    /// Gives zeroed memory, aligned to a page.
    ///
    /// Units:   at least `bytes`; 0 is taken as one page.
    /// Owner:   the caller, until `unmap`.
    /// Returns: null when there is none.
    /// Context: may run in a signal.
    virtual void* map(std::size_t bytes) = 0;

    /// Takes memory of `map` back. Null is nothing.
    ///
    /// Units:   `bytes` as given to `map`.
    /// Context: may run in a signal.
    virtual void unmap(void* memory, std::size_t bytes) = 0;

    /// Gives the calls in use: the system's, or those that a test installed.
    static Pages& current();

    /// Installs other calls; null restores the system's.
    ///
    /// Owner:   the caller, who installs others before destroying them.
    /// Returns: what was installed before, null for the system's.
    static Pages* install(Pages* other);

protected:
    ~Pages() = default;
};

} // namespace zt_platform

#endif
