#ifndef ZTSH_SCRIPT_IDLE_H
#define ZTSH_SCRIPT_IDLE_H

/// \file
/// What goes on while the shell waits: for input, for a key, for a time.

#include <chrono>
#include <functional>
#include <optional>

namespace ztsh {

/// What there is to do in a wait.
class Idle
{
public:
    Idle() = default;
    Idle(const Idle&) = delete;
    Idle& operator=(const Idle&) = delete;
    virtual ~Idle() = default;

    /// Tells whether there is something to do.
    ///
    /// Context: signals may be held back; it has to be short.
    virtual bool Due() const = 0;

    /// Does what there is to do at the moment; does not mind if that is
    /// nothing.
    virtual void RunDue() = 0;

    /// Tells whether the wait is to be given up.
    virtual bool Over() const = 0;
};

/// What ends a wait.
struct WaitEnds
{
    /// A file descriptor that has input, or its end; -1 for none.
    int descriptor = -1;
    /// A moment that has come.
    std::optional<std::chrono::steady_clock::time_point> deadline = {};
    /// Something that a signal handler brings about; empty for nothing. What
    /// is due by then is done first, and it has to hold after that.
    std::function<bool()> happened = {};
};

/// Which of them did.
enum class Waited {
    Input,
    Deadline,
    Happened,
    Over ///< The wait was given up.
};

/// Waits, and does meanwhile what there is to do.
///
/// What is due all the time does not keep the wait from its end.
Waited WaitFor(const WaitEnds& ends, Idle& idle);

} // namespace ztsh

#endif
