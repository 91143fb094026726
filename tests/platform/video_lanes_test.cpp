#include "platform/video_lanes.h"

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "platform/x86/video_lanes_avx2.h"
#include "platform/x86/video_lanes_avx512.h"

namespace {

using zt_platform::ChannelWeights;
using zt_platform::VideoCarry;
using zt_platform::VideoColors;
using zt_platform::VideoLanes;
using zt_platform::VideoMix;
using Words = std::vector<std::uint32_t>;
using Bytes = std::vector<unsigned char>;

/// Each test runs with every kind of lanes that this processor has.
class VideoLanesTest : public testing::TestWithParam<const VideoLanes*>
{
protected:
    const VideoLanes& lanes = *GetParam();
    std::mt19937 random{52};

    std::uint32_t Word() { return static_cast<std::uint32_t>(random()); }

    int Between(int least, int most)
    {
        return least + static_cast<int>(
                           Word() % static_cast<unsigned>(most - least + 1));
    }

    ChannelWeights AnyWeights()
    {
        return {Between(-32768, 32767), Between(-65536, 65534),
                Between(-32768, 32767)};
    }

    VideoMix AnyMix()
    {
        return {AnyWeights(),
                Between(0, 255),
                {{AnyWeights(), AnyWeights(), Between(0, 255)},
                 {AnyWeights(), AnyWeights(), Between(0, 255)}}};
    }

    Words AnyPixels(std::size_t count)
    {
        Words pixels(count);
        for (std::uint32_t& pixel : pixels)
            pixel = Word();
        return pixels;
    }

    Bytes Mixed(const Words& pixels, const VideoMix& video, VideoCarry& carry)
    {
        Bytes groups(2 * pixels.size() + 1, 0xA5);
        lanes.mix(pixels.data(), groups.data(), pixels.size() / 2, video,
                  carry);
        EXPECT_EQ(groups.back(), 0xA5);
        groups.pop_back();
        return groups;
    }
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

INSTANTIATE_TEST_SUITE_P(Lanes, VideoLanesTest, testing::ValuesIn(AllLanes()),
                         [](const auto& about) {
                             return std::string(about.param->name());
                         });

constexpr VideoMix nothing = {
    {0, 0, 0}, 0, {{{0, 0, 0}, {0, 0, 0}, 0}, {{0, 0, 0}, {0, 0, 0}, 0}}};

TEST_P(VideoLanesTest, LumasAreOfOnePixelEach)
{
    VideoMix video = nothing;
    video.luma = {16384, 0, 0};
    video.luma_offset = 16;
    VideoCarry carry;

    Bytes groups = Mixed({0x80000000, 0x40000000, 0xFC000000, 0}, video, carry);

    EXPECT_EQ(groups, (Bytes{0, 16 + 32, 0, 16 + 16, 0, 16 + 63, 0, 16}));
}

TEST_P(VideoLanesTest, BytesAreTakenModulo256)
{
    VideoMix video = nothing;
    video.luma = {0, 65534, 0};
    video.luma_offset = 16;
    VideoCarry carry;

    // 255 * 65534 is 254 wholes and 65026 parts, and 255 wholes with a carry.
    Bytes groups = Mixed({0x00FF0000, 0x00FF0000}, video, carry);

    EXPECT_EQ(groups, (Bytes{0, 254 + 16 - 256, 0, 255 + 16 - 256}));
}

TEST_P(VideoLanesTest, AChromaIsOfTheFirstPixelAndTheSecondOnesOnBothSides)
{
    VideoMix video = nothing;
    video.chroma[0] = {{16384, 0, 0}, {8192, 0, 0}, 128};
    video.chroma[1] = {{0, 0, -16384}, {0, 0, -8192}, 128};
    VideoCarry carry;

    Bytes groups =
        Mixed({0x40004000, 0x80008000, 0x10001000, 0x20002000}, video, carry);

    EXPECT_EQ(groups, (Bytes{128 + 16 + 16, 0, 128 - 32, 0, //
                             128 + 16 + 4 + 4, 0, 128 - 24, 0}));
    EXPECT_EQ(carry.second[0], 0x20 * 8192);
    EXPECT_EQ(carry.second[1], 0x20 * -8192);
}

TEST_P(VideoLanesTest, AlphaIsIgnored)
{
    VideoMix video = AnyMix();
    Words pixels = AnyPixels(64);
    Words opaque = pixels;
    for (std::uint32_t& pixel : opaque)
        pixel |= 0xFF;
    VideoCarry carry;
    VideoCarry carry_of_opaque;

    EXPECT_EQ(Mixed(pixels, video, carry),
              Mixed(opaque, video, carry_of_opaque));
}

TEST_P(VideoLanesTest, AFractionIsCarriedUntilItMakesAWhole)
{
    VideoMix video = nothing;
    video.luma = {1, 0, 0};
    VideoCarry carry;

    // 257 times 255 is 65535, one short.
    Bytes groups = Mixed(Words(512, 0xFF000000), video, carry);

    for (std::size_t i = 0; i < 512; ++i)
        EXPECT_EQ(groups[2 * i + 1], i == 257 ? 1 : 0) << i;
    EXPECT_EQ(carry.luma, 512u * 255 - 65536);
}

TEST_P(VideoLanesTest, APartGoesOnWhereTheOneBeforeEnded)
{
    VideoMix video = AnyMix();
    Words pixels = AnyPixels(2 * 200);
    VideoCarry carry;
    Bytes whole = Mixed(pixels, video, carry);
    for (std::size_t cut = 0; cut <= 400; cut += 2) {
        VideoCarry carry_of_parts;
        auto middle = pixels.begin() + static_cast<std::ptrdiff_t>(cut);

        Bytes parts =
            Mixed(Words(pixels.begin(), middle), video, carry_of_parts);
        Bytes rest = Mixed(Words(middle, pixels.end()), video, carry_of_parts);

        parts.insert(parts.end(), rest.begin(), rest.end());
        ASSERT_EQ(parts, whole) << cut;
        ASSERT_EQ(carry_of_parts.luma, carry.luma);
    }
}

// The plain ones are compared with a reference in the tests of the frame.
TEST_P(VideoLanesTest, AllGiveTheSameBitsAsThePlainOnes)
{
    for (int i = 0; i < 2000; ++i) {
        VideoMix video = AnyMix();
        Words pixels = AnyPixels(2 * (Word() % 80));
        VideoCarry carry;
        carry.luma = Word() & 0xFFFF;
        carry.chroma[0] = Word() & 0xFFFF;
        carry.chroma[1] = Word() & 0xFFFF;
        carry.second[0] = Between(-1000000, 1000000);
        carry.second[1] = Between(-1000000, 1000000);
        VideoCarry plain_carry = carry;
        Bytes expected(2 * pixels.size());
        VideoLanes::plain().mix(pixels.data(), expected.data(),
                                pixels.size() / 2, video, plain_carry);

        ASSERT_EQ(Mixed(pixels, video, carry), expected) << i;

        ASSERT_EQ(carry.luma, plain_carry.luma);
        for (int kind = 0; kind < 2; ++kind) {
            ASSERT_EQ(carry.chroma[kind], plain_carry.chroma[kind]);
            ASSERT_EQ(carry.second[kind], plain_carry.second[kind]);
        }
    }
}

Words Colored(const VideoLanes& lanes, const Bytes& groups,
              const VideoColors& colors)
{
    Words pixels(groups.size() / 2 + 1, 0xA5A5A5A5);
    lanes.color(groups.data(), pixels.data(), groups.size() / 4, colors);
    EXPECT_EQ(pixels.back(), 0xA5A5A5A5);
    pixels.pop_back();
    return pixels;
}

constexpr VideoColors grey = {65536, 16, {0, 0}, {0, 0}, {0, 0}, 128, true};

TEST_P(VideoLanesTest, ALumaBelowItsOffsetIsBlack)
{
    Words pixels = Colored(lanes, {0, 0, 0, 15, 0, 16, 0, 17}, grey);

    EXPECT_EQ(pixels, (Words{0, 0, 0, 0x00010101}));
}

TEST_P(VideoLanesTest, EachChannelHasItsOwnShareOfTheChromas)
{
    VideoColors colors = grey;
    colors.red = {65536, 0};
    colors.green = {0, 2 * 65536};
    colors.blue = {-65536, 65536};

    Words red_lowest = Colored(lanes, {138, 116, 133, 117}, colors);
    colors.red_lowest = false;
    Words red_highest = Colored(lanes, {138, 116, 133, 117}, colors);

    EXPECT_EQ(red_lowest, (Words{0x005F6E6E, 0x00606F6F}));
    EXPECT_EQ(red_highest, (Words{0x6E6E5F00, 0x6F6F6000}));
}

TEST_P(VideoLanesTest, FractionsOfAChannelAreAddedBeforeTheyAreCut)
{
    VideoColors colors = grey;
    colors.luma = 65536 / 4;
    colors.red = {65536 / 4, 65536 / 2};
    colors.green = {-65536 / 4, 0};

    Words pixels = Colored(lanes, {129, 17, 129, 18}, colors);

    EXPECT_EQ(pixels, (Words{0x00000001, 0x00000001}));
}

TEST_P(VideoLanesTest, AChannelIsClampedAtBothEnds)
{
    VideoColors colors = grey;
    colors.red = {8421504, 0}; // The largest that fits.
    colors.blue = {-8421504, 0};

    Words above = Colored(lanes, {255, 255, 0, 16}, colors);
    Words below = Colored(lanes, {0, 255, 0, 16}, colors);

    EXPECT_EQ(above, (Words{0x0000EFFF, 0x000000FF}));
    EXPECT_EQ(below, (Words{0x00FFEF00, 0x00FF0000}));
}

// How the plain ones do is compared with a reference in the tests of the
// reader.
TEST_P(VideoLanesTest, EverySampleOfVideoIsColoredAsByThePlainOnes)
{
    constexpr VideoColors video = {
        76310, 16, {0, 104635}, {-25690, -53294}, {132278, 0}, 128, true};
    for (int luma = 0; luma < 256; luma += 2) {
        Bytes groups(4 * 65536);
        for (std::size_t i = 0; i < 65536; ++i) {
            groups[4 * i] = static_cast<unsigned char>(i);
            groups[4 * i + 1] = static_cast<unsigned char>(luma);
            groups[4 * i + 2] = static_cast<unsigned char>(i >> 8);
            groups[4 * i + 3] = static_cast<unsigned char>(luma + 1);
        }

        ASSERT_EQ(Colored(lanes, groups, video),
                  Colored(VideoLanes::plain(), groups, video))
            << luma;
    }
}

TEST_P(VideoLanesTest, AnyWeightsColorAsWithThePlainOnes)
{
    constexpr int most = 2500000; // Three of them, 255 times, fit 32 bits.
    for (int i = 0; i < 2000; ++i) {
        const auto chromas = [this] {
            return VideoColors::Chromas{Between(-most, most),
                                        Between(-most, most)};
        };
        const int small = i % 2 ? 1 : 20; // Of which fewer are clamped.
        VideoColors colors = {Between(-most, most) / small,
                              Between(0, 255),
                              chromas(),
                              chromas(),
                              chromas(),
                              Between(0, 255),
                              i % 4 < 2};
        for (VideoColors::Chromas* of :
             {&colors.red, &colors.green, &colors.blue}) {
            of->first /= small;
            of->second /= small;
        }
        Bytes groups(4 * (Word() % 80));
        for (unsigned char& byte : groups)
            byte = static_cast<unsigned char>(Word());

        ASSERT_EQ(Colored(lanes, groups, colors),
                  Colored(VideoLanes::plain(), groups, colors))
            << i;
    }
}

TEST(VideoLanes, TheFastestAreInUseUnlessOthersAreInstalled)
{
    EXPECT_EQ(&VideoLanes::current(), &VideoLanes::fastest());

    VideoLanes::install(&VideoLanes::plain());
    EXPECT_EQ(&VideoLanes::current(), &VideoLanes::plain());

    VideoLanes::install(nullptr);
    EXPECT_EQ(&VideoLanes::current(), &VideoLanes::fastest());
}

TEST(VideoLanes, TheyAreToldApartByTheirNames)
{
    std::vector<std::string> names;
    for (const VideoLanes* lanes : AllLanes())
        names.emplace_back(lanes->name());

    EXPECT_EQ(names.front(), "plain");
    EXPECT_EQ(names.back(), VideoLanes::fastest().name());
    std::sort(names.begin(), names.end());
    EXPECT_EQ(std::adjacent_find(names.begin(), names.end()), names.end());
}

} // namespace
