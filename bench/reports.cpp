// What does a report cost that nobody sees, beside one that is made and posted?

#include "ZT/error.h"

#include <benchmark/benchmark.h>

namespace {

/// Swallows whatever it gets.
class Swallow : public ZtErrHandler
{
public:
    void Handle(ZtErr* error) override { delete error; }
};

void Dropped(benchmark::State& state)
{
    for (auto _ : state)
        ZtDebug("frame %d of %s\n", 12, "shot");
}
BENCHMARK(Dropped);

// The same report made in full: what it costs where a host has put a handler
// of its own on the stack.
void Posted(benchmark::State& state)
{
    Swallow handler;
    for (auto _ : state)
        ZtDebug("frame %d of %s\n", 12, "shot");
}
BENCHMARK(Posted);

void CheckThatHolds(benchmark::State& state)
{
    int value = 1;
    for (auto _ : state) {
        benchmark::DoNotOptimize(value);
        benchmark::DoNotOptimize(ZtErr::Check(value, "no value", 4));
    }
}
BENCHMARK(CheckThatHolds);

} // namespace
