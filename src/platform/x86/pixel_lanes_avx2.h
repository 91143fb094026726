#ifndef ZT_PLATFORM_X86_PIXEL_LANES_AVX2_H
#define ZT_PLATFORM_X86_PIXEL_LANES_AVX2_H

/// \file
/// Work on rows of pixels with the 256-bit registers of x86 processors.

#include "platform/pixel_lanes.h"

namespace zt_platform {

/// Returns: null where the processor has none, or is of another kind.
const PixelLanes* avx2_pixel_lanes();

} // namespace zt_platform

#endif
