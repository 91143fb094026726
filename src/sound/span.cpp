#include "sound/span.h"

#include "sound/sample_buffer.h"

#include <algorithm>
#include <cstring>

namespace zt_sound {

short* copy_span(const KvoSound& sound, std::int64_t first, std::int64_t last)
{
    const std::size_t step = samples_in_frame(sound);
    const std::int64_t from = std::max<std::int64_t>(first, 0);
    const std::int64_t to = std::min<std::int64_t>(last, sound.frames - 1);
    short* span = from == first && to == last
                      ? new_samples(last - first + 1, step)
                      : new_silence(last - first + 1, step);
    if (span && from <= to)
        std::memcpy(span + static_cast<std::size_t>(from - first) * step,
                    sound.samples + static_cast<std::size_t>(from) * step,
                    static_cast<std::size_t>(to - from + 1) * step *
                        sizeof(short));
    return span;
}

bool keep_span(KvoSound& sound, std::int64_t first, std::int64_t last)
{
    if (last < first) {
        replace_samples(sound, nullptr, 0);
        return true;
    }
    short* span = copy_span(sound, first, last);
    if (span)
        replace_samples(sound, span, last - first + 1);
    return span != nullptr;
}

bool trim(KvoSound& sound, KvoTime from, KvoTime to)
{
    return keep_span(
        sound, frame_at(from, sound.rate),
        std::min<std::int64_t>(frame_at(to, sound.rate), sound.frames - 1));
}

} // namespace zt_sound
