#ifndef ZT_IMAGE_PIXEL_ROWS_H
#define ZT_IMAGE_PIXEL_ROWS_H

/// \file
/// Rows of pixels and the rows of channel values that they are made of.

#include "image/picture.h"
#include "platform/pixel_lanes.h"

#include <cstddef>

namespace zt_image {

/// Four rows of channel values: red, green, blue, alpha.
struct ChannelRows
{
    const unsigned char* channel[4];
};

/// Gives the four rows in the order of a pixel's bytes.
zt_platform::Joining joining_of(const ChannelRows& rows, std::size_t count,
                                ChannelOrder order, ZtPixel* pixels);

/// Makes `count` pixels of the four rows.
void join_channels(const ChannelRows& rows, std::size_t count,
                   ChannelOrder order, ZtPixel* pixels);

/// Four rows that channel values are put in.
struct ChannelRoom
{
    unsigned char* channel[4];
};

/// Takes the four channels out of `count` pixels.
void take_channels(const ZtPixel* pixels, std::size_t count, ChannelOrder order,
                   const ChannelRoom& rows);

/// Takes the luminance out of `count` pixels: of 256 parts 79 red, 156 green
/// and 21 blue.
void take_luminance(const ZtPixel* pixels, std::size_t count,
                    ChannelOrder order, unsigned char* values);

/// Makes pixels that hold a grey value in their red channel opaque grey.
void spread_grey(ZtPixel* pixels, std::size_t count, ChannelOrder order);

/// Makes pixels opaque.
void make_opaque(ZtPixel* pixels, std::size_t count, ChannelOrder order);

} // namespace zt_image

#endif
