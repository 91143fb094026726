#include "core/slab.h"

#include <algorithm>
#include <new>

#include "platform/large_memory.h"

namespace zt_core {

namespace {
constexpr std::size_t least_bytes = std::size_t{64} << 10;
constexpr std::size_t most_bytes = std::size_t{32} << 20;

// What all slabs have together.
constinit std::size_t carved_from = 0;
} // namespace

constinit char* Slab::unused = nullptr;
constinit char* Slab::end = nullptr;

// A slab is as large as all before it together. Its untouched pages cost
// nothing, so a host with few links pays little; with many of them the slabs
// become large enough for large pages, without which a walk through a million
// nodes waits for addresses as long as for the nodes.
bool Slab::renew()
{
    std::size_t bytes = std::clamp(carved_from, least_bytes, most_bytes);
    void* slab = ::operator new(bytes, std::nothrow);
    if (!slab && bytes > least_bytes) {
        bytes = least_bytes;
        slab = ::operator new(bytes, std::nothrow);
    }
    if (!slab)
        return false;
    zt_platform::prefer_large_pages(slab, bytes);
    carved_from += bytes;
    unused = static_cast<char*>(slab);
    end = unused + bytes;
    return true;
}

} // namespace zt_core
