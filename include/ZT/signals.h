#ifndef ZT_SIGNALS_H
#define ZT_SIGNALS_H

/// \file
/// Several callbacks on one signal of the operating system.
///
/// Surprising: a hook runs once. The first delivery of any hooked signal puts
/// every hooked signal back to its default, so that the next one takes the
/// system's default action; whoever wants more calls `OnSignal` again.

#include <KVO/KvoCommon.h>

/// What a signal is sent to: a function that takes its number. The system's
/// SIG_DFL, SIG_IGN and SIG_ERR are of this type too.
typedef void (*ZtSignalHandler)(int);

/// Hooks `handler` to `signal`, in front of all hooks so far.
///
/// On delivery every hooked signal, whichever it is, goes back to its default;
/// then each hook on the delivered signal is called with the signal and its
/// own `data`, the newest first. Hooks that a hook adds wait for the next
/// delivery. A hook is never removed: hooked twice, it runs twice, and hooked
/// again after a delivery the earlier record runs once more as well.
///
/// Requires:  no hooked signal arrives during the call.
/// Owner:     `data` stays the caller's and must live as long as the process.
/// Returns:   the handler that `signal` had before, or SIG_ERR for a signal
///            that cannot be caught, which is hooked all the same.
/// Context:   the call allocates; `handler` runs in the signal, where it must
///            not allocate, report or touch a stream.
/// By design: one delivery disarms all (OnSignal.ADeliveryDisarmsEverySignal).
ZT_API ZtSignalHandler OnSignal(int signal, void (*handler)(int, void*),
                                void* data);

/// Sends `signal` to `handler` until another is set: the signal is held back
/// while the handler runs, and system calls that it interrupts go on.
///
/// Returns: the handler that `signal` had before, or SIG_ERR with `errno` set
///          for a signal that cannot be caught.
/// Context: may run in a signal.
ZT_API ZtSignalHandler BSDsignal(int signal, ZtSignalHandler handler);

#endif
