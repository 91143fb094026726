#ifndef ZT_PLATFORM_X86_SAMPLE_LANES_AVX512_H
#define ZT_PLATFORM_X86_SAMPLE_LANES_AVX512_H

/// \file
/// Work on samples with the 512-bit registers of x86 processors, where they
/// make it faster.

#include "platform/sample_lanes.h"

namespace zt_platform {

/// Returns: null where the processor has none, or is of another kind.
const SampleLanes* avx512_sample_lanes();

} // namespace zt_platform

#endif
