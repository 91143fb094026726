#include "sequence/worker_pool.h"
#include "support/TempDir.h"
#include "system/signals.h"

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <stdexcept>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

using ztsh::JobResult;
using ztsh::WorkerPool;

namespace {

std::vector<JobResult> ResultsOf(int workers, long count,
                                 const WorkerPool::Job& job)
{
    std::vector<JobResult> results;
    WorkerPool pool(workers, job);
    pool.Run(
        count, [&](const JobResult& result) { results.push_back(result); },
        [](long) {});
    return results;
}

/// Tells whether this process has no children left.
bool NoChildren()
{
    return waitpid(-1, nullptr, WNOHANG) == -1 && errno == ECHILD;
}

void WaitFor(const std::string& file)
{
    while (!std::filesystem::exists(file))
        usleep(1000);
}

} // namespace

TEST(WorkerPool, GivesCodesAndOutputInTheOrderOfTheJobs)
{
    auto results = ResultsOf(3, 10, [](long index) {
        std::cout << "out " << index << "\n";
        std::cerr << "err " << index << "\n";
        return static_cast<int>(index);
    });

    ASSERT_EQ(results.size(), 10u);
    for (long i = 0; i < 10; ++i) {
        const JobResult& result = results[static_cast<std::size_t>(i)];
        EXPECT_EQ(result.index, i);
        EXPECT_EQ(result.code, i);
        EXPECT_EQ(result.signal, 0);
        EXPECT_EQ(result.why, "");
        EXPECT_EQ(result.output, "out " + std::to_string(i) + "\n");
        EXPECT_EQ(result.errors, "err " + std::to_string(i) + "\n");
    }
    EXPECT_TRUE(NoChildren());
}

TEST(WorkerPool, KeepsTheOrderWhenTheFirstJobIsTheLastToEnd)
{
    TempDir dir;
    auto results = ResultsOf(2, 5, [&](long index) {
        if (index == 0)
            WaitFor(dir.Path("done"));
        if (index == 4)
            dir.Write("done", "");
        return 0;
    });

    ASSERT_EQ(results.size(), 5u);
    for (long i = 0; i < 5; ++i)
        EXPECT_EQ(results[static_cast<std::size_t>(i)].index, i);
}

TEST(WorkerPool, TakesOutputThatIsLargerThanAPipe)
{
    auto results = ResultsOf(2, 3, [](long) {
        std::cout << std::string(500000, 'o');
        std::cerr << std::string(300000, 'e');
        return 0;
    });

    ASSERT_EQ(results.size(), 3u);
    for (const JobResult& result : results) {
        EXPECT_EQ(result.output, std::string(500000, 'o'));
        EXPECT_EQ(result.errors, std::string(300000, 'e'));
    }
}

TEST(WorkerPool, TellsTheSignalThatEndedAWorker)
{
    auto results = ResultsOf(2, 3, [](long index) {
        std::cerr << "before" << std::flush;
        if (index == 1)
            raise(SIGKILL);
        return 0;
    });

    ASSERT_EQ(results.size(), 3u);
    EXPECT_EQ(results[0].signal, 0);
    EXPECT_EQ(results[1].signal, SIGKILL);
    EXPECT_EQ(results[1].errors, "before");
    EXPECT_EQ(results[2].signal, 0);
}

TEST(WorkerPool, AJobThatThrowsHasFailed)
{
    auto results = ResultsOf(
        1, 1, [](long) -> int { throw std::runtime_error("no luck"); });

    ASSERT_EQ(results.size(), 1u);
    EXPECT_EQ(results[0].code, 1);
    EXPECT_EQ(results[0].errors, "Error: no luck\n");
}

TEST(WorkerPool, DoesNotWaitForWhatAWorkerLeavesRunning)
{
    auto results = ResultsOf(1, 1, [](long) {
        return std::system("sleep 1000 & echo $!") == 0 ? 0 : 1;
    });

    ASSERT_EQ(results.size(), 1u);
    EXPECT_EQ(results[0].code, 0);
    kill(static_cast<pid_t>(std::atol(results[0].output.c_str())), SIGKILL);
}

TEST(WorkerPool, RunsAsManyAtATimeAsItIsTold)
{
    TempDir dir;
    // Each job waits for the other: one at a time would never end.
    auto results = ResultsOf(2, 2, [&](long index) {
        dir.Write(std::to_string(index), "");
        WaitFor(dir.Path(std::to_string(1 - index)));
        return 0;
    });

    EXPECT_EQ(results.size(), 2u);
}

TEST(WorkerPool, AWorkerReadsNothing)
{
    auto results = ResultsOf(1, 1, [](long) {
        char byte = 0;
        return read(STDIN_FILENO, &byte, 1) == 0 ? 0 : 1;
    });

    EXPECT_EQ(results.at(0).code, 0);
}

TEST(WorkerPool, ASignalStopsItWithItsWorkers)
{
    TempDir dir;
    ztsh::CatchStopSignals();
    std::vector<long> given;
    WorkerPool pool(2, [&](long index) {
        if (index == 0)
            return 0;
        dir.Write(std::to_string(index), "");
        while (ztsh::StopSignal() == 0)
            usleep(1000);
        return 128 + ztsh::StopSignal();
    });

    pool.Run(
        100, [&](const JobResult& result) { given.push_back(result.index); },
        [&](long finished) {
            if (finished == 1 && std::filesystem::exists(dir.Path("1")) &&
                ztsh::StopSignal() == 0)
                raise(SIGINT);
        });

    EXPECT_EQ(ztsh::StopSignal(), SIGINT);
    ztsh::ClearStopSignal();
    EXPECT_EQ(given, std::vector<long>{0});
    EXPECT_TRUE(NoChildren());
}

TEST(WorkerPool, NoJobsAreSoonDone)
{
    EXPECT_TRUE(ResultsOf(2, 0, [](long) { return 0; }).empty());
}
