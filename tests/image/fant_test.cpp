#include "image/fant.h"

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"

namespace {

PixelList Scaled(const PixelList& source, int width, int height, int new_width,
                 int new_height)
{
    PixelList out(static_cast<std::size_t>(new_width) *
                  static_cast<std::size_t>(new_height));
    EXPECT_TRUE(zt_image::zoom_fant(source.data(), width, height, out.data(),
                                    new_width, new_height));
    return out;
}

PixelList ScaledLine(const PixelList& source, int length)
{
    return Scaled(source, static_cast<int>(source.size()), 1, length, 1);
}

TEST(fant, HalvingAveragesPairs)
{
    EXPECT_EQ(ScaledLine({0x00102030, 0x00203040, 0x00000000, 0x00000204}, 2),
              (PixelList{0x00182838, 0x00000102}));
}

TEST(fant, AThirdIsTakenOfThePixelThatIsShared)
{
    // Three pixels into two: each is one and a half of the source. The half
    // that is left of the middle one counts as the mean of it and the next.
    EXPECT_EQ(ScaledLine({0x30, 0x60, 0x90}, 2), (PixelList{0x40, 0x88}));
}

TEST(fant, DoublingJoinsPixelsByStraightLines)
{
    // The first half of a pixel is itself, the second the mean with the next.
    EXPECT_EQ(ScaledLine({0x20, 0x40}, 4), (PixelList{0x20, 0x30, 0x40, 0x40}));
}

TEST(fant, TheHighByteIsNotAveragedAndBecomesZero)
{
    EXPECT_EQ(ScaledLine({0xFF010203, 0xFF010203}, 2),
              (PixelList{0x00010203, 0x00010203}));
}

TEST(fant, TheSameSizeKeepsTheThreeLowBytes)
{
    std::mt19937 random(12);
    PixelList picture = RandomPicture(random, 33, 21, Texture::Noise);
    PixelList expected = picture;
    for (ZtPixel& pixel : expected)
        pixel &= 0x00FFFFFF;

    EXPECT_EQ(Scaled(picture, 33, 21, 33, 21), expected);
}

TEST(fant, EqualPixelsComeOutEqualOrOneLower)
{
    PixelList constant(7 * 5, 0x00646464);

    for (ZtPixel pixel : Scaled(constant, 7, 5, 10, 3))
        for (int shift : {0, 8, 16}) {
            EXPECT_GE(pixel >> shift & 0xFF, 0x63u);
            EXPECT_LE(pixel >> shift & 0xFF, 0x64u);
        }
}

// The straight-line description of the walk and ours, bit for bit.
TEST(fant, RandomSizesAgreeWithAPlainScaler)
{
    std::mt19937 random(13);
    for (int i = 0; i < 1500; ++i) {
        auto size = [&random] { return static_cast<int>(random() % 45 + 1); };
        int width = size();
        int height = size();
        int new_width = size();
        int new_height = size();
        PixelList picture =
            RandomPicture(random, width, height, TextureNumber(i));

        ASSERT_EQ(Scaled(picture, width, height, new_width, new_height),
                  literal::Fant(picture, width, height, new_width, new_height))
            << width << "x" << height << " to " << new_width << "x"
            << new_height;
    }
}

TEST(fant, AllLengthsOfALineAgreeWithAPlainScaler)
{
    std::mt19937 random(14);
    for (int in = 1; in <= 70; ++in)
        for (int out = 1; out <= 70; ++out) {
            PixelList line = RandomPicture(random, in, 1, Texture::Noise);

            ASSERT_EQ(ScaledLine(line, out), literal::FantLine(line, out))
                << in << " to " << out;
        }
}

TEST(fant, LargePicturesAgreeWithAPlainScaler)
{
    std::mt19937 random(15);
    PixelList picture = RandomPicture(random, 320, 243, Texture::Noise);
    for (auto [width, height] : {std::pair{160, 121}, std::pair{201, 300},
                                 std::pair{641, 487}, std::pair{3, 2}})
        ASSERT_EQ(Scaled(picture, 320, 243, width, height),
                  literal::Fant(picture, 320, 243, width, height));
}

TEST(fant, ExtremeLengthsReadNothingBeyondTheLine)
{
    std::mt19937 random(16);
    for (auto [in, out] :
         {std::pair{1, 4096}, std::pair{4096, 1}, std::pair{7, 1000},
          std::pair{1000, 7}, std::pair{65535, 3}, std::pair{3, 65535},
          std::pair{65535, 65534}, std::pair{65534, 65535}}) {
        PixelList line = RandomPicture(random, in, 1, Texture::Noise);

        ASSERT_EQ(ScaledLine(line, out), literal::FantLine(line, out));
        ASSERT_EQ(Scaled(line, 1, in, 1, out), literal::FantLine(line, out));
    }
}

TEST(fant, AWalkUsesUpTheWholeLine)
{
    zt_image::FantWalk walk(10, 4);

    ASSERT_TRUE(walk.made());
    EXPECT_EQ(walk.scale(), 0.4);
    EXPECT_EQ(walk.span(0).first, 0u);
    EXPECT_EQ(walk.span(0).count, 2u);
    EXPECT_EQ(walk.span(0).head, 1.0);
    EXPECT_EQ(walk.span(0).tail, 0.5);
    EXPECT_EQ(walk.span(1).first, 2u);
    EXPECT_EQ(walk.span(1).head, 0.5);
    EXPECT_EQ(walk.span(3).first, 7u);
    EXPECT_EQ(walk.span(3).count, 2u);
    EXPECT_EQ(walk.span(3).tail, 1.0);
}

} // namespace
