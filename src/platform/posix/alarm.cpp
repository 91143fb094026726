#include "platform/alarm.h"

#include <cstdlib>
#include <cstring>
#include <pthread.h>
#include <signal.h>
#include <sys/syscall.h>
#include <sys/time.h>
#include <unistd.h>

#include "platform/posix/signal_set.h"
#include "platform/signal_handler.h"

namespace zt_platform {

namespace {

constexpr std::int64_t second = 1000000; // in microseconds

/// The thread that handles the alarm. A process of 0 is nobody yet.
struct Owner
{
    pid_t process;
    pid_t thread_id;
    pthread_t thread;
};

constinit Owner owner = {};
constinit Alarm::Function volatile listener = nullptr;

pid_t this_thread_id()
{
    return static_cast<pid_t>(syscall(SYS_gettid));
}

/// Hands the alarm over to its owner.
///
/// When the owner has ended the alarm is handled where it is, for otherwise it
/// would be the last one. In a child that another thread has forked there is
/// no owner, and a stray alarm is dropped.
///
/// Returns: false when this thread is to handle it.
bool handed_over()
{
    if (owner.process == 0 || pthread_equal(pthread_self(), owner.thread))
        return false;
    const pid_t process = getpid();
    if (process != owner.process)
        return true;
    if (this_thread_id() == owner.thread_id)
        return false;
    return syscall(SYS_tgkill, process, owner.thread_id, SIGALRM) == 0;
}

void take_alarm(int signal)
{
    const ErrnoKept errno_kept;
    const Alarm::Function handler = listener;
    if (handler && !handed_over())
        handler(signal);
}

/// Runs when the process exits or the library is unloaded.
void silence()
{
    struct sigaction now = {};
    sigaction(SIGALRM, nullptr, &now);
    if (now.sa_handler != take_alarm)
        return;
    const itimerval never = {};
    setitimer(ITIMER_REAL, &never, nullptr);
    struct sigaction ignored = {};
    ignored.sa_handler = SIG_IGN;
    sigaction(SIGALRM, &ignored, nullptr);
}

} // namespace

class PosixAlarm final : public Alarm
{
public:
    void arm(std::int64_t microseconds) override
    {
        itimerval once = {};
        once.it_value.tv_sec = static_cast<time_t>(microseconds / second);
        once.it_value.tv_usec = static_cast<suseconds_t>(microseconds % second);
        setitimer(ITIMER_REAL, &once, nullptr);
    }

    AlarmLeft left() override
    {
        itimerval now = {};
        getitimer(ITIMER_REAL, &now);
        return {now.it_value.tv_sec, now.it_value.tv_usec};
    }

    void listen(Function handler) override
    {
        listener = handler;
        struct sigaction wanted = {};
        wanted.sa_handler = take_alarm;
        wanted.sa_flags = SA_RESTART;
        wanted.sa_mask = all_but_faults();
        sigaction(SIGALRM, &wanted, nullptr);
    }

    void own() override
    {
        owner = {getpid(), this_thread_id(), pthread_self()};
    }

    AlarmDisposition ignore() override
    {
        struct sigaction ignored = {};
        struct sigaction before = {};
        ignored.sa_handler = SIG_IGN;
        sigaction(SIGALRM, &ignored, &before);
        AlarmDisposition disposition;
        static_assert(sizeof before <= AlarmDisposition::action_bytes);
        std::memcpy(disposition.action, &before, sizeof before);
        disposition.function = before.sa_handler;
        return disposition;
    }

    void restore(const AlarmDisposition& disposition) override
    {
        struct sigaction wanted = {};
        std::memcpy(&wanted, disposition.action, sizeof wanted);
        if (wanted.sa_handler == disposition.function)
            sigaction(SIGALRM, &wanted, nullptr);
        else
            SignalHandlers::current().set(SIGALRM, disposition.function);
    }

    bool waiting() override
    {
        sigset_t pending;
        return sigpending(&pending) == 0 && sigismember(&pending, SIGALRM) == 1;
    }

    void let_through() override
    {
        sigset_t alarm;
        sigemptyset(&alarm);
        sigaddset(&alarm, SIGALRM);
        pthread_sigmask(SIG_UNBLOCK, &alarm, nullptr);
    }

    void silence_at_exit() override
    {
        static constinit bool arranged = false;
        if (!arranged)
            arranged = std::atexit(silence) == 0;
    }
};

namespace {
constinit PosixAlarm posix_alarm;
constinit Alarm* installed = nullptr;
} // namespace

Alarm& Alarm::current()
{
    return installed ? *installed : posix_alarm;
}

Alarm& Alarm::system()
{
    return posix_alarm;
}

Alarm* Alarm::install(Alarm* other)
{
    Alarm* const before = installed;
    installed = other;
    return before;
}

} // namespace zt_platform
