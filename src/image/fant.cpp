#include "image/fant.h"

#include "image/picture.h"
#include "platform/pixel_lanes.h"

#include <algorithm>
#include <cstdlib>

namespace zt_image {

namespace {

using zt_platform::PixelLanes;

/// Lines that are averaged side by side in the pass across: a cache line of
/// pixels.
constexpr std::size_t side_by_side = 16;

/// Where the lines of a walk are: one behind the other, and the last of them
/// again for all that the walk looks at after it.
class WalkLines
{
public:
    WalkLines(const FantWalk& walk, const ZtPixel* first, std::size_t stride)
        : lanes(PixelLanes::current()),
          lines(static_cast<const ZtPixel**>(
              std::malloc(walk.reach() * sizeof(const ZtPixel*))))
    {
        for (std::size_t i = 0; lines && i < walk.reach(); ++i)
            lines[i] = first + std::min(i, walk.in_length() - 1) * stride;
    }

    ~WalkLines() { std::free(lines); }
    WalkLines(const WalkLines&) = delete;
    WalkLines& operator=(const WalkLines&) = delete;

    bool made() const { return lines != nullptr; }

    /// Averages the lines of a span into one line of `count` pixels.
    void average(const FantSpan& span, double scale, ZtPixel* out,
                 std::size_t count) const
    {
        lanes.average(
            {lines + span.first, span.count, span.head, span.tail, scale}, out,
            count);
    }

private:
    const PixelLanes& lanes;
    const ZtPixel** lines;
};

/// Turns a picture of `width` x `height` pixels, so that its columns become
/// rows; the strides go from one row to the next.
void turn(const ZtPixel* pixels, std::size_t width, std::size_t height,
          std::size_t stride, ZtPixel* columns, std::size_t columns_stride)
{
    const PixelLanes& lanes = PixelLanes::current();
    constexpr std::size_t block = PixelLanes::turned;
    for (std::size_t y = 0; y < height; y += block)
        for (std::size_t x = 0; x < width; x += block) {
            const ZtPixel* from = pixels + y * stride + x;
            ZtPixel* to = columns + x * columns_stride + y;
            if (y + block <= height && x + block <= width) {
                lanes.turn(from, stride, to, columns_stride);
                continue;
            }
            for (std::size_t row = 0; row < std::min(block, height - y); ++row)
                for (std::size_t i = 0; i < std::min(block, width - x); ++i)
                    to[i * columns_stride + row] = from[row * stride + i];
        }
}

/// Scales a picture across, a band of rows at a time: the band is turned, its
/// columns are averaged, and the averages are turned back.
///
/// Returns: false for lack of memory.
bool scale_across(const ZtPixel* source, std::size_t height,
                  const FantWalk& walk, ZtPixel* out)
{
    std::size_t width = walk.in_length();
    std::size_t new_width = walk.out_length();
    ZtPixel* turned = new_zeroed_pixels(width + new_width, side_by_side);
    if (!turned)
        return false;
    ZtPixel* averages = turned + width * side_by_side;
    WalkLines columns(walk, turned, side_by_side);
    for (std::size_t y = 0; columns.made() && y < height; y += side_by_side) {
        std::size_t count = std::min(side_by_side, height - y);
        turn(source + y * width, width, count, width, turned, side_by_side);
        for (std::size_t x = 0; x < new_width; ++x)
            columns.average(walk.span(x), walk.scale(),
                            averages + x * side_by_side, side_by_side);
        turn(averages, count, new_width, side_by_side, out + y * new_width,
             new_width);
    }
    std::free(turned);
    return columns.made();
}

/// Scales a picture down its columns.
///
/// Returns: false for lack of memory.
bool scale_down(const ZtPixel* source, std::size_t width, const FantWalk& walk,
                ZtPixel* out)
{
    WalkLines rows(walk, source, width);
    for (std::size_t y = 0; rows.made() && y < walk.out_length(); ++y)
        rows.average(walk.span(y), walk.scale(), out + y * width, width);
    return rows.made();
}

} // namespace

FantWalk::FantWalk(int in_pixels, int out_pixels)
    : in(static_cast<std::size_t>(in_pixels)),
      out(static_cast<std::size_t>(out_pixels)),
      out_per_in(static_cast<double>(out_pixels) / in_pixels), last_position(0),
      spans(static_cast<FantSpan*>(std::malloc(out * sizeof(FantSpan))))
{
    double inseg = 1.0; // What is left of the present source pixel.
    std::size_t position = 0;
    for (std::size_t i = 0; spans && i < out; ++i) {
        double outseg = 1.0 / out_per_in; // What the present pixel still needs.
        FantSpan span = {position, 0, inseg, 0.0};
        while (inseg < outseg) {
            outseg -= inseg;
            inseg = 1.0;
            ++span.count;
        }
        span.tail = outseg;
        inseg -= outseg;
        last_position = position + std::max<std::size_t>(span.count, 1);
        position += span.count;
        spans[i] = span;
    }
}

FantWalk::~FantWalk()
{
    std::free(spans);
}

bool zoom_fant(const ZtPixel* source, int width, int height,
               ZtPixel* destination, int new_width, int new_height)
{
    FantWalk across(width, new_width);
    FantWalk down(height, new_height);
    ZtPixel* half_done = new_pixels(across.out_length(), down.in_length());
    bool done = across.made() && down.made() && half_done &&
                scale_across(source, down.in_length(), across, half_done) &&
                scale_down(half_done, across.out_length(), down, destination);
    std::free(half_done);
    return done;
}

} // namespace zt_image
