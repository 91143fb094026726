#ifndef ZT_TESTS_IMAGE_SGI_BYTES_H
#define ZT_TESTS_IMAGE_SGI_BYTES_H

#include <cstdint>
#include <string>
#include <vector>

/// Spells out picture files byte by byte.

/// Bytes from numbers; each must be 0..255.
std::string Bytes(const std::vector<int>& values);

/// `count` times the same byte.
std::string Fill(std::size_t count, int value);

std::string Big16(unsigned value);
std::string Big32(std::uint32_t value);

/// What the header of an SGI image file says, with the usual values.
struct SgiFields
{
    unsigned magic = 0x01DA;
    unsigned storage = 1;
    unsigned bytes_a_channel = 1;
    unsigned dimensions = 3;
    unsigned width = 4;
    unsigned height = 4;
    unsigned channels = 3;
    unsigned color_map = 0;
};

/// The 512 bytes of a header.
std::string SgiHeaderBytes(const SgiFields& fields);

/// The compressed rows of a file and the order they lie in.
struct SgiRows
{
    /// Row `y` of channel `z` at y + z * height.
    std::vector<std::string> rows;
    /// What the length table says where that is not the row's length.
    std::vector<std::pair<std::size_t, std::uint32_t>> lengths = {};
    /// What the start table says where that is not where the row lies.
    std::vector<std::pair<std::size_t, std::uint32_t>> starts = {};
    /// Whether all rows of a channel lie together.
    bool by_channel = false;
};

/// The start table, the length table and the rows behind a header.
std::string SgiRowBytes(const SgiFields& fields, const SgiRows& rows);

/// As many equal rows as the fields ask for.
std::vector<std::string> EqualRows(const SgiFields& fields,
                                   const std::string& row);

/// One repeated value a row: 40 in the first channel, 41 in the second and so
/// on, hexadecimal.
std::vector<std::string> PlainRows(const SgiFields& fields);

/// A whole run-length file.
std::string SgiFile(const SgiFields& fields, const SgiRows& rows);

#endif
