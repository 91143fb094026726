#include "image/picture.h"

#include "image/pixel_rows.h"
#include "image/sgi_header.h"
#include "image/sgi_packets.h"
#include "platform/byte_order.h"
#include "platform/files.h"

#include <cstdlib>
#include <cstring>

namespace zt_image {

namespace {

constexpr std::size_t entry_bytes = 4;
constexpr std::size_t largest_offset = 0xFFFFFFFF;

unsigned char* new_bytes(std::size_t count)
{
    return static_cast<unsigned char*>(std::malloc(count));
}

/// A file of compressed rows in the making. Rows are packed into a buffer that
/// goes out whenever it is full; header and tables go out at the end, into the
/// room that was left for them. Nothing is touched without memory for both.
class RowWriter
{
public:
    RowWriter(const char* name, int xsize, int ysize, int zsize)
        : width(static_cast<std::size_t>(xsize)),
          rows(static_cast<std::size_t>(ysize) *
               static_cast<std::size_t>(zsize)),
          front_bytes(sgi_header_bytes + 2 * entry_bytes * rows),
          front(new_bytes(front_bytes)),
          buffer(new_bytes(largest_write + most_packet_bytes(width) +
                           packet_slack)),
          packed(0), offset(front_bytes), sound(true),
          file(front && buffer ? name : nullptr)
    {
        if (front)
            store_sgi_header(front, xsize, ysize, zsize);
    }

    ~RowWriter()
    {
        std::free(front);
        std::free(buffer);
    }

    RowWriter(const RowWriter&) = delete;
    RowWriter& operator=(const RowWriter&) = delete;

    bool is_open() const { return file.is_open(); }

    /// Gives the number of pixels in a row.
    std::size_t row_width() const { return width; }

    /// Adds the row whose entry in the tables has this number.
    ///
    /// Returns: false when there is no use in going on.
    bool add(const unsigned char* values, std::size_t entry)
    {
        unsigned char* end = compress_row(values, width, buffer + packed);
        std::size_t bytes = static_cast<std::size_t>(end - buffer) - packed;
        if (bytes > row_bound(width)) {
            overlong_row();
            sound = false;
        }
        if (offset + packed > largest_offset)
            sound = false;
        store_entry(entry, offset + packed);
        store_entry(rows + entry, bytes);
        packed += bytes;
        if (packed >= largest_write)
            flush();
        return sound;
    }

    /// Returns: whether every byte has reached the file.
    bool finish()
    {
        flush();
        sound = sound && file.write_at(0, front, front_bytes);
        return file.close() && sound;
    }

private:
    static constexpr std::size_t largest_write = std::size_t{256} << 10;

    void store_entry(std::size_t entry, std::size_t value)
    {
        zt_platform::store_big_32(front + sgi_header_bytes +
                                      entry_bytes * entry,
                                  static_cast<std::uint32_t>(value));
    }

    void flush()
    {
        sound = sound && file.write_at(offset, buffer, packed);
        offset += packed;
        packed = 0;
    }

    std::size_t width;
    std::size_t rows;        ///< Compressed rows, those of all channels.
    std::size_t front_bytes; ///< Of header and tables.
    unsigned char* front;    ///< The header, then the tables.
    unsigned char* buffer;   ///< Rows that have not gone out yet.
    std::size_t packed;      ///< Bytes in the buffer.
    std::size_t offset;      ///< Where in the file the buffer goes.
    bool sound;              ///< Whether the file can still become right.
    zt_platform::OutputFile file;
};

/// Writes the channels of one row of pixels.
bool write_row(RowWriter& writer, const ZtPixel* pixels, ChannelOrder order,
               int zsize, std::size_t ysize, std::size_t y,
               const ChannelRoom& rows)
{
    std::size_t width = writer.row_width();
    if (zsize == 1) {
        take_luminance(pixels, width, order, rows.channel[0]);
        return writer.add(rows.channel[0], y);
    }
    take_channels(pixels, width, order, rows);
    for (int z = 0; z < zsize; ++z)
        if (!writer.add(rows.channel[z],
                        y + static_cast<std::size_t>(z) * ysize))
            return false;
    return true;
}

bool can_be_written(const ZtPixel* pixels, int xsize, int ysize, int zsize)
{
    constexpr int largest_size = 65535;
    return pixels && xsize >= 1 && xsize <= largest_size && ysize >= 1 &&
           ysize <= largest_size && zsize >= 1 && zsize <= 4;
}

} // namespace

bool write_sgi(const ZtPixel* pixels, int xsize, int ysize, int zsize,
               const char* name, ChannelOrder order)
{
    if (!can_be_written(pixels, xsize, ysize, zsize))
        return false;
    std::size_t width = static_cast<std::size_t>(xsize);
    std::size_t height = static_cast<std::size_t>(ysize);
    unsigned char* values = new_bytes(4 * width + packet_slack);
    if (!values)
        return false;
    ChannelRoom rows = {
        {values, values + width, values + 2 * width, values + 3 * width}};
    RowWriter writer(name, xsize, ysize, zsize);
    bool sound = writer.is_open();
    for (std::size_t y = 0; sound && y < height; ++y)
        sound = write_row(writer, pixels + y * width, order, zsize, height, y,
                          rows);
    std::free(values);
    return sound && writer.finish();
}

} // namespace zt_image

int longstoimage(const ZtPixel* pixels, int xsize, int ysize, int zsize,
                 const char* name)
{
    return zt_image::write_sgi(pixels, xsize, ysize, zsize, name,
                               zt_image::ChannelOrder::Codec);
}
