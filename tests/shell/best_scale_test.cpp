#include "pictures/best_scale.h"

#include <algorithm>

#include <gtest/gtest.h>

using ztsh::ScaleBest;

namespace {

int ChannelOf(ZtPixel pixel, int channel)
{
    return static_cast<int>(pixel >> (24 - 8 * channel) & 0xFF);
}

} // namespace

TEST(ScaleBest, AveragesAllFourChannels)
{
    ZtImageSGI image(2, 1, nullptr);
    image.pixels[0] = 0x10203040;
    image.pixels[1] = 0x30405060;

    EXPECT_TRUE(ScaleBest(image, 1, 1));

    // An average may come out one lower than exact.
    const int exact[] = {0x20, 0x30, 0x40, 0x50};
    for (int channel = 0; channel < 4; ++channel)
        EXPECT_NEAR(ChannelOf(image.pixels[0], channel), exact[channel], 1)
            << channel;
}

TEST(ScaleBest, GivesTheOtherThreeChannelsAsResizeBestDoes)
{
    ZtImageSGI image(7, 5, nullptr);
    unsigned seed = 7;
    for (int i = 0; i < 35; ++i)
        image.pixels[i] = seed = seed * 1664525U + 1013904223U;
    ZtImageSGI expected(image);
    expected.ResizeBest(11, 3);

    EXPECT_TRUE(ScaleBest(image, 11, 3));

    ASSERT_EQ(image.width, 11);
    ASSERT_EQ(image.height, 3);
    for (int i = 0; i < 33; ++i)
        EXPECT_EQ(image.pixels[i] & 0x00FFFFFF, expected.pixels[i]) << i;
}

TEST(ScaleBest, KeepsAnOpaquePictureOpaque)
{
    ZtImageSGI image(5, 5, nullptr);
    for (int i = 0; i < 25; ++i)
        image.pixels[i] = static_cast<ZtPixel>(i * 7919) << 8 | 0xFF;

    EXPECT_TRUE(ScaleBest(image, 7, 3));

    for (int i = 0; i < 21; ++i)
        EXPECT_EQ(ChannelOf(image.pixels[i], 3), 0xFF) << i;
}

TEST(ScaleBest, TreatsRedAsItTreatsGreen)
{
    ZtImageSGI image(9, 9, nullptr);
    unsigned seed = 3;
    for (int i = 0; i < 81; ++i) {
        seed = seed * 1664525U + 1013904223U;
        ZtPixel value = seed >> 24;
        image.pixels[i] = value << 24 | value << 16 | 0xFF;
    }

    EXPECT_TRUE(ScaleBest(image, 4, 13));

    for (int i = 0; i < 4 * 13; ++i)
        EXPECT_EQ(ChannelOf(image.pixels[i], 0), ChannelOf(image.pixels[i], 1))
            << i;
}

TEST(ScaleBest, ToTheSameSizeKeepsThePicture)
{
    ZtImageSGI image(2, 2, nullptr);
    const ZtPixel pixels[] = {0xFF000000, 0x00FF0000, 0x0000FF00, 0x000000FF};
    std::copy(std::begin(pixels), std::end(pixels), image.pixels);

    EXPECT_TRUE(ScaleBest(image, 2, 2));

    for (int i = 0; i < 4; ++i)
        for (int channel = 0; channel < 4; ++channel)
            EXPECT_NEAR(ChannelOf(image.pixels[i], channel),
                        ChannelOf(pixels[i], channel), 1);
}

TEST(ScaleBest, RefusesAnEmptyPicture)
{
    ZtImageSGI image("/nonexistent.rgb", 0);

    EXPECT_FALSE(ScaleBest(image, 2, 2));

    EXPECT_EQ(image.pixels, nullptr);
}
