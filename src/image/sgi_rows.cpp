#include "image/sgi_rows.h"

#include "platform/byte_order.h"

#include <algorithm>
#include <cstdlib>

namespace zt_image {

SgiRowTable::SgiRowTable() : starts(nullptr), count(0), height(0) {}

SgiRowTable::~SgiRowTable()
{
    std::free(starts);
}

bool SgiRowTable::read(const zt_platform::InputFile& file,
                       const SgiHeader& header)
{
    height = header.ysize;
    count = height * header.zsize;
    if (count == 0)
        return true;
    starts = static_cast<std::uint32_t*>(
        std::calloc(count * 2, sizeof(std::uint32_t)));
    if (!starts)
        return false;
    file.read_at(sgi_header_bytes, starts, count * 2 * sizeof(std::uint32_t));
    for (std::size_t i = 0; i < count * 2; ++i)
        starts[i] = zt_platform::load_big_32(
            reinterpret_cast<const unsigned char*>(starts + i));
    return true;
}

bool SgiRowTable::in_order() const
{
    std::uint32_t before = 0;
    for (std::size_t y = 0; y < height; ++y)
        for (std::size_t entry = y; entry < count; entry += height) {
            if (starts[entry] < before)
                return false;
            before = starts[entry];
        }
    return true;
}

bool SgiRowTable::any_longer_than(std::size_t bytes) const
{
    return std::any_of(starts + count, starts + 2 * count,
                       [bytes](std::uint32_t row) { return row > bytes; });
}

} // namespace zt_image
