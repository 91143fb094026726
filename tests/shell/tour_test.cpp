// The tour runs as a program; what it leaves behind is read with libpng and
// held against the pictures it began with.

#include "common/png_reading.h"
#include "support/TempDir.h"

#include <ZT/image_sgi.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>

#include <gtest/gtest.h>

namespace {

/// Runs the tour once for all tests; it writes to a directory with a blank in
/// its name.
class Tour : public testing::Test
{
protected:
    static void SetUpTestSuite()
    {
        dir = new TempDir;
        std::string command = "cd '" + dir->Path("") +
                              "' && '" ZTSH_PROGRAM
                              "' --jobs 2 -c 'Set out \"to look at\"' '" ZT_TREE
                              "/examples/tour.zt' >output 2>errors </dev/null";
        status = std::system(command.c_str());
    }

    static void TearDownTestSuite()
    {
        delete dir;
        dir = nullptr;
    }

    static ReadPicture Png(const std::string& name)
    {
        return ReadPng(dir->Path("to look at/" + name + ".png"));
    }

    static ZtImageSGI Loaded(const std::string& name)
    {
        return {(ZT_TREE "/examples/pictures/" + name).c_str(), 0};
    }

    /// Holds a PNG file against a picture in memory, pixel for pixel.
    static void ExpectSame(const ReadPicture& png, const ZtImageSGI& image)
    {
        ASSERT_EQ(png.width, image.width);
        ASSERT_EQ(png.height, image.height);
        for (int row = 0; row < png.height; ++row)
            for (int column = 0; column < png.width; ++column)
                ASSERT_EQ(
                    png.At(column, row),
                    image.pixels[(png.height - 1 - row) * png.width + column])
                    << column << "," << row;
    }

    static inline TempDir* dir = nullptr;
    static inline int status = -1;
};

int Channel(std::uint32_t pixel, int channel)
{
    return static_cast<int>(pixel >> (24 - 8 * channel) & 0xFF);
}

void ExpectNear(std::uint32_t pixel, std::uint32_t expected, int tolerance)
{
    for (int channel = 0; channel < 4; ++channel)
        EXPECT_NEAR(Channel(pixel, channel), Channel(expected, channel),
                    tolerance)
            << std::hex << pixel << " " << expected;
}

} // namespace

TEST_F(Tour, EndsWellAndLeavesNothingHalfDone)
{
    EXPECT_EQ(status, 0);
    EXPECT_EQ(dir->Read("errors").find("Error"), std::string::npos);

    long files = 0;
    for (const auto& entry :
         std::filesystem::directory_iterator(dir->Path("to look at"))) {
        EXPECT_NE(entry.path().extension(), ".part");
        ++files;
    }
    EXPECT_EQ(files, 12 + 3 + 8 * 2);
}

TEST_F(Tour, SaysWhatItDoesAndHowLongItTook)
{
    std::string errors = dir->Read("errors");

    EXPECT_EQ(errors.find("Writing to to look at\n0. ready, seconds since the "
                          "start: "),
              0u);
    for (const char* part : {"\n1. ", "\n2. ", "\n3. ", "\n4. ",
                             "\n   seconds: ", "\nLook at the PNG files"})
        EXPECT_NE(errors.find(part), std::string::npos) << part;
    EXPECT_NE(dir->Read("output").find("back: 48 x 36 pixels"),
              std::string::npos);
}

TEST_F(Tour, MakesPngFilesOfTheSamePixels)
{
    ExpectSame(Png("hills"), Loaded("hills.rgb"));
    ExpectSame(Png("discs"), Loaded("discs.sgi"));
    ExpectSame(Png("plasma"), Loaded("plasma.rgb"));
    ExpectSame(Png("weave"), Loaded("weave.rgb"));
    ExpectSame(Png("words"), Loaded("words.sgi"));
    ExpectSame(Png("ramp"), Loaded("ramp.sgi"));
    ExpectSame(Png("checker"), Loaded("checker.sgi"));
    ExpectSame(Png("picture"), Loaded("hills.rgb"));
}

TEST_F(Tour, HasTheColoursThatThePicturesWereDrawnWith)
{
    ReadPicture hills = Png("hills");
    EXPECT_FALSE(hills.has_alpha);
    ExpectNear(hills.At(80, 0), 0x2060C0FF, 2); // the sky
    EXPECT_EQ(hills.At(110, 40), 0xFFF0A0FFu);  // the sun
    EXPECT_EQ(hills.At(40, 115), 0x306030FFu);  // the hill on the left
    EXPECT_EQ(hills.At(125, 115), 0x204820FFu); // the hill on the right

    ReadPicture discs = Png("discs");
    EXPECT_TRUE(discs.has_alpha);
    EXPECT_EQ(discs.At(20, 60), 0xD0204080u);
    EXPECT_EQ(discs.At(95, 60), 0x2040D0C0u);
    EXPECT_EQ(discs.At(0, 0) & 0xFF, 0u);

    ReadPicture checker = Png("checker");
    ExpectNear(checker.At(4, 4), 0xCC1A1AFF, 1); // its frame
    ExpectNear(checker.At(0, 0), 0xE6CC99FF, 1);
    ExpectNear(checker.At(14, 2), 0x4D331AFF, 1);

    ReadPicture words = Png("words");
    EXPECT_EQ(words.At(0, 0), 0xFFFFFFFFu);
    EXPECT_NE(std::count(words.pixels.begin(), words.pixels.end(), 0x000000FFu),
              0);
    EXPECT_GT(Channel(Png("ramp").At(80, 60), 0), 250);
    EXPECT_EQ(Png("ramp").At(0, 0), 0x000000FFu);
}

TEST_F(Tour, TakesTheNearestPixelWhenItIsAsked)
{
    ReadPicture hills = Png("hills");
    ReadPicture nearest = Png("nearest");

    ASSERT_EQ(nearest.width, 480);
    ASSERT_EQ(nearest.height, 360);
    for (int row = 0; row < 360; ++row)
        for (int column = 0; column < 480; ++column)
            ASSERT_EQ(nearest.At(column, row), hills.At(column / 3, row / 3));
}

TEST_F(Tour, AveragesAllChannelsWhenItIsAsked)
{
    ReadPicture smooth = Png("smooth");
    ReadPicture thumbnail = Png("thumbnail");

    ASSERT_EQ(smooth.width, 480);
    ASSERT_EQ(smooth.height, 360);
    ExpectNear(smooth.At(331, 121), 0xFFF0A0FF, 2);
    ExpectNear(smooth.At(121, 346), 0x306030FF, 2);
    ASSERT_EQ(thumbnail.width, 48);
    ASSERT_EQ(thumbnail.height, 36);
    // A picture and its thumbnail have the same average colour.
    double sums[2][3] = {};
    const ReadPicture pictures[] = {Png("weave"), thumbnail};
    for (int which = 0; which < 2; ++which)
        for (std::uint32_t pixel : pictures[which].pixels)
            for (int channel = 0; channel < 3; ++channel)
                sums[which][channel] +=
                    Channel(pixel, channel) /
                    static_cast<double>(pictures[which].pixels.size());
    for (int channel = 0; channel < 3; ++channel)
        EXPECT_NEAR(sums[0][channel], sums[1][channel], 1.5);
}

TEST_F(Tour, ShowsThatTheLibrarysAverageLeavesNoRed)
{
    ReadPicture hills = Png("hills");
    ReadPicture redless = Png("redless");

    ASSERT_EQ(redless.pixels.size(), hills.pixels.size());
    for (std::size_t i = 0; i < hills.pixels.size(); ++i)
        ExpectNear(redless.pixels[i], hills.pixels[i] & 0x00FFFFFF, 1);
}

TEST_F(Tour, MakesEveryFrameOfTheSequence)
{
    for (int width = 20; width <= 160; width += 20) {
        std::string digits = std::to_string(width);
        std::string name =
            "grow." + std::string(4 - digits.size(), '0') + digits;
        ReadPicture frame = Png(name);
        EXPECT_EQ(frame.width, width);
        EXPECT_EQ(frame.height, 120);
        ExpectNear(frame.At(width * 110 / 160, 40), 0xFFF0A0FF, 2);

        ExpectSame(
            frame,
            ZtImageSGI(dir->Path("to look at/" + name + ".rgb").c_str(), 0));
    }
}
