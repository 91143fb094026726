#include "image/pixel_rows.h"

namespace zt_image {

void join_channels(const ChannelRows& rows, std::size_t count,
                   ChannelOrder order, ZtPixel* pixels)
{
    // Lowest byte of the pixel first: object order is the other way round.
    bool codec = order == ChannelOrder::Codec;
    const unsigned char* byte0 = rows.channel[codec ? 0 : 3];
    const unsigned char* byte1 = rows.channel[codec ? 1 : 2];
    const unsigned char* byte2 = rows.channel[codec ? 2 : 1];
    const unsigned char* byte3 = rows.channel[codec ? 3 : 0];
    for (std::size_t i = 0; i < count; ++i)
        pixels[i] = static_cast<ZtPixel>(byte0[i]) |
                    static_cast<ZtPixel>(byte1[i]) << 8 |
                    static_cast<ZtPixel>(byte2[i]) << 16 |
                    static_cast<ZtPixel>(byte3[i]) << 24;
}

void take_channel(const ZtPixel* pixels, std::size_t count, ChannelOrder order,
                  int channel, unsigned char* values)
{
    int shift = channel_shift(order, channel);
    for (std::size_t i = 0; i < count; ++i)
        values[i] = static_cast<unsigned char>(pixels[i] >> shift);
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
