#ifndef ZT_FRAMESTORE_RECEPTION_H
#define ZT_FRAMESTORE_RECEPTION_H

/// \file
/// One client's message, as it comes in.

#include "frame_file.h"
#include "frame_layout.h"

#include <cstddef>
#include <optional>
#include <string>

namespace framestore {

/// The reception of one message. It knows nothing of sockets: it is given
/// bytes, in pieces of any size, and has an answer in the end.
class Reception
{
public:
    /// Requires: `frame_storage` outlives the reception.
    explicit Reception(const Storage& frame_storage) : storage(frame_storage) {}

    /// Takes the next bytes of the message; those behind its end are dropped.
    void Take(const char* bytes, std::size_t count);

    /// Gives how many bytes have come, the dropped ones not counted.
    std::size_t Count() const { return count_so_far; }

    /// Tells whether the message is complete: its frame is in its place, or
    /// why it is not is known.
    bool Complete() const { return count_so_far == message_bytes; }

    /// Gives the four bytes that answer a complete message.
    const char* Answer() const
    {
        return why.empty() ? answer_well : answer_refused;
    }

    /// Gives a line for the log about a complete message from `address`.
    std::string Line(const std::string& address) const;

private:
    int number() const;
    std::string sender() const;

    const Storage& storage;
    char head[head_bytes] = {};
    std::size_t count_so_far = 0;
    std::optional<FrameFile> file; ///< From the end of the head to its own.
    std::string written;           ///< The name of a frame in its place.
    std::string why;               ///< The frame was refused.
};

} // namespace framestore

#endif
