#include "platform/dynlib.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

namespace zt_platform {

namespace {
constexpr std::size_t least_room = 1024;
}

NameList::~NameList()
{
    std::free(block);
}

bool NameList::add(const char* name)
{
    const std::size_t bytes = std::strlen(name) + 1;
    if (bytes > room - used) {
        const std::size_t wanted =
            std::max({least_room, room * 2, used + bytes});
        void* const grown = std::realloc(block, wanted);
        if (!grown)
            return false;
        block = static_cast<char*>(grown);
        room = wanted;
    }
    std::memcpy(block + used, name, bytes);
    used += bytes;
    return true;
}

const char* NameList::first() const
{
    return used == 0 ? nullptr : block;
}

const char* NameList::next(const char* name) const
{
    const char* const following = name + std::strlen(name) + 1;
    return following == block + used ? nullptr : following;
}

} // namespace zt_platform
