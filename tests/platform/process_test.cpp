#include "platform/process.h"

#include <cerrno>
#include <csignal>
#include <filesystem>
#include <string>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <unistd.h>

#include "support/CapturedStderr.h"
#include "support/FakeProcesses.h"
#include "support/InAChild.h"
#include "support/TempDir.h"

using zt_platform::Processes;
using zt_platform::ShellLine;
using zt_platform::ShellOutput;

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

namespace {

std::string OutputOf(const std::string& command)
{
    ShellOutput output(command.c_str());
    std::string text;
    char piece[7];
    while (const std::size_t bytes = output.read(piece, sizeof piece))
        text.append(piece, bytes);
    return text;
}

int OpenFiles()
{
    int count = 0;
    for ([[maybe_unused]] const auto& file :
         std::filesystem::directory_iterator("/proc/self/fd"))
        ++count;
    return count;
}

} // namespace

TEST(ShellOutput, IsReadToTheEnd)
{
    const int before = OpenFiles();

    EXPECT_EQ(OutputOf("echo one; echo two three"), "one\ntwo three\n");
    EXPECT_EQ(OutputOf("head -c 200000 /dev/zero").size(), 200000u);
    EXPECT_EQ(OutputOf(":"), "");
    EXPECT_EQ(OpenFiles(), before);
    EXPECT_EQ(waitpid(-1, nullptr, WNOHANG), -1);
    EXPECT_EQ(errno, ECHILD);
}

TEST(ShellOutput, OfALineThatBeginsWithAMinusIsNoOption)
{
    CapturedStderr quiet;

    EXPECT_EQ(OutputOf("-x; echo on"), "on\n");
}

TEST(ShellOutput, IsReadToTheEndThoughNobodyWantsIt)
{
    TempDir directory;

    {
        ShellOutput output(
            ("head -c 200000 /dev/zero; echo end > " + directory.Path("end"))
                .c_str());
        EXPECT_TRUE(output.was_started());
    }

    EXPECT_EQ(directory.Read("end"), "end\n");
}

TEST(ShellOutput, IsWaitedForEvenWhenItIsClosedEarly)
{
    TempDir directory;

    OutputOf("exec >&-; sleep 0.03; echo end > " + directory.Path("end"));

    EXPECT_EQ(directory.Read("end"), "end\n");
}

TEST(ShellOutput, IsWholeThoughOurAlarmInterrupts)
{
    SignalsKept kept(SIGALRM);
    struct sigaction action = {};
    action.sa_handler = Count; // without SA_RESTART: the reading is cut short
    sigaction(SIGALRM, &action, nullptr);
    calls = 0;
    itimerval every_millisecond = {{0, 1000}, {0, 1000}}, off = {};
    setitimer(ITIMER_REAL, &every_millisecond, nullptr);

    const std::string text = OutputOf("sleep 0.03; echo whole; sleep 0.01");

    setitimer(ITIMER_REAL, &off, nullptr);
    EXPECT_EQ(text, "whole\n");
    EXPECT_GT(calls, 0);
}

TEST(ShellOutput, ItsLineFindsTheAlarmNeitherIgnoredNorHeldBack)
{
    SignalsKept kept(SIGALRM);
    SignalsKept kept_too(SIGHUP);
    signal(SIGALRM, SIG_IGN);
    signal(SIGHUP, SIG_IGN); // as `nohup` does
    sigset_t all;
    sigfillset(&all);
    sigprocmask(SIG_BLOCK, &all, nullptr);

    const std::string ignored = OutputOf("grep SigIgn /proc/self/status");
    const std::string held = OutputOf("grep SigBlk /proc/self/status");

    const unsigned long ignored_bits =
        std::stoul(ignored.substr(8), nullptr, 16);
    EXPECT_EQ(ignored_bits & Bit(SIGALRM), 0u);
    EXPECT_NE(ignored_bits & Bit(SIGHUP), 0u);
    EXPECT_EQ(std::stoul(held.substr(8), nullptr, 16), 0u);
}

TEST(ShellOutput, OfALineThatIsKilledIsWhatItWrote)
{
    EXPECT_EQ(OutputOf("echo before; kill -KILL $$"), "before\n");
}

TEST(ShellOutput, OtherCommandsDoNotHoldThePipe)
{
    const std::string held_alone = OutputOf("ls /proc/self/fd");
    ShellLine line;
    ASSERT_TRUE(Processes::current().start_shell("echo one", line));
    const std::string held_beside = OutputOf("ls /proc/self/fd");
    const int flags = fcntl(line.pipe, F_GETFD);
    Processes::current().end_shell(line);

    EXPECT_EQ(held_beside, held_alone);
    EXPECT_EQ(flags & FD_CLOEXEC, FD_CLOEXEC);
    EXPECT_EQ(line.pipe, -1);
}

TEST(ShellOutput, ComesThroughWhenOurOwnOutputIsClosedInAChild)
{
    RunInAChild([] {
        close(0);
        close(1);
        EXPECT_EQ(OutputOf("echo one"), "one\n");
    });
}

TEST(ShellOutput, IsEmptyWhenNothingCanBeStarted)
{
    ShellOutput none(nullptr);
    ShellOutput too_long((": " + std::string(10000000, 'x')).c_str());
    char piece[4];

    EXPECT_FALSE(none.was_started());
    EXPECT_EQ(none.read(piece, sizeof piece), 0u);
    EXPECT_FALSE(too_long.was_started());
    EXPECT_EQ(too_long.read(piece, sizeof piece), 0u);
}

TEST(ShellOutput, TellsWhyItCannotBeStarted)
{
    ShellLine line;
    const int before = OpenFiles();

    EXPECT_FALSE(Processes::current().start_shell(nullptr, line));
    EXPECT_EQ(errno, EINVAL);
    EXPECT_FALSE(Processes::current().start_shell(
        (": " + std::string(10000000, 'x')).c_str(), line));
    EXPECT_EQ(errno, E2BIG);
    EXPECT_EQ(line.pipe, -1);
    EXPECT_EQ(OpenFiles(), before);
}

TEST(ShellOutput, CannotBeStartedWithoutFilesLeftInAChild)
{
    RunInAChild([] {
        // Room for one file more, but a pipe has two ends.
        const int next = dup(2);
        close(next);
        rlimit files = {static_cast<rlim_t>(next) + 1,
                        static_cast<rlim_t>(next) + 1};
        setrlimit(RLIMIT_NOFILE, &files);
        ShellLine line;
        EXPECT_FALSE(Processes::current().start_shell("echo", line));
        EXPECT_EQ(errno, EMFILE);
        EXPECT_EQ(dup(2), next);
    });
}

TEST(ShellOutput, IsTheSameInPiecesAndPastInterruptions)
{
    FakeProcesses processes;
    processes.output = "one two three four";
    processes.most_at_once = 1;
    processes.interrupts = true;

    EXPECT_EQ(OutputOf("anything"), "one two three four");
    EXPECT_EQ(processes.running, 0);
}

TEST(ShellOutput, EndsAtAFault)
{
    FakeProcesses processes;
    processes.output = "one two three four";
    processes.read_ends = 5;

    EXPECT_EQ(OutputOf("anything"), "one t");
    EXPECT_EQ(processes.running, 0);
}

TEST(Processes, AProgramIsARegularFileThatMayBeExecuted)
{
    namespace fs = std::filesystem;
    TempDir directory;
    const std::string file = directory.Write("file", "");
    const std::string link = directory.Path("link");
    fs::create_symlink(file, link);
    fs::create_directory(directory.Path("folder"));
    mkfifo(directory.Path("fifo").c_str(), 0777);
    Processes& processes = Processes::current();

    EXPECT_FALSE(processes.is_program(file.c_str()));
    fs::permissions(file, fs::perms::owner_all);
    EXPECT_TRUE(processes.is_program(file.c_str()));
    EXPECT_TRUE(processes.is_program(link.c_str()));
    EXPECT_FALSE(processes.is_program(directory.Path("folder").c_str()));
    EXPECT_FALSE(processes.is_program(directory.Path("fifo").c_str()));
    EXPECT_FALSE(processes.is_program(directory.Path("none").c_str()));
    EXPECT_FALSE(processes.is_program(""));
    EXPECT_FALSE(processes.is_program(nullptr));
}

TEST(Processes, ATestHasNoRaisedRights)
{
    EXPECT_FALSE(Processes::current().has_raised_rights());
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
    Processes* const system = &Processes::current();
    FakeProcesses others;
    others.result = 7;

    const int answer = Shell("anything");
    Processes* const installed = Processes::install(nullptr);
    Processes* const in_use = &Processes::current();
    Processes* const before = Processes::install(&others);

    EXPECT_EQ(answer, 7);
    EXPECT_EQ(installed, &others);
    EXPECT_EQ(in_use, system);
    EXPECT_EQ(before, nullptr);
}
