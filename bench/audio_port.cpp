// What the beat pays for a port of the machine's device: asking how full its
// queue is and writing a block, beside copying the same samples through the
// same stretch of memory. The other side takes what is written without looking
// at it.

#include <cstring>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>

#include "platform/audio_queue.h"
#include "require.h"

namespace {

using Samples = std::vector<std::int16_t>;

constexpr long capacity = 100000;
constexpr std::size_t places = std::size_t{1} << 18; // those of the queue

void Copy(benchmark::State& state, std::size_t count)
{
    const Samples from(count, 1);
    Samples to(places);
    std::size_t at = 0;
    for (auto _ : state) {
        std::memcpy(to.data() + at, from.data(), count * sizeof from[0]);
        benchmark::ClobberMemory();
        at += count;
        if (at + count > to.size())
            at = 0;
    }
}

void Write(benchmark::State& state, std::size_t count)
{
    const Samples from(count, 1);
    const auto size = static_cast<long>(count);
    zt_platform::AudioQueue queue;
    Require(queue.make(capacity), "audio_port");
    Require(queue.write(from.data(), size) == size, "audio_port");
    Samples back(count);
    Require(queue.read(back.data(), size) == size && back == from,
            "audio_port");
    for (auto _ : state) {
        benchmark::DoNotOptimize(queue.fillable());
        queue.write(from.data(), size);
        queue.drop(size);
    }
}

const bool registered = [] {
    for (const std::size_t count : {1000U, 10000U}) {
        const std::string row = "port_write_" + std::to_string(count);
        benchmark::RegisterBenchmark((row + "/ours").c_str(), Write, count);
        benchmark::RegisterBenchmark((row + "/limit").c_str(), Copy, count);
    }
    return true;
}();

} // namespace
