// The machine's sound device as people have it: PortAudio over ALSA over a
// sound server, in real time, with the beat running. What goes through it comes
// out sample for sample; on a busy machine there may be silence in between, so
// silence is left out on both sides.

#include <algorithm>
#include <cstdlib>
#include <dirent.h>
#include <fstream>
#include <iterator>
#include <memory>
#include <numeric>
#include <signal.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "ZT/sound.h"
#include "integration/SoundServer.h"
#include "platform/clock.h"
#include "support/BeatTest.h"
#include "support/CapturedStderr.h"

namespace {
using Control = ZtSoundControl;
using Samples = std::vector<std::int16_t>;

constexpr long rate = SoundServer::rate;

// No sample is silence, and each tells where it stands.
Samples Ramp(std::size_t count)
{
    Samples samples(count);
    for (std::size_t at = 0; at < count; ++at)
        samples[at] = static_cast<std::int16_t>(1 + at % 30000);
    return samples;
}

KvoSound SoundOf(const Samples& samples)
{
    auto* const copy = new short[samples.size()];
    std::copy(samples.begin(), samples.end(), copy);
    return KvoSound(rate, 1, static_cast<long>(samples.size()), copy);
}

void SleepFor(double seconds)
{
    zt_platform::Clock::current().sleep_nanoseconds(
        static_cast<std::uint64_t>(seconds * 1e9));
}

std::string FieldOf(const std::string& path, const std::string& name)
{
    std::ifstream file(path);
    for (std::string line; std::getline(file, line);)
        if (line.rfind(name, 0) == 0)
            return line.substr(name.size());
    return "";
}

/// Gives the names of the threads, but for this one, that would take the alarm.
std::vector<std::string> ThreadsOpenToTheAlarm(int& threads)
{
    std::vector<std::string> open;
    threads = 0;
    DIR* const folder = opendir("/proc/self/task");
    while (const dirent* const entry = readdir(folder)) {
        const std::string name = entry->d_name;
        if (name[0] == '.' || name == std::to_string(gettid()))
            continue;
        const std::string path = "/proc/self/task/" + name + "/status";
        const std::string held = FieldOf(path, "SigBlk:");
        if (held.empty())
            continue; // it has ended meanwhile
        ++threads;
        const auto mask = std::strtoull(held.c_str(), nullptr, 16);
        if ((mask >> (SIGALRM - 1) & 1) == 0)
            open.push_back(FieldOf(path, "Name:"));
    }
    closedir(folder);
    return open;
}

// Tells whether a recorded ramp that repeats itself lacks nothing.
bool IsWhole(const KvoSound& sound)
{
    Samples heard;
    std::copy_if(sound.samples, sound.samples + sound.frames,
                 std::back_inserter(heard),
                 [](short sample) { return sample != 0; });
    bool whole = heard.size() > static_cast<std::size_t>(rate);
    for (std::size_t at = 1; at < heard.size(); ++at)
        whole = whole && heard[at] == heard[at - 1] % 30000 + 1;
    return whole;
}

class SoundServerTest : public testing::Test
{
protected:
    static void SetUpTestSuite()
    {
        server = new SoundServer;
        setenv("ZT_AUDIO", "portaudio", 1);
    }

    static void TearDownTestSuite()
    {
        setenv("ZT_AUDIO", "null", 1);
        Control::OutputRate();
        delete server;
    }

    void SetUp() override
    {
        ASSERT_TRUE(server->Runs()) << "pulseaudio does not start";
        played_before = server->Played().size();
        ZtTimerBeat::start();
    }

    void TearDown() override
    {
        ZtTimerBeat::stop();
        Control::PlaySpeed(1.0F);
    }

    /// Waits until this much was played since the test began, and gives it.
    Samples Played(std::size_t count)
    {
        for (int look = 0; look < 300; ++look) {
            if (server->Played().size() >= played_before + count)
                break;
            SleepFor(0.1);
        }
        const Samples all = server->Played();
        return {all.begin() + static_cast<std::ptrdiff_t>(played_before),
                all.end()};
    }

    static SoundServer* server;
    std::size_t played_before = 0;
    BeatErrorTrap reports;
};

SoundServer* SoundServerTest::server = nullptr;
} // namespace

TEST_F(SoundServerTest, IsListedAndNothingIsPrintedOnTheWay)
{
    CapturedStderr captured;

    const char* const name = Control::DeviceName(0);

    ASSERT_NE(name, nullptr);
    EXPECT_EQ(std::string(name).rfind("portaudio: ", 0), 0U) << name;
    EXPECT_STREQ(Control::DeviceInUse(), "portaudio");
    EXPECT_EQ(captured.Text(), "");
}

TEST_F(SoundServerTest, PlaysEverySampleOnceAndInOrder)
{
    KvoSound sound = SoundOf(Ramp(2 * rate));

    Control::Play(&sound);

    EXPECT_EQ(Played(2 * rate), Ramp(2 * rate));
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(SoundServerTest, PlaysASoundThatFollowsATimer)
{
    KvoSound sound = SoundOf(Ramp(3 * rate));
    ZtTimer timer(KvoTime(), KvoTime(0, 0, 30, 0));
    Control::Play(&sound, &timer, KvoTime(0, 0, 0, 10));
    timer.restart();

    EXPECT_EQ(Played(3 * rate), Ramp(3 * rate));
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(SoundServerTest, AStoppedTimerStopsTheSound)
{
    KvoSound sound = SoundOf(Ramp(20 * rate));
    ZtTimer timer(KvoTime(), KvoTime(0, 1, 0, 0));
    Control::Play(&sound, &timer, KvoTime());
    timer.restart();
    Played(rate / 2);

    timer.stop();
    SleepFor(1);
    const std::size_t after = server->Played().size();
    SleepFor(0.5);

    EXPECT_EQ(server->Played().size(), after);
    const Samples played = Played(0);
    EXPECT_EQ(played, Ramp(played.size()));
    EXPECT_LT(played.size(), 20U * rate);
}

TEST_F(SoundServerTest, VolumeIsDoneInSoftware)
{
    KvoSound sound = SoundOf(Ramp(rate / 2));

    Control::JackVolume(0.2F); // 51 of 255, a fifth
    Control::Play(&sound);
    Samples expected;
    for (const std::int16_t sample : Ramp(rate / 2))
        if (sample / 5 != 0)
            expected.push_back(static_cast<std::int16_t>(sample / 5));
    const Samples played = Played(expected.size());
    Control::JackVolume(1.0F);

    EXPECT_EQ(played, expected);
}

// The server itself drops input on a machine that is busy enough, which is not
// ours to prevent: one recording of a few must be whole.
TEST_F(SoundServerTest, RecordsEverySampleInOrder)
{
    server->Hear(Ramp(30000));
    Control::RecordSetFrequency(rate);
    bool whole = false;
    for (int attempt = 0; attempt < 5 && !whole; ++attempt) {
        ZtTimer timer(KvoTime(), KvoTime(0, 0, 3, 0));
        Control::Record(&timer, KvoTime(0, 0, 1, 0));
        timer.restart();
        for (int look = 0; look < 100 && timer.state != ZtTimer::Running;
             ++look)
            SleepFor(0.1);
        for (int look = 0; look < 300 && timer.state == ZtTimer::Running;
             ++look)
            SleepFor(0.1);
        const std::unique_ptr<KvoSound> sound(Control::RecordResult());
        ASSERT_NE(sound, nullptr);
        EXPECT_GT(sound->frames, rate);
        whole = IsWhole(*sound);
    }
    server->Hear({});

    EXPECT_TRUE(whole);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(SoundServerTest, NoThreadOfTheDeviceTakesTheAlarm)
{
    KvoSound sound = SoundOf(Ramp(rate));
    ZtTimer timer(KvoTime(), KvoTime(0, 0, 30, 0));
    Control::Play(&sound, &timer, KvoTime());
    timer.restart();
    Played(rate / 4);

    int threads = 0;
    const std::vector<std::string> open = ThreadsOpenToTheAlarm(threads);

    EXPECT_EQ(open, std::vector<std::string>());
    EXPECT_GE(threads, 4); // the server's two, the device's, the stream's
}

// Last of all: afterwards there is no server.
TEST_F(SoundServerTest, AServerThatDiesEndsTheSoundAndTimersGoOn)
{
    KvoSound sound = SoundOf(Ramp(60 * rate));
    ZtTimer timer;
    Control::Play(&sound, &timer, KvoTime());
    timer.restart();
    Played(rate / 2);

    server->Kill();
    Control::Play(&sound); // does not wait for a minute that nobody plays

    EXPECT_EQ(timer.state, ZtTimer::Running);
    const KvoTime before = timer.current;
    SleepFor(0.5);
    EXPECT_GT(timer.current, before);
    timer.stop();
    SleepFor(0.1);
}
