#include "core/number_text.h"

#include <climits>
#include <cmath>
#include <cstdlib>
#include <limits>
#include <locale>
#include <random>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "support/OtherLocale.h"

namespace {

/// What a stream with its defaults makes of a number, in the classic locale.
template <class Number>
std::string Streamed(Number value)
{
    std::ostringstream out;
    out.imbue(std::locale::classic());
    out << value;
    return out.str();
}

} // namespace

TEST(TextToInt, ReadsWhatAtoiReads)
{
    for (const char* text :
         {"0", "7", "-7", "+7", " \t\n12", "12abc", "007", "0x10", "", "abc",
          "-", "+", "--1", "2147483647", "-2147483648", "1e3", "1.9"})
        EXPECT_EQ(zt_core::text_to_int(text), std::atoi(text)) << text;
}

TEST(TextToInt, KeepsTheLowBitsOfNumbersBeyondInt)
{
    for (const char* text :
         {"2147483648", "4294967296", "4294967295", "-2147483649",
          "9223372036854775807", "-9223372036854775808"})
        EXPECT_EQ(zt_core::text_to_int(text), std::atoi(text)) << text;
    EXPECT_EQ(zt_core::text_to_int("2147483648"), INT_MIN);
    EXPECT_EQ(zt_core::text_to_int("4294967297"), 1);
}

TEST(TextToInt, TakesNumbersBeyondLongAsItsNearestEnd)
{
    EXPECT_EQ(zt_core::text_to_int("99999999999999999999"), -1);
    EXPECT_EQ(zt_core::text_to_int("-99999999999999999999"), 0);
    EXPECT_EQ(zt_core::text_to_int(std::string(100000, '9').c_str()), -1);
}

TEST(TextToInt, OfNullIsZero)
{
    EXPECT_EQ(zt_core::text_to_int(nullptr), 0);
}

TEST(TextToFloat, ReadsWhatAtofReads)
{
    for (const char* text : {"0",
                             "-0",
                             "1",
                             "-2.5",
                             "+.5",
                             "5.",
                             " \t1e3",
                             "1e-3x",
                             "12abc",
                             "",
                             "abc",
                             ".",
                             "-.",
                             "e5",
                             "0x10",
                             "0x1.8p1",
                             "1e",
                             "1e+",
                             "3,5",
                             "123456789.123456789",
                             "4.9e-324",
                             "1e-400",
                             "1.7976931348623157e308"})
        EXPECT_EQ(zt_core::text_to_float(text), std::atof(text)) << text;
    EXPECT_TRUE(std::signbit(zt_core::text_to_float("-0")));
}

TEST(TextToFloat, ReadsInfinityAndNan)
{
    EXPECT_EQ(zt_core::text_to_float("1e400"), HUGE_VAL);
    EXPECT_EQ(zt_core::text_to_float("-1e400"), -HUGE_VAL);
    EXPECT_EQ(zt_core::text_to_float("inf"), HUGE_VAL);
    EXPECT_EQ(zt_core::text_to_float("-Infinity!"), -HUGE_VAL);
    EXPECT_TRUE(std::isnan(zt_core::text_to_float("nan")));
}

TEST(TextToFloat, OfNullIsZero)
{
    EXPECT_EQ(zt_core::text_to_float(nullptr), 0.0);
}

TEST(NumberText, LeavesTheSystemErrorAlone)
{
    errno = ENOENT;

    zt_core::text_to_int("99999999999999999999");
    zt_core::text_to_float("1e400");

    EXPECT_EQ(errno, ENOENT);
}

TEST(IntToText, WritesDecimal)
{
    EXPECT_EQ(zt_core::int_to_text(0), "0");
    EXPECT_EQ(zt_core::int_to_text(-42), "-42");
    EXPECT_EQ(zt_core::int_to_text(INT_MAX), "2147483647");
    EXPECT_EQ(zt_core::int_to_text(INT_MIN), "-2147483648");
}

TEST(FloatToText, WritesSixSignificantDigitsAndNoTrailingZeros)
{
    EXPECT_EQ(zt_core::float_to_text(2.5f), "2.5");
    EXPECT_EQ(zt_core::float_to_text(0.1f), "0.1");
    EXPECT_EQ(zt_core::float_to_text(1000000.0f), "1e+06");
    EXPECT_EQ(zt_core::float_to_text(123456.7f), "123457");
    EXPECT_EQ(zt_core::float_to_text(0.0), "0");
    EXPECT_EQ(zt_core::float_to_text(-0.0), "-0");
    EXPECT_EQ(zt_core::float_to_text(100.0), "100");
}

TEST(FloatToText, WritesWhatAStreamWrites)
{
    std::mt19937_64 random(20260101);
    for (int round = 0; round < 20000; ++round) {
        const std::uint64_t bits = random();
        const double wide = std::bit_cast<double>(bits);
        const auto narrow =
            std::bit_cast<float>(static_cast<std::uint32_t>(bits));
        EXPECT_EQ(zt_core::float_to_text(wide), Streamed(wide));
        EXPECT_EQ(zt_core::float_to_text(narrow), Streamed(narrow));
    }
    for (const double value :
         {HUGE_VAL, -HUGE_VAL, std::numeric_limits<double>::quiet_NaN(),
          std::numeric_limits<double>::denorm_min(),
          std::numeric_limits<double>::max(), 999999.5, 0.0001, 0.00001})
        EXPECT_EQ(zt_core::float_to_text(value), Streamed(value));
}

TEST(NumberText, IsTheSameWhereTheDecimalSignIsAComma)
{
    OtherLocale german("de_DE");
    ASSERT_EQ(std::atof("2,5"), 2.5);

    EXPECT_EQ(zt_core::text_to_float("2.5"), 2.5);
    EXPECT_EQ(zt_core::text_to_float("2,5"), 2.0);
    EXPECT_EQ(zt_core::text_to_float("1.234.567"), 1.234);
    EXPECT_EQ(zt_core::text_to_int("1.234"), 1);
    EXPECT_EQ(zt_core::float_to_text(2.5), "2.5");
    EXPECT_EQ(zt_core::int_to_text(1234567), "1234567");
}
