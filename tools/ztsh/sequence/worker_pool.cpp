#include "sequence/worker_pool.h"

#include "exit_code.h"
#include "system/signals.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <exception>
#include <fcntl.h>
#include <iostream>
#include <poll.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace ztsh {

namespace {

constexpr int watch_milliseconds = 100;
constexpr std::chrono::seconds patience(3);

/// The two ends of a pipe that programs started by a worker do not inherit.
struct Pipe
{
    int ends[2] = {-1, -1};

    bool Open() { return pipe2(ends, O_CLOEXEC) == 0; }

    void CloseRead() { close_end(0); }
    void CloseWrite() { close_end(1); }

    ~Pipe()
    {
        CloseRead();
        CloseWrite();
    }

    int TakeRead()
    {
        int taken = ends[0];
        fcntl(taken, F_SETFL, O_NONBLOCK);
        ends[0] = -1;
        return taken;
    }

private:
    void close_end(int which)
    {
        if (ends[which] >= 0)
            close(ends[which]);
        ends[which] = -1;
    }
};

/// Makes the new process a worker: a group of its own, so that one signal
/// reaches whatever it starts, nothing to read, and its output in the pipes.
void become_worker(Pipe& output, Pipe& errors, pid_t shell)
{
    setpgid(0, 0);
    prctl(PR_SET_PDEATHSIG, SIGTERM);
    if (getppid() != shell)
        _exit(ExitSignalBase + SIGTERM);
    int nothing = open("/dev/null", O_RDONLY | O_CLOEXEC);
    dup2(nothing, STDIN_FILENO);
    dup2(output.ends[1], STDOUT_FILENO);
    dup2(errors.ends[1], STDERR_FILENO);
}

[[noreturn]] void do_job(const WorkerPool::Job& job, long index)
{
    int code = ExitReported;
    try {
        code = job(index);
    } catch (const std::exception& fault) {
        std::cerr << "Error: " << fault.what() << "\n";
    }
    std::cout.flush();
    std::cerr.flush();
    std::fflush(nullptr);
    _exit(code);
}

} // namespace

WorkerPool::WorkerPool(int worker_count, Job worker_job)
    : most_workers(worker_count), job(std::move(worker_job))
{}

WorkerPool::~WorkerPool()
{
    stop_all();
}

void WorkerPool::Run(long count, const Taker& take, const Watcher& watch)
{
    long next_to_start = 0;
    while (next_to_start < count || !workers.empty()) {
        while (next_to_start < count && StopSignal() == 0 &&
               workers.size() < static_cast<std::size_t>(most_workers)) {
            if (!start(next_to_start))
                break;
            ++next_to_start;
        }
        if (StopSignal() != 0) {
            stop_all();
            break;
        }
        if (!workers.empty())
            wait_for_news();
        give_finished(take);
        watch(finished_count);
    }
    // After a stop there may be gaps; what is complete is given all the same.
    while (!finished.empty()) {
        next_to_give = std::min_element(finished.begin(), finished.end(),
                                        [](const auto& a, const auto& b) {
                                            return a.index < b.index;
                                        })
                           ->index;
        give_finished(take);
    }
}

/// Starts the worker of a job. Without a process to spare the job waits for a
/// worker to end; if there is none to wait for, the job has failed.
bool WorkerPool::start(long index)
{
    Worker worker;
    worker.result.index = index;
    Pipe output;
    Pipe errors;
    Pipe life;
    std::cout.flush();
    std::cerr.flush();
    std::fflush(nullptr);
    pid_t shell = getpid();
    bool piped = output.Open() && errors.Open() && life.Open();
    worker.process = piped ? fork() : -1;
    if (worker.process < 0) {
        if (!workers.empty())
            return false;
        worker.result.why = std::strerror(errno);
        finished.push_back(worker.result);
        ++finished_count;
        return true;
    }
    if (worker.process == 0) {
        become_worker(output, errors, shell);
        do_job(job, index);
    }
    setpgid(worker.process, worker.process);
    worker.output = output.TakeRead();
    worker.errors = errors.TakeRead();
    worker.life = life.TakeRead();
    workers.push_back(std::move(worker));
    return true;
}

void WorkerPool::wait_for_news()
{
    std::vector<pollfd> waits;
    for (const Worker& worker : workers)
        for (int descriptor : {worker.output, worker.errors, worker.life})
            waits.push_back({descriptor, POLLIN, 0});
    if (poll(waits.data(), waits.size(), watch_milliseconds) <= 0)
        return;
    for (std::size_t i = 0; i < workers.size(); ++i) {
        bool ended = waits[3 * i + 2].revents != 0;
        if (ended || waits[3 * i].revents != 0)
            read_all(workers[i].output, workers[i].result.output);
        if (ended || waits[3 * i + 1].revents != 0)
            read_all(workers[i].errors, workers[i].result.errors);
        if (ended)
            reap(workers[i]);
    }
    std::erase_if(workers, [](const Worker& w) { return w.process < 0; });
}

/// Takes what the pipe holds at the moment and closes it at its end.
void WorkerPool::read_all(int& descriptor, std::string& text)
{
    char bytes[16384];
    while (descriptor >= 0) {
        ssize_t got = read(descriptor, bytes, sizeof bytes);
        if (got > 0) {
            text.append(bytes, static_cast<std::size_t>(got));
        } else if (got < 0 && errno == EINTR) {
            continue;
        } else if (got < 0 && errno == EAGAIN) {
            return;
        } else {
            close(descriptor);
            descriptor = -1;
        }
    }
}

/// Notes how a worker ended and forgets the process. Something it started may
/// still hold its pipes open; nobody waits for that.
void WorkerPool::reap(Worker& worker)
{
    int status = 0;
    while (waitpid(worker.process, &status, 0) < 0 && errno == EINTR) {
    }
    if (WIFSIGNALED(status))
        worker.result.signal = WTERMSIG(status);
    else
        worker.result.code = WEXITSTATUS(status);
    for (int descriptor : {worker.output, worker.errors, worker.life})
        if (descriptor >= 0)
            close(descriptor);
    worker.process = -1;
    bool was_stopped = stopping && (worker.result.signal != 0 ||
                                    worker.result.code > ExitSignalBase);
    if (!was_stopped) {
        finished.push_back(std::move(worker.result));
        ++finished_count;
    }
}

void WorkerPool::give_finished(const Taker& take)
{
    for (;;) {
        auto next = std::find_if(
            finished.begin(), finished.end(),
            [this](const JobResult& r) { return r.index == next_to_give; });
        if (next == finished.end())
            return;
        JobResult result = std::move(*next);
        finished.erase(next);
        ++next_to_give;
        take(result);
    }
}

/// Asks the workers to end; kills those that have not after a while.
void WorkerPool::stop_all()
{
    if (workers.empty())
        return;
    stopping = true;
    signal_all(SIGTERM);
    auto deadline = std::chrono::steady_clock::now() + patience;
    while (!workers.empty()) {
        wait_for_news();
        if (std::chrono::steady_clock::now() > deadline)
            signal_all(SIGKILL);
    }
}

void WorkerPool::signal_all(int signal)
{
    for (const Worker& worker : workers)
        kill(-worker.process, signal);
}

} // namespace ztsh
