#include "platform/clock.h"

#include <cerrno>
#include <limits>
#include <time.h>

namespace zt_platform {

namespace {

constexpr std::uint64_t second = 1000000000;

std::uint64_t steady_now()
{
    timespec now = {};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<std::uint64_t>(now.tv_sec) * second +
           static_cast<std::uint64_t>(now.tv_nsec);
}

class PosixClock final : public Clock
{
public:
    timeval wall() override
    {
        timeval now = {};
        gettimeofday(&now, nullptr);
        return now;
    }

    std::uint64_t steady_nanoseconds() override { return steady_now(); }

    void sleep_nanoseconds(std::uint64_t nanoseconds) override
    {
        // Until a moment, not for a time: the beat interrupts a sleep 250
        // times a second, and rests that are slept again add up.
        const std::uint64_t now = steady_now();
        const std::uint64_t longest =
            std::numeric_limits<std::int64_t>::max() - now;
        const std::uint64_t end =
            now + (nanoseconds < longest ? nanoseconds : longest);
        timespec until = {};
        until.tv_sec = static_cast<time_t>(end / second);
        until.tv_nsec = static_cast<long>(end % second);
        while (clock_nanosleep(CLOCK_MONOTONIC, TIMER_ABSTIME, &until,
                               nullptr) == EINTR) {
        }
    }
};

constinit PosixClock posix_clock;
constinit Clock* installed = nullptr;

} // namespace

Clock& Clock::current()
{
    return installed ? *installed : posix_clock;
}

Clock* Clock::install(Clock* other)
{
    Clock* const before = installed;
    installed = other;
    return before;
}

DayTime local_day_time(time_t moment)
{
    tm local = {};
    if (!localtime_r(&moment, &local))
        return {};
    return {local.tm_hour, local.tm_min, local.tm_sec};
}

} // namespace zt_platform
