#include "sound/aifc_header.h"

#include "platform/byte_order.h"

#include <bit>
#include <cstring>

// A FORM of four chunks: the version of the format, what the samples are, and
// the samples themselves. Sizes count what follows them, a chunk of an odd
// size is followed by a zero that no size counts but the FORM's.

namespace zt_sound {

namespace {

using zt_platform::store_big_16;
using zt_platform::store_big_32;

constexpr std::uint32_t format_version = 0xA2805140;
constexpr const char* compression = "NONE\016not compressed";
constexpr std::size_t compression_bytes = 20; ///< With the zero that pads it.

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
    Header(unsigned char* bytes, const AifcFormat& about) : at(bytes)
    {
        constexpr std::uint32_t rest_of_sound = 8;
        name("FORM");
        number_32(static_cast<std::uint32_t>(aifc_header_bytes) - 8 +
                  about.data_bytes + about.data_bytes % 2);
        name("AIFC");
        name("FVER");
        number_32(4);
        number_32(format_version);
        name("COMM");
        number_32(18 + compression_bytes);
        number_16(static_cast<std::uint16_t>(about.channels));
        number_32(static_cast<std::uint32_t>(
            about.data_bytes / about.bytes_a_sample /
            static_cast<std::uint32_t>(about.channels)));
        number_16(static_cast<std::uint16_t>(8 * about.bytes_a_sample));
        store_extended(at, about.rate);
        at += 10;
        std::memcpy(at, compression, compression_bytes);
        at += compression_bytes;
        name("SSND");
        number_32(rest_of_sound + about.data_bytes);
        number_32(0); // Offset of the first sample.
        number_32(0); // Samples are not aligned to blocks.
    }

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

} // namespace

void store_aifc_header(unsigned char* bytes, const AifcFormat& about)
{
    const Header header(bytes, about);
}

} // namespace zt_sound
