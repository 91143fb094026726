#ifndef ZT_BENCH_SAMPLE_PICTURES_H
#define ZT_BENCH_SAMPLE_PICTURES_H

/// \file
/// Three kinds of picture, from hard to easy to pack: what a camera gives, what
/// a renderer gives, and a matte of two flat areas.

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <vector>

#include <ZT/image_sgi.h>

enum class Kind { Photo, Rendered, Flat };

/// Makes a picture in the order of the codec, its alpha by kind as well.
inline std::vector<ZtPixel> SamplePicture(Kind kind, int width, int height)
{
    std::vector<ZtPixel> pixels;
    pixels.reserve(static_cast<std::size_t>(width) *
                   static_cast<std::size_t>(height));
    std::uint32_t random = 1;
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x) {
            random = random * 1664525 + 1013904223;
            const int dx = x - width / 2, dy = y - height / 2;
            const bool inside = dx * dx + dy * dy < height * height / 9;
            ZtPixel value = 0, alpha = 0xFF;
            if (kind == Kind::Photo) {
                value = static_cast<ZtPixel>(x / 16 + y / 16) % 240 +
                        (random >> 28);
                alpha = 0xF0 | random >> 29;
            } else if (kind == Kind::Rendered) {
                value =
                    inside ? static_cast<ZtPixel>(128 + dx / 8) & 0xFF : 0x20;
                alpha = inside ? 0xFF : 0;
            } else {
                value = alpha = inside ? 0xFF : 0;
            }
            pixels.push_back(alpha << 24 | value << 16 |
                             ((255 - value) & 0xFF) << 8 | (value ^ 0x55));
        }
    return pixels;
}

#endif
