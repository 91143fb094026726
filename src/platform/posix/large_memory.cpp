#include "platform/large_memory.h"

#include <cstdint>
#include <cstdlib>
#include <sys/mman.h>

namespace zt_platform {

namespace {

constexpr std::uintptr_t large_page = std::uintptr_t{2} << 20;

} // namespace

void* new_large_block(std::size_t bytes)
{
    void* block = std::malloc(bytes);
    std::uintptr_t start = reinterpret_cast<std::uintptr_t>(block);
    std::uintptr_t first = (start + large_page - 1) & ~(large_page - 1);
    std::uintptr_t end = (start + bytes) & ~(large_page - 1);
    // Only advice: without large pages the block is as good as any other.
    if (block && end > first)
        madvise(reinterpret_cast<void*>(first), end - first, MADV_HUGEPAGE);
    return block;
}

} // namespace zt_platform
