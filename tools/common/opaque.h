#ifndef ZT_TOOLS_COMMON_OPAQUE_H
#define ZT_TOOLS_COMMON_OPAQUE_H

/// \file
/// Whether light comes through a picture.

#include <ZT/image_sgi.h>

#include <algorithm>

namespace zt_tools {

/// The alpha of an opaque pixel, at its place in the pixel.
constexpr ZtPixel opaque_alpha = 0xFF;

/// Tells whether every pixel of `image` is opaque.
inline bool IsOpaque(const ZtImageSGI& image)
{
    std::size_t pixels = static_cast<std::size_t>(image.width) *
                         static_cast<std::size_t>(image.height);
    return std::all_of(image.pixels, image.pixels + pixels, [](ZtPixel pixel) {
        return (pixel & opaque_alpha) == opaque_alpha;
    });
}

} // namespace zt_tools

#endif
