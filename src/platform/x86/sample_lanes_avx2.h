#ifndef ZT_PLATFORM_X86_SAMPLE_LANES_AVX2_H
#define ZT_PLATFORM_X86_SAMPLE_LANES_AVX2_H

/// \file
/// Work on samples with the 256-bit registers of x86 processors.

#include "platform/sample_lanes.h"

namespace zt_platform {

/// Returns: null where the processor has none, or is of another kind.
const SampleLanes* avx2_sample_lanes();

} // namespace zt_platform

#endif
