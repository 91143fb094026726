#include "platform/large_memory.h"

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <sstream>
#include <string>
#include <sys/mman.h>
#include <vector>

#include <gtest/gtest.h>

#include "support/FailingMalloc.h"

namespace {

using zt_platform::new_large_block;

/// Gives the system's marks of the memory around an address.
std::string MarksAt(const void* address)
{
    std::ifstream in("/proc/self/smaps");
    bool inside = false;
    for (std::string line; std::getline(in, line);) {
        unsigned long long from = 0;
        unsigned long long to = 0;
        if (std::sscanf(line.c_str(), "%llx-%llx ", &from, &to) == 2)
            inside = reinterpret_cast<std::uintptr_t>(address) >= from &&
                     reinterpret_cast<std::uintptr_t>(address) < to;
        if (inside && line.starts_with("VmFlags:"))
            return line + " ";
    }
    return "";
}

/// Tells whether the system has large pages to ask for.
bool SystemHasLargePages()
{
    constexpr std::size_t bytes = std::size_t{4} << 20;
    void* probe = mmap(nullptr, bytes, PROT_READ | PROT_WRITE,
                       MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    bool has = madvise(probe, bytes, MADV_HUGEPAGE) == 0;
    munmap(probe, bytes);
    return has;
}

TEST(large_memory, ABlockOfAnySizeCanBeFilledAndReleased)
{
    for (std::size_t bytes :
         {std::size_t{1}, std::size_t{100}, std::size_t{2} << 20,
          (std::size_t{2} << 20) - 1, (std::size_t{9} << 20) + 5}) {
        void* block = new_large_block(bytes);

        ASSERT_NE(block, nullptr);
        std::memset(block, 0x5A, bytes);
        std::free(block);
    }
}

TEST(large_memory, WithoutMemoryThereIsNone)
{
    FailingMalloc none(0);

    void* small = new_large_block(1);
    void* large = new_large_block(std::size_t{9} << 20);

    EXPECT_EQ(small, nullptr);
    EXPECT_EQ(large, nullptr);
}

TEST(large_memory, ALargeBlockAsksForLargePagesWhereTheSystemHasThem)
{
    const std::size_t bytes = std::size_t{9} << 20;
    char* block = static_cast<char*>(new_large_block(bytes));
    ASSERT_NE(block, nullptr);

    bool asked = MarksAt(block + bytes / 2).find(" hg ") != std::string::npos;

    EXPECT_EQ(asked, SystemHasLargePages());
    std::free(block);
}

TEST(large_memory, RefusedAdviceLeavesTheLastFailureAlone)
{
    const std::size_t bytes = std::size_t{4} << 20;
    void* gone = mmap(nullptr, bytes, PROT_READ | PROT_WRITE,
                      MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    munmap(gone, bytes);

    errno = 0;
    zt_platform::prefer_large_pages(gone, bytes);

    EXPECT_EQ(errno, 0);
}

TEST(large_memory, NewMemoryOfAnySizeIsClearedAndNothingBesideIt)
{
    for (std::size_t bytes :
         {std::size_t{0}, std::size_t{1}, std::size_t{100},
          (std::size_t{256} << 10) - 1, std::size_t{256} << 10,
          (std::size_t{3} << 20) + 5}) {
        std::vector<char> block(7 + bytes + 1, 'x');

        errno = EDOM;
        zt_platform::clear_new_memory(block.data() + 7, bytes);

        EXPECT_EQ(errno, EDOM);
        EXPECT_EQ(std::count(block.begin(), block.begin() + 7, 'x'), 7);
        EXPECT_EQ(static_cast<std::size_t>(
                      std::count(block.begin(), block.end(), '\0')),
                  bytes);
        EXPECT_EQ(block.back(), 'x');
    }
}

} // namespace
