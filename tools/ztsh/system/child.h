#ifndef ZTSH_SYSTEM_CHILD_H
#define ZTSH_SYSTEM_CHILD_H

/// \file
/// Something dangerous done in a process of its own.

#include <functional>
#include <string>

namespace ztsh {

/// How a child process ended.
struct ChildEnd
{
    std::string errors;     ///< What it wrote to standard error.
    int code = -1;          ///< What `body` returned, or the code of an exit.
    int signal = 0;         ///< What ended it, or 0.
    bool timed_out = false; ///< It was ended since it took too long.
    bool started = false;   ///< False when there could be no child.
};

/// Runs `body` in a child process, with nothing on standard input and output,
/// and waits for it. Whatever ends this process ends the child too.
///
/// Units: `seconds` at most.
ChildEnd RunInChild(const std::function<int()>& body, int seconds);

} // namespace ztsh

#endif
