#include "image/picture.h"

#include "core/write_text.h"
#include "platform/files.h"
#include "platform/video_lanes.h"

#include <cstring>
#include <iostream>

namespace zt_image {

namespace {

using zt_platform::InputFile;
using zt_platform::VideoColors;
using zt_platform::VideoLanes;

constexpr std::size_t frame_width = 720;
constexpr std::size_t frame_height = 486;
constexpr std::size_t line_bytes = frame_width * 2;

/// Lines are read so many at a time: they stay in the fastest cache.
constexpr std::size_t lines_at_once = 18;
static_assert(frame_height % lines_at_once == 0);

/// How much the samples weigh, in units of 1/65536.
constexpr int luma_weight = 76310;
constexpr int red_weight = 104635;
constexpr int green_weight1 = 25690;
constexpr int green_weight2 = 53294;
constexpr int blue_weight = 132278;

/// The same for the whole parts of what `decode_yuv` gives, after its
/// clamping, for samples that are in a file.
constexpr VideoColors colors_in(ChannelOrder order)
{
    return {luma_weight,
            16,
            {0, red_weight},
            {-green_weight1, -green_weight2},
            {blue_weight, 0},
            128,
            order == ChannelOrder::Codec};
}

/// Clamps a sum that was made modulo 2^32, as only samples that no video holds
/// can tell.
constexpr int clamp_fixed(std::uint32_t sum)
{
    int value = static_cast<int>(sum);
    if (value >= 0x1000000)
        return 0xFFFFFF;
    return value < 0x10000 ? 0 : value;
}

/// Decodes a frame that is open into the picture, its last line first. What
/// the file lacks is zero.
void decode_frame(const InputFile& file, ZtPixel* pixels, ChannelOrder order)
{
    const VideoLanes& lanes = VideoLanes::current();
    const VideoColors colors = colors_in(order);
    unsigned char raw[lines_at_once * line_bytes];
    std::size_t got = sizeof raw;
    for (std::size_t line = 0; line < frame_height; ++line) {
        const std::size_t ahead = line % lines_at_once;
        if (ahead == 0) {
            // Nothing counts that comes after a gap.
            got = got == sizeof raw
                      ? file.read_at(line * line_bytes, raw, sizeof raw)
                      : 0;
            std::memset(raw + got, 0, sizeof raw - got);
        }
        lanes.color(raw + ahead * line_bytes,
                    pixels + (frame_height - 1 - line) * frame_width,
                    frame_width / 2, colors);
    }
}

} // namespace

Picture read_yuv(const char* name, ChannelOrder order)
{
    if (!within_pixel_limit(frame_width, frame_height))
        return {};
    ZtPixel* pixels = new_pixels(frame_width, frame_height);
    if (!pixels)
        return {};
    InputFile file(name);
    if (file.is_open()) {
        decode_frame(file, pixels, order);
    } else {
        std::memset(pixels, 0, frame_width * frame_height * sizeof(ZtPixel));
        for (const char* text :
             {"Couldn't open yuv file [", name ? name : "", "]\n"})
            zt_core::write_text(std::cerr, text);
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
