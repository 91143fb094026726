#include "system/signals.h"

#include "exit_code.h"

#include <csignal>
#include <initializer_list>
#include <unistd.h>

namespace ztsh {

namespace {

volatile std::sig_atomic_t pending_signal = 0;
volatile std::sig_atomic_t waiting_for_command = 0;

void note_signal(int signal)
{
    if (pending_signal != 0 || (waiting_for_command && signal != SIGINT))
        _exit(ExitSignalBase + signal);
    pending_signal = signal;
}

/// Programs that the shell starts get the default back, which they would not
/// if the signal were ignored.
void do_nothing(int) {}

} // namespace

void CatchStopSignals()
{
    struct sigaction file_too_large = {};
    file_too_large.sa_handler = do_nothing;
    sigemptyset(&file_too_large.sa_mask);
    sigaction(SIGXFSZ, &file_too_large, nullptr);
    for (int signal : {SIGINT, SIGTERM, SIGHUP}) {
        struct sigaction present = {};
        sigaction(signal, nullptr, &present);
        if (present.sa_handler == SIG_IGN)
            continue;
        // No SA_RESTART: a read that waits for input has to return.
        struct sigaction action = {};
        action.sa_handler = note_signal;
        sigemptyset(&action.sa_mask);
        sigaction(signal, &action, nullptr);
    }
}

int StopSignal()
{
    return pending_signal;
}

void ClearStopSignal()
{
    pending_signal = 0;
}

CommandWait::CommandWait()
{
    // A signal that is blocked stays pending even while it is ignored; it is
    // delivered when the library has put our handler back and this is over.
    sigset_t interrupt;
    sigemptyset(&interrupt);
    sigaddset(&interrupt, SIGINT);
    sigprocmask(SIG_BLOCK, &interrupt, nullptr);
    waiting_for_command = 1;
}

CommandWait::~CommandWait()
{
    waiting_for_command = 0;
    sigset_t interrupt;
    sigemptyset(&interrupt);
    sigaddset(&interrupt, SIGINT);
    sigprocmask(SIG_UNBLOCK, &interrupt, nullptr);
}

} // namespace ztsh
