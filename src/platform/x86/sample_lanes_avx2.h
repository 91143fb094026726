#ifndef ZT_PLATFORM_X86_SAMPLE_LANES_AVX2_H
#define ZT_PLATFORM_X86_SAMPLE_LANES_AVX2_H

/// \file
/// Work on samples with the 256-bit registers of x86 processors.

#include "platform/sample_lanes.h"

namespace zt_platform {

/// Returns: null where the processor has none, or is of another kind.
const SampleLanes* avx2_sample_lanes();

#if defined(__x86_64__) || defined(__i386__)

/// What it says of the operations is said where they are first declared.
class Avx2SampleLanes : public SampleLanes
{
public:
    const char* name() const override;
    void weigh(const short* now, const short* before, short* to,
               std::size_t count, float now_factor,
               float before_factor) const override;
    void average(const short* pairs, short* averages,
                 std::size_t count) const override;
    Range range(const short* samples, std::size_t count) const override;
    float sum_of_squares(const short* samples, std::size_t count,
                         float sum) const override;
    void interpolate(const short* samples, short* to, std::size_t count,
                     const Steps& steps) const override;
    void repeat(const short* frames, short* to, std::size_t count,
                const Steps& steps) const override;
    void to_big_bytes(const short* samples, unsigned char* bytes,
                      std::size_t count) const override;

protected:
    ~Avx2SampleLanes() = default;
};

#endif

} // namespace zt_platform

#endif
