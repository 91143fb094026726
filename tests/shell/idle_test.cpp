#include "script/idle.h"
#include "system/waiting.h"

#include <csignal>
#include <unistd.h>

#include <gtest/gtest.h>

using namespace ztsh;
using std::chrono::steady_clock;

namespace {

/// Something to do that is due so many times.
class Chore : public Idle
{
public:
    bool Due() const override { return left > 0; }
    void RunDue() override
    {
        if (left > 0)
            --left;
        ++done;
        if (then)
            then();
    }
    bool Over() const override { return over; }

    long left = 0;
    int done = 0;
    bool over = false;
    std::function<void()> then;
};

/// A pipe, closed at the end.
class Pipe
{
public:
    Pipe() { EXPECT_EQ(pipe(ends), 0); }
    ~Pipe()
    {
        CloseWrite();
        close(ends[0]);
    }
    Pipe(const Pipe&) = delete;
    Pipe& operator=(const Pipe&) = delete;

    int Read() const { return ends[0]; }
    void Write() { EXPECT_EQ(write(ends[1], "x", 1), 1); }
    void CloseWrite()
    {
        if (ends[1] >= 0)
            close(ends[1]);
        ends[1] = -1;
    }

private:
    int ends[2] = {-1, -1};
};

constexpr long always = 1L << 60;

volatile std::sig_atomic_t signals_seen = 0;

void note_signal(int)
{
    signals_seen = signals_seen + 1;
}

WaitEnds In(std::chrono::milliseconds length)
{
    WaitEnds ends;
    ends.deadline = steady_clock::now() + length;
    return ends;
}

} // namespace

TEST(WaitFor, EndsWithInputOrWithItsEnd)
{
    Chore chore;
    Pipe with_input;
    Pipe at_end;
    with_input.Write();
    at_end.CloseWrite();

    EXPECT_EQ(WaitFor({.descriptor = with_input.Read()}, chore), Waited::Input);
    EXPECT_EQ(WaitFor({.descriptor = at_end.Read()}, chore), Waited::Input);
}

TEST(WaitFor, EndsAtTheDeadlineAndNotBefore)
{
    Chore chore;
    WaitEnds ends = In(std::chrono::milliseconds(20));

    EXPECT_EQ(WaitFor(ends, chore), Waited::Deadline);

    EXPECT_GE(steady_clock::now(), *ends.deadline);
    EXPECT_EQ(WaitFor(ends, chore), Waited::Deadline);
}

TEST(WaitFor, DoesWhatIsDueMeanwhile)
{
    Chore chore;
    chore.left = 3;
    Pipe pipe;
    chore.then = [&] {
        if (chore.left == 0)
            pipe.Write();
    };

    EXPECT_EQ(WaitFor({.descriptor = pipe.Read()}, chore), Waited::Input);

    EXPECT_EQ(chore.done, 3);
}

TEST(WaitFor, WhatIsDueAllTheTimeDoesNotKeepItFromItsEnd)
{
    Chore chore;
    chore.left = always;
    Pipe pipe;
    pipe.Write();
    WaitEnds happened;
    happened.happened = [] { return true; };

    EXPECT_EQ(WaitFor({.descriptor = pipe.Read()}, chore), Waited::Input);
    EXPECT_EQ(WaitFor(In(std::chrono::milliseconds(5)), chore),
              Waited::Deadline);
    EXPECT_EQ(WaitFor(happened, chore), Waited::Happened);
}

TEST(WaitFor, DoesWhatIsDueBeforeItEndsWithWhatHappened)
{
    Chore chore;
    chore.left = 1;
    WaitEnds ends;
    ends.happened = [] { return true; };

    EXPECT_EQ(WaitFor(ends, chore), Waited::Happened);

    EXPECT_EQ(chore.done, 1);
}

TEST(WaitFor, GoesOnIfWhatHappenedIsUndone)
{
    Chore chore;
    bool happened = true;
    chore.left = 1;
    chore.then = [&] { happened = false; };
    WaitEnds ends = In(std::chrono::milliseconds(5));
    ends.happened = [&] { return happened; };

    EXPECT_EQ(WaitFor(ends, chore), Waited::Deadline);
}

TEST(WaitFor, IsGivenUp)
{
    Pipe pipe;
    pipe.Write();
    Chore chore;
    chore.left = 2;
    chore.then = [&] { chore.over = true; };

    EXPECT_EQ(WaitFor({.descriptor = pipe.Read()}, chore), Waited::Over);
    EXPECT_EQ(chore.done, 1);
    EXPECT_EQ(WaitFor({.descriptor = pipe.Read()}, chore), Waited::Over);
    EXPECT_EQ(chore.done, 1);
}

TEST(Sleep, ASignalJustBeforeItEndsIt)
{
    std::signal(SIGUSR1, note_signal);
    signals_seen = 0;
    auto awake = [] {
        // Held back: it would be lost on a sleep that began only now.
        std::raise(SIGUSR1);
        EXPECT_EQ(signals_seen, 0);
        return false;
    };

    Woken woken = Sleep(-1, std::nullopt, awake);

    EXPECT_EQ(woken, Woken::Signal);
    EXPECT_EQ(signals_seen, 1);
    std::signal(SIGUSR1, SIG_DFL);
}

TEST(Sleep, WhoIsAwakeOnlyLooks)
{
    Pipe pipe;
    auto awake = [] { return true; };
    auto past = steady_clock::now();

    EXPECT_EQ(Sleep(pipe.Read(), std::nullopt, awake), Woken::Signal);
    EXPECT_EQ(Sleep(pipe.Read(), past, awake), Woken::Deadline);
    pipe.Write();
    EXPECT_EQ(Sleep(pipe.Read(), past, awake), Woken::Input);
}

TEST(Sleep, LeavesTheSignalMaskAsItWas)
{
    sigset_t before;
    sigset_t after;
    sigprocmask(SIG_SETMASK, nullptr, &before);

    Sleep(-1, steady_clock::now(), [] { return false; });

    sigprocmask(SIG_SETMASK, nullptr, &after);
    for (int number = 1; number < 32; ++number)
        EXPECT_EQ(sigismember(&after, number), sigismember(&before, number));
}
