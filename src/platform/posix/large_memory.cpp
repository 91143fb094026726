#include "platform/large_memory.h"

#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <sys/mman.h>

namespace zt_platform {

namespace {

constexpr std::size_t large_page = std::size_t{2} << 20;

} // namespace

void prefer_large_pages(void* block, std::size_t bytes)
{
    std::uintptr_t start = reinterpret_cast<std::uintptr_t>(block);
    std::size_t before = (large_page - start % large_page) % large_page;
    // Only advice: without large pages the block is as good as any other, and
    // nobody hears of it.
    if (!block || bytes < before + large_page)
        return;
    const int number = errno;
    madvise(static_cast<char*>(block) + before,
            (bytes - before) / large_page * large_page, MADV_HUGEPAGE);
    errno = number;
}

void* new_large_block(std::size_t bytes)
{
    void* block = std::malloc(bytes);
    prefer_large_pages(block, bytes);
    return block;
}

} // namespace zt_platform
