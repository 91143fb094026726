#include "ZT/signals.h"

#include <atomic>
#include <cerrno>
#include <signal.h>
#include <string>
#include <thread>
#include <unistd.h>

#include <gtest/gtest.h>

#include "platform/signal_handler.h"

// Hooks are never removed, so every test has signals of its own.
namespace {

std::string calls;

void note(int, void* name)
{
    calls += *static_cast<char*>(name);
}

char a = 'a', b = 'b', c = 'c';

/// The handler that a signal has now.
ZtSignalHandler handler_of(int signal)
{
    struct sigaction now = {};
    sigaction(signal, nullptr, &now);
    return now.sa_handler;
}

int real_time_signal(int number)
{
    return SIGRTMIN + number;
}

TEST(OnSignal, HooksRunNewestFirst)
{
    calls.clear();
    const int signal = real_time_signal(0);
    OnSignal(signal, note, &a);
    OnSignal(signal, note, &b);

    raise(signal);

    EXPECT_EQ(calls, "ba");
}

TEST(OnSignal, OnlyHooksOnTheDeliveredSignalRun)
{
    calls.clear();
    const int delivered = real_time_signal(1), other = real_time_signal(2);
    OnSignal(delivered, note, &a);
    OnSignal(other, note, &b);

    raise(delivered);

    EXPECT_EQ(calls, "a");
}

TEST(OnSignal, ADeliveryDisarmsEverySignal)
{
    calls.clear();
    const int delivered = real_time_signal(3), other = real_time_signal(4);
    OnSignal(delivered, note, &a);
    OnSignal(other, note, &b);

    raise(delivered);

    EXPECT_EQ(handler_of(delivered), SIG_DFL);
    EXPECT_EQ(handler_of(other), SIG_DFL);
}

TEST(OnSignal, EverySignalIsDisarmedBeforeTheFirstHookRuns)
{
    calls.clear();
    static ZtSignalHandler seen;
    static int other;
    seen = SIG_ERR;
    other = real_time_signal(5);
    OnSignal(other, note, &b);
    OnSignal(
        real_time_signal(6), [](int, void*) { seen = handler_of(other); },
        nullptr);

    raise(real_time_signal(6));

    EXPECT_EQ(seen, SIG_DFL);
}

TEST(OnSignal, TheSecondDeliveryTakesTheDefaultActionDeath)
{
    calls.clear();
    EXPECT_EXIT(
        {
            OnSignal(SIGUSR1, note, &a);
            raise(SIGUSR1);
            if (calls == "a")
                raise(SIGUSR1);
            _exit(1);
        },
        testing::KilledBySignal(SIGUSR1), "");
}

TEST(OnSignal, HookingAgainArmsTheEarlierRecordsToo)
{
    calls.clear();
    const int signal = real_time_signal(7);
    OnSignal(signal, note, &a);
    raise(signal);

    OnSignal(signal, note, &b);
    raise(signal);

    EXPECT_EQ(calls, "aba");
}

TEST(OnSignal, TheSameHandlerHookedTwiceRunsTwice)
{
    calls.clear();
    const int signal = real_time_signal(8);
    OnSignal(signal, note, &a);
    OnSignal(signal, note, &a);

    raise(signal);

    EXPECT_EQ(calls, "aa");
}

TEST(OnSignal, ANullHandlerIsHookedAndDoesNothing)
{
    calls.clear();
    const int signal = real_time_signal(13);
    OnSignal(signal, note, &a);
    OnSignal(signal, nullptr, &b);

    raise(signal);

    EXPECT_EQ(calls, "a");
    EXPECT_EQ(handler_of(signal), SIG_DFL);
}

TEST(OnSignal, AHookGetsItsSignalAndItsData)
{
    calls.clear();
    static int got_signal;
    static void* got_data;
    const int signal = real_time_signal(9);
    int data = 0;
    OnSignal(
        signal,
        [](int number, void* pointer) {
            got_signal = number;
            got_data = pointer;
        },
        &data);

    raise(signal);

    EXPECT_EQ(got_signal, signal);
    EXPECT_EQ(got_data, &data);
}

TEST(OnSignal, AHookAddedByAHookWaitsForTheNextDelivery)
{
    calls.clear();
    static bool again;
    again = true;
    const int signal = real_time_signal(10);
    OnSignal(
        signal,
        [](int number, void*) {
            calls += 'x';
            if (again)
                OnSignal(number, note, &b);
            again = false;
        },
        nullptr);

    raise(signal);
    EXPECT_EQ(calls, "x");

    raise(signal);
    EXPECT_EQ(calls, "xbx");
}

TEST(OnSignal, ReturnsTheHandlerBefore)
{
    calls.clear();
    const int signal = real_time_signal(11);
    ZtSignalHandler ours = [](int) {};
    BSDsignal(signal, ours);

    const ZtSignalHandler before = OnSignal(signal, note, &a);
    const ZtSignalHandler dispatcher = OnSignal(signal, note, &b);

    EXPECT_EQ(before, ours);
    EXPECT_EQ(dispatcher, handler_of(signal));
    BSDsignal(signal, SIG_DFL);
}

TEST(OnSignal, ReturnsFailureForASignalThatCannotBeCaught)
{
    calls.clear();
    EXPECT_EQ(OnSignal(SIGKILL, note, &a), SIG_ERR);
}

/// Refuses to set anything while it lives.
class RefusingHandlers : public zt_platform::SignalHandlers
{
public:
    RefusingHandlers() { install(this); }
    ~RefusingHandlers() { install(nullptr); }
    zt_platform::SignalFunction set(int, zt_platform::SignalFunction) override
    {
        return SIG_ERR;
    }
    zt_platform::SignalFunction by_default() override { return SIG_DFL; }
};

TEST(OnSignal, ARefusedSignalIsHookedAllTheSame)
{
    calls.clear();
    const int signal = real_time_signal(12);
    {
        RefusingHandlers refusing;
        EXPECT_EQ(OnSignal(signal, note, &a), SIG_ERR);
    }

    OnSignal(signal, note, &b);
    raise(signal);

    EXPECT_EQ(calls, "ba");
}

TEST(OnSignal, ErrnoIsKeptForTheInterruptedCode)
{
    calls.clear();
    const int signal = real_time_signal(13);
    OnSignal(
        signal, [](int, void*) { errno = EDOM; }, nullptr);

    errno = ERANGE;
    raise(signal);

    EXPECT_EQ(errno, ERANGE);
}

/// Hooks before `main`, when no static object of the library need be ready.
struct EarlyHook
{
    EarlyHook() { OnSignal(SIGUSR2, note, &c); }
} early_hook;

TEST(OnSignal, CanBeCalledBeforeMain)
{
    calls.clear();
    OnSignal(SIGUSR2, note, &a);

    raise(SIGUSR2);

    EXPECT_EQ(calls, "ac");
}

TEST(BSDsignal, TheHandlerStaysAndItsSignalIsHeldBackWhileItRuns)
{
    static int running, most_at_once, deliveries;
    const int signal = SIGRTMIN + 14;
    BSDsignal(signal, [](int number) {
        ++running;
        ++deliveries;
        most_at_once = running > most_at_once ? running : most_at_once;
        if (deliveries == 1)
            raise(number);
        --running;
    });

    raise(signal);

    EXPECT_EQ(deliveries, 2);
    EXPECT_EQ(most_at_once, 1);
    BSDsignal(signal, SIG_DFL);
}

TEST(BSDsignal, HoldsBackNoOtherSignal)
{
    static bool inner_ran_inside;
    BSDsignal(SIGRTMIN + 14, [](int) { inner_ran_inside = true; });
    BSDsignal(SIGRTMIN + 13, [](int) {
        raise(SIGRTMIN + 14);
        if (!inner_ran_inside)
            _exit(1);
    });

    raise(SIGRTMIN + 13);

    EXPECT_TRUE(inner_ran_inside);
    BSDsignal(SIGRTMIN + 13, SIG_DFL);
    BSDsignal(SIGRTMIN + 14, SIG_DFL);
}

TEST(BSDsignal, InterruptedSystemCallsGoOn)
{
    static int ends[2];
    static std::atomic<bool> reading;
    ASSERT_EQ(pipe(ends), 0);
    const int signal = SIGRTMIN + 14;
    BSDsignal(signal, [](int) {
        const char byte = 'x';
        if (write(ends[1], &byte, 1) != 1)
            _exit(1);
    });
    struct sigaction now = {};
    sigaction(signal, nullptr, &now);
    EXPECT_NE(now.sa_flags & SA_RESTART, 0);
    const pthread_t reader = pthread_self();
    reading = false;
    std::thread sender([reader, signal] {
        while (!reading)
            std::this_thread::yield();
        // Most of the time the reader is inside the call by then.
        for (int wait = 0; wait < 1000; ++wait)
            std::this_thread::yield();
        pthread_kill(reader, signal);
    });

    char byte = 0;
    reading = true;
    const ssize_t got = read(ends[0], &byte, 1);

    EXPECT_EQ(got, 1);
    EXPECT_EQ(byte, 'x');
    sender.join();
    BSDsignal(signal, SIG_DFL);
    close(ends[0]);
    close(ends[1]);
}

TEST(BSDsignal, ReturnsTheHandlerBeforeOrFailureWithErrno)
{
    EXPECT_EQ(BSDsignal(SIGRTMIN + 14, SIG_IGN), SIG_DFL);
    EXPECT_EQ(BSDsignal(SIGRTMIN + 14, SIG_DFL), SIG_IGN);
    errno = 0;
    EXPECT_EQ(BSDsignal(SIGKILL, SIG_DFL), SIG_ERR);
    EXPECT_EQ(errno, EINVAL);
}

} // namespace
