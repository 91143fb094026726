#include "edge/grey.h"

#include <cstdlib>

#include <gtest/gtest.h>

#include "plugins/grey_pictures.h"

namespace {

using edge::Grey;
using edge::GreyOf;
using edge::Halved;
using edge::WindowSums;
using Values = std::vector<std::int32_t>;

TEST(edge_grey, WeighsRedGreenAndBlueAndLeavesAlphaOut)
{
    ZtImageSGI image(3, 2, nullptr);
    image.pixels[0] = 0xFF000000;
    image.pixels[1] = 0x00FF0000;
    image.pixels[2] = 0x0000FF00;
    image.pixels[3] = 0x000000FF;
    image.pixels[4] = 0xFFFFFFFF;
    image.pixels[5] = 0x0A141E28;

    Grey grey = GreyOf(image);

    EXPECT_EQ(grey.width, 3);
    EXPECT_EQ(grey.height, 2);
    EXPECT_EQ(grey.values, (Values{78, 155, 20, 0, 255, 17}));
    EXPECT_EQ(grey.Row(1), grey.values.data() + 3);
}

TEST(edge_grey, APictureWithoutPixelsIsEmpty)
{
    for (auto [width, height] : {std::pair{0, 0}, {0, 5}, {5, 0}}) {
        ZtImageSGI image(width, height, nullptr);

        Grey grey = GreyOf(image);

        EXPECT_EQ(grey.width, 0);
        EXPECT_EQ(grey.height, 0);
        EXPECT_TRUE(grey.values.empty());
    }
}

TEST(edge_grey, HalvingAddsUpFourAndDropsTheOddEnd)
{
    Grey grey = GreyPicture(5, 3,
                            {1, 2, 3, 4, 5,  //
                             6, 7, 8, 9, 10, //
                             11, 12, 13, 14, 15});

    Grey half = Halved(grey);

    EXPECT_EQ(half.width, 2);
    EXPECT_EQ(half.height, 1);
    EXPECT_EQ(half.values, (Values{16, 24}));
}

TEST(edge_grey, HalvingOneColumnLeavesNothing)
{
    EXPECT_TRUE(Halved(Plain(1, 9, 7)).values.empty());
    EXPECT_TRUE(Halved(Plain(9, 1, 7)).values.empty());
}

/// The spread straight from its definition.
std::int64_t Spread(const Grey& grey, int x, int y, int width, int height)
{
    std::int64_t sum = 0;
    std::int64_t squares = 0;
    for (int v = y; v < y + height; ++v)
        for (int u = x; u < x + width; ++u) {
            const std::int64_t value = grey.Row(v)[u];
            sum += value;
            squares += value * value;
        }
    return static_cast<std::int64_t>(width) * height * squares - sum * sum;
}

TEST(edge_grey, TheSpreadOfEveryWindowIsAsDefined)
{
    Grey grey = Noise(9, 7, 1);

    WindowSums sums(grey);

    for (int y = 0; y < 7; ++y)
        for (int x = 0; x < 9; ++x)
            for (int height = 1; y + height <= 7; ++height)
                for (int width = 1; x + width <= 9; ++width)
                    EXPECT_EQ(sums.Spread(x, y, width, height),
                              Spread(grey, x, y, width, height));
}

TEST(edge_grey, TheSpreadOfOneGreyIsExactlyZero)
{
    // As large as a window gets, and as bright as the coarsest level gets.
    Grey bright = Plain(320, 242, 255);
    Grey coarse = Plain(64, 64, 255 * 256);

    EXPECT_EQ(WindowSums(bright).Spread(0, 0, 320, 242), 0);
    EXPECT_EQ(WindowSums(coarse).Spread(3, 5, 40, 30), 0);
    bright.values[320 * 242 - 1] = 254;
    EXPECT_EQ(WindowSums(bright).Spread(0, 0, 320, 242), 320 * 242 - 1);
}

TEST(edge_grey, TheWidestSpreadDoesNotOverflow)
{
    Grey grey = Plain(362, 362, 0);
    for (std::size_t i = 0; i < grey.values.size(); i += 2)
        grey.values[i] = 255;

    // Half black and half white: count squared times a quarter of 255 squared.
    EXPECT_EQ(WindowSums(grey).Spread(0, 0, 362, 362),
              131044LL * 131044 / 4 * 255 * 255);
}

} // namespace
