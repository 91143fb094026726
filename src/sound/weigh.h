#ifndef ZT_SOUND_WEIGH_H
#define ZT_SOUND_WEIGH_H

/// \file
/// The sum of a sample and the one before it, each with a weight: what the low
/// pass does to every sample.

#include <cstddef>

namespace zt_sound {

/// The weights of a sample and of the one before it in the same channel.
struct Weights
{
    float now;
    float before;
};

/// Gives the weights of the low pass.
Weights low_pass(long frequency, long rate);

/// Makes to[i] the low 16 bits of trunc(now[i] * weights.now) +
/// trunc(before[i] * weights.before), from the last one down to the first, so
/// that `to` may be `now`. Products beyond 32 bits are their nearest end.
void weigh(const short* now, const short* before, short* to, std::size_t count,
           Weights weights);

} // namespace zt_sound

#endif
