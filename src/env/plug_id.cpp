#include "env/plug_id.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <limits>

namespace zt_env {

namespace {
int number_at(const char* text)
{
    constexpr long least = std::numeric_limits<int>::min();
    constexpr long most = std::numeric_limits<int>::max();
    return static_cast<int>(
        std::clamp(std::strtol(text, nullptr, 10), least, most));
}
} // namespace

PlugId split_id(const char* text)
{
    if (!text)
        text = "";
    const char* const colon = std::strchr(text, ':');
    if (!colon)
        return {text, 0, 0};
    const char* const point = std::strchr(colon, '.');
    return {{text, static_cast<std::size_t>(colon - text)},
            number_at(colon + 1),
            point ? number_at(point + 1) : 0};
}

} // namespace zt_env
