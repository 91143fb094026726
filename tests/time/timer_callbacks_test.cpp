#include "ZT/timer.h"

#include <climits>
#include <vector>

#include "support/BeatTest.h"

namespace {

using Moments = std::vector<std::int64_t>;

constexpr int ticks_a_beat = 24; // 4 ms

class TimerCallbacks : public BeatTest
{
protected:
    TimerCallbacks() { ZtTimerBeat::start(); }
};

KvoTime Ticks(int count)
{
    return KvoTime::FromTicks(count);
}

TEST_F(TimerCallbacks, APostedTriggerIsAppendedAfterTheBeat)
{
    ZtTimer timer;
    Beats(1);
    int data = 0;

    timer.post_trigger(Note, &data, Ticks(44));
    EXPECT_EQ(timer.callbacks, nullptr);
    Beats(1);

    const ZtTimerCallbackInfo* const record = timer.callbacks;
    ASSERT_NE(record, nullptr);
    EXPECT_EQ(record->kind, 0);
    EXPECT_EQ(record->callback, Note);
    EXPECT_EQ(record->fired, 0);
    EXPECT_EQ(record->time, Ticks(44));
    EXPECT_EQ(record->data, &data);
    EXPECT_EQ(record->next, nullptr);
}

TEST_F(TimerCallbacks, APostedRepeatIsAppendedAfterTheBeat)
{
    ZtTimer timer;
    timer.post_trigger(Note, nullptr, Ticks(44));
    int data = 0;

    timer.post_repeat(Note, &data, 250);
    Beats(1);

    const ZtTimerCallbackInfo* const record = timer.callbacks->next;
    ASSERT_NE(record, nullptr);
    EXPECT_EQ(record->kind, 1);
    EXPECT_EQ(record->callback, Note);
    EXPECT_EQ(record->interval, 250);
    EXPECT_EQ(record->last_fired, 0);
    EXPECT_EQ(record->data, &data);
    EXPECT_EQ(record->next, nullptr);
}

TEST_F(TimerCallbacks, APostedStopCallbackIsAppendedAtOnce)
{
    ZtTimer timer;
    timer.force(Ticks(55));
    Beats(1);
    int data = 0;

    timer.post_stop(Note, nullptr);
    timer.post_stop(Note, &data);

    const ZtTimerCallbackInfo* const record = timer.stop_callbacks->next;
    ASSERT_NE(record, nullptr);
    EXPECT_EQ(record->callback, Note);
    EXPECT_EQ(record->time, Ticks(55));
    EXPECT_EQ(record->data, &data);
    EXPECT_EQ(record->next, nullptr);
    EXPECT_EQ(timer.callbacks, nullptr);
}

TEST_F(TimerCallbacks, ATriggerFiresOnceWhenItsTimeIsReached)
{
    ZtTimer up, down(Ticks(1000), Ticks(0));
    up.post_trigger(Note, Named("u"), Ticks(2 * ticks_a_beat));
    down.post_trigger(Note, Named("d"), Ticks(1000 - 3 * ticks_a_beat));
    up.start();
    down.start();
    Beats(1);

    Beats(1);
    EXPECT_EQ(BeatLog::Texts(), "");
    Beats(1);
    EXPECT_EQ(BeatLog::Texts(), "u");
    Beats(5);

    EXPECT_EQ(BeatLog::Texts(), "ud");
    EXPECT_EQ(BeatLog::Entries()[1].ticks, 1000 - 3 * ticks_a_beat);
    EXPECT_EQ(up.callbacks->fired, 1);
}

TEST_F(TimerCallbacks, ACallbackGetsItsTimerAndItsData)
{
    ZtTimer first, second;
    int data = 0;
    second.post_trigger(Note, &data, Ticks(0));
    second.start();

    Beats(2);

    ASSERT_EQ(BeatLog::Entries().size(), 1u);
    EXPECT_EQ(BeatLog::Entries()[0].timer, &second);
    EXPECT_EQ(BeatLog::Entries()[0].data, &data);
}

TEST_F(TimerCallbacks, ATriggerAtTheEndFiresInTheBeatThatReachesIt)
{
    ZtTimer timer(Ticks(0), Ticks(50));
    timer.post_trigger(Note, Named("end"), Ticks(50));
    timer.start();
    Beats(1);

    Beats(2);
    EXPECT_EQ(BeatLog::Texts(), "");
    Beats(1);

    EXPECT_EQ(BeatLog::Texts(), "end");
    EXPECT_EQ(timer.state, ZtTimer::Stopped);
}

TEST_F(TimerCallbacks, TheTimerIsStoppedAlreadyWhenItsEndTriggerFires)
{
    static int state;
    ZtTimer timer(Ticks(0), Ticks(50));
    timer.post_trigger([](ZtTimer* its, void*) { state = its->state; }, nullptr,
                       Ticks(50));
    timer.start();

    Beats(5);

    EXPECT_EQ(state, ZtTimer::Stopped);
}

TEST_F(TimerCallbacks, ATriggerAtATimePassedFiresAtTheFirstRunningBeat)
{
    ZtTimer timer;
    timer.force(Ticks(1000));
    Beats(1);
    timer.post_trigger(Note, Named("late"), Ticks(20));
    Beats(3);
    EXPECT_EQ(BeatLog::Texts(), "");

    timer.start();
    Beats(1);
    EXPECT_EQ(BeatLog::Texts(), "");
    Beats(1);

    EXPECT_EQ(BeatLog::Texts(), "late");
}

TEST_F(TimerCallbacks, AFiredTriggerStaysSoOverStopAndRestart)
{
    ZtTimer timer;
    timer.post_trigger(Note, Named("t"), Ticks(0));
    timer.start();
    Beats(2);
    ASSERT_EQ(BeatLog::Texts(), "t");

    timer.stop();
    Beats(2);
    timer.restart();
    Beats(4);
    EXPECT_EQ(BeatLog::Texts(), "t");

    timer.reset_callbacks();
    Beats(2);
    EXPECT_EQ(BeatLog::Texts(), "tt");
}

TEST_F(TimerCallbacks, ResetRearmsEveryTriggerAndNoRepeat)
{
    ZtTimer timer;
    timer.post_trigger(Note, Named("a"), Ticks(0));
    timer.post_repeat(Note, Named("r"), 1000);
    timer.post_trigger(Note, Named("b"), Ticks(0));
    timer.start();
    alarm.Run(1200000);
    ASSERT_EQ(BeatLog::Texts(), "abr");
    ZtTimerCallbackInfo* const repeat = timer.callbacks->next;
    const std::int64_t last = repeat->last_fired;
    repeat->fired = 7;

    timer.reset_callbacks();
    Beats(1);
    EXPECT_EQ(timer.callbacks->fired, 0);
    EXPECT_EQ(repeat->fired, 7);
    EXPECT_EQ(repeat->last_fired, last);
    EXPECT_EQ(repeat->next->fired, 0);
    Beats(1);

    EXPECT_EQ(BeatLog::Texts(), "abrab");
}

TEST_F(TimerCallbacks, ANaturalEndRearmsTheTriggersAndCallsNoStopCallback)
{
    ZtTimer timer(Ticks(0), Ticks(50));
    timer.post_trigger(Note, Named("t"), Ticks(30));
    timer.post_stop(Note, Named("s"));
    timer.start();
    Beats(5);
    ASSERT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(timer.callbacks->fired, 0);
    EXPECT_EQ(BeatLog::Texts(), "t");

    timer.restart();
    Beats(5);

    EXPECT_EQ(BeatLog::Texts(), "tt");
}

TEST_F(TimerCallbacks, AnEndRearmsTheTriggersOfAllLaterSlotsToo)
{
    ZtTimer before, ending(Ticks(0), Ticks(50)), after, stopped_after;
    Beats(1);
    for (ZtTimer* timer : {&before, &ending, &after, &stopped_after}) {
        timer->post_trigger(Note, timer, Ticks(0));
        timer->start();
    }
    Beats(2);
    stopped_after.stop();
    Beats(1);
    ASSERT_EQ(ending.state, ZtTimer::Running);
    ASSERT_EQ(BeatLog::Entries().size(), 4u);

    Beats(1);

    EXPECT_EQ(ending.state, ZtTimer::Stopped);
    EXPECT_EQ(before.callbacks->fired, 1);
    EXPECT_EQ(ending.callbacks->fired, 0);
    EXPECT_EQ(after.callbacks->fired, 0);
    EXPECT_EQ(stopped_after.callbacks->fired, 0);
    Beats(1);
    EXPECT_EQ(BeatLog::Entries().size(), 5u);
    EXPECT_EQ(BeatLog::Entries()[4].timer, &after);
}

TEST_F(TimerCallbacks, ARepeatPostedAt250FiresAtOnceAndThenOnTheMultiples)
{
    ZtTimer timer;
    timer.start();
    alarm.Run(248000);
    ASSERT_EQ(Milliseconds(), 248);

    timer.post_repeat(Note, Named("r"), 100);
    alarm.Run(400000);

    // It is posted in the beat at 252, whose milliseconds are over 100.
    EXPECT_EQ(BeatLog::Moments("r"), (Moments{256, 300, 400, 500, 600}));
}

TEST_F(TimerCallbacks, ALateBeatDoesNotShiftARepeat)
{
    ZtTimer timer;
    timer.post_repeat(Note, Named("r"), 100);
    timer.start();
    alarm.Run(196000);
    clock.AdvanceMicroseconds(150000);
    Beats(1);
    ASSERT_EQ(Milliseconds(), 346);

    alarm.Run(160000);

    // The missed one at 300 comes once, late; the next is due at 400 again.
    EXPECT_EQ(BeatLog::Moments("r"), (Moments{100, 346, 402, 502}));
}

TEST_F(TimerCallbacks, ARepeatGoesByTheBeatsClockNotTheTimers)
{
    ZtTimer timer;
    timer.post_repeat(Note, Named("r"), 100);
    timer.start();
    Beats(1);

    timer.force(Ticks(1000000));
    alarm.Run(90000);

    EXPECT_EQ(BeatLog::Texts(), "");
}

TEST_F(TimerCallbacks, ALastFiredOfMinusOneFiresAtTheNextBeat)
{
    ZtTimer timer;
    timer.post_repeat(Note, Named("r"), 100000);
    timer.start();
    Beats(3);
    timer.callbacks->last_fired = -1;

    Beats(1);

    EXPECT_EQ(BeatLog::Moments("r"), (Moments{16}));
    EXPECT_EQ(timer.callbacks->last_fired, 16);
}

TEST_F(TimerCallbacks, IntervalsBelowOneFireAtEveryBeat)
{
    ZtTimer timer;
    timer.post_repeat(Note, Named("z"), 0);
    timer.post_repeat(Note, Named("n"), -1);
    timer.post_repeat(Note, Named("m"), LONG_MIN);
    timer.start();
    Beats(1);

    Beats(3);

    EXPECT_EQ(BeatLog::Texts(), "znmznmznm");
}

TEST_F(TimerCallbacks, AfterTheClockBeganAgainARepeatIsNotStuck)
{
    ZtTimer timer;
    timer.post_repeat(Note, Named("r"), 100);
    timer.start();
    alarm.Run(1000000);
    BeatLog::Clear();

    ZtTimerBeat::start();
    alarm.Run(204000);

    EXPECT_EQ(BeatLog::Moments("r"), (Moments{1100, 1200}));
}

TEST_F(TimerCallbacks, RepeatsOfAStoppedTimerDoNotFire)
{
    ZtTimer timer;
    timer.post_repeat(Note, Named("r"), 4);
    Beats(5);

    EXPECT_EQ(BeatLog::Texts(), "");
}

TEST_F(TimerCallbacks, ARepeatFiresInTheBeatInWhichItsTimerEnds)
{
    ZtTimer timer(Ticks(0), Ticks(30));
    timer.post_repeat(Note, Named("r"), 4);
    timer.start();

    Beats(6);

    EXPECT_EQ(BeatLog::Moments("r"), (Moments{8, 12}));
}

TEST_F(TimerCallbacks, CallbacksRunInListOrderSlotBySlot)
{
    ZtTimer first, second;
    second.post_trigger(Note, Named("c"), Ticks(0));
    first.post_trigger(Note, Named("a"), Ticks(0));
    first.post_repeat(Note, Named("b"), 0);
    second.post_trigger(Note, Named("d"), Ticks(0));
    first.start();
    second.start();

    Beats(2);

    EXPECT_EQ(BeatLog::Texts(), "abcd");
}

TEST_F(TimerCallbacks, AllTimersStandAtTheirNewTimesWhenTheFirstIsCalled)
{
    static ZtTimer* later;
    static int seen;
    ZtTimer first, second;
    later = &second;
    first.post_trigger([](ZtTimer*, void*) { seen = later->current.Ticks(); },
                       nullptr, Ticks(0));
    first.start();
    second.start();

    Beats(2);

    EXPECT_EQ(seen, ticks_a_beat);
}

// It is neither running nor stopped until the walk comes to its own slot.
TEST_F(TimerCallbacks, ATimerThatEndsInThisBeatCannotBeReversedYet)
{
    static ZtTimer* later;
    static int seen;
    ZtTimer first;
    ZtTimer second(KvoTime(), Ticks(ticks_a_beat));
    later = &second;
    seen = -1;
    first.post_trigger(
        [](ZtTimer*, void*) {
            seen = later->state;
            later->reverse();
        },
        nullptr, Ticks(ticks_a_beat));
    first.start();
    second.start();

    Beats(3);

    EXPECT_EQ(seen, ZtTimer::Ended);
    EXPECT_EQ(second.state, ZtTimer::Stopped);
    EXPECT_EQ(second.start_time, KvoTime());
    EXPECT_EQ(second.end, Ticks(ticks_a_beat));
}

TEST_F(TimerCallbacks, UnpostRemovesTheFirstMatchOnly)
{
    ZtTimer timer;
    char a[] = "a", b[] = "b";
    timer.post_repeat(Note, b, 0);
    timer.post_repeat(Note, a, 0);
    timer.post_trigger(Note, a, Ticks(0));
    timer.post_repeat([](ZtTimer*, void*) {}, a, 0);
    Beats(1);

    timer.unpost(Note, a);
    EXPECT_EQ(timer.callbacks->next->kind, ZtTimerCallbackInfo::Repeat);
    Beats(1);

    const ZtTimerCallbackInfo* record = timer.callbacks;
    EXPECT_EQ(record->data, b);
    record = record->next;
    EXPECT_EQ(record->kind, ZtTimerCallbackInfo::Trigger);
    EXPECT_EQ(record->data, a);
    record = record->next;
    EXPECT_NE(record->callback, Note);
    EXPECT_EQ(record->next, nullptr);
}

TEST_F(TimerCallbacks, UnpostTakesHeadMiddleAndTail)
{
    ZtTimer timer;
    char a[] = "a", b[] = "b", c[] = "c", d[] = "d";
    for (char* name : {a, b, c, d})
        timer.post_repeat(Note, name, 0);
    timer.unpost(Note, a);
    timer.unpost(Note, c);
    timer.unpost(Note, d);
    timer.start();

    Beats(2);

    EXPECT_EQ(BeatLog::Texts(), "b");
    timer.unpost(Note, b);
    Beats(1);
    EXPECT_EQ(timer.callbacks, nullptr);
}

TEST_F(TimerCallbacks, UnpostWithoutAMatchDoesNothing)
{
    ZtTimer timer;
    char a[] = "a", b[] = "b";
    timer.post_repeat(Note, a, 0);
    timer.unpost(Note, b);
    timer.unpost([](ZtTimer*, void*) {}, a);
    timer.unpost(nullptr, nullptr);

    Beats(1);

    ASSERT_NE(timer.callbacks, nullptr);
    EXPECT_EQ(timer.callbacks->next, nullptr);
}

TEST_F(TimerCallbacks, UnpostDoesNotRemoveStopCallbacks)
{
    ZtTimer timer;
    char name[] = "s";
    timer.post_stop(Note, name);
    timer.unpost(Note, name);
    timer.start();
    timer.stop();

    Beats(1);

    EXPECT_EQ(BeatLog::Texts(), "s");
}

TEST_F(TimerCallbacks, StopCallbacksRunInOrderEachTimeARunningTimerIsStopped)
{
    ZtTimer timer;
    timer.post_stop(Note, Named("a"));
    timer.post_stop(Note, Named("b"));
    timer.start();
    Beats(2);

    timer.stop();
    EXPECT_EQ(BeatLog::Texts(), "");
    Beats(1);
    EXPECT_EQ(BeatLog::Texts(), "ab");
    timer.stop();
    Beats(1);
    EXPECT_EQ(BeatLog::Texts(), "ab");
    timer.start();
    timer.stop();
    Beats(1);

    EXPECT_EQ(BeatLog::Texts(), "abab");
}

TEST_F(TimerCallbacks, StartAndStopBetweenTwoBeatsCallTheStopCallbacksOnce)
{
    ZtTimer timer;
    timer.post_stop(Note, Named("s"));
    Beats(1);

    timer.start();
    timer.stop();
    Beats(1);

    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(BeatLog::Texts(), "s");
    Beats(2);
    EXPECT_EQ(BeatLog::Texts(), "s");
}

TEST_F(TimerCallbacks, AStopCallbackAddedByAStopCallbackWaitsForTheNextStop)
{
    ZtTimer timer;
    timer.post_stop(
        [](ZtTimer* its, void* data) {
            Note(its, data);
            its->post_stop(Note, Named("+"));
        },
        Named("s"));
    timer.start();
    timer.stop();
    Beats(1);
    EXPECT_EQ(BeatLog::Texts(), "s");

    timer.start();
    timer.stop();
    Beats(1);

    EXPECT_EQ(BeatLog::Texts(), "ss+");
}

TEST_F(TimerCallbacks, PostingAndUnpostingInACallbackTakesEffectAfterTheBeat)
{
    static char old_name[] = "old ";
    ZtTimer timer;
    timer.post_trigger(
        [](ZtTimer* its, void* data) {
            Note(its, data);
            its->post_repeat(Note, Named("new "), 0);
            its->unpost(Note, old_name);
        },
        Named("trigger "), Ticks(0));
    timer.post_repeat(Note, old_name, 0);
    timer.start();

    Beats(2);
    EXPECT_EQ(BeatLog::Texts(), "trigger old ");
    Beats(1);

    EXPECT_EQ(BeatLog::Texts(), "trigger old new ");
}

TEST_F(TimerCallbacks, ARepeatMayUnpostItself)
{
    ZtTimer timer;
    ZtTimerCallback once = [](ZtTimer* its, void* data) {
        Note(its, data);
        for (const ZtTimerCallbackInfo* record = its->callbacks; record;
             record = record->next)
            if (record->data == data)
                its->unpost(record->callback, data);
    };
    timer.post_repeat(once, Named("1"), 0);
    timer.post_repeat(Note, Named("2"), 0);
    timer.start();

    Beats(3);

    EXPECT_EQ(BeatLog::Texts(), "122");
}

TEST_F(TimerCallbacks, OperationsInACallbackAreQueuedForTheEndOfTheBeat)
{
    static int inside;
    ZtTimer timer;
    timer.post_trigger(
        [](ZtTimer* its, void*) {
            its->force(Ticks(5000));
            its->stop();
            inside = its->current.Ticks();
        },
        nullptr, Ticks(0));
    timer.start();

    Beats(2);

    EXPECT_EQ(inside, ticks_a_beat);
    EXPECT_EQ(timer.current, Ticks(5000));
    EXPECT_EQ(timer.state, ZtTimer::Stopped);
}

TEST_F(TimerCallbacks, OperationsInAStopCallbackRunInTheSameBeat)
{
    ZtTimer timer;
    timer.post_stop([](ZtTimer* its, void*) { its->force(Ticks(5000)); },
                    nullptr);
    timer.start();
    timer.stop();

    Beats(1);

    EXPECT_EQ(timer.current, Ticks(5000));
    EXPECT_EQ(ZtTimerBeat::defer_op_count, 0);
}

TEST_F(TimerCallbacks, AStopCallbackThatStartsAndStopsForEverEndsWithTheQueue)
{
    ZtTimer timer;
    timer.post_stop(
        [](ZtTimer* its, void* data) {
            Note(its, data);
            its->start();
            its->stop();
        },
        Named("."));
    Beats(1);
    timer.start();
    timer.stop();

    Beats(1);

    // A start and a stop a round, and the two before the first.
    EXPECT_EQ(BeatLog::Entries().size(), 50u);
    EXPECT_EQ(ZtTimerBeat::defer_op_count, 0);
}

TEST_F(TimerCallbacks, ANullCallbackIsNotCalled)
{
    ZtTimer timer;
    timer.post_trigger(nullptr, nullptr, Ticks(0));
    timer.post_repeat(nullptr, nullptr, 0);
    timer.post_stop(nullptr, nullptr);
    timer.start();

    Beats(2);
    timer.stop();
    Beats(1);

    EXPECT_EQ(timer.state, ZtTimer::Stopped);
}

} // namespace
