#include "core/slab.h"

#include <algorithm>
#include <cstdint>
#include <new>

#include "platform/large_memory.h"

namespace zt_core {

namespace {

constexpr std::size_t least_bytes = std::size_t{64} << 10;
constexpr std::size_t most_bytes = std::size_t{32} << 20;

// What all slabs have together.
constinit std::size_t taken = 0;

struct Room
{
    char* begin;
    std::size_t bytes;
};

// A slab is as large as all before it together. Its untouched pages cost
// nothing, so a host with few links pays little; with many of them the slabs
// become large enough for large pages, without which a walk through a million
// nodes waits for addresses as long as for the nodes.
//
// `margin` is what the caller loses by aligning. Nothing is given when memory
// runs out.
Room new_slab(std::size_t margin)
{
    std::size_t bytes = std::clamp(taken, least_bytes, most_bytes);
    void* slab = ::operator new(bytes + margin, std::nothrow);
    if (!slab && bytes > least_bytes) {
        bytes = least_bytes;
        slab = ::operator new(bytes + margin, std::nothrow);
    }
    if (!slab)
        return {};
    zt_platform::prefer_large_pages(slab, bytes + margin);
    taken += bytes;
    return {static_cast<char*>(slab), bytes};
}

// What is left of the slab that blocks are cut from.
constinit Room uncut = {};

} // namespace

constinit char* Slab::unused = nullptr;
constinit char* Slab::end = nullptr;

bool Slab::renew()
{
    const Room slab = new_slab(0);
    if (!slab.begin)
        return false;
    unused = slab.begin;
    end = unused + slab.bytes;
    return true;
}

void* Slab::cut_block()
{
    static_assert(least_bytes % block_bytes == 0);
    if (uncut.bytes == 0) {
        uncut = new_slab(block_bytes);
        const auto place = reinterpret_cast<std::uintptr_t>(uncut.begin);
        uncut.begin += (block_bytes - place % block_bytes) % block_bytes;
    }
    if (uncut.bytes == 0)
        return nullptr;
    void* block = uncut.begin;
    uncut.begin += block_bytes;
    uncut.bytes -= block_bytes;
    return block;
}

} // namespace zt_core
