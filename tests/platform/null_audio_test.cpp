#include "platform/audio_port.h"

#include <algorithm>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/FakeAudioDevice.h"
#include "support/FakeClock.h"

namespace {
using namespace zt_platform;
using Samples = std::vector<std::int16_t>;

constexpr long millisecond = 1000; // in microseconds

class NullAudio : public testing::Test
{
protected:
    NullAudio() { device.parameters().set(audio_output_rate, 8000); }

    ~NullAudio() override
    {
        device.parameters().set(audio_output_rate, 44100);
        device.parameters().set(audio_input_rate, 44100);
    }

    AudioPort* Opened(int channels = 1,
                      AudioDirection direction = AudioDirection::Play)
    {
        AudioPortConfig config;
        config.direction = direction;
        config.channels = channels;
        AudioPort* const port = device.prepare(config);
        EXPECT_TRUE(port && port->open(config));
        return port;
    }

    FakeClock clock;
    AudioDevice& device = null_audio_device();
};
} // namespace

TEST_F(NullAudio, IsTheDeviceInUseWithoutAnother)
{
    EXPECT_EQ(&AudioDevice::current(), &device);
    EXPECT_STREQ(device.name(), "null");
    EXPECT_FALSE(AudioDevice::is_installed());
}

TEST_F(NullAudio, AnInstalledDeviceComesBeforeAChosenOne)
{
    FakeAudioDevice fake;
    AudioDevice::install(nullptr);

    AudioDevice::choose(&fake);
    EXPECT_EQ(&AudioDevice::current(), &fake);
    EXPECT_EQ(AudioDevice::install(&device), nullptr);
    EXPECT_EQ(&AudioDevice::current(), &device);
    EXPECT_TRUE(AudioDevice::is_installed());

    EXPECT_EQ(AudioDevice::install(nullptr), &device);
    AudioDevice::choose(nullptr);
    EXPECT_EQ(&AudioDevice::current(), &device);
}

TEST_F(NullAudio, HasOneMember)
{
    char name[3] = {};

    EXPECT_TRUE(device.member_name(0, name, sizeof name));
    EXPECT_FALSE(device.member_name(1, name, sizeof name));
    EXPECT_FALSE(device.member_name(-1, name, sizeof name));

    EXPECT_STREQ(name, "nu");
}

TEST_F(NullAudio, PlaysAtThePaceOfItsRate)
{
    AudioPort* const port = Opened();
    const Samples second(8000);

    EXPECT_EQ(port->write(second.data(), 8000), 8000);
    EXPECT_EQ(port->filled(), 8000);
    EXPECT_EQ(port->fillable(), 92000);
    clock.AdvanceMicroseconds(250 * millisecond);
    EXPECT_EQ(port->filled(), 6000);
    EXPECT_EQ(port->fillable(), 94000);
    clock.AdvanceMicroseconds(800 * millisecond);
    EXPECT_EQ(port->filled(), 0);

    port->release();
}

TEST_F(NullAudio, AStereoPortPlaysTwoSamplesAFrame)
{
    AudioPort* const port = Opened(2);
    const Samples second(16000);

    port->write(second.data(), 16000);
    clock.AdvanceMicroseconds(250 * millisecond);

    EXPECT_EQ(port->filled(), 12000);
    port->release();
}

TEST_F(NullAudio, ItsQueueTakesAHundredThousandSamplesAndNoMore)
{
    AudioPort* const port = Opened();
    const Samples much(120000);

    EXPECT_EQ(port->write(much.data(), 120000), 100000);
    EXPECT_EQ(port->fillable(), 0);
    EXPECT_EQ(port->write(much.data(), 1), 0);

    port->release();
}

TEST_F(NullAudio, TimeInWhichNothingWaitsIsNotMadeUpFor)
{
    AudioPort* const port = Opened();
    const Samples second(8000);

    clock.AdvanceMicroseconds(5000 * millisecond);
    port->write(second.data(), 8000);

    EXPECT_EQ(port->filled(), 8000);
    port->release();
}

TEST_F(NullAudio, ManyShortLooksAddUpToTheWholeTime)
{
    AudioPort* const port = Opened();
    const Samples second(8000);
    port->write(second.data(), 8000);

    for (int look = 0; look < 700; ++look) {
        clock.AdvanceMicroseconds(999);
        port->filled();
    }

    EXPECT_EQ(port->filled(), 8000 - 8 * 699 - 2); // 699.3 ms
    port->release();
}

TEST_F(NullAudio, ANewRateCountsFromTheNextLook)
{
    AudioPort* const port = Opened();
    const Samples much(50000);
    port->write(much.data(), 50000);

    clock.AdvanceMicroseconds(1000 * millisecond);
    EXPECT_EQ(port->filled(), 42000);
    device.parameters().set(audio_output_rate, 16000);
    EXPECT_EQ(port->filled(), 42000);
    clock.AdvanceMicroseconds(1000 * millisecond);

    EXPECT_EQ(port->filled(), 26000);
    port->release();
}

TEST_F(NullAudio, ARateOfNothingPlaysNothing)
{
    device.parameters().set(audio_output_rate, -5);
    AudioPort* const port = Opened();
    const Samples some(100);
    port->write(some.data(), 100);

    clock.AdvanceMicroseconds(1000000 * millisecond);

    EXPECT_EQ(port->filled(), 100);
    port->release();
}

TEST_F(NullAudio, YearsAndTheGreatestRateDoNotOverflow)
{
    device.parameters().set(audio_output_rate, 2147483647);
    AudioPort* const port = Opened(2);
    const Samples some(100000);
    port->write(some.data(), 100000);

    for (int year = 0; year < 3; ++year)
        clock.AdvanceMicroseconds(31557600000000L);

    EXPECT_EQ(port->filled(), 0);
    port->release();
}

TEST_F(NullAudio, HalfAnHourAtAHighRateDoesNotOverflow)
{
    device.parameters().set(audio_output_rate, 1 << 30);
    AudioPort* const port = Opened();
    const Samples some(100);
    port->write(some.data(), 100);

    // In nanoseconds, times the rate, this is a multiple of 2^64.
    clock.AdvanceMicroseconds(1L << 31);

    EXPECT_EQ(port->filled(), 0);
    port->release();
}

TEST_F(NullAudio, RecordsSilenceAtThePaceOfTheInputRate)
{
    device.parameters().set(audio_input_rate, 16000);
    AudioPort* const port = Opened(1, AudioDirection::Record);
    Samples samples(16000, 7);

    clock.AdvanceMicroseconds(500 * millisecond);
    EXPECT_EQ(port->filled(), 8000);
    EXPECT_EQ(port->read(samples.data(), 16000), 8000);

    EXPECT_TRUE(std::all_of(samples.begin(), samples.begin() + 8000,
                            [](std::int16_t sample) { return sample == 0; }));
    EXPECT_EQ(samples[8000], 7);
    EXPECT_EQ(port->filled(), 0);
    port->release();
}

TEST_F(NullAudio, AFullInputQueueLosesWhatComesNext)
{
    AudioPort* const port = Opened(1, AudioDirection::Record);

    clock.AdvanceMicroseconds(100000 * millisecond);

    EXPECT_EQ(port->filled(), 100000);
    EXPECT_EQ(port->fillable(), 0);
    port->release();
}

TEST_F(NullAudio, APortGoesOneWay)
{
    AudioPort* const play = Opened();
    AudioPort* const record = Opened(1, AudioDirection::Record);
    std::int16_t sample = 1;

    EXPECT_EQ(play->read(&sample, 1), 0);
    EXPECT_EQ(record->write(&sample, 1), 0);

    play->release();
    record->release();
}

TEST_F(NullAudio, AClosedPortTakesAndGivesNothingAndOpensEmpty)
{
    AudioPort* const port = Opened();
    const Samples some(100);
    port->write(some.data(), 100);

    port->close();
    EXPECT_EQ(port->filled(), 0);
    EXPECT_EQ(port->write(some.data(), 100), 0);
    EXPECT_TRUE(port->open({}));

    EXPECT_EQ(port->filled(), 0);
    EXPECT_EQ(port->write(some.data(), 100), 100);
    port->release();
}

TEST_F(NullAudio, APortIsNotOpenedForWhatItWasNotMadeReadyFor)
{
    AudioPortConfig config;
    AudioPort* const port = device.prepare(config);

    config.direction = AudioDirection::Record;
    EXPECT_FALSE(port->open(config));
    config.direction = AudioDirection::Play;
    config.channels = 3;
    EXPECT_FALSE(port->open(config));
    config.channels = 2;
    EXPECT_TRUE(port->open(config));
    EXPECT_FALSE(port->open(config)); // it is open

    port->release();
}

TEST_F(NullAudio, PortsAreUsedAgainAndThereIsAnEndOfThem)
{
    std::vector<AudioPort*> ports;
    while (AudioPort* const port = device.prepare({}))
        ports.push_back(port);

    EXPECT_EQ(ports.size(), 64U);
    for (AudioPort* const port : ports)
        port->release();
    AudioPort* const again = device.prepare({});

    EXPECT_NE(again, nullptr);
    again->release();
}

TEST(AudioParameters, BeginFullWithMonitoringOff)
{
    const AudioParameters parameters;

    EXPECT_EQ(parameters.get(audio_left_gain), 255);
    EXPECT_EQ(parameters.get(audio_right_gain), 255);
    EXPECT_EQ(parameters.get(audio_left_monitor), 255);
    EXPECT_EQ(parameters.get(audio_right_monitor), 255);
    EXPECT_EQ(parameters.get(audio_monitor), 0);
    EXPECT_EQ(parameters.get(audio_input_rate), 44100);
    EXPECT_EQ(parameters.get(audio_output_rate), 44100);
}

TEST(AudioParameters, KeepLevelsInTheirRangeAndPassOverUnknownNumbers)
{
    AudioParameters parameters;

    for (const int number : {-1, 16, 1000000})
        parameters.set(number, 5);
    parameters.set(audio_left_gain, 300);
    parameters.set(audio_right_gain, -300);
    parameters.set(audio_output_rate, -300);

    EXPECT_EQ(parameters.get(audio_left_gain), 255);
    EXPECT_EQ(parameters.get(audio_right_gain), 0);
    EXPECT_EQ(parameters.get(audio_output_rate), -300);
    EXPECT_EQ(parameters.get(-1), 0);
    EXPECT_EQ(parameters.get(16), 0);
}
