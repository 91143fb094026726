#include "ZT/swatch.h"

#include "platform/clock.h"

namespace {
double seconds_between(const timeval& from, const timeval& to)
{
    return static_cast<double>(to.tv_sec - from.tv_sec) +
           static_cast<double>(to.tv_usec - from.tv_usec) / 1000000.0;
}
} // namespace

constinit ZtMicroWatch::Counter ZtMicroWatch::iotimer;
constinit std::uint32_t ZtMicroWatch::microRes = 0;

ZtStopWatch::ZtStopWatch(double watch_rate)
    : start(zt_platform::Clock::current().wall()), rate(watch_rate)
{}

ZtStopWatch::~ZtStopWatch() = default;

double ZtStopWatch::Mark()
{
    const timeval now = zt_platform::Clock::current().wall();
    const double reading = seconds_between(start, now) * rate;
    start = now;
    return reading;
}

double ZtStopWatch::Split()
{
    return seconds_between(start, zt_platform::Clock::current().wall()) * rate;
}

std::uint32_t ZtMicroWatch::Counter::operator*() const
{
    return running ? static_cast<std::uint32_t>(
                         zt_platform::Clock::current().steady_nanoseconds())
                   : 0;
}

ZtMicroWatch::ZtMicroWatch() : start(0)
{
    if (!iotimer)
        InitCycleTimer();
    start = *iotimer;
}

ZtMicroWatch::~ZtMicroWatch() = default;

void ZtMicroWatch::InitCycleTimer()
{
    iotimer.running = true;
    microRes = 1000;
}
