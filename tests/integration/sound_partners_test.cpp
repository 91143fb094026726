// Sounds written by us and read by other programs, and the other way round,
// sample for sample: SoX, FFmpeg and the aifc module of Python.
//
// What is exchanged with them besides AIFF-C files are raw samples, 16 bits
// wide, the least significant byte first.

#include <KVO/KvoSound.h>

#include <cstdlib>
#include <string>

#include <gtest/gtest.h>

#include "sound/sounds.h"
#include "support/TempDir.h"

namespace {

constexpr long rate = 22050;

void Shell(const std::string& command)
{
    // What they say is of no interest, as long as they are content.
    const std::string quiet = "exec 2>/dev/null </dev/null; " + command;
    ASSERT_EQ(std::system(quiet.c_str()), 0) << command;
}

std::string RawBytes(const Samples& samples)
{
    std::string bytes;
    for (short sample : samples) {
        bytes += static_cast<char>(sample & 0xFF);
        bytes += static_cast<char>(sample >> 8);
    }
    return bytes;
}

/// Gives what is left of samples that were this wide.
Samples Narrowed(Samples samples, int width)
{
    if (width == 1)
        for (short& sample : samples)
            sample = static_cast<short>(sample & ~0xFF);
    return samples;
}

/// Channels and width of what is exchanged.
using Shape = std::pair<int, int>;

class SoundPartners : public testing::TestWithParam<Shape>
{
protected:
    int channels = GetParam().first;
    int width = GetParam().second;
    TempDir directory;

    Samples MakeSamples() const
    {
        std::mt19937 random(97);
        return Narrowed(RandomSamples(random, 5002), width);
    }

    /// Saves a sound as `name`.
    void Save(const std::string& name) const
    {
        KvoSound sound = SoundOf(MakeSamples(), channels, rate);
        sound.width = width;
        sound.Save(directory.Path(name).c_str());
    }

    /// Loads `name` and expects the sound that we made.
    void ExpectLoaded(const std::string& name) const
    {
        const KvoSound sound(directory.Path(name).c_str());

        EXPECT_EQ(sound.channels, channels);
        EXPECT_EQ(sound.width, width);
        EXPECT_EQ(sound.rate, rate);
        EXPECT_EQ(SamplesOf(sound), MakeSamples());
    }

    std::string In(const std::string& name) const
    {
        return " '" + directory.Path(name) + "' ";
    }

    std::string Channels() const { return std::to_string(channels); }
};

INSTANTIATE_TEST_SUITE_P(Mono8, SoundPartners, testing::Values(Shape(1, 1)));
INSTANTIATE_TEST_SUITE_P(Stereo8, SoundPartners, testing::Values(Shape(2, 1)));
INSTANTIATE_TEST_SUITE_P(Mono16, SoundPartners, testing::Values(Shape(1, 2)));
INSTANTIATE_TEST_SUITE_P(Stereo16, SoundPartners, testing::Values(Shape(2, 2)));
INSTANTIATE_TEST_SUITE_P(Mono24, SoundPartners, testing::Values(Shape(1, 4)));
INSTANTIATE_TEST_SUITE_P(Stereo24, SoundPartners, testing::Values(Shape(2, 4)));

TEST_P(SoundPartners, SoxReadsWhatWeWrite)
{
    Save("ours.aifc");

    Shell(std::string(ZT_SOX) + " -D" + In("ours.aifc") +
          "-t raw -e signed -b 16 -L" + In("raw"));
    Shell("test \"$(" ZT_SOX " --i -r" + In("ours.aifc") + ")\" = 22050");
    Shell("test \"$(" ZT_SOX " --i -c" + In("ours.aifc") +
          ")\" = " + Channels());

    EXPECT_EQ(directory.Read("raw"), RawBytes(MakeSamples()));
}

TEST_P(SoundPartners, WeReadWhatSoxWrites)
{
    directory.Write("raw", RawBytes(MakeSamples()));
    const std::string bits = std::to_string(width == 1   ? 8
                                            : width == 2 ? 16
                                                         : 24);
    for (const std::string kind : {"aiff", "aifc", "wav", "au"}) {
        Shell(std::string(ZT_SOX) +
              " -D -t raw -e signed -b 16 -L -r 22050 -c " + Channels() +
              In("raw") + "-b " + bits +
              (kind == "wav" && width == 1 ? " -e unsigned " : " -e signed ") +
              In("theirs." + kind));

        ExpectLoaded("theirs." + kind);
    }
}

TEST_P(SoundPartners, FfmpegReadsWhatWeWrite)
{
    Save("ours.aifc");

    Shell(std::string(ZT_FFMPEG) + " -i" + In("ours.aifc") +
          "-f s16le -sws_flags 0" + In("raw"));

    EXPECT_EQ(directory.Read("raw"), RawBytes(MakeSamples()));
}

TEST_P(SoundPartners, WeReadWhatFfmpegWrites)
{
    directory.Write("raw", RawBytes(MakeSamples()));
    const std::string codec = width == 1   ? "pcm_s8"
                              : width == 2 ? "pcm_s16be"
                                           : "pcm_s24be";

    Shell(std::string(ZT_FFMPEG) + " -f s16le -ar 22050 -ac " + Channels() +
          " -i" + In("raw") + "-c:a " + codec + In("theirs.aiff"));

    ExpectLoaded("theirs.aiff");
}

TEST_P(SoundPartners, PythonReadsWhatWeWriteAndWritesWhatWeRead)
{
    Save("ours.aifc");
    // As it comes in, all but the samples copied by its own writer.
    directory.Write("copy.py", R"(
import aifc, sys, warnings
ours = aifc.open(sys.argv[1], "rb")
theirs = aifc.open(sys.argv[2], "wb")
theirs.setparams(ours.getparams())
theirs.writeframes(ours.readframes(ours.getnframes()))
theirs.close()
parameters = ours.getparams()
print(parameters.nchannels, parameters.sampwidth, parameters.framerate,
      parameters.nframes, parameters.comptype.decode())
)");

    Shell(std::string(ZT_PYTHON_AIFC) + " -W ignore" + In("copy.py") +
          In("ours.aifc") + In("theirs.aifc") + ">" + In("said"));

    const int bytes = width == 4 ? 3 : width;
    EXPECT_EQ(directory.Read("said"),
              Channels() + " " + std::to_string(bytes) + " 22050 " +
                  std::to_string(5002 / channels) + " NONE\n");
    ExpectLoaded("theirs.aifc");
}

TEST_P(SoundPartners, CompressionWithoutLossChangesNothing)
{
    if (width == 1)
        width = 2; // what it is encoded as
    directory.Write("raw", RawBytes(MakeSamples()));

    Shell(std::string(ZT_FFMPEG) + " -f s16le -ar 22050 -ac " + Channels() +
          " -i" + In("raw") + "-sample_fmt " + (width == 4 ? "s32" : "s16") +
          In("theirs.flac"));

    ExpectLoaded("theirs.flac");
}

// A compressed sound goes beyond the range where the original did not.
TEST(SoundCompressed, LoudSoundsAreClampedAndDoNotWrapAround)
{
    const TempDir directory;
    Samples wave;
    for (int i = 0; i < 44100; ++i)
        wave.push_back(i / 100 % 2 ? short{32767} : short{-32768});
    directory.Write("raw", RawBytes(wave));
    for (const std::string kind : {"ogg", "mp3"}) {
        Shell(std::string(ZT_FFMPEG) + " -f s16le -ar 22050 -ac 1 -i '" +
              directory.Path("raw") + "' '" + directory.Path("wave." + kind) +
              "'");

        const KvoSound sound(directory.Path("wave." + kind).c_str());

        EXPECT_EQ(sound.width, 2) << kind;
        EXPECT_EQ(sound.rate, 22050) << kind;
        ASSERT_GE(sound.frames, 44100) << kind;
        int ends = 0;
        int jumps = 0;
        for (long i = 5000; i < 40000; ++i) {
            ends += sound.samples[i] == 32767 || sound.samples[i] == -32768;
            jumps += std::abs(sound.samples[i] - sound.samples[i - 1]) > 50000;
        }
        EXPECT_GT(ends, 100) << kind;
        EXPECT_LT(jumps, 400) << kind; // one for each of 350 edges at most
    }
}

} // namespace
