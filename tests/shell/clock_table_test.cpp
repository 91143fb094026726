#include "support/BeatTest.h"
#include "support/ErrorTrap.h"
#include "time/clock_table.h"

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

/// Statements that only have to be told apart.
Statements Saying(const char* word)
{
    return {{KvoStatement(word), {}}};
}

KvoTime Span(int count)
{
    return KvoTime(KvoTime::milliseconds, count);
}

class ClockTableTest : public BeatTest
{
protected:
    ClockTableTest() { ZtTimerBeat::start(); }

    /// The words of what is due, in order; what was withdrawn is a "-".
    std::string Take()
    {
        std::string words;
        for (const auto& taken : clocks.Take()) {
            auto statements = taken.lock();
            KvoStatement first;
            if (statements)
                first = statements->front().statement;
            words += statements ? first.ArgText(0) : "-";
        }
        return words;
    }

    ClockTable clocks;
};

} // namespace

TEST_F(ClockTableTest, ClocksAreFoundByName)
{
    Clock* a = clocks.Make("a");
    Clock* b = clocks.Make("b", Span(10), KvoTime());

    EXPECT_EQ(clocks.Find("a"), a);
    EXPECT_EQ(clocks.Find("b"), b);
    EXPECT_EQ(clocks.Find("c"), nullptr);
    EXPECT_EQ(a->Timer().end_mode, ZtTimer::Endless);
    EXPECT_EQ(b->Timer().start_time, Span(10));
    clocks.Remove("a");
    EXPECT_EQ(clocks.Find("a"), nullptr);
}

TEST_F(ClockTableTest, NothingIsDueBeforeItsTime)
{
    Clock* one = clocks.Make("a", KvoTime(), Span(1000));
    one->At(Span(20), Saying("x"));
    one->Timer().start();

    Beats(4);
    EXPECT_FALSE(clocks.Any());
    EXPECT_EQ(Take(), "");

    Beats(3);
    EXPECT_TRUE(clocks.Any());
    EXPECT_EQ(Take(), "x");
    EXPECT_FALSE(clocks.Any());
    Beats(20);
    EXPECT_EQ(Take(), "");
}

TEST_F(ClockTableTest, WhatIsDueComesInTheOrderInWhichItBecameSo)
{
    Clock* late = clocks.Make("a", KvoTime(), Span(1000));
    Clock* early = clocks.Make("b", Span(1000), KvoTime());
    late->At(Span(40), Saying("3"));
    late->At(Span(20), Saying("2"));
    early->At(Span(990), Saying("1"));
    late->Timer().start();
    early->Timer().start();

    Beats(15);

    EXPECT_EQ(Take(), "123");
}

TEST_F(ClockTableTest, RepeatsThatWereNotTakenCountAsOne)
{
    Clock* one = clocks.Make("a");
    one->Every(8, Saying("x"));
    one->Timer().start();

    Beats(20);
    EXPECT_EQ(Take(), "x");
    Beats(2);
    EXPECT_EQ(Take(), "x");
    EXPECT_EQ(Take(), "");
}

TEST_F(ClockTableTest, StoppingMakesItsStatementsDueAndComingToTheEndDoesNot)
{
    Clock* one = clocks.Make("a", Span(20), KvoTime());
    one->OnStop(Saying("stop"));
    one->At(KvoTime(), Saying("end"));
    one->Timer().start();

    Beats(2);
    one->Timer().stop();
    Beats(1);
    EXPECT_EQ(Take(), "stop");

    one->Timer().start();
    Beats(10);
    EXPECT_EQ(Take(), "end");
    EXPECT_EQ(one->Timer().current, KvoTime());
}

TEST_F(ClockTableTest, AClockAtRestStaysThere)
{
    Clock* one = clocks.Make("a", KvoTime(), Span(20));
    EXPECT_FALSE(one->AtRest());
    Beats(1);
    EXPECT_TRUE(one->AtRest());

    one->Timer().start();
    EXPECT_FALSE(one->AtRest());
    Beats(1);
    EXPECT_FALSE(one->AtRest());
    Beats(10);
    EXPECT_TRUE(one->AtRest());
}

TEST_F(ClockTableTest, AForgottenClockTakesItsStatementsWithIt)
{
    Clock* one = clocks.Make("a");
    one->Every(4, Saying("x"));
    one->Timer().start();
    Beats(3);
    ASSERT_TRUE(clocks.Any());

    clocks.Remove("a");
    Beats(3);

    EXPECT_EQ(Take(), "");
    EXPECT_FALSE(clocks.Any());
}

TEST_F(ClockTableTest, AClockThatIsForgottenBeforeItsTurnIsPassedOver)
{
    for (const char* name : {"a", "b"}) {
        clocks.Make(name)->Every(4, Saying(name));
        clocks.Find(name)->Timer().start();
    }
    Beats(3);

    std::vector<std::weak_ptr<const Statements>> taken = clocks.Take();
    clocks.Remove("b");

    ASSERT_EQ(taken.size(), 2u);
    EXPECT_NE(taken[0].lock(), nullptr);
    EXPECT_EQ(taken[1].lock(), nullptr);
}

TEST_F(ClockTableTest, SixClocksAreDriven)
{
    BeatErrorTrap reports;
    for (const char* name : {"a", "b", "c", "d", "e", "f"})
        EXPECT_NE(clocks.Make(name), nullptr);
    Beats(1);

    EXPECT_EQ(clocks.Make("g"), nullptr);
    EXPECT_EQ(clocks.Find("g"), nullptr);
    EXPECT_NE(clocks.Make("a"), nullptr);
    Beats(1);

    EXPECT_EQ(reports.Text(), "");
}

TEST_F(ClockTableTest, AClockThatNoBeatHasSeenIsForgottenInSilence)
{
    ErrorTrap reports;
    clocks.Make("a");

    clocks.Remove("a");

    EXPECT_EQ(reports.Text(), "");
    Beats(1);
    EXPECT_EQ(std::count(std::begin(ZtTimerBeat::timers),
                         std::end(ZtTimerBeat::timers), nullptr),
              ZtTimerBeat::timer_limit);
}
