#include <KVO/KvoSound.h>

#include <ZT/error.h>

#include "core/number_text.h"
#include "core/write_text.h"
#include "platform/audio_file.h"
#include "platform/random.h"
#include "platform/sample_lanes.h"
#include "sound/aifc_writer.h"
#include "sound/sample_buffer.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <new>

using zt_platform::SampleLanes;

namespace {

constexpr long first_rate = 8000;
constexpr long silence_rate = 44100;
constexpr long leader_rate = 8000;
constexpr int sixteen_bits = 2;

/// No compressed sound has more frames in a byte of its file: the densest code
/// of them has 65535 frames in 14 bytes. A file that claims more lies.
constexpr std::uint64_t most_frames_in_byte = 8192;

/// A sound file that is open, closed at the end of its scope.
class OpenSound
{
public:
    explicit OpenSound(const char* name)
        : about(), file(zt_platform::AudioFiles::current().open(name, about))
    {}

    ~OpenSound()
    {
        if (file)
            zt_platform::AudioFiles::current().close(file);
    }

    OpenSound(const OpenSound&) = delete;
    OpenSound& operator=(const OpenSound&) = delete;

    bool is_open() const { return file != nullptr; }

    /// Tells whether the claimed frames can be held, and be in the file.
    bool has_sane_length() const
    {
        return about.frames <=
                   static_cast<std::uint64_t>(zt_sound::most_frames) &&
               about.frames / most_frames_in_byte <= about.bytes;
    }

    /// Reads all the frames; what does not come is zero.
    ///
    /// Owner:   the caller, who frees it with `delete[]`.
    /// Returns: null for no frames, and without memory.
    short* read() const
    {
        const auto channels = static_cast<std::size_t>(about.channels);
        short* samples = zt_sound::new_samples(
            static_cast<std::int64_t>(about.frames), channels);
        if (!samples)
            return nullptr;
        const std::uint64_t came =
            std::min(zt_platform::AudioFiles::current().read(file, samples,
                                                             about.frames),
                     about.frames);
        std::memset(samples + came * channels, 0,
                    (about.frames - came) * channels * sizeof(short));
        return samples;
    }

    zt_platform::AudioFormat about;

private:
    void* file;
};

const char* text_of(const char* name)
{
    return name ? name : "";
}

/// Sets every tenth sample of `count` from `first` on, as far as the sound has
/// them.
void add_clicks(KvoSound& sound, std::int64_t first, std::int64_t count)
{
    constexpr std::int64_t distance = 10;
    constexpr short click = 16000;
    for (std::int64_t i = 0; i < count; i += distance)
        if (first + i >= 0 && first + i < sound.frames)
            sound.samples[first + i] = click;
}

/// Copies the samples of a sound.
///
/// Owner:   the caller, who frees it with `delete[]`.
/// Returns: null for none, and without memory.
short* copy_samples(const KvoSound& sound)
{
    if (!sound.samples)
        return nullptr;
    short* samples =
        zt_sound::new_samples(sound.frames, zt_sound::samples_in_frame(sound));
    if (samples)
        std::memcpy(samples, sound.samples,
                    zt_sound::samples_of(sound) * sizeof(short));
    return samples;
}

void pick_channel(const KvoSound& sound, std::size_t channel, short* to)
{
    const std::size_t frames = zt_sound::frames_of(sound);
    for (std::size_t i = 0; i < frames; ++i)
        to[i] = sound.samples[2 * i + channel];
}

} // namespace

KvoSound::KvoSound()
    : format(twos_complement), width(sixteen_bits), channels(1), frames(0),
      rate(first_rate), min(0), max(0), samples(nullptr)
{}

KvoSound::KvoSound(const char* filename) : KvoSound()
{
    const OpenSound file(filename);
    if (!file.is_open()) {
        ZtError("Failed to open audio file [%s].\n", text_of(filename));
        return;
    }
    frames = static_cast<long>(std::min(
        file.about.frames, static_cast<std::uint64_t>(zt_sound::most_frames)));
    channels = file.about.channels;
    rate = file.about.rate;
    width = file.about.width;
    if (channels != 1 && channels != 2) {
        ZtError("Audio file [%s] contains unsupported channel count [%d].\n",
                text_of(filename), channels);
        return;
    }
    if (file.has_sane_length())
        samples = file.read();
    if (!samples)
        frames = 0;
}

KvoSound::KvoSound(const KvoSound& other)
    : format(other.format), width(other.width), channels(other.channels),
      frames(other.frames), rate(other.rate), min(other.min), max(other.max),
      samples(copy_samples(other))
{
    if (other.samples && !samples)
        frames = 0;
}

KvoSound::KvoSound(KvoTime length, int noise) : KvoSound()
{
    rate = silence_rate;
    const std::int64_t count = zt_sound::frame_at(length, rate);
    samples = zt_sound::new_silence(count, 1);
    if (!samples)
        return;
    frames = static_cast<long>(count);
    if (!noise)
        return;
    zt_platform::Random& random = zt_platform::Random::current();
    random.seed(0);
    for (std::int64_t i = 0; i < count; ++i)
        samples[i] = static_cast<short>(random.draw() >> 9);
}

KvoSound::KvoSound(KvoTime body, KvoTime pad) : KvoSound()
{
    rate = leader_rate;
    const std::int64_t ticks = body.Ticks() + std::int64_t{2} * pad.Ticks();
    const std::int64_t count = ticks * rate / KvoTime::ticks_per_second;
    samples = zt_sound::new_silence(count, 1);
    if (!samples)
        return;
    frames = static_cast<long>(count);
    const std::int64_t padded = zt_sound::frame_at(pad, rate);
    add_clicks(*this, 0, padded);
    add_clicks(*this, count - padded, padded);
}

KvoSound::KvoSound(long sample_rate, int channel_count, long frame_count,
                   short* sample_buffer)
    : KvoSound()
{
    rate = sample_rate;
    channels = channel_count == 1 ? 1 : 2;
    if (frame_count > zt_sound::most_frames) {
        delete[] sample_buffer;
        return;
    }
    frames = std::max(frame_count, 0L);
    samples = sample_buffer;
}

KvoSound::~KvoSound()
{
    delete[] samples;
}

void KvoSound::Save(const char* filename) const
{
    const char* name = text_of(filename);
    if (!samples) {
        ZtError("Failed to save sound file [%s], no audio data.\n", name);
        return;
    }
    switch (zt_sound::write_aifc(*this, filename)) {
    case zt_sound::Written::NotOpened:
        ZtError("Failed to open audio file [%s].\n", name);
        break;
    case zt_sound::Written::NotKept:
        ZtError("Failed to write audio file [%s].\n", name);
        break;
    case zt_sound::Written::Whole:
        break;
    }
}

void KvoSound::ComputeMinMax()
{
    const std::size_t count = zt_sound::samples_of(*this);
    min = 0;
    max = 0;
    if (!samples || count == 0)
        return;
    const SampleLanes::Range range =
        SampleLanes::current().range(samples, count);
    min = static_cast<float>(range.least);
    max = static_cast<float>(range.largest);
}

float KvoSound::Volume() const
{
    const std::size_t count = zt_sound::samples_of(*this);
    if (!samples || (channels != 1 && channels != 2) || count == 0)
        return 0;
    const float sum = SampleLanes::current().sum_of_squares(samples, count, 0);
    return std::sqrt(sum / static_cast<float>(count));
}

void KvoSound::Stats() const
{
    const float seconds =
        zt_sound::length_of(frames, rate).Time(KvoTime::seconds);
    char lines[160];
    std::snprintf(lines, sizeof lines,
                  "Sample frequency : %ld hz\n"
                  "Frame count      : %ld\n"
                  "Length           : %s seconds\n",
                  rate, frames, zt_core::float_to_text(seconds).c_str());
    zt_core::write_text(std::cout, lines);
}

float* KvoSound::ChannelData(int which)
{
    constexpr int mono_data = 4;
    if (which != mono_data) {
        ZtError("Only MONO channel data allowed.\n");
        return nullptr;
    }
    Mono(0);
    if (!samples || channels != 1)
        return nullptr;
    const std::size_t count = zt_sound::frames_of(*this);
    float* data = new (std::nothrow) float[count];
    for (std::size_t i = 0; data && i < count; ++i)
        data[i] = static_cast<float>(samples[i]) / 32768.0f;
    return data;
}

void KvoSound::Stereo(const KvoSound* other)
{
    if (!zt_sound::is_ready(*this) || channels == 2)
        return;
    short* both = zt_sound::new_samples(frames, 2);
    if (!both && frames > 0)
        return;
    const std::size_t count = zt_sound::frames_of(*this);
    const short* right = samples;
    std::size_t there = count;
    if (other) {
        right = other->samples;
        there = right ? std::min(count, zt_sound::samples_of(*other)) : 0;
    }
    for (std::size_t i = 0; i < count; ++i) {
        both[2 * i] = samples[i];
        both[2 * i + 1] = i < there ? right[i] : short{0};
    }
    zt_sound::replace_samples(*this, both, frames);
    channels = 2;
}

void KvoSound::Mono(int channel)
{
    if (!zt_sound::is_ready(*this) || channels == 1)
        return;
    const bool is_known = channel >= 0 && channel <= 2;
    if (!is_known)
        ZtError("Must choose either channel 1 or 2.\n");
    short* one = is_known ? zt_sound::new_samples(frames, 1)
                          : zt_sound::new_silence(frames, 1);
    if (!one && frames > 0)
        return;
    if (channel == 0)
        SampleLanes::current().average(samples, one,
                                       zt_sound::frames_of(*this));
    else if (is_known)
        pick_channel(*this, static_cast<std::size_t>(channel - 1), one);
    zt_sound::replace_samples(*this, one, frames);
    channels = 1;
}

void KvoSound::Whack()
{
    if (!zt_sound::is_ready(*this) || channels != 1)
        return;
    const std::int64_t doubled = std::int64_t{2} * frames;
    short* longer = zt_sound::new_samples(doubled, 1);
    if (!longer)
        return;
    const std::size_t last = zt_sound::frames_of(*this) - 1;
    for (std::size_t i = 0; i < last; ++i) {
        longer[2 * i] = samples[i];
        longer[2 * i + 1] =
            static_cast<short>((samples[i] + samples[i + 1]) / 2);
    }
    longer[2 * last] = 0;
    longer[2 * last + 1] = 0;
    zt_sound::replace_samples(*this, longer, doubled);
}

KvoSound& KvoSound::operator=(const KvoSound& other)
{
    if (this == &other)
        return *this;
    short* copy = copy_samples(other);
    if (other.samples && other.frames > 0 && !copy)
        return *this;
    format = other.format;
    width = other.width;
    channels = other.channels;
    rate = other.rate;
    zt_sound::replace_samples(*this, copy, other.frames);
    return *this;
}

void KvoSound::CopySamples(short* destination, const short* source, long count,
                           long offset, int channel_count)
{
    if (!destination || !source || count <= 0 || offset <= -count)
        return;
    const long left_out = offset < 0 ? -offset : 0;
    const std::ptrdiff_t samples_a_frame = channel_count == 1 ? 1 : 2;
    std::memmove(
        destination + (offset + left_out) * samples_a_frame,
        source + left_out * samples_a_frame,
        static_cast<std::size_t>((count - left_out) * samples_a_frame) *
            sizeof(short));
}
