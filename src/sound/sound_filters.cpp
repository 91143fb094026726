#include <KVO/KvoSound.h>

#include "core/truncate.h"
#include "sound/sample_buffer.h"
#include "sound/span.h"
#include "sound/weigh.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace {

/// Gives the low 16 bits of a number that is truncated.
short low_bits(double value)
{
    return static_cast<short>(zt_core::truncate_to<std::int32_t>(value));
}

/// Weighs every sample but those of the first frames with the one before it.
void weigh_from(KvoSound& sound, std::size_t first_frame,
                zt_sound::Weights weights)
{
    const std::size_t step = zt_sound::samples_in_frame(sound);
    const std::size_t first = first_frame * step;
    const std::size_t count = zt_sound::samples_of(sound);
    if (count > first)
        zt_sound::weigh(sound.samples + first, sound.samples + first - step,
                        sound.samples + first, count - first, weights);
}

/// Runs a filter over each channel by itself, from the first frame on.
template <class Filter>
void run_forwards(KvoSound& sound, const Filter& new_filter)
{
    const std::size_t step = zt_sound::samples_in_frame(sound);
    const std::size_t count = zt_sound::samples_of(sound);
    for (std::size_t channel = 0; channel < step; ++channel) {
        auto filter = new_filter;
        for (std::size_t i = channel; i < count; i += step)
            sound.samples[i] = low_bits(filter(sound.samples[i]));
    }
}

/// Entry `i` of a window of `count` entries that have a cosine.
float cosine_entry(KvoSound::WindowType type, std::size_t i, std::size_t count)
{
    if (i + 1 == count)
        return 0;
    const float x =
        (6.2831853f * static_cast<float>(i)) / static_cast<float>(count - 1);
    const float cosine = std::cos(x);
    switch (type) {
    case KvoSound::Hamming:
        return 0.54f - 0.46f * cosine;
    case KvoSound::Hanning:
        return (1 - cosine) * 0.5f;
    default:
        return 0.42f - 0.5f * cosine + 0.08f * cosine;
    }
}

/// Entry `i` of a triangle: it rises from both ends, and where both reach, the
/// higher one counts.
float triangle_entry(std::size_t i, std::size_t count)
{
    const std::size_t middle = count / 2;
    const std::size_t from_end = count - 1 - i;
    std::size_t height = std::min(i, from_end);
    if (std::max(i, from_end) <= middle)
        height = std::max(i, from_end);
    return static_cast<float>(height) / static_cast<float>(middle);
}

void multiply_by_window(KvoSound& sound, KvoSound::WindowType type)
{
    const std::size_t step = zt_sound::samples_in_frame(sound);
    const std::size_t count = zt_sound::frames_of(sound);
    for (std::size_t i = 0; i < count; ++i) {
        const float entry = type == KvoSound::Triangular
                                ? triangle_entry(i, count)
                                : cosine_entry(type, i, count);
        for (std::size_t k = step * i; k < step * (i + 1); ++k)
            sound.samples[k] =
                low_bits(static_cast<float>(sound.samples[k]) * entry);
    }
}

} // namespace

void KvoSound::PreEmphasis(float a)
{
    if (!zt_sound::is_ready(*this))
        return;
    constexpr float largest = 32768.0f;
    constexpr std::size_t first_frame = 2;
    // Less a product is plus its opposite, unless a product is cut off at the
    // ends of the range, which are not opposite.
    if (std::fabs(a) <= largest) {
        weigh_from(*this, first_frame, {1.0f, -a});
        return;
    }
    const std::size_t step = zt_sound::samples_in_frame(*this);
    for (std::size_t i = zt_sound::samples_of(*this); i-- > 2 * step;) {
        const auto product =
            static_cast<std::uint32_t>(zt_core::truncate_to<std::int32_t>(
                a * static_cast<float>(samples[i - step])));
        samples[i] = static_cast<short>(static_cast<std::uint32_t>(samples[i]) -
                                        product);
    }
}

void KvoSound::LoPass(long frequency)
{
    if (zt_sound::is_ready(*this))
        weigh_from(*this, 1, zt_sound::low_pass(frequency, rate));
}

void KvoSound::HiPass(long frequency)
{
    if (!zt_sound::is_ready(*this))
        return;
    const float g = zt_sound::low_pass(frequency, rate).before;
    bool is_first = true;
    float last_in = 0;
    float last_out = 0;
    run_forwards(*this, [=](short sample) mutable {
        const float in = static_cast<float>(sample);
        last_out = is_first ? in : g * (last_out - last_in + in);
        last_in = in;
        is_first = false;
        return last_out;
    });
}

void KvoSound::BandPass(long low, long high)
{
    if (!zt_sound::is_ready(*this))
        return;
    const double circle = 2.0 * std::numbers::pi;
    const double cycles = static_cast<double>(rate);
    const double e = std::exp(-circle * static_cast<double>(high) / cycles);
    const double c = std::cos(circle * static_cast<double>(low) / cycles);
    const double feedback = -4.0 * e / (e + 1.0) * c;
    // The square of the feedback by 4e, written so that e may be 0. Rounding
    // must not take it past 1.
    const double share =
        std::min(4.0 * e / ((e + 1.0) * (e + 1.0)) * c * c, 1.0);
    const double gain = (1.0 - e) * std::sqrt(1.0 - share);
    double last = 0;
    double before_last = 0;
    run_forwards(*this, [=](short sample) mutable {
        const double out = gain * static_cast<double>(sample) -
                           feedback * last - e * before_last;
        before_last = last;
        last = out;
        return out;
    });
}

void KvoSound::Window(KvoTime center, KvoTime width_of_window, WindowType type)
{
    if (!zt_sound::is_ready(*this) || type < Rectangular || type > Blackman)
        return;
    const KvoTime length = zt_sound::length_of(frames, rate);
    const bool is_whole = width_of_window == length && center == length / 2;
    const KvoTime half = width_of_window / 2;
    const bool is_cut =
        is_whole || zt_sound::trim(*this, center - half, center + half);
    if (is_cut && samples && type != Rectangular)
        multiply_by_window(*this, type);
}
