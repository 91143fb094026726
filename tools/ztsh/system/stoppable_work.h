#ifndef ZTSH_SYSTEM_STOPPABLE_WORK_H
#define ZTSH_SYSTEM_STOPPABLE_WORK_H

/// \file
/// Work that may take for ever, done in a copy of the shell that can be ended.

#include <functional>
#include <string>

namespace ztsh {

/// How the work came to its end.
enum class WorkEnd {
    Done,       ///< By itself.
    Crashed,    ///< By a signal that was not ours.
    TimedOut,   ///< Its time was over; it was killed.
    Stopped,    ///< The shell is asked to stop; it was killed.
    NotStarted, ///< There was no process to spare.
};

/// Does `work` in a child and gives what it writes to standard error to
/// `take`, as it comes. The terminal's interrupt reaches the shell only.
///
/// Units: `seconds` 0 is as long as it takes.
WorkEnd DoStoppably(const std::function<void()>& work, double seconds,
                    const std::function<void(const std::string&)>& take);

} // namespace ztsh

#endif
