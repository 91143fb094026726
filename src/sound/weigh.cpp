#include "sound/weigh.h"

#include "core/truncate.h"
#include "platform/sample_lanes.h"

#include <cmath>
#include <cstdint>
#include <numbers>

using zt_platform::SampleLanes;

namespace zt_sound {

namespace {

bool fits_lanes(float weight)
{
    return std::fabs(weight) <= SampleLanes::largest_factor;
}

std::uint32_t product(short sample, float weight)
{
    return static_cast<std::uint32_t>(zt_core::truncate_to<std::int32_t>(
        static_cast<float>(sample) * weight));
}

} // namespace

Weights low_pass(long frequency, long rate)
{
    const double cycles = static_cast<double>(rate);
    const float now = static_cast<float>(
        2.0 * std::numbers::pi * static_cast<double>(frequency) / cycles);
    return {now,
            static_cast<float>(std::exp(-static_cast<double>(now) / cycles))};
}

void weigh(const short* now, const short* before, short* to, std::size_t count,
           Weights weights)
{
    if (fits_lanes(weights.now) && fits_lanes(weights.before)) {
        SampleLanes::current().weigh(now, before, to, count, weights.now,
                                     weights.before);
        return;
    }
    for (std::size_t i = count; i-- > 0;)
        to[i] = static_cast<short>(product(now[i], weights.now) +
                                   product(before[i], weights.before));
}

} // namespace zt_sound
