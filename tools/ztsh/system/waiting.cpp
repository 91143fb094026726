#include "system/waiting.h"

#include <algorithm>
#include <csignal>
#include <initializer_list>
#include <poll.h>

namespace ztsh {

namespace {

using Clock = std::chrono::steady_clock;

/// Holds signals back for as long as it lives, but for those that tell of a
/// fault.
class SignalsHeld
{
public:
    SignalsHeld()
    {
        sigset_t all;
        sigfillset(&all);
        for (int fault : {SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGABRT, SIGTRAP})
            sigdelset(&all, fault);
        sigprocmask(SIG_BLOCK, &all, &former);
    }
    ~SignalsHeld() { sigprocmask(SIG_SETMASK, &former, nullptr); }
    SignalsHeld(const SignalsHeld&) = delete;
    SignalsHeld& operator=(const SignalsHeld&) = delete;

    const sigset_t* Former() const { return &former; }

private:
    sigset_t former;
};

timespec time_left(Clock::time_point deadline)
{
    constexpr long billion = 1000000000;
    std::chrono::nanoseconds left = deadline - Clock::now();
    auto count = std::max<std::int64_t>(left.count(), 0);
    timespec time = {};
    time.tv_sec = static_cast<time_t>(count / billion);
    time.tv_nsec = static_cast<long>(count % billion);
    return time;
}

} // namespace

Woken Sleep(int descriptor, const std::optional<Clock::time_point>& deadline,
            const std::function<bool()>& awake)
{
    SignalsHeld held;
    timespec limit = {};
    const timespec* timeout = nullptr;
    bool sleeps = !awake();
    if (sleeps && deadline)
        limit = time_left(*deadline);
    if (!sleeps || deadline)
        timeout = &limit;
    pollfd wait = {descriptor, POLLIN, 0};
    nfds_t count = descriptor >= 0 ? 1 : 0;
    if (ppoll(&wait, count, timeout, held.Former()) > 0)
        return Woken::Input;
    if (deadline && Clock::now() >= *deadline)
        return Woken::Deadline;
    return Woken::Signal;
}

} // namespace ztsh
