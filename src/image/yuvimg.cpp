#include "image/picture.h"

#include "platform/files.h"

#include <algorithm>
#include <cstdlib>
#include <iostream>

namespace zt_image {

namespace {

constexpr int frame_width = 720;
constexpr int frame_height = 486;
constexpr std::size_t line_bytes = frame_width * 2;
constexpr std::size_t frame_bytes = line_bytes * frame_height;

/// Clamps a sum that was made modulo 2^32, as only samples that no video holds
/// can tell.
constexpr int clamp_fixed(std::uint32_t sum)
{
    int value = static_cast<int>(sum);
    if (value >= 0x1000000)
        return 0xFFFFFF;
    return value < 0x10000 ? 0 : value;
}

ZtPixel pixel_of(ChannelOrder order, int luma, int chroma1, int chroma2)
{
    int red;
    int green;
    int blue;
    decode_yuv(red, green, blue, luma, chroma1, chroma2);
    return make_pixel(order, static_cast<ZtPixel>(red >> 16),
                      static_cast<ZtPixel>(green >> 16),
                      static_cast<ZtPixel>(blue >> 16), 0);
}

/// Decodes a line: groups of first chroma, luma, second chroma, luma.
void decode_line(const unsigned char* raw, ZtPixel* pixels, ChannelOrder order)
{
    for (std::size_t i = 0; i < line_bytes; i += 4, pixels += 2) {
        int chroma1 = raw[i] - 128;
        int chroma2 = raw[i + 2] - 128;
        pixels[0] =
            pixel_of(order, std::max(raw[i + 1] - 16, 0), chroma1, chroma2);
        pixels[1] =
            pixel_of(order, std::max(raw[i + 3] - 16, 0), chroma1, chroma2);
    }
}

/// Decodes a frame that is open into the picture, its last line first.
///
/// Returns: false for lack of memory.
bool decode_frame(const zt_platform::InputFile& file, ZtPixel* pixels,
                  ChannelOrder order)
{
    unsigned char* raw =
        static_cast<unsigned char*>(std::calloc(frame_bytes, 1));
    if (!raw)
        return false;
    file.read_at(0, raw, frame_bytes);
    for (int line = frame_height - 1; line >= 0; --line) {
        decode_line(raw + static_cast<std::size_t>(line) * line_bytes, pixels,
                    order);
        pixels += frame_width;
    }
    std::free(raw);
    return true;
}

} // namespace

Picture read_yuv(const char* name, ChannelOrder order)
{
    if (!within_pixel_limit(frame_width, frame_height))
        return {};
    ZtPixel* pixels = new_zeroed_pixels(frame_width, frame_height);
    if (!pixels)
        return {};
    zt_platform::InputFile file(name);
    if (!file.is_open()) {
        std::cerr << "Couldn't open yuv file [" << (name ? name : "") << "]\n";
    } else if (!decode_frame(file, pixels, order)) {
        std::free(pixels);
        return {};
    }
    return {pixels, frame_width, frame_height};
}

} // namespace zt_image

void decode_yuv(int& red, int& green, int& blue, int luma, int chroma1,
                int chroma2)
{
    using zt_image::clamp_fixed;
    std::uint32_t y = static_cast<std::uint32_t>(luma) * 76310u;
    std::uint32_t u = static_cast<std::uint32_t>(chroma1);
    std::uint32_t v = static_cast<std::uint32_t>(chroma2);
    red = clamp_fixed(y + 104635u * v);
    green = clamp_fixed(y - 25690u * u - 53294u * v);
    blue = clamp_fixed(y + 132278u * u);
}

ZtPixel* longimageyuvdata(const char* name)
{
    return zt_image::read_yuv(name, zt_image::ChannelOrder::Codec).pixels;
}
