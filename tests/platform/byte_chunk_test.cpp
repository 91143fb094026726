#include "platform/byte_chunk.h"

#include <cstring>
#include <random>

#include <gtest/gtest.h>

using zt_platform::chunk_bytes;

namespace {
constexpr char fixed[] = {'"', '\\'};
constexpr char wanted[] = {';', static_cast<char>(0xE9)};

zt_platform::ByteChunks<2>& Wanted()
{
    static char chunks[2][chunk_bytes];
    for (int i = 0; i < 2; ++i)
        std::memset(chunks[i], wanted[i], chunk_bytes);
    return chunks;
}

bool IsOne(char byte)
{
    return static_cast<unsigned char>(byte) <= ' ' || byte == fixed[0] ||
           byte == fixed[1] || byte == wanted[0] || byte == wanted[1];
}

std::uint32_t Found(const char* chunk)
{
    return zt_platform::find_low_in_chunk(chunk, ' ') |
           zt_platform::find_in_chunk(chunk, fixed, Wanted());
}
} // namespace

TEST(ByteChunk, FindsEveryByteValueInEveryPlaceAndNoOther)
{
    for (int place = 0; place < chunk_bytes; ++place)
        for (int value = 0; value < 256; ++value) {
            char chunk[chunk_bytes];
            std::memset(chunk, 'x', sizeof chunk);
            chunk[place] = static_cast<char>(value);

            EXPECT_EQ(Found(chunk), IsOne(chunk[place]) ? 1U << place : 0U)
                << value << " at " << place;
        }
}

TEST(ByteChunk, FindsAllOfSeveralBytes)
{
    std::mt19937 random(7);
    for (int round = 0; round < 10000; ++round) {
        char chunk[chunk_bytes];
        std::uint32_t expected = 0;
        for (int i = 0; i < chunk_bytes; ++i) {
            chunk[i] = static_cast<char>(random());
            expected |= std::uint32_t{IsOne(chunk[i])} << i;
        }

        EXPECT_EQ(Found(chunk), expected);
    }
}
