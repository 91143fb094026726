#include "pictures/terminal_picture.h"

#include <sstream>

#include <gtest/gtest.h>

using ztsh::FitIntoCells;
using ztsh::PictureSize;
using ztsh::WriteHalfBlocks;

namespace {

void ExpectFit(PictureSize picture, int columns, int rows, int width,
               int height)
{
    PictureSize fit = FitIntoCells(picture, columns, rows);
    EXPECT_EQ(fit.width, width);
    EXPECT_EQ(fit.height, height);
}

std::string HalfBlocksOf(const ZtImageSGI& image)
{
    std::ostringstream out;
    WriteHalfBlocks(image, out);
    return out.str();
}

} // namespace

TEST(FitIntoCells, CountsTwoPixelsToACellsHeight)
{
    ExpectFit({100, 100}, 80, 24, 48, 48);
}

TEST(FitIntoCells, IsBoundByTheWidthOfAWidePicture)
{
    ExpectFit({200, 10}, 80, 24, 80, 4);
}

TEST(FitIntoCells, EnlargesASmallPicture)
{
    ExpectFit({2, 1}, 80, 24, 80, 40);
}

TEST(FitIntoCells, GivesAtLeastOnePixel)
{
    ExpectFit({65535, 1}, 10, 1, 10, 1);
    ExpectFit({1, 65535}, 10, 1, 1, 2);
}

TEST(WriteHalfBlocks, PutsTheUpperPixelBeforeTheLowerOnesColour)
{
    ZtImageSGI image(1, 2, nullptr);
    image.pixels[0] = 0x040506FF; // below
    image.pixels[1] = 0x010203FF; // above

    EXPECT_EQ(HalfBlocksOf(image),
              "\033[38;2;1;2;3m\033[48;2;4;5;6m\u2580\033[0m\n");
}

TEST(WriteHalfBlocks, LeavesOutColoursThatStay)
{
    ZtImageSGI image(3, 2, nullptr);
    for (int i = 0; i < 6; ++i)
        image.pixels[i] = 0x010203FF;
    image.pixels[2] = 0x090909FF;

    EXPECT_EQ(HalfBlocksOf(image),
              "\033[38;2;1;2;3m\033[48;2;1;2;3m\u2580\u2580"
              "\033[48;2;9;9;9m\u2580\033[0m\n");
}

TEST(WriteHalfBlocks, LeavesTheLowerHalfOfALoneRow)
{
    ZtImageSGI image(1, 3, nullptr);
    for (int i = 0; i < 3; ++i)
        image.pixels[i] = 0x010203FF;

    EXPECT_EQ(HalfBlocksOf(image),
              "\033[38;2;1;2;3m\033[48;2;1;2;3m\u2580\033[0m\n"
              "\033[38;2;1;2;3m\u2580\033[0m\n");
}

TEST(WriteHalfBlocks, PutsTranslucentPixelsBeforeBlack)
{
    ZtImageSGI image(2, 1, nullptr);
    image.pixels[0] = 0xFF804000;
    image.pixels[1] = 0xFF800080;

    EXPECT_EQ(HalfBlocksOf(image), "\033[38;2;0;0;0m\u2580"
                                   "\033[38;2;128;64;0m\u2580\033[0m\n");
}
