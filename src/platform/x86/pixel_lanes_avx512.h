#ifndef ZT_PLATFORM_X86_PIXEL_LANES_AVX512_H
#define ZT_PLATFORM_X86_PIXEL_LANES_AVX512_H

/// \file
/// Work on rows of pixels with the 512-bit registers of x86 processors, where
/// they make it faster.

#include "platform/pixel_lanes.h"

namespace zt_platform {

/// Returns: null where the processor has none, or is of another kind.
const PixelLanes* avx512_pixel_lanes();

} // namespace zt_platform

#endif
