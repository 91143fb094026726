#include <KVO/KvoSound.h>

#include <csignal>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <sys/resource.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

#include <gtest/gtest.h>

#include "sound/aiff_bytes.h"
#include "sound/sounds.h"
#include "support/ErrorTrap.h"
#include "support/FaultyFiles.h"
#include "support/InAChild.h"
#include "support/TempDir.h"

namespace {

/// Saves a sound and gives the file.
std::string Saved(const KvoSound& sound)
{
    const TempDir directory;
    sound.Save(directory.Path("a.aiff").c_str());
    return directory.Read("a.aiff");
}

/// Gives how many entries a directory has.
std::ptrdiff_t EntriesOf(const TempDir& directory)
{
    return std::distance(
        std::filesystem::directory_iterator(directory.Path("")),
        std::filesystem::directory_iterator());
}

TEST(aifc_writer, AMonoFileIsSpelledOut)
{
    const std::string file = Saved(MonoSound({258, -2}, 44100));

    const std::string expected =
        "FORM" + BigEndian32(82) + "AIFC" + "FVER" + BigEndian32(4) +
        ByteString({0xA2, 0x80, 0x51, 0x40}) + "COMM" + BigEndian32(38) +
        BigEndian16(1) + BigEndian32(2) + BigEndian16(16) +
        ByteString({0x40, 0x0E, 0xAC, 0x44, 0, 0, 0, 0, 0, 0}) + "NONE" +
        ByteString({14}) + "not compressed" + ByteString({0}) + "SSND" +
        BigEndian32(12) + BigEndian32(0) + BigEndian32(0) +
        ByteString({1, 2, 0xFF, 0xFE});
    EXPECT_EQ(file, expected);
}

TEST(aifc_writer, StereoSamplesAreInterleaved)
{
    const auto file = ReadAifc(Saved(StereoSound({{1, -2}, {3, -4}}, 8000)));

    ASSERT_TRUE(file);
    EXPECT_EQ(file->channels, 2);
    EXPECT_EQ(file->frames, 2u);
    EXPECT_EQ(file->bits, 16);
    EXPECT_EQ(file->rate, 8000);
    EXPECT_EQ(file->compression, "NONE");
    EXPECT_EQ(file->version, 0xA2805140);
    EXPECT_EQ(file->samples, (std::vector<std::int32_t>{1, -2, 3, -4}));
}

TEST(aifc_writer, EightBitsAreTheHighOnesAndPaddedToEven)
{
    KvoSound sound = MonoSound({258, -2, 32767});
    sound.width = 1;

    const std::string bytes = Saved(sound);

    EXPECT_EQ(bytes.size() % 2, 0u);
    const auto file = ReadAifc(bytes);
    ASSERT_TRUE(file);
    EXPECT_EQ(file->bits, 8);
    EXPECT_EQ(file->samples, (std::vector<std::int32_t>{1, -1, 127}));
}

TEST(aifc_writer, TwentyFourBitsHaveZerosBelow)
{
    KvoSound sound = MonoSound({258, -2, 32767});
    sound.width = 4;

    const auto file = ReadAifc(Saved(sound));

    ASSERT_TRUE(file);
    EXPECT_EQ(file->bits, 24);
    EXPECT_EQ(file->samples,
              (std::vector<std::int32_t>{258 * 256, -2 * 256, 32767 * 256}));
}

TEST(aifc_writer, OtherWidthsAreWrittenAsSixteenBits)
{
    for (int width : {0, 2, 3, 5, -1, 100}) {
        KvoSound sound = MonoSound({258});
        sound.width = width;

        const auto file = ReadAifc(Saved(sound));

        ASSERT_TRUE(file);
        EXPECT_EQ(file->bits, 16);
        EXPECT_EQ(file->samples, (std::vector<std::int32_t>{258}));
    }
}

TEST(aifc_writer, AnyChannelCountButOneIsTwo)
{
    const auto file = ReadAifc(Saved(ThreeChannels()));

    ASSERT_TRUE(file);
    EXPECT_EQ(file->channels, 2);
    EXPECT_EQ(file->samples, (std::vector<std::int32_t>{1, 2, 3, 4}));
}

TEST(aifc_writer, RatesAreWholeNumbersOfAnySize)
{
    for (long rate : {1L, 2L, 3L, 7999L, 8000L, 44100L, 96000L, 2147483647L,
                      9223372036854775807L, 0L, -8000L}) {
        const auto file = ReadAifc(Saved(MonoSound({1}, rate)));

        ASSERT_TRUE(file);
        EXPECT_EQ(file->rate, static_cast<long double>(rate));
    }
}

TEST(aifc_writer, ABufferOfNoFramesMakesAFileOfNone)
{
    const auto file = ReadAifc(Saved(KvoSound(8000, 2, 0, new short[1])));

    ASSERT_TRUE(file);
    EXPECT_EQ(file->frames, 0u);
}

TEST(aifc_writer, FilesOfEveryLengthAndWidthReadBack)
{
    std::mt19937 random(91);
    for (int i = 0; i < 106; ++i) {
        const int channels = 1 + i % 2;
        const std::size_t frames =
            i < 100 ? 1 + random() % 300 : 90000 + random() % 120000;
        const Samples samples =
            RandomSamples(random, frames * static_cast<std::size_t>(channels));
        KvoSound sound = SoundOf(samples, channels, 22050);
        static const int widths[] = {1, 2, 4};
        sound.width = widths[i % 3];

        const auto file = ReadAifc(Saved(sound));

        ASSERT_TRUE(file);
        ASSERT_EQ(file->frames, frames);
        ASSERT_EQ(file->samples.size(), samples.size());
        std::vector<std::int32_t> expected;
        for (const short sample : samples)
            expected.push_back(sound.width == 1   ? sample >> 8
                               : sound.width == 4 ? sample * 256
                                                  : sample);
        ASSERT_TRUE(file->samples == expected);
    }
}

TEST(aifc_writer, WhatIsSavedLoadsAsTheSameSound)
{
    std::mt19937 random(92);
    const TempDir directory;
    const std::string path = directory.Path("a.aiff");
    for (int width : {1, 2, 4})
        for (int channels : {1, 2}) {
            Samples samples = RandomSamples(random, 70000);
            if (width == 1)
                for (short& sample : samples)
                    sample = static_cast<short>(sample & ~0xFF);
            KvoSound sound = SoundOf(samples, channels, 11025);
            sound.width = width;

            sound.Save(path.c_str());
            const KvoSound loaded(path.c_str());

            EXPECT_EQ(loaded.width, width);
            EXPECT_EQ(loaded.rate, 11025);
            EXPECT_EQ(loaded.channels, channels);
            EXPECT_EQ(SamplesOf(loaded), samples);
        }
}

TEST(aifc_writer, MoreThanAFileCanHoldIsReportedBeforeAnythingIsWritten)
{
    const TempDir directory;
    const std::string path = directory.Write("a", "old");
    // Twelve gigabytes in the file, which are not there in memory.
    KvoSound sound(8000, 2, 2147483647, new short[2]);
    sound.width = 4;
    const ErrorTrap reports;

    RunInAChild([&] { sound.Save(path.c_str()); });
    sound.Save(path.c_str());

    EXPECT_EQ(reports.Text(),
              "Error: Failed to write audio file [" + path + "].\n");
    EXPECT_EQ(directory.Read("a"), "old");
}

// --- reports and faults
// ------------------------------------------------------------

TEST(aifc_writer, ASoundWithoutABufferIsReported)
{
    const TempDir directory;
    const std::string path = directory.Path("%s");
    const ErrorTrap reports;

    KvoSound().Save(path.c_str());

    EXPECT_EQ(reports.Text(), "Error: Failed to save sound file [" + path +
                                  "], no audio data.\n");
    EXPECT_FALSE(std::filesystem::exists(path));
}

TEST(aifc_writer, APlaceThatCannotBeWrittenIsReported)
{
    const TempDir directory;
    const KvoSound sound = MonoSound({1});
    for (const std::string& path :
         {directory.Path(""), directory.Path("x/y"), std::string("")}) {
        const ErrorTrap reports;

        sound.Save(path.c_str());

        EXPECT_EQ(reports.Text(),
                  "Error: Failed to open audio file [" + path + "].\n");
    }
    const ErrorTrap reports;
    sound.Save(nullptr);
    EXPECT_EQ(reports.Text(), "Error: Failed to open audio file [].\n");
}

TEST(aifc_writer, ShortWritesAndInterruptionsGiveTheSameFile)
{
    const KvoSound sound = MonoSound(Samples(100, 0x1234));
    const std::string expected = Saved(sound);
    FaultyFiles files;
    files.most_at_once = 1;
    files.interrupts = true;

    EXPECT_EQ(Saved(sound), expected);
    EXPECT_EQ(files.open_count, 0);
}

TEST(aifc_writer, LongSoundsGoOutInLargeBlocks)
{
    const KvoSound sound(Seconds(30), 1);
    const FaultyFiles files;

    const std::size_t bytes = Saved(sound).size();

    EXPECT_LE(static_cast<std::size_t>(files.writes), bytes / 65536);
}

TEST(aifc_writer, AWriteFaultAtAnyByteLeavesTheOldFileAndNoOther)
{
    const TempDir directory;
    const std::string path = directory.Write("a", "old");
    const KvoSound sound = MonoSound({1, 2, 3});
    const std::size_t size = Saved(sound).size();
    for (int error : {ENOSPC, EDQUOT, EFBIG, EIO})
        for (std::size_t left = 0; left < size; ++left) {
            FaultyFiles files;
            files.bytes_left = left;
            files.write_error = error;
            const ErrorTrap reports;

            sound.Save(path.c_str());

            ASSERT_EQ(reports.Text(),
                      "Error: Failed to write audio file [" + path + "].\n");
            ASSERT_EQ(directory.Read("a"), "old");
            ASSERT_EQ(EntriesOf(directory), 1);
            ASSERT_EQ(files.open_count, 0);
        }
}

TEST(aifc_writer, AFailingCloseOrMoveLeavesNothing)
{
    const TempDir directory;
    const std::string path = directory.Path("a");
    const KvoSound sound = MonoSound({1, 2, 3});
    for (bool closing : {true, false}) {
        FaultyFiles files;
        files.close_fails = closing;
        files.moves_fail = !closing;
        const ErrorTrap reports;

        sound.Save(path.c_str());

        EXPECT_EQ(reports.Text(),
                  "Error: Failed to write audio file [" + path + "].\n");
        EXPECT_EQ(EntriesOf(directory), 0);
    }
}

TEST(aifc_writer, AFullDeviceIsReportedAndStays)
{
    const ErrorTrap reports;

    MonoSound({1}).Save("/dev/full");

    EXPECT_EQ(reports.Text(),
              "Error: Failed to write audio file [/dev/full].\n");
    EXPECT_TRUE(std::filesystem::is_character_file("/dev/full"));
}

TEST(aifc_writer, ALimitOnFilesIsReportedAndNoSignalInAChild)
{
    const TempDir directory;
    const std::string path = directory.Path("a");
    RunInAChild([&] {
        const rlimit short_files = {600, 600};
        setrlimit(RLIMIT_FSIZE, &short_files);
        const ErrorTrap reports;

        MonoSound(Samples(1000, 7)).Save(path.c_str());

        EXPECT_EQ(reports.Text(),
                  "Error: Failed to write audio file [" + path + "].\n");
        sigset_t pending;
        sigpending(&pending);
        EXPECT_FALSE(sigismember(&pending, SIGXFSZ));
    });
    EXPECT_EQ(EntriesOf(directory), 0);
}

TEST(aifc_writer, APipeIsWrittenAsItIs)
{
    const TempDir directory;
    const std::string path = directory.Path("fifo");
    ASSERT_EQ(mkfifo(path.c_str(), 0600), 0);
    const KvoSound sound = MonoSound(Samples(200000, 0x0102));
    const int reader = open(path.c_str(), O_RDONLY | O_NONBLOCK);
    fcntl(reader, F_SETFL, 0);
    std::string came;
    std::thread listener([&] {
        char buffer[65536];
        for (ssize_t got; (got = read(reader, buffer, sizeof buffer)) > 0;)
            came.append(buffer, static_cast<std::size_t>(got));
    });

    sound.Save(path.c_str());

    listener.join();
    close(reader);
    EXPECT_EQ(came, Saved(sound));
}

TEST(aifc_writer, APipeWithoutAReaderIsReportedWithoutAWaitInAChild)
{
    const TempDir directory;
    const std::string path = directory.Path("fifo");
    ASSERT_EQ(mkfifo(path.c_str(), 0600), 0);
    RunInAChild([&] {
        const ErrorTrap reports;

        MonoSound({1}).Save(path.c_str());

        EXPECT_EQ(reports.Text(),
                  "Error: Failed to open audio file [" + path + "].\n");
    });
}

TEST(aifc_writer, AFileThatIsThereIsReplacedWithItsPermissions)
{
    const TempDir directory;
    const std::string path = directory.Write("a", std::string(5000, 'x'));
    chmod(path.c_str(), 0640);
    const KvoSound sound = MonoSound({1, 2});

    sound.Save(path.c_str());

    EXPECT_EQ(directory.Read("a"), Saved(sound));
    struct stat about;
    ASSERT_EQ(stat(path.c_str(), &about), 0);
    EXPECT_EQ(about.st_mode & 07777, 0640u);
    EXPECT_EQ(EntriesOf(directory), 1);
}

TEST(aifc_writer, ALinkStaysALink)
{
    const TempDir directory;
    const std::string path = directory.Write("real", "old");
    std::filesystem::create_symlink(path, directory.Path("link"));

    MonoSound({1}).Save(directory.Path("link").c_str());

    EXPECT_TRUE(std::filesystem::is_symlink(directory.Path("link")));
    EXPECT_EQ(directory.Read("real"), Saved(MonoSound({1})));
}

} // namespace
