// What timecode costs: the split of a tick count into its parts, and the text
// form, each against the plain way of doing the same.

#include <KVO/KvoTime.h>

#include <cstdio>
#include <ostream>
#include <random>
#include <streambuf>
#include <vector>

#include <benchmark/benchmark.h>
#ifdef ZT_BENCH_FMT
#include <fmt/format.h>
#endif

#include "require.h"
#include "support/LiteralTimecode.h"

namespace {
constexpr std::size_t many = 4096;

/// Times of one day, so that no way has to wrap them.
const std::vector<std::int32_t>& AnyTimes()
{
    static const std::vector<std::int32_t> times = [] {
        std::mt19937 random(42);
        std::uniform_int_distribution<std::int32_t> any(0, 518400000 - 1);
        std::vector<std::int32_t> made(many);
        for (std::int32_t& time : made)
            time = any(random);
        return made;
    }();
    return times;
}

/// Characters that are overwritten from the start again and again.
class Slate : public std::streambuf
{
public:
    void Clean() { setp(text, text + sizeof text); }
    const char* Text() const { return text; }

private:
    char text[64];
};

void SplitLiteral(benchmark::State& state)
{
    const std::vector<std::int32_t>& times = AnyTimes();
    auto fps = static_cast<int>(state.range(0));
    for (auto round : state) {
        (void)round;
        for (const std::int32_t ticks : times) {
            benchmark::DoNotOptimize(fps);
            LiteralTimecode code = LiteralSplit(ticks, fps);
            benchmark::DoNotOptimize(code);
        }
    }
    state.SetItemsProcessed(state.iterations() *
                            static_cast<std::int64_t>(many));
}

LiteralTimecode SplitOurs(std::int32_t ticks, int fps)
{
    LiteralTimecode code;
    int hours;
    code.hours = KvoTime::FromTicks(ticks).Timecode(
        &hours, &code.minutes, &code.seconds, &code.frames, fps);
    return code;
}

void Split(benchmark::State& state)
{
    const std::vector<std::int32_t>& times = AnyTimes();
    auto fps = static_cast<int>(state.range(0));
    for (const std::int32_t ticks : times)
        Require(SplitOurs(ticks, fps) == LiteralSplit(ticks, fps),
                "timecode split");
    for (auto round : state) {
        (void)round;
        for (const std::int32_t ticks : times) {
            benchmark::DoNotOptimize(fps);
            LiteralTimecode code = SplitOurs(ticks, fps);
            benchmark::DoNotOptimize(code);
        }
    }
    state.SetItemsProcessed(state.iterations() *
                            static_cast<std::int64_t>(many));
}

void TextSnprintf(benchmark::State& state)
{
    const std::vector<std::int32_t>& times = AnyTimes();
    char text[64];
    for (auto round : state) {
        (void)round;
        for (const std::int32_t ticks : times) {
            const LiteralTimecode code = LiteralSplit(ticks, 30);
            std::snprintf(text, sizeof text, "%02ld:%02d:%02d:%02d", code.hours,
                          code.minutes, code.seconds, code.frames);
            benchmark::DoNotOptimize(text);
        }
    }
    state.SetItemsProcessed(state.iterations() *
                            static_cast<std::int64_t>(many));
}

#ifdef ZT_BENCH_FMT
void TextFmt(benchmark::State& state)
{
    const std::vector<std::int32_t>& times = AnyTimes();
    char text[64];
    for (auto round : state) {
        (void)round;
        for (const std::int32_t ticks : times) {
            const LiteralTimecode code = LiteralSplit(ticks, 30);
            *fmt::format_to(text, "{:02}:{:02}:{:02}:{:02}", code.hours,
                            code.minutes, code.seconds, code.frames) = '\0';
            benchmark::DoNotOptimize(text);
        }
    }
    state.SetItemsProcessed(state.iterations() *
                            static_cast<std::int64_t>(many));
}
#endif

void TextLiteral(benchmark::State& state)
{
    const std::vector<std::int32_t>& times = AnyTimes();
    Slate slate;
    std::ostream out(&slate);
    for (auto round : state) {
        (void)round;
        for (const std::int32_t ticks : times) {
            slate.Clean();
            LiteralWrite(out, LiteralSplit(ticks, 30));
            benchmark::DoNotOptimize(slate.Text());
        }
    }
    state.SetItemsProcessed(state.iterations() *
                            static_cast<std::int64_t>(many));
}

void TextWrite(benchmark::State& state)
{
    const std::vector<std::int32_t>& times = AnyTimes();
    Slate slate;
    std::ostream out(&slate);
    for (auto round : state) {
        (void)round;
        for (const std::int32_t ticks : times) {
            slate.Clean();
            KvoTime::FromTicks(ticks).Write(out);
            benchmark::DoNotOptimize(slate.Text());
        }
    }
    state.SetItemsProcessed(state.iterations() *
                            static_cast<std::int64_t>(many));
}
} // namespace

BENCHMARK(Split)->Name("timecode_split/ours")->Arg(30);
BENCHMARK(SplitLiteral)->Name("timecode_split/literal")->Arg(30);
BENCHMARK(Split)->Name("timecode_split_25/ours")->Arg(25);
BENCHMARK(SplitLiteral)->Name("timecode_split_25/literal")->Arg(25);
BENCHMARK(Split)->Name("timecode_split_7/ours")->Arg(7);
BENCHMARK(SplitLiteral)->Name("timecode_split_7/literal")->Arg(7);
BENCHMARK(TextWrite)->Name("timecode_text/ours");
BENCHMARK(TextLiteral)->Name("timecode_text/literal");
BENCHMARK(TextSnprintf)->Name("timecode_text/snprintf");
#ifdef ZT_BENCH_FMT
BENCHMARK(TextFmt)->Name("timecode_text/fmt");
#endif
