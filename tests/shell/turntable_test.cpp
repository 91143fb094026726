// The turn-table runs as a program, in the shell itself and in workers; the
// pictures that it leaves behind are read with libpng.

#include "common/png_reading.h"
#include "support/TempDir.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>

#include <gtest/gtest.h>

namespace {

constexpr std::uint32_t background = 0x101418FF;
constexpr std::uint32_t floor_colour = 0x304050FF;
constexpr std::uint32_t house_before = 0x607080FF;
constexpr std::uint32_t house_after = 0xFFC040FF;

/// Runs the turn-table once with one job and once with three.
class Turntable : public testing::Test
{
protected:
    static void SetUpTestSuite()
    {
        dir = new TempDir;
        status = Run("1", "alone") + Run("3", "together");
    }

    static void TearDownTestSuite()
    {
        delete dir;
        dir = nullptr;
    }

    static int Run(const std::string& jobs, const std::string& out)
    {
        std::string command = "cd '" + dir->Path("") +
                              "' && '" ZTSH_PROGRAM "' --jobs " + jobs +
                              " -c 'Set out " + out +
                              "; Set step 90' '" ZT_TREE
                              "/examples/turntable.zt' >>output 2>>errors "
                              "</dev/null";
        return std::system(command.c_str());
    }

    static ReadPicture Png(const std::string& name)
    {
        return ReadPng(dir->Path("together/" + name + ".png"));
    }

    static long Count(const ReadPicture& picture, std::uint32_t colour)
    {
        return std::count(picture.pixels.begin(), picture.pixels.end(), colour);
    }

    static inline TempDir* dir = nullptr;
    static inline int status = -1;
};

} // namespace

TEST_F(Turntable, EndsWellWithAPictureForEachFrame)
{
    EXPECT_EQ(status, 0);
    EXPECT_EQ(dir->Read("errors"), "");

    long files = 0;
    for (const auto& entry :
         std::filesystem::directory_iterator(dir->Path("together")))
        files += entry.path().extension() == ".png" ? 1 : 100;
    EXPECT_EQ(files, 5);
}

TEST_F(Turntable, MakesTheSamePicturesInWorkers)
{
    for (const char* name : {"turn.0000.png", "turn.0090.png", "turn.0180.png",
                             "turn.0270.png", "above.png"})
        EXPECT_EQ(dir->Read(std::string("alone/") + name),
                  dir->Read(std::string("together/") + name))
            << name;
}

TEST_F(Turntable, ShowsFloorAxesAndTheHouseBeforeAndAfter)
{
    for (const char* name :
         {"turn.0000", "turn.0090", "turn.0180", "turn.0270"}) {
        ReadPicture picture = Png(name);
        EXPECT_EQ(picture.width, 240);
        EXPECT_EQ(picture.height, 240);
        EXPECT_FALSE(picture.has_alpha);
        EXPECT_EQ(picture.At(0, 0), background) << name;
        EXPECT_GT(Count(picture, background), 240 * 240 / 2) << name;
        for (std::uint32_t colour :
             {floor_colour, house_before, house_after, 0x40E040FFu})
            EXPECT_GT(Count(picture, colour), 20) << name << " " << colour;
    }
}

TEST_F(Turntable, TheAxisThatPointsUpIsAtTheMiddleAndStays)
{
    for (const char* name : {"turn.0000", "turn.0090", "turn.0180"}) {
        ReadPicture picture = Png(name);
        long upright = 0;
        for (int row = 0; row < 120; ++row)
            upright += picture.At(119, row) == 0x40E040FF ||
                       picture.At(120, row) == 0x40E040FF;
        EXPECT_GT(upright, 20) << name;
    }
}

TEST_F(Turntable, TheHouseTurns)
{
    ReadPicture front = Png("turn.0000");

    EXPECT_NE(front.pixels, Png("turn.0090").pixels);
    EXPECT_NE(front.pixels, Png("turn.0180").pixels);
}
