#ifndef ZT_TESTS_FAKECLOCK_H
#define ZT_TESTS_FAKECLOCK_H

#include "platform/clock.h"

/// Clocks that stand still until a test moves them; in use while they live.
///
/// A sleep moves both clocks on and returns at once.
class FakeClock : public zt_platform::Clock
{
public:
    /// Starts at this many seconds since the beginning of 1970, and at a
    /// steady time of one second.
    explicit FakeClock(long seconds = 1000000000);
    ~FakeClock();
    FakeClock(const FakeClock&) = delete;
    FakeClock& operator=(const FakeClock&) = delete;

    timeval wall() override;
    std::uint64_t steady_nanoseconds() override;
    void sleep_nanoseconds(std::uint64_t nanoseconds) override;

    /// Lets time pass on both clocks. Below 0, only the wall clock goes: it
    /// is set back.
    void AdvanceMicroseconds(long microseconds);

    /// Sets the clock on the wall; the steady one does not notice.
    void SetWall(long seconds, long microseconds);

private:
    zt_platform::Clock* before;
    long wall_microseconds;
    std::uint64_t steady;
};

#endif
