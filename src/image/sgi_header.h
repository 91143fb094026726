#ifndef ZT_IMAGE_SGI_HEADER_H
#define ZT_IMAGE_SGI_HEADER_H

/// \file
/// The header of an SGI image file, and the two things that its row tables
/// share: the bound of a compressed row and what happens beyond it.

#include "platform/files.h"

#include <cstddef>
#include <cstdint>

namespace zt_image {

constexpr std::size_t sgi_header_bytes = 512;
constexpr std::uint16_t sgi_magic = 474;

/// The fields that are read; those that are only ever written have no member.
struct SgiHeader
{
    std::uint16_t imagic; ///< `sgi_magic`.
    std::uint16_t type;   ///< High byte: 1 run-length; low: bytes a channel.
    std::uint16_t dim;    ///< Not examined.
    std::uint16_t xsize;  ///< Pixels a row.
    std::uint16_t ysize;  ///< Rows.
    std::uint16_t zsize;  ///< Channels.

    bool is_run_length() const { return (type & 0xFF00) == 0x0100; }
    int bytes_a_channel() const { return type & 0x00FF; }
};

/// Reads the header; what a short file does not hold is zero.
SgiHeader read_sgi_header(const zt_platform::InputFile& file);

/// Writes the header of a run-length file to `bytes`, zeros where nothing
/// is said.
void store_sgi_header(unsigned char* bytes, int xsize, int ysize, int zsize);

/// Keeps a refused file open until the next one is refused.
///
/// Owner: this function, for one file at a time.
void hold_refused(zt_platform::InputFile& file);

/// Gives the number of bytes that a compressed row of `xsize` pixels may take.
constexpr std::size_t row_bound(std::size_t xsize)
{
    return xsize * 105 / 100 + 10;
}

/// Calls what `ZtSetOverlongRowHandler` installed, at first `exit(1)`.
void overlong_row();

} // namespace zt_image

#endif
