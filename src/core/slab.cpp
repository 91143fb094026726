#include "core/slab.h"

#include <new>

namespace zt_core {

namespace {
// Untouched pages of a slab cost nothing, so a host with few links pays little.
constexpr std::size_t slab_bytes = 65536;
} // namespace

constinit char* Slab::unused = nullptr;
constinit char* Slab::end = nullptr;

bool Slab::renew()
{
    void* slab = ::operator new(slab_bytes, std::nothrow);
    if (!slab)
        return false;
    unused = static_cast<char*>(slab);
    end = unused + slab_bytes;
    return true;
}

} // namespace zt_core
