#ifndef ZT_TESTS_RECORDINGSHUTTLE_H
#define ZT_TESTS_RECORDINGSHUTTLE_H

#include <ZT/shuttle.h>

#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/FakeClock.h"

/// Whether a time in the middle of play is right: the fraction played is a
/// float, and the way through frames costs a tick here and there.
inline testing::AssertionResult IsNear(KvoTime time, KvoTime wanted,
                                       int ticks = 4)
{
    const auto off = static_cast<long>(time.Ticks()) - wanted.Ticks();
    if (off >= -ticks && off <= ticks)
        return testing::AssertionSuccess();
    return testing::AssertionFailure()
           << time.Ticks() << " ticks, wanted " << wanted.Ticks();
}

/// A shuttle on a clock of its own that writes down, in one list, what it tells
/// its subclass and its listener, and runs what a test hangs into that.
class RecordingShuttle : public ZtShuttle
{
public:
    RecordingShuttle() : recorder(*this) { listener = &recorder; }

    /// Sets in point, current time and out point, in seconds, and tells nobody.
    void Mark(int in, int current, int out)
    {
        SetTime(KvoTime(0, 0, in, 0), in_point, 0);
        SetTime(KvoTime(0, 0, current, 0), current_time, 0);
        SetTime(KvoTime(0, 0, out, 0), out_point, 0);
    }

    /// Lets seconds pass, then asks the time, so that an end is noticed.
    KvoTime After(double seconds)
    {
        clock.AdvanceMicroseconds(static_cast<long>(seconds * 1000000));
        return Time();
    }

    /// Starts a delayed play, as the device would that it waits for.
    void GoNow() { ZtShuttle::Go(); }

    void Go() override
    {
        if (delays_go)
            log.push_back("go delayed");
        else
            ZtShuttle::Go();
    }

    void PrePlayNotify(float play_speed, KvoTime play_from,
                       KvoTime play_to) override
    {
        std::ostringstream line;
        line << "pre " << play_speed << " from " << play_from.Ticks() / 6000
             << " to " << play_to.Ticks() / 6000;
        log.push_back(line.str());
    }

    void PlayNotify() override
    {
        log.push_back("play");
        if (on_play)
            on_play();
    }

    void PostPlayNotify() override
    {
        log.push_back("post");
        if (on_post)
            on_post();
    }

    FakeClock clock;
    std::vector<std::string> log;
    bool delays_go = false;
    std::function<void()> on_play;
    std::function<void()> on_post;
    std::function<void(ZtShuttle*)> on_change;

private:
    class Recorder : public ZtShuttleListener
    {
    public:
        explicit Recorder(RecordingShuttle& recording) : owner(recording) {}

        void ShuttleChanged(ZtShuttle* shuttle) override
        {
            owner.log.push_back("changed");
            if (owner.on_change)
                owner.on_change(shuttle);
        }

    private:
        RecordingShuttle& owner;
    };

    Recorder recorder;
};

#endif
