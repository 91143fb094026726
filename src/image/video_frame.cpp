#include "image/video_frame.h"

#include "platform/video_lanes.h"

#include <cstring>

namespace zt_image {

namespace {

using zt_platform::VideoCarry;
using zt_platform::VideoLanes;
using zt_platform::VideoMix;

/// Ten samples show nine pixels, the first of them twice.
constexpr std::size_t stretched_from = 9;
constexpr std::size_t stretched_to = 10;
static_assert(video_width * stretched_from ==
              video_picture_width * stretched_to);

/// The weights of the channels in the two lumas and in the chromas, whose
/// filter takes a quarter, a half and a quarter of three samples.
///
/// The first blue weight of the first chroma is 455 more than would make its
/// weights cancel out for grey: what recorders have always been sent.
constexpr VideoMix mix = {
    {16829, 33039, 6416},
    16,
    {{{-4853, -9530, 14838}, {-2426, -4765, 7191}, 128},
     {{14386, -12046, -2340}, {7193, -6023, -1170}, 128}}};

void stretch(const ZtPixel* row, ZtPixel* samples)
{
    for (std::size_t at = 0; at < video_picture_width; at += stretched_from) {
        samples[0] = row[at];
        std::memcpy(samples + 1, row + at, stretched_from * sizeof(ZtPixel));
        samples += stretched_to;
    }
}

} // namespace

void make_video_frame(const ZtPixel* pixels, unsigned char* frame)
{
    const VideoLanes& lanes = VideoLanes::current();
    VideoCarry carry;
    ZtPixel samples[video_width];
    for (int row = video_picture_height - 1; row >= 0; --row) {
        stretch(pixels + static_cast<std::size_t>(row) * video_picture_width,
                samples);
        lanes.mix(samples,
                  frame + static_cast<std::size_t>(video_line_of(row)) *
                              video_line_bytes,
                  video_width / 2, mix, carry);
    }
}

} // namespace zt_image
