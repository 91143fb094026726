#include "image/picture.h"

#include <sys/stat.h>

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "support/FaultyFiles.h"
#include "support/InAChild.h"
#include "support/TempDir.h"

namespace {

std::string Header(unsigned width, unsigned height, unsigned bits = 24)
{
    return Big16(width) + Big16(height) + Big16(5) + Big16(6) + Big16(bits);
}

/// Reads a pix file of these bytes in codec order.
std::optional<PixelList> Read(const std::string& bytes)
{
    TempDir directory;
    QuarnHeader header = {};
    ZtPixel* pixels = ReadQuarnPix(directory.Write("a", bytes).c_str(), header);
    return Taken(pixels, std::size_t{header.width} * header.height);
}

TEST(quarnimg, TheHeaderIsReadAsItStands)
{
    TempDir directory;
    std::string path = directory.Write("a", Header(2, 3));
    QuarnHeader header = {};

    auto pixels = Taken(ReadQuarnPix(path.c_str(), header), 6);

    EXPECT_EQ(header.width, 2);
    EXPECT_EQ(header.height, 3);
    EXPECT_EQ(header.x_offset, 5);
    EXPECT_EQ(header.y_offset, 6);
    EXPECT_EQ(header.bits_per_pixel, 24);
    EXPECT_EQ(pixels, PixelList(6, 0));
}

TEST(quarnimg, APacketIsACountThenBlueGreenRed)
{
    EXPECT_EQ(Read(Header(2, 1) + Bytes({2, 1, 2, 3})),
              PixelList(2, 0xFF010203));
}

TEST(quarnimg, RowsAreStoredTopRowFirst)
{
    EXPECT_EQ(Read(Header(1, 3) + Bytes({1, 0, 0, 1, 1, 0, 0, 2, 1, 0, 0, 3})),
              (PixelList{0xFF000003, 0xFF000002, 0xFF000001}));
}

TEST(quarnimg, RunsOfARowFollowOneAnother)
{
    EXPECT_EQ(Read(Header(3, 1) + Bytes({2, 0, 0, 1, 1, 0, 0, 2})),
              (PixelList{0xFF000001, 0xFF000001, 0xFF000002}));
}

TEST(quarnimg, ARunGoesOnOverTheEndOfItsRow)
{
    // Two runs of three into rows of four: the second ends two pixels into
    // the row above, which is the memory that follows; of a third the top row
    // has none.
    EXPECT_EQ(Read(Header(4, 2) + Bytes({4, 0, 0, 9}) +
                   Bytes({3, 0, 0, 1, 3, 0, 0, 2})),
              (PixelList{0xFF000001, 0xFF000001, 0xFF000001, 0xFF000002,
                         0xFF000002, 0xFF000002, 0xFF000009, 0xFF000009}));
}

TEST(quarnimg, ARunStepsDownOneRowOnly)
{
    EXPECT_EQ(Read(Header(1, 3) + Bytes({3, 0, 0, 1, 1, 0, 0, 2})),
              (PixelList{0, 0xFF000002, 0xFF000001}));
}

TEST(quarnimg, ACountOfZeroWritesNothing)
{
    EXPECT_EQ(Read(Header(2, 1) + Bytes({0, 9, 9, 9, 2, 1, 1, 1})),
              PixelList(2, 0xFF010101));
}

TEST(quarnimg, RowsThatTheFileDoesNotReachAreZero)
{
    EXPECT_EQ(Read(Header(1, 2) + Bytes({1, 0, 0, 1})),
              (PixelList{0, 0xFF000001}));
}

TEST(quarnimg, WhatFollowsTheLastRowIsNotRead)
{
    EXPECT_EQ(Read(Header(1, 1) + Bytes({1, 0, 0, 1, 7, 7})),
              PixelList(1, 0xFF000001));
}

TEST(quarnimg, SizesAndBitsOutOfRangeAreRefused)
{
    EXPECT_EQ(Read(Header(8193, 1)), std::nullopt);
    EXPECT_EQ(Read(Header(1, 8193)), std::nullopt);
    EXPECT_EQ(Read(Header(0, 1)), std::nullopt);
    EXPECT_EQ(Read(Header(1, 0)), std::nullopt);
    EXPECT_EQ(Read(Header(1, 1, 8)), std::nullopt);
    EXPECT_EQ(Read(Header(1, 1, 32)), std::nullopt);
    EXPECT_EQ(Read(Header(8192, 1)), PixelList(8192, 0));
    EXPECT_EQ(Read(Header(1, 8192)), PixelList(8192, 0));
}

TEST(quarnimg, ARefusedHeaderIsGivenAsItWasRead)
{
    TempDir directory;
    std::string path = directory.Write("a", Header(8193, 7, 8).substr(0, 9));
    QuarnHeader header = {1, 1, 1, 1, 1};

    EXPECT_EQ(ReadQuarnPix(path.c_str(), header), nullptr);

    EXPECT_EQ(header.width, 8193);
    EXPECT_EQ(header.height, 7);
    EXPECT_EQ(header.bits_per_pixel, 0);
}

TEST(quarnimg, WhatCannotBeOpenedIsNullAndLeavesTheHeader)
{
    TempDir directory;
    QuarnHeader header = {1, 2, 3, 4, 5};

    EXPECT_EQ(ReadQuarnPix(directory.Path("none").c_str(), header), nullptr);
    EXPECT_EQ(ReadQuarnPix(nullptr, header), nullptr);

    EXPECT_EQ(header.width, 1);
    EXPECT_EQ(header.bits_per_pixel, 5);
}

TEST(quarnimg, AShortHeaderIsRefused)
{
    for (std::size_t size = 0; size < 10; ++size)
        EXPECT_EQ(Read(Header(1, 1).substr(0, size)), std::nullopt) << size;
}

TEST(quarnimg, APacketThatIsCutIsRefused)
{
    std::string file = Header(2, 2) + Bytes({1, 2, 3, 4, 1, 2, 3, 4});
    for (std::size_t cut = 1; cut <= 3; ++cut)
        EXPECT_EQ(Read(file.substr(0, file.size() - cut)), std::nullopt);
    EXPECT_EQ(Read(file), (PixelList{0, 0, 0xFF020304, 0xFF020304}));
}

TEST(quarnimg, ObjectOrderIsTheReverseOfCodecOrder)
{
    TempDir directory;
    std::string path = directory.Write("a", Header(1, 1) + Bytes({1, 1, 2, 3}));
    QuarnHeader header;

    zt_image::Picture picture = zt_image::read_pix(
        path.c_str(), header, zt_image::ChannelOrder::Object);

    EXPECT_EQ(Taken(picture.pixels, 1), PixelList(1, 0x030201FF));
}

TEST(quarnimg, RandomFilesAgreeWithAPlainReader)
{
    std::mt19937 random(18);
    for (int i = 0; i < 1000; ++i) {
        std::string file = Header(static_cast<unsigned>(random() % 40 + 1),
                                  static_cast<unsigned>(random() % 9 + 1));
        for (std::size_t packets = random() % 60; packets; --packets)
            file += Bytes({static_cast<int>(random() % 25),
                           static_cast<int>(random() % 256),
                           static_cast<int>(random() % 256),
                           static_cast<int>(random() % 256)});
        file += Fill(random() % 8 == 0, 0);
        literal::Picture expected = literal::ReadPix(file);

        std::optional<PixelList> pixels = Read(file);

        ASSERT_EQ(pixels.has_value(), expected.read) << i;
        ASSERT_TRUE(!pixels || *pixels == expected.pixels) << i;
    }
}

TEST(quarnimg, FilesLargerThanOneReadAgreeWithAPlainReader)
{
    std::string file = Header(300, 300);
    for (int i = 0; i < 90000; ++i)
        file += Bytes({1, i & 0xFF, i >> 8 & 0xFF, i >> 16});

    EXPECT_EQ(Read(file), literal::ReadPix(file).pixels);
    EXPECT_EQ(Read(file.substr(0, file.size() - 2)), std::nullopt);
    EXPECT_EQ(Read(file.substr(0, 10 + 65536)),
              literal::ReadPix(file.substr(0, 10 + 65536)).pixels);
}

TEST(quarnimg, ShortReadsAndInterruptionsGiveTheSamePicture)
{
    std::string file =
        Header(3, 2) + Bytes({2, 1, 2, 3, 1, 4, 5, 6, 3, 7, 8, 9});
    FaultyFiles files;
    files.most_at_once = 1;
    files.interrupts = true;

    EXPECT_EQ(Read(file), literal::ReadPix(file).pixels);
}

TEST(quarnimg, AReadFaultIsAFileThatEndsThere)
{
    std::string file =
        Header(3, 2) + Bytes({2, 1, 2, 3, 1, 4, 5, 6, 3, 7, 8, 9});
    for (std::size_t end = 0; end <= file.size(); ++end) {
        FaultyFiles files;
        files.read_ends = end;

        ASSERT_EQ(Read(file).value_or(PixelList()),
                  literal::ReadPix(file.substr(0, end)).pixels)
            << end;
    }
}

TEST(quarnimg, ARunOfTheTopRowStaysInThePictureInAChild)
{
    std::string file = Header(1, 1) + Bytes({255, 1, 2, 3});
    RunInAChild([&] { EXPECT_EQ(Read(file), PixelList(1, 0xFF010203)); });
}

TEST(quarnimg, EmptyPacketsEndWithTheFileInAChild)
{
    std::string file = Header(2, 2) + Fill(4 * 65536, 0);
    RunInAChild([&] { EXPECT_EQ(Read(file), PixelList(4, 0)); });
}

TEST(quarnimg, AGiantHeaderAloneIsZerosOrNullInAChild)
{
    TempDir directory;
    std::string path = directory.Write("a", Header(8192, 8192));
    RunInAChild([&] {
        QuarnHeader header;
        ZtPixel* pixels = ReadQuarnPix(path.c_str(), header);
        for (std::size_t i = 0; pixels && i < 8192 * 8192; i += 4096)
            EXPECT_EQ(pixels[i], 0u);
        std::free(pixels);
    });
}

TEST(quarnimg, OverlongRunsAreClampedAtBothEndsInAChild)
{
    std::string file = Header(4, 2);
    for (int i = 0; i < 3; ++i)
        file += Bytes({3, i, 0, 0, 3, i, 1, 1});
    RunInAChild([&] { EXPECT_EQ(Read(file), literal::ReadPix(file).pixels); });
}

TEST(quarnimg, WhatIsNoRegularFileIsRefusedInAChild)
{
    TempDir directory;
    std::string fifo = directory.Path("fifo");
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    RunInAChild([&] {
        QuarnHeader header;
        for (const std::string& path :
             {directory.Path(""), fifo, std::string("/dev/zero")})
            EXPECT_EQ(ReadQuarnPix(path.c_str(), header), nullptr);
    });
}

} // namespace
