#include "support/FakeAlarm.h"

#include <signal.h>

FakeAlarm::FakeAlarm(FakeClock& its_clock)
    : clock(its_clock), real(zt_platform::Alarm::system()),
      before(zt_platform::Alarm::install(this))
{}

FakeAlarm::~FakeAlarm()
{
    signal(SIGALRM, SIG_IGN);
    zt_platform::Alarm::install(before);
}

std::int64_t FakeAlarm::MicrosecondsLeft() const
{
    const std::uint64_t now = clock.steady_nanoseconds();
    return armed && due > now ? static_cast<std::int64_t>((due - now) / 1000)
                              : 0;
}

bool FakeAlarm::Step()
{
    if (!armed)
        return false;
    clock.AdvanceMicroseconds(static_cast<long>(MicrosecondsLeft()));
    armed = false;
    raise(SIGALRM);
    return true;
}

int FakeAlarm::Run(long microseconds)
{
    const std::uint64_t end = clock.steady_nanoseconds() +
                              static_cast<std::uint64_t>(microseconds) * 1000;
    int raised = 0;
    while (armed && due <= end && Step())
        ++raised;
    const std::uint64_t now = clock.steady_nanoseconds();
    if (now < end)
        clock.AdvanceMicroseconds(static_cast<long>((end - now) / 1000));
    return raised;
}

void FakeAlarm::arm(std::int64_t microseconds)
{
    armed = true;
    wait = microseconds;
    due = clock.steady_nanoseconds() +
          static_cast<std::uint64_t>(microseconds) * 1000;
}

zt_platform::AlarmLeft FakeAlarm::left()
{
    const std::int64_t microseconds = MicrosecondsLeft();
    return {static_cast<long>(microseconds / 1000000),
            static_cast<long>(microseconds % 1000000)};
}

void FakeAlarm::listen(Function handler)
{
    real.listen(handler);
}

void FakeAlarm::own()
{
    real.own();
}

zt_platform::AlarmDisposition FakeAlarm::ignore()
{
    return real.ignore();
}

void FakeAlarm::restore(const zt_platform::AlarmDisposition& disposition)
{
    real.restore(disposition);
}

bool FakeAlarm::waiting()
{
    return real.waiting();
}

void FakeAlarm::let_through()
{
    real.let_through();
}

void FakeAlarm::silence_at_exit()
{
    real.silence_at_exit();
}
