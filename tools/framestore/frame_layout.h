#ifndef ZT_FRAMESTORE_FRAME_LAYOUT_H
#define ZT_FRAMESTORE_FRAME_LAYOUT_H

/// \file
/// How a frame lies in a message and on the disk; docs/frame-store.md has the
/// whole.

#include <cstddef>

namespace framestore {

/// The message: a host's name, a number, a frame.
constexpr std::size_t name_bytes = 64;
constexpr std::size_t number_bytes = 4;
constexpr std::size_t head_bytes = name_bytes + number_bytes;
constexpr std::size_t line_bytes = 1440;
constexpr int lines = 486;
constexpr std::size_t frame_bytes = line_bytes * lines;
constexpr std::size_t message_bytes = head_bytes + frame_bytes;

/// The answers, with the NUL that makes them four bytes.
constexpr std::size_t answer_bytes = 4;
constexpr char answer_well[answer_bytes] = {'O', 'K', 0, 0};
constexpr char answer_refused[answer_bytes] = {'B', 'A', 'D', 0};

/// Gives the line of a frame, stored field after field, that holds line
/// `shown` of the picture, counted from the top.
constexpr int StoredLine(int shown)
{
    return shown % 2 == 0 ? lines / 2 + shown / 2 : shown / 2;
}

} // namespace framestore

#endif
