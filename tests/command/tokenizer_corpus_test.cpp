#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

#include <gtest/gtest.h>

#include "support/TokenizerDifference.h"

namespace {
TEST(TokenizerCorpus, ReadsEveryInputAsTheLiteralTokenizerDoes)
{
    int inputs = 0;
    for (const auto& entry :
         std::filesystem::directory_iterator(ZT_TOKENIZER_CORPUS)) {
        std::ifstream in(entry.path(), std::ios::binary);
        const std::string text{std::istreambuf_iterator<char>(in), {}};

        EXPECT_EQ(TokenizerDifferenceOn(text), "") << entry.path();
        ++inputs;
    }

    EXPECT_GE(inputs, 18);
}
} // namespace
