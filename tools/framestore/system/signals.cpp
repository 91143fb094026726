#include "system/signals.h"

#include <algorithm>
#include <csignal>
#include <initializer_list>
#include <poll.h>

namespace framestore {

namespace {

volatile std::sig_atomic_t stop_signal = 0;
sigset_t while_waiting; ///< What is held back during a wait.

void note_signal(int signal)
{
    stop_signal = signal;
}

timespec time_left(std::chrono::steady_clock::time_point deadline)
{
    constexpr long billion = 1000000000;
    const std::chrono::nanoseconds left =
        deadline - std::chrono::steady_clock::now();
    const auto count = std::max<std::int64_t>(left.count(), 0);
    timespec time = {};
    time.tv_sec = static_cast<time_t>(count / billion);
    time.tv_nsec = static_cast<long>(count % billion);
    return time;
}

} // namespace

void CatchSignals()
{
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGXFSZ, SIG_IGN);
    sigset_t held;
    sigemptyset(&held);
    for (int signal : {SIGINT, SIGTERM, SIGHUP}) {
        struct sigaction action = {};
        sigaction(signal, nullptr, &action);
        if (action.sa_handler == SIG_IGN && signal == SIGHUP)
            continue; // It was started to outlive its terminal.
        action = {};
        action.sa_handler = note_signal;
        sigemptyset(&action.sa_mask);
        sigaction(signal, &action, nullptr);
        sigaddset(&held, signal);
    }
    sigprocmask(SIG_BLOCK, &held, &while_waiting);
    for (int signal : {SIGINT, SIGTERM, SIGHUP})
        sigdelset(&while_waiting, signal);
}

int StopSignal()
{
    return stop_signal;
}

void Wait(std::vector<Watched>& watched,
          const std::optional<std::chrono::steady_clock::time_point>& deadline)
{
    std::vector<pollfd> polled;
    polled.reserve(watched.size());
    for (const Watched& one : watched)
        polled.push_back({one.descriptor, POLLIN, 0});
    timespec limit = {};
    if (deadline)
        limit = time_left(*deadline);
    const int ready = ppoll(polled.data(), polled.size(),
                            deadline ? &limit : nullptr, &while_waiting);
    for (std::size_t i = 0; i < watched.size(); ++i)
        watched[i].ready = ready > 0 && polled[i].revents != 0;
}

} // namespace framestore
