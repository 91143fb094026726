#include <cstddef>
#include <iterator>
#include <memory>

#include "sound/SoundTest.h"

namespace {
using Control = ZtSoundControl;

const KvoTime ten_seconds(0, 0, 10, 0);

class RecordTest : public SoundTest
{
protected:
    RecordTest() { device.input = Ramp(3000000); }

    static std::unique_ptr<KvoSound> Result()
    {
        return std::unique_ptr<KvoSound>(Control::RecordResult());
    }

    /// Records from the start of a timer for a number of samples at a rate.
    void RecordSamples(long samples, long rate)
    {
        Control::RecordSetFrequency(static_cast<int>(rate));
        ZtTimer timer;
        Control::Record(&timer, KvoTime());
        Start(timer);
        Beats(1);
        ASSERT_TRUE(Control::sound_record.recording);
        const double exactly =
            static_cast<double>(samples) / static_cast<double>(rate);
        RunFor(exactly - 0.004);
        timer.stop();
        Beats(1);
        ASSERT_FALSE(Control::sound_record.recording);
    }
};
} // namespace

// First of all, before anything was recorded in this process.
TEST_F(RecordTest, BeforeTheFirstRecordingThereIsNoResult)
{
    EXPECT_EQ(Control::RecordResult(), nullptr);
    EXPECT_EQ(Control::sound_record.has_data, 0);
    EXPECT_EQ(Control::sound_record.rate, 8000);
    EXPECT_EQ(Control::sound_record.channels, 1);
}

TEST_F(RecordTest, FieldsStandInTheirOrder)
{
    using Fields = ZtSoundControl::SoundRecord;

    EXPECT_EQ(offsetof(Fields, recording), 0U);
    EXPECT_EQ(offsetof(Fields, has_data), 4U);
    EXPECT_EQ(offsetof(Fields, rate), 8U);
    EXPECT_EQ(offsetof(Fields, channels), 12U);
    EXPECT_EQ(offsetof(Fields, chunk_size), 16U);
    EXPECT_EQ(offsetof(Fields, last_count), 20U);
    EXPECT_EQ(offsetof(Fields, chunk_count), 24U);
    EXPECT_LT(offsetof(Fields, chunk_count), offsetof(Fields, current_chunk));
    EXPECT_LT(offsetof(Fields, current_chunk), offsetof(Fields, chunks));
    EXPECT_LT(offsetof(Fields, chunks), offsetof(Fields, port));
    EXPECT_EQ(std::size(Control::sound_record.chunks), 100U);
}

TEST_F(RecordTest, SixtyThousandSamplesAreTwoChunksAndTenThousand)
{
    RecordSamples(60000, 10000);

    const ZtSoundControl::SoundRecord& record = Control::sound_record;
    EXPECT_EQ(record.chunk_size, 25000);
    EXPECT_EQ(record.chunk_count, 2);
    EXPECT_EQ(record.last_count, 10000);
    const std::unique_ptr<KvoSound> sound = Result();
    ASSERT_NE(sound, nullptr);
    EXPECT_EQ(sound->rate, 10000);
    EXPECT_EQ(sound->channels, 1);
    EXPECT_EQ(sound->frames, 60000);
    EXPECT_EQ(SamplesOf(*sound), Ramp(60000));
}

TEST_F(RecordTest, TheResultCanBeHadAgain)
{
    RecordSamples(4000, 1000);

    const std::unique_ptr<KvoSound> first = Result();
    const std::unique_ptr<KvoSound> second = Result();

    EXPECT_NE(first->samples, second->samples);
    EXPECT_EQ(SamplesOf(*first), SamplesOf(*second));
}

TEST_F(RecordTest, ThereIsNoResultWhileARecordingRuns)
{
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    Start(timer);
    RunFor(1);

    EXPECT_EQ(Control::RecordResult(), nullptr);
    timer.stop();
    Beats(1);

    EXPECT_NE(Result(), nullptr);
}

TEST_F(RecordTest, RecordingBeginsWhenTheTimerReachesItsTime)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    Control::Record(&timer, KvoTime(0, 0, 2, 0));
    EXPECT_EQ(device.ready_ports, 1);
    Beats(1);
    ASSERT_NE(timer.callbacks, nullptr);
    EXPECT_EQ(timer.callbacks->callback, Control::RecordStartCB);
    EXPECT_EQ(timer.callbacks->time, KvoTime(0, 0, 2, 0));
    EXPECT_EQ(timer.callbacks->data, nullptr);

    Start(timer);
    RunFor(1.98);
    EXPECT_EQ(device.open_ports, 0);
    RunFor(0.03);

    EXPECT_EQ(device.open_ports, 1);
    EXPECT_EQ(Control::sound_record.recording, 1);
    EXPECT_EQ(Control::sound_record.has_data, 1);
}

TEST_F(RecordTest, ThePortIsOpenedWithTheChannelsAndTheDeviceSetToTheRate)
{
    ZtTimer timer;
    Control::RecordSetFrequency(22050);
    Control::Record(&timer, KvoTime());
    Control::RecordSetStereo(5); // counts when it begins
    Start(timer);
    Beats(1);

    ASSERT_EQ(device.opens.size(), 1U);
    const zt_platform::AudioPortConfig& config = device.opens[0];
    EXPECT_EQ(config.direction, zt_platform::AudioDirection::Record);
    EXPECT_EQ(config.format, 1);
    EXPECT_EQ(config.width, 2);
    EXPECT_EQ(config.channels, 2);
    EXPECT_EQ(Control::InputRate(), 22050);
}

TEST_F(RecordTest, GoesOnEveryHundredMillisecondsAndEndsWithTheTimer)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    Control::Record(&timer, KvoTime());
    Start(timer);
    Beats(2);

    const ZtTimerCallbackInfo* const repeat = timer.callbacks->next;
    ASSERT_NE(repeat, nullptr);
    EXPECT_EQ(repeat->callback, Control::RecordContinueCB);
    EXPECT_EQ(repeat->interval, 100);
    ASSERT_NE(repeat->next, nullptr);
    EXPECT_EQ(repeat->next->callback, Control::RecordEndCB);
    EXPECT_EQ(repeat->next->time, ten_seconds);
    ASSERT_NE(timer.stop_callbacks, nullptr);
    EXPECT_EQ(timer.stop_callbacks->callback, Control::RecordEndCB);
}

TEST_F(RecordTest, OneChunkAtMostIsTakenAtATime)
{
    Control::RecordSetFrequency(44100);
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    Start(timer);
    RunFor(0.5);
    EXPECT_EQ(Control::sound_record.chunk_count, 0); // 22050 samples wait
    clock.AdvanceMicroseconds(1500000);              // no beat comes
    Beats(1);
    EXPECT_EQ(Control::sound_record.chunk_count, 1);
    RunFor(0.1);
    EXPECT_EQ(Control::sound_record.chunk_count, 2);

    timer.stop();
    Beats(1);
    EXPECT_EQ(SamplesOf(*Result()),
              Ramp(static_cast<std::size_t>(Result()->frames)));
}

TEST_F(RecordTest, AChunkIsTakenAsSoonAsItIsWhole)
{
    Control::RecordSetFrequency(25000);
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    StartInStep(timer);

    RunFor(0.9);
    EXPECT_EQ(Control::sound_record.chunk_count, 0);
    RunFor(0.1); // now exactly a chunk waits

    EXPECT_EQ(Control::sound_record.chunk_count, 1);
    timer.stop();
    Beats(1);
}

TEST_F(RecordTest, AWholeChunkThatWaitsAtTheEndIsTheLastOne)
{
    RecordSamples(25000, 312500); // before the first look at the queue

    EXPECT_EQ(Control::sound_record.chunk_count, 0);
    EXPECT_EQ(Control::sound_record.last_count, 25000);
    EXPECT_EQ(SamplesOf(*Result()), Ramp(25000));
}

TEST_F(RecordTest, TheNaturalEndOfTheTimerEndsTheRecording)
{
    ZtTimer timer(KvoTime(), KvoTime(0, 0, 2, 0));
    Control::RecordSetFrequency(1000);
    Control::Record(&timer, KvoTime());
    Start(timer);

    RunFor(3);

    EXPECT_EQ(Control::sound_record.recording, 0);
    EXPECT_EQ(device.ready_ports, 0);
    const std::unique_ptr<KvoSound> sound = Result();
    EXPECT_NEAR(static_cast<double>(sound->frames), 2000, 8);
    EXPECT_EQ(SamplesOf(*sound), Ramp(static_cast<std::size_t>(sound->frames)));
}

TEST_F(RecordTest, MoreThanAHundredChunksAreDropped)
{
    RecordSamples(2700000, 100000);

    EXPECT_EQ(Control::sound_record.chunk_count, 100);
    EXPECT_EQ(Control::sound_record.last_count, 0);
    EXPECT_EQ(Control::sound_record.current_chunk, nullptr);
    const std::unique_ptr<KvoSound> sound = Result();
    EXPECT_EQ(sound->frames, 2500000);
    EXPECT_EQ(SamplesOf(*sound), Ramp(2500000));
}

TEST_F(RecordTest, AFullInputQueueLosesSamplesAndTheRecordingGoesOn)
{
    ZtTimer timer;
    Control::RecordSetFrequency(44100);
    Control::Record(&timer, KvoTime());
    Start(timer);
    Beats(1);

    clock.AdvanceMicroseconds(10000000); // ten seconds without a beat
    RunFor(1);
    timer.stop();
    Beats(1);

    const std::unique_ptr<KvoSound> sound = Result();
    ASSERT_GT(sound->frames, 100000);
    EXPECT_EQ(Part(SamplesOf(*sound), 0, 100000), Ramp(100000));
    EXPECT_NE(SamplesOf(*sound)[100000], 100000 % 32000);
}

TEST_F(RecordTest, WhatWaitsAtTheEndIsStoredInFurtherChunks)
{
    ZtTimer timer;
    Control::RecordSetFrequency(44100);
    Control::Record(&timer, KvoTime());
    Start(timer);
    Beats(1);
    timer.stop(); // carried out after the next beat's callbacks
    clock.AdvanceMicroseconds(2000000);
    Beats(1);

    const std::unique_ptr<KvoSound> sound = Result();
    EXPECT_GT(Control::sound_record.chunk_count, 2);
    EXPECT_EQ(sound->frames, 88200);
    EXPECT_EQ(SamplesOf(*sound), Ramp(static_cast<std::size_t>(sound->frames)));
}

TEST_F(RecordTest, AStereoResultCountsSamplesAsFrames)
{
    Control::RecordSetStereo(1);
    RecordSamples(3000, 1000);

    const std::unique_ptr<KvoSound> sound = Result();

    EXPECT_EQ(sound->channels, 2);
    EXPECT_EQ(sound->frames, 6000);
    Samples expected = Ramp(6000);
    expected.resize(12000);
    EXPECT_EQ(SamplesOf(*sound), expected);
}

TEST_F(RecordTest, AFrequencySetDuringARecordWarnsAndIsKept)
{
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    Start(timer);
    RunFor(1);

    Control::RecordSetFrequency(11025);
    EXPECT_EQ(reports.Text(),
              "Warning: Cannot change audio frequency during a record.\n");
    EXPECT_EQ(reports.errors[0]->level, 3);
    EXPECT_EQ(Control::InputRate(), 8000);
    timer.stop();
    Beats(1);

    EXPECT_EQ(Result()->rate, 11025);
    EXPECT_NEAR(static_cast<double>(Result()->frames), 8000, 100);
    RecordSamples(1000, 11025);
    EXPECT_EQ(Control::InputRate(), 11025);
}

TEST_F(RecordTest, AChannelCountSetDuringARecordWarnsAndIsKept)
{
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    Start(timer);
    RunFor(1);

    Control::RecordSetStereo(1);
    EXPECT_EQ(reports.Text(),
              "Warning: Cannot change audio channel count during a record.\n");
    timer.stop();
    Beats(1);

    const std::unique_ptr<KvoSound> sound = Result();
    EXPECT_EQ(sound->channels, 2);
    EXPECT_EQ(SamplesOf(*sound).size(),
              static_cast<std::size_t>(2 * sound->frames));
}

TEST_F(RecordTest, ChangesBetweenRecordingsSayNothing)
{
    Control::RecordSetFrequency(44100);
    Control::RecordSetStereo(-1);
    EXPECT_EQ(Control::sound_record.channels, 2);
    Control::RecordSetStereo(0);

    EXPECT_EQ(Control::sound_record.channels, 1);
    EXPECT_EQ(Control::sound_record.rate, 44100);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(RecordTest, RecordingOnTopOfARecordingWarns)
{
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    Start(timer);
    RunFor(0.5);

    Control::Record(&timer, KvoTime());

    EXPECT_EQ(reports.Text(),
              "Warning: Oops, audio recording on top of recording.\n");
    EXPECT_EQ(device.ready_ports, 1);
    timer.stop();
    Beats(1);
}

TEST_F(RecordTest, ABackwardTimerIsRefusedWithAWarning)
{
    ZtTimer timer(ten_seconds, KvoTime());

    Control::Record(&timer, KvoTime(0, 0, 5, 0));
    Beats(2);

    EXPECT_EQ(reports.Text(),
              "Warning: Cannot record audio on reverse running timer.\n");
    EXPECT_EQ(timer.callbacks, nullptr);
}

TEST_F(RecordTest, ATimeBeforeTheTimerIsRefusedWithAWarning)
{
    ZtTimer timer(KvoTime(0, 0, 5, 0), ten_seconds);

    Control::Record(&timer, KvoTime(0, 0, 4, 29));
    Beats(2);

    EXPECT_EQ(reports.Text(),
              "Warning: Audio recording should not start before timer.\n");
    EXPECT_EQ(timer.callbacks, nullptr);
}

TEST_F(RecordTest, ATimeAtOrBehindTheEndDoesNothing)
{
    ZtTimer timer(KvoTime(), ten_seconds);

    Control::Record(&timer, ten_seconds);
    Control::Record(&timer, KvoTime(0, 1, 0, 0));
    Beats(2);

    EXPECT_EQ(reports.Text(), "");
    EXPECT_EQ(timer.callbacks, nullptr);
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(RecordTest, AnEndlessTimerRecordsAtAnyTime)
{
    ZtTimer timer;

    Control::Record(&timer, KvoTime(0, 0, 1, 0)); // behind its 3 ticks
    Start(timer);
    RunFor(2);

    EXPECT_EQ(Control::sound_record.recording, 1);
    timer.stop();
    Beats(1);
    EXPECT_NEAR(static_cast<double>(Result()->frames), 8000, 100);
}

TEST_F(RecordTest, ARestartedTimerDoesNotRecordAgain)
{
    ZtTimer timer(KvoTime(), KvoTime(0, 0, 1, 0));
    Control::Record(&timer, KvoTime());
    Start(timer);
    RunFor(1.5);
    EXPECT_EQ(timer.callbacks, nullptr);
    const long frames = Result()->frames;

    Start(timer);
    RunFor(0.5);
    timer.stop(); // its stop record finds an unknown token
    Beats(1);

    EXPECT_EQ(Control::sound_record.recording, 0);
    EXPECT_EQ(Result()->frames, frames);
    EXPECT_EQ(device.opens.size(), 1U);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(RecordTest, AStopRecordOfAnEarlierRecordingDoesNotEndALaterOne)
{
    ZtTimer first;
    Control::Record(&first, KvoTime());
    Start(first);
    first.stop();
    Beats(1);
    ZtTimer second;
    Control::Record(&second, KvoTime());
    Start(second);
    first.start();
    Beats(2);

    first.stop();
    Beats(2);

    EXPECT_EQ(Control::sound_record.recording, 1);
    second.stop();
    Beats(1);
}

TEST_F(RecordTest, TwoThatWaitOnOneTimerAreOneRecording)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    Control::Record(&timer, KvoTime());
    Control::Record(&timer, KvoTime(0, 0, 1, 0));
    Start(timer);
    RunFor(2);
    EXPECT_EQ(device.ready_ports, 1);

    timer.stop();
    Beats(2);

    EXPECT_EQ(timer.callbacks, nullptr);
    EXPECT_EQ(device.opens.size(), 1U);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(RecordTest, TwoTimersRecordOneAfterTheOther)
{
    ZtTimer first(KvoTime(), KvoTime(0, 0, 1, 0));
    ZtTimer second(KvoTime(), ten_seconds);
    Control::Record(&first, KvoTime());
    Control::Record(&second, KvoTime(0, 0, 2, 0));
    Start(first);
    Start(second);

    RunFor(3);

    EXPECT_EQ(device.opens.size(), 2U);
    EXPECT_EQ(Control::sound_record.recording, 1);
    EXPECT_EQ(reports.Text(), "");
    second.stop();
    Beats(1);
}

TEST_F(RecordTest, ANewRecordingReplacesTheOneBeforeWhenItBegins)
{
    RecordSamples(60000, 10000);
    ZtTimer timer;
    Control::Record(&timer, KvoTime(0, 0, 1, 0));
    Beats(1);
    EXPECT_EQ(Result()->frames, 60000);
    Start(timer);
    RunFor(1.5);
    timer.stop();
    Beats(1);

    EXPECT_NEAR(static_cast<double>(Result()->frames), 5000, 100);
    EXPECT_EQ(Result()->samples[0], 60000 % 32000);
}

TEST_F(RecordTest, WithoutADeviceTheBeatReportsAndTimersGoOn)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    device.refuses_ports = true;
    Control::Record(&timer, KvoTime(0, 0, 1, 0));
    EXPECT_EQ(reports.Text(), "");
    Start(timer);

    RunFor(2);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for reading.\n");
    EXPECT_EQ(reports.errors[0]->level, 4);
    EXPECT_EQ(Control::sound_record.recording, 0);
    EXPECT_EQ(timer.state, ZtTimer::Running);
    EXPECT_EQ(Result()->frames, 0); // begun, and nothing came
}

TEST_F(RecordTest, APortThatDoesNotOpenIsReportedAndGivenBack)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    Control::Record(&timer, KvoTime());
    device.refuses_opens = true;
    Start(timer);
    Beats(2);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for reading.\n");
    EXPECT_EQ(device.ready_ports, 0);
    EXPECT_EQ(timer.callbacks, nullptr); // it is not tried again
    EXPECT_EQ(timer.stop_callbacks, nullptr);
}

TEST_F(RecordTest, ADeviceThatVanishesLeavesWhatWasRecorded)
{
    ZtTimer timer;
    Control::RecordSetFrequency(50000);
    Control::Record(&timer, KvoTime());
    Start(timer);
    RunFor(1.2);

    device.gone = true;
    RunFor(2);
    timer.stop();
    Beats(1);

    EXPECT_EQ(SamplesOf(*Result()), Ramp(50000));
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(RecordTest, DestroyingTheTimerKeepsWhatWasRecorded)
{
    {
        ZtTimer timer;
        Control::Record(&timer, KvoTime());
        Start(timer);
        RunFor(1);
    }
    EXPECT_EQ(device.open_ports, 1);

    const std::unique_ptr<KvoSound> sound = Result();

    ASSERT_NE(sound, nullptr);
    EXPECT_NEAR(static_cast<double>(sound->frames), 8000, 100);
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(RecordTest, DestroyingATimerThatWaitsGivesThePortBack)
{
    {
        ZtTimer timer;
        Control::Record(&timer, KvoTime());
        Beats(1);
    }

    Control::RecordSetStereo(0);

    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(RecordTest, ARecordRequestedInsideTheBeatIsReportedWhenItBegins)
{
    ZtTimer timer(KvoTime(), ten_seconds);
    timer.post_trigger([](ZtTimer* its_timer,
                          void*) { Control::Record(its_timer, KvoTime()); },
                       nullptr, KvoTime());
    Start(timer);
    RunFor(0.1);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for reading.\n");
}

TEST_F(RecordTest, WarningsComeInsideTheBeatToo)
{
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    Start(timer);
    RunFor(0.1);

    timer.post_trigger(
        [](ZtTimer* its_timer, void*) {
            Control::RecordSetFrequency(4000);
            Control::RecordSetStereo(1);
            Control::Record(its_timer, KvoTime());
        },
        nullptr, KvoTime());
    Beats(2);

    EXPECT_EQ(reports.Text(),
              "Warning: Cannot change audio frequency during a record.\n"
              "Warning: Cannot change audio channel count during a record.\n"
              "Warning: Oops, audio recording on top of recording.\n");
    EXPECT_EQ(Control::sound_record.rate, 4000);
    timer.stop();
    Beats(1);
}

TEST_F(RecordTest, ANegativeRateRecordsNothing)
{
    ZtTimer timer;
    Control::RecordSetFrequency(-8000);
    Control::Record(&timer, KvoTime());
    Start(timer);
    RunFor(1);
    timer.stop();
    Beats(1);

    EXPECT_EQ(Result()->frames, 0);
}

TEST_F(RecordTest, UnknownTokensAndNullsDoNothing)
{
    ZtTimer timer;

    Control::Record(nullptr, KvoTime());
    Control::RecordContinueCB(&timer, nullptr);
    Control::RecordEndCB(&timer, &timer);
    Beats(1);

    EXPECT_EQ(timer.callbacks, nullptr);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(RecordTest, RecordsWhileASoundPlaysOnTheSameTimer)
{
    ZtTimer timer(KvoTime(), KvoTime(0, 0, 2, 0));
    KvoSound sound = MonoSound(Ramp(8000), 8000);
    Control::Play(&sound, &timer, KvoTime());
    Control::Record(&timer, KvoTime());
    Start(timer);

    RunFor(3);

    EXPECT_EQ(device.played, Ramp(8000));
    EXPECT_NEAR(static_cast<double>(Result()->frames), 16000, 100);
}
