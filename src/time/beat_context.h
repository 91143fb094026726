#ifndef ZT_TIME_BEAT_CONTEXT_H
#define ZT_TIME_BEAT_CONTEXT_H

/// \file
/// What keeps the beat and the code that it interrupts out of each other's way.
///
/// The beat runs in the alarm signal, on the thread of the code that shares
/// data with it. So there is nothing to lock: that code holds signals back for
/// the few instructions in which the data is not whole.
///
/// A callback that is left by a jump leaves its scopes and walks behind; they
/// are forgotten when the beat is started again.

#include <optional>

#include "ZT/timer.h"
#include "diag/signal_report.h"
#include "platform/signal_handler.h"

namespace zt_time {

/// Tells whether the code that asks is run by the beat.
inline bool in_beat()
{
    return zt_diag::in_signal();
}

/// Holds the beat back from ordinary code while it lives. May stand inside
/// another one; inside the beat it does nothing.
class BeatHeld
{
public:
    BeatHeld()
    {
        if (!in_beat() && depth == 0)
            signals.emplace();
        depth = depth + 1;
    }

    ~BeatHeld() { depth = depth - 1; }

    BeatHeld(const BeatHeld&) = delete;
    BeatHeld& operator=(const BeatHeld&) = delete;

private:
    friend void forget_abandoned_beat();
    static volatile int depth;
    std::optional<zt_platform::SignalsHeld> signals;
};

/// Makes what it encloses a part of the beat. Records that are freed inside are
/// kept until the outermost scope ends.
///
/// Requires: signals are held back.
class BeatScope
{
public:
    BeatScope();
    ~BeatScope();
    BeatScope(const BeatScope&) = delete;
    BeatScope& operator=(const BeatScope&) = delete;

private:
    const bool outermost;
    zt_diag::SignalScope scope;
};

/// A part of the beat that is called like any function, maybe by ordinary
/// code, from which it holds the beat proper back.
class CalledBeatScope
{
public:
    CalledBeatScope();
    ~CalledBeatScope();
    CalledBeatScope(const CalledBeatScope&) = delete;
    CalledBeatScope& operator=(const CalledBeatScope&) = delete;

private:
    const bool from_ordinary_code;
    BeatHeld held;
    BeatScope scope;
};

/// A walk over a timer's records, which ends when a callback destroys the
/// timer.
class RecordWalk
{
public:
    explicit RecordWalk(const ZtTimer* walked);
    ~RecordWalk();
    RecordWalk(const RecordWalk&) = delete;
    RecordWalk& operator=(const RecordWalk&) = delete;

    /// Tells whether the timer is still there.
    bool goes_on() const { return timer; }

    /// Ends every walk over this timer's records.
    static void end(const ZtTimer* destroyed);

private:
    friend void forget_abandoned_beat();
    static RecordWalk* innermost;
    const ZtTimer* timer;
    RecordWalk* const outer;
};

/// Tells whether a part of the beat was left by a jump: it never ended, yet
/// the stack has gone back behind where it began.
bool beat_was_abandoned();

/// Forgets the scopes and walks of such a part.
void forget_abandoned_beat();

} // namespace zt_time

#endif
