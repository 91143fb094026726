#ifndef ZT_SOUND_SAMPLE_BUFFER_H
#define ZT_SOUND_SAMPLE_BUFFER_H

/// \file
/// What every operation on a sound starts and ends with: a look at the sound,
/// places in frames, and buffers that come and go.

#include <KVO/KvoSound.h>

#include <cstddef>
#include <cstdint>

namespace zt_sound {

constexpr std::int64_t most_frames = 2147483647;
constexpr std::int64_t highest_rate = 2147483647;

/// Gives how many samples a frame has; any count but one counts as two.
inline std::size_t samples_in_frame(const KvoSound& sound)
{
    return sound.channels == 1 ? 1 : 2;
}

/// Gives the number of frames, 0 for less.
inline std::size_t frames_of(const KvoSound& sound)
{
    return sound.frames > 0 ? static_cast<std::size_t>(sound.frames) : 0;
}

/// Gives the number of all samples.
inline std::size_t samples_of(const KvoSound& sound)
{
    return frames_of(sound) * samples_in_frame(sound);
}

/// Tells whether there is something to work on.
///
/// Reports: an error for a buffer of other than one or two channels.
bool is_ready(const KvoSound& sound);

void report_channel_count();

/// Gives the frame at a time, at or before zero rounded toward it.
std::int64_t frame_at(KvoTime time, long rate);

/// Gives how long a number of frames lasts; 0 for a rate below 1.
KvoTime length_of(std::int64_t frames, long rate);

/// Makes room for some frames, not cleared.
///
/// Owner:   the caller, who frees it with `delete[]`.
/// Returns: null for less than one frame, for too many, and without memory.
short* new_samples(std::int64_t frames, std::size_t samples_a_frame);

/// Makes the same, cleared.
short* new_silence(std::int64_t frames, std::size_t samples_a_frame);

/// Puts a buffer in the place of the one that a sound has; one of no frames
/// empties it.
///
/// Owner: the sound owns the new one, the old one is freed.
void replace_samples(KvoSound& sound, short* samples, std::int64_t frames);

} // namespace zt_sound

#endif
