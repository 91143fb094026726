#include "image/video_frame.h"

#include <algorithm>
#include <cmath>
#include <random>
#include <set>

#include <gtest/gtest.h>

#include "image/literal_frame.h"
#include "image/pictures.h"
#include "platform/video_lanes.h"
#include "platform/x86/video_lanes_avx2.h"
#include "platform/x86/video_lanes_avx512.h"

namespace {

using zt_image::video_frame_bytes;
using zt_image::video_line_bytes;
using zt_image::video_line_of;
using zt_platform::VideoLanes;

constexpr int width = 648;
constexpr int height = 486;
constexpr std::size_t pixel_count = std::size_t{width} * height;

std::string Frame(const PixelList& pixels)
{
    EXPECT_EQ(pixels.size(), pixel_count);
    std::string frame(video_frame_bytes + 16, '\x5A');
    zt_image::make_video_frame(pixels.data(),
                               reinterpret_cast<unsigned char*>(frame.data()));
    EXPECT_EQ(frame.substr(video_frame_bytes), std::string(16, '\x5A'));
    frame.resize(video_frame_bytes);
    return frame;
}

/// A sample's group and its luma, by line of the frame and number.
struct Sample
{
    int chroma1;
    int luma;
    int chroma2;
};

Sample SampleAt(const std::string& frame, int line, int number)
{
    const std::size_t group = static_cast<std::size_t>(line) * 1440 +
                              static_cast<std::size_t>(number) / 2 * 4;
    auto byte = [&](std::size_t at) {
        return static_cast<int>(static_cast<unsigned char>(frame[group + at]));
    };
    return {byte(0), byte(number % 2 ? 3 : 1), byte(2)};
}

ZtPixel Grey(int value)
{
    return static_cast<ZtPixel>(value) * 0x01010100 | 0xFF;
}

PixelList Flat(ZtPixel pixel)
{
    return PixelList(pixel_count, pixel);
}

/// A grey picture made by a function of column and row, from the bottom.
template <class Value>
PixelList Made(const Value& value)
{
    PixelList pixels;
    for (int row = 0; row < height; ++row)
        for (int column = 0; column < width; ++column)
            pixels.push_back(value(column, row));
    return pixels;
}

/// Each comparison is made with every kind of lanes that this processor has.
class VideoFrameTest : public testing::TestWithParam<const VideoLanes*>
{
protected:
    VideoFrameTest() { VideoLanes::install(GetParam()); }
    ~VideoFrameTest() override { VideoLanes::install(nullptr); }

    std::mt19937 random{73};
};

std::vector<const VideoLanes*> AllLanes()
{
    std::vector<const VideoLanes*> all = {&VideoLanes::plain()};
    for (const VideoLanes* lanes :
         {zt_platform::avx2_video_lanes(), zt_platform::avx512_video_lanes()})
        if (lanes)
            all.push_back(lanes);
    return all;
}

INSTANTIATE_TEST_SUITE_P(
    Lanes, VideoFrameTest, testing::ValuesIn(AllLanes()),
    [](const auto& about) { return std::string(about.param->name()); });

TEST_P(VideoFrameTest, RandomPicturesAgreeWithALiteralConversion)
{
    for (int i = 0; i < 12; ++i) {
        PixelList pixels =
            RandomPicture(random, width, height, TextureNumber(i));

        ASSERT_EQ(Frame(pixels), literal::VideoFrame(pixels)) << i;
    }
}

TEST_P(VideoFrameTest, GreyRampsAgreeWithALiteralConversion)
{
    for (const PixelList& pixels :
         {Made([](int column, int) { return Grey(column * 256 / width); }),
          Made([](int, int row) { return Grey(row % 256); }),
          Made([](int column, int row) {
              return Grey((column + 3 * row) % 256);
          })})
        ASSERT_EQ(Frame(pixels), literal::VideoFrame(pixels));
}

TEST_P(VideoFrameTest, PrimariesAgreeWithALiteralConversion)
{
    for (ZtPixel corner = 0; corner < 8; ++corner) {
        PixelList pixels =
            Flat((corner & 1) * 0xFF000000 + (corner >> 1 & 1) * 0x00FF0000 +
                 (corner >> 2) * 0x0000FF00);

        ASSERT_EQ(Frame(pixels), literal::VideoFrame(pixels)) << corner;
    }
}

TEST_P(VideoFrameTest, PrimariesNextToEachOtherAgreeWithALiteralConversion)
{
    PixelList pixels = Made([this](int, int) {
        const ZtPixel corner = static_cast<ZtPixel>(random());
        return (corner & 1) * 0xFF000000 + (corner >> 1 & 1) * 0x00FF0000 +
               (corner >> 2 & 1) * 0x0000FF00;
    });

    ASSERT_EQ(Frame(pixels), literal::VideoFrame(pixels));
}

TEST_P(VideoFrameTest, AlphaIsIgnored)
{
    PixelList pixels = RandomPicture(random, width, height, Texture::Noise);
    PixelList clear = pixels;
    for (ZtPixel& pixel : clear)
        pixel &= 0xFFFFFF00;

    EXPECT_EQ(Frame(clear), Frame(pixels));
}

TEST_P(VideoFrameTest, EveryPictureStartsWithoutCarries)
{
    PixelList pixels = RandomPicture(random, width, height, Texture::Noise);
    const std::string first = Frame(pixels);

    EXPECT_EQ(Frame(pixels), first);
}

TEST(video_frame, LinesAreAFieldAfterTheOther)
{
    EXPECT_EQ(video_line_of(485), 243);
    EXPECT_EQ(video_line_of(484), 0);
    EXPECT_EQ(video_line_of(483), 244);
    EXPECT_EQ(video_line_of(2), 241);
    EXPECT_EQ(video_line_of(1), 485);
    EXPECT_EQ(video_line_of(0), 242);
}

TEST(video_frame, EveryRowHasALineOfItsOwn)
{
    std::set<int> lines;
    for (int row = 0; row < height; ++row)
        lines.insert(video_line_of(row));

    EXPECT_EQ(lines.size(), 486u);
    EXPECT_EQ(*lines.begin(), 0);
    EXPECT_EQ(*lines.rbegin(), 485);
}

TEST(video_frame, RowsLandOnTheirLines)
{
    for (int row : {485, 484, 243, 242, 1, 0}) {
        std::string frame = Frame(Made(
            [row](int, int at) { return at == row ? Grey(200) : Grey(0); }));

        for (int line = 0; line < height; ++line)
            EXPECT_EQ(SampleAt(frame, line, 300).luma > 100,
                      line == video_line_of(row))
                << row << " " << line;
    }
}

// Columns are told apart by their brightness, which repeats after 216 of them.
TEST(video_frame, SamplesComeFromNineTenthsOfTheirNumber)
{
    std::string frame =
        Frame(Made([](int column, int) { return Grey(column % 216); }));

    for (int line : {0, 242, 243, 485})
        for (int i = 0; i < 720; ++i) {
            const int grey = 9 * i / 10 % 216;
            const int luma = SampleAt(frame, line, i).luma;
            // 56284 parts of 65536 and at most one carried.
            const int least = 16 + grey * 56284 / 65536;
            EXPECT_TRUE(luma == least || luma == least + 1)
                << line << " " << i << " " << luma;
        }
}

TEST(video_frame, TheFirstTwoSamplesAndTheTenthTwoAreOfOneColumn)
{
    for (int column : {0, 9, 647}) {
        std::string frame = Frame(Made([column](int at, int) {
            return at == column ? Grey(255) : Grey(0);
        }));

        std::vector<int> bright;
        for (int i = 0; i < 720; ++i)
            if (SampleAt(frame, 0, i).luma > 100)
                bright.push_back(i);
        EXPECT_EQ(bright, column == 0   ? (std::vector<int>{0, 1})
                          : column == 9 ? (std::vector<int>{10, 11})
                                        : (std::vector<int>{719}));
    }
}

TEST(video_frame, BlackIsAtTheLowerEndOfVideo)
{
    std::string frame = Frame(Flat(0));

    for (std::size_t at = 0; at < video_frame_bytes; at += 2) {
        ASSERT_EQ(static_cast<unsigned char>(frame[at]), 128);
        ASSERT_EQ(static_cast<unsigned char>(frame[at + 1]), 16);
    }
}

// Spelled out: a luma is 255 * 56284 parts, 219 wholes and 36 over; the first
// chroma 255 * 455, 1 whole and 50489 over, the next time 2; the second none.
TEST(video_frame, TheFirstGroupsOfWhite)
{
    std::string frame = Frame(Flat(0xFFFFFFFF)).substr(243 * 1440, 8);

    EXPECT_EQ(frame, std::string("\x81\xEB\x80\xEB\x82\xEB\x80\xEB", 8));
}

TEST(video_frame, FractionsAreCarriedOverTheEndOfALine)
{
    // A level of blue adds 6416 parts, so that every 10.2 samples make a whole.
    std::string frame = Frame(Flat(0x00000100));
    long sum = 0;
    for (int row = 485; row >= 0; --row)
        for (int i = 0; i < 720; ++i) {
            ++sum;
            const long whole = sum * 6416 / 65536 - (sum - 1) * 6416 / 65536;
            ASSERT_EQ(SampleAt(frame, video_line_of(row), i).luma, 16 + whole)
                << row << " " << i;
        }
}

TEST(video_frame, AChromaSeesTheSecondSampleOfThePairBeforeOverTheEndOfALine)
{
    // Red in the last column of the top row only: its half weight shows in the
    // last pair of line 243 and in the first of line 0.
    std::string frame = Frame(Made([](int column, int row) {
        return row == 485 && column == 647 ? 0xFF000000u : 0u;
    }));

    EXPECT_GT(SampleAt(frame, 243, 718).chroma2, 128 + 20);
    EXPECT_GT(SampleAt(frame, 0, 0).chroma2, 128 + 20);
    EXPECT_LT(SampleAt(frame, 0, 2).chroma2, 128 + 2);
}

TEST(video_frame, GreyHasTheChromaOfItsBlueWeight)
{
    // 455 parts a level: at 255 that is 1.77 wholes.
    std::string frame = Frame(Flat(Grey(255)));
    long sum = 0;
    for (int i = 0; i < 720 * 486; i += 2)
        sum += SampleAt(frame, i / 720, i % 720).chroma1 - 128;

    EXPECT_NEAR(static_cast<double>(sum) / (360.0 * 486.0),
                255.0 * 455.0 / 65536.0, 0.001);
}

} // namespace
