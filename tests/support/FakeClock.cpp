#include "support/FakeClock.h"

namespace {
constexpr long second = 1000000; // in microseconds
}

FakeClock::FakeClock(long seconds)
    : before(zt_platform::Clock::install(this)),
      wall_microseconds(seconds * second), steady(1000000000)
{}

FakeClock::~FakeClock()
{
    zt_platform::Clock::install(before);
}

timeval FakeClock::wall()
{
    timeval now = {};
    now.tv_sec = wall_microseconds / second;
    now.tv_usec = wall_microseconds % second;
    return now;
}

std::uint64_t FakeClock::steady_nanoseconds()
{
    return steady;
}

void FakeClock::sleep_nanoseconds(std::uint64_t nanoseconds)
{
    steady += nanoseconds;
    wall_microseconds += static_cast<long>(nanoseconds / 1000);
}

void FakeClock::AdvanceMicroseconds(long microseconds)
{
    wall_microseconds += microseconds;
    if (microseconds > 0)
        steady += static_cast<std::uint64_t>(microseconds) * 1000;
}

void FakeClock::SetWall(long seconds, long microseconds)
{
    wall_microseconds = seconds * second + microseconds;
}
