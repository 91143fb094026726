#ifndef ZT_CORE_SLAB_H
#define ZT_CORE_SLAB_H

/// \file
/// The store from which the containers take their links and nodes.
///
/// Pieces are carved from large slabs, one behind the other, and are never
/// given back: a list keeps the links it frees in a chain of its own and takes
/// from there first. That makes a piece cheap, keeps neighbours close together
/// and lets a whole chain of links be freed by one splice. Nodes, of which none
/// is like the next, lie in blocks instead (`node_store.h`). The slabs grow
/// with what is asked for, up to 32 MiB, so that many links lie on large pages.
///
/// Everything is constant-initialised and never destroyed, so containers may
/// live before `main` and after it.

#include <cstddef>

namespace zt_core {

// Under AddressSanitizer every piece is an allocation of its own, so that the
// use of a freed one is seen.
#if defined(__SANITIZE_ADDRESS__)
constexpr bool pieces_are_separate = true;
#elif !defined(__has_feature)
constexpr bool pieces_are_separate = false;
#elif __has_feature(address_sanitizer)
constexpr bool pieces_are_separate = true;
#else
constexpr bool pieces_are_separate = false;
#endif

/// The unused rest of the newest slab.
class Slab
{
public:
    Slab() = delete;

    /// Carves a piece that is aligned for pointers.
    ///
    /// Requires: `bytes` is a multiple of a pointer's size, at most 4096.
    /// Owner:    the process.
    /// Returns:  null when memory runs out.
    static void* carve(std::size_t bytes)
    {
        if (static_cast<std::size_t>(end - unused) < bytes && !renew())
            return nullptr;
        void* piece = unused;
        unused += bytes;
        return piece;
    }

    static constexpr std::size_t block_bytes = std::size_t{64} << 10;

    /// Cuts a block of `block_bytes` that is aligned to its size, so that a
    /// piece of it leads to its beginning.
    ///
    /// Owner:   the process.
    /// Returns: null when memory runs out.
    static void* cut_block();

private:
    static bool renew();

    static char* unused;
    static char* end;
};

} // namespace zt_core

#endif
