#ifndef ZT_IMAGE_SGI_PACKETS_H
#define ZT_IMAGE_SGI_PACKETS_H

/// \file
/// The packets of a compressed row, from bytes to channel values and back.
///
/// What a packet is, `zt_platform::PackedRow` says, which rows that fill their
/// width exactly are read through.

#include <ZT/image_sgi.h>

#include <cstddef>

namespace zt_image {

/// Bytes behind packets and values that `compress_row` may touch.
constexpr std::size_t packet_slack = 32;

/// Expands a row of any kind into one channel of the pixels from `pixels` on.
///
/// A row that is too long runs on into the pixels that follow, up to
/// `pixels_end`; a short one leaves the rest as it lies. A packet that
/// `packets_end` cuts off gives what there is of it.
///
/// Units: `shift` is the bit at which the channel starts.
void expand_row(const unsigned char* packets, const unsigned char* packets_end,
                ZtPixel* pixels, const ZtPixel* pixels_end, int shift);

/// Gives the room that a compressed row may take in the worst case, which no
/// row comes near to: two bytes a value and the closing zero.
constexpr std::size_t most_packet_bytes(std::size_t width)
{
    return 2 * width + 1;
}

/// Compresses a row of channel values.
///
/// Requires: room for `most_packet_bytes(width)` at `packets`; `packet_slack`
///           bytes behind it that may be written and behind
///           `values + width` that may be read.
/// Returns:  the end of the packets, behind the closing zero.
unsigned char* compress_row(const unsigned char* values, std::size_t width,
                            unsigned char* packets);

} // namespace zt_image

#endif
