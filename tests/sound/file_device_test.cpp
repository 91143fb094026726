#include <cstdio>
#include <cstdlib>
#include <memory>
#include <sys/stat.h>

#include "sound/SoundTest.h"
#include "support/TempDir.h"

namespace {
using Control = ZtSoundControl;

/// The device of files, by a fake clock, chosen as hosts choose it.
class FileDeviceTest : public BeatTest
{
protected:
    FileDeviceTest() { ZtTimerBeat::start(); }

    ~FileDeviceTest() override
    {
        Control::RecordSetFrequency(8000);
        Control::RecordSetStereo(0);
        unsetenv("ZT_AUDIO");
        setenv("ZT_AUDIO", "null", 1);
        Control::OutputRate();
    }

    void UseFiles(const std::string& names)
    {
        setenv("ZT_AUDIO", ("file:" + names).c_str(), 1);
    }

    std::string Path(const std::string& name) const
    {
        return folder.Path(name);
    }

    void RunFor(double seconds) { alarm.Run(static_cast<long>(seconds * 1e6)); }

    TempDir folder;
    BeatErrorTrap reports;
};

bool Exists(const std::string& path)
{
    struct stat about;
    return stat(path.c_str(), &about) == 0;
}
} // namespace

TEST_F(FileDeviceTest, KeepsWhatIsPlayedWithTheSoundsOwnRateAndChannels)
{
    UseFiles(Path("out.aifc"));
    Frames frames;
    for (int frame = 0; frame < 30000; ++frame)
        frames.push_back({frame, -frame});
    KvoSound sound = StereoSound(frames, 22050);

    Control::Play(&sound);

    EXPECT_STREQ(Control::DeviceInUse(), "file");
    KvoSound kept(Path("out.aifc").c_str());
    EXPECT_EQ(kept.rate, 22050);
    EXPECT_EQ(kept.channels, 2);
    EXPECT_EQ(kept.width, 2);
    EXPECT_EQ(kept.frames, 30000);
    EXPECT_EQ(SamplesOf(kept), SamplesOf(sound));
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(FileDeviceTest, VolumesDoNotScaleWhatIsKept)
{
    UseFiles(Path("out.aifc"));
    KvoSound sound = MonoSound(Ramp(1000), 11025);

    Control::JackVolume(0.25F);
    Control::Play(&sound);
    Control::JackVolume(1.0F);

    EXPECT_EQ(SamplesOf(KvoSound(Path("out.aifc").c_str())), Ramp(1000));
}

TEST_F(FileDeviceTest, PlaysAtThePaceOfARealDevice)
{
    UseFiles(Path("out.aifc"));
    KvoSound sound = MonoSound(Ramp(16000), 8000);

    Control::Play(&sound);

    EXPECT_EQ(Milliseconds(), 2000);
}

TEST_F(FileDeviceTest, EachSoundMakesTheFileAnew)
{
    UseFiles(Path("out.aifc"));
    KvoSound first = MonoSound(Ramp(1000), 8000);
    KvoSound second = StereoSound({{1, 2}, {3, 4}}, 44100);

    Control::Play(&first);
    Control::Play(&second);

    KvoSound kept(Path("out.aifc").c_str());
    EXPECT_EQ(kept.rate, 44100);
    EXPECT_EQ(SamplesOf(kept), (Samples{1, 2, 3, 4}));
}

TEST_F(FileDeviceTest, AnEmptySoundMakesAFileOfNoFrames)
{
    UseFiles(Path("out.aifc"));
    KvoSound sound;

    Control::Play(&sound);

    KvoSound kept(Path("out.aifc").c_str());
    EXPECT_EQ(kept.frames, 0);
    EXPECT_EQ(kept.rate, 8000);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(FileDeviceTest, KeepsASoundThatFollowsATimer)
{
    UseFiles(Path("out.aifc"));
    KvoSound sound = MonoSound(Ramp(120000), 44100);
    ZtTimer timer;
    Control::Play(&sound, &timer, KvoTime());
    EXPECT_FALSE(Exists(Path("out.aifc")));
    timer.restart();

    RunFor(4);
    Control::OutputRate(); // waits for the file

    EXPECT_EQ(SamplesOf(KvoSound(Path("out.aifc").c_str())), Ramp(120000));
    timer.stop();
    Beats(1);
}

TEST_F(FileDeviceTest, WhatIsStoppedIsKeptAsFarAsItWasPlayed)
{
    UseFiles(Path("out.aifc"));
    KvoSound sound = MonoSound(Ramp(80000), 8000);
    ZtTimer timer;
    Control::Play(&sound, &timer, KvoTime());
    timer.restart();
    RunFor(1);
    timer.stop();
    Beats(1);
    Control::OutputRate();

    const Samples kept = SamplesOf(KvoSound(Path("out.aifc").c_str()));
    EXPECT_NEAR(static_cast<double>(kept.size()), 8000, 100);
    EXPECT_EQ(kept, Ramp(kept.size()));
}

TEST_F(FileDeviceTest, ASoundThatNeverBeginsLeavesTheFileAsItWas)
{
    UseFiles(Path("out.aifc"));
    KvoSound sound = MonoSound(Ramp(1000), 8000);
    Control::Play(&sound);
    {
        ZtTimer timer;
        Control::Play(&sound, &timer, KvoTime());
        Beats(1);
    }
    Control::OutputRate();

    EXPECT_EQ(SamplesOf(KvoSound(Path("out.aifc").c_str())), Ramp(1000));
    EXPECT_FALSE(Exists(Path(".zt_new_0")));
}

TEST_F(FileDeviceTest, AFileThatCannotBeMadeMakesOpeningThePortFail)
{
    UseFiles(Path("no/such/folder/out.aifc"));
    KvoSound sound = MonoSound(Ramp(1000), 8000);

    Control::Play(&sound);
    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for writing.\n");
    ZtTimer timer;
    Control::Play(&sound, &timer, KvoTime());
    timer.restart();
    RunFor(0.1);

    EXPECT_EQ(reports.count, 2);
    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for writing.\n"
              "Error: Failed to open an audio port for writing.\n");
}

TEST_F(FileDeviceTest, NamesThatAreMissingOrTooLongCannotBeMade)
{
    KvoSound sound = MonoSound(Ramp(10), 8000);

    for (const std::string& names :
         {std::string(), std::string(","), std::string(5000, 'x'),
          std::string(20000, 'x')}) {
        UseFiles(names);
        Control::Play(&sound);
    }

    EXPECT_EQ(reports.count, 4);
}

TEST_F(FileDeviceTest, RecordsFromTheOtherFileAtItsPaceAndThenSilence)
{
    KvoSound source = MonoSound(Ramp(6000, 1), 8000);
    source.Save(Path("in.aifc").c_str());
    UseFiles(Path("out.aifc") + "," + Path("in.aifc"));
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    timer.restart();
    Beats(2);

    RunFor(1);
    timer.stop();
    Beats(1);

    const std::unique_ptr<KvoSound> sound(Control::RecordResult());
    EXPECT_NEAR(static_cast<double>(sound->frames), 8000, 100);
    const Samples samples = SamplesOf(*sound);
    EXPECT_EQ(Part(samples, 0, 6000), Ramp(6000, 1));
    EXPECT_EQ(Part(samples, 6000), Samples(samples.size() - 6000));
}

TEST_F(FileDeviceTest, RecordsEachTimeFromTheStartOfTheFile)
{
    KvoSound source = MonoSound(Ramp(60000, 1), 8000);
    source.Save(Path("in.aifc").c_str());
    UseFiles(Path("out.aifc") + "," + Path("in.aifc"));

    for (int time = 0; time < 2; ++time) {
        ZtTimer timer;
        Control::Record(&timer, KvoTime());
        timer.restart();
        RunFor(1);
        timer.stop();
        Beats(1);
        const std::unique_ptr<KvoSound> sound(Control::RecordResult());
        ASSERT_GT(sound->frames, 7000);
        EXPECT_EQ(sound->samples[0], 1);
    }
}

TEST_F(FileDeviceTest, ChannelsOfTheOtherFileAreConverted)
{
    KvoSound source = StereoSound({{10, 20}, {30, 50}}, 8000);
    source.Save(Path("stereo.aifc").c_str());
    KvoSound mono = MonoSound({7, 9}, 8000);
    mono.Save(Path("mono.aifc").c_str());
    const std::vector<std::pair<std::string, Samples>> cases = {
        {"stereo.aifc", {15, 40, 0}}, {"mono.aifc", {7, 9, 0}}};

    for (const auto& [name, expected] : cases) {
        UseFiles("," + Path(name));
        ZtTimer timer;
        Control::Record(&timer, KvoTime());
        timer.restart();
        RunFor(0.1);
        timer.stop();
        Beats(1);
        const std::unique_ptr<KvoSound> sound(Control::RecordResult());
        EXPECT_EQ(Part(SamplesOf(*sound), 0, 3), expected) << name;
    }
    UseFiles("," + Path("mono.aifc"));
    Control::RecordSetStereo(1);
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    timer.restart();
    RunFor(0.1);
    timer.stop();
    Beats(1);
    const std::unique_ptr<KvoSound> sound(Control::RecordResult());
    EXPECT_EQ(Part(SamplesOf(*sound), 0, 6), (Samples{7, 7, 9, 9, 0, 0}));
}

TEST_F(FileDeviceTest, WithoutAnotherFileSilenceIsRecorded)
{
    UseFiles(Path("out.aifc"));
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    timer.restart();
    RunFor(1);
    timer.stop();
    Beats(1);

    const std::unique_ptr<KvoSound> sound(Control::RecordResult());
    EXPECT_NEAR(static_cast<double>(sound->frames), 8000, 100);
    EXPECT_EQ(sound->Volume(), 0.0F);
}

TEST_F(FileDeviceTest, AnOtherFileThatCannotBeReadMakesOpeningThePortFail)
{
    UseFiles(Path("out.aifc") + "," + Path("none.aifc"));
    ZtTimer timer;
    Control::Record(&timer, KvoTime());
    timer.restart();
    RunFor(0.1);

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open an audio port for reading.\n");
}

TEST_F(FileDeviceTest, TheDeviceIsChosenAgainWhenTheVariableChanges)
{
    UseFiles(Path("first.aifc"));
    KvoSound sound = MonoSound(Ramp(10), 8000);
    Control::Play(&sound);

    UseFiles(Path("second.aifc"));
    Control::Play(&sound);
    setenv("ZT_AUDIO", "null", 1);
    EXPECT_STREQ(Control::DeviceInUse(), "null");
    Control::Play(&sound);

    EXPECT_TRUE(Exists(Path("first.aifc")));
    EXPECT_TRUE(Exists(Path("second.aifc")));
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(FileDeviceTest, AFileThatCannotBeKeptIsReported)
{
    ASSERT_TRUE(Exists("/dev/full"));
    UseFiles("/dev/full");
    KvoSound sound = MonoSound(Ramp(10), 8000);

    Control::Play(&sound);
    Control::OutputRate(); // says it no more

    EXPECT_EQ(reports.Text(), "Error: Failed to write audio file "
                              "[/dev/full].\n");
}

TEST_F(FileDeviceTest, ALongSoundIsKeptWhole)
{
    UseFiles(Path("out.aifc"));
    KvoSound sound = MonoSound(Ramp(3000000), 44100);

    Control::Play(&sound);

    EXPECT_EQ(SamplesOf(KvoSound(Path("out.aifc").c_str())), Ramp(3000000));
}
