// The PortAudio device, with the test in the place of the library: it keeps
// the streams and calls them as the library would.

#include "platform/audio_port.h"
#include "platform/portaudio/pa_functions.h"

#include <atomic>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "support/CapturedStderr.h"

namespace {
using namespace zt_platform;
using Samples = std::vector<std::int16_t>;

/// What stands for a stream of the library.
struct FakeStream
{
    std::atomic<bool> open = false;
    std::atomic<bool> started = false;
    bool plays = false;
    int channels = 0;
    double rate = 0;
    double latency = 0; ///< In seconds, as suggested.
    PaStreamCallback* call = nullptr;
    PaStreamFinishedCallback* finished = nullptr;
    void* data = nullptr;
};

/// What the library would do.
struct FakeLibrary
{
    PaError initialize = paNoError;
    int devices = 1;
    int input_channels = 2;
    int output_channels = 2;
    double only_rate = 0; ///< 0 takes every rate.
    PaError start = paNoError;
    std::atomic<int> initialized = 0;
    std::atomic<int> terminated = 0;
    std::atomic<int> opened = 0;
};

FakeLibrary library;
constexpr int most_streams = 64;
FakeStream streams[most_streams];

const PaDeviceInfo* Info(PaDeviceIndex index)
{
    static PaDeviceInfo info;
    info = {};
    info.name = index == 0 ? "first" : "second";
    info.maxInputChannels = library.input_channels;
    info.maxOutputChannels = library.output_channels;
    info.defaultSampleRate = 48000;
    return &info;
}

PaDeviceIndex Default()
{
    return library.devices > 0 ? 0 : paNoDevice;
}

PaError Open(PaStream** stream, const PaStreamParameters* input,
             const PaStreamParameters* output, double rate, unsigned long,
             PaStreamFlags, PaStreamCallback* call, void* data)
{
    if (library.only_rate > 0 && rate != library.only_rate)
        return paInvalidSampleRate;
    const int number = library.opened++;
    FakeStream& made = streams[number % most_streams];
    made.plays = output != nullptr;
    made.channels = output ? output->channelCount : input->channelCount;
    made.rate = rate;
    made.latency = (output ? output : input)->suggestedLatency;
    made.call = call;
    made.data = data;
    made.open = true;
    *stream = &made;
    return paNoError;
}

PaError Start(PaStream* stream)
{
    if (library.start == paNoError)
        static_cast<FakeStream*>(stream)->started = true;
    return library.start;
}

PaError Stop(PaStream* stream)
{
    static_cast<FakeStream*>(stream)->started = false;
    return paNoError;
}

PaError Close(PaStream* stream)
{
    static_cast<FakeStream*>(stream)->open = false;
    return paNoError;
}

PaError SetFinished(PaStream* stream, PaStreamFinishedCallback* callback)
{
    static_cast<FakeStream*>(stream)->finished = callback;
    return paNoError;
}

const PaStreamInfo* StreamInfo(PaStream*)
{
    static const PaStreamInfo info = {1, 0, 0.01, 44100};
    return &info;
}

constexpr PaFunctions functions = {[] {
                                       ++library.initialized;
                                       return library.initialize;
                                   },
                                   [] {
                                       ++library.terminated;
                                       return PaError{paNoError};
                                   },
                                   [] { return library.devices; },
                                   Info,
                                   Default,
                                   Default,
                                   Open,
                                   SetFinished,
                                   Start,
                                   Stop,
                                   Stop,
                                   Close,
                                   StreamInfo};

class PortAudio : public testing::Test
{
protected:
    PortAudio()
    {
        PaFunctions::install(&functions);
        device = portaudio_device();
        const AudioParameters fresh;
        for (int parameter = 0; parameter < 16; ++parameter)
            device->parameters().set(parameter, fresh.get(parameter));
        first = library.opened;
    }

    ~PortAudio() override
    {
        library.initialize = paNoError;
        library.devices = 1;
        library.input_channels = library.output_channels = 2;
        library.only_rate = 0;
        library.start = paNoError;
        for (AudioPort* const port : ports)
            port->release();
        EXPECT_TRUE(Soon([] { return OpenStreams() == 0; }));
    }

    AudioPort* Ready(int channels = 1, long rate = 44100,
                     AudioDirection direction = AudioDirection::Play)
    {
        config = {};
        config.direction = direction;
        config.channels = channels;
        config.rate = rate;
        AudioPort* const port = device->prepare(config);
        if (port)
            ports.push_back(port);
        return port;
    }

    AudioPort* Opened(int channels = 1, long rate = 44100,
                      AudioDirection direction = AudioDirection::Play)
    {
        AudioPort* const port = Ready(channels, rate, direction);
        EXPECT_TRUE(port && port->open(config));
        return port;
    }

    /// Gives a stream that was opened in this test.
    FakeStream& Stream(int number = 0) const
    {
        return streams[(first + number) % most_streams];
    }

    static int OpenStreams()
    {
        int count = 0;
        for (const FakeStream& stream : streams)
            count += stream.open;
        return count;
    }

    /// Has a stream take its next frames.
    static Samples Taken(FakeStream& stream, std::size_t frames)
    {
        Samples samples(frames * static_cast<std::size_t>(stream.channels), 99);
        stream.call(nullptr, samples.data(), frames, nullptr, 0, stream.data);
        return samples;
    }

    /// Has a stream bring these samples.
    static void Bring(FakeStream& stream, const Samples& samples)
    {
        stream.call(samples.data(), nullptr,
                    samples.size() / static_cast<std::size_t>(stream.channels),
                    nullptr, 0, stream.data);
    }

    static Samples Read(AudioPort* port, long count)
    {
        Samples samples(static_cast<std::size_t>(count));
        samples.resize(
            static_cast<std::size_t>(port->read(samples.data(), count)));
        return samples;
    }

    static void Write(AudioPort* port, const Samples& samples)
    {
        EXPECT_EQ(
            port->write(samples.data(), static_cast<long>(samples.size())),
            static_cast<long>(samples.size()));
    }

    /// Waits until the device's own thread has brought something about.
    template <class Condition>
    static bool Soon(Condition condition)
    {
        for (int look = 0; look < 2000; ++look) {
            if (condition())
                return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
        return false;
    }

    AudioDevice* device;
    AudioPortConfig config;
    std::vector<AudioPort*> ports;
    int first = 0;
};
} // namespace

TEST_F(PortAudio, NamesTheDevicesOfTheLibrary)
{
    library.devices = 2;
    char name[40];

    EXPECT_STREQ(device->name(), "portaudio");
    ASSERT_TRUE(device->member_name(0, name, sizeof name));
    EXPECT_STREQ(name, "portaudio: first");
    ASSERT_TRUE(device->member_name(1, name, sizeof name));
    EXPECT_STREQ(name, "portaudio: second");
    EXPECT_FALSE(device->member_name(2, name, sizeof name));
    EXPECT_FALSE(device->member_name(-1, name, sizeof name));
}

TEST_F(PortAudio, APortThatIsReadyHasARunningStreamThatIsSilent)
{
    AudioPort* const port = Ready(2, 22050);

    ASSERT_NE(port, nullptr);
    EXPECT_TRUE(Stream().started);
    EXPECT_TRUE(Stream().plays);
    EXPECT_EQ(Stream().channels, 2);
    EXPECT_EQ(Stream().rate, 22050);
    EXPECT_GE(Stream().latency, 0.1); // less would break on a busy machine
    EXPECT_EQ(Taken(Stream(), 3), Samples(6));
}

TEST_F(PortAudio, PlaysWhatWasWrittenAndThenSilence)
{
    AudioPort* const port = Opened();

    Write(port, {1, 2, 3, 4, 5});

    EXPECT_EQ(port->filled(), 5);
    EXPECT_EQ(port->fillable(), 99995);
    EXPECT_EQ(Taken(Stream(), 3), (Samples{1, 2, 3}));
    EXPECT_EQ(port->filled(), 2);
    EXPECT_EQ(Taken(Stream(), 3), (Samples{4, 5, 0}));
    EXPECT_EQ(port->filled(), 0);
}

TEST_F(PortAudio, ClosingThrowsAwayWhatWaits)
{
    AudioPort* const port = Opened();
    Write(port, {1, 2, 3});

    port->close();

    EXPECT_EQ(port->filled(), 0);
    EXPECT_EQ(port->write(Samples{9}.data(), 1), 0);
    EXPECT_EQ(Taken(Stream(), 2), Samples(2));
    EXPECT_TRUE(port->open(config));
    Write(port, {4});
    EXPECT_EQ(Taken(Stream(), 2), (Samples{4, 0}));
}

TEST_F(PortAudio, GainsAreDoneInSoftwareForEachChannel)
{
    AudioPort* const port = Opened(2);
    device->parameters().set(audio_left_gain, 51);
    device->parameters().set(audio_right_gain, 0);

    Write(port, {1000, 1000, -1000, -1000});

    EXPECT_EQ(Taken(Stream(), 2), (Samples{200, 0, -200, 0}));
}

TEST_F(PortAudio, TheOutputRateIsDoneInSoftware)
{
    AudioPort* const port = Opened(1, 44100);
    Write(port, {1, 2, 3, 4, 5, 6, 7, 8});

    device->parameters().set(audio_output_rate, 88200); // twice as fast
    EXPECT_EQ(Taken(Stream(), 2), (Samples{2, 4}));
    device->parameters().set(audio_output_rate, 22050);
    EXPECT_EQ(Taken(Stream(), 4), (Samples{4, 5, 5, 6}));
}

TEST_F(PortAudio, ARateOfNothingStandsStill)
{
    AudioPort* const port = Opened();
    device->parameters().set(audio_output_rate, -1);
    Write(port, {1, 2, 3});

    EXPECT_EQ(Taken(Stream(), 4), Samples(4));

    EXPECT_EQ(port->filled(), 3);
}

TEST_F(PortAudio, ARefusedRateIsPlayedAtTheDevicesOwn)
{
    library.only_rate = 48000;
    device->parameters().set(audio_output_rate, 24000);

    AudioPort* const port = Opened(1, 24000);
    Write(port, {1, 2, 3});

    EXPECT_EQ(Stream().rate, 48000);
    EXPECT_EQ(Taken(Stream(), 6), (Samples{0, 1, 1, 2, 2, 3}));
}

TEST_F(PortAudio, AMonoDevicePlaysStereoAsTheAverage)
{
    library.output_channels = 1;
    AudioPort* const port = Opened(2);

    Write(port, {10, 20, -3, 0});

    EXPECT_EQ(Stream().channels, 1);
    EXPECT_EQ(Taken(Stream(), 2), (Samples{15, -1}));
}

TEST_F(PortAudio, AMonoMicrophoneRecordsStereoTwice)
{
    library.input_channels = 1;
    AudioPort* const port = Opened(2, 44100, AudioDirection::Record);

    Bring(Stream(), {5, 6});

    EXPECT_EQ(Read(port, 10), (Samples{5, 5, 6, 6}));
}

TEST_F(PortAudio, RecordsOnlyWhileThePortIsOpen)
{
    AudioPort* const port = Ready(1, 44100, AudioDirection::Record);
    Bring(Stream(), {1, 2});
    ASSERT_TRUE(port->open(config));
    Bring(Stream(), {3, 4});
    EXPECT_EQ(port->filled(), 2);
    EXPECT_EQ(Read(port, 10), (Samples{3, 4}));
    Bring(Stream(), {5});
    port->close();
    Bring(Stream(), {6});

    EXPECT_EQ(port->filled(), 0);
}

TEST_F(PortAudio, TheInputRateIsDoneInSoftware)
{
    AudioPort* const port = Opened(1, 44100, AudioDirection::Record);
    device->parameters().set(audio_input_rate, 88200);
    Bring(Stream(), {1, 2});
    device->parameters().set(audio_input_rate, 22050);
    Bring(Stream(), {3, 4, 5, 6});

    EXPECT_EQ(Read(port, 20), (Samples{1, 1, 2, 2, 4, 6}));
}

TEST_F(PortAudio, AFullInputQueueLosesWholeFrames)
{
    AudioPort* const port = Opened(2, 44100, AudioDirection::Record);
    Bring(Stream(), Samples(99998, 1));

    Bring(Stream(), {2, 3, 4, 5});

    EXPECT_EQ(port->filled(), 100000);
    port->read(Samples(99998).data(), 99998);
    EXPECT_EQ(Read(port, 10), (Samples{2, 3}));
}

TEST_F(PortAudio, NoHalfOfAFrameIsQueued)
{
    AudioPort* const port = Opened(2, 44100, AudioDirection::Record);
    Bring(Stream(), Samples(100000, 1));
    Read(port, 1);

    Bring(Stream(), {2, 3});
    EXPECT_EQ(port->filled(), 99999);
    device->parameters().set(audio_input_rate, 88200);
    Bring(Stream(), {4, 5});

    EXPECT_EQ(port->filled(), 99999);
}

TEST_F(PortAudio, AnAbsurdRateTakesAThousandFramesAtATime)
{
    AudioPort* const port = Opened(1, 44100);
    Write(port, Samples(5000, 1));
    device->parameters().set(audio_output_rate, 2147483647);

    Taken(Stream(), 2);

    EXPECT_EQ(port->filled(), 3000);
}

TEST_F(PortAudio, WhileMonitoringIsOnTheInputIsHeard)
{
    AudioPort* const port = Opened(1, 44100, AudioDirection::Record);
    device->parameters().set(audio_left_monitor, 51);
    device->parameters().set(audio_monitor, 1);
    ASSERT_TRUE(Soon([&] { return library.opened == first + 2; }));
    FakeStream& monitor = Stream(1);
    ASSERT_TRUE(Soon([&] { return monitor.started.load(); }));

    EXPECT_TRUE(monitor.plays);
    Bring(Stream(), {1000, 2000});
    EXPECT_EQ(Taken(monitor, 3), (Samples{200, 400, 0}));
    EXPECT_EQ(Read(port, 5), (Samples{1000, 2000}));
    device->parameters().set(audio_monitor, 0);
    EXPECT_TRUE(Soon([&] { return !monitor.open; }));
    EXPECT_TRUE(Stream().open);
}

TEST_F(PortAudio, TheNextRecordingIsHeardWhenTheOneBeforeHasEnded)
{
    AudioPort* const before = Opened(1, 44100, AudioDirection::Record);
    device->parameters().set(audio_monitor, 1);
    ASSERT_TRUE(Soon([&] { return library.opened == first + 2; }));
    ports.clear();
    before->release();
    ASSERT_TRUE(Soon([&] { return !Stream().open && !Stream(1).open; }));

    Opened(1, 44100, AudioDirection::Record);
    ASSERT_TRUE(Soon([&] { return library.opened == first + 4; }));
    ASSERT_TRUE(Soon([&] { return Stream(3).started.load(); }));

    EXPECT_TRUE(Soon([&] {
        Bring(Stream(2), {1000});
        return Taken(Stream(3), 1) == Samples{1000};
    }));
}

TEST_F(PortAudio, TheLibraryIsNotBegunAnewUnderARunningStream)
{
    AudioPort* const port = Opened();
    Write(port, {1, 2});
    library.start = paUnanticipatedHostError;
    const int terminated = library.terminated;

    EXPECT_EQ(Ready(), nullptr);

    EXPECT_EQ(library.terminated, terminated);
    EXPECT_EQ(Taken(Stream(), 2), (Samples{1, 2}));
}

TEST_F(PortAudio, ADeviceThatVanishesSwallowsWhatIsWritten)
{
    AudioPort* const port = Opened();
    Write(port, Samples(1000));

    Stream().finished(Stream().data);

    EXPECT_EQ(port->filled(), 0);
    EXPECT_EQ(port->fillable(), 100000);
    EXPECT_EQ(port->write(Samples(500).data(), 500), 500);
    EXPECT_EQ(port->filled(), 0);
    port->close();
    EXPECT_FALSE(port->open(config));
}

TEST_F(PortAudio, AStreamThatIsNotCalledAnyMoreCountsAsVanished)
{
    AudioPort* const port = Opened();
    Write(port, Samples(1000));
    Taken(Stream(), 10);

    EXPECT_EQ(port->filled(), 990);
    EXPECT_TRUE(Soon([&] { return port->filled() == 0; }));
}

TEST_F(PortAudio, AReleasedPortPlaysOnForAWhileAndIsThenClosed)
{
    AudioPort* const port = Opened();
    Write(port, {1, 2});
    Taken(Stream(), 2);

    ports.clear();
    port->release();

    EXPECT_TRUE(Stream().open);
    EXPECT_EQ(Taken(Stream(), 2), Samples(2));
    EXPECT_TRUE(Soon([&] { return !Stream().open; }));
}

TEST_F(PortAudio, AReleasedPortDoesNotOpen)
{
    AudioPort* const port = Ready();
    ports.clear();

    port->release();

    EXPECT_FALSE(port->open(config));
}

TEST_F(PortAudio, ManyPortsCanBeReadyButNotAnyNumber)
{
    int count = 0;
    while (Ready())
        ++count;

    EXPECT_EQ(count, 24);
}

TEST_F(PortAudio, WithoutADeviceNothingIsReadyAndItIsLookedForAgain)
{
    ASSERT_TRUE(Soon([] { return OpenStreams() == 0; }));
    library.devices = 0;
    char name[8];
    const int initialized = library.initialized;

    EXPECT_EQ(Ready(), nullptr);
    EXPECT_FALSE(device->member_name(0, name, sizeof name));
    EXPECT_GT(library.initialized, initialized);
    library.devices = 1;

    EXPECT_NE(Ready(), nullptr);
}

TEST_F(PortAudio, AStreamThatDoesNotStartIsClosed)
{
    library.start = paUnanticipatedHostError;

    EXPECT_EQ(Ready(), nullptr);

    EXPECT_EQ(OpenStreams(), 0);
    EXPECT_GT(library.opened, first);
}

TEST_F(PortAudio, ALibraryThatCannotBeginHasNoDevices)
{
    library.devices = 0;
    library.initialize = paNotInitialized;
    EXPECT_EQ(Ready(), nullptr); // lets go of what had begun
    char name[8];
    library.devices = 1;

    EXPECT_EQ(Ready(), nullptr);
    EXPECT_FALSE(device->member_name(0, name, sizeof name));
    library.initialize = paNoError;

    EXPECT_NE(Ready(), nullptr);
}

TEST_F(PortAudio, ClosedPortsOfOtherKindsAreNotOpened)
{
    AudioPort* const port = Ready();

    config.direction = AudioDirection::Record;
    EXPECT_FALSE(port->open(config));
    config.direction = AudioDirection::Play;
    config.channels = 0;
    EXPECT_FALSE(port->open(config));
}
