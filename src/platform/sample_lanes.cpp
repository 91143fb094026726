#include "platform/sample_lanes.h"

#include "platform/byte_order.h"
#include "platform/x86/sample_lanes_avx2.h"
#include "platform/x86/sample_lanes_avx512.h"

#include <algorithm>
#include <iterator>

namespace zt_platform {

namespace {

struct PlainLanes final : SampleLanes
{};

constinit const PlainLanes plain_lanes;
constinit const SampleLanes* in_use = nullptr; ///< Null before the first use.

/// A place that advances by whole samples and a remainder, so that no output
/// costs a division.
class Place
{
public:
    explicit Place(const SampleLanes::Steps& steps)
        : whole(static_cast<std::size_t>(steps.step / steps.grid)),
          more(steps.step % steps.grid), grid(steps.grid), sample(0),
          rest(steps.rest)
    {}

    std::size_t index() const { return sample; }
    std::int64_t remainder() const { return rest; }

    void advance()
    {
        sample += whole;
        rest += more;
        if (rest >= grid) {
            rest -= grid;
            ++sample;
        }
    }

private:
    std::size_t whole;
    std::int64_t more;
    std::int64_t grid;
    std::size_t sample;
    std::int64_t rest;
};

} // namespace

const char* SampleLanes::name() const
{
    return "plain";
}

void SampleLanes::weigh(const short* now, const short* before, short* to,
                        std::size_t count, float now_factor,
                        float before_factor) const
{
    for (std::size_t i = count; i-- > 0;) {
        // Unsigned, since two products of 2^30 are too much for the other.
        const auto from_now = static_cast<std::uint32_t>(
            static_cast<std::int32_t>(static_cast<float>(now[i]) * now_factor));
        const auto from_before =
            static_cast<std::uint32_t>(static_cast<std::int32_t>(
                static_cast<float>(before[i]) * before_factor));
        to[i] = static_cast<short>(from_now + from_before);
    }
}

void SampleLanes::average(const short* pairs, short* averages,
                          std::size_t count) const
{
    for (std::size_t i = 0; i < count; ++i)
        averages[i] = static_cast<short>((pairs[2 * i] + pairs[2 * i + 1]) / 2);
}

SampleLanes::Range SampleLanes::range(const short* samples,
                                      std::size_t count) const
{
    Range found = {samples[0], samples[0]};
    for (std::size_t i = 1; i < count; ++i) {
        found.least = std::min(found.least, samples[i]);
        found.largest = std::max(found.largest, samples[i]);
    }
    return found;
}

float SampleLanes::sum_of_squares(const short* samples, std::size_t count,
                                  float sum) const
{
    for (std::size_t i = 0; i < count; ++i) {
        const float value = static_cast<float>(samples[i]) / 32768.0f;
        sum += value * value;
    }
    return sum;
}

void SampleLanes::interpolate(const short* samples, short* to,
                              std::size_t count, const Steps& steps) const
{
    const float grid = static_cast<float>(steps.grid);
    Place place(steps);
    for (std::size_t k = 0; k < count; ++k, place.advance()) {
        const short* here = samples + place.index();
        const float rise = static_cast<float>(here[1] - here[0]) *
                           static_cast<float>(place.remainder()) / grid;
        to[k] = static_cast<short>(here[0] + static_cast<std::int32_t>(rise));
    }
}

void SampleLanes::repeat(const short* frames, short* to, std::size_t count,
                         const Steps& steps) const
{
    Place place(steps);
    for (std::size_t k = 0; k < count; ++k, place.advance()) {
        to[2 * k] = frames[2 * place.index()];
        to[2 * k + 1] = frames[2 * place.index() + 1];
    }
}

void SampleLanes::to_big_bytes(const short* samples, unsigned char* bytes,
                               std::size_t count) const
{
    for (std::size_t i = 0; i < count; ++i)
        store_big_16(bytes + 2 * i, static_cast<std::uint16_t>(samples[i]));
}

const SampleLanes& SampleLanes::plain()
{
    return plain_lanes;
}

const SampleLanes& SampleLanes::fastest()
{
    std::size_t number = 0;
    while (numbered(number + 1))
        ++number;
    return *numbered(number);
}

const SampleLanes* SampleLanes::numbered(std::size_t number)
{
    const SampleLanes* const all[] = {&plain_lanes, avx2_sample_lanes(),
                                      avx512_sample_lanes()};
    return number < std::size(all) ? all[number] : nullptr;
}

const SampleLanes& SampleLanes::current()
{
    if (!in_use)
        in_use = &fastest();
    return *in_use;
}

void SampleLanes::install(const SampleLanes* other)
{
    in_use = other;
}

} // namespace zt_platform
