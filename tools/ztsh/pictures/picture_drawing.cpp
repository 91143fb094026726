#include "pictures/picture_drawing.h"

#include <algorithm>

namespace ztsh {

namespace {

constexpr int thickness = 2;

/// What of a stretch lies between 0 and `end`.
struct Stretch
{
    Stretch(long begin, long length, long end)
        : from(std::max(begin, 0L)), to(std::min(begin + length, end))
    {}

    long from;
    long to;
};

ZtPixel* pixel_at(const ZtImageSGI& image, long x, long y)
{
    return image.pixels + y * image.width + x;
}

void fill(ZtImageSGI& image, long x, long y, long width, long height,
          ZtPixel colour)
{
    const Stretch columns(x, width, image.width);
    const Stretch rows(y, height, image.height);
    if (columns.from >= columns.to)
        return;
    for (long row = rows.from; row < rows.to; ++row)
        std::fill(pixel_at(image, columns.from, row),
                  pixel_at(image, columns.from, row) +
                      (columns.to - columns.from),
                  colour);
}

} // namespace

void Paste(ZtImageSGI& image, const ZtImageSGI& pasted, int x, int y)
{
    const Stretch columns(x, pasted.width, image.width);
    const Stretch rows(y, pasted.height, image.height);
    if (columns.from >= columns.to)
        return;
    for (long row = rows.from; row < rows.to; ++row)
        std::copy_n(pixel_at(pasted, columns.from - x, row - y),
                    columns.to - columns.from,
                    pixel_at(image, columns.from, row));
}

void DrawFrame(ZtImageSGI& image, const Part& part, ZtPixel colour)
{
    const long across = std::min(thickness, part.width);
    const long up = std::min(thickness, part.height);
    const long right = static_cast<long>(part.x) + part.width;
    const long top = static_cast<long>(part.y) + part.height;
    fill(image, part.x, part.y, part.width, up, colour);
    fill(image, part.x, top - up, part.width, up, colour);
    fill(image, part.x, part.y, across, part.height, colour);
    fill(image, right - across, part.y, across, part.height, colour);
}

} // namespace ztsh
