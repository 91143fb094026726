#include "image/picture.h"

#include "platform/large_memory.h"

#include <cstdlib>

namespace zt_image {

namespace {

constexpr unsigned long long default_pixel_limit = 1ULL << 28;

/// Reads the limit anew each time, since a host may set it at any time; a
/// value that is not a plain number is no limit of ours.
unsigned long long pixel_limit()
{
    const char* text = std::getenv("ZT_MAX_PIXELS");
    if (!text || *text < '0' || *text > '9')
        return default_pixel_limit;
    char* end = nullptr;
    unsigned long long limit = std::strtoull(text, &end, 10);
    return *end == '\0' ? limit : default_pixel_limit;
}

/// Tells whether width * height pixels and the extra bytes can be counted.
bool can_be_counted(std::size_t width, std::size_t height,
                    std::size_t extra_bytes)
{
    constexpr std::size_t most = static_cast<std::size_t>(-1) / 2;
    std::size_t room = (most - extra_bytes) / sizeof(ZtPixel);
    return height == 0 || width <= room / height;
}

} // namespace

bool within_pixel_limit(std::size_t width, std::size_t height)
{
    return height == 0 || width <= pixel_limit() / height;
}

ZtPixel* new_pixels(std::size_t width, std::size_t height,
                    std::size_t extra_bytes)
{
    if (!can_be_counted(width, height, extra_bytes))
        return nullptr;
    std::size_t bytes = width * height * sizeof(ZtPixel) + extra_bytes;
    // A picture of no pixels is a picture all the same, and not null.
    return static_cast<ZtPixel*>(
        zt_platform::new_large_block(bytes ? bytes : 1));
}

ZtPixel* new_zeroed_pixels(std::size_t width, std::size_t height)
{
    if (!can_be_counted(width, height, 0))
        return nullptr;
    std::size_t bytes = width * height * sizeof(ZtPixel);
    return static_cast<ZtPixel*>(std::calloc(bytes ? bytes : 1, 1));
}

} // namespace zt_image
