#ifndef ZT_DIAG_SIGNAL_REPORT_H
#define ZT_DIAG_SIGNAL_REPORT_H

/// \file
/// Reports that are posted in a signal, through the same stack of handlers and
/// at once, without allocating, locking or touching a stream.
///
/// The error objects are made beforehand, in ordinary code. In a signal, the
/// handler at the bottom prints past every stream, a handler that holds errors
/// back gets them through a ring that ordinary code empties into its queue, and
/// an error that is deleted is set aside for ordinary code to free.

#include <atomic>

class ZtErr;
class ZtErrHandler;

namespace zt_diag {

/// Marks the time that this process spends in a signal, for those who must
/// behave differently there. May stand inside another one.
class SignalScope
{
public:
    SignalScope();
    ~SignalScope();
    SignalScope(const SignalScope&) = delete;
    SignalScope& operator=(const SignalScope&) = delete;

    /// Ends all scopes, whose code was left by a jump.
    static void forget_all();
};

/// Tells whether a `SignalScope` lives.
bool in_signal();

class SignalErr;

/// One text that can be reported in a signal. Has static storage.
class SignalReport
{
public:
    /// Describes the report of kind 0 that reads `prefix` and `text`.
    constexpr SignalReport(const char* report_prefix, const char* report_text,
                           int report_level)
        : prefix(report_prefix), text(report_text), level(report_level)
    {}

    SignalReport(const SignalReport&) = delete;
    SignalReport& operator=(const SignalReport&) = delete;

    /// Makes errors until this many are ready to be posted in a signal.
    ///
    /// Context: does nothing in a signal.
    void reserve(int count);

    /// Posts the report. With no error ready in a signal, prints it as the
    /// bottom handler would.
    void post();

private:
    SignalErr* take();

    const char* prefix;
    const char* text;
    int level;
    std::atomic<SignalErr*> ready = nullptr;
    std::atomic<int> ready_count = 0;
};

/// Makes room for the default handler, so that a signal can make it.
///
/// Context: does nothing in a signal.
void reserve_default_handler();

/// Frees an error: at once, or in a signal as late as need be. In a signal an
/// error that was not made for it is left where it is.
void dispose(ZtErr* error);

/// An error on its way from a signal to a handler's queue.
struct HeldInSignal
{
    ZtErrHandler* handler;
    ZtErr* error;
};

/// Puts an error that a handler is to hold back into the ring.
///
/// Returns: false when the ring is full.
/// Context: in a signal only.
bool hold_in_signal(ZtErrHandler& handler, ZtErr* error);

/// Takes the oldest error out of the ring.
///
/// Returns: false when the ring is empty.
/// Context: ordinary code only.
bool next_held_in_signal(HeldInSignal& held);

/// Takes the oldest error for one handler out of the ring.
///
/// Returns: null when there is none.
ZtErr* take_held_in_signal(const ZtErrHandler& handler);

} // namespace zt_diag

#endif
