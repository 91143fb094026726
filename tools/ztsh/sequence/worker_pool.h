#ifndef ZTSH_SEQUENCE_WORKER_POOL_H
#define ZTSH_SEQUENCE_WORKER_POOL_H

/// \file
/// Numbered jobs in worker processes, one process a job.
///
/// A worker is a copy of the shell as it stood when the job began, so no job
/// sees what another one did, and one that crashes takes nobody with it. What
/// a worker writes is collected and given whole, so lines never mix.

#include <functional>
#include <string>
#include <sys/types.h>
#include <vector>

namespace ztsh {

/// What came of a job.
struct JobResult
{
    long index = 0;
    int code = 0;       ///< What the job returned, 0..255.
    int signal = 0;     ///< The signal that ended its worker, 0 if none did.
    std::string why;    ///< Why no worker could be started; empty if one was.
    std::string output; ///< What it wrote to standard output.
    std::string errors; ///< What it wrote to standard error.
};

/// Runs jobs in at most a given number of processes at a time.
class WorkerPool
{
public:
    /// Does the job of that index, in the worker; the result is the worker's
    /// exit code.
    using Job = std::function<int(long index)>;
    /// Takes a result, in the shell.
    using Taker = std::function<void(const JobResult& result)>;
    /// Is called now and then while workers run.
    using Watcher = std::function<void(long finished)>;

    /// Units: `worker_count` at least 1.
    WorkerPool(int worker_count, Job worker_job);

    /// Stops workers that still run.
    ~WorkerPool();
    WorkerPool(const WorkerPool&) = delete;
    WorkerPool& operator=(const WorkerPool&) = delete;

    /// Runs the jobs 0 to `count` - 1 and gives their results in that order.
    ///
    /// A stop signal ends the run: workers are asked to end and, if they do
    /// not, killed; only jobs that were complete are given.
    void Run(long count, const Taker& take, const Watcher& watch);

private:
    struct Worker
    {
        pid_t process = -1;
        int output = -1;
        int errors = -1;
        int life = -1; ///< Ends when the worker does.
        JobResult result;
    };

    bool start(long index);
    void wait_for_news();
    void read_all(int& descriptor, std::string& text);
    void reap(Worker& worker);
    void give_finished(const Taker& take);
    void stop_all();
    void signal_all(int signal);

    int most_workers;
    Job job;
    std::vector<Worker> workers;
    std::vector<JobResult> finished; ///< Not given yet, in no order.
    long next_to_give = 0;
    long finished_count = 0;
    bool stopping = false;
};

} // namespace ztsh

#endif
