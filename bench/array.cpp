// How cheap is appending to an array, and reading it back?

#include "KVO/KvoObjArr.h"

#include <benchmark/benchmark.h>
#include <vector>

namespace {

void AppendInts(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    for (auto _ : state) {
        KvoIntArray array;
        for (int i = 0; i < count; ++i)
            array[i] = i;
        benchmark::DoNotOptimize(array.data);
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void AppendIntsBySize(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    for (auto _ : state) {
        KvoIntArray array;
        for (int i = 0; i < count; ++i)
            array[array.size] = i;
        benchmark::DoNotOptimize(array.data);
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void AppendIntsToVector(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    for (auto _ : state) {
        std::vector<int> array;
        for (int i = 0; i < count; ++i)
            array.push_back(i);
        benchmark::DoNotOptimize(array.data());
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void AppendObjects(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    KvoObject object;
    for (auto _ : state) {
        KvoObjArray array;
        for (int i = 0; i < count; ++i)
            array.Insert(&object, array.size);
        benchmark::DoNotOptimize(array.data);
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void AppendObjectsToVector(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    KvoObject object;
    for (auto _ : state) {
        std::vector<KvoObject*> array;
        for (int i = 0; i < count; ++i)
            array.push_back(&object);
        benchmark::DoNotOptimize(array.data());
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void BumpInts(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    for (auto _ : state) {
        KvoIntArray array;
        for (int i = 0; i < count; ++i) {
            array.BumpSize(1);
            static_cast<int*>(array.data)[i] = i;
        }
        benchmark::DoNotOptimize(array.data);
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void SumInts(benchmark::State& state)
{
    const int count = static_cast<int>(state.range(0));
    KvoIntArray array(count);
    for (auto _ : state) {
        int sum = 0;
        for (int i = 0; i < count; ++i)
            sum += array[i];
        benchmark::DoNotOptimize(sum);
    }
    state.SetItemsProcessed(state.iterations() * count);
}

BENCHMARK(AppendInts)
    ->Name("curve/array_append/ours")
    ->RangeMultiplier(10)
    ->Range(10, 100000000);
BENCHMARK(AppendIntsToVector)
    ->Name("curve/array_append/std::vector")
    ->RangeMultiplier(10)
    ->Range(10, 100000000);
BENCHMARK(AppendIntsBySize)->Name("also/append_by_size/ours")->Arg(10000000);
BENCHMARK(BumpInts)->Name("also/bump/ours")->Arg(1000000);
BENCHMARK(AppendObjects)->Name("also/append_objects/ours")->Arg(10000000);
BENCHMARK(AppendObjectsToVector)
    ->Name("also/append_objects/std::vector")
    ->Arg(10000000);
BENCHMARK(SumInts)->Name("also/sum/ours")->Arg(10000);

} // namespace
