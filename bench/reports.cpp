// What does a report cost that nobody sees, beside one that is made and posted?

#include "ZT/error.h"

#include <benchmark/benchmark.h>

#include <cstdarg>
#include <cstdio>
#include <sstream>
#include <string>
#ifdef ZT_BENCH_SPDLOG
#include <spdlog/sinks/base_sink.h>
#include <spdlog/spdlog.h>
#endif

#include "require.h"

namespace {

/// Reads whatever it gets.
class Reader : public ZtErrHandler
{
public:
    void Handle(ZtErr* error) override
    {
        text = error->Message();
        delete error;
    }

    std::string text;
};

void Dropped(benchmark::State& state)
{
    const int before = ZtErr::count;
    ZtDebug("frame %d of %s\n", 12, "shot");
    Require(ZtErr::count == before + 1, "dropped error");
    for (auto _ : state)
        ZtDebug("frame %d of %s\n", 12, "shot");
}

/// The same with nothing foreseen: the error is made, its text composed, and
/// the last handler of the stack finds that its level is too low.
class LiteralError
{
public:
    LiteralError(int error_level, const char* text) : level(error_level)
    {
        ++count;
        stream << text;
    }

    static int count;
    int level;
    std::ostringstream stream;
};
int LiteralError::count = 0;

class LiteralHandler
{
public:
    virtual ~LiteralHandler() = default;
    virtual void Handle(LiteralError* error)
    {
        if (error->level >= ZtErrHandler::outputLevel)
            std::fputs(error->stream.str().c_str(), stderr);
        delete error;
    }
};

__attribute__((format(printf, 2, 3))) void LiteralDebug(LiteralHandler& handler,
                                                        const char* format, ...)
{
    char text[2048];
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    handler.Handle(new LiteralError(1, text));
}

void DroppedLiterally(benchmark::State& state)
{
    LiteralHandler handler;
    for (auto _ : state)
        LiteralDebug(handler, "frame %d of %s\n", 12, "shot");
}

void Posted(benchmark::State& state)
{
    Reader handler;
    for (auto _ : state)
        ZtWarning("frame %d of %s\n", 12, "shot");
    Require(handler.text == "Warning: frame 12 of shot\n", "posted error");
}

#ifdef ZT_BENCH_SPDLOG
/// Composes the line as its pattern says and reads it, as the handler does.
class ReadingSink : public spdlog::sinks::base_sink<spdlog::details::null_mutex>
{
public:
    std::string text;

protected:
    void sink_it_(const spdlog::details::log_msg& message) override
    {
        spdlog::memory_buf_t line;
        formatter_->format(message, line);
        text.assign(line.data(), line.size());
    }
    void flush_() override {}
};

/// Warns as hosts of spdlog do: the line has a time, a name and a level, for
/// that is the pattern a logger comes with.
void PostedToSpdlog(benchmark::State& state)
{
    const auto sink = std::make_shared<ReadingSink>();
    spdlog::logger logger("reports", sink);
    for (auto _ : state)
        logger.warn("frame {} of {}", 12, "shot");
    Require(sink->text.ends_with("[reports] [warning] frame 12 of shot\n"),
            "spdlog");
}

/// The same with a pattern of just what our reports say. It asks for no time,
/// but a logger takes the time of every message whether it is asked for or not.
void PostedToSpdlogShortly(benchmark::State& state)
{
    const auto sink = std::make_shared<ReadingSink>();
    spdlog::logger logger("reports", sink);
    logger.set_pattern("%l: %v");
    for (auto _ : state)
        logger.warn("frame {} of {}", 12, "shot");
    Require(sink->text == "warning: frame 12 of shot\n", "spdlog");
}
BENCHMARK(PostedToSpdlog)->Name("error_posted/spdlog");
BENCHMARK(PostedToSpdlogShortly)->Name("error_posted/spdlog short pattern");
#endif

void CheckThatHolds(benchmark::State& state)
{
    int value = 1;
    for (auto _ : state) {
        benchmark::DoNotOptimize(value);
        benchmark::DoNotOptimize(ZtErr::Check(value, "no value", 4));
    }
}

BENCHMARK(Dropped)->Name("error_dropped/ours");
BENCHMARK(DroppedLiterally)->Name("error_dropped/literal");
BENCHMARK(Posted)->Name("error_posted/ours");
BENCHMARK(CheckThatHolds)->Name("also/check_that_holds/ours");

} // namespace
