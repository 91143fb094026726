#include "platform/dynlib.h"

#include <cstdint>
#include <cstring>

#include "platform/files.h"

namespace zt_platform {

namespace {

constexpr std::size_t identity_bytes = 16;
constexpr std::size_t longest_record = 64;
constexpr std::uint64_t loaded_segment = 1;

/// Where the numbers stand that are needed, for one word size.
struct Layout
{
    std::size_t header_bytes;
    std::size_t word_bytes;
    std::size_t table_offset; ///< In the header, a word.
    std::size_t entry_bytes;  ///< In the header, two bytes.
    std::size_t entry_count;  ///< In the header, two bytes.
    std::size_t segment_bytes;
    std::size_t file_offset; ///< In a segment, a word.
    std::size_t file_bytes;  ///< In a segment, a word.
};

constexpr Layout narrow = {52, 4, 28, 42, 44, 32, 4, 16};
constexpr Layout wide = {64, 8, 32, 54, 56, 56, 8, 32};

/// Reads numbers of a file of either byte order.
class ObjectReader
{
public:
    ObjectReader(const InputFile& input, bool most_significant_first)
        : file(input), big(most_significant_first)
    {}

    /// Reads the record that the numbers are taken from.
    bool read(std::uint64_t offset, std::size_t bytes)
    {
        return bytes <= sizeof record &&
               file.read_at(offset, record, bytes) == bytes;
    }

    std::uint64_t number(std::size_t place, std::size_t bytes) const
    {
        std::uint64_t value = 0;
        for (std::size_t i = 0; i < bytes; ++i) {
            const std::size_t from = place + (big ? i : bytes - 1 - i);
            value = value << 8 | record[from];
        }
        return value;
    }

private:
    const InputFile& file;
    bool big;
    unsigned char record[longest_record] = {};
};

/// Tells whether `bytes` bytes from `offset` on lie inside `size` bytes.
bool inside(std::uint64_t offset, std::uint64_t bytes, std::uint64_t size)
{
    return offset <= size && bytes <= size - offset;
}

ObjectExtent extent_of_segments(const InputFile& file, ObjectReader& reader,
                                const Layout& layout)
{
    if (!reader.read(0, layout.header_bytes))
        return ObjectExtent::Cut;
    const std::uint64_t table =
        reader.number(layout.table_offset, layout.word_bytes);
    const std::uint64_t count = reader.number(layout.entry_count, 2);
    if (reader.number(layout.entry_bytes, 2) != layout.segment_bytes)
        return ObjectExtent::Unknown;
    if (!inside(table, count * layout.segment_bytes, file.size()))
        return ObjectExtent::Cut;
    for (std::uint64_t i = 0; i < count; ++i) {
        if (!reader.read(table + i * layout.segment_bytes,
                         layout.segment_bytes))
            return ObjectExtent::Unknown;
        if (reader.number(0, 4) != loaded_segment)
            continue;
        const auto offset =
            reader.number(layout.file_offset, layout.word_bytes);
        const auto bytes = reader.number(layout.file_bytes, layout.word_bytes);
        if (!inside(offset, bytes, file.size()))
            return ObjectExtent::Cut;
    }
    return ObjectExtent::Whole;
}

} // namespace

ObjectExtent object_extent(const char* path)
{
    static constexpr unsigned char magic[] = {0x7F, 'E', 'L', 'F'};
    const InputFile file(path);
    unsigned char identity[identity_bytes] = {};
    const std::size_t got = file.read_at(0, identity, sizeof identity);
    if (got < sizeof magic || std::memcmp(identity, magic, sizeof magic) != 0)
        return ObjectExtent::Unknown;
    if (got < sizeof identity)
        return ObjectExtent::Cut;
    const unsigned char word_size = identity[4];
    const unsigned char byte_order = identity[5];
    if (word_size < 1 || word_size > 2 || byte_order < 1 || byte_order > 2)
        return ObjectExtent::Unknown;
    ObjectReader reader(file, byte_order == 2);
    return extent_of_segments(file, reader, word_size == 2 ? wide : narrow);
}

} // namespace zt_platform
