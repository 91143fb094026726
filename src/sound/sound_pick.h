#ifndef ZT_SOUND_SOUND_PICK_H
#define ZT_SOUND_SOUND_PICK_H

/// \file
/// Picks samples at even distances, the one kind of resampling of all playback.

#include <cstdint>

#include "core/truncate.h"

namespace zt_sound {

/// Gives a number of samples, or of positions, times or through a factor: in
/// single precision, truncated.
inline std::int64_t scaled(std::int64_t count, float factor)
{
    return zt_core::truncate_to<std::int64_t>(
        double{static_cast<float>(count) * factor});
}
inline std::int64_t divided(std::int64_t count, float factor)
{
    return zt_core::truncate_to<std::int64_t>(
        double{static_cast<float>(count) / factor});
}

/// Makes `out_count` samples of `in_count`: sample i is number i * in_count /
/// out_count of `in`. Of no samples it makes zeros.
///
/// Requires: room and samples; both counts at least 0.
/// Context:  may run inside the beat.
void pick(std::int16_t* out, long out_count, const std::int16_t* in,
          long in_count);

/// Makes `out_count` samples of the stretch of `in` that begins at sample
/// `begin` and is `stretch` samples long, backward if that is below 0. What
/// lies outside the `in_count` samples is the nearest one inside, zeros if
/// there is none.
///
/// Requires: room and samples; both counts at least 0.
/// Context:  may run inside the beat.
void pick_stretch(std::int16_t* out, long out_count, const std::int16_t* in,
                  long in_count, long begin, long stretch);

} // namespace zt_sound

#endif
