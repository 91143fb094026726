// In which order a beat does what it has to do, what a request that is carried
// out sees of the others, and which alarms count as lost.

#include <memory>
#include <new>
#include <signal.h>

#include "support/BeatTest.h"

namespace {

using Handler = void (*)(int);

KvoTime Ticks(int count)
{
    return KvoTime::FromTicks(count);
}

Handler Disposition()
{
    struct sigaction now = {};
    sigaction(SIGALRM, nullptr, &now);
    return now.sa_handler;
}

class BeatOrder : public BeatTest
{};

TEST_F(BeatOrder, TheTimeOfStopCallbacksIsTakenFromTheNextWaitToo)
{
    static FakeClock* its_clock;
    its_clock = &clock;
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_stop(
        [](ZtTimer*, void*) { its_clock->AdvanceMicroseconds(1900); }, nullptr);
    timer.start();
    Beats(1);

    timer.stop();
    Beats(1);

    EXPECT_EQ(alarm.Wait(), 3000);
}

TEST_F(BeatOrder, StoppedInAStopCallbackTheBeatInProgressIsTheLast)
{
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_stop([](ZtTimer*, void*) { ZtTimerBeat::stop(); }, nullptr);
    timer.start();
    Beats(1);

    timer.stop();
    Beats(1);

    EXPECT_FALSE(alarm.Armed());
}

TEST_F(BeatOrder, ABeatOfExactlyThePeriodIsAnOverrun)
{
    static FakeClock* its_clock;
    static long microseconds;
    its_clock = &clock;
    microseconds = 3999;
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_repeat(
        [](ZtTimer*, void*) { its_clock->AdvanceMicroseconds(microseconds); },
        nullptr, 0);
    timer.start();
    Beats(2);
    EXPECT_EQ(ZtTimerBeat::Statistics().overruns, 0);

    microseconds = 4000;
    Beats(1);

    EXPECT_EQ(ZtTimerBeat::Statistics().overruns, 1);
    EXPECT_EQ(alarm.Wait(), 1);
}

TEST_F(BeatOrder, WholeSecondsThatAreLeftAreNoLostAlarm)
{
    ZtTimerBeat::sample_rate = 2000000;
    ZtTimerBeat::start();

    ZtTimerBeat::block();
    ZtTimerBeat::unblock();

    EXPECT_EQ(alarm.Wait(), 2000000);
}

TEST_F(BeatOrder, AnAlarmLostInABlockIsLeftToTheEndOfTheBlock)
{
    ZtTimerBeat::start();
    ZtTimerBeat::block();
    ASSERT_TRUE(alarm.Step());

    ZtTimerBeat::execute_ops();

    EXPECT_EQ(Disposition(), SIG_IGN);
    EXPECT_FALSE(alarm.Armed());
    ZtTimerBeat::unblock();
    EXPECT_EQ(alarm.Wait(), 1);
}

TEST_F(BeatOrder, AQueueThatIsCarriedOutInsideItselfWaitsForTheOuterOne)
{
    static int seen;
    seen = -1;
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_stop(
        [](ZtTimer* its, void*) {
            ZtTimerBeat::execute_ops();
            seen = its->current.Ticks();
        },
        nullptr);
    timer.start();
    timer.stop();
    timer.force(Ticks(3));

    Beats(1);

    EXPECT_EQ(seen, 0);
    EXPECT_EQ(timer.current, Ticks(3));
}

TEST_F(BeatOrder, APostThatWaitsReturnsItsRecordWithItsTimer)
{
    ZtTimerBeat::start();
    ZtTimerCallbackInfo* waiting = nullptr;
    {
        ZtTimer timer;
        Beats(1);
        timer.post_trigger(Note, nullptr, Ticks(0));
        waiting = ZtTimerBeat::defer_ops[0].info;
    }

    const std::unique_ptr<ZtTimerCallbackInfo> next(new ZtTimerCallbackInfo);

    EXPECT_EQ(next.get(), waiting);
    Beats(1);
}

TEST_F(BeatOrder, ARecordThatWasPostedByTheSameQueueIsReturnedOnce)
{
    alignas(ZtTimer) static unsigned char room[sizeof(ZtTimer)];
    ZtTimerBeat::start();
    auto* const timer = new (room) ZtTimer;
    timer->post_stop([](ZtTimer* its, void*) { its->~ZtTimer(); }, nullptr);
    timer->start();
    Beats(1);

    timer->post_trigger(Note, nullptr, Ticks(100));
    timer->stop();
    Beats(1);

    std::unique_ptr<ZtTimerCallbackInfo> records[4];
    for (auto& record : records)
        record.reset(new ZtTimerCallbackInfo);
    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < i; ++j)
            EXPECT_NE(records[i], records[j]);
}

TEST_F(BeatOrder, ABeatInsideACallbackDoesNotUseFreedRecordsAgain)
{
    static ZtTimerCallbackInfo* removed;
    static ZtTimerCallbackInfo* made;
    removed = made = nullptr;
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_trigger(Note, Named("gone"), Ticks(1000));
    timer.post_trigger(
        [](ZtTimer* its, void*) {
            if (removed)
                return;
            removed = its->callbacks;
            ZtTimerBeat::unpost_callback_op(its, Note, removed->data);
            ZtTimerBeat::fire(0, 0, nullptr);
            made = new ZtTimerCallbackInfo;
        },
        nullptr, Ticks(0));
    timer.start();

    Beats(2);

    ASSERT_NE(removed, nullptr);
    EXPECT_NE(removed, made);
    delete made;
}

TEST_F(BeatOrder, PostingARecordThatIsThereKeepsThoseBehindIt)
{
    ZtTimerBeat::start();
    ZtTimer timer;
    auto* const first = new ZtTimerCallbackInfo;
    auto* const second = new ZtTimerCallbackInfo;
    for (ZtTimerCallbackInfo* record : {first, second, first})
        ZtTimerBeat::tmr_post_callback(&timer, record);

    Beats(1);

    EXPECT_EQ(timer.callbacks, first);
    EXPECT_EQ(first->next, second);
    EXPECT_EQ(second->next, nullptr);
}

} // namespace
