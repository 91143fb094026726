#include <KVO/KvoSound.h>

#include <ZT/util.h>

#include "core/truncate.h"
#include "platform/sample_lanes.h"
#include "sound/sample_buffer.h"
#include "sound/weigh.h"

#include <algorithm>
#include <cstring>

// The two rates meet on a grid that both divide: a frame in lies `up` places
// after the one before, a frame out `down` places. The band is limited on the
// way: some thousand frames at a time are filtered into a buffer that stays in
// the cache, and the frames out are made from there.

using zt_platform::SampleLanes;

namespace {

/// Filtered samples at hand.
constexpr std::int64_t room = 16384;

/// What stays the same during one conversion.
struct Conversion
{
    const KvoSound& sound;
    std::size_t samples_a_frame;
    std::int64_t up;
    std::int64_t down;
    zt_sound::Weights weights;
};

/// Filters `count` frames from frame `first` on; the first of all stays.
void filter_frames(const Conversion& work, std::int64_t first,
                   std::int64_t count, short* to)
{
    const std::size_t step = work.samples_a_frame;
    const short* from =
        work.sound.samples + static_cast<std::size_t>(first) * step;
    std::size_t samples = static_cast<std::size_t>(count) * step;
    if (first == 0) {
        std::memcpy(to, from, step * sizeof(short));
        from += step;
        to += step;
        samples -= step;
    }
    zt_sound::weigh(from, from - step, to, samples, work.weights);
}

/// Makes the frames out from number `first` on, as far as the frames in that
/// they need fit the buffer.
///
/// Returns: how many were made.
std::int64_t convert_some(const Conversion& work, std::int64_t first,
                          std::int64_t count, short* to)
{
    // One sample more than fits: the last one of all is held.
    short filtered[room + 1];
    const std::int64_t frames_at_hand =
        room / static_cast<std::int64_t>(work.samples_a_frame);
    const std::int64_t place = first * work.down;
    const std::int64_t start = place / work.up;
    const SampleLanes::Steps steps = {place % work.up, work.down, work.up};
    const std::int64_t most =
        ((frames_at_hand - 1) * work.up - 1 - steps.rest) / work.down + 1;
    const std::int64_t made = std::min(count - first, most);
    const std::int64_t last =
        start + (steps.rest + (made - 1) * work.down) / work.up;
    const std::int64_t here =
        std::min<std::int64_t>(last + 2, work.sound.frames) - start;
    filter_frames(work, start, here, filtered);

    const SampleLanes& lanes = SampleLanes::current();
    const auto outputs = static_cast<std::size_t>(made);
    to += static_cast<std::size_t>(first) * work.samples_a_frame;
    if (work.samples_a_frame == 1) {
        filtered[here] = filtered[here - 1];
        lanes.interpolate(filtered, to, outputs, steps);
    } else {
        lanes.repeat(filtered, to, outputs, steps);
    }
    return made;
}

bool is_rate(long rate)
{
    return rate >= 1 && rate <= zt_sound::highest_rate;
}

/// Converts a sound that is ready.
void convert(KvoSound& sound, long new_rate)
{
    if (!is_rate(new_rate) || !is_rate(sound.rate))
        return;
    const long grid = ZtLCM(sound.rate, new_rate);
    const Conversion work = {sound, zt_sound::samples_in_frame(sound),
                             grid / sound.rate, grid / new_rate,
                             zt_sound::low_pass(new_rate / 2, sound.rate)};
    const std::int64_t frames =
        static_cast<std::int64_t>(zt_sound::frames_of(sound));
    const std::int64_t count = frames * work.up / work.down;
    short* converted = zt_sound::new_samples(count, work.samples_a_frame);
    if (!converted && count > 0)
        return;
    for (std::int64_t done = 0; done < count;)
        done += convert_some(work, done, count, converted);
    zt_sound::replace_samples(sound, converted, count);
    sound.rate = new_rate;
}

} // namespace

void KvoSound::Resample(long new_rate)
{
    if (zt_sound::is_ready(*this))
        convert(*this, new_rate);
}

void KvoSound::Speed(float factor)
{
    if (!zt_sound::is_ready(*this) || factor == 0)
        return;
    const long kept = rate;
    convert(*this,
            zt_core::truncate_to<long>(static_cast<float>(rate) / factor));
    rate = kept;
}
