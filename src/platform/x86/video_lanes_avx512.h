#ifndef ZT_PLATFORM_X86_VIDEO_LANES_AVX512_H
#define ZT_PLATFORM_X86_VIDEO_LANES_AVX512_H

/// \file
/// Pixels mixed into luma and chroma with the 512-bit registers of x86
/// processors.

#include "platform/video_lanes.h"

namespace zt_platform {

/// Returns: null where the processor has none, or none that multiply and add
///          words, or is of another kind.
const VideoLanes* avx512_video_lanes();

} // namespace zt_platform

#endif
