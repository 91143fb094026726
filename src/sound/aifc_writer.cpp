#include "sound/aifc_writer.h"

#include "platform/byte_order.h"
#include "platform/new_file.h"
#include "platform/sample_lanes.h"
#include "sound/aifc_header.h"
#include "sound/sample_buffer.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <new>

namespace zt_sound {

namespace {

using zt_platform::store_big_16;

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
        new (std::nothrow) unsigned char[aifc_header_bytes + block_bytes + 1]);
    if (!block || data_bytes > most_aifc_bytes)
        return Written::NotKept;
    zt_platform::NewFile file(name);
    if (!file.is_open())
        return Written::NotOpened;

    // The header goes out with the first samples, a pad with the last.
    store_aifc_header(block.get(),
                      {static_cast<int>(samples_in_frame(sound)), sound.rate,
                       bytes_a_sample, static_cast<std::uint32_t>(data_bytes)});
    std::size_t filled = aifc_header_bytes;
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
