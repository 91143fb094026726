#include "image/sgi_bytes.h"

std::string Bytes(const std::vector<int>& values)
{
    std::string bytes;
    for (int value : values)
        bytes += static_cast<char>(value);
    return bytes;
}

std::string Fill(std::size_t count, int value)
{
    return std::string(count, static_cast<char>(value));
}

std::string Big16(unsigned value)
{
    return Bytes(
        {static_cast<int>(value >> 8 & 0xFF), static_cast<int>(value & 0xFF)});
}

std::string Big32(std::uint32_t value)
{
    return Big16(value >> 16) + Big16(value & 0xFFFF);
}

std::string SgiHeaderBytes(const SgiFields& fields)
{
    std::string bytes = Big16(fields.magic) +
                        Bytes({static_cast<int>(fields.storage),
                               static_cast<int>(fields.bytes_a_channel)}) +
                        Big16(fields.dimensions) + Big16(fields.width) +
                        Big16(fields.height) + Big16(fields.channels) +
                        Big32(0) + Big32(255) + Big32(0) + "no name";
    bytes.resize(104, '\0');
    bytes += Big32(fields.color_map);
    bytes.resize(512, '\0');
    return bytes;
}

std::string SgiRowBytes(const SgiFields& fields, const SgiRows& rows)
{
    std::size_t count = rows.rows.size();
    std::vector<std::uint32_t> starts(count);
    std::vector<std::uint32_t> lengths(count);
    std::string body;
    std::uint32_t offset = static_cast<std::uint32_t>(512 + 8 * count);
    for (std::size_t i = 0; i < count; ++i) {
        std::size_t entry =
            rows.by_channel
                ? i
                : i / fields.channels + i % fields.channels * fields.height;
        starts[entry] = offset;
        lengths[entry] = static_cast<std::uint32_t>(rows.rows[entry].size());
        body += rows.rows[entry];
        offset += lengths[entry];
    }
    for (const auto& [entry, start] : rows.starts)
        starts[entry] = start;
    for (const auto& [entry, length] : rows.lengths)
        lengths[entry] = length;
    std::string bytes;
    for (std::uint32_t start : starts)
        bytes += Big32(start);
    for (std::uint32_t length : lengths)
        bytes += Big32(length);
    return bytes + body;
}

std::vector<std::string> EqualRows(const SgiFields& fields,
                                   const std::string& row)
{
    return std::vector<std::string>(fields.height * fields.channels, row);
}

std::vector<std::string> PlainRows(const SgiFields& fields)
{
    std::vector<std::string> rows;
    for (unsigned z = 0; z < fields.channels; ++z)
        for (unsigned y = 0; y < fields.height; ++y)
            rows.push_back(Bytes({static_cast<int>(fields.width),
                                  static_cast<int>(0x40 + z), 0}));
    return rows;
}

std::string SgiFile(const SgiFields& fields, const SgiRows& rows)
{
    return SgiHeaderBytes(fields) + SgiRowBytes(fields, rows);
}
