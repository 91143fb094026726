#include "image/pixel_rows.h"

namespace zt_image {

using zt_platform::PixelLanes;

zt_platform::Joining joining_of(const ChannelRows& rows, std::size_t count,
                                ChannelOrder order, ZtPixel* pixels)
{
    const auto& of = rows.channel;
    if (order == ChannelOrder::Codec)
        return {{of[0], of[1], of[2], of[3]}, pixels, count};
    return {{of[3], of[2], of[1], of[0]}, pixels, count};
}

void join_channels(const ChannelRows& rows, std::size_t count,
                   ChannelOrder order, ZtPixel* pixels)
{
    zt_platform::Joining joining = joining_of(rows, count, order, pixels);
    PixelLanes::current().join(joining.bytes, joining.words, joining.count);
}

void take_channels(const ZtPixel* pixels, std::size_t count, ChannelOrder order,
                   const ChannelRoom& rows)
{
    const auto& of = rows.channel;
    if (order == ChannelOrder::Codec)
        PixelLanes::current().split(pixels, {of[0], of[1], of[2], of[3]},
                                    count);
    else
        PixelLanes::current().split(pixels, {of[3], of[2], of[1], of[0]},
                                    count);
}

void take_luminance(const ZtPixel* pixels, std::size_t count,
                    ChannelOrder order, unsigned char* values)
{
    int red = channel_shift(order, 0);
    int green = channel_shift(order, 1);
    int blue = channel_shift(order, 2);
    for (std::size_t i = 0; i < count; ++i)
        values[i] =
            static_cast<unsigned char>((79 * (pixels[i] >> red & 0xFF) +
                                        156 * (pixels[i] >> green & 0xFF) +
                                        21 * (pixels[i] >> blue & 0xFF)) >>
                                       8);
}

void spread_grey(ZtPixel* pixels, std::size_t count, ChannelOrder order)
{
    int red = channel_shift(order, 0);
    for (std::size_t i = 0; i < count; ++i) {
        ZtPixel grey = pixels[i] >> red & 0xFF;
        pixels[i] = make_pixel(order, grey, grey, grey, 0xFF);
    }
}

void make_opaque(ZtPixel* pixels, std::size_t count, ChannelOrder order)
{
    for (std::size_t i = 0; i < count; ++i)
        pixels[i] |= make_pixel(order, 0, 0, 0, 0xFF);
}

} // namespace zt_image
