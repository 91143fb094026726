#include "platform/pixel_lanes.h"

#include "platform/unpack_rows.h"
#include "platform/x86/pixel_lanes_avx2.h"

#include <cstring>

namespace zt_platform {

namespace {

struct PlainLanes final : PixelLanes
{};

constinit const PlainLanes plain_lanes;
constinit const PixelLanes* in_use = nullptr; ///< Null before the first use.

/// Blocks of bytes: nearly every packet is done with the first.
struct PlainWide
{
    static constexpr std::size_t block = 64;

    static void copy(unsigned char* to, const unsigned char* from,
                     std::size_t count)
    {
        for (std::size_t done = 0; done < count; done += bytes)
            std::memcpy(to + done, from + done, bytes);
    }

    static void fill(unsigned char* to, unsigned char value, std::size_t count)
    {
        for (std::size_t done = 0; done < count; done += bytes)
            std::memset(to + done, value, bytes);
    }

    static void join(const unsigned char* const (&rows)[4], std::size_t at,
                     std::uint32_t* words)
    {
        plain_lanes.join(
            {rows[0] + at, rows[1] + at, rows[2] + at, rows[3] + at}, words,
            block);
    }

private:
    static constexpr std::size_t bytes = 32;
};

} // namespace

const char* PixelLanes::name() const
{
    return "plain";
}

void PixelLanes::join(const unsigned char* const (&bytes)[4],
                      std::uint32_t* words, std::size_t count) const
{
    for (std::size_t i = 0; i < count; ++i)
        words[i] = static_cast<std::uint32_t>(bytes[0][i]) |
                   static_cast<std::uint32_t>(bytes[1][i]) << 8 |
                   static_cast<std::uint32_t>(bytes[2][i]) << 16 |
                   static_cast<std::uint32_t>(bytes[3][i]) << 24;
}

bool PixelLanes::unpack(const PackedRow (&rows)[4], Packets packets,
                        const Joining& beside) const
{
    return unpack_rows<PlainWide>(*this, rows, packets, beside);
}

void PixelLanes::split(const std::uint32_t* words,
                       unsigned char* const (&bytes)[4],
                       std::size_t count) const
{
    for (int lane = 0; lane < 4; ++lane)
        for (std::size_t i = 0; i < count; ++i)
            bytes[lane][i] = static_cast<unsigned char>(words[i] >> 8 * lane);
}

std::size_t PixelLanes::find_three_equal(const unsigned char* bytes,
                                         std::size_t count) const
{
    for (std::size_t i = 0; i + 2 < count; ++i)
        if (bytes[i] == bytes[i + 1] && bytes[i + 1] == bytes[i + 2])
            return i;
    return count;
}

std::size_t PixelLanes::count_equal(const unsigned char* bytes,
                                    std::size_t count) const
{
    std::size_t i = 1;
    while (i < count && bytes[i] == bytes[0])
        ++i;
    return i;
}

void PixelLanes::turn(const std::uint32_t* words, std::size_t stride,
                      std::uint32_t* columns, std::size_t columns_stride) const
{
    for (std::size_t row = 0; row < turned; ++row)
        for (std::size_t column = 0; column < turned; ++column)
            columns[column * columns_stride + row] =
                words[row * stride + column];
}

void PixelLanes::pick(const std::uint32_t* words, const int* places,
                      std::uint32_t* picked, std::size_t count) const
{
    for (std::size_t i = 0; i < count; ++i)
        picked[i] = words[places[i]];
}

void PixelLanes::average(const Average& lines, std::uint32_t* averages,
                         std::size_t count) const
{
    average_from(lines, averages, 0, count);
}

void PixelLanes::average_from(const Average& lines, std::uint32_t* averages,
                              std::size_t at, std::size_t count)
{
    double rest = 1.0 - lines.head;
    double first_share = lines.whole ? lines.head : lines.tail;
    for (std::size_t i = at; i < count; ++i) {
        std::uint32_t average = 0;
        for (int shift = 0; shift < 24; shift += 8) {
            auto value = [&](std::size_t line) {
                return static_cast<double>(lines.lines[line][i] >> shift &
                                           0xFF);
            };
            double sum =
                (lines.head * value(0) + rest * value(1)) * first_share;
            for (std::size_t line = 1; line < lines.whole; ++line)
                sum += value(line);
            if (lines.whole)
                sum += value(lines.whole) * lines.tail;
            average |= (static_cast<std::uint32_t>(sum * lines.scale) & 0xFF)
                       << shift;
        }
        averages[i] = average;
    }
}

const PixelLanes& PixelLanes::plain()
{
    return plain_lanes;
}

const PixelLanes& PixelLanes::fastest()
{
    const PixelLanes* wide = avx2_pixel_lanes();
    return wide ? *wide : plain_lanes;
}

const PixelLanes& PixelLanes::current()
{
    if (!in_use)
        in_use = &fastest();
    return *in_use;
}

void PixelLanes::install(const PixelLanes* other)
{
    in_use = other;
}

} // namespace zt_platform
