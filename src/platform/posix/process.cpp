#include "platform/process.h"

#include <cerrno>
#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/auxv.h>
#include <sys/stat.h>
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

/// What a command's files are: ours, but for the output when it has a pipe.
class SpawnFiles
{
public:
    SpawnFiles() { posix_spawn_file_actions_init(&actions); }

    ~SpawnFiles() { posix_spawn_file_actions_destroy(&actions); }

    SpawnFiles(const SpawnFiles&) = delete;
    SpawnFiles& operator=(const SpawnFiles&) = delete;

    /// Lets the command write into `pipe`, which is closed in it otherwise.
    ///
    /// Returns: 0, or the error number.
    int write_to(int pipe)
    {
        return posix_spawn_file_actions_adddup2(&actions, pipe, STDOUT_FILENO);
    }

    const posix_spawn_file_actions_t* get() const { return &actions; }

private:
    posix_spawn_file_actions_t actions;
};

/// Starts `command` in the shell.
///
/// Returns: 0, or the error number.
int spawn_shell(const char* command, const posix_spawn_file_actions_t* files,
                const posix_spawnattr_t* attributes, pid_t& child)
{
    // A command that begins with a minus is no option.
    const char* const words[] = {"sh", "-c", "--", command, nullptr};
    return posix_spawn(&child, shell, files, attributes,
                       const_cast<char* const*>(words), environ);
}

/// Waits for a child of ours to end.
///
/// Returns: what the system tells of its end; -1 with `errno` set when it
///          tells nothing.
int wait_for(pid_t child)
{
    int status = -1;
    pid_t ended = -1;
    do {
        ended = waitpid(child, &status, 0);
    } while (ended < 0 && errno == EINTR);
    return ended == child ? status : -1;
}

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
        pid_t child = -1;
        const int failure =
            spawn_shell(command, nullptr, attributes.get(), child);
        if (failure != 0) {
            errno = failure;
            return -1;
        }
        return wait_for(child);
    }

    bool start_shell(const char* command, ShellLine& line) override
    {
        if (!command) {
            errno = EINVAL;
            return false;
        }
        int ends[2];
        if (pipe2(ends, O_CLOEXEC) != 0)
            return false;
        const pid_t child = start_writer(command, ends[1]);
        const int kept = errno;
        ::close(ends[1]);
        if (child < 0) {
            ::close(ends[0]);
            errno = kept;
            return false;
        }
        line.pipe = ends[0];
        line.process = child;
        return true;
    }

    std::ptrdiff_t read_output(const ShellLine& line, void* to,
                               std::size_t bytes) override
    {
        return ::read(line.pipe, to, bytes);
    }

    void end_shell(ShellLine& line) override
    {
        ::close(line.pipe);
        wait_for(static_cast<pid_t>(line.process));
        line = ShellLine();
    }

    bool is_program(const char* path) override
    {
        struct stat about;
        return path && ::stat(path, &about) == 0 && S_ISREG(about.st_mode) &&
               ::access(path, X_OK) == 0;
    }

    bool has_raised_rights() override { return getauxval(AT_SECURE) != 0; }

    bool change_directory(const char* path) override
    {
        if (!path) {
            errno = EINVAL;
            return false;
        }
        return chdir(path) == 0;
    }

private:
    /// Starts `command` with its output in `pipe`; -1 with `errno` set when it
    /// could not be.
    static pid_t start_writer(const char* command, int pipe)
    {
        sigset_t defaults;
        sigemptyset(&defaults);
        sigaddset(&defaults, SIGALRM);
        const SpawnAttributes attributes(defaults);
        SpawnFiles files;
        pid_t child = -1;
        int failure = files.write_to(pipe);
        if (failure == 0)
            failure =
                spawn_shell(command, files.get(), attributes.get(), child);
        errno = failure;
        return failure == 0 ? child : -1;
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
