// Replays what the fuzz harnesses start from, and what they have found.

#include "image/picture_difference.h"

#include <filesystem>
#include <fstream>
#include <iterator>

#include <gtest/gtest.h>

namespace {

using Difference = std::string (*)(const std::string& file);

void ExpectNoDifference(const std::string& harness, Difference difference,
                        int at_least)
{
    int inputs = 0;
    for (const auto& entry :
         std::filesystem::directory_iterator(ZT_FUZZ_CORPUS "/" + harness)) {
        std::ifstream in(entry.path(), std::ios::binary);
        const std::string file{std::istreambuf_iterator<char>(in), {}};

        EXPECT_EQ(difference(file), "") << entry.path();
        ++inputs;
    }

    EXPECT_GE(inputs, at_least);
}

TEST(picture_corpus, SgiImages)
{
    ExpectNoDifference("sgi_image", SgiDifferenceOn, 23);
}

TEST(picture_corpus, PixFiles)
{
    ExpectNoDifference("pix_image", PixDifferenceOn, 12);
}

TEST(picture_corpus, VideoFrames)
{
    ExpectNoDifference("yuv", YuvDifferenceOn, 7);
}

} // namespace
