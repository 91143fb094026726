#ifndef ZT_TESTS_FAKEALARM_H
#define ZT_TESTS_FAKEALARM_H

#include "platform/alarm.h"
#include "support/FakeClock.h"

/// An alarm whose timer runs by a fake clock, in use while it lives.
///
/// Only the timer is faked. The signal is the real one: a step raises it on the
/// calling thread, so that the beat runs where it always does, in the signal,
/// and is held back or ignored as it always is. At the end the signal is
/// ignored, and what waits of it is gone.
class FakeAlarm : public zt_platform::Alarm
{
public:
    explicit FakeAlarm(FakeClock& its_clock);
    ~FakeAlarm();
    FakeAlarm(const FakeAlarm&) = delete;
    FakeAlarm& operator=(const FakeAlarm&) = delete;

    /// Lets time pass until the timer runs down, and raises the signal.
    ///
    /// Returns: false when the timer does not run.
    bool Step();

    /// Steps as long as the timer runs down within this time, and lets the
    /// rest of it pass.
    ///
    /// Returns: how often the signal was raised.
    int Run(long microseconds);

    bool Armed() const { return armed; }

    /// Gives what the timer was set to last.
    std::int64_t Wait() const { return wait; }

    void arm(std::int64_t microseconds) override;
    zt_platform::AlarmLeft left() override;
    void listen(Function handler) override;
    void own() override;
    zt_platform::AlarmDisposition ignore() override;
    void restore(const zt_platform::AlarmDisposition& disposition) override;
    bool waiting() override;
    void let_through() override;
    void silence_at_exit() override;

private:
    std::int64_t MicrosecondsLeft() const;

    FakeClock& clock;
    zt_platform::Alarm& real;
    zt_platform::Alarm* before;
    bool armed = false;
    std::int64_t wait = 0;
    std::uint64_t due = 0; ///< On the steady clock.
};

#endif
