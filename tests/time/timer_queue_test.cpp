#include <csignal>
#include <new>

#include "support/BeatTest.h"

namespace {

class TimerQueue : public BeatTest
{
protected:
    TimerQueue() { ZtTimerBeat::start(); }
};

KvoTime Ticks(int count)
{
    return KvoTime::FromTicks(count);
}

ZtTimerDeferOp Request(int code, ZtTimer* timer)
{
    ZtTimerDeferOp op;
    op.op = code;
    op.timer = timer;
    return op;
}

TEST_F(TimerQueue, ANewRequestIsEmpty)
{
    const ZtTimerDeferOp op;

    EXPECT_EQ(op.time, Ticks(0));
    EXPECT_EQ(op.timer, nullptr);
    EXPECT_EQ(op.callback, nullptr);
    EXPECT_EQ(op.data, nullptr);
    EXPECT_EQ(op.info, nullptr);
}

TEST_F(TimerQueue, EveryOperationQueuesItsCodeAndArguments)
{
    ZtTimer timer;
    Beats(1);
    int data = 0;
    auto* const record = new ZtTimerCallbackInfo;

    ZtTimerBeat::tmr_reset_callbacks(&timer);
    ZtTimerBeat::tmr_add(&timer);
    ZtTimerBeat::tmr_post_callback(&timer, record);
    ZtTimerBeat::tmr_unpost_callback(&timer, Note, &data);
    ZtTimerBeat::tmr_reverse(&timer);
    ZtTimerBeat::tmr_start(&timer);
    ZtTimerBeat::tmr_restart(&timer);
    ZtTimerBeat::tmr_stop(&timer);
    ZtTimerBeat::tmr_force(&timer, Ticks(7));

    ASSERT_EQ(ZtTimerBeat::defer_op_count, 9);
    for (int code = 0; code < 9; ++code) {
        EXPECT_EQ(ZtTimerBeat::defer_ops[code].op, code);
        EXPECT_EQ(ZtTimerBeat::defer_ops[code].timer, &timer);
    }
    EXPECT_EQ(ZtTimerBeat::defer_ops[2].info, record);
    EXPECT_EQ(ZtTimerBeat::defer_ops[3].callback, Note);
    EXPECT_EQ(ZtTimerBeat::defer_ops[3].data, &data);
    EXPECT_EQ(ZtTimerBeat::defer_ops[8].time, Ticks(7));
}

TEST_F(TimerQueue, ARequestIsCopied)
{
    ZtTimer timer;
    Beats(1);
    ZtTimerDeferOp op = Request(ZtTimerDeferOp::Force, &timer);
    op.time = Ticks(5);

    ZtTimerBeat::q_op(&op);
    op.time = Ticks(6);
    Beats(1);

    EXPECT_EQ(timer.current, Ticks(5));
}

TEST_F(TimerQueue, AHundredRequestsFitAndTheRestIsDroppedWithoutAWord)
{
    BeatErrorTrap trap;
    ZtTimer timer;
    Beats(1);

    for (int count = 1; count <= 103; ++count)
        timer.force(Ticks(count));
    EXPECT_EQ(ZtTimerBeat::defer_op_count, 100);
    Beats(1);

    EXPECT_EQ(timer.current, Ticks(100));
    EXPECT_EQ(ZtTimerBeat::defer_op_count, 0);
    EXPECT_EQ(trap.Text(), "");
}

TEST_F(TimerQueue, ADroppedPostReturnsItsRecord)
{
    ZtTimer timer;
    Beats(1);
    for (int count = 0; count < 100; ++count)
        timer.start();

    timer.post_repeat(Note, nullptr, 5);
    auto* const next = new ZtTimerCallbackInfo;
    delete next;
    timer.post_repeat(Note, nullptr, 5);
    auto* const again = new ZtTimerCallbackInfo;
    delete again;

    EXPECT_EQ(next, again);
}

TEST_F(TimerQueue, RecordsMadeAndFreedForEverTakeNoMoreMemory)
{
    ZtTimer timer;
    Beats(1);
    timer.post_repeat(Note, nullptr, 5);
    Beats(1);
    const ZtTimerCallbackInfo* const first = timer.callbacks;
    timer.unpost(Note, nullptr);
    Beats(1);

    for (int round = 0; round < 3000; ++round) {
        timer.post_repeat(Note, nullptr, 5);
        Beats(1);
        ASSERT_EQ(timer.callbacks, first);
        timer.unpost(Note, nullptr);
        Beats(1);
    }
}

TEST_F(TimerQueue, NothingIsCarriedOutBeforeTheBeat)
{
    ZtTimer timer;
    Beats(1);

    timer.start();
    timer.force(Ticks(9));

    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(timer.current, Ticks(0));
}

TEST_F(TimerQueue, ExecuteOpsCarriesOutInOrderAndEmpties)
{
    ZtTimer timer;
    Beats(1);
    timer.force(Ticks(1));
    timer.force(Ticks(2));

    ZtTimerBeat::execute_ops();

    EXPECT_EQ(timer.current, Ticks(2));
    EXPECT_EQ(ZtTimerBeat::defer_op_count, 0);
}

TEST_F(TimerQueue, ExecuteOpDoesTheWorkOfEachCode)
{
    ZtTimer timer(Ticks(1), Ticks(1000));
    Beats(1);
    int data = 0;
    ZtTimerDeferOp post = Request(ZtTimerDeferOp::PostCallback, &timer);
    post.info = new ZtTimerCallbackInfo;
    post.info->callback = Note;
    post.info->data = &data;
    post.info->fired = 1;
    ZtTimerDeferOp unpost = Request(ZtTimerDeferOp::UnpostCallback, &timer);
    unpost.callback = Note;
    unpost.data = &data;
    ZtTimerDeferOp force = Request(ZtTimerDeferOp::Force, &timer);
    force.time = Ticks(33);
    const auto execute = [&timer](int code) {
        ZtTimerDeferOp op = Request(code, &timer);
        ZtTimerBeat::execute_op(&op);
    };

    ZtTimerBeat::execute_op(&post);
    EXPECT_EQ(timer.callbacks, post.info);
    execute(ZtTimerDeferOp::ResetCallbacks);
    EXPECT_EQ(timer.callbacks->fired, 0);
    ZtTimerBeat::execute_op(&unpost);
    EXPECT_EQ(timer.callbacks, nullptr);
    execute(ZtTimerDeferOp::Reverse);
    EXPECT_EQ(timer.start_time, Ticks(1000));
    execute(ZtTimerDeferOp::Start);
    EXPECT_EQ(timer.state, ZtTimer::Running);
    EXPECT_EQ(timer.current, Ticks(1));
    execute(ZtTimerDeferOp::Restart);
    EXPECT_EQ(timer.current, Ticks(1000));
    ZtTimerBeat::execute_op(&force);
    EXPECT_EQ(timer.current, Ticks(33));
    execute(ZtTimerDeferOp::Stop);
    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    execute(ZtTimerDeferOp::Destroy);
    EXPECT_EQ(ZtTimerBeat::list_find(timer.id), nullptr);
    execute(ZtTimerDeferOp::Add);
    EXPECT_EQ(ZtTimerBeat::list_find(timer.id), &timer);
}

TEST_F(TimerQueue, AnUnknownCodeDoesNothing)
{
    ZtTimer timer(Ticks(1), Ticks(1000));
    Beats(1);

    for (const int code : {-1, 10, 1000}) {
        ZtTimerDeferOp op = Request(code, &timer);
        ZtTimerBeat::execute_op(&op);
    }

    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(timer.start_time, Ticks(1));
    EXPECT_EQ(ZtTimerBeat::list_find(timer.id), &timer);
}

struct Seen
{
    int blocked_count;
    int danger;
    void (*disposition)(int);
};
Seen seen;

void Look(ZtTimer*, void*)
{
    struct sigaction now = {};
    sigaction(SIGALRM, nullptr, &now);
    seen = {ZtTimerBeat::blocked_count, ZtTimerBeat::danger, now.sa_handler};
}

TEST_F(TimerQueue, TheBeatIsBlockedWhileARequestIsCarriedOut)
{
    ZtTimer timer;
    timer.post_stop(Look, nullptr);
    timer.start();
    timer.stop();

    Beats(1);

    EXPECT_EQ(seen.blocked_count, 1);
    EXPECT_EQ(seen.danger, 0);
    EXPECT_EQ(seen.disposition, SIG_IGN);
    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
}

TEST_F(TimerQueue, CarryingOutLeavesTheCallersBlockAlone)
{
    ZtTimer timer;
    Beats(1);
    struct sigaction now = {};
    ZtTimerDeferOp op = Request(ZtTimerDeferOp::Start, &timer);

    ZtTimerBeat::block();
    ZtTimerBeat::execute_op(&op);
    timer.stop();
    ZtTimerBeat::execute_ops();
    ZtTimerBeat::fire(0, 0, nullptr);

    EXPECT_EQ(ZtTimerBeat::blocked_count, 1);
    sigaction(SIGALRM, nullptr, &now);
    EXPECT_EQ(now.sa_handler, SIG_IGN);
    ZtTimerBeat::unblock();
    sigaction(SIGALRM, nullptr, &now);
    EXPECT_NE(now.sa_handler, SIG_IGN);
}

TEST_F(TimerQueue, AddTakesTheFirstEmptySlot)
{
    ZtTimer first;
    auto* const second = new ZtTimer;
    ZtTimer third;
    Beats(1);
    ASSERT_EQ(ZtTimerBeat::timers[1], second);
    delete second;
    ZtTimer fourth, fifth;

    Beats(1);

    EXPECT_EQ(ZtTimerBeat::timers[0], &first);
    EXPECT_EQ(ZtTimerBeat::timers[1], &fourth);
    EXPECT_EQ(ZtTimerBeat::timers[2], &third);
    EXPECT_EQ(ZtTimerBeat::timers[3], &fifth);
    EXPECT_EQ(ZtTimerBeat::timers[4], nullptr);
}

TEST_F(TimerQueue, ListFindGivesTheFirstTimerOfAnId)
{
    ZtTimer first, second;
    Beats(1);
    second.id = first.id;

    EXPECT_EQ(ZtTimerBeat::list_find(first.id), &first);
    EXPECT_EQ(ZtTimerBeat::list_find(-5), nullptr);
}

TEST_F(TimerQueue, DestroyEmptiesEverySlotThatHoldsTheTimer)
{
    ZtTimer timer;
    ZtTimerBeat::tmr_add(&timer);
    ZtTimerBeat::tmr_add(&timer);
    Beats(1);
    ASSERT_EQ(ZtTimerBeat::timers[2], &timer);

    ZtTimerBeat::tmr_destroy(&timer);

    for (const ZtTimer* slot : ZtTimerBeat::timers)
        EXPECT_EQ(slot, nullptr);
    ZtTimerBeat::tmr_add(&timer);
    Beats(1);
}

TEST_F(TimerQueue, PostAppendsAtTheTailAndEndsTheList)
{
    ZtTimer timer;
    Beats(1);
    auto* const first = new ZtTimerCallbackInfo;
    auto* const second = new ZtTimerCallbackInfo;
    first->next = second;

    ZtTimerBeat::post_callback_op(&timer, first);
    EXPECT_EQ(timer.callbacks, first);
    EXPECT_EQ(first->next, nullptr);
    ZtTimerBeat::post_callback_op(&timer, second);

    EXPECT_EQ(first->next, second);
    EXPECT_EQ(second->next, nullptr);
}

TEST_F(TimerQueue, PostingARecordTwiceMakesNoRing)
{
    ZtTimer timer;
    Beats(1);
    auto* const record = new ZtTimerCallbackInfo;

    ZtTimerBeat::tmr_post_callback(&timer, record);
    ZtTimerBeat::tmr_post_callback(&timer, record);
    ZtTimerBeat::tmr_post_callback(&timer, nullptr);
    Beats(1);

    EXPECT_EQ(timer.callbacks, record);
    EXPECT_EQ(record->next, nullptr);
}

TEST_F(TimerQueue, ReverseFindsTheDirectionAnew)
{
    ZtTimer timer(Ticks(5), Ticks(5));
    ZtTimer down(Ticks(9), Ticks(1));
    Beats(1);

    timer.reverse();
    down.reverse();
    Beats(1);

    EXPECT_EQ(timer.counting_up, 0);
    EXPECT_EQ(down.counting_up, 1);
}

TEST_F(TimerQueue, OperationsWorkOnATimerThatIsInNoSlot)
{
    ZtTimer timer;
    Beats(1);
    ZtTimerBeat::tmr_destroy(&timer);
    timer.post_stop(Note, Named("s"));
    timer.force(Ticks(50));
    timer.start();

    Beats(3);
    EXPECT_EQ(timer.state, ZtTimer::Running);
    EXPECT_EQ(timer.current, Ticks(50));
    timer.stop();
    Beats(1);

    EXPECT_EQ(BeatLog::Texts(), "s");
    ZtTimerBeat::tmr_add(&timer);
    Beats(1);
}

TEST_F(TimerQueue, ATimerMayBeDestroyedByItsOwnTrigger)
{
    alignas(ZtTimer) static unsigned char room[sizeof(ZtTimer)];
    auto* const timer = new (room) ZtTimer;
    ZtTimer other;
    timer->post_trigger(
        [](ZtTimer* its, void* data) {
            Note(its, data);
            its->~ZtTimer();
        },
        Named("last "), Ticks(0));
    timer->post_repeat(Note, Named("never "), 0);
    other.post_repeat(Note, Named("other "), 0);
    timer->start();
    other.start();

    Beats(3);

    EXPECT_EQ(BeatLog::Texts(), "last other other ");
    EXPECT_EQ(ZtTimerBeat::timers[0], nullptr);
}

TEST_F(TimerQueue, ATimerMayBeDestroyedByItsOwnStopCallback)
{
    alignas(ZtTimer) static unsigned char room[sizeof(ZtTimer)];
    auto* const timer = new (room) ZtTimer;
    timer->post_stop(Note, Named("first "));
    timer->post_stop(
        [](ZtTimer* its, void* data) {
            Note(its, data);
            its->~ZtTimer();
        },
        Named("last "));
    timer->post_stop(Note, Named("never "));
    timer->start();
    timer->stop();
    timer->force(Ticks(4));

    Beats(2);

    EXPECT_EQ(BeatLog::Texts(), "first last ");
    EXPECT_EQ(ZtTimerBeat::timers[0], nullptr);
}

TEST_F(TimerQueue, ACallbackMayDestroyTheTimerOfALaterSlot)
{
    alignas(ZtTimer) static unsigned char room[sizeof(ZtTimer)];
    ZtTimer first;
    auto* const victim = new (room) ZtTimer;
    first.post_trigger(
        [](ZtTimer*, void* data) { static_cast<ZtTimer*>(data)->~ZtTimer(); },
        victim, Ticks(0));
    victim->post_repeat(Note, Named("never"), 0);
    first.start();
    victim->start();

    Beats(3);

    EXPECT_EQ(BeatLog::Texts(), "");
}

TEST_F(TimerQueue, ARecordFreedInTheBeatIsNotUsedAgainBeforeItsEnd)
{
    static ZtTimerCallbackInfo* removed;
    static ZtTimerCallbackInfo* made;
    ZtTimer timer;
    timer.post_repeat(
        [](ZtTimer* its, void* data) {
            removed = its->callbacks;
            ZtTimerBeat::unpost_callback_op(its, removed->callback, data);
            made = new ZtTimerCallbackInfo;
        },
        nullptr, 0);
    timer.post_repeat(Note, Named("next"), 0);
    timer.start();

    Beats(2);

    EXPECT_NE(removed, made);
    EXPECT_EQ(BeatLog::Texts(), "next");
    delete made;
}

TEST_F(TimerQueue, ARecordRemovedBeforeItsTurnIsNotCalled)
{
    ZtTimer timer;
    timer.post_repeat(
        [](ZtTimer* its, void*) {
            ZtTimerBeat::unpost_callback_op(its, its->callbacks->callback,
                                            nullptr);
            ZtTimerBeat::unpost_callback_op(its, Note, nullptr);
        },
        nullptr, 0);
    timer.post_repeat(Note, nullptr, 0);
    timer.start();

    Beats(3);

    EXPECT_TRUE(BeatLog::Entries().empty());
    EXPECT_EQ(timer.callbacks, nullptr);
}

TEST_F(TimerQueue, ABeatInsideACallbackDoesNothingTwice)
{
    ZtTimer timer;
    timer.post_trigger(
        [](ZtTimer* its, void*) {
            its->callbacks->fired = 1;
            its->post_repeat(Note, Named("r"), 0);
            ZtTimerBeat::fire(0, 0, nullptr);
            EXPECT_EQ(ZtTimerBeat::danger, 1);
        },
        nullptr, Ticks(0));
    timer.start();

    Beats(2);

    // Posted in the inner beat, served in the outer one, which goes on.
    EXPECT_EQ(BeatLog::Texts(), "r");
    ASSERT_NE(timer.callbacks->next, nullptr);
    EXPECT_EQ(timer.callbacks->next->next, nullptr);
    EXPECT_EQ(ZtTimerBeat::danger, 0);
    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
}

TEST_F(TimerQueue, ABeatInsideAStopCallbackLeavesTheQueueToTheOuterOne)
{
    ZtTimer timer;
    timer.post_stop(
        [](ZtTimer* its, void* data) {
            Note(its, data);
            ZtTimerBeat::fire(0, 0, nullptr);
            ZtTimerBeat::execute_ops();
        },
        Named("s"));
    timer.post_repeat(Note, Named("r"), 0);
    timer.start();
    timer.stop();
    timer.force(Ticks(3));

    Beats(1);

    EXPECT_EQ(BeatLog::Texts(), "s");
    EXPECT_EQ(timer.current, Ticks(3));
    ASSERT_NE(timer.callbacks, nullptr);
    EXPECT_EQ(timer.callbacks->next, nullptr);
}

} // namespace
