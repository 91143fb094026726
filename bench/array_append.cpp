// What does it cost to append ten million numbers to an array?
//
// Each time in a process of its own: how a large block grows depends on what
// was given back to the C library before, and what one array frees would decide
// on the time of the other.

#include "KVO/KvoObjArr.h"

#include <benchmark/benchmark.h>
#include <vector>

#include "in_a_child.h"

namespace {

constexpr int count = 10000000;

void Append(benchmark::State& state)
{
    for (auto _ : state)
        state.SetIterationTime(SecondsInAChild([] {
            KvoIntArray array;
            for (int i = 0; i < count; ++i)
                array[i] = i;
            benchmark::DoNotOptimize(array.data);
            return array.size == count && array[count - 1] == count - 1;
        }));
}

void AppendToVector(benchmark::State& state)
{
    for (auto _ : state)
        state.SetIterationTime(SecondsInAChild([] {
            std::vector<int> array;
            for (int i = 0; i < count; ++i)
                array.push_back(i);
            benchmark::DoNotOptimize(array.data());
            return array.size() == count && array[count - 1] == count - 1;
        }));
}

BENCHMARK(Append)
    ->Name("array_append/ours")
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
BENCHMARK(AppendToVector)
    ->Name("array_append/std::vector")
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);

} // namespace
