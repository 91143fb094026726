#ifndef ZT_IMAGE_FRAME_STORE_H
#define ZT_IMAGE_FRAME_STORE_H

/// \file
/// The frame store: a server that writes video frames to a disk recorder, as
/// its clients see it.

#include "image/video_frame.h"
#include "platform/socket.h"

#include <cstddef>
#include <cstdint>

namespace zt_image {

/// What goes to the frame store, in this order and nothing else.
struct FrameMessage
{
    char host_name[zt_platform::host_name_bytes]; ///< The sender's.
    unsigned char number[4];                      ///< Most significant first.
    unsigned char frame[video_frame_bytes];
};
static_assert(sizeof(FrameMessage) == 699908);

constexpr std::uint16_t frame_store_port = 5333;

/// The variable of the installation that names the frame store's host.
constexpr char frame_store_host[] = "QUARN_DDR_HOST";

/// While this file exists the recorder is busy and nobody connects.
constexpr char frame_store_lock[] = "/ddr/ddr_lock";

/// So long is a wait for the lock file to go.
constexpr std::uint64_t lock_wait_nanoseconds = 5000000000;

/// Replaces the lock file; null restores `frame_store_lock`. For tests.
///
/// Owner: the caller, who restores it before the text goes.
void use_frame_store_lock(const char* path);

} // namespace zt_image

#endif
