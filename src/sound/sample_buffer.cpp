#include "sound/sample_buffer.h"

#include <ZT/error.h>

#include "platform/large_memory.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <new>

namespace zt_sound {

bool is_ready(const KvoSound& sound)
{
    if (!sound.samples)
        return false;
    if (sound.channels == 1 || sound.channels == 2)
        return true;
    report_channel_count();
    return false;
}

void report_channel_count()
{
    ZtError("Audio with more than 2 channels is not supported.\n");
}

std::int64_t frame_at(KvoTime time, long rate)
{
    const std::int64_t sane =
        std::clamp<std::int64_t>(rate, -highest_rate, highest_rate);
    return time.Ticks() * sane / KvoTime::ticks_per_second;
}

KvoTime length_of(std::int64_t frames, long rate)
{
    if (rate < 1 || frames < 1)
        return KvoTime::ZERO;
    const std::int64_t ticks =
        std::min(frames, most_frames) * KvoTime::ticks_per_second / rate;
    return KvoTime::FromTicks(static_cast<std::int32_t>(std::min<std::int64_t>(
        ticks, std::numeric_limits<std::int32_t>::max())));
}

short* new_samples(std::int64_t frames, std::size_t samples_a_frame)
{
    if (frames < 1 || frames > most_frames)
        return nullptr;
    const std::size_t count =
        static_cast<std::size_t>(frames) * samples_a_frame;
    short* samples = new (std::nothrow) short[count];
    zt_platform::prefer_large_pages(samples, count * sizeof(short));
    return samples;
}

short* new_silence(std::int64_t frames, std::size_t samples_a_frame)
{
    short* samples = new_samples(frames, samples_a_frame);
    if (samples)
        std::memset(samples, 0,
                    static_cast<std::size_t>(frames) * samples_a_frame *
                        sizeof(short));
    return samples;
}

void replace_samples(KvoSound& sound, short* samples, std::int64_t frames)
{
    delete[] sound.samples;
    sound.samples = samples;
    sound.frames = static_cast<long>(frames);
}

} // namespace zt_sound
