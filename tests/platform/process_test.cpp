#include "platform/process.h"

#include <cerrno>
#include <csignal>
#include <filesystem>
#include <string>

#include <gtest/gtest.h>
#include <sys/time.h>
#include <sys/wait.h>

#include "support/CapturedStderr.h"
#include "support/TempDir.h"

using zt_platform::Processes;

namespace {

/// Puts one signal's action and the mask of signals back.
class SignalsKept
{
public:
    explicit SignalsKept(int kept_signal) : signal(kept_signal)
    {
        sigaction(signal, nullptr, &action);
        sigprocmask(SIG_SETMASK, nullptr, &mask);
    }

    ~SignalsKept()
    {
        sigaction(signal, &action, nullptr);
        sigprocmask(SIG_SETMASK, &mask, nullptr);
    }

private:
    int signal;
    struct sigaction action;
    sigset_t mask;
};

int Shell(const std::string& command)
{
    return Processes::current().run_shell(command.c_str());
}

/// The signals that a command finds ignored ("Ign") or held back ("Blk").
unsigned long SignalsOfACommand(const std::string& which)
{
    TempDir directory;
    Shell("grep Sig" + which + " /proc/self/status > " + directory.Path("out"));
    const std::string line = directory.Read("out");
    return std::stoul(line.substr(line.find('\t') + 1), nullptr, 16);
}

unsigned long Bit(int signal)
{
    return 1ul << (signal - 1);
}

volatile std::sig_atomic_t calls = 0;

void Count(int)
{
    calls = calls + 1;
}

} // namespace

TEST(Processes, RunsACommandInTheShellAndWaits)
{
    TempDir directory;

    const int status = Shell("for word in a b; do echo $word; done > " +
                             directory.Path("out"));

    EXPECT_EQ(status, 0);
    EXPECT_EQ(directory.Read("out"), "a\nb\n");
}

TEST(Processes, TellsHowTheCommandEnded)
{
    const int left = Shell("exit 3");
    const int killed = Shell("kill -KILL $$");

    ASSERT_TRUE(WIFEXITED(left));
    EXPECT_EQ(WEXITSTATUS(left), 3);
    ASSERT_TRUE(WIFSIGNALED(killed));
    EXPECT_EQ(WTERMSIG(killed), SIGKILL);
}

TEST(Processes, ACommandThatBeginsWithAMinusIsNoOption)
{
    CapturedStderr quiet;

    const int status = Shell("-x");

    EXPECT_EQ(WEXITSTATUS(status), 127);
}

TEST(Processes, ACommandThatIsTooLongIsRefused)
{
    EXPECT_EQ(Shell(": " + std::string(10000000, 'x')), -1);
    EXPECT_EQ(errno, E2BIG);
}

TEST(Processes, NullIsNoCommandAndNoDirectory)
{
    EXPECT_EQ(Processes::current().run_shell(nullptr), -1);
    EXPECT_EQ(errno, EINVAL);
    EXPECT_FALSE(Processes::current().change_directory(nullptr));
    EXPECT_EQ(errno, EINVAL);
}

TEST(Processes, ACommandFindsTheAlarmNeitherIgnoredNorHeldBack)
{
    SignalsKept kept(SIGALRM);
    signal(SIGALRM, SIG_IGN);
    sigset_t all;
    sigfillset(&all);
    sigprocmask(SIG_BLOCK, &all, nullptr);

    EXPECT_EQ(SignalsOfACommand("Ign") & Bit(SIGALRM), 0u);
    EXPECT_EQ(SignalsOfACommand("Blk"), 0u);
}

TEST(Processes, ACommandIsNotKilledByOurAlarm)
{
    SignalsKept kept(SIGALRM);
    struct sigaction action = {};
    action.sa_handler = Count; // without SA_RESTART: the waiting is cut short
    sigaction(SIGALRM, &action, nullptr);
    itimerval every_millisecond = {{0, 1000}, {0, 1000}}, off = {};
    setitimer(ITIMER_REAL, &every_millisecond, nullptr);

    const int status = Shell("sleep 0.03; exit 5");

    setitimer(ITIMER_REAL, &off, nullptr);
    EXPECT_EQ(WEXITSTATUS(status), 5);
    EXPECT_GT(calls, 0);
}

TEST(Processes, InterruptAndQuitReachTheCommandOnly)
{
    EXPECT_EQ(WEXITSTATUS(Shell("kill -INT $PPID; kill -QUIT $PPID; exit 4")),
              4);

    const int interrupted = Shell("kill -INT $$; exit 4");
    ASSERT_TRUE(WIFSIGNALED(interrupted));
    EXPECT_EQ(WTERMSIG(interrupted), SIGINT);
}

TEST(Processes, WhatIsIgnoredByThisProcessStaysIgnoredInTheCommand)
{
    SignalsKept kept(SIGINT);
    signal(SIGINT, SIG_IGN);
    SignalsKept kept_too(SIGHUP);
    signal(SIGHUP, SIG_IGN); // as `nohup` does

    const unsigned long ignored = SignalsOfACommand("Ign");

    EXPECT_NE(ignored & Bit(SIGINT), 0u);
    EXPECT_NE(ignored & Bit(SIGHUP), 0u);
    EXPECT_EQ(ignored & Bit(SIGQUIT), 0u);
}

TEST(Processes, OurOwnActionsAreBackAfterwards)
{
    SignalsKept kept(SIGINT);
    signal(SIGINT, Count);
    calls = 0;

    Shell("true");
    raise(SIGINT);

    EXPECT_EQ(calls, 1);
    sigset_t mask;
    sigprocmask(SIG_SETMASK, nullptr, &mask);
    EXPECT_EQ(sigismember(&mask, SIGCHLD), 0);
}

TEST(Processes, AHandlerThatCollectsChildrenDoesNotTakeOurs)
{
    SignalsKept kept(SIGCHLD);
    signal(SIGCHLD, [](int) {
        while (waitpid(-1, nullptr, WNOHANG) > 0) {
        }
    });

    EXPECT_EQ(WEXITSTATUS(Shell("exit 6")), 6);
}

TEST(Processes, ChangesTheDirectory)
{
    const auto before = std::filesystem::current_path();
    TempDir directory;

    const bool there =
        Processes::current().change_directory(directory.Path("").c_str());
    const auto now = std::filesystem::current_path();
    const bool nowhere =
        Processes::current().change_directory(directory.Path("no").c_str());
    std::filesystem::current_path(before);

    EXPECT_TRUE(there);
    EXPECT_TRUE(std::filesystem::equivalent(now, directory.Path("")));
    EXPECT_FALSE(nowhere);
}

TEST(Processes, InstallGivesBackWhatWasInUse)
{
    class Others : public Processes
    {
    public:
        int run_shell(const char*) override { return 7; }
        bool change_directory(const char*) override { return true; }
    };
    Others others;

    Processes* const before = Processes::install(&others);
    const int answer = Shell("anything");
    Processes* const installed = Processes::install(before);

    EXPECT_EQ(answer, 7);
    EXPECT_EQ(before, nullptr);
    EXPECT_EQ(installed, &others);
    EXPECT_NE(&Processes::current(), &others);
}
