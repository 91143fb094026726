#ifndef ZT_PLATFORM_X86_POINT_LANES_AVX_H
#define ZT_PLATFORM_X86_POINT_LANES_AVX_H

/// \file
/// Work on arrays of points with the 256-bit registers of x86 processors.

#include "platform/point_lanes.h"

namespace zt_platform {

/// Returns: null where the processor has none, or is of another kind.
const PointLanes* avx_point_lanes();

} // namespace zt_platform

#endif
