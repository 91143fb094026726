#include "platform/signal_handler.h"

#include <cerrno>
#include <signal.h>
#include <string>
#include <unistd.h>

#include <gtest/gtest.h>

#include "support/CapturedStderr.h"

namespace {

using zt_platform::ErrnoKept;
using zt_platform::SignalHandlers;
using zt_platform::SignalsHeld;

volatile int delivered = 0;

bool IsHeld(int signal)
{
    sigset_t mask;
    pthread_sigmask(SIG_SETMASK, nullptr, &mask);
    return sigismember(&mask, signal) == 1;
}

TEST(SignalHandlers, SetSendsTheSignalAndTellsWhereItWent)
{
    SignalHandlers& handlers = SignalHandlers::current();
    const auto count = [](int) { delivered = delivered + 1; };
    delivered = 0;

    EXPECT_EQ(handlers.set(SIGUSR1, count), SIG_DFL);
    raise(SIGUSR1);
    raise(SIGUSR1);

    EXPECT_EQ(delivered, 2);
    EXPECT_NE(handlers.set(SIGUSR1, handlers.by_default()), SIG_DFL);
    EXPECT_EQ(handlers.set(SIGUSR1, handlers.by_default()), SIG_DFL);
}

TEST(SignalHandlers, ASignalThatCannotBeCaughtIsRefused)
{
    errno = 0;

    EXPECT_EQ(SignalHandlers::current().set(SIGKILL, SIG_IGN), SIG_ERR);
    EXPECT_EQ(errno, EINVAL);
}

TEST(SignalHandlers, ATestMayInstallItsOwn)
{
    class Own : public SignalHandlers
    {
    public:
        zt_platform::SignalFunction set(int,
                                        zt_platform::SignalFunction) override
        {
            return SIG_IGN;
        }
        zt_platform::SignalFunction by_default() override { return SIG_DFL; }
    };
    Own own;

    EXPECT_EQ(SignalHandlers::install(&own), nullptr);
    EXPECT_EQ(&SignalHandlers::current(), &own);
    EXPECT_EQ(SignalHandlers::install(nullptr), &own);
    EXPECT_NE(&SignalHandlers::current(), &own);
}

TEST(SignalsHeld, WaitUntilTheEnd)
{
    delivered = 0;
    signal(SIGUSR1, [](int) { delivered = delivered + 1; });
    {
        const SignalsHeld held;
        raise(SIGUSR1);
        EXPECT_EQ(delivered, 0);
    }

    EXPECT_EQ(delivered, 1);
    signal(SIGUSR1, SIG_DFL);
}

TEST(SignalsHeld, FaultsAreNotHeld)
{
    const SignalsHeld held;

    for (const int fault : {SIGBUS, SIGFPE, SIGILL, SIGSEGV, SIGTRAP})
        EXPECT_FALSE(IsHeld(fault)) << fault;
    for (const int other : {SIGALRM, SIGINT, SIGTERM, SIGUSR2, SIGCHLD})
        EXPECT_TRUE(IsHeld(other)) << other;
}

TEST(SignalsHeld, NestAndLeaveWhatWasHeldBefore)
{
    sigset_t one;
    sigemptyset(&one);
    sigaddset(&one, SIGUSR2);
    pthread_sigmask(SIG_BLOCK, &one, nullptr);
    {
        const SignalsHeld outer;
        {
            const SignalsHeld inner;
        }
        EXPECT_TRUE(IsHeld(SIGALRM));
    }

    EXPECT_FALSE(IsHeld(SIGALRM));
    EXPECT_TRUE(IsHeld(SIGUSR2));
    pthread_sigmask(SIG_UNBLOCK, &one, nullptr);
}

TEST(ErrnoKept, IsPutBack)
{
    errno = ERANGE;
    {
        const ErrnoKept kept;
        errno = EDOM;
    }

    EXPECT_EQ(errno, ERANGE);
}

TEST(WriteStandardError, WritesTheTextAndKeepsErrno)
{
    const std::string text(100000, 'x');
    CapturedStderr captured;
    errno = ERANGE;

    zt_platform::write_standard_error(text.c_str());
    zt_platform::write_standard_error("");
    zt_platform::write_standard_error("%s%n\n");

    EXPECT_EQ(errno, ERANGE);
    EXPECT_EQ(captured.Text(), text + "%s%n\n");
}

TEST(WriteStandardError, GivesUpWhenStandardErrorIsClosed)
{
    const int kept = dup(STDERR_FILENO);
    close(STDERR_FILENO);

    zt_platform::write_standard_error("nobody reads this\n");

    dup2(kept, STDERR_FILENO);
    close(kept);
}

} // namespace
