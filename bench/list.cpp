// How cheap are the links of a list?

#include "KVO/KvoList.h"

#include <benchmark/benchmark.h>
#include <list>

namespace {

void Push(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    int item;
    for (auto _ : state) {
        KvoList list;
        for (int i = 0; i < count; ++i)
            list.PushTail(&item);
        state.PauseTiming();
        list.Clear();
        state.ResumeTiming();
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void PushToStdList(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    int item;
    for (auto _ : state) {
        std::list<void*> list;
        for (int i = 0; i < count; ++i)
            list.push_back(&item);
        state.PauseTiming();
        list.clear();
        state.ResumeTiming();
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void Pop(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    int item;
    for (auto _ : state) {
        state.PauseTiming();
        KvoList list;
        for (int i = 0; i < count; ++i)
            list.PushTail(&item);
        state.ResumeTiming();
        while (void* popped = list.Pop())
            benchmark::DoNotOptimize(popped);
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void PopFromStdList(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    int item;
    for (auto _ : state) {
        state.PauseTiming();
        std::list<void*> list(static_cast<std::size_t>(count), &item);
        state.ResumeTiming();
        while (!list.empty()) {
            benchmark::DoNotOptimize(list.front());
            list.pop_front();
        }
    }
    state.SetItemsProcessed(state.iterations() * count);
}

// A queue of eight through which everything passes.
void ShortQueue(benchmark::State& state)
{
    KvoList list;
    int item;
    for (int i = 0; i < 8; ++i)
        list.PushTail(&item);
    for (auto _ : state) {
        list.PushTail(&item);
        benchmark::DoNotOptimize(list.Pop());
    }
    state.SetItemsProcessed(state.iterations());
}

void ShortQueueOfStdList(benchmark::State& state)
{
    int item;
    std::list<void*> list(8, &item);
    for (auto _ : state) {
        list.push_back(&item);
        benchmark::DoNotOptimize(list.front());
        list.pop_front();
    }
    state.SetItemsProcessed(state.iterations());
}

void Clear(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    int item;
    for (auto _ : state) {
        state.PauseTiming();
        KvoList list;
        for (int i = 0; i < count; ++i)
            list.PushTail(&item);
        state.ResumeTiming();
        list.Clear();
    }
}

void ClearStdList(benchmark::State& state)
{
    const auto count = static_cast<std::size_t>(state.range(0));
    int item;
    for (auto _ : state) {
        state.PauseTiming();
        std::list<void*> list(count, &item);
        state.ResumeTiming();
        list.clear();
    }
}

BENCHMARK(Push)->Name("list_push/ours")->Arg(10000);
BENCHMARK(PushToStdList)->Name("list_push/std::list")->Arg(10000);
BENCHMARK(Pop)->Name("list_pop/ours")->Arg(10000);
BENCHMARK(PopFromStdList)->Name("list_pop/std::list")->Arg(10000);
BENCHMARK(ShortQueue)->Name("list_queue/ours");
BENCHMARK(ShortQueueOfStdList)->Name("list_queue/std::list");
BENCHMARK(Clear)->Name("list_clear/ours")->Arg(1000000)->Iterations(20);
BENCHMARK(ClearStdList)
    ->Name("list_clear/std::list")
    ->Arg(1000000)
    ->Iterations(20);
BENCHMARK(Push)
    ->Name("curve/list_push/ours")
    ->RangeMultiplier(10)
    ->Range(10, 10000000);
BENCHMARK(PushToStdList)
    ->Name("curve/list_push/std::list")
    ->RangeMultiplier(10)
    ->Range(10, 10000000);

} // namespace
