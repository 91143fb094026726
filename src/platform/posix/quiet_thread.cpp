#include "platform/quiet_thread.h"

#include <fcntl.h>
#include <linux/close_range.h>
#include <new>
#include <pthread.h>
#include <unistd.h>

#include "platform/signal_handler.h"

namespace zt_platform {

namespace {

// Whether the calling thread has open files of its own.
thread_local bool output_is_away = false;

struct Start
{
    void (*work)(void*);
    void* data;
    QuietThread::Output output;
};

// Parts the thread's open files from the process's and closes them; another
// thread that waits for the end of a pipe must not wait for our copy of it. A
// system that cannot do it leaves everything as it is.
void send_output_away()
{
    constexpr unsigned first_beyond_standard = 3;
    if (close_range(first_beyond_standard, ~0U, CLOSE_RANGE_UNSHARE) != 0)
        return;
    output_is_away = true;
    const int nowhere = open("/dev/null", O_RDWR | O_CLOEXEC);
    for (int standard = STDIN_FILENO; standard <= STDERR_FILENO; ++standard)
        if (nowhere < 0 || dup2(nowhere, standard) < 0)
            close(standard);
    if (nowhere > STDERR_FILENO)
        close(nowhere);
}

void* run(void* argument)
{
    auto* const start = static_cast<Start*>(argument);
    const Start what = *start;
    delete start;
    if (what.output == QuietThread::Output::Away)
        send_output_away();
    what.work(what.data);
    return nullptr;
}

} // namespace

bool QuietThread::start(void (*work)(void*), void* data, Output output)
{
    auto* const argument = new (std::nothrow) Start{work, data, output};
    if (!argument)
        return false;
    const SignalsHeld held; // a thread begins with what its maker holds back
    pthread_t made = {};
    if (pthread_create(&made, nullptr, run, argument) != 0) {
        delete argument;
        return false;
    }
    static_assert(sizeof made <= sizeof thread);
    thread = static_cast<std::uintptr_t>(made);
    process = getpid();
    return true;
}

bool QuietThread::runs() const
{
    return process != 0 && process == getpid();
}

void QuietThread::join()
{
    if (runs())
        pthread_join(static_cast<pthread_t>(thread), nullptr);
    process = 0;
}

StandardErrorAway::StandardErrorAway() : kept(-1)
{
    if (output_is_away)
        return;
    kept = fcntl(STDERR_FILENO, F_DUPFD_CLOEXEC, 0);
    const int nowhere = open("/dev/null", O_WRONLY | O_CLOEXEC);
    if (nowhere < 0)
        return;
    dup2(nowhere, STDERR_FILENO);
    close(nowhere);
}

StandardErrorAway::~StandardErrorAway()
{
    if (kept < 0)
        return;
    dup2(kept, STDERR_FILENO);
    close(kept);
}

} // namespace zt_platform
