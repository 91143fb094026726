#include "image/picture.h"

#include "image/file_window.h"
#include "image/pixel_rows.h"
#include "image/sgi_header.h"
#include "image/sgi_packets.h"
#include "image/sgi_rows.h"
#include "platform/files.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

// Most files hold rows that fill their width exactly, in whatever order they
// lie: the channels of such a row are unpacked into bytes, and while those of
// the next row are, they are joined into pixels. As soon as one row is longer
// or shorter, the file is read anew, row after row into the cleared picture,
// which decides what overlapping rows mean.

namespace zt_image {

namespace {

using zt_platform::InputFile;
using zt_platform::Joining;
using zt_platform::PackedRow;
using zt_platform::PixelLanes;

constexpr std::size_t most_channels = 4;

/// What the reading of one file works on.
struct Reading
{
    const InputFile& file;
    const SgiHeader& header;
    ZtPixel* pixels;
    ChannelOrder order;

    std::size_t width() const { return header.xsize; }
    std::size_t height() const { return header.ysize; }

    /// Channels that end up in the picture; a second one is dropped.
    std::size_t shown_channels() const
    {
        return header.zsize == 2 ? 1 : header.zsize;
    }
};

/// Two rows of channel values, one for each channel, and a row of opaque alpha.
class PlaneRows
{
public:
    explicit PlaneRows(std::size_t width)
        : stride((width + PixelLanes::packet_slack + line - 1) / line * line),
          bytes(static_cast<unsigned char*>(
              std::aligned_alloc(line, planes * stride)))
    {
        if (!bytes)
            return;
        std::memset(bytes, 0, planes * stride);
        std::memset(plane(2, 0), 0xFF, stride);
    }

    ~PlaneRows() { std::free(bytes); }
    PlaneRows(const PlaneRows&) = delete;
    PlaneRows& operator=(const PlaneRows&) = delete;

    bool made() const { return bytes != nullptr; }

    /// Gives the room of a channel in either row.
    unsigned char* plane(std::size_t row, std::size_t channel)
    {
        return bytes + (row * most_channels + channel) * stride;
    }

    const unsigned char* opaque() { return plane(2, 0); }

private:
    static constexpr std::size_t line = 64; ///< Bytes of the fastest access.
    static constexpr std::size_t planes = 2 * most_channels + 1;

    std::size_t stride;
    unsigned char* bytes;
};

/// Completes what a file's channels are in a picture: fewer than three are
/// grey, fewer than four opaque.
ChannelRows complete(const unsigned char* const (&planes)[most_channels],
                     const unsigned char* opaque, std::size_t zsize)
{
    if (zsize < 3)
        return {{planes[0], planes[0], planes[0], opaque}};
    return {{planes[0], planes[1], planes[2], zsize == 3 ? opaque : planes[3]}};
}

static_assert(FileWindow::slack >= PixelLanes::packet_slack);

/// Where the packets of the rows come from.
class PacketSource
{
public:
    PacketSource(const Reading& picture, const SgiRowTable& rows)
        : reading(picture), table(rows), windows{FileWindow(picture.file),
                                                 FileWindow(picture.file),
                                                 FileWindow(picture.file),
                                                 FileWindow(picture.file)}
    {}

    /// Finds the packets of each channel of a row; they stay until the next
    /// row is asked for.
    ///
    /// Channels that follow one another, as in most files, are read at once.
    /// Otherwise the file most likely goes channel by channel.
    ///
    /// Returns: false for lack of memory.
    bool find(std::size_t y, PackedRow (&rows)[most_channels])
    {
        std::uint64_t begin = ~std::uint64_t{0};
        std::uint64_t end = 0;
        for (std::size_t z = 0; z < reading.shown_channels(); ++z) {
            begin = std::min<std::uint64_t>(begin, table.start(y, z));
            end = std::max<std::uint64_t>(end, table.start(y, z) + bytes(y, z));
        }
        const std::size_t most =
            most_channels * most_packet_bytes(reading.width());
        const bool at_once = begin < end && end - begin <= most;
        if (at_once && !windows[0].at(begin, end - begin))
            return false;
        for (std::size_t z = 0; z < reading.shown_channels(); ++z) {
            const unsigned char* packets =
                windows[at_once ? 0 : z].at(table.start(y, z), bytes(y, z));
            if (!packets)
                return false;
            rows[z].packets = packets;
            rows[z].packets_end = packets + bytes(y, z);
        }
        return true;
    }

    /// Guesses at the packets of a row by the bytes that they take.
    PixelLanes::Packets packets(std::size_t y) const
    {
        const std::size_t channels = reading.shown_channels();
        std::size_t all = 0;
        for (std::size_t z = 0; z < channels; ++z)
            all += bytes(y, z);
        return all > channels * reading.width() / 2
                   ? PixelLanes::Packets::Long
                   : PixelLanes::Packets::Short;
    }

private:
    std::size_t bytes(std::size_t y, std::size_t z) const
    {
        return std::min<std::size_t>(table.length(y, z),
                                     most_packet_bytes(reading.width()));
    }

    const Reading& reading;
    const SgiRowTable& table;
    FileWindow windows[most_channels];
};

/// One of the two rows of a picture that are being read: first it is unpacked,
/// then, while the next one is, it is joined.
struct RowAtWork
{
    PackedRow packed[most_channels];
    Joining joining;
};

/// Makes a row of these planes; packets and pixels are still to come.
RowAtWork row_at_work(const Reading& reading, PlaneRows& rows, std::size_t row)
{
    unsigned char* const planes[most_channels] = {
        rows.plane(row, 0), rows.plane(row, 1), rows.plane(row, 2),
        rows.plane(row, 3)};
    RowAtWork work = {};
    work.joining =
        joining_of(complete(planes, rows.opaque(), reading.header.zsize), 0,
                   reading.order, nullptr);
    for (std::size_t z = 0; z < reading.shown_channels(); ++z) {
        work.packed[z].values = planes[z];
        work.packed[z].values_end = planes[z] + reading.width();
    }
    return work;
}

/// Reads rows that all fill their width exactly.
///
/// Returns: false when one does not, and for lack of memory.
bool read_exact_rows(const Reading& reading, const SgiRowTable& table)
{
    PlaneRows rows(reading.width());
    if (!rows.made())
        return false;
    const PixelLanes& lanes = PixelLanes::current();
    PacketSource source(reading, table);
    RowAtWork work[2] = {row_at_work(reading, rows, 0),
                         row_at_work(reading, rows, 1)};
    for (std::size_t y = 0; y < reading.height(); ++y) {
        RowAtWork& row = work[y % 2];
        const RowAtWork& before = work[1 - y % 2];
        if (!source.find(y, row.packed) ||
            !lanes.unpack(row.packed, source.packets(y), before.joining))
            return false;
        row.joining.words = reading.pixels + y * reading.width();
        row.joining.count = reading.width();
    }
    const Joining& last = work[(reading.height() + 1) % 2].joining;
    lanes.join(last.bytes, last.words, last.count);
    return true;
}

/// Gives the most bytes that can matter of a row that starts at pixel `first`:
/// it may run on to the picture's end, and no further than the file reaches
/// but for one packet of zeros.
std::size_t useful_bytes(const Reading& reading, const SgiRowTable& table,
                         std::size_t y, std::size_t z)
{
    std::size_t pixels = (reading.height() - y) * reading.width();
    std::uint64_t start = table.start(y, z);
    std::uint64_t held =
        reading.file.size() > start ? reading.file.size() - start : 0;
    std::uint64_t useful =
        std::min<std::uint64_t>(most_packet_bytes(pixels), held + 128);
    return static_cast<std::size_t>(
        std::min<std::uint64_t>(useful, table.length(y, z)));
}

/// Reads rows of any kind.
///
/// Returns: false for lack of memory.
bool read_any_rows(const Reading& reading, const SgiRowTable& table)
{
    std::size_t count = reading.width() * reading.height();
    std::memset(reading.pixels, 0, count * sizeof(ZtPixel));
    FileWindow window(reading.file);
    for (std::size_t z = 0; z < reading.shown_channels(); ++z)
        for (std::size_t y = 0; y < reading.height(); ++y) {
            std::size_t bytes = useful_bytes(reading, table, y, z);
            const unsigned char* packets = window.at(table.start(y, z), bytes);
            if (!packets)
                return false;
            expand_row(packets, packets + bytes,
                       reading.pixels + y * reading.width(),
                       reading.pixels + count,
                       channel_shift(reading.order, static_cast<int>(z)));
        }
    if (reading.header.zsize < 3)
        spread_grey(reading.pixels, count, reading.order);
    else if (reading.header.zsize == 3)
        make_opaque(reading.pixels, count, reading.order);
    return true;
}

/// Reads the rows of a run-length file.
///
/// Returns: false for lack of memory, and when rows out of order are too long
///          and the handler for that has returned.
bool read_run_length(const Reading& reading)
{
    SgiRowTable table;
    if (!table.read(reading.file, reading.header))
        return false;
    if (!table.in_order() &&
        table.any_longer_than(row_bound(reading.width()))) {
        overlong_row();
        return false;
    }
    return read_exact_rows(reading, table) || read_any_rows(reading, table);
}

/// Reads the planes of a verbatim file, a row of each at a time.
///
/// Returns: false for lack of memory.
bool read_verbatim(const Reading& reading)
{
    PlaneRows rows(reading.width());
    if (!rows.made())
        return false;
    FileWindow windows[most_channels] = {
        FileWindow(reading.file), FileWindow(reading.file),
        FileWindow(reading.file), FileWindow(reading.file)};
    const unsigned char* planes[most_channels] = {
        rows.plane(0, 0), rows.plane(0, 1), rows.plane(0, 2), rows.plane(0, 3)};
    for (std::size_t y = 0; y < reading.height(); ++y) {
        for (std::size_t z = 0; z < reading.shown_channels(); ++z) {
            std::uint64_t row = z * reading.height() + y;
            planes[z] = windows[z].at(sgi_header_bytes + row * reading.width(),
                                      reading.width());
            if (!planes[z])
                return false;
        }
        join_channels(complete(planes, rows.opaque(), reading.header.zsize),
                      reading.width(), reading.order,
                      reading.pixels + y * reading.width());
    }
    return true;
}

/// Writes the five words that follow the pixels of a picture that was read.
void add_tag(ZtPixel* behind_pixels, const SgiHeader& header)
{
    const ZtPixel tag[] = {0x12345678, 0x59493333, 0x69434222, header.xsize,
                           header.ysize};
    std::memcpy(behind_pixels, tag, sizeof tag);
}

constexpr std::size_t tag_bytes = 5 * sizeof(ZtPixel);

} // namespace

Picture read_sgi(const char* name, ChannelOrder order)
{
    InputFile file(name);
    if (!file.is_open())
        return {};
    SgiHeader header = read_sgi_header(file);
    if (header.imagic != sgi_magic || header.bytes_a_channel() != 1) {
        hold_refused(file);
        return {};
    }
    std::size_t width = header.xsize;
    std::size_t height = header.ysize;
    if (header.zsize > most_channels || !within_pixel_limit(width, height))
        return {};
    ZtPixel* pixels = new_pixels(width, height, tag_bytes);
    if (!pixels)
        return {};
    Reading reading = {file, header, pixels, order};
    bool read = header.is_run_length() ? read_run_length(reading)
                                       : read_verbatim(reading);
    if (!read) {
        std::free(pixels);
        return {};
    }
    add_tag(pixels + width * height, header);
    return {pixels, header.xsize, header.ysize};
}

} // namespace zt_image

ZtPixel* longimagedata(const char* name)
{
    return zt_image::read_sgi(name, zt_image::ChannelOrder::Codec).pixels;
}
