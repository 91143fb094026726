#include "image/sgi_packets.h"

#include "platform/pixel_lanes.h"

#include <algorithm>
#include <cstring>

namespace zt_image {

namespace {

using zt_platform::PixelLanes;

constexpr unsigned literal_bit = zt_platform::PackedRow::literal_bit;
constexpr unsigned count_bits = zt_platform::PackedRow::count_bits;
constexpr std::size_t most_in_a_packet = 126;

/// Copies a literal in whole blocks, past its end, which is why both sides
/// have slack: nearly every packet is done with the first.
void copy_values(unsigned char* to, const unsigned char* from,
                 std::size_t count)
{
    std::size_t done = 0;
    do {
        std::memcpy(to + done, from + done, packet_slack);
        done += packet_slack;
    } while (done < count);
}

/// One channel of consecutive pixels, written value by value.
class ChannelCursor
{
public:
    ChannelCursor(ZtPixel* first, const ZtPixel* last, int channel_shift)
        : pixel(first), end(last), shift(channel_shift)
    {}

    bool at_end() const { return pixel == end; }

    void put(ZtPixel value)
    {
        *pixel = (*pixel & ~(ZtPixel{0xFF} << shift)) | value << shift;
        ++pixel;
    }

    std::size_t clamp(std::size_t count) const
    {
        return std::min(count, static_cast<std::size_t>(end - pixel));
    }

private:
    ZtPixel* pixel;
    const ZtPixel* end;
    int shift;
};

const unsigned char* expand_literal(const unsigned char* packets,
                                    const unsigned char* packets_end,
                                    std::size_t count, ChannelCursor& channel)
{
    const unsigned char* next =
        packets +
        std::min(count, static_cast<std::size_t>(packets_end - packets));
    const unsigned char* stop =
        packets + channel.clamp(static_cast<std::size_t>(next - packets));
    for (; packets != stop; ++packets)
        channel.put(*packets);
    return next;
}

const unsigned char* expand_repeat(const unsigned char* packets,
                                   const unsigned char* packets_end,
                                   std::size_t count, ChannelCursor& channel)
{
    if (packets == packets_end)
        return packets;
    for (count = channel.clamp(count); count; --count)
        channel.put(*packets);
    return packets + 1;
}

/// Gives how many values go out as they are: up to the first three that are
/// equal or, where there are none, up to the last two.
std::size_t count_literals(const PixelLanes& lanes, const unsigned char* values,
                           std::size_t count)
{
    std::size_t found = lanes.find_three_equal(values, count);
    return found < count ? found : std::max<std::size_t>(count, 2) - 2;
}

unsigned char* put_literals(const unsigned char* values, std::size_t count,
                            unsigned char* packets)
{
    while (count) {
        std::size_t todo = std::min(count, most_in_a_packet);
        *packets++ = static_cast<unsigned char>(literal_bit | todo);
        copy_values(packets, values, todo);
        packets += todo;
        values += todo;
        count -= todo;
    }
    return packets;
}

unsigned char* put_repeats(unsigned char value, std::size_t count,
                           unsigned char* packets)
{
    while (count) {
        std::size_t todo = std::min(count, most_in_a_packet);
        *packets++ = static_cast<unsigned char>(todo);
        *packets++ = value;
        count -= todo;
    }
    return packets;
}

} // namespace

void expand_row(const unsigned char* packets, const unsigned char* packets_end,
                ZtPixel* pixels, const ZtPixel* pixels_end, int shift)
{
    ChannelCursor channel(pixels, pixels_end, shift);
    while (packets < packets_end && !channel.at_end()) {
        unsigned packet = *packets++;
        std::size_t count = packet & count_bits;
        if (count == 0)
            return;
        if (packet & literal_bit)
            packets = expand_literal(packets, packets_end, count, channel);
        else
            packets = expand_repeat(packets, packets_end, count, channel);
    }
}

// A literal ends just before the first three equal values, or two values short
// of the row's end; what follows it goes out as repeats, also of one or two.
unsigned char* compress_row(const unsigned char* values, std::size_t width,
                            unsigned char* packets)
{
    const PixelLanes& lanes = PixelLanes::current();
    const unsigned char* end = values + width;
    while (values != end) {
        std::size_t literals = count_literals(
            lanes, values, static_cast<std::size_t>(end - values));
        packets = put_literals(values, literals, packets);
        values += literals;
        std::size_t repeats =
            lanes.count_equal(values, static_cast<std::size_t>(end - values));
        packets = put_repeats(*values, repeats, packets);
        values += repeats;
    }
    *packets++ = 0;
    return packets;
}

} // namespace zt_image
