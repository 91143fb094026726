#include "edge/grey.h"

#include <algorithm>

namespace edge {

namespace {

constexpr std::size_t pixels_of(int width, int height)
{
    return static_cast<std::size_t>(width) * static_cast<std::size_t>(height);
}

/// Weighs one pixel of the object's order, 0xRRGGBBAA.
constexpr std::int32_t grey_of(ZtPixel pixel)
{
    const ZtPixel red = pixel >> 24;
    const ZtPixel green = pixel >> 16 & 0xFF;
    const ZtPixel blue = pixel >> 8 & 0xFF;
    return static_cast<std::int32_t>((79 * red + 156 * green + 21 * blue) >> 8);
}

} // namespace

Grey GreyOf(const ZtImageSGI& image)
{
    Grey grey;
    if (!image.pixels || image.width < 1 || image.height < 1)
        return grey;
    grey.width = image.width;
    grey.height = image.height;
    grey.values.resize(pixels_of(image.width, image.height));
    std::transform(image.pixels, image.pixels + grey.values.size(),
                   grey.values.begin(), grey_of);
    return grey;
}

Grey Halved(const Grey& grey)
{
    Grey half;
    half.width = grey.width / 2;
    half.height = grey.height / 2;
    half.values.reserve(pixels_of(half.width, half.height));
    for (int y = 0; y < half.height; ++y) {
        const std::int32_t* low = grey.Row(2 * y);
        const std::int32_t* high = grey.Row(2 * y + 1);
        for (int x = 0; x < half.width; ++x, low += 2, high += 2)
            half.values.push_back(low[0] + low[1] + high[0] + high[1]);
    }
    return half;
}

WindowSums::WindowSums(const Grey& grey)
    : stride(static_cast<std::size_t>(grey.width) + 1),
      sums(stride * (static_cast<std::size_t>(grey.height) + 1)),
      squares(sums.size())
{
    std::size_t at = stride;
    for (int y = 0; y < grey.height; ++y) {
        const std::int32_t* row = grey.Row(y);
        std::int64_t row_sum = 0;
        std::int64_t row_squares = 0;
        ++at;
        for (int x = 0; x < grey.width; ++x, ++at) {
            const std::int64_t value = row[x];
            row_sum += value;
            row_squares += value * value;
            sums[at] = sums[at - stride] + row_sum;
            squares[at] = squares[at - stride] + row_squares;
        }
    }
}

std::int64_t WindowSums::sum(const Table& table, int x, int y, int width,
                             int height) const
{
    const std::size_t low =
        static_cast<std::size_t>(y) * stride + static_cast<std::size_t>(x);
    const std::size_t high = low + static_cast<std::size_t>(height) * stride;
    const auto across = static_cast<std::size_t>(width);
    return table[high + across] - table[high] - table[low + across] +
           table[low];
}

std::int64_t WindowSums::Spread(int x, int y, int width, int height) const
{
    const std::int64_t total = sum(sums, x, y, width, height);
    const std::int64_t count = static_cast<std::int64_t>(width) * height;
    return count * sum(squares, x, y, width, height) - total * total;
}

} // namespace edge
