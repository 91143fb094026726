// What does a beat cost over the signal that carries it, and a request over
// the masking that protects it?
//
// The beat rows raise the alarm themselves, so that each pays for one real
// delivery; compare them with the empty handler of the same run.

#include <benchmark/benchmark.h>
#include <signal.h>

#include <memory>

#include "ZT/timer.h"

namespace {

constexpr int timer_count = 6;

void Nothing(ZtTimer*, void*) {}

/// Six running timers with their records, and the beat's handler in place.
class BusyBeat
{
public:
    BusyBeat(bool all_due, int records_a_timer)
    {
        for (auto& timer : timers) {
            timer = std::make_unique<ZtTimer>();
            for (int record = 0; record < records_a_timer; ++record) {
                if (all_due)
                    timer->post_repeat(Nothing, nullptr, 0);
                else if (record % 2)
                    timer->post_trigger(Nothing, nullptr, KvoTime::FOREVER);
                else
                    timer->post_repeat(Nothing, nullptr, 1000000000);
                if (ZtTimerBeat::defer_op_count == ZtTimerBeat::defer_op_limit)
                    ZtTimerBeat::execute_ops();
            }
            timer->start();
            ZtTimerBeat::execute_ops();
        }
        ZtTimerBeat::start();
    }

    ~BusyBeat()
    {
        ZtTimerBeat::stop();
        ZtTimerBeat::reload(1000000000);
        raise(SIGALRM);
    }

    BusyBeat(const BusyBeat&) = delete;
    BusyBeat& operator=(const BusyBeat&) = delete;

private:
    std::unique_ptr<ZtTimer> timers[timer_count];
};

void RaiseAtEmptyHandler(benchmark::State& state)
{
    signal(SIGALRM, [](int) {});
    for (auto _ : state)
        raise(SIGALRM);
}
BENCHMARK(RaiseAtEmptyHandler)->Name("beat_walk/limit");

template <bool AllDue>
void Beat(benchmark::State& state)
{
    const BusyBeat busy(AllDue, 10);
    for (auto _ : state)
        raise(SIGALRM);
}
BENCHMARK(Beat<false>)->Name("beat_walk/ours");
BENCHMARK(Beat<true>)->Name("also/beat_all_due/ours");

void GrowingBeat(benchmark::State& state)
{
    const BusyBeat busy(false, static_cast<int>(state.range(0)) / timer_count);
    for (auto _ : state)
        raise(SIGALRM);
}
BENCHMARK(GrowingBeat)
    ->Name("curve/beat/ours")
    ->Arg(6)
    ->Arg(60)
    ->Arg(600)
    ->Arg(6000)
    ->Arg(60000);

void BeatWithoutTimers(benchmark::State& state)
{
    ZtTimerBeat::start();
    for (auto _ : state)
        raise(SIGALRM);
    ZtTimerBeat::stop();
    raise(SIGALRM);
}
BENCHMARK(BeatWithoutTimers)->Name("also/beat_without_timers/ours");

void MaskAndUnmask(benchmark::State& state)
{
    sigset_t alarm_only, before;
    sigemptyset(&alarm_only);
    sigaddset(&alarm_only, SIGALRM);
    for (auto _ : state) {
        pthread_sigmask(SIG_BLOCK, &alarm_only, &before);
        pthread_sigmask(SIG_SETMASK, &before, nullptr);
    }
}
BENCHMARK(MaskAndUnmask)->Name("beat_queue/limit");

/// Empties the queue whenever it is full, for the price of a comparison.
void EmptyWhenFull()
{
    if (ZtTimerBeat::defer_op_count == ZtTimerBeat::defer_op_limit)
        ZtTimerBeat::defer_op_count = 0;
}

void QueueRequest(benchmark::State& state)
{
    ZtTimer timer;
    ZtTimerBeat::execute_ops();
    for (auto _ : state) {
        timer.force(KvoTime::ZERO);
        EmptyWhenFull();
    }
    ZtTimerBeat::defer_op_count = 0;
}
BENCHMARK(QueueRequest)->Name("beat_queue/ours");

void PostAndUnpost(benchmark::State& state)
{
    ZtTimer timer;
    ZtTimerBeat::execute_ops();
    for (auto _ : state) {
        timer.post_trigger(Nothing, nullptr, KvoTime::ZERO);
        timer.unpost(Nothing, nullptr);
        if (ZtTimerBeat::defer_op_count == ZtTimerBeat::defer_op_limit)
            ZtTimerBeat::execute_ops();
    }
    ZtTimerBeat::execute_ops();
}
BENCHMARK(PostAndUnpost)->Name("also/post_and_unpost/ours");

} // namespace
