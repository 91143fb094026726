#ifndef ZT_SOUND_AIFC_HEADER_H
#define ZT_SOUND_AIFC_HEADER_H

/// \file
/// What stands before the samples in a file of AIFF-C without compression.

#include <cstddef>
#include <cstdint>

namespace zt_sound {

/// What a header says. An odd number of bytes is followed by a zero in the
/// file.
struct AifcFormat
{
    int channels;               ///< At least 1.
    long rate;                  ///< Frames a second.
    std::size_t bytes_a_sample; ///< 1, 2 or 3.
    std::uint32_t data_bytes;   ///< Of all samples.
};

constexpr std::size_t aifc_header_bytes = 86;

/// The bytes of samples that one file can hold.
constexpr std::uint64_t most_aifc_bytes = 0xFFFFFFFF - aifc_header_bytes;

/// Writes a header.
///
/// Requires: room for `aifc_header_bytes`.
void store_aifc_header(unsigned char* bytes, const AifcFormat& about);

} // namespace zt_sound

#endif
