#ifndef ZT_IMAGE_VIDEO_FRAME_H
#define ZT_IMAGE_VIDEO_FRAME_H

/// \file
/// Pictures turned into frames of interlaced video.
///
/// A frame has 486 lines of 720 samples in 4:2:2, groups of first chroma,
/// luma, second chroma, luma, and is stored one field after the other: lines 0
/// to 242 hold the second, fourth, ... line of the picture from the top, lines
/// 243 to 485 the first, third, ....

#include <ZT/image_sgi.h>

#include <cstddef>

namespace zt_image {

constexpr int video_width = 720;
constexpr int video_lines = 486;
constexpr std::size_t video_line_bytes = std::size_t{video_width} * 2;
constexpr std::size_t video_frame_bytes = video_line_bytes * video_lines;

/// The size of the pictures that become frames: their pixels are wider.
constexpr int video_picture_width = 648;
constexpr int video_picture_height = video_lines;

/// Gives the line of a frame that holds row `row` of a picture, counted from
/// the bottom.
constexpr int video_line_of(int row)
{
    return row % 2 == 0 ? 242 - row / 2 : video_lines - 1 - row / 2;
}

/// Makes a frame of a picture.
///
/// Fractions that are cut off are carried from sample to sample and from line
/// to line, from the top line of the picture to the bottom one.
///
/// Requires: 648 x 486 pixels in object order and room for
///           `video_frame_bytes`. Alpha is ignored.
/// Context:  nothing is allocated; one line of samples is on the stack.
void make_video_frame(const ZtPixel* pixels, unsigned char* frame);

} // namespace zt_image

#endif
