#ifndef ZT_PLATFORM_LARGE_MEMORY_H
#define ZT_PLATFORM_LARGE_MEMORY_H

/// \file
/// Memory for pictures and the like, large blocks that are written from one
/// end to the other.
///
/// The first touch of each page costs more than what is written there; large
/// blocks are put on the largest pages the system has, and those that must stay
/// on small ones get them many at a time.

#include <cstddef>

namespace zt_platform {

/// Gives memory that is not cleared.
///
/// Owner:   the caller, who releases it with `free`.
/// Returns: null for lack of memory.
void* new_large_block(std::size_t bytes);

/// Puts what can be put there of a block on large pages.
///
/// Requires: that nothing was written to the block yet, or it gains little.
void prefer_large_pages(void* block, std::size_t bytes);

/// Clears memory that was just obtained.
///
/// Its pages are asked for many at a time: the system takes longer to be told
/// of each first touch than to provide the page.
void clear_new_memory(void* begin, std::size_t bytes);

} // namespace zt_platform

#endif
