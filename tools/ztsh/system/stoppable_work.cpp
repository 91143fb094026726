#include "system/stoppable_work.h"

#include "exit_code.h"
#include "system/signals.h"
#include "system/waiting.h"

#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <exception>
#include <fcntl.h>
#include <iostream>
#include <optional>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace ztsh {

namespace {

using Clock = std::chrono::steady_clock;

/// Nothing may be left in a buffer that two processes would write.
void flush_all()
{
    std::cout.flush();
    std::cerr.flush();
    std::fflush(nullptr);
}

[[noreturn]] void do_in_child(const std::function<void()>& work, int errors,
                              pid_t shell)
{
    setpgid(0, 0);
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (getppid() != shell)
        _exit(ExitReported);
    dup2(errors, STDERR_FILENO);
    try {
        work();
    } catch (const std::exception& fault) {
        std::cerr << "Error: " << fault.what() << "\n";
    }
    flush_all();
    _exit(ExitWell);
}

/// Takes what comes out of the pipe until it ends, the time is over or the
/// shell is asked to stop.
WorkEnd read_to_end(int errors,
                    const std::optional<Clock::time_point>& deadline,
                    const std::function<void(const std::string&)>& take)
{
    char bytes[4096];
    for (;;) {
        const Woken woken =
            Sleep(errors, deadline, [] { return StopSignal() != 0; });
        if (StopSignal() != 0)
            return WorkEnd::Stopped;
        if (woken == Woken::Deadline)
            return WorkEnd::TimedOut;
        if (woken != Woken::Input)
            continue;
        const ssize_t got = read(errors, bytes, sizeof bytes);
        if (got > 0)
            take(std::string(bytes, static_cast<std::size_t>(got)));
        else if (got == 0 || errno != EINTR)
            return WorkEnd::Done;
    }
}

} // namespace

WorkEnd DoStoppably(const std::function<void()>& work, double seconds,
                    const std::function<void(const std::string&)>& take)
{
    int errors[2] = {-1, -1};
    if (pipe2(errors, O_CLOEXEC) != 0)
        return WorkEnd::NotStarted;
    std::optional<Clock::time_point> deadline;
    if (seconds > 0)
        deadline = Clock::now() + std::chrono::duration_cast<Clock::duration>(
                                      std::chrono::duration<double>(seconds));
    flush_all();
    const pid_t shell = getpid();
    const pid_t child = fork();
    if (child == 0)
        do_in_child(work, errors[1], shell);
    close(errors[1]);
    if (child < 0) {
        close(errors[0]);
        return WorkEnd::NotStarted;
    }
    WorkEnd end = read_to_end(errors[0], deadline, take);
    close(errors[0]);
    if (end != WorkEnd::Done)
        kill(child, SIGKILL);
    int status = 0;
    while (waitpid(child, &status, 0) < 0 && errno == EINTR) {
    }
    if (end == WorkEnd::Done && WIFSIGNALED(status))
        end = WorkEnd::Crashed;
    return end;
}

} // namespace ztsh
