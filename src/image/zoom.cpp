#include "image/zoom.h"

#include "platform/pixel_lanes.h"

#include <algorithm>
#include <cstddef>
#include <cstdlib>
#include <cstring>

namespace zt_image {

namespace {

constinit ColumnMap column_map;

} // namespace

int nearest_position(int source_size, int size, int position)
{
    float nearest =
        static_cast<float>(source_size) *
        ((static_cast<float>(position) + 0.5f) / static_cast<float>(size));
    // Beyond 2^24 single precision rounds up to the size itself.
    if (!(nearest < static_cast<float>(source_size)))
        return source_size - 1;
    return std::min(static_cast<int>(nearest), source_size - 1);
}

const int* ColumnMap::columns(int source_width, int width)
{
    if (entries && from == source_width && to == width)
        return entries;
    if (!entries || width > capacity) {
        void* larger = std::realloc(entries, static_cast<std::size_t>(width) *
                                                 sizeof *entries);
        if (!larger)
            return nullptr;
        entries = static_cast<int*>(larger);
        capacity = width;
    }
    for (int i = 0; i < width; ++i)
        entries[i] = nearest_position(source_width, width, i);
    from = source_width;
    to = width;
    ++built;
    return entries;
}

bool zoom_nearest(const ZtPixel* source, ZtPixel* destination, int ax, int ay,
                  int bx, int by)
{
    if (ax < 1 || ay < 1 || bx < 1 || by < 1)
        return true;
    const int* columns = column_map.columns(ax, bx);
    if (!columns)
        return false;
    const zt_platform::PixelLanes& lanes = zt_platform::PixelLanes::current();
    std::size_t width = static_cast<std::size_t>(bx);
    int shown = -1; // The source row that the row before was made of.
    for (int y = 0; y < by; ++y, destination += width) {
        int row = nearest_position(ay, by, y);
        if (row == shown) {
            std::memcpy(destination, destination - width,
                        width * sizeof(ZtPixel));
            continue;
        }
        const ZtPixel* pixels = source + static_cast<std::size_t>(row) *
                                             static_cast<std::size_t>(ax);
        lanes.pick(pixels, columns, destination, width);
        shown = row;
    }
    return true;
}

} // namespace zt_image

void fastzoom(const ZtPixel* source, ZtPixel* destination, int ax, int ay,
              int bx, int by)
{
    zt_image::zoom_nearest(source, destination, ax, ay, bx, by);
}
