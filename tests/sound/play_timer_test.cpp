#include <cmath>
#include <limits>

#include "platform/pages.h"
#include "sound/SoundTest.h"

namespace {
using Control = ZtSoundControl;

const KvoTime one_second(0, 0, 1, 0);
const KvoTime ten_seconds(0, 0, 10, 0);

/// The system's pages, with a limit and a count of what is large and in use.
class WatchedPages : public zt_platform::Pages
{
public:
    WatchedPages() : real(current()), before(install(this)) {}
    ~WatchedPages() { install(before); }
    void* map(std::size_t bytes) override
    {
        void* const memory = bytes > most_bytes ? nullptr : real.map(bytes);
        large += memory && bytes >= large_bytes;
        return memory;
    }
    void unmap(void* memory, std::size_t bytes) override
    {
        large -= memory && bytes >= large_bytes;
        real.unmap(memory, bytes);
    }

    std::size_t most_bytes = std::numeric_limits<std::size_t>::max();
    int large = 0;

private:
    static constexpr std::size_t large_bytes = 1000000;
    zt_platform::Pages& real;
    zt_platform::Pages* before;
};

class PlayTimer : public SoundTest
{
protected:
    /// Gives the callbacks that are posted on a timer, triggers and repeats.
    static int Posted(const ZtTimer& timer)
    {
        int count = 0;
        for (const ZtTimerCallbackInfo* info = timer.callbacks; info;
             info = info->next)
            ++count;
        return count;
    }
};
} // namespace

TEST_F(PlayTimer, ASoundBeginsWhenTheTimerReachesItsTime)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(4000), 8000);
    Control::Play(&sound, &timer, one_second);
    Start(timer);

    RunFor(0.98);
    EXPECT_EQ(device.open_ports, 0);
    RunFor(0.02);
    EXPECT_EQ(device.open_ports, 1);
    EXPECT_EQ(timer.current.Ticks() / 24 * 24, 6000);

    RunFor(1.0);
    EXPECT_EQ(device.played, Ramp(4000));
    EXPECT_EQ(Control::OutputRate(), 8000);
}

TEST_F(PlayTimer, ThePortIsReadyBeforeTheBeatAndOpenedLikeTheSound)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = StereoSound({{1, 2}, {3, 4}}, 22050);

    Control::Play(&sound, &timer, KvoTime());
    EXPECT_EQ(device.ready_ports, 1);
    EXPECT_EQ(device.open_ports, 0);
    Start(timer);
    Beats(1);

    ASSERT_EQ(device.opens.size(), 1U);
    EXPECT_EQ(device.opens[0].channels, 2);
    EXPECT_EQ(device.opens[0].queue_size, 100000);
}

TEST_F(PlayTimer, AShortSoundIsQueuedAtOnce)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(100000), 44100);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    Beats(1);

    EXPECT_EQ(device.blocks, std::vector<long>{100000});
    EXPECT_EQ(device.written, Ramp(100000));
}

TEST_F(PlayTimer, ALongSoundIsFedInBlocksOf50000)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(270000), 44100);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);

    RunFor(9);

    EXPECT_EQ(device.blocks,
              (std::vector<long>{100000, 50000, 50000, 50000, 20000}));
    EXPECT_EQ(device.played, Ramp(270000));
}

TEST_F(PlayTimer, TheRestIsQueuedAsSoonAsAllOfItFits)
{
    ZtTimer timer(KvoTime(), KvoTime(0, 1, 0, 0));
    KvoSound sound = MonoSound(Ramp(150000), 10000);
    Control::Play(&sound, &timer, KvoTime());
    StartInStep(timer);

    RunFor(4.9);
    EXPECT_EQ(device.blocks, std::vector<long>{100000});
    RunFor(0.1); // now exactly 50000 are free

    EXPECT_EQ(device.blocks, (std::vector<long>{100000, 50000}));
}

TEST_F(PlayTimer, ABlockIsQueuedWhenMoreThanHalfOfTheQueueIsFree)
{
    ZtTimer timer(KvoTime(), KvoTime(0, 1, 0, 0));
    KvoSound sound = MonoSound(Ramp(250000), 10000);
    Control::Play(&sound, &timer, KvoTime());
    StartInStep(timer);

    RunFor(5); // exactly 50000 are free
    EXPECT_EQ(device.blocks, std::vector<long>{100000});
    RunFor(0.1);

    EXPECT_EQ(device.blocks, (std::vector<long>{100000, 50000}));
}

TEST_F(PlayTimer, TheSoundIsFedEveryHundredMilliseconds)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(10));
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    Beats(2);

    const ZtTimerCallbackInfo* const repeat = timer.callbacks->next;
    ASSERT_NE(repeat, nullptr);
    EXPECT_EQ(repeat->kind, ZtTimerCallbackInfo::Repeat);
    EXPECT_EQ(repeat->callback, Control::PlayContinueCB);
    EXPECT_EQ(repeat->interval, 100);
    ASSERT_NE(repeat->next, nullptr);
    EXPECT_EQ(repeat->next->callback, Control::PlayEndCB);
    EXPECT_EQ(repeat->next->time, ten_seconds);
    ASSERT_NE(timer.stop_callbacks, nullptr);
    EXPECT_EQ(timer.stop_callbacks->callback, Control::PlayEndCB);
}

TEST_F(PlayTimer, ThePortIsClosedWhenTheQueueHasDrained)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(8000), 8000);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);

    RunFor(0.9);
    EXPECT_EQ(device.open_ports, 1);
    RunFor(0.3);

    EXPECT_EQ(device.open_ports, 0);
    EXPECT_EQ(device.ready_ports, 1); // the record lives until the timer ends
    RunFor(10);
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(PlayTimer, WhatLiesBeforeTheStartOfTheTimerIsLeftOut)
{
    ZtTimer timer(ten_seconds, KvoTime(0, 0, 20, 0));
    KvoSound sound = MonoSound(Ramp(16000), 8000);

    Control::Play(&sound, &timer, KvoTime(0, 0, 9, 15));
    Start(timer);
    RunFor(3);

    EXPECT_EQ(device.played, Part(Ramp(16000), 4000));
}

TEST_F(PlayTimer, WholeFramesAreLeftOutSoThatStereoBeginsLeft)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    Frames frames;
    for (int frame = 0; frame < 10000; ++frame)
        frames.push_back({frame, -frame});
    KvoSound sound = StereoSound(frames, 7000);

    Control::Play(&sound, &timer, KvoTime::FromTicks(-1001));
    Start(timer);
    RunFor(2);

    // 1001 of 8571 ticks are 1167.9 of 10000 frames.
    ASSERT_EQ(device.played.size(), 2 * (10000U - 1167U));
    EXPECT_EQ(device.played[0], 1167);
    EXPECT_EQ(device.played[1], -1167);
}

TEST_F(PlayTimer, ASoundThatEndsBeforeTheTimerStartsPlaysNothing)
{
    ZtTimer timer(ten_seconds, KvoTime(0, 0, 20, 0));
    KvoSound sound = MonoSound(Ramp(8000), 8000);

    Control::Play(&sound, &timer, one_second);
    Start(timer);
    RunFor(2);

    EXPECT_TRUE(device.written.empty());
    EXPECT_EQ(device.open_ports, 0);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(PlayTimer, ASoundAtOrBehindTheEndIsNotPlayed)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(10));

    Control::Play(&sound, &timer, ten_seconds);
    Control::Play(&sound, &timer, KvoTime(0, 1, 0, 0));
    Start(timer);
    RunFor(11);

    EXPECT_TRUE(device.opens.empty());
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(PlayTimer, AnEndlessTimerRefusesNothing)
{
    ZtTimer timer;
    KvoSound sound = MonoSound(Ramp(800), 8000);

    Control::Play(&sound, &timer, one_second); // behind its end of 3 ticks
    Start(timer);
    RunFor(2);

    EXPECT_EQ(device.played, Ramp(800));
    for (const ZtTimerCallbackInfo* info = timer.callbacks; info;
         info = info->next)
        EXPECT_NE(info->callback, Control::PlayEndCB);
    timer.stop();
    Beats(1);
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(PlayTimer, ABackwardTimerPlaysTheSoundBackwardAndEndsAtItsTime)
{
    ZtTimer timer(ten_seconds, KvoTime());
    KvoSound sound = MonoSound(Ramp(16000), 8000);
    Control::Play(&sound, &timer, KvoTime(0, 0, 5, 0)); // from 5 s to 7 s
    Start(timer);

    RunFor(2.99);
    EXPECT_TRUE(device.opens.empty());
    RunFor(0.02);
    EXPECT_EQ(device.open_ports, 1);
    RunFor(2.1);

    EXPECT_EQ(device.played, Backward(Ramp(16000)));
    EXPECT_EQ(device.open_ports, 0);
}

TEST_F(PlayTimer, ABackwardTimerLeavesOutWhatLiesOverItsStart)
{
    ZtTimer timer(ten_seconds, KvoTime());
    KvoSound sound = MonoSound(Ramp(16000), 8000);

    Control::Play(&sound, &timer, KvoTime(0, 0, 9, 0)); // from 9 s to 11 s
    Start(timer);
    RunFor(3);

    EXPECT_EQ(device.played, Backward(Ramp(8000)));
}

TEST_F(PlayTimer, ABackwardTimerDoesNotPlayWhatLiesBehindItsEnd)
{
    ZtTimer timer(ten_seconds, KvoTime(0, 0, 5, 0));
    KvoSound sound = MonoSound(Ramp(8000), 8000);

    Control::Play(&sound, &timer, KvoTime(0, 0, 4, 0)); // up to the very end
    Start(timer);
    RunFor(6);

    EXPECT_TRUE(device.opens.empty());
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(PlayTimer, TheReversedCopyGoesWhenTheQueueHasDrained)
{
    ZtTimer timer(KvoTime(0, 1, 40, 0), KvoTime());
    KvoSound sound = MonoSound(Ramp(500000), 50000);
    WatchedPages pages;
    Control::Play(&sound, &timer, KvoTime(0, 1, 30, 0)); // the whole of it
    const int with_copy = pages.large;
    Start(timer);

    RunFor(9.9);
    EXPECT_EQ(pages.large, with_copy);
    RunFor(0.3);

    EXPECT_EQ(pages.large, with_copy - 1);
    EXPECT_EQ(timer.state, ZtTimer::Running);
}

TEST_F(PlayTimer, AStereoSoundPlayedBackwardExchangesItsChannels)
{
    ZtTimer timer(ten_seconds, KvoTime());
    KvoSound sound = StereoSound({{1, 2}, {3, 4}});

    Control::Play(&sound, &timer, KvoTime(0, 0, 9, 0));
    Start(timer);
    RunFor(2);

    EXPECT_EQ(device.played, (Samples{4, 3, 2, 1}));
}

TEST_F(PlayTimer, ATimerThatIsTurnedRoundLaterPlaysTheOtherWay)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(800), 8000);
    Control::Play(&sound, &timer, KvoTime(0, 0, 5, 0));
    timer.reverse();
    Start(timer);

    RunFor(6);

    EXPECT_EQ(device.played, Backward(Ramp(800)));
}

TEST_F(PlayTimer, WithoutMemoryForTheReversedCopyNothingIsPlayed)
{
    WatchedPages pages;
    pages.most_bytes = 4000000;
    ZtTimer timer(ten_seconds, KvoTime());
    KvoSound sound = MonoSound(Ramp(2500000), 8000);

    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    RunFor(1);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for writing.\n");
    EXPECT_TRUE(device.written.empty());
}

TEST_F(PlayTimer, AtDoubleSpeedEverySecondSampleIsPlayed)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(20000), 44100);
    Control::PlaySpeed(2.0F);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    Beats(1);

    EXPECT_EQ(device.blocks, std::vector<long>{10000});
    for (std::size_t place = 0; place < 10000; ++place)
        ASSERT_EQ(device.written[place], static_cast<short>(2 * place));
}

TEST_F(PlayTimer, AtHalfSpeedEverySampleIsPlayedTwice)
{
    ZtTimer timer(KvoTime(), KvoTime(0, 1, 0, 0));
    KvoSound sound = MonoSound(Ramp(200000), 44100);
    Control::PlaySpeed(0.5F);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);

    RunFor(12);

    EXPECT_EQ(device.blocks[0], 100000);
    EXPECT_EQ(device.blocks[1], 50000);
    ASSERT_EQ(device.played.size(), 400000U);
    for (std::size_t place = 0; place < 400000; ++place)
        ASSERT_EQ(device.played[place], static_cast<short>(place / 2 % 32000));
}

TEST_F(PlayTimer, ASpeedThatIsNotAboveZeroWaitsAndPlaysNothing)
{
    for (const float speed : {0.0F, -1.0F, std::nanf("")}) {
        ZtTimer timer(KvoTime(), ten_seconds);
        KvoSound sound = MonoSound(Ramp(800), 8000);
        Control::PlaySpeed(speed);
        Control::Play(&sound, &timer, KvoTime());
        Start(timer);
        RunFor(1);
        EXPECT_TRUE(device.blocks.empty()) << speed;

        Control::PlaySpeed(1.0F);
        RunFor(1);

        EXPECT_EQ(device.played, Ramp(800)) << speed;
        device.played.clear();
        device.blocks.clear();
    }
}

TEST_F(PlayTimer, ASpeedThatUsesNoneOrAllOfTheSamplesEndsThePlayback)
{
    for (const float speed :
         {1e30F, std::numeric_limits<float>::infinity(), 1e-30F}) {
        ZtTimer timer(KvoTime(), KvoTime(0, 1, 0, 0));
        KvoSound sound = MonoSound(Ramp(800), 8000);
        Control::PlaySpeed(speed);
        Control::Play(&sound, &timer, KvoTime());
        Start(timer);

        RunFor(20);

        EXPECT_EQ(device.open_ports, 0) << speed;
        EXPECT_EQ(device.played, Samples(speed < 1 ? 100000 : 0)) << speed;
        device.played.clear();
    }
}

TEST_F(PlayTimer, StoppingTheTimerStopsTheSoundForGood)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(80000), 8000);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    RunFor(1);

    timer.stop();
    Beats(2);
    EXPECT_EQ(device.ready_ports, 0);
    EXPECT_EQ(Posted(timer), 0);
    const std::size_t played = device.played.size();
    EXPECT_NEAR(static_cast<double>(played), 8000, 100);

    timer.reset_callbacks();
    Start(timer);
    RunFor(1);
    timer.stop();
    Beats(1);

    EXPECT_EQ(device.played.size(), played);
    EXPECT_EQ(device.opens.size(), 1U);
}

TEST_F(PlayTimer, AStopRecordOfAnEarlierSoundDoesNotEndALaterOne)
{
    ZtTimer first(KvoTime(), one_second);
    ZtTimer second(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(80000), 8000);
    Control::Play(&sound, &first, KvoTime());
    Start(first);
    RunFor(1.2); // the end of the timer ends the sound, its stop record stays
    Control::Play(&sound, &second, KvoTime());
    Start(second);
    Start(first);

    first.stop();
    Beats(2);

    EXPECT_EQ(device.open_ports, 1);
    EXPECT_TRUE(Control::Playing(&sound));
}

TEST_F(PlayTimer, TheEndOfTheTimerEndsTheSoundForGood)
{
    ZtTimer timer(KvoTime(), one_second);
    KvoSound sound = MonoSound(Ramp(80000), 8000);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);

    RunFor(1.2);
    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(device.ready_ports, 0);
    EXPECT_EQ(Posted(timer), 0);
    Start(timer);
    RunFor(1.2);

    EXPECT_EQ(device.opens.size(), 1U);
}

TEST_F(PlayTimer, ATimerStoppedBeforeTheSoundBeganPlaysItLater)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(800), 8000);
    Control::Play(&sound, &timer, KvoTime(0, 0, 2, 0));
    Start(timer);
    RunFor(1);
    timer.stop();
    RunFor(5);
    EXPECT_TRUE(device.opens.empty());

    timer.start();
    RunFor(2);

    EXPECT_EQ(device.played, Ramp(800));
}

TEST_F(PlayTimer, ReArmedTriggersLeaveASoundThatPlaysAlone)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(16000), 8000);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    RunFor(1);

    timer.reset_callbacks();
    RunFor(2);

    EXPECT_EQ(device.played, Ramp(16000));
    EXPECT_EQ(device.opens.size(), 1U);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(PlayTimer, ReArmedTriggersPlayADrainedSoundOnceMore)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(800), 8000);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    RunFor(1);

    timer.reset_callbacks();
    RunFor(1);

    EXPECT_EQ(device.played.size(), 1600U);
    EXPECT_EQ(Posted(timer), 3); // start, feeding and end, once each
}

TEST_F(PlayTimer, DestroyingTheTimerLetsGoOfTheSoundAtTheNextCall)
{
    KvoSound sound = MonoSound(Ramp(80000), 8000);
    {
        ZtTimer timer(KvoTime(), ten_seconds);
        Control::Play(&sound, &timer, KvoTime());
        Start(timer);
        RunFor(1);
        EXPECT_EQ(device.open_ports, 1);
    }

    Control::OutputRate();

    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(PlayTimer, ATimerThatWaitsForItsFirstBeatKeepsItsSound)
{
    KvoSound sound = MonoSound(Ramp(800), 8000);
    ZtTimer timer(KvoTime(), ten_seconds);
    Control::Play(&sound, &timer, KvoTime());

    Control::OutputRate();
    EXPECT_EQ(device.ready_ports, 1);
    Start(timer);
    RunFor(1);

    EXPECT_EQ(device.played, Ramp(800));
}

TEST_F(PlayTimer, ANewTimerInThePlaceOfADestroyedOneIsAnother)
{
    KvoSound sound = MonoSound(Ramp(80000), 8000);
    alignas(ZtTimer) unsigned char place[sizeof(ZtTimer)];
    auto* timer = new (place) ZtTimer(KvoTime(), ten_seconds);
    Control::Play(&sound, timer, KvoTime());
    Start(*timer);
    timer->~ZtTimer();
    timer = new (place) ZtTimer(KvoTime(), ten_seconds);
    Beats(1);

    Control::OutputRate();

    EXPECT_EQ(device.ready_ports, 0);
    timer->~ZtTimer();
}

TEST_F(PlayTimer, WithoutADeviceTheBeatReportsAndTimersGoOn)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(800), 8000);
    device.refuses_ports = true;

    Control::Play(&sound, &timer, one_second);
    Start(timer);
    RunFor(0.9);
    EXPECT_EQ(reports.Text(), "");
    RunFor(0.2);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for writing.\n");
    EXPECT_EQ(Posted(timer), 0);
    const int before = timer.current.Ticks();
    RunFor(1);
    EXPECT_EQ(timer.current.Ticks() - before, 6000);
}

TEST_F(PlayTimer, APortThatDoesNotOpenIsReportedAndGivenBack)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(800), 8000);
    Control::Play(&sound, &timer, KvoTime());
    device.refuses_opens = true;
    Start(timer);
    RunFor(1);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for writing.\n");
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(PlayTimer, ADeviceThatVanishesEndsTheSoundAndTimersGoOn)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(800000), 8000);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    RunFor(1);

    device.gone = true;
    RunFor(8);

    EXPECT_EQ(device.open_ports, 0);
    EXPECT_EQ(reports.Text(), "");
    EXPECT_EQ(timer.state, ZtTimer::Running);
}

TEST_F(PlayTimer, AnUnderrunIsSilenceAndTheSoundGoesOn)
{
    ZtTimer timer(KvoTime(), KvoTime(0, 1, 0, 0));
    KvoSound sound = MonoSound(Ramp(300000), 44100);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    Beats(1);

    clock.AdvanceMicroseconds(10000000); // no beat comes for ten seconds
    RunFor(10);

    EXPECT_EQ(device.played, Ramp(300000));
}

TEST_F(PlayTimer, ManySoundsPlayOnOneTimer)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    std::vector<KvoSound> sounds(20, MonoSound(Ramp(400), 8000));
    for (std::size_t number = 0; number < sounds.size(); ++number)
        Control::Play(&sounds[number], &timer,
                      KvoTime::FromTicks(static_cast<int>(600 * number)));
    Start(timer);

    RunFor(3);

    EXPECT_EQ(device.played.size(), 20U * 400U);
    timer.stop();
    Beats(1);
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(PlayTimer, BeyondTheMostSoundsEachIsReported)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(4), 8000);
    for (int number = 0; number < 70; ++number)
        Control::Play(&sound, &timer, one_second);

    // 64 records; of those, 40 have a port.
    EXPECT_EQ(reports.count, 6);
    Beats(1);
    Start(timer);
    RunFor(1.1);

    EXPECT_EQ(reports.count, 30);
    EXPECT_EQ(device.opens.size(), 40U);
}

TEST_F(PlayTimer, ASoundBeyondTheMostGivesItsPortBack)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound = MonoSound(Ramp(4), 8000);
    device.refuses_ports = true;
    for (int number = 0; number < 64; ++number)
        Control::Play(&sound, &timer, one_second);
    device.refuses_ports = false;

    Control::Play(&sound, &timer, one_second);

    EXPECT_EQ(reports.count, 1);
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(PlayTimer, ACallbackWithAnUnknownTokenDoesNothing)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    int other = 0;

    for (void* token : {static_cast<void*>(nullptr), static_cast<void*>(&other),
                        reinterpret_cast<void*>(~std::uintptr_t{0})}) {
        Control::PlayStartCB(&timer, token);
        Control::PlayContinueCB(&timer, token);
        Control::PlayEndCB(&timer, token);
    }
    Beats(2);

    EXPECT_TRUE(device.opens.empty());
    EXPECT_EQ(Posted(timer), 0);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(PlayTimer, NullsAndEmptySoundsPlayNothing)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    KvoSound sound(8000, 1, 1000, nullptr);

    Control::Play(nullptr, &timer, KvoTime());
    Control::Play(&sound, nullptr, KvoTime());
    EXPECT_EQ(device.ready_ports, 0);
    Control::Play(&sound, &timer, KvoTime());
    Start(timer);
    RunFor(1);

    EXPECT_EQ(device.opens.size(), 1U);
    EXPECT_EQ(device.open_ports, 0);
    EXPECT_TRUE(device.blocks.empty());
}

TEST_F(PlayTimer, TellsHowLongASoundIsPlayedAndUsed)
{
    KvoSound sound = MonoSound(Ramp(8000), 8000);
    KvoSound other = MonoSound(Ramp(10));
    EXPECT_FALSE(Control::Playing(&sound));
    EXPECT_FALSE(Control::Uses(&sound));
    {
        ZtTimer timer(KvoTime(), ten_seconds);
        Control::Play(&sound, &timer, one_second);
        EXPECT_TRUE(Control::Playing(&sound)); // it waits for its time
        Start(timer);
        RunFor(1.5);
        EXPECT_TRUE(Control::Playing(&sound));
        EXPECT_FALSE(Control::Playing(&other));
        RunFor(1);
        EXPECT_FALSE(Control::Playing(&sound));
        EXPECT_TRUE(Control::Uses(&sound)); // it can be played once more
        EXPECT_FALSE(Control::Uses(&other));
    }

    EXPECT_FALSE(Control::Uses(&sound));
}
