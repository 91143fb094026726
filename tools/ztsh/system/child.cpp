#include "system/child.h"

#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <fcntl.h>
#include <iostream>
#include <poll.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace ztsh {

namespace {

[[noreturn]] void be_the_child(const std::function<int()>& body, int errors,
                               pid_t parent)
{
    // What waits for this, and ends it in time, may be ended itself.
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (getppid() != parent)
        _exit(1);
    rlimit no_core = {0, 0};
    setrlimit(RLIMIT_CORE, &no_core);
    for (int signal : {SIGINT, SIGTERM, SIGSEGV, SIGBUS, SIGABRT, SIGALRM})
        ::signal(signal, SIG_DFL);
    int nothing = open("/dev/null", O_RDWR);
    dup2(nothing, STDIN_FILENO);
    dup2(nothing, STDOUT_FILENO);
    dup2(errors, STDERR_FILENO);
    int code = body();
    std::cerr.flush();
    // As a program ends: what was left to be done at exit is done.
    exit(code);
}

/// Reads until the other end is closed or the time is over.
///
/// Returns: false when the time is over.
bool read_all(int from, std::string& text, int seconds)
{
    using Clock = std::chrono::steady_clock;
    const auto end = Clock::now() + std::chrono::seconds(seconds);
    for (;;) {
        auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
            end - Clock::now());
        if (left.count() <= 0)
            return false;
        pollfd readable = {from, POLLIN, 0};
        int ready = poll(&readable, 1, static_cast<int>(left.count()));
        if (ready < 0 && errno != EINTR)
            return true;
        if (ready <= 0)
            continue;
        char block[4096];
        ssize_t got = read(from, block, sizeof block);
        if (got == 0)
            return true;
        if (got > 0)
            text.append(block, static_cast<std::size_t>(got));
        else if (errno != EINTR)
            return true;
    }
}

} // namespace

ChildEnd RunInChild(const std::function<int()>& body, int seconds)
{
    ChildEnd end;
    int ends[2];
    if (pipe2(ends, O_CLOEXEC) != 0)
        return end;
    std::cout.flush();
    std::cerr.flush();
    std::fflush(nullptr);
    const pid_t parent = getpid();
    pid_t child = fork();
    if (child == 0) {
        close(ends[0]);
        be_the_child(body, ends[1], parent);
    }
    close(ends[1]);
    if (child > 0) {
        end.started = true;
        end.timed_out = !read_all(ends[0], end.errors, seconds);
        if (end.timed_out)
            kill(child, SIGKILL);
        int status = 0;
        while (waitpid(child, &status, 0) < 0 && errno == EINTR)
            ;
        if (WIFSIGNALED(status))
            end.signal = WTERMSIG(status);
        else
            end.code = WEXITSTATUS(status);
    }
    close(ends[0]);
    return end;
}

} // namespace ztsh
