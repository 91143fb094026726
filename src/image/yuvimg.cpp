#include "image/picture.h"

#include "core/write_text.h"
#include "platform/files.h"

#include <algorithm>
#include <cstdlib>
#include <iostream>

namespace zt_image {

namespace {

constexpr int frame_width = 720;
constexpr int frame_height = 486;
constexpr std::size_t line_bytes = std::size_t{frame_width} * 2;
constexpr std::size_t frame_bytes = line_bytes * frame_height;

constexpr int luma_offset = 16;
constexpr int chroma_offset = 128;

/// How much the samples weigh, in units of 1/65536.
constexpr int luma_weight = 76310;
constexpr int red_weight = 104635;
constexpr int green_weight1 = 25690;
constexpr int green_weight2 = 53294;
constexpr int blue_weight = 132278;

/// Clamps a sum that was made modulo 2^32, as only samples that no video holds
/// can tell.
constexpr int clamp_fixed(std::uint32_t sum)
{
    int value = static_cast<int>(sum);
    if (value >= 0x1000000)
        return 0xFFFFFF;
    return value < 0x10000 ? 0 : value;
}

/// Gives the whole part of a sum of `decode_yuv` after its clamping: one that
/// is too large gives 255, one below 1 gives 0.
constexpr ZtPixel whole_part(int sum)
{
    return static_cast<ZtPixel>(std::clamp(sum >> 16, 0, 0xFF));
}

/// Decodes a pixel as `decode_yuv` does, for samples that are in a file.
constexpr ZtPixel decode_pixel(ChannelOrder order, int luma, int chroma1,
                               int chroma2)
{
    int y = std::max(luma - luma_offset, 0) * luma_weight;
    int u = chroma1 - chroma_offset;
    int v = chroma2 - chroma_offset;
    return make_pixel(order, whole_part(y + red_weight * v),
                      whole_part(y - green_weight1 * u - green_weight2 * v),
                      whole_part(y + blue_weight * u), 0);
}

/// Decodes a line: groups of first chroma, luma, second chroma, luma.
template <ChannelOrder order>
void decode_line(const unsigned char* raw, ZtPixel* pixels)
{
    for (std::size_t group = 0; group < frame_width / 2; ++group) {
        const unsigned char* of = raw + 4 * group;
        pixels[2 * group] = decode_pixel(order, of[1], of[0], of[2]);
        pixels[2 * group + 1] = decode_pixel(order, of[3], of[0], of[2]);
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
        const unsigned char* from =
            raw + static_cast<std::size_t>(line) * line_bytes;
        if (order == ChannelOrder::Codec)
            decode_line<ChannelOrder::Codec>(from, pixels);
        else
            decode_line<ChannelOrder::Object>(from, pixels);
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
        for (const char* text :
             {"Couldn't open yuv file [", name ? name : "", "]\n"})
            zt_core::write_text(std::cerr, text);
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
    using namespace zt_image;
    auto product = [](int weight, int sample) {
        return static_cast<std::uint32_t>(weight) *
               static_cast<std::uint32_t>(sample);
    };
    std::uint32_t y = product(luma_weight, luma);
    red = clamp_fixed(y + product(red_weight, chroma2));
    green = clamp_fixed(y - product(green_weight1, chroma1) -
                        product(green_weight2, chroma2));
    blue = clamp_fixed(y + product(blue_weight, chroma1));
}

ZtPixel* longimageyuvdata(const char* name)
{
    return zt_image::read_yuv(name, zt_image::ChannelOrder::Codec).pixels;
}
