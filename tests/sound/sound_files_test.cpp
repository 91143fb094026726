// Files that break their own rules: what becomes of each, and that nothing
// worse does.

#include <KVO/KvoSound.h>

#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <limits>
#include <sys/stat.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "sound/aiff_bytes.h"
#include "sound/sounds.h"
#include "support/ErrorTrap.h"
#include "support/FaultyFiles.h"
#include "support/InAChild.h"
#include "support/TempDir.h"

namespace {

/// What a file turned into.
struct Loaded
{
    KvoSound sound;
    std::string reports; ///< The file's name replaced by NAME.
};

Loaded Load(const std::string& bytes, const std::string& name = "a.aiff")
{
    const TempDir directory;
    const std::string path = directory.Write(name, bytes);
    ErrorTrap reports;
    Loaded loaded = {KvoSound(path.c_str()), reports.Text()};
    const std::size_t at = loaded.reports.find(path);
    if (at != std::string::npos)
        loaded.reports.replace(at, path.size(), "NAME");
    return loaded;
}

const std::string not_opened = "Error: Failed to open audio file [NAME].\n";

std::string BadCount(int channels)
{
    return "Error: Audio file [NAME] contains unsupported channel count [" +
           std::to_string(channels) + "].\n";
}

void ExpectPlain(const std::string& bytes)
{
    const Loaded loaded = Load(bytes);

    EXPECT_EQ(loaded.reports, "");
    EXPECT_EQ(loaded.sound.channels, 1);
    EXPECT_EQ(SamplesOf(loaded.sound), (Samples{258, 772, 1286, 1800}));
}

void ExpectRefused(const std::string& bytes)
{
    const Loaded loaded = Load(bytes);

    EXPECT_EQ(loaded.reports, not_opened);
    EXPECT_EQ(loaded.sound.frames, 0);
    EXPECT_EQ(loaded.sound.samples, nullptr);
    EXPECT_EQ(loaded.sound.channels, 1);
    EXPECT_EQ(loaded.sound.rate, 8000);
}

std::string WithRate(std::initializer_list<int> rate)
{
    return PlainAifc({.rate = ByteString(rate)});
}

/// Uses whatever came in every way that a rate or a length could spoil.
void UseInEveryWay(KvoSound& sound)
{
    KvoSound other = MonoSound({1, 2, 3});
    sound.ComputeMinMax();
    EXPECT_GE(sound.Volume(), 0);
    other.Match(sound);
    sound.LoPass(100);
    sound.HiPass(100);
    sound.BandPass(100, 100);
    sound.Speed(0.5f);
    sound.Resample(16000);
    sound.Trim(Seconds(0), Seconds(1));
    sound.Window(Seconds(0.5), Seconds(0.5), KvoSound::Hamming);
    sound.Insert(&other, Seconds(0.001));
}

TEST(sound_files, TheOrdinaryFileIsLoaded)
{
    const Loaded loaded = Load(PlainAifc());

    EXPECT_EQ(loaded.reports, "");
    EXPECT_EQ(loaded.sound.format, 1);
    EXPECT_EQ(loaded.sound.width, 2);
    EXPECT_EQ(loaded.sound.channels, 1);
    EXPECT_EQ(loaded.sound.frames, 4);
    EXPECT_EQ(loaded.sound.rate, 8000);
    EXPECT_EQ(loaded.sound.min, 0);
    EXPECT_EQ(loaded.sound.max, 0);
    EXPECT_EQ(SamplesOf(loaded.sound), (Samples{258, 772, 1286, 1800}));
}

TEST(sound_files, AHeaderAloneIsRefused)
{
    ExpectRefused(PlainAifc().substr(0, 12));
}

TEST(sound_files, AFileCutInItsDescriptionIsRefused)
{
    ExpectRefused(PlainAifc().substr(0, 40));
}

TEST(sound_files, SamplesThatAreCutGiveTheFramesThatAreWhole)
{
    const std::string file = PlainAifc();

    const Loaded loaded = Load(file.substr(0, file.size() - 3));

    EXPECT_EQ(loaded.reports, "");
    EXPECT_EQ(SamplesOf(loaded.sound), (Samples{258, 772}));
}

TEST(sound_files, TheSizeOfTheFormIsNotBelieved)
{
    std::string none = PlainAifc();
    std::string endless = none;
    none.replace(4, 4, BigEndian32(0));
    endless.replace(4, 4, BigEndian32(0xFFFFFFFF));

    ExpectPlain(none);
    ExpectPlain(endless);
}

TEST(sound_files, NoChannelsAndNegativeOnesAreRefused)
{
    ExpectRefused(PlainAifc({.channels = 0}));
    ExpectRefused(PlainAifc({.channels = -1}));
}

TEST(sound_files, ThreeChannelsAreReportedAndKeepNoBuffer)
{
    const Loaded loaded = Load(PlainAifc({.channels = 3}));

    EXPECT_EQ(loaded.reports, BadCount(3));
    EXPECT_EQ(loaded.sound.samples, nullptr);
    EXPECT_EQ(loaded.sound.channels, 3);
    EXPECT_EQ(loaded.sound.frames, 1);
    EXPECT_EQ(loaded.sound.rate, 8000);
}

TEST(sound_files, AThousandChannelsAreReported)
{
    const Loaded loaded = Load(PlainAifc({.channels = 1024}));

    EXPECT_EQ(loaded.reports, BadCount(1024));
    EXPECT_EQ(loaded.sound.samples, nullptr);
    EXPECT_EQ(loaded.sound.frames, 0);
}

TEST(sound_files, MoreChannelsThanTheLibraryCountsAreRefused)
{
    ExpectRefused(PlainAifc({.channels = 1025}));
}

TEST(sound_files, TheSamplesSayHowManyFramesThereAre)
{
    ExpectPlain(PlainAifc({.frames = 0}));
    ExpectPlain(PlainAifc({.frames = 0x7FFFFFFF}));
    ExpectPlain(PlainAifc({.frames = 0xFFFFFFFF}));
}

TEST(sound_files, ImpossibleWidthsAreRefused)
{
    ExpectRefused(PlainAifc({.bits = 0}));
    ExpectRefused(PlainAifc({.bits = 33}));
    ExpectRefused(PlainAifc({.bits = -16}));
}

TEST(sound_files, EightBitsMoveUp)
{
    const Loaded loaded = Load(PlainAifc({.bits = 8}));

    EXPECT_EQ(loaded.reports, "");
    EXPECT_EQ(loaded.sound.width, 1);
    EXPECT_EQ(SamplesOf(loaded.sound),
              (Samples{256, 512, 768, 1024, 1280, 1536, 1792, 2048}));
}

TEST(sound_files, TwelveBitsStandInSixteen)
{
    ExpectPlain(PlainAifc({.bits = 12}));
}

TEST(sound_files, TwentyFourBitsLoseTheirLowOnes)
{
    const Loaded loaded =
        Load(Form(FverChunk() + CommChunk({.frames = 2, .bits = 24}) +
                  SsndChunk(ByteString({1, 2, 3, 0xFF, 0xFE, 0xFF}))));

    EXPECT_EQ(loaded.sound.width, 4);
    EXPECT_EQ(SamplesOf(loaded.sound), (Samples{258, -2}));
}

TEST(sound_files, ARateOfZeroBecomesOne)
{
    Loaded loaded = Load(WithRate({0, 0, 0, 0, 0, 0, 0, 0, 0, 0}));

    EXPECT_EQ(loaded.sound.rate, 1);
    EXPECT_EQ(loaded.sound.frames, 4);
    UseInEveryWay(loaded.sound);
}

TEST(sound_files, ANegativeRateIsRefused)
{
    ExpectRefused(WithRate({0xC0, 0x0B, 0xFA, 0, 0, 0, 0, 0, 0, 0}));
}

TEST(sound_files, InfiniteAndUndefinedRatesBecomeNumbers)
{
    Loaded infinite = Load(WithRate({0x7F, 0xFF, 0x80, 0, 0, 0, 0, 0, 0, 0}));
    Loaded no_number = Load(WithRate({0x7F, 0xFF, 0xC0, 0, 0, 0, 0, 0, 0, 0}));

    EXPECT_EQ(infinite.sound.rate, 67108864);
    EXPECT_EQ(no_number.sound.rate, 67108864);
    UseInEveryWay(infinite.sound);
    UseInEveryWay(no_number.sound);
}

TEST(sound_files, AHugeRateBecomesANumber)
{
    Loaded loaded =
        Load(WithRate({0x40, 0x1D, 0xBE, 0xBC, 0x20, 0, 0, 0, 0, 0}));

    EXPECT_EQ(loaded.reports, "");
    EXPECT_EQ(loaded.sound.rate, 800000000);
    UseInEveryWay(loaded.sound);
}

TEST(sound_files, RatesBelowOneBecomeOne)
{
    Loaded half = Load(WithRate({0x3F, 0xFE, 0x80, 0, 0, 0, 0, 0, 0, 0}));
    Loaded tiny = Load(WithRate({0, 0, 0, 0, 0, 0, 0, 0, 0, 1}));

    EXPECT_EQ(half.sound.rate, 1);
    EXPECT_EQ(tiny.sound.rate, 1);
    UseInEveryWay(half.sound);
    UseInEveryWay(tiny.sound);
}

TEST(sound_files, AFileWithoutDescriptionOrSamplesIsRefused)
{
    ExpectRefused(Form(FverChunk() + SsndChunk(PlainData())));
    ExpectRefused(Form(FverChunk() + CommChunk({})));
}

TEST(sound_files, TheSecondOfTwoDescriptionsCounts)
{
    const Loaded loaded =
        Load(Form(FverChunk() + CommChunk({}) + CommChunk({.channels = 2}) +
                  SsndChunk(PlainData())));

    EXPECT_EQ(loaded.sound.channels, 2);
    EXPECT_EQ(loaded.sound.frames, 2);
    EXPECT_EQ(SamplesOf(loaded.sound), (Samples{258, 772, 1286, 1800}));
}

TEST(sound_files, SamplesMayStandBeforeTheirDescription)
{
    ExpectPlain(Form(FverChunk() + SsndChunk(PlainData()) + CommChunk({})));
}

TEST(sound_files, AnOffsetPastTheEndLeavesNoFrames)
{
    const Loaded loaded = Load(
        Form(FverChunk() + CommChunk({}) + SsndChunk(PlainData(), 0xFFFFFFF0)));

    EXPECT_EQ(loaded.reports, "");
    EXPECT_EQ(loaded.sound.frames, 0);
    EXPECT_EQ(loaded.sound.samples, nullptr);
}

TEST(sound_files, AnEndlessSizeOfTheSamplesIsNotBelieved)
{
    std::string file = PlainAifc();
    file.replace(file.find("SSND") + 4, 4, BigEndian32(0xFFFFFFFF));

    ExpectPlain(file);
}

TEST(sound_files, ADescriptionOfAnOddSizeIsRead)
{
    ExpectPlain(PlainAifc({.compression = std::string("NONE\0", 5)}));
    // Seventeen bytes cut the rate by one, which is zero anyway.
    const Comm comm;
    std::string chunk = CommChunk(comm).substr(0, 8 + 17) + '\0';
    chunk.replace(4, 4, BigEndian32(17));
    ExpectPlain(Form(FverChunk() + chunk + SsndChunk(PlainData())));
}

TEST(sound_files, AnUnknownCompressionIsRefused)
{
    ExpectRefused(PlainAifc({.compression = std::string("XXXX\0\0", 6)}));
}

TEST(sound_files, ANameOfTheCompressionLongerThanItsChunkIsCut)
{
    ExpectPlain(PlainAifc({.compression = "NONE\xFF" + std::string(1, '\0')}));
}

TEST(sound_files, AnOddChunkWithoutItsPadIsRefused)
{
    std::string odd = Chunk("ANNO", "abc");
    odd.pop_back();

    ExpectRefused(
        Form(FverChunk() + odd + CommChunk({}) + SsndChunk(PlainData())));
}

TEST(sound_files, AThousandEmptyAnnotationsAreSkipped)
{
    std::string chunks = FverChunk() + CommChunk({});
    for (int i = 0; i < 1000; ++i)
        chunks += Chunk("ANNO", "");

    ExpectPlain(Form(chunks + SsndChunk(PlainData())));
}

TEST(sound_files, LittleEndianSamplesAreTurnedRound)
{
    const Loaded loaded =
        Load(PlainAifc({.compression = std::string("sowt\0\0", 6)}));

    EXPECT_EQ(SamplesOf(loaded.sound), (Samples{513, 1027, 1541, 2055}));
}

TEST(sound_files, APacketOfCompressedSamplesIs64Frames)
{
    const Loaded loaded = Load(Form(
        FverChunk() +
        CommChunk({.frames = 1, .compression = std::string("ima4\0\0", 6)}) +
        SsndChunk(std::string(34, '\0'))));

    EXPECT_EQ(loaded.reports, "");
    EXPECT_EQ(loaded.sound.width, 2);
    EXPECT_EQ(loaded.sound.frames, 64);
    EXPECT_EQ(SamplesOf(loaded.sound).size(), 64u);
}

TEST(sound_files, ChannelLayoutsAndMarksAreSkipped)
{
    const std::string layout =
        Chunk("CHAN", BigEndian32(100 << 16 | 1) + std::string(8, '\0'));
    const std::string marks = Chunk("MARK", BigEndian16(0xFFFF));

    ExpectPlain(
        Form(FverChunk() + CommChunk({}) + layout + SsndChunk(PlainData())));
    ExpectPlain(
        Form(FverChunk() + CommChunk({}) + marks + SsndChunk(PlainData())));
}

TEST(sound_files, TheOlderFormatIsLoaded)
{
    ExpectPlain(
        Form(CommChunk({.compression = ""}) + SsndChunk(PlainData()), "AIFF"));
}

TEST(sound_files, TheVersionMayBeMissing)
{
    ExpectPlain(Form(CommChunk({}) + SsndChunk(PlainData())));
}

// --- other formats
// ---------------------------------------------------------------

std::string LittleEndian(std::uint32_t value, int bytes)
{
    std::string text;
    for (int i = 0; i < bytes; ++i)
        text += static_cast<char>(value >> 8 * i);
    return text;
}

std::string Wave(int kind, int channels, int bits, const std::string& data)
{
    const auto frame = static_cast<std::uint32_t>(channels * bits / 8);
    const std::string format =
        LittleEndian(static_cast<std::uint32_t>(kind), 2) +
        LittleEndian(static_cast<std::uint32_t>(channels), 2) +
        LittleEndian(22050, 4) + LittleEndian(22050 * frame, 4) +
        LittleEndian(frame, 2) +
        LittleEndian(static_cast<std::uint32_t>(bits), 2);
    const std::string chunks =
        "WAVEfmt " + LittleEndian(16, 4) + format + "data" +
        LittleEndian(static_cast<std::uint32_t>(data.size()), 4) + data;
    return "RIFF" + LittleEndian(static_cast<std::uint32_t>(chunks.size()), 4) +
           chunks;
}

std::string Floats(std::initializer_list<float> values)
{
    std::string text;
    for (float value : values) {
        std::uint32_t bits;
        std::memcpy(&bits, &value, sizeof bits);
        text += LittleEndian(bits, 4);
    }
    return text;
}

TEST(sound_files, FloatingSamplesAreScaledTruncatedAndClamped)
{
    const Loaded loaded = Load(
        Wave(3, 1, 32,
             Floats({0.5f, -0.5f, 1.0f, -1.0f, 7.0f, -7.0f, 1.9f / 32768,
                     -1.9f / 32768, std::numeric_limits<float>::quiet_NaN(),
                     std::numeric_limits<float>::infinity(),
                     -std::numeric_limits<float>::infinity()})));

    EXPECT_EQ(loaded.sound.width, 4);
    EXPECT_EQ(loaded.sound.rate, 22050);
    EXPECT_EQ(SamplesOf(loaded.sound),
              (Samples{16384, -16384, 32767, -32768, 32767, -32768, 1, -1, 0,
                       32767, -32768}));
}

TEST(sound_files, FloatingSamplesOfDoublePrecisionAreTakenLikeOthers)
{
    std::string data;
    for (double value : {0.5, 1.0, -7.0, 0.99999, -1.9 / 32768}) {
        std::uint64_t bits;
        std::memcpy(&bits, &value, sizeof bits);
        data += LittleEndian(static_cast<std::uint32_t>(bits), 4) +
                LittleEndian(static_cast<std::uint32_t>(bits >> 32), 4);
    }

    const Loaded loaded = Load(Wave(3, 1, 64, data));

    EXPECT_EQ(loaded.sound.width, 4);
    EXPECT_EQ(SamplesOf(loaded.sound),
              (Samples{16384, 32767, -32768, 32767, -1}));
}

TEST(sound_files, LongFloatingStereoSoundsAreReadWhole)
{
    std::string data;
    Samples expected;
    for (int i = 0; i < 30000; ++i) {
        data += Floats({static_cast<float>(i % 3000) / 32768});
        expected.push_back(static_cast<short>(i % 3000));
    }

    const Loaded loaded = Load(Wave(3, 2, 32, data));

    EXPECT_EQ(loaded.sound.frames, 15000);
    EXPECT_EQ(SamplesOf(loaded.sound), expected);
}

TEST(sound_files, UnsignedBytesAreCentredAndMoveUp)
{
    const Loaded loaded =
        Load(Wave(1, 1, 8, ByteString({0x80, 0, 0xFF, 0x81})));

    EXPECT_EQ(loaded.sound.width, 1);
    EXPECT_EQ(SamplesOf(loaded.sound), (Samples{0, -32768, 32512, 256}));
}

TEST(sound_files, WiderIntegersLoseTheirLowBits)
{
    const Loaded loaded = Load(
        Wave(1, 1, 32, ByteString({0, 0xFF, 2, 1, 0xFF, 0xFF, 0xFF, 0xFF})));

    EXPECT_EQ(loaded.sound.width, 4);
    EXPECT_EQ(SamplesOf(loaded.sound), (Samples{258, -1}));
}

TEST(sound_files, CompandedSamplesCountAsSixteenBits)
{
    const Loaded loaded = Load(Wave(7, 1, 8, ByteString({0xFF, 0, 0x80})));

    EXPECT_EQ(loaded.sound.width, 2);
    EXPECT_EQ(SamplesOf(loaded.sound), (Samples{0, -32124, 32124}));
}

TEST(sound_files, SamplesWithoutAHeaderAreKnownByTheirName)
{
    const Loaded loaded = Load(std::string(330, '\x55'), "a.gsm");

    EXPECT_EQ(loaded.reports, "");
    EXPECT_EQ(loaded.sound.rate, 8000);
    EXPECT_GT(loaded.sound.frames, 0);
}

// --- odd files, faults, names
// --------------------------------------------------------

TEST(sound_files, WhatIsNoSoundIsReported)
{
    ExpectRefused("");
    ExpectRefused("x");
    ExpectRefused(std::string(5000, 'x'));
    ExpectRefused(std::string(5000, '\0'));
}

TEST(sound_files, NamesArePrintedAsTheyStand)
{
    const ErrorTrap reports;

    const KvoSound percent("/nowhere/%s%n%d");
    const KvoSound null(static_cast<const char*>(nullptr));

    EXPECT_EQ(reports.Text(),
              "Error: Failed to open audio file [/nowhere/%s%n%d].\n"
              "Error: Failed to open audio file [].\n");
}

TEST(sound_files, DirectoriesDevicesAndPipesAreRefusedWithoutAWaitInAChild)
{
    const TempDir directory;
    const std::string fifo = directory.Path("fifo.gsm");
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    RunInAChild([&] {
        for (const std::string& path :
             {directory.Path(""), fifo, std::string("/dev/zero"),
              std::string("/dev/null")}) {
            const ErrorTrap reports;
            const KvoSound sound(path.c_str());
            EXPECT_EQ(sound.samples, nullptr);
            EXPECT_EQ(reports.Text(),
                      "Error: Failed to open audio file [" + path + "].\n");
        }
    });
}

TEST(sound_files, ShortReadsAndInterruptionsGiveTheSameSound)
{
    const TempDir directory;
    const std::string path = directory.Write("a", PlainAifc());
    FaultyFiles files;
    files.most_at_once = 1;
    files.interrupts = true;

    const KvoSound sound(path.c_str());

    EXPECT_EQ(SamplesOf(sound), (Samples{258, 772, 1286, 1800}));
    EXPECT_EQ(files.open_count, 0);
}

TEST(sound_files, AFaultAtAnyByteLeavesZerosOrNothing)
{
    const TempDir directory;
    const std::string file = PlainAifc();
    const std::string path = directory.Write("a", file);
    const Samples whole = {258, 772, 1286, 1800};
    for (std::size_t end = 0; end < file.size(); ++end) {
        FaultyFiles files;
        files.read_ends = end;
        const ErrorTrap reports;

        const KvoSound sound(path.c_str());

        const Samples samples = SamplesOf(sound);
        const std::size_t first_missing =
            end + 8 >= file.size() ? (end + 8 - file.size()) / 2 : 0;
        for (std::size_t i = 0; i < samples.size(); ++i)
            ASSERT_EQ(samples[i], i < first_missing ? whole[i] : 0) << end;
        ASSERT_TRUE(first_missing == 0 || samples.size() == 4) << end;
        ASSERT_EQ(files.open_count, 0);
    }
}

TEST(sound_files, FilesAreClosed)
{
    const TempDir directory;
    FaultyFiles files;
    for (const std::string& bytes :
         {PlainAifc(), PlainAifc({.channels = 3}), std::string("no sound")}) {
        const std::string path = directory.Write("a", bytes);
        const ErrorTrap reports;

        const KvoSound sound(path.c_str());

        EXPECT_EQ(files.open_count, 0);
    }
}

TEST(sound_files, LengthsThatNoFileCouldHoldLeaveNoFramesInAChild)
{
    // A FLAC file that claims some frames and holds none: the marker, then
    // one block that describes a mono sound of 16 bits at 8000 hertz. Of the
    // numbers, the last is the greatest; memory would do for the others.
    for (std::uint32_t claimed : {400000U, 100000000U, 0x7FFFFFFFU}) {
        const std::string file =
            "fLaC" +
            ByteString({0x80, 0, 0, 34, 0x10, 0, 0x10, 0, 0, 0, 0, 0, 0, 0,
                        0x01, 0xF4, 0x00, 0xF0}) +
            BigEndian32(claimed) + std::string(16, '\0');
        RunInAChild([&] {
            const Loaded loaded = Load(file, "a.flac");

            EXPECT_EQ(loaded.sound.frames, 0);
            EXPECT_EQ(loaded.sound.samples, nullptr);
            EXPECT_EQ(loaded.reports, "");
            EXPECT_EQ(loaded.sound.rate, 8000);
        });
    }
}

TEST(sound_files, AnyByteMayBeWrong)
{
    const std::string file = PlainAifc();
    const TempDir directory;
    for (std::size_t at = 0; at < file.size(); ++at)
        for (int byte : {0x00, 0x01, 0x7F, 0x80, 0xFF}) {
            std::string changed = file;
            changed[at] = static_cast<char>(byte);
            const std::string path = directory.Write("a", changed);
            const ErrorTrap reports;

            const KvoSound sound(path.c_str());

            ASSERT_LE(sound.frames, 8);
            ASSERT_TRUE(!sound.samples || sound.channels == 1 ||
                        sound.channels == 2);
        }
}

} // namespace
