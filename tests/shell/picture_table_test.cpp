#include "pictures/picture_table.h"

#include <gtest/gtest.h>

using ztsh::Picture;
using ztsh::PictureTable;

namespace {

std::shared_ptr<Picture> PictureOf(ZtPixel pixel)
{
    ZtImageSGI image(1, 1, nullptr);
    image.pixels[0] = pixel;
    return std::make_shared<Picture>(Picture{image, "made"});
}

} // namespace

TEST(PictureTable, HoldsPicturesByName)
{
    PictureTable table;

    table.Put("a", PictureOf(1));

    ASSERT_NE(table.Find("a"), nullptr);
    EXPECT_EQ(table.Find("a")->image.pixels[0], 1u);
    EXPECT_EQ(table.Find("A"), nullptr);
}

TEST(PictureTable, PutReplacesThePictureOfThatName)
{
    PictureTable table;
    table.Put("a", PictureOf(1));

    table.Put("a", PictureOf(2));

    EXPECT_EQ(table.Find("a")->image.pixels[0], 2u);
    EXPECT_EQ(table.All().size(), 1u);
}

TEST(PictureTable, ACopyIsChangedByItself)
{
    PictureTable table;
    table.Put("a", PictureOf(1));

    table.Copy("a", "b");
    table.FindToChange("b")->image.pixels[0] = 2;

    EXPECT_EQ(table.Find("a")->image.pixels[0], 1u);
    EXPECT_EQ(table.Find("b")->image.pixels[0], 2u);
}

TEST(PictureTable, ACopyOfTheTableSharesPicturesUntilTheyChange)
{
    PictureTable table;
    table.Put("a", PictureOf(1));

    PictureTable former = table;
    EXPECT_EQ(former.Find("a"), table.Find("a"));
    table.FindToChange("a")->image.pixels[0] = 2;

    EXPECT_EQ(former.Find("a")->image.pixels[0], 1u);
    EXPECT_EQ(table.Find("a")->image.pixels[0], 2u);
}

TEST(PictureTable, APictureOfItsOwnIsChangedInPlace)
{
    PictureTable table;
    table.Put("a", PictureOf(1));
    const Picture* before = table.Find("a");

    EXPECT_EQ(table.FindToChange("a"), before);
}

TEST(PictureTable, RemoveSaysWhetherThereWasOne)
{
    PictureTable table;
    table.Put("a", PictureOf(1));

    EXPECT_TRUE(table.Remove("a"));
    EXPECT_FALSE(table.Remove("a"));

    EXPECT_EQ(table.Find("a"), nullptr);
    EXPECT_EQ(table.FindToChange("a"), nullptr);
}
