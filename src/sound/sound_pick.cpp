#include "sound/sound_pick.h"

#include <algorithm>
#include <cstring>

namespace zt_sound {

namespace {

/// Steps through floor(i * wide / count) for i = 0, 1, ... without dividing
/// more than once.
class EvenSteps
{
public:
    EvenSteps(std::int64_t wide, std::int64_t steps)
        : count(steps), whole(wide / steps), part(wide % steps)
    {}

    std::int64_t place() const { return at; }

    void next()
    {
        at += whole;
        rest += part;
        if (rest >= count) {
            rest -= count;
            ++at;
        }
    }

private:
    std::int64_t count;
    std::int64_t whole;
    std::int64_t part;
    std::int64_t at = 0;
    std::int64_t rest = 0;
};

void clear(std::int16_t* out, long count)
{
    std::memset(out, 0, static_cast<std::size_t>(count) * sizeof *out);
}

} // namespace

void pick(std::int16_t* out, long out_count, const std::int16_t* in,
          long in_count)
{
    if (out_count <= 0)
        return;
    if (in_count <= 0)
        return clear(out, out_count);
    if (in_count == out_count) {
        std::memcpy(out, in, static_cast<std::size_t>(out_count) * sizeof *out);
        return;
    }
    EvenSteps steps(in_count, out_count);
    for (long i = 0; i < out_count; ++i, steps.next())
        out[i] = in[steps.place()];
}

void pick_stretch(std::int16_t* out, long out_count, const std::int16_t* in,
                  long in_count, long begin, long stretch)
{
    if (out_count <= 0)
        return;
    if (in_count <= 0 || stretch == 0)
        return clear(out, out_count);
    const bool backward = stretch < 0;
    EvenSteps steps(backward ? -std::int64_t{stretch} : std::int64_t{stretch},
                    out_count);
    for (long i = 0; i < out_count; ++i, steps.next()) {
        const std::int64_t place =
            backward ? begin - steps.place() : begin + steps.place();
        out[i] =
            in[std::clamp(place, std::int64_t{0}, std::int64_t{in_count} - 1)];
    }
}

} // namespace zt_sound
