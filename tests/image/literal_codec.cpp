#include "image/literal_codec.h"

#include <algorithm>

namespace literal {

namespace {

/// A file as bytes; behind its end there are zeros.
class Source
{
public:
    explicit Source(const std::string& file) : bytes(file) {}

    std::uint32_t Byte(std::uint64_t at) const
    {
        return at < bytes.size() ? static_cast<unsigned char>(
                                       bytes[static_cast<std::size_t>(at)])
                                 : 0;
    }
    std::uint32_t Short(std::uint64_t at) const
    {
        return Byte(at) * 256 + Byte(at + 1);
    }
    std::uint32_t Long(std::uint64_t at) const
    {
        return Short(at) * 65536 + Short(at + 2);
    }

private:
    const std::string& bytes;
};

void SetByte(std::uint32_t& pixel, unsigned channel, std::uint32_t value)
{
    pixel = (pixel & ~(0xFFu << 8 * channel)) | value << 8 * channel;
}

/// Expands the row of `length` bytes at `start` into one channel of the pixels
/// from number `pixel` on, up to the last.
void ExpandRow(const Source& in, std::uint64_t start, std::uint64_t length,
               Pixels& pixels, std::size_t pixel, unsigned channel)
{
    std::uint64_t at = start;
    std::uint64_t end = start + length;
    while (at < end && pixel < pixels.size()) {
        std::uint32_t packet = in.Byte(at++);
        std::uint32_t count = packet & 0x7F;
        if (count == 0)
            return;
        for (std::uint32_t i = 0; i < count; ++i) {
            if (at >= end)
                return;
            if (pixel < pixels.size())
                SetByte(pixels[pixel++], channel, in.Byte(at));
            if (packet & 0x80)
                ++at;
        }
        if (!(packet & 0x80))
            ++at;
    }
}

bool InOrder(const Source& in, std::uint32_t height, std::uint32_t channels)
{
    std::uint32_t before = 0;
    for (std::uint32_t y = 0; y < height; ++y)
        for (std::uint32_t z = 0; z < channels; ++z) {
            std::uint32_t start = in.Long(512 + 4ull * (y + z * height));
            if (start < before)
                return false;
            before = start;
        }
    return true;
}

void ReadRunLength(const Source& in, std::uint32_t channels, Picture& picture)
{
    std::uint32_t height = static_cast<std::uint32_t>(picture.height);
    std::uint64_t lengths = 512 + 4ull * height * channels;
    bool in_order = InOrder(in, height, channels);
    std::uint32_t bound =
        static_cast<std::uint32_t>(static_cast<int>(1.05 * picture.width + 10));
    for (std::uint32_t i = 0; i < height * channels; ++i) {
        std::uint32_t y = in_order ? i / channels : i % height;
        std::uint32_t z = in_order ? i % channels : i / height;
        std::uint32_t start = in.Long(512 + 4ull * (y + z * height));
        std::uint32_t length = in.Long(lengths + 4ull * (y + z * height));
        if (!in_order && length > bound) {
            picture.ends_the_process = true;
            return;
        }
        ExpandRow(in, start, length, picture.pixels,
                  std::size_t{y} * static_cast<std::size_t>(picture.width), z);
    }
}

void ReadVerbatim(const Source& in, std::uint32_t channels, Picture& picture)
{
    std::uint64_t at = 512;
    for (std::uint32_t z = 0; z < channels; ++z)
        for (std::uint32_t& pixel : picture.pixels)
            SetByte(pixel, z, in.Byte(at++));
}

std::string Big(std::uint32_t value, int bytes)
{
    std::string text;
    for (int shift = 8 * bytes - 8; shift >= 0; shift -= 8)
        text += static_cast<char>(value >> shift);
    return text;
}

} // namespace

Picture ReadSgi(const std::string& file)
{
    Source in(file);
    Picture picture;
    std::uint32_t type = in.Short(2);
    std::uint32_t channels = in.Short(10);
    if (in.Short(0) != 474 || (type & 0xFF) != 1 || channels > 4)
        return picture;
    picture.width = static_cast<int>(in.Short(6));
    picture.height = static_cast<int>(in.Short(8));
    picture.pixels.resize(static_cast<std::size_t>(picture.width) *
                          static_cast<std::size_t>(picture.height));
    if ((type & 0xFF00) == 0x0100)
        ReadRunLength(in, channels, picture);
    else
        ReadVerbatim(in, channels, picture);
    for (std::uint32_t& pixel : picture.pixels) {
        if (channels == 3)
            pixel |= 0xFF000000;
        if (channels < 3)
            pixel = 0xFF000000 + (pixel & 0xFF) * 0x010101;
    }
    picture.read = !picture.ends_the_process;
    return picture;
}

std::string CompressRow(const std::string& values)
{
    std::string out;
    std::size_t count = values.size();
    std::size_t at = 0;
    while (at < count) {
        std::size_t start = at;
        at += 2;
        while (at < count && !(values[at - 2] == values[at - 1] &&
                               values[at - 1] == values[at]))
            ++at;
        at -= 2;
        while (start < at) {
            std::size_t todo = std::min<std::size_t>(at - start, 126);
            out += static_cast<char>(0x80 | todo);
            out += values.substr(start, todo);
            start += todo;
        }
        char value = values[at];
        ++at;
        while (at < count && values[at] == value)
            ++at;
        while (start < at) {
            std::size_t todo = std::min<std::size_t>(at - start, 126);
            out += static_cast<char>(todo);
            out += value;
            start += todo;
        }
    }
    return out + '\0';
}

std::string WriteSgi(const Pixels& pixels, int width, int height, int channels)
{
    std::string header = Big(474, 2) + Big(0x0101, 2) +
                         Big(channels < 2 ? 2 : 3, 2) +
                         Big(static_cast<std::uint32_t>(width), 2) +
                         Big(static_cast<std::uint32_t>(height), 2) +
                         Big(static_cast<std::uint32_t>(channels), 2) +
                         Big(0, 4) + Big(255, 4) + Big(0, 4) + "no name";
    header.resize(512, '\0');
    std::size_t rows = static_cast<std::size_t>(height * channels);
    std::vector<std::string> starts(rows);
    std::vector<std::string> lengths(rows);
    std::string body;
    for (int y = 0; y < height; ++y)
        for (int z = 0; z < channels; ++z) {
            std::string values;
            for (int x = 0; x < width; ++x) {
                std::uint32_t pixel =
                    pixels[static_cast<std::size_t>(y * width + x)];
                std::uint32_t luminance =
                    (79 * (pixel & 0xFF) + 156 * (pixel >> 8 & 0xFF) +
                     21 * (pixel >> 16 & 0xFF)) >>
                    8;
                values += static_cast<char>(channels == 1 ? luminance
                                                          : pixel >> 8 * z);
            }
            std::string row = CompressRow(values);
            std::size_t entry = static_cast<std::size_t>(y + z * height);
            starts[entry] = Big(
                static_cast<std::uint32_t>(512 + 8 * rows + body.size()), 4);
            lengths[entry] = Big(static_cast<std::uint32_t>(row.size()), 4);
            body += row;
        }
    std::string tables;
    for (const std::string& start : starts)
        tables += start;
    for (const std::string& length : lengths)
        tables += length;
    return header + tables + body;
}

namespace {

std::uint32_t VideoChannel(int sum)
{
    if (sum >= 0x1000000)
        sum = 0xFFFFFF;
    if (sum < 0x10000)
        sum = 0;
    return static_cast<std::uint32_t>(sum >> 16);
}

std::uint32_t VideoPixel(int luma, int u, int v)
{
    int y = luma * 76310;
    return VideoChannel(y + 104635 * v) +
           (VideoChannel(y - 25690 * u - 53294 * v) << 8) +
           (VideoChannel(y + 132278 * u) << 16);
}

} // namespace

Picture ReadYuv(const std::string& file)
{
    Source in(file);
    Picture picture;
    picture.read = true;
    picture.width = 720;
    picture.height = 486;
    for (std::uint64_t line = 486; line-- > 0;)
        for (std::uint64_t group = 0; group < 360; ++group) {
            std::uint64_t at = line * 1440 + group * 4;
            int u = static_cast<int>(in.Byte(at)) - 128;
            int v = static_cast<int>(in.Byte(at + 2)) - 128;
            for (std::uint64_t luma : {at + 1, at + 3})
                picture.pixels.push_back(VideoPixel(
                    std::max(static_cast<int>(in.Byte(luma)) - 16, 0), u, v));
        }
    return picture;
}

Picture ReadPix(const std::string& file)
{
    Source in(file);
    Picture picture;
    int width = static_cast<int>(in.Short(0));
    int height = static_cast<int>(in.Short(2));
    if (file.size() < 10 || width < 1 || width > 8192 || height < 1 ||
        height > 8192 || in.Short(8) != 24)
        return picture;
    Pixels pixels(static_cast<std::size_t>(width) *
                  static_cast<std::size_t>(height));
    int row = height - 1;
    int position = 0;
    for (std::uint64_t at = 10; at != file.size() && row >= 0; at += 4) {
        if (at + 4 > file.size())
            return picture;
        std::uint32_t word = 0xFF000000 + (in.Byte(at + 1) << 16) +
                             (in.Byte(at + 2) << 8) + in.Byte(at + 3);
        for (std::uint32_t i = 0; i < in.Byte(at); ++i, ++position) {
            std::size_t pixel = static_cast<std::size_t>(row) *
                                    static_cast<std::size_t>(width) +
                                static_cast<std::size_t>(position);
            if (pixel < pixels.size())
                pixels[pixel] = word;
        }
        if (position >= width) {
            --row;
            position = 0;
        }
    }
    picture.read = true;
    picture.width = width;
    picture.height = height;
    picture.pixels = pixels;
    return picture;
}

namespace {

int Nearest(int a, int b, int i)
{
    float at = static_cast<float>(a) *
               ((static_cast<float>(i) + 0.5f) / static_cast<float>(b));
    return static_cast<int>(
        std::min<long long>(static_cast<long long>(at), a - 1));
}

} // namespace

Pixels Zoom(const Pixels& source, int ax, int ay, int bx, int by)
{
    Pixels out;
    for (int y = 0; y < by; ++y)
        for (int x = 0; x < bx; ++x)
            out.push_back(source[static_cast<std::size_t>(Nearest(ay, by, y)) *
                                     static_cast<std::size_t>(ax) +
                                 static_cast<std::size_t>(Nearest(ax, bx, x))]);
    return out;
}

Pixels FantLine(const Pixels& source, int out_length)
{
    Pixels out;
    int in_length = static_cast<int>(source.size());
    double scale = static_cast<double>(out_length) / in_length;
    double inseg = 1.0;
    double outseg = 1.0 / scale;
    double sum[3] = {0.0, 0.0, 0.0};
    std::size_t at = 0;
    while (static_cast<int>(out.size()) < out_length) {
        std::uint32_t p0 = source[std::min(at, source.size() - 1)];
        std::uint32_t p1 = source[std::min(at + 1, source.size() - 1)];
        double value[3];
        for (int c = 0; c < 3; ++c)
            value[c] = inseg * (p0 >> 8 * c & 0xFF) +
                       (1.0 - inseg) * (p1 >> 8 * c & 0xFF);
        if (inseg < outseg) {
            for (int c = 0; c < 3; ++c)
                sum[c] += value[c] * inseg;
            outseg -= inseg;
            ++at;
            inseg = 1.0;
        } else {
            std::uint32_t pixel = 0;
            for (int c = 0; c < 3; ++c) {
                int result =
                    static_cast<int>((sum[c] + value[c] * outseg) * scale);
                pixel += static_cast<std::uint32_t>(result & 0xFF) << 8 * c;
                sum[c] = 0.0;
            }
            out.push_back(pixel);
            inseg -= outseg;
            outseg = 1.0 / scale;
        }
    }
    return out;
}

Pixels Fant(const Pixels& source, int width, int height, int new_width,
            int new_height)
{
    std::size_t columns = static_cast<std::size_t>(new_width);
    Pixels half_done;
    for (int y = 0; y < height; ++y) {
        auto row = source.begin() + static_cast<std::ptrdiff_t>(y) * width;
        Pixels line = FantLine(Pixels(row, row + width), new_width);
        half_done.insert(half_done.end(), line.begin(), line.end());
    }
    Pixels out(columns * static_cast<std::size_t>(new_height));
    for (std::size_t x = 0; x < columns; ++x) {
        Pixels column;
        for (std::size_t at = x; at < half_done.size(); at += columns)
            column.push_back(half_done[at]);
        Pixels line = FantLine(column, new_height);
        for (std::size_t y = 0; y < line.size(); ++y)
            out[y * columns + x] = line[y];
    }
    return out;
}

Pixels Reversed(const Pixels& pixels)
{
    Pixels out;
    for (std::uint32_t pixel : pixels)
        out.push_back(pixel >> 24 | (pixel >> 8 & 0xFF00) |
                      (pixel & 0xFF00) << 8 | pixel << 24);
    return out;
}

} // namespace literal
