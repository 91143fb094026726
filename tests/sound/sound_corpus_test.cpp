// Replays what the fuzz harness starts from, and what it has found.

#include "sound/sound_difference.h"

#include <filesystem>
#include <fstream>
#include <iterator>

#include <gtest/gtest.h>

TEST(sound_corpus, SoundFiles)
{
    int inputs = 0;
    for (const auto& entry :
         std::filesystem::directory_iterator(ZT_FUZZ_CORPUS "/sound_file")) {
        std::ifstream in(entry.path(), std::ios::binary);
        const std::string file{std::istreambuf_iterator<char>(in), {}};

        EXPECT_EQ(SoundDifferenceOn(file), "") << entry.path();
        ++inputs;
    }

    EXPECT_GE(inputs, 14);
}
