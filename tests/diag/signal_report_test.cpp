#include "diag/signal_report.h"

#include <csignal>
#include <string>

#include <gtest/gtest.h>

#include "ZT/error.h"
#include "support/CapturedStderr.h"
#include "support/FailingMemory.h"

// A scope makes ordinary code behave as code in a signal does; the beat's own
// tests prove that it may run in one.
namespace {

using zt_diag::SignalReport;
using zt_diag::SignalScope;

constinit SignalReport error_report("Error: ", "of a signal.\n", 4);
constinit SignalReport warning_report("Warning: ", "of a signal.\n", 3);
constinit SignalReport information("Info: ", "of a signal.\n", 2);
constinit SignalReport never_reserved("Error: ", "unreserved.\n", 4);

/// Keeps what it gets.
class Trap : public ZtErrHandler
{
public:
    explicit Trap(int hold_back = 0) : ZtErrHandler(hold_back) {}
    ~Trap() override
    {
        Release();
        for (int place = 0; place < count; ++place)
            delete errors[place];
    }

    void Handle(ZtErr* error) override
    {
        if (count < limit)
            errors[count++] = error;
    }

    std::string Text() const
    {
        std::string text;
        for (int place = 0; place < count; ++place)
            text += errors[place]->Message();
        return text;
    }

    static constexpr int limit = 1000;
    ZtErr* errors[limit] = {};
    int count = 0;
};

/// Deletes what it gets.
class Sink : public ZtErrHandler
{
public:
    void Handle(ZtErr* error) override
    {
        ++count;
        delete error;
    }

    int count = 0;
};

void PostInSignal(SignalReport& report)
{
    const SignalScope scope;
    report.post();
}

TEST(SignalReport, ReachesThePushedHandlerAtOnce)
{
    error_report.reserve(1);
    Trap trap;

    const SignalScope scope;
    error_report.post();

    ASSERT_EQ(trap.count, 1);
    EXPECT_STREQ(trap.errors[0]->Message(), "Error: of a signal.\n");
    EXPECT_EQ(trap.errors[0]->level, 4);
    EXPECT_EQ(trap.errors[0]->code, 0);
}

TEST(SignalReport, IsAnErrorLikeOthersForItsHandler)
{
    Trap trap;
    error_report.reserve(1);
    errno = EDOM;

    PostInSignal(error_report);

    EXPECT_EQ(trap.errors[0]->stream.str(), "Error: of a signal.\n");
    EXPECT_EQ(trap.errors[0]->SystemError(), EDOM);
    EXPECT_STREQ(trap.errors[0]->ClassName(), "KvoObject");
}

TEST(SignalReport, CountsWhenItIsPostedNotWhenItIsMadeReady)
{
    Trap trap;
    const int before = ZtErr::count;

    warning_report.reserve(5);
    EXPECT_EQ(ZtErr::count, before);
    PostInSignal(warning_report);

    EXPECT_EQ(ZtErr::count, before + 1);
}

TEST(SignalReport, InOrdinaryCodeItIsMadeAndPosted)
{
    Trap trap;

    never_reserved.post();

    EXPECT_EQ(trap.Text(), "Error: unreserved.\n");
}

TEST(SignalReport, TheBottomHandlerPrintsIt)
{
    error_report.reserve(1);
    CapturedStderr captured;

    PostInSignal(error_report);

    EXPECT_EQ(captured.Text(), "Error: of a signal.\n");
}

TEST(SignalReport, BelowTheOutputLevelItIsDropped)
{
    information.reserve(1);
    CapturedStderr captured;
    const int before = ZtErr::count;

    PostInSignal(information);

    EXPECT_EQ(captured.Text(), "");
    EXPECT_EQ(ZtErr::count, before + 1);
}

TEST(SignalReport, WithNoneReadyItIsPrintedAllTheSame)
{
    Trap trap;
    CapturedStderr captured;
    const int before = ZtErr::count;

    PostInSignal(never_reserved);

    EXPECT_EQ(captured.Text(), "Error: unreserved.\n");
    EXPECT_EQ(ZtErr::count, before + 1);
    EXPECT_EQ(trap.count, 0);
}

TEST(SignalReport, WithoutMemoryToMakeOneReadyItIsPrinted)
{
    constinit static SignalReport report("Error: ", "that finds no memory.\n",
                                         4);
    // One request for the error, and two or three for its text.
    for (const long spared : {0, 1, 2}) {
        {
            const FailingMemory no_memory(spared);
            report.reserve(1);
            EXPECT_TRUE(FailingMemory::Failed()) << spared;
        }
        const int before = ZtErr::count;
        CapturedStderr captured;
        PostInSignal(report);
        EXPECT_EQ(captured.Text(), "Error: that finds no memory.\n") << spared;
        EXPECT_EQ(ZtErr::count, before + 1);
    }
}

TEST(SignalReport, WithoutMemoryInOrdinaryCodeItIsPrinted)
{
    CapturedStderr captured;
    {
        const FailingMemory no_memory;
        never_reserved.post();
    }

    EXPECT_EQ(captured.Text(), "Error: unreserved.\n");
}

TEST(SignalReport, ReserveMakesUpWhatWasTaken)
{
    Trap trap;
    error_report.reserve(3);
    {
        const SignalScope scope;
        error_report.reserve(100); // nothing
        for (int count = 0; count < 3; ++count)
            error_report.post();
    }

    error_report.reserve(2);
    {
        const SignalScope scope;
        error_report.post();
        error_report.post();
    }

    EXPECT_EQ(trap.count, 5);
}

TEST(SignalReport, APassedOnErrorGoesDownTheStack)
{
    class PassOn : public ZtErrHandler
    {
    public:
        void Handle(ZtErr* error) override
        {
            ++count;
            ZtErrHandler::Handle(error);
        }
        int count = 0;
    };
    error_report.reserve(1);
    Trap below;
    PassOn above;

    PostInSignal(error_report);

    EXPECT_EQ(above.count, 1);
    EXPECT_EQ(below.count, 1);
}

TEST(SignalReport, DeletedInASignalItIsFreedByOrdinaryCode)
{
    Sink sink;

    for (int round = 0; round < 100; ++round) {
        error_report.reserve(2);
        const SignalScope scope;
        error_report.post();
        error_report.post();
    }

    // The leak checker sees to the rest.
    EXPECT_EQ(sink.count, 200);
}

TEST(SignalReport, KeptInASignalItMayBeDeletedByOrdinaryCode)
{
    Trap trap;
    error_report.reserve(1);

    PostInSignal(error_report);

    EXPECT_EQ(trap.count, 1);
}

TEST(SignalReport, AHeldErrorIsInTheQueueAtTheNextOrdinaryUse)
{
    error_report.reserve(1);
    warning_report.reserve(1);
    Trap trap(1);
    ZtWarning("first\n");

    {
        const SignalScope scope;
        error_report.post();
        warning_report.post();
    }
    ZtWarning("last\n");

    EXPECT_EQ(trap.count, 0);
    EXPECT_EQ(trap.queue.count, 4);
    trap.Release();
    EXPECT_EQ(trap.Text(), "Warning: first\nError: of a signal.\n"
                           "Warning: of a signal.\nWarning: last\n");
}

TEST(SignalReport, PopAndPopTailSeeWhatWasHeldInASignal)
{
    error_report.reserve(1);
    warning_report.reserve(1);
    Trap trap(1);
    {
        const SignalScope scope;
        error_report.post();
        warning_report.post();
    }

    ZtErr* const newest = trap.PopTail();
    ZtErr* const oldest = trap.Pop();

    ASSERT_NE(newest, nullptr);
    ASSERT_NE(oldest, nullptr);
    EXPECT_STREQ(newest->Message(), "Warning: of a signal.\n");
    EXPECT_STREQ(oldest->Message(), "Error: of a signal.\n");
    EXPECT_EQ(trap.Pop(), nullptr);
    delete newest;
    delete oldest;
}

TEST(SignalReport, AHandlerThatIsDestroyedHandlesWhatItHeldInASignal)
{
    error_report.reserve(1);
    Trap below;
    {
        ZtErrHandler holder(1);
        PostInSignal(error_report);
    }

    EXPECT_EQ(below.Text(), "Error: of a signal.\n");
}

TEST(SignalReport, HeldErrorsGoToTheHandlerThatHeldThem)
{
    error_report.reserve(2);
    warning_report.reserve(1);
    Trap below(1);
    PostInSignal(error_report);
    {
        Trap above(1);
        PostInSignal(warning_report);
        above.Release();
        EXPECT_EQ(above.Text(), "Warning: of a signal.\n");
    }
    PostInSignal(error_report);

    below.Release();

    EXPECT_EQ(below.Text(), "Error: of a signal.\nError: of a signal.\n");
}

TEST(SignalReport, WhatFindsNoPlaceToBeHeldIsHandled)
{
    constexpr int places = 256;
    error_report.reserve(places + 3);
    Trap trap(1);

    {
        const SignalScope scope;
        for (int count = 0; count < places + 3; ++count)
            error_report.post();
    }

    EXPECT_EQ(trap.count, 3);
    trap.Release();
    EXPECT_EQ(trap.count, places + 3);
}

TEST(SignalReport, TheRingIsUsedRoundAndRound)
{
    Trap trap(1);

    for (int round = 0; round < 9; ++round) {
        error_report.reserve(100);
        {
            const SignalScope scope;
            for (int count = 0; count < 100; ++count)
                error_report.post();
        }
        ZtWarning("next\n");
    }

    EXPECT_EQ(trap.queue.count, 9 * 101);
}

TEST(SignalReport, AnErrorAtTheAbortLevelAbortsInTheSignalDeath)
{
    error_report.reserve(1);

    EXPECT_EXIT(
        {
            ZtErrHandler::abortLevel = 4;
            PostInSignal(error_report);
        },
        testing::KilledBySignal(SIGABRT), "^Error: of a signal.\n$");
}

TEST(SignalReport, AnAbortInASignalHandlesWhatIsHeldFirstDeath)
{
    error_report.reserve(2);
    warning_report.reserve(2);

    EXPECT_EXIT(
        {
            ZtErrHandler bottom;
            ZtErrHandler holder(1);
            ZtWarning("one\n");
            ZtWarning("two\n");
            ZtErrHandler::abortLevel = 4;
            const SignalScope scope;
            warning_report.post();
            error_report.post();
            ZtErrHandler::Abort();
        },
        testing::KilledBySignal(SIGABRT),
        "^Warning: one\nWarning: two\nWarning: of a signal.\n"
        "Error: of a signal.\n$");
}

TEST(SignalReport, UnreservedAtTheAbortLevelItAbortsTooDeath)
{
    EXPECT_EXIT(
        {
            ZtErrHandler::abortLevel = 4;
            PostInSignal(never_reserved);
        },
        testing::KilledBySignal(SIGABRT), "^Error: unreserved.\n$");
}

} // namespace
