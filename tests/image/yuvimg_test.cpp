#include "image/picture.h"

#include <sys/stat.h>

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "platform/video_lanes.h"
#include "support/CapturedStderr.h"
#include "support/FaultyFiles.h"
#include "support/InAChild.h"
#include "support/TempDir.h"
#include "support/ThrowingStderr.h"

namespace {

using zt_platform::VideoLanes;

constexpr std::size_t frame_pixels = 720 * 486;
constexpr std::size_t frame_bytes = 699840;
constexpr ZtPixel dark_green = 0x00009A00; ///< What zero bytes decode to.

std::optional<PixelList> Read(const std::string& bytes)
{
    TempDir directory;
    return Taken(longimageyuvdata(directory.Write("a", bytes).c_str()),
                 frame_pixels);
}

struct Color
{
    int red = -1;
    int green = -1;
    int blue = -1;

    bool operator==(const Color&) const = default;
    friend std::ostream& operator<<(std::ostream& out, const Color& color)
    {
        return out << color.red << "," << color.green << "," << color.blue;
    }
};

Color Decoded(int luma, int chroma1, int chroma2)
{
    Color color;
    decode_yuv(color.red, color.green, color.blue, luma, chroma1, chroma2);
    return color;
}

TEST(decode_yuv, GreyIsLumaAlone)
{
    EXPECT_EQ(Decoded(100, 0, 0), (Color{7631000, 7631000, 7631000}));
}

TEST(decode_yuv, ChromaWeighsAsItShould)
{
    EXPECT_EQ(Decoded(100, 10, 20),
              (Color{7631000 + 104635 * 20, 7631000 - 25690 * 10 - 53294 * 20,
                     7631000 + 132278 * 10}));
}

TEST(decode_yuv, ResultsAreClampedAtBothEnds)
{
    // 219 * 76310 is below the upper end by 65326, 220 above it.
    EXPECT_EQ(Decoded(219, 0, 0).red, 219 * 76310);
    EXPECT_EQ(Decoded(220, 0, 0), (Color{0xFFFFFF, 0xFFFFFF, 0xFFFFFF}));
    EXPECT_EQ(Decoded(1, 0, 0).red, 76310);
    EXPECT_EQ(Decoded(0, 0, 0), (Color{0, 0, 0}));
    EXPECT_EQ(Decoded(0, -128, -128).red, 0);
    EXPECT_EQ(Decoded(235, 127, 127).blue, 0xFFFFFF);
}

TEST(decode_yuv, ThroughPointersItIsTheSame)
{
    Color color;

    decode_yuv(&color.red, &color.green, &color.blue, 50, -3, 4);

    EXPECT_EQ(color, Decoded(50, -3, 4));
}

TEST(decode_yuv, SamplesThatNoVideoHoldsWrapModulo32Bits)
{
    EXPECT_EQ(Decoded(1 << 30, 0, 0).red, 0); // 2^30 * 76310 is 0x80000000.
    EXPECT_EQ(Decoded(INT_MIN, INT_MIN, INT_MIN).blue, 0);
}

TEST(yuvimg, TheTopLineOfTheFileIsTheLastRow)
{
    std::string frame = Fill(frame_bytes, 0x80);
    frame.replace(0, 4, Bytes({128, 16 + 100, 128, 16 + 50}));

    auto pixels = Read(frame);

    ASSERT_TRUE(pixels);
    EXPECT_EQ((*pixels)[frame_pixels - 720], 0x00747474u);
    EXPECT_EQ((*pixels)[frame_pixels - 719], 0x003A3A3Au);
    EXPECT_EQ((*pixels)[0], 0x00828282u);
}

TEST(yuvimg, AGroupIsFirstChromaLumaSecondChromaLuma)
{
    auto pixels = Read(Bytes({90, 126, 240, 17}) + Fill(frame_bytes - 4, 0));

    Color first = Decoded(110, -38, 112);
    Color second = Decoded(1, -38, 112);
    ASSERT_TRUE(pixels);
    EXPECT_EQ((*pixels)[frame_pixels - 720],
              static_cast<ZtPixel>((first.red >> 16) |
                                   (first.green >> 16) << 8 |
                                   (first.blue >> 16) << 16));
    EXPECT_EQ((*pixels)[frame_pixels - 719],
              static_cast<ZtPixel>((second.red >> 16) |
                                   (second.green >> 16) << 8 |
                                   (second.blue >> 16) << 16));
}

TEST(yuvimg, LumaBelowItsOffsetCountsAsTheOffset)
{
    auto below = Read(Bytes({128, 3, 128, 15}));
    auto at_it = Read(Bytes({128, 16, 128, 16}));

    EXPECT_EQ(below, at_it);
}

TEST(yuvimg, RandomFramesAgreeWithAPlainReader)
{
    std::mt19937 random(17);
    for (int i = 0; i < 3; ++i) {
        std::string frame;
        while (frame.size() < frame_bytes)
            frame += static_cast<char>(random());

        ASSERT_EQ(Read(frame), literal::ReadYuv(frame).pixels);
    }
}

/// All pairs of chromas, each group with the lumas that `luma` gives for it.
template <typename Luma>
std::string FrameOfAllChromas(Luma luma)
{
    std::string frame;
    for (int i = 0; frame.size() < frame_bytes; ++i)
        frame += Bytes({i & 0xFF, luma(2 * i), i >> 8 & 0xFF, luma(2 * i + 1)});
    return frame;
}

TEST(yuvimg, AllSamplesAgreeWithAPlainReader)
{
    std::mt19937 random(18);
    const std::string frames[] = {
        FrameOfAllChromas([](int i) { return i & 0x20000 ? 235 : 16; }),
        FrameOfAllChromas([](int i) { return i & 0x20000 ? 60 : 180; }),
        FrameOfAllChromas([&](int i) { return (i + (i >> 9)) & 0xFF; }),
        FrameOfAllChromas(
            [&](int) { return static_cast<int>(random() & 0xFF); })};
    for (const std::string& frame : frames) {
        const PixelList expected = literal::ReadYuv(frame).pixels;

        VideoLanes::install(&VideoLanes::plain());
        EXPECT_EQ(Read(frame), expected);
        VideoLanes::install(nullptr);
        EXPECT_EQ(Read(frame), expected);
    }
}

TEST(yuvimg, FlatFramesAreClampedExactly)
{
    for (const std::string& group :
         {Bytes({0, 0, 0, 0}), Bytes({255, 255, 255, 255}),
          Bytes({128, 128, 128, 128}), Bytes({255, 0, 255, 0}),
          Bytes({0, 255, 0, 255})}) {
        std::string frame;
        while (frame.size() < frame_bytes)
            frame += group;

        ASSERT_EQ(Read(frame), literal::ReadYuv(frame).pixels);
    }
}

TEST(yuvimg, BytesThatAShortFrameLacksAreZero)
{
    EXPECT_EQ(Read(""), PixelList(frame_pixels, dark_green));
    for (std::size_t size : {std::size_t{1}, frame_bytes - 1}) {
        std::string frame = Fill(size, 0x90);
        EXPECT_EQ(Read(frame), literal::ReadYuv(frame).pixels) << size;
    }
}

TEST(yuvimg, AFrameIsAlwaysOfOneSizeWhateverTheFiles)
{
    std::string frame = Fill(frame_bytes, 0x44);

    EXPECT_EQ(Read(frame + Fill(1000, 0xFF)), Read(frame));
}

TEST(yuvimg, ObjectOrderIsTheReverseOfCodecOrder)
{
    TempDir directory;
    std::string path = directory.Write("a", Fill(frame_bytes, 0x55));
    zt_image::Picture picture =
        zt_image::read_yuv(path.c_str(), zt_image::ChannelOrder::Object);

    EXPECT_EQ(picture.width, 720);
    EXPECT_EQ(picture.height, 486);
    EXPECT_EQ(
        Taken(picture.pixels, frame_pixels),
        literal::Reversed(literal::ReadYuv(Fill(frame_bytes, 0x55)).pixels));
}

TEST(yuvimg, AFrameThatCannotBeOpenedIsSaidAndAllZeros)
{
    TempDir directory;
    std::string path = directory.Path("none");
    CapturedStderr printed;

    auto pixels = Taken(longimageyuvdata(path.c_str()), frame_pixels);

    EXPECT_EQ(printed.Text(), "Couldn't open yuv file [" + path + "]\n");
    EXPECT_EQ(pixels, PixelList(frame_pixels, 0));
}

TEST(yuvimg, NothingThrowsWhenStandardErrorDoes)
{
    const ThrowingStderr no_output;
    ZtPixel* pixels = nullptr;

    EXPECT_NO_THROW(pixels = longimageyuvdata(nullptr));

    EXPECT_EQ(Taken(pixels, frame_pixels), PixelList(frame_pixels, 0));
    EXPECT_TRUE(std::cerr.bad());
}

TEST(yuvimg, NoNameIsAnEmptyName)
{
    CapturedStderr printed;

    auto pixels = Taken(longimageyuvdata(nullptr), frame_pixels);

    EXPECT_EQ(printed.Text(), "Couldn't open yuv file []\n");
    EXPECT_EQ(pixels, PixelList(frame_pixels, 0));
}

TEST(yuvimg, ANameIsPrintedAsItIs)
{
    CapturedStderr printed;

    Taken(longimageyuvdata("/nowhere/%s%n%d"), frame_pixels);

    EXPECT_EQ(printed.Text(), "Couldn't open yuv file [/nowhere/%s%n%d]\n");
}

TEST(yuvimg, WhatIsNoRegularFileReadsAsAnEmptyOneInAChild)
{
    TempDir directory;
    std::string fifo = directory.Path("fifo");
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    RunInAChild([&] {
        for (const std::string& path :
             {directory.Path(""), fifo, std::string("/dev/zero")})
            EXPECT_EQ(Taken(longimageyuvdata(path.c_str()), frame_pixels),
                      PixelList(frame_pixels, dark_green));
    });
}

TEST(yuvimg, ShortReadsAndInterruptionsGiveTheSameFrame)
{
    std::string frame;
    for (std::size_t i = 0; i < frame_bytes; ++i)
        frame += static_cast<char>(i * 7);
    FaultyFiles files;
    files.most_at_once = 1000;
    files.interrupts = true;

    EXPECT_EQ(Read(frame), literal::ReadYuv(frame).pixels);
}

TEST(yuvimg, AReadFaultIsAFileThatEndsThere)
{
    std::string frame = Fill(frame_bytes, 0x90);
    FaultyFiles files;
    files.read_ends = 1001;

    EXPECT_EQ(Read(frame), literal::ReadYuv(frame.substr(0, 1001)).pixels);
}

} // namespace
