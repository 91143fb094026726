#ifndef ZT_IMAGE_PICTURE_H
#define ZT_IMAGE_PICTURE_H

/// \file
/// What the readers hand to the codec functions and to the image object: a
/// size with its pixels, in either order of channels.
///
/// Pixels come from `malloc` and go with `free`, for hosts may do either.

#include <ZT/image_sgi.h>

#include <cstddef>

namespace zt_image {

/// Where the channels stand in a pixel: 0xAABBGGRR or 0xRRGGBBAA.
enum class ChannelOrder : int { Codec = 0, Object = 1 };

/// Gives the bit at which a channel starts, 0 being red and 3 alpha.
constexpr int channel_shift(ChannelOrder order, int channel)
{
    return order == ChannelOrder::Codec ? 8 * channel : 24 - 8 * channel;
}

/// Puts the four channels of a pixel in their places.
constexpr ZtPixel make_pixel(ChannelOrder order, ZtPixel red, ZtPixel green,
                             ZtPixel blue, ZtPixel alpha)
{
    return red << channel_shift(order, 0) | green << channel_shift(order, 1) |
           blue << channel_shift(order, 2) | alpha << channel_shift(order, 3);
}

/// A picture as it was read; without pixels the size is 0 x 0 as well.
///
/// Owner: whoever receives it releases the pixels with `free`.
struct Picture
{
    ZtPixel* pixels = nullptr;
    int width = 0;
    int height = 0;
};

/// Tells whether a reader may make a picture of this size: at most 2^28
/// pixels, or as many as the environment variable ZT_MAX_PIXELS says.
bool within_pixel_limit(std::size_t width, std::size_t height);

/// Makes room for width * height pixels and `extra_bytes` behind them.
///
/// Owner:   the caller, who releases it with `free`.
/// Returns: the pixels, not cleared; null for lack of memory.
ZtPixel* new_pixels(std::size_t width, std::size_t height,
                    std::size_t extra_bytes = 0);

/// Does the same and clears the pixels.
ZtPixel* new_zeroed_pixels(std::size_t width, std::size_t height);

/// Reads an SGI image file; see `longimagedata`.
Picture read_sgi(const char* name, ChannelOrder order);

/// Writes an SGI image file; see `longstoimage`.
///
/// Returns: whether every byte reached the file.
bool write_sgi(const ZtPixel* pixels, int xsize, int ysize, int zsize,
               const char* name, ChannelOrder order);

/// Reads a raw video frame; see `longimageyuvdata`.
Picture read_yuv(const char* name, ChannelOrder order);

/// Reads a pix file; see `ReadQuarnPix`.
Picture read_pix(const char* name, QuarnHeader& header, ChannelOrder order);

} // namespace zt_image

#endif
