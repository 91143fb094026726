#ifndef ZT_TESTS_IMAGE_LITERAL_FRAME_H
#define ZT_TESTS_IMAGE_LITERAL_FRAME_H

#include <cstdint>
#include <string>
#include <vector>

/// The conversion to a video frame once more, each step as plain as it can be
/// said: what the library must agree with, bit by bit.
namespace literal {

/// Makes a frame of 648 x 486 pixels in object order, bottom row first.
std::string VideoFrame(const std::vector<std::uint32_t>& pixels);

} // namespace literal

#endif
