#include "diag/signal_report.h"

#include <new>
#include <utility>

#include "ZT/error.h"
#include "platform/signal_handler.h"

namespace zt_diag {

/// An error that may be deleted in a signal: it is then set aside, whole, and
/// freed by ordinary code.
class SignalErr final : public ZtErr
{
public:
    SignalErr(const char* prefix, const char* text, int error_level)
        : ZtErr(prefix, 0, error_level)
    {
        --count; // it counts when it is posted
        stream << text;
        Message();
    }

    /// Tells whether there was memory for the text.
    bool is_whole() const { return stream.good() && *message; }

    void stamp()
    {
        system_error = oserror();
        ++count;
    }

    static void operator delete(SignalErr* error, std::destroying_delete_t);

    SignalErr* following = nullptr; ///< In the list that it stands in.
};

namespace {

constinit std::atomic<int> scopes = 0;
constinit std::atomic<SignalErr*> set_aside = nullptr;

// Written by the signal, read by ordinary code; the counters only ever grow.
constexpr unsigned ring_length = 256;
constinit HeldInSignal ring[ring_length] = {};
constinit std::atomic<unsigned> ring_written = 0;
constinit std::atomic<unsigned> ring_read = 0;

void free_now(SignalErr* error)
{
    error->~SignalErr();
    ::operator delete(error);
}

void free_what_was_set_aside()
{
    SignalErr* error = set_aside.exchange(nullptr);
    while (error) {
        SignalErr* const following = error->following;
        free_now(error);
        error = following;
    }
}

// Returns: null when there is no memory for the error and all of its text.
SignalErr* make_whole(const char* prefix, const char* text, int level)
{
    auto* const error = new (std::nothrow) SignalErr(prefix, text, level);
    if (error && error->is_whole())
        return error;
    delete error;
    return nullptr;
}

// A signal that comes between the two steps makes the exchange fail, and it is
// tried again on the list as the signal has left it.
void push(std::atomic<SignalErr*>& list, SignalErr* error)
{
    error->following = list;
    while (!list.compare_exchange_weak(error->following, error)) {
    }
}

} // namespace

void SignalErr::operator delete(SignalErr* error, std::destroying_delete_t)
{
    if (in_signal())
        push(set_aside, error);
    else
        free_now(error);
}

SignalScope::SignalScope()
{
    ++scopes;
}

SignalScope::~SignalScope()
{
    --scopes;
}

void SignalScope::forget_all()
{
    scopes = 0;
}

bool in_signal()
{
    return scopes.load(std::memory_order_relaxed) > 0;
}

void SignalReport::reserve(int count)
{
    if (in_signal())
        return;
    reserve_default_handler();
    free_what_was_set_aside();
    while (ready_count < count) {
        SignalErr* const error = make_whole(prefix, text, level);
        if (!error)
            return;
        push(ready, error);
        ++ready_count;
    }
}

SignalErr* SignalReport::take()
{
    if (!in_signal())
        return make_whole(prefix, text, level);
    SignalErr* const error = ready;
    if (error) {
        ready = error->following;
        --ready_count;
    }
    return error;
}

void SignalReport::post()
{
    if (SignalErr* const error = take()) {
        error->stamp();
        error->Post();
        return;
    }
    ++ZtErr::count;
    if (level >= ZtErrHandler::outputLevel) {
        zt_platform::write_standard_error(prefix);
        zt_platform::write_standard_error(text);
    }
    if (level >= ZtErrHandler::abortLevel)
        ZtErrHandler::Abort();
}

void dispose(ZtErr* error)
{
    if (!in_signal() || dynamic_cast<SignalErr*>(error))
        delete error;
}

bool hold_in_signal(ZtErrHandler& handler, ZtErr* error)
{
    const unsigned written = ring_written;
    if (written - ring_read >= ring_length)
        return false;
    ring[written % ring_length] = {&handler, error};
    ring_written = written + 1;
    return true;
}

bool next_held_in_signal(HeldInSignal& held)
{
    while (ring_read != ring_written) {
        const unsigned read = ring_read;
        held = ring[read % ring_length];
        ring_read = read + 1;
        if (held.error)
            return true;
    }
    return false;
}

ZtErr* take_held_in_signal(const ZtErrHandler& handler)
{
    for (unsigned place = ring_read; place != ring_written; ++place) {
        HeldInSignal& held = ring[place % ring_length];
        if (held.handler == &handler && held.error)
            return std::exchange(held.error, nullptr);
    }
    return nullptr;
}

} // namespace zt_diag
