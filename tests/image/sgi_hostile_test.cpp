// Files that are wrong on purpose. Each is read in a child process of bounded
// memory and time, and gives what a plain reader gives that sees zeros beyond
// the end of the file and no pixels beyond the end of the picture.

#include <ZT/image_sgi.h>

#include <chrono>

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "support/InAChild.h"
#include "support/TempDir.h"

namespace {

void ExpectAsThePlainReader(const std::string& file)
{
    TempDir directory;
    std::string path = directory.Write("a", file);
    RunInAChild([&] {
        literal::Picture expected = literal::ReadSgi(file);

        ZtPixel* pixels = longimagedata(path.c_str());

        EXPECT_EQ(pixels != nullptr, expected.read);
        EXPECT_EQ(Taken(pixels, expected.pixels.size()).value_or(PixelList()),
                  expected.pixels);
    });
}

void ExpectRefused(const std::string& file)
{
    TempDir directory;
    std::string path = directory.Write("a", file);
    RunInAChild([&] { EXPECT_EQ(longimagedata(path.c_str()), nullptr); });
}

void ExpectPicture(const std::string& file, const PixelList& pixels)
{
    ASSERT_EQ(literal::ReadSgi(file).pixels, pixels);
    ExpectAsThePlainReader(file);
}

/// A 4 x 4 picture of three channels with these rows.
std::string FileOf(const SgiRows& rows)
{
    return SgiFile({}, rows);
}

std::string GoodFile()
{
    return FileOf({.rows = PlainRows({})});
}

const PixelList good_pixels(16, 0xFF424140);
const PixelList black_pixels(16, 0xFF000000);

TEST(sgi_hostile, AGoodFileIsReadInAChild)
{
    ExpectPicture(GoodFile(), good_pixels);
}

TEST(sgi_hostile, AnEmptyFileIsRefusedInAChild)
{
    ExpectRefused("");
}

TEST(sgi_hostile, AMagicNumberAloneIsRefusedInAChild)
{
    ExpectRefused(Bytes({0x01, 0xDA}));
}

TEST(sgi_hostile, AHeaderCutByOneByteIsABlackPictureInAChild)
{
    ExpectPicture(GoodFile().substr(0, 511), black_pixels);
}

TEST(sgi_hostile, AFileWithoutTablesIsABlackPictureInAChild)
{
    ExpectPicture(GoodFile().substr(0, 512), black_pixels);
}

TEST(sgi_hostile, AFileCutInItsTablesIsReadInAChild)
{
    ExpectAsThePlainReader(GoodFile().substr(0, 552));
}

TEST(sgi_hostile, AFileThatLacksItsLastBytesReadsZerosInAChild)
{
    std::string file = GoodFile();
    ExpectAsThePlainReader(file.substr(0, file.size() - 5));
}

TEST(sgi_hostile, OtherSampleSizesAreRefusedInAChild)
{
    for (unsigned bytes : {0u, 2u})
        ExpectRefused(
            SgiFile({.bytes_a_channel = bytes}, {.rows = PlainRows({})}));
}

TEST(sgi_hostile, AnUnknownStorageIsReadVerbatimInAChild)
{
    ExpectAsThePlainReader(SgiFile({.storage = 2}, {.rows = PlainRows({})}));
}

TEST(sgi_hostile, NoChannelsAreOpaqueBlackInAChild)
{
    ExpectPicture(SgiHeaderBytes({.channels = 0}), black_pixels);
}

TEST(sgi_hostile, MoreThanFourChannelsAreRefusedInAChild)
{
    ExpectRefused(
        SgiFile({.channels = 5}, {.rows = PlainRows({.channels = 5})}));
    ExpectRefused(SgiHeaderBytes({.width = 1, .height = 1, .channels = 65535}) +
                  Fill(64, 0));
}

TEST(sgi_hostile, NoColumnsOrNoRowsAreAPictureOfNothingInAChild)
{
    for (unsigned storage : {0u, 1u}) {
        ExpectPicture(
            SgiFile({.storage = storage, .width = 0}, {.rows = PlainRows({})}),
            {});
        ExpectPicture(SgiHeaderBytes({.storage = storage, .height = 0}), {});
    }
}

TEST(sgi_hostile, AGiantOfAFewBytesIsRefusedAtOnceInAChild)
{
    for (unsigned storage : {0u, 1u})
        for (unsigned channels : {1u, 4u}) {
            TempDir directory;
            std::string path =
                directory.Write("a", SgiHeaderBytes({.storage = storage,
                                                     .width = 65535,
                                                     .height = 65535,
                                                     .channels = channels}) +
                                         Fill(64, 0));
            auto body = [&path] {
                auto start = std::chrono::steady_clock::now();
                EXPECT_EQ(longimagedata(path.c_str()), nullptr);
                EXPECT_LT(std::chrono::steady_clock::now() - start,
                          std::chrono::milliseconds(10));
            };
            RunInAChild(body, {.memory_bytes = 1 << 20});
        }
}

TEST(sgi_hostile, LiteralsThatOverrunEveryRowStayInThePictureInAChild)
{
    ExpectAsThePlainReader(FileOf(
        {.rows = EqualRows({}, Bytes({0xFF}) + Fill(127, 0x41) + Bytes({0}))}));
}

TEST(sgi_hostile, RepeatsThatOverrunTheLastRowStayInThePictureInAChild)
{
    SgiRows rows = {.rows = PlainRows({})};
    rows.rows[11].clear();
    for (int i = 0; i < 40; ++i)
        rows.rows[11] += Bytes({0x7F, 0x41});
    rows.rows[11] += Bytes({0});
    ExpectPicture(FileOf(rows), [] {
        PixelList pixels = good_pixels;
        for (std::size_t i = 12; i < 16; ++i)
            pixels[i] = 0xFF414140;
        return pixels;
    }());
}

TEST(sgi_hostile, RowsWithoutAnEndStopAtTheirLengthInAChild)
{
    ExpectPicture(FileOf({.rows = EqualRows({}, Bytes({0x04, 0x09}))}),
                  PixelList(16, 0xFF090909));
}

TEST(sgi_hostile, LiteralsCutByTheirLengthGiveWhatIsThereInAChild)
{
    PixelList pixels(16, 0xFF000000);
    for (std::size_t i = 0; i < 16; i += 4)
        pixels[i] = 0xFF010101;
    ExpectPicture(FileOf({.rows = EqualRows({}, Bytes({0x84, 0x01}))}), pixels);
}

TEST(sgi_hostile, AGiantLengthOfTheLastRowEndsWithTheFileInAChild)
{
    ExpectPicture(
        FileOf({.rows = PlainRows({}), .lengths = {{11, 0x7FFFFFFF}}}),
        good_pixels);
}

TEST(sgi_hostile, GiantLengthsOfAllRowsAreNoReasonToEndInAChild)
{
    SgiRows rows = {.rows = PlainRows({})};
    for (std::size_t i = 0; i < 12; ++i)
        rows.lengths.push_back({i, 0xFFFFFFFF});
    ExpectPicture(FileOf(rows), good_pixels);
}

/// Rows whose start table stands the wrong way round.
SgiRows Backwards(std::uint32_t first_length)
{
    SgiRows rows = {.rows = PlainRows({}), .lengths = {{0, first_length}}};
    std::uint32_t start = 512 + 8 * 12;
    for (std::size_t i = 0; i < 12; ++i, start += 3)
        rows.starts.push_back({11 - i, start});
    return rows;
}

TEST(sgi_hostile, AnOverlongRowOutOfOrderEndsTheProcessSilently)
{
    TempDir directory;
    std::string path =
        directory.Write("a", FileOf(Backwards(15)) + Fill(64, 0));

    EXPECT_EXIT(longimagedata(path.c_str()), testing::ExitedWithCode(1), "^$");
}

TEST(sgi_hostile, TheLongestRowAllowedOutOfOrderIsReadInAChild)
{
    ExpectAsThePlainReader(FileOf(Backwards(14)) + Fill(64, 0));
}

TEST(sgi_hostile, AnOverlongRowInOrderIsReadInAChild)
{
    SgiRows rows = {.rows = PlainRows({})};
    rows.rows[5].clear();
    for (int i = 0; i < 7; ++i)
        rows.rows[5] += Bytes({0x01, 0x05});
    rows.rows[5] += Bytes({0});
    ASSERT_EQ(rows.rows[5].size(), 15u);
    ExpectAsThePlainReader(FileOf(rows));
}

TEST(sgi_hostile, StartsThatAreNonsenseReadZerosOrTheHeaderInAChild)
{
    for (std::uint32_t start : {0xFFFFFFFFu, 0u, 0x7FFFFFFFu}) {
        SgiRows rows = {.rows = PlainRows({})};
        for (std::size_t i = 0; i < 12; ++i)
            rows.starts.push_back({i, start});
        ExpectAsThePlainReader(FileOf(rows));
    }
}

TEST(sgi_hostile, ShortRowsAndNoRowsLeaveTheRestZeroInAChild)
{
    ExpectAsThePlainReader(
        FileOf({.rows = EqualRows({}, Bytes({0x02, 0x07, 0x00}))}));
    ExpectPicture(FileOf({.rows = EqualRows({}, "")}), black_pixels);
}

TEST(sgi_hostile, ShortVerbatimFilesReadZerosInAChild)
{
    std::string file = SgiHeaderBytes({.storage = 0}) + Fill(10, 0x33);
    PixelList pixels(16, 0xFF000000);
    for (std::size_t i = 0; i < 10; ++i)
        pixels[i] = 0xFF000033;
    ExpectPicture(file, pixels);
}

TEST(sgi_hostile, DimensionsAndColorMapAreNotExaminedInAChild)
{
    ExpectPicture(SgiFile({.dimensions = 1}, {.rows = PlainRows({})}),
                  good_pixels);
    ExpectPicture(SgiFile({.dimensions = 9}, {.rows = PlainRows({})}),
                  good_pixels);
    ExpectPicture(SgiFile({.color_map = 3}, {.rows = PlainRows({})}),
                  good_pixels);
}

TEST(sgi_hostile, TheOtherByteOrderIsRefusedInAChild)
{
    ExpectRefused(SgiFile({.magic = 0xDA01}, {.rows = PlainRows({})}));
}

TEST(sgi_hostile, OneAndTwoChannelsAreGreyInAChild)
{
    for (unsigned channels : {1u, 2u}) {
        SgiFields fields = {.channels = channels};
        ExpectPicture(SgiFile(fields, {.rows = PlainRows(fields)}),
                      PixelList(16, 0xFF404040));
    }
}

// Starts that jump about must not make each row cost a whole read of the file.
TEST(sgi_hostile, AMillionBytesReadInTheWorstOrderTakeNoTimeInAChild)
{
    SgiFields fields = {.width = 1, .height = 65535, .channels = 4};
    std::string row = Bytes({1, 0x77, 0});
    std::string tables;
    for (std::uint32_t i = 0; i < 65535 * 4; ++i) {
        std::uint32_t slot = i % 2 ? i : 65535 * 4 - 1 - i;
        tables += Big32(512 + 8 * 65535 * 4 + slot * 3);
    }
    for (std::uint32_t i = 0; i < 65535 * 4; ++i)
        tables += Big32(3);
    std::string rows;
    for (int i = 0; i < 65535 * 4; ++i)
        rows += row;
    TempDir directory;
    std::string path =
        directory.Write("a", SgiHeaderBytes(fields) + tables + rows);

    RunInAChild([&] {
        EXPECT_EQ(Taken(longimagedata(path.c_str()), 65535),
                  PixelList(65535, 0x77777777));
    });
}

TEST(sgi_hostile, EveryPrefixOfAFileIsReadInAChild)
{
    std::string file = GoodFile();
    TempDir directory;
    for (std::size_t size = 0; size <= file.size(); ++size)
        directory.Write(std::to_string(size), file.substr(0, size));

    RunInAChild([&] {
        for (std::size_t size = 0; size <= file.size(); ++size) {
            std::string path = directory.Path(std::to_string(size));
            literal::Picture expected = literal::ReadSgi(file.substr(0, size));
            EXPECT_EQ(Taken(longimagedata(path.c_str()), expected.pixels.size())
                          .value_or(PixelList()),
                      expected.pixels)
                << size;
        }
    });
}

} // namespace
