#include "ZT/signals.h"

#include <atomic>
#include <new>

#include "platform/signal_handler.h"

namespace {
struct Hook
{
    int signal;
    void* data;
    void (*handler)(int, void*);
    Hook* older;
};

// The newest hook, or null. Hooks are never freed, and each is whole before it
// is linked in, so a signal may walk the list at any moment.
constinit std::atomic<Hook*> newest = nullptr;

void signal_cb(int signal)
{
    const zt_platform::ErrnoKept errno_kept;
    const ZtSignalHandler by_default =
        zt_platform::SignalHandlers::current().by_default();
    Hook* const first = newest;
    for (Hook* hook = first; hook; hook = hook->older)
        BSDsignal(hook->signal, by_default);
    for (Hook* hook = first; hook; hook = hook->older)
        if (hook->signal == signal && hook->handler)
            hook->handler(signal, hook->data);
}
} // namespace

ZtSignalHandler OnSignal(int signal, void (*handler)(int, void*), void* data)
{
    auto* const hook = new (std::nothrow) Hook{signal, data, handler, newest};
    if (hook)
        newest = hook;
    return BSDsignal(signal, signal_cb);
}

ZtSignalHandler BSDsignal(int signal, ZtSignalHandler handler)
{
    return zt_platform::SignalHandlers::current().set(signal, handler);
}
