#include "platform/process.h"

#include <cerrno>
#include <signal.h>
#include <spawn.h>
#include <sys/types.h>
#include <sys/wait.h>
#include <unistd.h>

namespace zt_platform {

namespace {

constexpr char shell[] = "/bin/sh";

/// While a command runs in the foreground, the terminal's interrupt and quit
/// are the command's, and the end of a child is ours to collect.
class ForegroundSignals
{
public:
    ForegroundSignals()
    {
        struct sigaction ignored = {};
        ignored.sa_handler = SIG_IGN;
        sigemptyset(&ignored.sa_mask);
        sigaction(SIGINT, &ignored, &interrupt);
        sigaction(SIGQUIT, &ignored, &quit);
        sigset_t child_ended;
        sigemptyset(&child_ended);
        sigaddset(&child_ended, SIGCHLD);
        pthread_sigmask(SIG_BLOCK, &child_ended, &mask);
    }

    ~ForegroundSignals()
    {
        const int kept = errno;
        pthread_sigmask(SIG_SETMASK, &mask, nullptr);
        sigaction(SIGINT, &interrupt, nullptr);
        sigaction(SIGQUIT, &quit, nullptr);
        errno = kept;
    }

    ForegroundSignals(const ForegroundSignals&) = delete;
    ForegroundSignals& operator=(const ForegroundSignals&) = delete;

    /// Gives the signals that the command starts with at their default: ours,
    /// unless this process was itself told to ignore them, and the beat's.
    sigset_t for_the_command() const
    {
        sigset_t signals;
        sigemptyset(&signals);
        sigaddset(&signals, SIGALRM);
        if (interrupt.sa_handler != SIG_IGN)
            sigaddset(&signals, SIGINT);
        if (quit.sa_handler != SIG_IGN)
            sigaddset(&signals, SIGQUIT);
        return signals;
    }

private:
    struct sigaction interrupt;
    struct sigaction quit;
    sigset_t mask;
};

/// How a command starts: nothing held back, some signals at their default.
class SpawnAttributes
{
public:
    explicit SpawnAttributes(const sigset_t& defaults)
    {
        sigset_t none;
        sigemptyset(&none);
        posix_spawnattr_init(&attributes);
        posix_spawnattr_setsigmask(&attributes, &none);
        posix_spawnattr_setsigdefault(&attributes, &defaults);
        posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETSIGMASK |
                                                  POSIX_SPAWN_SETSIGDEF);
    }

    ~SpawnAttributes() { posix_spawnattr_destroy(&attributes); }

    SpawnAttributes(const SpawnAttributes&) = delete;
    SpawnAttributes& operator=(const SpawnAttributes&) = delete;

    const posix_spawnattr_t* get() const { return &attributes; }

private:
    posix_spawnattr_t attributes;
};

class PosixProcesses final : public Processes
{
public:
    int run_shell(const char* command) override
    {
        if (!command) {
            errno = EINVAL;
            return -1;
        }
        const ForegroundSignals signals;
        const SpawnAttributes attributes(signals.for_the_command());
        // A command that begins with a minus is no option.
        const char* const words[] = {"sh", "-c", "--", command, nullptr};
        pid_t child = -1;
        const int failure =
            posix_spawn(&child, shell, nullptr, attributes.get(),
                        const_cast<char* const*>(words), environ);
        if (failure != 0) {
            errno = failure;
            return -1;
        }
        int status = -1;
        pid_t ended = -1;
        do {
            ended = waitpid(child, &status, 0);
        } while (ended < 0 && errno == EINTR);
        return ended == child ? status : -1;
    }

    bool change_directory(const char* path) override
    {
        if (!path) {
            errno = EINVAL;
            return false;
        }
        return chdir(path) == 0;
    }
};

constinit PosixProcesses posix_processes;
constinit Processes* installed = nullptr;

} // namespace

Processes& Processes::current()
{
    return installed ? *installed : posix_processes;
}

Processes* Processes::install(Processes* other)
{
    Processes* const before = installed;
    installed = other;
    return before;
}

} // namespace zt_platform
