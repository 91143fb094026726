#ifndef ZT_PLATFORM_BYTE_ORDER_H
#define ZT_PLATFORM_BYTE_ORDER_H

/// \file
/// Numbers in files, most significant byte first, whatever the processor does.
///
/// Everything is done by shifts, so the same text serves every machine and
/// nothing depends on alignment.

#include <cstdint>

namespace zt_platform {

/// Reads two bytes at `bytes`, the most significant first.
constexpr std::uint16_t load_big_16(const unsigned char* bytes)
{
    return static_cast<std::uint16_t>(bytes[0] << 8 | bytes[1]);
}

/// Reads four bytes at `bytes`, the most significant first.
constexpr std::uint32_t load_big_32(const unsigned char* bytes)
{
    return static_cast<std::uint32_t>(load_big_16(bytes)) << 16 |
           load_big_16(bytes + 2);
}

/// Writes two bytes to `bytes`, the most significant first.
constexpr void store_big_16(unsigned char* bytes, std::uint16_t value)
{
    bytes[0] = static_cast<unsigned char>(value >> 8);
    bytes[1] = static_cast<unsigned char>(value);
}

/// Writes four bytes to `bytes`, the most significant first.
constexpr void store_big_32(unsigned char* bytes, std::uint32_t value)
{
    store_big_16(bytes, static_cast<std::uint16_t>(value >> 16));
    store_big_16(bytes + 2, static_cast<std::uint16_t>(value));
}

} // namespace zt_platform

#endif
