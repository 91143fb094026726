// The example sound.zt runs as a program on a machine without a sound device;
// what it leaves behind is read by the library and by libpng.

#include "common/png_reading.h"
#include "support/TempDir.h"

#include <KVO/KvoSound.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <set>

#include <gtest/gtest.h>

namespace {

/// Runs the example once for all tests.
class SoundExample : public testing::Test
{
protected:
    static void SetUpTestSuite()
    {
        dir = new TempDir;
        dir->Write("no_device.conf", "pcm.default { type none_such }\n");
        const std::string command =
            "cd '" + dir->Path("") +
            "' && unset ZT_AUDIO && ALSA_CONFIG_PATH=no_device.conf "
            "'" ZTSH_PROGRAM "' '" ZT_TREE
            "/examples/sound.zt' >output 2>errors </dev/null";
        status = std::system(command.c_str());
    }

    static void TearDownTestSuite()
    {
        delete dir;
        dir = nullptr;
    }

    static inline TempDir* dir = nullptr;
    static inline int status = -1;
};

} // namespace

TEST_F(SoundExample, EndsWellOnTheSilentDevice)
{
    EXPECT_EQ(status, 0);
    EXPECT_EQ(dir->Read("errors").find("Error"), std::string::npos);
    EXPECT_NE(dir->Read("errors").find("Played as it is, then backward"),
              std::string::npos);
    EXPECT_NE(dir->Read("output").find("device: null\n"), std::string::npos);
}

TEST_F(SoundExample, LeavesThePartThatWasCutFadedAtBothEnds)
{
    const KvoSound whole(ZT_TREE "/examples/sounds/strum.wav");
    const KvoSound part(dir->Path("ztsh-sound/strum.aifc").c_str());

    ASSERT_EQ(whole.frames, 16000);
    ASSERT_EQ(part.frames, 8001);
    EXPECT_EQ(part.rate, 8000);
    EXPECT_EQ(part.channels, 1);
    // 0:12 is 3200 frames; in the middle the window leaves all there is.
    EXPECT_NEAR(part.samples[4000], whole.samples[3200 + 4000], 2);
    for (const long frame : {0L, 1L, 7999L, 8000L})
        EXPECT_NEAR(part.samples[frame], 0, 4) << frame;
    EXPECT_GT(part.Volume(), 0.01F);
    EXPECT_LT(part.Volume(), whole.Volume());
}

TEST_F(SoundExample, DrawsItsWaveform)
{
    const ReadPicture drawn = ReadPng(dir->Path("ztsh-sound/strum.png"));

    EXPECT_EQ(drawn.width, 480);
    EXPECT_EQ(drawn.height, 120);
    // Faded at both ends and loud in between: columns of few and of many
    // pixels that are not the background.
    const std::uint32_t background = drawn.At(0, 0);
    std::vector<int> heights(static_cast<std::size_t>(drawn.width));
    for (int column = 0; column < drawn.width; ++column)
        for (int row = 0; row < drawn.height; ++row)
            heights[static_cast<std::size_t>(column)] +=
                drawn.At(column, row) != background;
    const int loudest = *std::max_element(heights.begin(), heights.end());
    EXPECT_GT(loudest, 20);
    EXPECT_LT(heights.front(), loudest / 2);
    EXPECT_LT(heights.back(), loudest / 2);
}
