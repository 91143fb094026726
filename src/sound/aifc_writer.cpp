#include "sound/aifc_writer.h"

#include "platform/byte_order.h"
#include "platform/new_file.h"
#include "platform/sample_lanes.h"
#include "sound/sample_buffer.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <memory>
#include <new>

// A FORM of four chunks: the version of the format, what the samples are, and
// the samples themselves. Sizes count what follows them, a chunk of an odd
// size is followed by a zero that no size counts but the FORM's.

namespace zt_sound {

namespace {

using zt_platform::store_big_16;
using zt_platform::store_big_32;

constexpr std::size_t header_bytes = 86;
constexpr std::uint32_t format_version = 0xA2805140;
constexpr const char* compression = "NONE\016not compressed";
constexpr std::size_t compression_bytes = 20; ///< With the zero that pads it.
constexpr std::uint64_t largest_form = 0xFFFFFFFF;

/// Bytes that are made at a time; a multiple of every sample's width.
constexpr std::size_t block_bytes = std::size_t{3} << 16;

/// Gives how many bytes a sample has in the file.
std::size_t sample_bytes(const KvoSound& sound)
{
    switch (sound.width) {
    case 1:
        return 1;
    case 4:
        return 3;
    default:
        return 2;
    }
}

/// Writes a whole number in the extended form of 80 bits: a sign, 15 bits of
/// exponent, and 64 bits whose first one stands for 2^exponent.
void store_extended(unsigned char* bytes, long value)
{
    constexpr int bias = 16383;
    constexpr int last_bit = 63;
    constexpr unsigned negative = 0x8000;
    std::memset(bytes, 0, 10);
    if (value == 0)
        return;
    const auto size = value < 0 ? 0 - static_cast<std::uint64_t>(value)
                                : static_cast<std::uint64_t>(value);
    const int shift = std::countl_zero(size);
    const std::uint64_t mantissa = size << shift;
    store_big_16(bytes, static_cast<std::uint16_t>(
                            static_cast<unsigned>(bias + last_bit - shift) |
                            (value < 0 ? negative : 0)));
    store_big_32(bytes + 2, static_cast<std::uint32_t>(mantissa >> 32));
    store_big_32(bytes + 6, static_cast<std::uint32_t>(mantissa));
}

/// The bytes before the samples, put one behind the other.
class Header
{
public:
    Header(const KvoSound& sound, std::uint32_t data_bytes) : at(bytes)
    {
        constexpr std::uint32_t rest_of_sound = 8;
        name("FORM");
        number_32(static_cast<std::uint32_t>(header_bytes) - 8 + data_bytes +
                  data_bytes % 2);
        name("AIFC");
        name("FVER");
        number_32(4);
        number_32(format_version);
        name("COMM");
        number_32(18 + compression_bytes);
        number_16(static_cast<std::uint16_t>(samples_in_frame(sound)));
        number_32(static_cast<std::uint32_t>(frames_of(sound)));
        number_16(static_cast<std::uint16_t>(8 * sample_bytes(sound)));
        store_extended(at, sound.rate);
        at += 10;
        std::memcpy(at, compression, compression_bytes);
        at += compression_bytes;
        name("SSND");
        number_32(rest_of_sound + data_bytes);
        number_32(0); // Offset of the first sample.
        number_32(0); // Samples are not aligned to blocks.
    }

    unsigned char bytes[header_bytes];

private:
    void name(const char* text)
    {
        std::memcpy(at, text, 4);
        at += 4;
    }

    void number_16(std::uint16_t value)
    {
        store_big_16(at, value);
        at += 2;
    }

    void number_32(std::uint32_t value)
    {
        store_big_32(at, value);
        at += 4;
    }

    unsigned char* at;
};

/// Writes samples as the bytes that they have in the file.
void store_samples(const short* samples, std::size_t count,
                   std::size_t bytes_a_sample, unsigned char* to)
{
    switch (bytes_a_sample) {
    case 1:
        for (std::size_t i = 0; i < count; ++i)
            to[i] = static_cast<unsigned char>(
                static_cast<std::uint16_t>(samples[i]) >> 8);
        break;
    case 3:
        for (std::size_t i = 0; i < count; ++i) {
            store_big_16(to + 3 * i, static_cast<std::uint16_t>(samples[i]));
            to[3 * i + 2] = 0;
        }
        break;
    default:
        zt_platform::SampleLanes::current().to_big_bytes(samples, to, count);
        break;
    }
}

} // namespace

Written write_aifc(const KvoSound& sound, const char* name)
{
    const std::size_t count = samples_of(sound);
    const std::size_t bytes_a_sample = sample_bytes(sound);
    const std::uint64_t data_bytes = std::uint64_t{count} * bytes_a_sample;
    const std::unique_ptr<unsigned char[]> block(
        new (std::nothrow) unsigned char[header_bytes + block_bytes + 1]);
    if (!block || data_bytes + header_bytes > largest_form)
        return Written::NotKept;
    zt_platform::NewFile file(name);
    if (!file.is_open())
        return Written::NotOpened;

    // The header goes out with the first samples, a pad with the last.
    const Header header(sound, static_cast<std::uint32_t>(data_bytes));
    std::memcpy(block.get(), header.bytes, header_bytes);
    std::size_t filled = header_bytes;
    std::size_t done = 0;
    do {
        const std::size_t here =
            std::min(count - done, block_bytes / bytes_a_sample);
        store_samples(sound.samples + done, here, bytes_a_sample,
                      block.get() + filled);
        filled += here * bytes_a_sample;
        done += here;
        if (done == count && data_bytes % 2 != 0)
            block[filled++] = 0;
        if (!file.append(block.get(), filled))
            return Written::NotKept;
        filled = 0;
    } while (done < count);
    return file.finish() ? Written::Whole : Written::NotKept;
}

} // namespace zt_sound
