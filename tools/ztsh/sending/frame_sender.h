#ifndef ZTSH_SENDING_FRAME_SENDER_H
#define ZTSH_SENDING_FRAME_SENDER_H

/// \file
/// Pictures to the frame store, with an answer and an end: the library tells
/// how it went by what it prints only, and waits for ever.

#include <ZT/image_sgi.h>

#include <functional>
#include <string>

namespace ztsh {

/// How a picture is sent.
struct Sending
{
    /// For everything, waits for the recorder included; 0 is as long as it
    /// takes.
    double seconds = 0;

    /// Gets each line that the library prints, without its end.
    std::function<void(const std::string& line)> say;

    /// Is called in the child first.
    std::function<void()> in_child = [] {};
};

/// Sends `image` as frame `number`, in a child.
///
/// Returns: the empty text, or why it was not sent; that the shell is asked to
///          stop is no reason but an end.
std::string SendToFrameStore(const ZtImageSGI& image, int number,
                             const Sending& sending);

/// Tells whether a line that the library prints is only about what it does.
bool IsAboutTheStart(const std::string& line);

} // namespace ztsh

#endif
