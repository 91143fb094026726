#include "image/picture.h"

#include "platform/byte_order.h"
#include "platform/files.h"

#include <algorithm>
#include <cstdlib>

namespace zt_image {

namespace {

using zt_platform::InputFile;
using zt_platform::load_big_16;

constexpr std::size_t pix_header_bytes = 10;
constexpr std::size_t packet_bytes = 4;
constexpr int largest_size = 8192;

/// Reads the header.
///
/// Returns: whether it was whole and describes a picture that can be read.
bool read_header(const InputFile& file, QuarnHeader& header)
{
    unsigned char bytes[pix_header_bytes] = {};
    std::size_t got = file.read_at(0, bytes, sizeof bytes);
    header = {load_big_16(bytes), load_big_16(bytes + 2),
              load_big_16(bytes + 4), load_big_16(bytes + 6),
              load_big_16(bytes + 8)};
    return got == sizeof bytes && header.width >= 1 &&
           header.width <= largest_size && header.height >= 1 &&
           header.height <= largest_size && header.bits_per_pixel == 24;
}

/// Where the next run goes: rows are filled from the last one, the top of the
/// picture, to the first.
class PixCursor
{
public:
    PixCursor(ZtPixel* all_pixels, const QuarnHeader& header)
        : pixels(all_pixels), width(header.width), count(width * header.height),
          row_start(count - width), position(0), done(false)
    {}

    bool at_end() const { return done; }

    /// Writes a run, past the row's end if it must be but not past the
    /// picture's, and steps to the row below if the row is full.
    void put(std::size_t run, ZtPixel pixel)
    {
        std::size_t first = row_start + position;
        std::fill_n(pixels + first, std::min(run, count - first), pixel);
        position += run;
        if (position < width)
            return;
        position = 0;
        done = row_start == 0;
        if (!done)
            row_start -= width;
    }

private:
    ZtPixel* pixels;
    std::size_t width;
    std::size_t count;     ///< Pixels of the picture.
    std::size_t row_start; ///< The first pixel of the present row.
    std::size_t position;  ///< Pixels of the present row that are done.
    bool done;
};

/// Reads the packets until the picture is full or the file ends.
///
/// Returns: false when a packet is cut, and for lack of memory.
bool read_packets(const InputFile& file, const QuarnHeader& header,
                  ZtPixel* pixels, ChannelOrder order)
{
    constexpr std::size_t block_bytes = std::size_t{64} << 10;
    unsigned char* block =
        static_cast<unsigned char*>(std::malloc(block_bytes));
    if (!block)
        return false;
    PixCursor cursor(pixels, header);
    std::uint64_t offset = pix_header_bytes;
    std::size_t got = block_bytes;
    while (!cursor.at_end() && got == block_bytes) {
        got = file.read_at(offset, block, block_bytes);
        offset += got;
        for (std::size_t at = 0; at + packet_bytes <= got && !cursor.at_end();
             at += packet_bytes)
            cursor.put(block[at],
                       make_pixel(order, block[at + 3], block[at + 2],
                                  block[at + 1], 0xFF));
    }
    std::free(block);
    return cursor.at_end() || got % packet_bytes == 0;
}

} // namespace

Picture read_pix(const char* name, QuarnHeader& header, ChannelOrder order)
{
    InputFile file(name);
    if (!file.is_open() || !read_header(file, header) ||
        !within_pixel_limit(header.width, header.height))
        return {};
    ZtPixel* pixels = new_zeroed_pixels(header.width, header.height);
    if (pixels && !read_packets(file, header, pixels, order)) {
        std::free(pixels);
        pixels = nullptr;
    }
    if (!pixels)
        return {};
    return {pixels, header.width, header.height};
}

} // namespace zt_image

ZtPixel* ReadQuarnPix(const char* name, QuarnHeader& header)
{
    return zt_image::read_pix(name, header, zt_image::ChannelOrder::Codec)
        .pixels;
}
