#ifndef ZT_PLATFORM_ALARM_H
#define ZT_PLATFORM_ALARM_H

/// \file
/// The one alarm of a process: a timer that runs down once and then raises the
/// alarm signal, and what becomes of that signal.
///
/// The signal may be delivered to any thread of the process. It is always
/// handled on the one that called `own` last: another thread that gets it hands
/// it over and goes on.

#include <cstddef>
#include <cstdint>

namespace zt_platform {

/// What the alarm signal is sent to, with everything that belongs to that.
class AlarmDisposition
{
public:
    using Function = void (*)(int);

    Function function = nullptr; ///< The handler; null is the default action.

private:
    friend class PosixAlarm;
    static constexpr std::size_t action_bytes = 160;
    alignas(long) unsigned char action[action_bytes] = {};
};

/// Time left on a timer that has been read.
struct AlarmLeft
{
    long seconds;
    long microseconds; ///< 0 to 999999.
};

/// The alarm: its timer and its signal.
///
/// Context: every operation may run in the signal, `silence_at_exit` excepted.
class Alarm
{
public:
    using Function = AlarmDisposition::Function;

    /// Starts the timer anew, to run down once.
    ///
    /// Units: `microseconds` is at least 1.
    virtual void arm(std::int64_t microseconds) = 0;

    /// Gives what the timer has left; 0 when it does not run.
    virtual AlarmLeft left() = 0;

    /// Sends the signal to `handler`, on the thread of the latest `own`.
    ///
    /// Every signal is held back while it runs, faults excepted; interrupted
    /// system calls go on, and `errno` is as it was for them.
    virtual void listen(Function handler) = 0;

    /// Makes the calling thread the one that handles the signal.
    virtual void own() = 0;

    /// Ignores the signal from now on; one that is waiting is thrown away.
    ///
    /// Returns: what it was sent to before, for `restore`.
    virtual AlarmDisposition ignore() = 0;

    /// Sends the signal where it went when `disposition` was taken. If its
    /// `function` was changed since, sends it there in the plain way.
    virtual void restore(const AlarmDisposition& disposition) = 0;

    /// Tells whether the signal was raised and waits to be delivered.
    virtual bool waiting() = 0;

    /// Lets the signal through to the calling thread.
    virtual void let_through() = 0;

    /// Makes sure that neither the end of the process nor the unloading of
    /// the library leaves an alarm behind that goes to code which is gone.
    ///
    /// Context: ordinary code only; only the first call does anything.
    virtual void silence_at_exit() = 0;

    /// Gives the alarm in use: the system's, or one that a test installed.
    static Alarm& current();

    /// Gives the system's, for stand-ins that replace only a part of it.
    static Alarm& system();

    /// Installs another; null restores the system's.
    ///
    /// Owner:   the caller, who installs another before destroying it.
    /// Returns: what was installed before, null for the system's.
    static Alarm* install(Alarm* other);

protected:
    ~Alarm() = default;
};

} // namespace zt_platform

#endif
