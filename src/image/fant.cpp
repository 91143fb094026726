#include "image/fant.h"

#include "image/picture.h"

#include <algorithm>
#include <cstdlib>

namespace zt_image {

namespace {

constexpr ZtPixel averaged_bits = 0x00FFFFFF;

/// Lines that are averaged side by side in the pass across: a cache line of
/// pixels.
constexpr std::size_t side_by_side = 16;

/// Values that are summed up together.
constexpr std::size_t lanes = 16;

/// Lines of bytes, one behind the other; the last stands for all after it.
struct Lines
{
    const unsigned char* first;
    std::size_t stride;
    std::size_t last;

    const unsigned char* at(std::size_t line) const
    {
        return first + std::min(line, last) * stride;
    }
};

/// Averages one block of values down the lines of a span.
void average_block(const Lines& lines_in, const FantSpan& span, double scale,
                   std::size_t at, unsigned char* out, std::size_t count)
{
    double sum[lanes] = {};
    const unsigned char* here = lines_in.at(span.first) + at;
    const unsigned char* next = lines_in.at(span.first + 1) + at;
    double rest = 1.0 - span.head;
    if (span.count == 0) {
        for (std::size_t i = 0; i < count; ++i)
            sum[i] = (span.head * here[i] + rest * next[i]) * span.tail;
    } else {
        for (std::size_t i = 0; i < count; ++i)
            sum[i] = (span.head * here[i] + rest * next[i]) * span.head;
        for (std::size_t line = 1; line < span.count; ++line) {
            const unsigned char* whole = lines_in.at(span.first + line) + at;
            for (std::size_t i = 0; i < count; ++i)
                sum[i] += whole[i];
        }
        const unsigned char* cut = lines_in.at(span.first + span.count) + at;
        for (std::size_t i = 0; i < count; ++i)
            sum[i] += cut[i] * span.tail;
    }
    for (std::size_t i = 0; i < count; ++i)
        out[i] = static_cast<unsigned char>(static_cast<int>(sum[i] * scale));
}

/// Averages lines of pixels into one line of `count` pixels.
void average_lines(const Lines& lines_in, const FantSpan& span, double scale,
                   ZtPixel* out, std::size_t count)
{
    std::size_t bytes = count * sizeof(ZtPixel);
    unsigned char* out_bytes = reinterpret_cast<unsigned char*>(out);
    std::size_t at = 0;
    for (; at + lanes <= bytes; at += lanes)
        average_block(lines_in, span, scale, at, out_bytes + at, lanes);
    if (at < bytes)
        average_block(lines_in, span, scale, at, out_bytes + at, bytes - at);
    for (std::size_t i = 0; i < count; ++i)
        out[i] &= averaged_bits;
}

/// Scales up to `side_by_side` rows across: they are turned so that pixels of
/// one column lie side by side, averaged, and turned back.
void scale_rows(const ZtPixel* rows, std::size_t count, const FantWalk& walk,
                ZtPixel* turned, ZtPixel* out)
{
    std::size_t in_width = static_cast<std::size_t>(walk.in_length());
    std::size_t out_width = static_cast<std::size_t>(walk.out_length());
    for (std::size_t x = 0; x < in_width; ++x)
        for (std::size_t row = 0; row < count; ++row)
            turned[x * side_by_side + row] = rows[row * in_width + x];
    Lines columns = {reinterpret_cast<const unsigned char*>(turned),
                     side_by_side * sizeof(ZtPixel), in_width - 1};
    ZtPixel column[side_by_side];
    for (int x = 0; x < walk.out_length(); ++x) {
        average_lines(columns, walk.span(x), walk.scale(), column,
                      side_by_side);
        for (std::size_t row = 0; row < count; ++row)
            out[row * out_width + static_cast<std::size_t>(x)] = column[row];
    }
}

/// Scales a picture across.
///
/// Returns: false for lack of memory.
bool scale_across(const ZtPixel* source, std::size_t height,
                  const FantWalk& walk, ZtPixel* out)
{
    std::size_t in_width = static_cast<std::size_t>(walk.in_length());
    std::size_t out_width = static_cast<std::size_t>(walk.out_length());
    ZtPixel* turned = new_zeroed_pixels(in_width, side_by_side);
    if (!turned)
        return false;
    for (std::size_t y = 0; y < height; y += side_by_side)
        scale_rows(source + y * in_width, std::min(side_by_side, height - y),
                   walk, turned, out + y * out_width);
    std::free(turned);
    return true;
}

/// Scales a picture down its columns.
void scale_down(const ZtPixel* source, std::size_t width, const FantWalk& walk,
                ZtPixel* out)
{
    Lines rows = {reinterpret_cast<const unsigned char*>(source),
                  width * sizeof(ZtPixel),
                  static_cast<std::size_t>(walk.in_length()) - 1};
    for (int y = 0; y < walk.out_length(); ++y)
        average_lines(rows, walk.span(y), walk.scale(),
                      out + static_cast<std::size_t>(y) * width, width);
}

} // namespace

FantWalk::FantWalk(int in_pixels, int out_pixels)
    : in(in_pixels), out(out_pixels), out_per_in(static_cast<double>(out) / in),
      spans(static_cast<FantSpan*>(
          std::malloc(static_cast<std::size_t>(out) * sizeof(FantSpan))))
{
    if (!spans)
        return;
    double inseg = 1.0; // What is left of the present source pixel.
    std::size_t position = 0;
    for (int i = 0; i < out; ++i) {
        double outseg = 1.0 / out_per_in; // What the present pixel still needs.
        FantSpan span = {position, 0, inseg, 0.0};
        while (inseg < outseg) {
            outseg -= inseg;
            inseg = 1.0;
            ++span.count;
        }
        span.tail = outseg;
        inseg -= outseg;
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
    std::size_t rows = static_cast<std::size_t>(height);
    std::size_t columns = static_cast<std::size_t>(new_width);
    FantWalk across(width, new_width);
    FantWalk down(height, new_height);
    ZtPixel* half_done = new_pixels(columns, rows);
    bool done = across.made() && down.made() && half_done &&
                scale_across(source, rows, across, half_done);
    if (done)
        scale_down(half_done, columns, down, destination);
    std::free(half_done);
    return done;
}

} // namespace zt_image
