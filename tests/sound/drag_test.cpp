#include <cmath>
#include <limits>

#include "sound/SoundTest.h"

namespace {
using Control = ZtSoundControl;

class DragTest : public SoundTest
{
protected:
    DragTest() : sound(MonoSound(Ramp(32000), 32000)) {}

    KvoSound sound;
    float position = 0.0F;
};

const std::string mono_only =
    "Error: Audio data for ZtSoundControl::PlayDrag() must be MONO.";
} // namespace

// First of all, while the factor is what it is at the start of the process.
TEST_F(DragTest, TheFactorBeginsAtOneAndAdaptsToTheQueue)
{
    ZtTimer timer;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);

    device.blocks.clear();
    Control::OutputRate(31320); // which holds from the next look on
    RunFor(0.1);                // the queue is empty: a hundredth more
    EXPECT_EQ(device.blocks, std::vector<long>{3232});
    Control::OutputRate(32310);
    RunFor(0.1); // 100 wait, which is neither too few nor too many
    EXPECT_EQ(device.blocks, std::vector<long>(2, 3232));
    RunFor(0.1); // 101 wait: a hundredth less

    EXPECT_EQ(device.blocks, (std::vector<long>{3232, 3232, 3199}));
}

TEST_F(DragTest, AStereoSoundIsReportedAndOpensNothing)
{
    ZtTimer timer;
    KvoSound stereo = StereoSound({{1, 2}});

    Control::PlayDrag(&stereo, &timer, 100, &position);
    Start(timer);
    RunFor(0.5);

    EXPECT_EQ(reports.Text(), mono_only);
    EXPECT_TRUE(device.opens.empty());
    EXPECT_EQ(timer.callbacks, nullptr);
    EXPECT_EQ(timer.stop_callbacks, nullptr);
}

TEST_F(DragTest, OpensAPortAtOnceAndPostsItsCallbacks)
{
    ZtTimer timer;

    Control::PlayDrag(&sound, &timer, 40, &position);
    Beats(1);
    EXPECT_TRUE(Control::Uses(&sound));
    EXPECT_FALSE(Control::Playing(&sound));

    ASSERT_EQ(device.opens.size(), 1U);
    EXPECT_EQ(device.opens[0].channels, 1);
    EXPECT_EQ(device.opens[0].queue_size, 100000);
    EXPECT_EQ(Control::OutputRate(), 32000);
    ASSERT_NE(timer.callbacks, nullptr);
    EXPECT_EQ(timer.callbacks->kind, ZtTimerCallbackInfo::Repeat);
    EXPECT_EQ(timer.callbacks->callback, Control::PlayDragCB);
    EXPECT_EQ(timer.callbacks->interval, 40);
    ASSERT_NE(timer.stop_callbacks, nullptr);
    EXPECT_EQ(timer.stop_callbacks->callback, Control::PlayDragEndCB);
}

TEST_F(DragTest, APositionThatStandsStillIsSilence)
{
    ZtTimer timer;
    position = 0.5F;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);

    RunFor(1);

    ASSERT_GT(device.written.size(), 20000U);
    EXPECT_EQ(device.written, Samples(device.written.size()));
}

TEST_F(DragTest, WhatThePositionPassesOverIsPlayed)
{
    ZtTimer timer;
    position = 0.25F;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);

    position = 0.5F;
    device.blocks.clear();
    RunFor(0.1);

    ASSERT_EQ(device.blocks.size(), 1U);
    const auto out = static_cast<std::size_t>(device.blocks[0]);
    ASSERT_EQ(device.written.size(), out);
    for (std::size_t k = 0; k < out; ++k)
        ASSERT_EQ(device.written[k], static_cast<short>(8000 + k * 8000 / out));
}

TEST_F(DragTest, ThePositionAtTheCallIsWhereTheDragBegins)
{
    ZtTimer timer;
    position = 0.75F;
    Control::PlayDrag(&sound, &timer, 100, &position);
    position = 1.0F;
    Start(timer);

    RunFor(0.1);

    EXPECT_EQ(device.written.front(), 24000);
    EXPECT_GT(device.written.back(), 31900);
}

TEST_F(DragTest, APositionThatGoesBackIsPlayedBackward)
{
    ZtTimer timer;
    position = 0.5F;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);

    position = 0.25F;
    device.blocks.clear();
    RunFor(0.1);

    const auto out = static_cast<std::size_t>(device.blocks.at(0));
    ASSERT_EQ(device.written.size(), out);
    for (std::size_t k = 0; k < out; ++k)
        ASSERT_EQ(device.written[k],
                  static_cast<short>(16000 - k * 8000 / out));
}

TEST_F(DragTest, EachIntervalGoesOnWhereTheOneBeforeEnded)
{
    ZtTimer timer;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);

    for (const float next : {0.25F, 0.75F, 0.5F}) {
        position = next;
        device.written.clear();
        RunFor(0.1);
        const auto frame = static_cast<double>(next) * 32000;
        EXPECT_NEAR(device.written.back(), frame, 16) << next;
    }
}

TEST_F(DragTest, PositionsStayOnTheSoundAndNotANumberIsItsStart)
{
    ZtTimer timer;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);
    constexpr float infinity = std::numeric_limits<float>::infinity();

    for (const float next : {5.0F, -3.0F, infinity, -infinity, 1e30F}) {
        position = next;
        device.written.clear();
        RunFor(0.1);
        EXPECT_NEAR(device.written.back(), next > 0 ? 31990 : 0, 12) << next;
    }
    position = std::nanf("");
    RunFor(0.1);

    EXPECT_NEAR(device.written.back(), 0, 12);
}

TEST_F(DragTest, AtMost15000SamplesArePlayedAtOnce)
{
    ZtTimer timer;
    KvoSound fast = MonoSound(Ramp(32000), 2000000000);

    Control::PlayDrag(&fast, &timer, 1000, &position);
    position = 1.0F;
    Start(timer);
    RunFor(3.1);

    EXPECT_EQ(device.blocks, (std::vector<long>{15000, 15000, 15000}));
}

TEST_F(DragTest, AnIntervalBelowZeroPlaysNothing)
{
    ZtTimer timer;
    Control::PlayDrag(&sound, &timer, -100, &position);
    Start(timer);
    position = 0.5F;

    RunFor(0.1);

    EXPECT_TRUE(device.written.empty());
}

TEST_F(DragTest, ASoundWithoutABufferIsSilence)
{
    ZtTimer timer;
    KvoSound empty(8000, 1, 1000, nullptr);
    Control::PlayDrag(&empty, &timer, 100, &position);
    Start(timer);
    position = 0.5F;

    RunFor(0.3);

    EXPECT_FALSE(device.written.empty());
    EXPECT_EQ(device.written, Samples(device.written.size()));
}

TEST_F(DragTest, StoppingTheTimerEndsTheDragForGood)
{
    ZtTimer timer;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);
    RunFor(0.5);

    timer.stop();
    Beats(2);
    EXPECT_EQ(device.ready_ports, 0);
    EXPECT_EQ(timer.callbacks, nullptr);
    const std::size_t written = device.written.size();
    Start(timer);
    RunFor(0.5);

    EXPECT_EQ(device.written.size(), written);
    timer.stop();
    Beats(1);
}

TEST_F(DragTest, AStopRecordOfAnEarlierDragDoesNotEndALaterOne)
{
    ZtTimer first;
    ZtTimer second;
    Control::PlayDrag(&sound, &first, 100, &position);
    Start(first);
    first.stop();
    Beats(2);
    Control::PlayDrag(&sound, &second, 100, &position);
    Start(second);
    Start(first);

    first.stop();
    Beats(2);

    EXPECT_EQ(device.open_ports, 1);
}

TEST_F(DragTest, TheEndOfTheSoundIsItsLastSample)
{
    ZtTimer timer;
    position = 1.0F;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);

    position = 0.75F;
    RunFor(0.1);

    ASSERT_GT(device.written.size(), 3000U);
    EXPECT_EQ(device.written[0], 31999);
    EXPECT_LT(device.written.back(), 24100);
}

TEST_F(DragTest, ANaturalEndOnlyInterruptsTheDrag)
{
    ZtTimer timer(KvoTime(), KvoTime(0, 0, 1, 0));
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);
    RunFor(1.5);
    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(device.open_ports, 1);
    const std::size_t written = device.written.size();

    Start(timer);
    RunFor(0.5);

    EXPECT_GT(device.written.size(), written);
}

TEST_F(DragTest, DestroyingTheTimerLetsGoOfTheDragAtTheNextCall)
{
    {
        ZtTimer timer;
        Control::PlayDrag(&sound, &timer, 100, &position);
        Start(timer);
    }
    EXPECT_EQ(device.open_ports, 1);

    EXPECT_FALSE(Control::Uses(&sound));

    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(DragTest, APortThatCannotBeOpenedIsReportedAndNothingPosted)
{
    ZtTimer timer;

    device.refuses_ports = true;
    Control::PlayDrag(&sound, &timer, 100, &position);
    device.refuses_ports = false;
    device.refuses_opens = true;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Beats(2);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for writing.\n"
              "Error: Failed to open an audio port for writing.\n");
    EXPECT_EQ(timer.callbacks, nullptr);
    EXPECT_EQ(timer.stop_callbacks, nullptr);
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(DragTest, TheFactorComesBackFromADeviceThatIsGoneForLong)
{
    ZtTimer timer;
    Control::PlayDrag(&sound, &timer, 100, &position);
    Start(timer);
    device.gone = true;
    RunFor(1000);
    device.gone = false;
    Control::OutputRate(1); // nothing leaves the queue
    RunFor(200);
    timer.stop();
    Beats(1);
    device.blocks.clear();
    ZtTimer again;
    Control::PlayDrag(&sound, &again, 100, &position);
    Start(again);

    RunFor(0.1);
    ASSERT_FALSE(device.blocks.empty());
    EXPECT_LT(device.blocks.back(), 10);
    RunFor(150);

    EXPECT_NEAR(static_cast<double>(device.blocks.back()), 3200, 100);
}

TEST_F(DragTest, BeyondTheMostDragsEachIsReported)
{
    ZtTimer timer;

    for (int number = 0; number < 18; ++number)
        Control::PlayDrag(&sound, &timer, 100, &position);

    EXPECT_EQ(reports.count, 2);
    EXPECT_EQ(device.open_ports, 16);
}

TEST_F(DragTest, NullsAndUnknownTokensDoNothing)
{
    ZtTimer timer;

    Control::PlayDrag(nullptr, &timer, 100, &position);
    Control::PlayDrag(&sound, nullptr, 100, &position);
    Control::PlayDrag(&sound, &timer, 100, nullptr);
    Control::PlayDragCB(&timer, &position);
    Control::PlayDragEndCB(&timer, nullptr);
    Beats(1);

    EXPECT_TRUE(device.opens.empty());
    EXPECT_EQ(reports.Text(), "");
}
