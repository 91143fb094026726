#include <cmath>
#include <limits>

#include "sound/SoundTest.h"

namespace {
using Control = ZtSoundControl;
using zt_platform::AudioPortConfig;

class SoundControl : public SoundTest
{};

constexpr float infinity = std::numeric_limits<float>::infinity();
const float not_a_number = std::nanf("");

/// What blocking playback makes of some samples, written down step by step.
Samples LiteralPlay(const Samples& source, float speed)
{
    Samples out;
    std::size_t at = 0;
    while (at < source.size()) {
        const auto remaining = static_cast<float>(source.size() - at);
        const auto out_count = static_cast<std::size_t>(
            std::min(double{remaining * speed}, 10000.0));
        const auto in_count = std::min(
            static_cast<std::size_t>(static_cast<float>(out_count) / speed),
            source.size() - at);
        for (std::size_t i = 0; i < out_count; ++i)
            out.push_back(in_count == 0
                              ? short{0}
                              : source[at + i * in_count / out_count]);
        if (in_count == 0)
            break;
        at += in_count;
    }
    return out;
}
} // namespace

TEST_F(SoundControl, BeginsAtFullVolumeWithMonitoringOff)
{
    EXPECT_EQ(Control::MonitorVolume(), 1.0F);
    EXPECT_EQ(Control::JackVolume(), 1.0F);
    EXPECT_FALSE(Control::Monitor());
    EXPECT_EQ(Control::play_speed, 1.0F);
}

TEST_F(SoundControl, RatesAreParametersThreeAndFour)
{
    Control::OutputRate(22050);
    Control::InputRate(11025);

    EXPECT_EQ(device.parameters().get(4), 22050);
    EXPECT_EQ(device.parameters().get(3), 11025);
    EXPECT_EQ(Control::OutputRate(), 22050);
    EXPECT_EQ(Control::InputRate(), 11025);
    EXPECT_EQ(Control::output_rate, 22050);
    EXPECT_EQ(Control::input_rate, 11025);
}

TEST_F(SoundControl, ARateBeyondThirtyTwoBitsIsTheNearest)
{
    Control::OutputRate(std::numeric_limits<long>::max());
    EXPECT_EQ(Control::OutputRate(), 2147483647);

    Control::OutputRate(std::numeric_limits<long>::min());
    EXPECT_EQ(Control::OutputRate(), -2147483648L);
}

TEST_F(SoundControl, AParameterIsHandedOverAsAPairInTheBuffer)
{
    Control::OutputRate(32000);

    EXPECT_EQ(Control::pv_buf[0], 4);
    EXPECT_EQ(Control::pv_buf[1], 32000);
    EXPECT_EQ(device.changes, 1);
}

TEST_F(SoundControl, MonitorVolumeSetsBothLevelsAndReadsTheLeft)
{
    Control::MonitorVolume(0.5F);

    EXPECT_EQ(Control::pv_buf[0], 13);
    EXPECT_EQ(Control::pv_buf[2], 14);
    EXPECT_EQ(device.parameters().get(13), 127);
    EXPECT_EQ(device.parameters().get(14), 127);
    EXPECT_EQ(device.changes, 1);
    device.parameters().set(13, 51);
    EXPECT_EQ(Control::MonitorVolume(), 0.2F);
}

TEST_F(SoundControl, JackVolumeSetsBothGainsAndReadsTheLeft)
{
    Control::JackVolume(0.999F);

    EXPECT_EQ(device.parameters().get(5), 254);
    EXPECT_EQ(device.parameters().get(6), 254);
    device.parameters().set(6, 3);
    EXPECT_EQ(Control::JackVolume(), static_cast<float>(254 / 255.0));
}

TEST_F(SoundControl, AVolumeBeyondItsRangeIsTheNearestEnd)
{
    for (const float much : {1.5F, 1e30F, infinity}) {
        Control::JackVolume(much);
        EXPECT_EQ(Control::JackVolume(), 1.0F) << much;
    }
    for (const float little : {-0.5F, -infinity, not_a_number}) {
        Control::MonitorVolume(little);
        EXPECT_EQ(Control::MonitorVolume(), 0.0F) << little;
    }
}

TEST_F(SoundControl, MonitorIsOneForAnythingButZero)
{
    Control::Monitor(-7);
    EXPECT_EQ(device.parameters().get(12), 1);
    EXPECT_TRUE(Control::Monitor());

    Control::Monitor(0);
    EXPECT_EQ(device.parameters().get(12), 0);
    EXPECT_FALSE(Control::Monitor());

    device.parameters().set(12, 2);
    EXPECT_FALSE(Control::Monitor());
}

TEST_F(SoundControl, PlaySpeedSetsTheFactor)
{
    Control::PlaySpeed(2.5F);

    EXPECT_EQ(Control::play_speed, 2.5F);
}

TEST_F(SoundControl, DisablingLibraryErrorsReachesTheDevice)
{
    Control::DisableAudioLibraryErrors();

    EXPECT_EQ(device.silenced, 1);
}

TEST_F(SoundControl, NamesTheDevicesAndTheSilentOnesThatAreAlwaysThere)
{
    EXPECT_STREQ(Control::DeviceName(0), "fake 0");
    EXPECT_STREQ(Control::DeviceName(1), "fake 1");
    EXPECT_STREQ(Control::DeviceName(2), "null");
    EXPECT_STREQ(Control::DeviceName(3), "file");
    EXPECT_EQ(Control::DeviceName(4), nullptr);
    EXPECT_EQ(Control::DeviceName(-1), nullptr);
    EXPECT_STREQ(Control::DeviceInUse(), "fake");
}

TEST_F(SoundControl, PlayOpensAPortLikeTheSoundAndSetsItsRate)
{
    KvoSound sound = StereoSound({{1, 2}, {3, 4}}, 22050);
    sound.width = 1;

    Control::Play(&sound);

    ASSERT_EQ(device.opens.size(), 1U);
    const AudioPortConfig& config = device.opens[0];
    EXPECT_EQ(config.direction, zt_platform::AudioDirection::Play);
    EXPECT_EQ(config.format, 1);
    EXPECT_EQ(config.width, 1);
    EXPECT_EQ(config.channels, 2);
    EXPECT_EQ(config.queue_size, 100000);
    EXPECT_EQ(config.rate, 22050);
    EXPECT_EQ(Control::OutputRate(), 22050);
    EXPECT_EQ(device.played, (Samples{1, 2, 3, 4}));
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(SoundControl, PlayReturnsWhenAllOfTheSoundWasPlayed)
{
    KvoSound sound = MonoSound(Ramp(250000), 44100);

    Control::Play(&sound);

    EXPECT_EQ(device.played, Ramp(250000));
    EXPECT_EQ(device.blocks, std::vector<long>(25, 10000));
    EXPECT_EQ(device.open_ports, 0);
    EXPECT_EQ(device.ready_ports, 0);
    EXPECT_GE(Milliseconds(), 250000 * 1000 / 44100);
    EXPECT_LE(Milliseconds(), 250000 * 1000 / 44100 + 101);
}

TEST_F(SoundControl, PlaySleepsTenClockTicksAtATime)
{
    KvoSound sound = MonoSound(Ramp(1), 8000);

    Control::Play(&sound);

    EXPECT_EQ(Milliseconds(), 100);
}

TEST_F(SoundControl, PlayWaitsUntilHalfOfTheQueueIsFree)
{
    struct CountingClock : FakeClock
    {
        explicit CountingClock(FakeAudioDevice& its_device) : audio(its_device)
        {}
        void sleep_nanoseconds(std::uint64_t nanoseconds) override
        {
            FakeClock::sleep_nanoseconds(nanoseconds);
            ++sleeps_after[audio.blocks.size()];
        }
        FakeAudioDevice& audio;
        int sleeps_after[8] = {};
    } counting(device);
    KvoSound sound = MonoSound(Ramp(70000), 1000);

    Control::Play(&sound);

    // Six blocks fit before the seventh has to wait for 10000 samples, which
    // take ten seconds.
    EXPECT_EQ(device.blocks, std::vector<long>(7, 10000));
    EXPECT_EQ(counting.sleeps_after[5], 0);
    EXPECT_EQ(counting.sleeps_after[6], 100);
    EXPECT_EQ(device.played, Ramp(70000));
}

TEST_F(SoundControl, AtDoubleSpeedBlocksOf10000AreMadeOf5000Samples)
{
    KvoSound sound = MonoSound(Ramp(20000), 44100);
    Control::PlaySpeed(2.0F);

    Control::Play(&sound);

    EXPECT_EQ(device.blocks, std::vector<long>(4, 10000));
    Samples doubled;
    for (const short sample : Ramp(20000)) {
        doubled.push_back(sample);
        doubled.push_back(sample);
    }
    EXPECT_EQ(device.played, doubled);
}

TEST_F(SoundControl, AtOtherSpeedsPlayPicksTheNearestSamples)
{
    const Samples source = Ramp(23457);
    for (const float speed : {0.1F, 0.5F, 0.75F, 1.1F, 3.0F, 7.3F}) {
        KvoSound sound = MonoSound(source, 44100);
        Control::PlaySpeed(speed);
        device.played.clear();

        Control::Play(&sound);

        EXPECT_EQ(device.played, LiteralPlay(source, speed)) << speed;
    }
}

TEST_F(SoundControl, ASpeedThatIsNotAboveZeroPlaysNothing)
{
    for (const float speed : {0.0F, -0.0F, -1.0F, -infinity, not_a_number}) {
        KvoSound sound = MonoSound(Ramp(1000));
        Control::PlaySpeed(speed);

        Control::Play(&sound);

        EXPECT_TRUE(device.blocks.empty()) << speed;
    }
    EXPECT_EQ(device.opens.size(), 5U);
    EXPECT_EQ(device.open_ports, 0);
}

TEST_F(SoundControl, PlayEndsWhenASpeedUsesNoSample)
{
    for (const float speed : {1e30F, infinity, 1e-30F}) {
        KvoSound sound = MonoSound(Ramp(1000));
        Control::PlaySpeed(speed);
        device.played.clear();

        Control::Play(&sound);

        EXPECT_EQ(device.played, Samples(speed > 1 ? 10000 : 0)) << speed;
    }
}

TEST_F(SoundControl, ASoundWithoutABufferIsPlayedAsNothing)
{
    KvoSound sound(8000, 2, 1000, nullptr);

    Control::Play(&sound);

    EXPECT_EQ(device.opens.size(), 1U);
    EXPECT_TRUE(device.blocks.empty());
    Control::Play(nullptr);
    EXPECT_EQ(device.opens.size(), 1U);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(SoundControl, ASoundOfNoRateIsNotWaitedFor)
{
    for (const long rate : {0L, -8000L, -9223372036854775807L - 1}) {
        KvoSound sound = MonoSound(Ramp(10), rate);

        Control::Play(&sound);

        EXPECT_TRUE(device.blocks.empty()) << rate;
        EXPECT_EQ(device.open_ports, 0);
    }
    EXPECT_EQ(device.opens.size(), 3U);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(SoundControl, PlaybackRequestedInsideTheBeatFindsNoPort)
{
    static KvoSound sound = MonoSound(Ramp(10));
    static float position = 0;
    ZtTimer timer;
    // Errors are made ready by a request from outside.
    ZtTimer later;
    for (int request = 0; request < 3; ++request)
        Control::Play(&sound, &later, KvoTime());

    timer.post_trigger(
        [](ZtTimer* its_timer, void*) {
            Control::Play(&sound);
            Control::Play(&sound, its_timer, KvoTime());
            Control::PlayDrag(&sound, its_timer, 100, &position);
        },
        nullptr, KvoTime());
    Start(timer);
    Beats(3);

    const std::string one =
        "Error: Failed to open an audio port for writing.\n";
    EXPECT_EQ(reports.Text(), one + one + one);
    EXPECT_TRUE(device.opens.empty());
    EXPECT_EQ(timer.stop_callbacks, nullptr);
}

TEST_F(SoundControl, WithoutADevicePlayReportsAndPlaysNothing)
{
    KvoSound sound = MonoSound(Ramp(10));
    device.refuses_ports = true;

    Control::Play(&sound);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for writing.\n");
    EXPECT_EQ(reports.errors[0]->level, 4);
    EXPECT_TRUE(device.played.empty());
}

TEST_F(SoundControl, APortThatDoesNotOpenIsReportedAndGivenBack)
{
    KvoSound sound = MonoSound(Ramp(10));
    device.refuses_opens = true;

    Control::Play(&sound);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for writing.\n");
    EXPECT_EQ(device.ready_ports, 0);
}

TEST_F(SoundControl, ChannelsThatNoPortHasAreReportedLikeAPortThatDoesNotOpen)
{
    KvoSound sound = ThreeChannels();

    Control::Play(&sound);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for writing.\n");
}

TEST_F(SoundControl, PlayDoesNotWaitForADeviceThatVanishes)
{
    KvoSound sound = MonoSound(Ramp(1000000), 8000);
    struct VanishLater : FakeClock
    {
        explicit VanishLater(FakeAudioDevice& its_device) : audio(its_device) {}
        void sleep_nanoseconds(std::uint64_t nanoseconds) override
        {
            FakeClock::sleep_nanoseconds(nanoseconds);
            audio.gone = ++sleeps > 20;
        }
        FakeAudioDevice& audio;
        int sleeps = 0;
    } vanish_later(device);
    Control::Play(&sound);

    EXPECT_LT(device.played.size(), 30000U);
    EXPECT_EQ(device.open_ports, 0);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(SoundControl, ResampleAtDoubleSpeedPicksEverySecondSample)
{
    Samples source = Ramp(200);
    Control::PlaySpeed(2.0F);

    Control::play_resample(source.data(), 100);

    for (int i = 0; i < 100; ++i)
        ASSERT_EQ(Control::play_buffer[i], 2 * i);
}

TEST_F(SoundControl, ResamplePicksAtEveryRatio)
{
    Samples source = Ramp(32000);
    for (const float speed : {0.3F, 0.5F, 1.0F, 1.7F, 2.9F})
        for (const long count : {1L, 2L, 3L, 10L, 999L, 10000L}) {
            Control::PlaySpeed(speed);
            const auto used =
                static_cast<long>(static_cast<float>(count) * speed);

            Control::play_resample(source.data(), count);

            for (long i = 0; i < count; ++i)
                ASSERT_EQ(
                    Control::play_buffer[i],
                    used == 0
                        ? 0
                        : source[static_cast<std::size_t>(i * used / count)])
                    << speed << ' ' << count << ' ' << i;
        }
}

TEST_F(SoundControl, ResampleOfNoSamplesIsZeros)
{
    short source = 7;
    for (const float speed : {0.0F, 0.05F, -3.0F, not_a_number, infinity}) {
        Control::PlaySpeed(speed);
        std::fill_n(Control::play_buffer, 12, short{5});

        Control::play_resample(&source, 10);

        for (int i = 0; i < 10; ++i)
            ASSERT_EQ(Control::play_buffer[i], 0) << speed;
        ASSERT_EQ(Control::play_buffer[10], 5) << speed;
    }
}

TEST_F(SoundControl, ResampleStaysInsideTheBuffer)
{
    Samples source(100000, 3);
    std::fill_n(Control::play_buffer, 10, short{5});

    Control::play_resample(source.data(), -4);
    EXPECT_EQ(Control::play_buffer[0], 5);
    Control::play_resample(source.data(), 1000000);

    EXPECT_EQ(Control::play_buffer[99999], 3);
}

TEST_F(SoundControl, TheStagingBuffersHaveAHundredThousandSamples)
{
    EXPECT_EQ(Control::queue_size, 100000);
    EXPECT_EQ(std::size(Control::play_buffer), 100000U);
    EXPECT_EQ(std::size(Control::record_buffer), 100000U);
    EXPECT_EQ(sizeof Control::play_buffer, 200000U);
    EXPECT_EQ(std::size(Control::pv_buf), 4U);
}
