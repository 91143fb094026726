#include "platform/large_memory.h"

#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <sys/mman.h>
#include <unistd.h>

namespace zt_platform {

namespace {

constexpr std::size_t large_page = std::size_t{2} << 20;

// What is cleared while it is still in the cache from being provided.
constexpr std::size_t at_a_time = std::size_t{256} << 10;

// Only advice: systems that do not know it provide each page when it is
// touched, as they would have.
void provide_pages(char* begin, std::size_t bytes)
{
    static const auto page = static_cast<std::size_t>(sysconf(_SC_PAGESIZE));
    const auto place = reinterpret_cast<std::uintptr_t>(begin);
    const std::size_t before = (page - place % page) % page;
    if (bytes < before + page)
        return;
    madvise(begin + before, (bytes - before) / page * page,
            MADV_POPULATE_WRITE);
}

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

void clear_new_memory(void* begin, std::size_t bytes)
{
    const int number = errno;
    char* rest = static_cast<char*>(begin);
    for (; bytes >= at_a_time; bytes -= at_a_time, rest += at_a_time) {
        provide_pages(rest, at_a_time);
        std::memset(rest, 0, at_a_time);
    }
    std::memset(rest, 0, bytes);
    errno = number;
}

void* new_large_block(std::size_t bytes)
{
    void* block = std::malloc(bytes);
    prefer_large_pages(block, bytes);
    return block;
}

} // namespace zt_platform
