#include "pictures/picture_drawing.h"

#include <climits>
#include <numeric>
#include <vector>

#include <gtest/gtest.h>

using ztsh::DrawFrame;
using ztsh::Paste;

namespace {

using Pixels = std::vector<ZtPixel>;

Pixels PixelsOf(const ZtImageSGI& image)
{
    return Pixels(image.pixels, image.pixels + image.width * image.height);
}

/// A picture of the pixels `first`, `first` + 1 and so on.
ZtImageSGI Counting(int width, int height, ZtPixel first)
{
    ZtImageSGI image(width, height, nullptr);
    std::iota(image.pixels, image.pixels + width * height, first);
    return image;
}

TEST(picture_drawing, APictureIsPutAtItsPlace)
{
    ZtImageSGI image(4, 3, nullptr);

    Paste(image, Counting(2, 2, 1), 1, 1);

    EXPECT_EQ(PixelsOf(image), (Pixels{0, 0, 0, 0, //
                                       0, 1, 2, 0, //
                                       0, 3, 4, 0}));
}

TEST(picture_drawing, WhatDoesNotFitIsLeftOut)
{
    ZtImageSGI low(3, 2, nullptr);
    ZtImageSGI high(3, 2, nullptr);
    ZtImageSGI inside(1, 1, nullptr);

    Paste(low, Counting(2, 2, 1), -1, -1);
    Paste(high, Counting(2, 2, 1), 2, 1);
    Paste(inside, Counting(3, 3, 1), -1, -1);

    EXPECT_EQ(PixelsOf(low), (Pixels{4, 0, 0, 0, 0, 0}));
    EXPECT_EQ(PixelsOf(high), (Pixels{0, 0, 0, 0, 0, 1}));
    EXPECT_EQ(PixelsOf(inside), (Pixels{5}));
}

TEST(picture_drawing, WhatLiesOutsideIsNotDrawn)
{
    for (auto [x, y] : {std::pair{3, 0},
                        {0, 2},
                        {-2, 0},
                        {0, -2},
                        {INT_MAX, 0},
                        {0, INT_MIN},
                        {INT_MIN, INT_MAX}}) {
        ZtImageSGI image(3, 2, nullptr);

        Paste(image, Counting(2, 2, 1), x, y);
        DrawFrame(image, {x, y, 2, 2}, 9);

        EXPECT_EQ(PixelsOf(image), Pixels(6, 0)) << x << ", " << y;
    }
}

TEST(picture_drawing, EmptyPicturesAreNothing)
{
    ZtImageSGI empty(0, 0, nullptr);
    ZtImageSGI image(2, 1, nullptr);

    Paste(image, empty, 0, 0);
    Paste(empty, image, 0, 0);
    DrawFrame(empty, {0, 0, 5, 5}, 9);

    EXPECT_EQ(PixelsOf(image), Pixels(2, 0));
}

TEST(picture_drawing, AFrameIsTwoPixelsThickAndInside)
{
    ZtImageSGI image(8, 7, nullptr);

    DrawFrame(image, {1, 1, 6, 5}, 9);

    EXPECT_EQ(PixelsOf(image), (Pixels{0, 0, 0, 0, 0, 0, 0, 0, //
                                       0, 9, 9, 9, 9, 9, 9, 0, //
                                       0, 9, 9, 9, 9, 9, 9, 0, //
                                       0, 9, 9, 0, 0, 9, 9, 0, //
                                       0, 9, 9, 9, 9, 9, 9, 0, //
                                       0, 9, 9, 9, 9, 9, 9, 0, //
                                       0, 0, 0, 0, 0, 0, 0, 0}));
}

TEST(picture_drawing, ASmallFrameIsFull)
{
    for (auto [width, height] : {std::pair{1, 1}, {2, 3}, {4, 1}, {4, 4}}) {
        ZtImageSGI image(4, 4, nullptr);

        DrawFrame(image, {0, 0, width, height}, 9);

        for (int y = 0; y < 4; ++y)
            for (int x = 0; x < 4; ++x)
                EXPECT_EQ(image.pixels[4 * y + x],
                          x < width && y < height ? 9U : 0U)
                    << width << " x " << height << ": " << x << ", " << y;
    }
}

TEST(picture_drawing, AFrameAroundNothingIsNone)
{
    ZtImageSGI image(3, 3, nullptr);

    DrawFrame(image, {1, 1, 0, 2}, 9);
    DrawFrame(image, {1, 1, 2, 0}, 9);
    DrawFrame(image, {1, 1, -1, -1}, 9);

    EXPECT_EQ(PixelsOf(image), Pixels(9, 0));
}

TEST(picture_drawing, AFrameIsCutOffAtTheBorder)
{
    ZtImageSGI image(4, 4, nullptr);

    DrawFrame(image, {-3, -3, 6, 6}, 9);

    EXPECT_EQ(PixelsOf(image), (Pixels{0, 9, 9, 0, //
                                       9, 9, 9, 0, //
                                       9, 9, 9, 0, //
                                       0, 0, 0, 0}));
}

} // namespace
