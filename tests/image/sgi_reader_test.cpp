#include "image/picture.h"

#include <cstring>

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "platform/x86/pixel_lanes_avx2.h"
#include "support/FaultyFiles.h"
#include "support/TempDir.h"

namespace {

using zt_image::ChannelOrder;

/// Reads the file at `path` in codec order; nothing when it is refused.
std::optional<PixelList> ReadFile(const std::string& path)
{
    zt_image::Picture picture =
        zt_image::read_sgi(path.c_str(), ChannelOrder::Codec);
    return Taken(picture.pixels, static_cast<std::size_t>(picture.width) *
                                     static_cast<std::size_t>(picture.height));
}

/// Reads a file of these bytes.
std::optional<PixelList> Read(const std::string& bytes)
{
    TempDir directory;
    return ReadFile(directory.Write("a", bytes));
}

TEST(sgi_reader, ThreeChannelsGetAlpha255)
{
    SgiFields fields = {.width = 2, .height = 1};

    auto pixels = Read(SgiFile(
        fields, {.rows = {Bytes({0x82, 0x11, 0x12, 0}), Bytes({2, 0x22, 0}),
                          Bytes({0x82, 0x31, 0x32, 0})}}));

    EXPECT_EQ(pixels, (PixelList{0xFF312211, 0xFF322212}));
}

TEST(sgi_reader, FourChannelsAreReadAsTheyStand)
{
    SgiFields fields = {.width = 1, .height = 1, .channels = 4};

    auto pixels = Read(
        SgiFile(fields, {.rows = {Bytes({1, 0x11, 0}), Bytes({1, 0x22, 0}),
                                  Bytes({1, 0x33, 0}), Bytes({1, 0x44, 0})}}));

    EXPECT_EQ(pixels, (PixelList{0x44332211}));
}

TEST(sgi_reader, OneChannelIsOpaqueGrey)
{
    SgiFields fields = {
        .dimensions = 2, .width = 2, .height = 1, .channels = 1};

    auto pixels =
        Read(SgiFile(fields, {.rows = {Bytes({0x82, 0x01, 0xFE, 0})}}));

    EXPECT_EQ(pixels, (PixelList{0xFF010101, 0xFFFEFEFE}));
}

TEST(sgi_reader, TheSecondOfTwoChannelsIsDropped)
{
    SgiFields fields = {.width = 1, .height = 1, .channels = 2};

    auto pixels = Read(
        SgiFile(fields, {.rows = {Bytes({1, 0x55, 0}), Bytes({1, 0x77, 0})}}));

    EXPECT_EQ(pixels, (PixelList{0xFF555555}));
}

TEST(sgi_reader, NoChannelAtAllIsOpaqueBlack)
{
    for (unsigned storage : {0u, 1u})
        EXPECT_EQ(
            Read(SgiHeaderBytes(
                {.storage = storage, .width = 2, .height = 1, .channels = 0})),
            (PixelList{0xFF000000, 0xFF000000}));
}

TEST(sgi_reader, RowsStandBottomRowFirstAsInTheFile)
{
    SgiFields fields = {.width = 1, .height = 2, .channels = 1};

    auto pixels = Read(
        SgiFile(fields, {.rows = {Bytes({1, 0x0A, 0}), Bytes({1, 0x0B, 0})}}));

    EXPECT_EQ(pixels, (PixelList{0xFF0A0A0A, 0xFF0B0B0B}));
}

TEST(sgi_reader, VerbatimPlanesFollowOneAnother)
{
    SgiFields fields = {.storage = 0, .width = 2, .height = 2};

    auto pixels = Read(SgiHeaderBytes(fields) + Bytes({1, 2, 3, 4}) +
                       Bytes({5, 6, 7, 8}) + Bytes({9, 10, 11, 12}));

    EXPECT_EQ(pixels,
              (PixelList{0xFF090501, 0xFF0A0602, 0xFF0B0703, 0xFF0C0804}));
}

TEST(sgi_reader, VerbatimGreyDropsItsSecondPlane)
{
    SgiFields fields = {.storage = 0, .width = 2, .height = 1, .channels = 2};

    auto pixels = Read(SgiHeaderBytes(fields) + Bytes({1, 2, 3, 4}));

    EXPECT_EQ(pixels, (PixelList{0xFF010101, 0xFF020202}));
}

TEST(sgi_reader, ObjectOrderIsTheReverseOfCodecOrder)
{
    TempDir directory;
    SgiFields fields = {.width = 1, .height = 1, .channels = 4};
    std::string path = directory.Write(
        "a",
        SgiFile(fields, {.rows = {Bytes({1, 0x11, 0}), Bytes({1, 0x22, 0}),
                                  Bytes({1, 0x33, 0}), Bytes({1, 0x44, 0})}}));

    zt_image::Picture picture =
        zt_image::read_sgi(path.c_str(), ChannelOrder::Object);

    EXPECT_EQ(Taken(picture.pixels, 1), (PixelList{0x11223344}));
}

TEST(sgi_reader, FiveWordsFollowThePixels)
{
    TempDir directory;
    SgiFields fields = {.width = 4, .height = 3, .channels = 1};
    std::string path =
        directory.Write("a", SgiFile(fields, {.rows = PlainRows(fields)}));

    ZtPixel* pixels = longimagedata(path.c_str());

    EXPECT_EQ(Taken(pixels, 17).value_or(PixelList(17)),
              (PixelList{0xFF404040, 0xFF404040, 0xFF404040, 0xFF404040,
                         0xFF404040, 0xFF404040, 0xFF404040, 0xFF404040,
                         0xFF404040, 0xFF404040, 0xFF404040, 0xFF404040,
                         0x12345678, 0x59493333, 0x69434222, 4, 3}));
}

TEST(sgi_reader, WhatCannotBeOpenedOrIsNoImageIsNull)
{
    TempDir directory;

    EXPECT_EQ(longimagedata(directory.Path("none").c_str()), nullptr);
    EXPECT_EQ(longimagedata(nullptr), nullptr);
    EXPECT_EQ(Read(SgiHeaderBytes({.magic = 0x01DB})), std::nullopt);
    EXPECT_EQ(Read(SgiHeaderBytes({.bytes_a_channel = 2})), std::nullopt);
    EXPECT_EQ(Read(SgiHeaderBytes({.bytes_a_channel = 0})), std::nullopt);
    EXPECT_EQ(Read(SgiHeaderBytes({.channels = 5})), std::nullopt);
}

TEST(sgi_reader, RowsMayLieChannelByChannel)
{
    SgiFields fields = {.width = 4, .height = 4};

    auto pixels =
        Read(SgiFile(fields, {.rows = PlainRows(fields), .by_channel = true}));

    EXPECT_EQ(pixels, PixelList(16, 0xFF424140));
}

TEST(sgi_reader, RowsMayShareBytes)
{
    SgiFields fields = {.width = 2, .height = 2, .channels = 1};

    auto pixels = Read(SgiFile(fields, {.rows = {Bytes({2, 9, 0}), ""},
                                        .lengths = {{1, 3}},
                                        .starts = {{1, 512 + 16}}}));

    EXPECT_EQ(pixels, PixelList(4, 0xFF090909));
}

// A width that is 4 allows 14 bytes a row.
SgiRows RowsWithAFirstOneOf(std::size_t bytes, const SgiFields& fields)
{
    SgiRows rows = {.rows = PlainRows(fields), .by_channel = true};
    rows.rows[0] += Fill(bytes - rows.rows[0].size(), 0);
    return rows;
}

TEST(sgi_reader, OnlyRowsOutOfOrderHaveABound)
{
    SgiFields fields;
    SgiRows longest = RowsWithAFirstOneOf(14, fields);
    SgiRows longer = RowsWithAFirstOneOf(15, fields);

    EXPECT_EQ(Read(SgiFile(fields, longest)), PixelList(16, 0xFF424140));
    EXPECT_EXIT(Read(SgiFile(fields, longer)), testing::ExitedWithCode(1),
                "^$");

    longer.by_channel = false;
    EXPECT_EQ(Read(SgiFile(fields, longer)), PixelList(16, 0xFF424140));
}

// Rows that start where the one before does are not out of order.
TEST(sgi_reader, RowsThatShareTheirStartHaveNoBound)
{
    SgiFields fields = {.width = 2, .height = 2, .channels = 1};
    const std::string row = Bytes({2, 9, 0});

    auto pixels = Read(SgiFile(fields, {.rows = {row, ""},
                                        .lengths = {{0, 500}, {1, 500}},
                                        .starts = {{1, 512 + 16}}}));

    EXPECT_EQ(pixels, PixelList(4, 0xFF090909));
}

TEST(sgi_reader, TheBoundHoldsForAChannelThatIsDroppedToo)
{
    SgiFields fields = {.width = 4, .height = 4, .channels = 2};
    SgiRows rows = {.rows = PlainRows(fields), .by_channel = true};
    rows.lengths = {{7, 14}};
    EXPECT_EQ(Read(SgiFile(fields, rows)), PixelList(16, 0xFF404040));

    rows.lengths = {{7, 15}};

    EXPECT_EXIT(Read(SgiFile(fields, rows)), testing::ExitedWithCode(1), "^$");
}

TEST(sgi_reader, AnOverlongRowIsAFailureWhenItsHandlerReturns)
{
    ZtSetOverlongRowHandler([] {});
    auto pixels = Read(SgiFile({}, RowsWithAFirstOneOf(15, {})));
    ZtSetOverlongRowHandler(nullptr);

    EXPECT_EQ(pixels, std::nullopt);
}

TEST(sgi_reader, ARowThatIsTooLongRunsOnIntoTheNext)
{
    SgiFields fields = {.width = 2, .height = 3, .channels = 1};

    auto pixels =
        Read(SgiFile(fields, {.rows = {Bytes({4, 0x0A, 0}), Bytes({1, 0x0B, 0}),
                                       Bytes({0x81, 0x0C, 0})}}));

    EXPECT_EQ(pixels, (PixelList{0xFF0A0A0A, 0xFF0A0A0A, 0xFF0B0B0B, 0xFF0A0A0A,
                                 0xFF0C0C0C, 0xFF000000}));
}

TEST(sgi_reader, ARowThatIsTooLongRunsOnInThreeChannelsToo)
{
    SgiFields fields = {.width = 2, .height = 2};
    SgiRows rows = {.rows = EqualRows(fields, Bytes({1, 7, 0}))};
    rows.rows[2] = Bytes({3, 9, 0}); // The first row of green.

    auto pixels = Read(SgiFile(fields, rows));

    EXPECT_EQ(pixels,
              (PixelList{0xFF070907, 0xFF000900, 0xFF070707, 0xFF000000}));
}

TEST(sgi_reader, RandomFilesAgreeWithAPlainReader)
{
    std::mt19937 random(2);
    for (int i = 0; i < 300; ++i) {
        int width = static_cast<int>(random() % 90 + 1);
        int height = static_cast<int>(random() % 12 + 1);
        int channels = static_cast<int>(random() % 4 + 1);
        PixelList pixels =
            RandomPicture(random, width, height, TextureNumber(i));
        std::string file = literal::WriteSgi(pixels, width, height, channels);

        ASSERT_EQ(Read(file), literal::ReadSgi(file).pixels) << i;
    }
}

/// Makes the rows of a picture with its bytes packed, some without the closing
/// zero and some with junk behind them, which their lengths leave out.
SgiRows PackedRows(std::mt19937& random, const SgiFields& fields,
                   const PixelList& pixels)
{
    SgiRows packed;
    for (unsigned channel = 0; channel < fields.channels; ++channel)
        for (unsigned y = 0; y < fields.height; ++y) {
            std::string values;
            for (unsigned x = 0; x < fields.width; ++x)
                values += static_cast<char>(pixels[y * fields.width + x] >>
                                            8 * channel);
            std::string row = literal::CompressRow(values);
            if (random() % 4 == 0)
                row.pop_back();
            packed.lengths.emplace_back(packed.rows.size(), row.size());
            if (random() % 8 == 0)
                row += Fill(random() % 3000, 0x7F);
            packed.rows.push_back(row);
        }
    return packed;
}

TEST(sgi_reader, WideRowsAgreeWithAPlainReaderOnAllLanes)
{
    using zt_platform::PixelLanes;
    std::mt19937 random(6);
    for (int i = 0; i < 200; ++i) {
        SgiFields fields = {.width = static_cast<unsigned>(random() % 1500 + 1),
                            .height = static_cast<unsigned>(random() % 9 + 1),
                            .channels = static_cast<unsigned>(i % 4 + 1)};
        PixelList pixels = RandomPicture(random, static_cast<int>(fields.width),
                                         static_cast<int>(fields.height),
                                         TextureNumber(i / 4));
        SgiRows rows = PackedRows(random, fields, pixels);
        rows.by_channel = random() % 2 == 0;
        std::string file = SgiFile(fields, rows);
        PixelList expected = literal::ReadSgi(file).pixels;

        for (const PixelLanes* lanes :
             {&PixelLanes::plain(), zt_platform::avx2_pixel_lanes()}) {
            PixelLanes::install(lanes);
            ASSERT_EQ(Read(file), expected) << i;
        }
        PixelLanes::install(nullptr);
    }
}

TEST(sgi_reader, RandomPacketsAgreeWithAPlainReader)
{
    ZtSetOverlongRowHandler([] {});
    std::mt19937 random(3);
    TempDir directory;
    auto number = [&random](unsigned below) {
        return static_cast<unsigned>(random() % below);
    };
    for (int i = 0; i < 2000; ++i) {
        SgiFields fields = {.width = number(40) + 1,
                            .height = number(6) + 1,
                            .channels = number(5)};
        SgiRows rows = {.rows = EqualRows(fields, ""),
                        .by_channel = number(2) != 0};
        for (std::string& row : rows.rows)
            for (unsigned length = number(14); row.size() < length;)
                row += static_cast<char>(number(3) ? number(40) : number(256));
        if (number(3) == 0 && !rows.rows.empty())
            rows.starts = {
                {number(static_cast<unsigned>(rows.rows.size())), number(900)}};
        std::string file = SgiFile(fields, rows);
        file.resize(file.size() - std::min<std::size_t>(number(30), 20));
        literal::Picture expected = literal::ReadSgi(file);

        std::optional<PixelList> pixels =
            ReadFile(directory.Write(std::to_string(i), file));

        ASSERT_EQ(pixels.has_value(), expected.read) << i;
        ASSERT_TRUE(!pixels || *pixels == expected.pixels) << i;
    }
    ZtSetOverlongRowHandler(nullptr);
}

TEST(sgi_reader, APhotoSizedPictureIsReadThroughSeveralWindows)
{
    std::mt19937 random(4);
    PixelList pixels = RandomPicture(random, 700, 500, Texture::Noise);
    for (int channels : {1, 3, 4}) {
        std::string file = literal::WriteSgi(pixels, 700, 500, channels);

        ASSERT_EQ(Read(file), literal::ReadSgi(file).pixels);
    }
}

TEST(sgi_reader, AVerbatimPhotoIsReadThroughSeveralWindows)
{
    std::mt19937 random(5);
    for (unsigned channels : {1u, 2u, 3u, 4u}) {
        std::string file = SgiHeaderBytes(
            {.storage = 0, .width = 640, .height = 500, .channels = channels});
        for (unsigned i = 0; i < 640 * 500 * channels; ++i)
            file += static_cast<char>(random());

        ASSERT_EQ(Read(file), literal::ReadSgi(file).pixels);
    }
}

TEST(sgi_reader, AnyShortReadsAndInterruptionsGiveTheSamePicture)
{
    std::string run_length = SgiFile({}, {.rows = PlainRows({})});
    std::string verbatim =
        SgiHeaderBytes({.storage = 0}) + "0123456789ABCDEF0123456789ABCDEF";
    FaultyFiles files;
    files.most_at_once = 1;
    files.interrupts = true;

    for (const std::string& file : {run_length, verbatim})
        EXPECT_EQ(Read(file), literal::ReadSgi(file).pixels);
}

TEST(sgi_reader, AReadFaultIsAFileThatEndsThere)
{
    std::string run_length = SgiFile({}, {.rows = PlainRows({})});
    std::string verbatim =
        SgiHeaderBytes({.storage = 0}) + "0123456789ABCDEF0123456789ABCDEF";
    TempDir directory;
    for (const std::string& file : {run_length, verbatim}) {
        std::string path = directory.Write("a", file);
        for (std::size_t end = 0; end <= file.size(); ++end) {
            FaultyFiles files;
            files.read_ends = end;

            ASSERT_EQ(ReadFile(path).value_or(PixelList()),
                      literal::ReadSgi(file.substr(0, end)).pixels)
                << end;
        }
    }
}

TEST(sgi_reader, AFileThatIsNotOpenedForLackOfHandlesIsNull)
{
    TempDir directory;
    std::string path =
        directory.Write("a", SgiFile({}, {.rows = PlainRows({})}));
    FaultyFiles files;
    files.opens_fail = true;

    EXPECT_EQ(longimagedata(path.c_str()), nullptr);
}

TEST(sgi_reader, ADirectoryIsNoPicture)
{
    TempDir directory;

    EXPECT_EQ(longimagedata(directory.Path("").c_str()), nullptr);
}

} // namespace
