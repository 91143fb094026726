#include "core/truncate.h"

#include <cfenv>
#include <cstdint>
#include <limits>

#include <gtest/gtest.h>

using zt_core::truncate_to;

namespace {
constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double not_a_number = std::numeric_limits<double>::quiet_NaN();
} // namespace

static_assert(truncate_to<std::int32_t>(1.5) == 1);

TEST(truncate, TruncatesTowardZero)
{
    EXPECT_EQ(truncate_to<int>(0.99), 0);
    EXPECT_EQ(truncate_to<int>(-0.99), 0);
    EXPECT_EQ(truncate_to<int>(7.9), 7);
    EXPECT_EQ(truncate_to<int>(-7.9), -7);
}

TEST(truncate, TruncatesWhateverTheRoundingModeIs)
{
    const volatile double amount = -7.9;
    for (const int mode : {FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        std::fesetround(mode);
        const int down = truncate_to<int>(amount);
        const int up = truncate_to<int>(-amount);
        std::fesetround(FE_TONEAREST);

        EXPECT_EQ(down, -7);
        EXPECT_EQ(up, 7);
    }
}

TEST(truncate, SaturatesAtTheEndsOfEachType)
{
    EXPECT_EQ(truncate_to<std::int32_t>(2147483647.0), INT32_MAX);
    EXPECT_EQ(truncate_to<std::int32_t>(2147483646.9), INT32_MAX - 1);
    EXPECT_EQ(truncate_to<std::int32_t>(2147483648.0), INT32_MAX);
    EXPECT_EQ(truncate_to<std::int32_t>(-2147483648.9), INT32_MIN);
    EXPECT_EQ(truncate_to<std::int32_t>(infinity), INT32_MAX);
    EXPECT_EQ(truncate_to<std::int32_t>(-infinity), INT32_MIN);
    EXPECT_EQ(truncate_to<std::int16_t>(32768.0), INT16_MAX);
    EXPECT_EQ(truncate_to<std::int16_t>(-40000.0), INT16_MIN);
    EXPECT_EQ(truncate_to<std::int64_t>(9223372036854775807.0), INT64_MAX);
    EXPECT_EQ(truncate_to<std::int64_t>(9223372036854774784.0),
              9223372036854774784);
    EXPECT_EQ(truncate_to<std::int64_t>(-1e300), INT64_MIN);
    EXPECT_EQ(truncate_to<std::uint8_t>(-1.0), 0);
    EXPECT_EQ(truncate_to<std::uint8_t>(255.9), 255);
}

TEST(truncate, TakesNotANumberAsZero)
{
    EXPECT_EQ(truncate_to<int>(not_a_number), 0);
    EXPECT_EQ(truncate_to<std::int64_t>(-not_a_number), 0);
}
