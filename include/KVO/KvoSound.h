#ifndef KVO_KVOSOUND_H
#define KVO_KVOSOUND_H

/// \file
/// A sound in memory: interleaved signed 16-bit samples, mono or stereo, with
/// their rate; loaded from any sound file, saved as AIFF-C, measured, cut,
/// joined, filtered and converted in place.
///
/// Surprising: `LoPass` and the band limit of `Resample` amplify above a ninth
/// of the rate or so and let the result wrap around; nothing here clamps.
///
/// A sample frame is one sample a channel. Times become frame indices as
/// ticks * rate / 6000, truncated. A sound of no frames has no buffer.
///
/// In every operation: without a buffer nothing happens and nothing is said,
/// unless its comment says otherwise; a channel count other than 1 and 2 gives
/// one error "Audio with more than 2 channels is not supported.\n" and leaves
/// the sound unchanged; without memory, or for more than 2^31 - 1 frames, the
/// sound stays unchanged without a word. Operations that change the length
/// free the old buffer: pointers into it are dead. Samples that are computed
/// keep their low 16 bits. Nothing here may run inside the beat or a signal.

#include <KVO/KvoCommon.h>
#include <KVO/KvoTime.h>

#include <type_traits>

/// A sound in memory: its samples, their rate and what can be done to them.
class ZT_API KvoSound
{
public:
    /// The shapes of `Window`.
    enum WindowType : int {
        Rectangular = 0, ///< Samples as they are.
        Hamming = 1,     ///< 0.54 - 0.46 cos x
        Hanning = 2,     ///< (1 - cos x) * 0.5
        Triangular = 3,  ///< i / (N / 2) from both ends
        Blackman = 4     ///< 0.42 - 0.5 cos x + 0.08 cos x
    };

    /// The one format of samples, two's complement.
    static constexpr int twos_complement = 1;

    /// Makes a mono sound of no frames at 8000 frames a second.
    KvoSound();

    /// Loads a sound file of any kind that the system's audio file library
    /// reads; samples of other widths become 16 bits wide: narrower ones move
    /// up, wider ones lose their low bits, floating-point ones are multiplied
    /// by 32768 and clamped. What the file ought to hold and does not is zero.
    ///
    /// Reports: an error "Failed to open audio file [NAME].\n" for what cannot
    ///          be read, which leaves no frames; an error "Audio file [NAME]
    ///          contains unsupported channel count [COUNT].\n" for a count
    ///          other than 1 and 2, which leaves count, frames and rate of the
    ///          file but no buffer. More frames than memory leave no frames.
    KvoSound(const char* filename);

    /// Copies every field, the buffer included; without memory the copy has no
    /// frames.
    KvoSound(const KvoSound& other);

    /// Makes a mono sound of zeros at 44100 frames a second, or of noise,
    /// which is the same noise each time.
    ///
    /// By design: noise seeds the process's one sequence of random numbers
    ///            with 0 (KvoSound.NoiseSeedsTheProcessesRandomNumbers).
    KvoSound(KvoTime length, int noise);

    /// A fraction of a noise would mean none.
    template <class Real,
              std::enable_if_t<std::is_floating_point_v<Real>, int> = 0>
    KvoSound(KvoTime length, Real noise) = delete;

    /// Makes a leader, a mono sound at 8000 frames a second: silence as long
    /// as `body` between two pads, in each of which every tenth sample is
    /// 16000.
    KvoSound(KvoTime body, KvoTime pad);

    /// Takes `sample_buffer` as its own.
    ///
    /// Requires: a buffer from `new short[]` of `frame_count` frames, or null.
    /// Units:    `channel_count` 1, else 2 is meant; a `frame_count` below 0
    ///           counts as 0.
    /// Owner:    this sound, which frees it with `delete[]`.
    KvoSound(long sample_rate, int channel_count, long frame_count,
             short* sample_buffer);

    virtual ~KvoSound();

    /// Writes the sound as an AIFF-C file without compression; samples are 8,
    /// 16 or 24 bits wide there by `width`.
    ///
    /// A file that is there is replaced once the new one is complete; a device
    /// or a pipe is written as it is.
    ///
    /// Reports: without a buffer an error "Failed to save sound file [NAME], no
    ///          audio data.\n"; for what cannot be made an error "Failed to
    ///          open audio file [NAME].\n"; when not everything could be kept
    ///          an error "Failed to write audio file [NAME].\n". A file that
    ///          was there then stays as it was, and no part of the new one
    ///          stays.
    void Save(const char* filename) const;

    /// Sets `min` and `max` to the smallest and the largest sample of both
    /// channels, to 0 without a buffer. A count other than 1 is taken for 2,
    /// without a report.
    void ComputeMinMax();

    /// Gives the root mean square of all samples, each divided by 32768.
    ///
    /// Returns:   0 without a buffer and for a channel count other than 1 and
    ///            2, without a report.
    /// By design: the squares are summed up in single precision, one after the
    ///            other, which comes out low for long sounds
    ///            (KvoSound.VolumeSumsUpInSinglePrecision).
    float Volume() const;

    /// Prints rate, frame count and length in seconds on standard output, one
    /// line each; also without a buffer.
    virtual void Stats() const;

    /// Makes the sound mono by averaging and gives its samples divided by
    /// 32768.
    ///
    /// Units:   `which` is 4.
    /// Owner:   the caller, who frees the array with `delete[]`.
    /// Returns: null without a buffer or memory.
    /// Reports: an error "Only MONO channel data allowed.\n" for another
    ///          `which`, with a buffer or without; null is returned.
    float* ChannelData(int which);

    /// Makes a mono sound stereo: its samples left, those of `other` right, or
    /// its own again if `other` is null.
    ///
    /// Samples that `other` does not have are 0. A stereo sound stays as it
    /// is.
    ///
    /// Requires: `other` is mono; only its first `frames` samples are looked
    ///           at.
    void Stereo(const KvoSound* other);

    /// Makes a stereo sound mono: from the average of both channels, rounded
    /// toward zero, if `channel` is 0, the left one if it is 1, the right one
    /// if it is 2. A mono sound stays as it is.
    ///
    /// Reports:   an error "Must choose either channel 1 or 2.\n" for another
    ///            `channel`.
    /// By design: the sound then becomes mono all the same, of zeros
    ///            (KvoSound.MonoOfABadChannelReportsAndGoesOn).
    void Mono(int channel);

    /// Doubles the length of a mono sound by putting the average of each two
    /// neighbours, rounded toward zero, between them; the rate stays.
    ///
    /// By design: the last two samples are 0 (KvoSound.WhackLeavesZerosLast).
    void Whack();

    /// Copies `other` but for `min` and `max`, which stay; also without a
    /// buffer on either side.
    KvoSound& operator=(const KvoSound& other);

    /// Copies `count` frames to frame `offset` and on of `destination`; frames
    /// that would lie before its start are left out.
    ///
    /// Requires: room and samples for the frames; `source` may overlap
    ///           `destination`.
    /// Units:    `channel_count` 1, else 2 is meant.
    static void CopySamples(short* destination, const short* source, long count,
                            long offset, int channel_count);

    /// Makes rate and channel count those of `other`, rate first; both need a
    /// buffer.
    void Match(const KvoSound& other);

    /// Converts to another rate, keeping the length in seconds to within a
    /// frame: limits the band with `LoPass(new_rate / 2)`, then interpolates.
    ///
    /// Units:     `new_rate` 1 to 2^31 - 1 frames a second; others do nothing.
    /// By design: mono interpolates, stereo repeats
    ///            (KvoSound.ResampleOfStereoRepeatsFrames).
    void Resample(long new_rate);

    /// Plays `factor` times as fast: resamples to rate / factor and keeps the
    /// rate. 0 does nothing.
    void Speed(float factor);

    /// Takes `a` times the sample before, truncated, from every sample of a
    /// channel but the first two.
    void PreEmphasis(float a);

    /// Keeps the frames from `from` to `to`, both included, but none past the
    /// end; those before the start are zeros. Nothing left empties the sound.
    void Trim(KvoTime from, KvoTime to);

    /// Keeps the frames from `from` to `to`, both included; those outside the
    /// sound are zeros. Nothing left empties the sound.
    void Snip(KvoTime from, KvoTime to);

    /// Pastes `other` over this sound so that it begins at `at`; what neither
    /// reaches is zeros, and the sound grows as needed. Below zero `other`
    /// begins the sound and this one moves back.
    ///
    /// Null, or a sound without a buffer, does nothing. Inserting a sound into
    /// itself pastes a copy.
    ///
    /// By design: `other` itself is converted to the rate and the channels of
    ///            this sound (KvoSound.InsertConvertsItsSource).
    void Insert(KvoSound* other, KvoTime at);

    /// Reverses the sound.
    ///
    /// By design: the channels of a stereo sound change places
    ///            (KvoSound.ReverseExchangesTheChannels).
    void Reverse();

    /// Makes each sample but a channel's first trunc(w * sample) + trunc(g *
    /// sample before), with w = 2 pi * frequency / rate and g = exp(-w /
    /// rate), all in single precision.
    ///
    /// Units:     `frequency` in hertz.
    /// By design: the rate divides twice in g, so g is close to 1, and w is
    ///            above 1 from a sixth of the rate on, which amplifies and
    ///            wraps around (KvoSound.LoPassAmplifiesAndWraps).
    void LoPass(long frequency);

    /// Keeps what is above `frequency`: y = g * (y before - x before + x), in
    /// single precision, with the g of `LoPass`; the first sample of a channel
    /// stays.
    ///
    /// Units: `frequency` in hertz.
    void HiPass(long frequency);

    /// Keeps what is around `low`: a resonator of two poles, with e = exp(-2 pi
    /// * high / rate), b = -4 e / (e + 1) * cos(2 pi * low / rate) and y =
    /// (1 - e) * sqrt(1 - b * b / (4 e)) * x - b * y before - e * y before
    /// that.
    ///
    /// Units: `low`, the centre, and `high`, the width, in hertz.
    void BandPass(long low, long high);

    /// Keeps the frames around `center`, as `Trim` does, unless that is the
    /// whole sound, and multiplies them by a window, truncating. A type that
    /// does not exist does nothing.
    ///
    /// With N frames, x is 2 pi * i / (N - 1) in frame i.
    ///
    /// By design: the last frame is multiplied by 0, except that of a
    ///            triangular window (KvoSound.WindowsEndInAZero).
    void Window(KvoTime center, KvoTime width_of_window, WindowType type);

    /// Copies the frames from `from` to `to`, both included, as far as the
    /// sound has them.
    ///
    /// Owner:   the caller.
    /// Returns: null if there are none, without a buffer, memory or a channel
    ///          count of 1 or 2.
    KvoSound* Extract(KvoTime from, KvoTime to) const;

    /// Copies the frames from number `first_frame` to `last_frame` likewise.
    KvoSound* Extract(long first_frame, long last_frame) const;

    /// A fraction of a frame would be lost without a word.
    template <class First, class Last,
              std::enable_if_t<std::is_arithmetic_v<First> &&
                                   std::is_arithmetic_v<Last> &&
                                   (std::is_floating_point_v<First> ||
                                    std::is_floating_point_v<Last>),
                               int> = 0>
    KvoSound* Extract(First first_frame, Last last_frame) const = delete;

    int format;     ///< Always `twos_complement`.
    int width;      ///< Of a sample in its file: 1, 2 or 4 for 8, 16, 24 bits.
    int channels;   ///< 1, or 2 with samples left, right, left, right.
    long frames;    ///< Sample frames, at most 2^31 - 1.
    long rate;      ///< Sample frames a second.
    float min;      ///< The smallest sample, as `ComputeMinMax` found it.
    float max;      ///< The largest one.
    short* samples; ///< frames * channels, from `new short[]`; null for none.
};

/// Joins two sounds: `a`, then `b` as `Match` fits it to `a`.
///
/// Returns: the other one if one has no buffer; `a` alone if they cannot be
///          fitted.
ZT_API KvoSound operator+(const KvoSound& a, const KvoSound& b);

#endif
