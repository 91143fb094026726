#ifndef ZT_PLATFORM_X86_VIDEO_LANES_AVX2_H
#define ZT_PLATFORM_X86_VIDEO_LANES_AVX2_H

/// \file
/// Pixels mixed into luma and chroma with the 256-bit registers of x86
/// processors.

#include "platform/video_lanes.h"

namespace zt_platform {

/// Returns: null where the processor has none, or is of another kind.
const VideoLanes* avx2_video_lanes();

} // namespace zt_platform

#endif
