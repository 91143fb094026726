#include "platform/quiet_thread.h"

#include <atomic>
#include <fcntl.h>
#include <signal.h>
#include <string>
#include <sys/stat.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

#include <gtest/gtest.h>

#include "support/CapturedStderr.h"

namespace {
using zt_platform::QuietThread;
using zt_platform::StandardErrorAway;

struct Seen
{
    sigset_t held;
    sigset_t held_by_child;
    bool ran;
};

void LookAround(void* data)
{
    auto* const seen = static_cast<Seen*>(data);
    pthread_sigmask(SIG_BLOCK, nullptr, &seen->held);
    std::thread child(
        [seen] { pthread_sigmask(SIG_BLOCK, nullptr, &seen->held_by_child); });
    child.join();
    seen->ran = true;
}

void Print(void*)
{
    const char text[] = "noise\n";
    if (write(STDERR_FILENO, text, sizeof text - 1) < 0)
        return;
}

bool Starts(QuietThread& thread, void (*work)(void*), void* data,
            QuietThread::Output output)
{
    return thread.start(work, data, output);
}
} // namespace

TEST(QuietThread, RunsItsWork)
{
    Seen seen = {};
    QuietThread thread;

    EXPECT_FALSE(thread.runs());
    ASSERT_TRUE(Starts(thread, LookAround, &seen, QuietThread::Output::Shared));
    EXPECT_TRUE(thread.runs());
    thread.join();

    EXPECT_TRUE(seen.ran);
    EXPECT_FALSE(thread.runs());
}

TEST(QuietThread, HoldsSignalsBackAndSoDoItsOwnThreads)
{
    Seen seen = {};
    QuietThread thread;
    ASSERT_TRUE(Starts(thread, LookAround, &seen, QuietThread::Output::Shared));
    thread.join();

    for (const int signal : {SIGALRM, SIGINT, SIGTERM, SIGCHLD, SIGUSR1}) {
        EXPECT_EQ(sigismember(&seen.held, signal), 1) << signal;
        EXPECT_EQ(sigismember(&seen.held_by_child, signal), 1) << signal;
    }
    EXPECT_EQ(sigismember(&seen.held, SIGSEGV), 0);
    sigset_t here;
    pthread_sigmask(SIG_BLOCK, nullptr, &here);
    EXPECT_EQ(sigismember(&here, SIGALRM), 0);
}

TEST(QuietThread, WithItsOutputAwayPrintsNothingAndLeavesOthersAlone)
{
    CapturedStderr captured;
    QuietThread thread;

    ASSERT_TRUE(Starts(thread, Print, nullptr, QuietThread::Output::Away));
    thread.join();
    Print(nullptr);

    EXPECT_EQ(captured.Text(), "noise\n");
}

TEST(QuietThread, WithItsOutputSharedPrintsLikeTheProcess)
{
    CapturedStderr captured;
    QuietThread thread;

    ASSERT_TRUE(Starts(thread, Print, nullptr, QuietThread::Output::Shared));
    thread.join();

    EXPECT_EQ(captured.Text(), "noise\n");
}

// The end of a pipe comes when its last writer closes it, so a thread that
// goes on must not be one.
TEST(QuietThread, WithItsOutputAwayHoldsNoPipeOpen)
{
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    static std::atomic<bool> is_away = false;
    static std::atomic<bool> may_end = false;
    QuietThread thread;
    ASSERT_TRUE(Starts(
        thread,
        [](void*) {
            is_away = true;
            while (!may_end)
                std::this_thread::yield();
        },
        nullptr, QuietThread::Output::Away));
    while (!is_away)
        std::this_thread::yield();

    close(ends[1]);
    char byte = 0;
    const ssize_t got = read(ends[0], &byte, 1);
    may_end = true;
    thread.join();

    EXPECT_EQ(got, 0);
    close(ends[0]);
}

TEST(QuietThread, DoesNotRunInAForkedChild)
{
    static std::atomic<bool> may_end = false;
    QuietThread thread;
    ASSERT_TRUE(Starts(
        thread,
        [](void*) {
            while (!may_end)
                std::this_thread::yield();
        },
        nullptr, QuietThread::Output::Shared));

    const pid_t child = fork();
    if (child == 0) {
        const bool runs = thread.runs();
        thread.join();
        _exit(runs ? 1 : 0);
    }
    int status = -1;
    while (waitpid(child, &status, 0) < 0) {
    }
    may_end = true;
    thread.join();

    EXPECT_EQ(status, 0);
}

TEST(StandardErrorAway, SilencesWhatIsPrintedMeanwhile)
{
    CapturedStderr captured;
    {
        const StandardErrorAway away;
        Print(nullptr);
    }
    Print(nullptr);

    EXPECT_EQ(captured.Text(), "noise\n");
}
