#include <KVO/KvoSound.h>

#include "sound/sample_buffer.h"
#include "sound/span.h"

#include <algorithm>
#include <new>

namespace {

void convert_channels(KvoSound& sound, int channels)
{
    if (channels == 1)
        sound.Mono(0);
    else
        sound.Stereo(nullptr);
}

/// Tells whether two sounds can be put into one.
bool are_alike(const KvoSound& a, const KvoSound& b)
{
    return a.samples && b.samples && a.channels == b.channels &&
           a.rate == b.rate;
}

void copy_into(short* buffer, const KvoSound& sound, std::int64_t at)
{
    KvoSound::CopySamples(buffer, sound.samples, std::max(sound.frames, 0L),
                          static_cast<long>(at), sound.channels);
}

/// Makes a longer sound of two that are alike, the second one on top.
void grow(KvoSound& sound, std::int64_t at, const KvoSound& other,
          std::int64_t other_at, std::int64_t frames)
{
    short* both =
        zt_sound::new_silence(frames, zt_sound::samples_in_frame(sound));
    if (!both)
        return;
    copy_into(both, sound, at);
    copy_into(both, other, other_at);
    zt_sound::replace_samples(sound, both, frames);
}

} // namespace

void KvoSound::Match(const KvoSound& other)
{
    if (!samples || !other.samples || !zt_sound::is_ready(*this) ||
        !zt_sound::is_ready(other))
        return;
    // Asked first: `other` may be this sound.
    const int wanted = other.channels;
    if (rate != other.rate)
        Resample(other.rate);
    convert_channels(*this, wanted);
}

KvoSound operator+(const KvoSound& a, const KvoSound& b)
{
    if (!a.samples || a.frames < 1)
        return b;
    KvoSound joined(a);
    KvoSound second(b);
    second.Match(joined);
    if (!are_alike(joined, second))
        return joined;
    const std::int64_t frames = std::int64_t{joined.frames} + second.frames;
    const std::size_t step = zt_sound::samples_in_frame(joined);
    short* both = zt_sound::new_samples(frames, step);
    if (!both)
        return joined;
    copy_into(both, joined, 0);
    copy_into(both, second, joined.frames);
    zt_sound::replace_samples(joined, both, frames);
    return joined;
}

void KvoSound::Trim(KvoTime from, KvoTime to)
{
    if (zt_sound::is_ready(*this))
        zt_sound::trim(*this, from, to);
}

void KvoSound::Snip(KvoTime from, KvoTime to)
{
    if (zt_sound::is_ready(*this))
        zt_sound::keep_span(*this, zt_sound::frame_at(from, rate),
                            zt_sound::frame_at(to, rate));
}

void KvoSound::Insert(KvoSound* other, KvoTime at)
{
    if (!other || !other->samples || !zt_sound::is_ready(*this))
        return;
    if (other == this) {
        KvoSound copy(*this);
        if (copy.samples)
            Insert(&copy, at);
        return;
    }
    if (!zt_sound::is_ready(*other))
        return;
    // Channels first, unlike `Match`: what becomes mono is then interpolated.
    convert_channels(*other, channels);
    if (other->rate != rate)
        other->Resample(rate);
    if (!are_alike(*this, *other))
        return;
    const std::int64_t start = zt_sound::frame_at(at, rate);
    const std::int64_t end = start + other->frames;
    if (start < 0)
        grow(*this, -start, *other, 0,
             std::max<std::int64_t>(frames - start, other->frames));
    else if (end > frames)
        grow(*this, 0, *other, start, end);
    else
        copy_into(samples, *other, start);
}

void KvoSound::Reverse()
{
    if (zt_sound::is_ready(*this))
        std::reverse(samples, samples + zt_sound::samples_of(*this));
}

KvoSound* KvoSound::Extract(KvoTime from, KvoTime to) const
{
    return Extract(static_cast<long>(zt_sound::frame_at(from, rate)),
                   static_cast<long>(zt_sound::frame_at(to, rate)));
}

KvoSound* KvoSound::Extract(long first_frame, long last_frame) const
{
    if (!zt_sound::is_ready(*this))
        return nullptr;
    const long first = std::max(first_frame, 0L);
    const long last = std::min(last_frame, frames - 1);
    if (last < first)
        return nullptr;
    short* span = zt_sound::copy_span(*this, first, last);
    if (!span)
        return nullptr;
    KvoSound* part =
        new (std::nothrow) KvoSound(rate, channels, last - first + 1, span);
    if (part)
        part->width = width;
    else
        delete[] span;
    return part;
}
