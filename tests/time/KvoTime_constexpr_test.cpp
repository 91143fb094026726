// What the compiler promises about time values: constant arithmetic, and which
// calls compile at all. Built twice, as C++20 and as the C++17 that hosts may
// still use.

#include <KVO/KvoTime.h>

#include <climits>
#include <type_traits>
#include <utility>

#include <gtest/gtest.h>

// Constants. A rate is named wherever there are frames, for the default rate
// is not a constant.

static_assert(KvoTime().Ticks() == 0);
static_assert(KvoTime(0, 0, 1, 0, 30).Ticks() == 6000);
static_assert(KvoTime(0, 0, 0, 1, 25).Ticks() == 240);
static_assert(KvoTime(1, 0, 0, 0, 30).Ticks() == 21600000);
static_assert(KvoTime(2, 60).Ticks() == 200);
static_assert(KvoTime(2L, 60).Ticks() == 200);
static_assert(KvoTime(1000, 6001).Ticks() == 0);
static_assert(KvoTime::ZERO.Ticks() == 0);
static_assert(KvoTime::FOREVER == KvoTime(48, 0, 0, 0, 30));
static_assert(KvoTime::FOREVER.Wrap() == KvoTime::ZERO);
static_assert(KvoTime::FromTicks(-1).Wrap() == KvoTime(23, 59, 59, 5999, 6000));

constexpr KvoTime one = KvoTime::FromTicks(1);
constexpr KvoTime most = KvoTime::FromTicks(INT_MAX);
constexpr KvoTime least = KvoTime::FromTicks(INT_MIN);

static_assert(one + one == KvoTime::FromTicks(2));
static_assert(one - one == KvoTime::ZERO);
static_assert(-one == KvoTime::FromTicks(-1));
static_assert(one * 3 == KvoTime::FromTicks(3));
static_assert(KvoTime::FromTicks(-7) / 2 == KvoTime::FromTicks(-3));
static_assert(one / 0 == KvoTime::ZERO);
static_assert(most + one == least);
static_assert(least - one == most);
static_assert(-least == least && least / -1 == least && least * -1 == least);
static_assert(least < most && least <= most && most > least && most >= least &&
              least != most);

constexpr KvoTime sum_and_difference()
{
    KvoTime time = one;
    time += most;
    time -= most;
    time.SetTimecode(0, 0, time.Ticks(), 0, 30);
    return time;
}
static_assert(sum_and_difference().Ticks() == 6000);

constexpr int frames_of(KvoTime time, int fps)
{
    int hh = 0;
    int mm = 0;
    int ss = 0;
    int ff = 0;
    time.Timecode(&hh, &mm, &ss, &ff, fps);
    return ((hh * 100 + mm) * 100 + ss) * 100 + ff;
}
static_assert(frames_of(KvoTime(1, 2, 3, 4, 25), 25) == 1020304);
static_assert(frames_of(KvoTime::FromTicks(7000), 30) == 105);

// Calls that two constructors could take.

template <class... Arguments>
constexpr bool makes_a_time = std::is_constructible_v<KvoTime, Arguments...>;

static_assert(makes_a_time<int> && makes_a_time<long> && makes_a_time<short> &&
              makes_a_time<unsigned> && makes_a_time<unsigned long long> &&
              makes_a_time<char> && makes_a_time<bool>);
static_assert(makes_a_time<float> && makes_a_time<double>);
static_assert(makes_a_time<const char*> && makes_a_time<char*> &&
              makes_a_time<decltype(nullptr)>);
static_assert(makes_a_time<long, int> && makes_a_time<float, int> &&
              makes_a_time<double, int> && makes_a_time<const char*, int>);
static_assert(makes_a_time<KvoTime::Unit, float> &&
              makes_a_time<KvoTime::Unit, double> &&
              makes_a_time<KvoTime::Unit, int> &&
              makes_a_time<KvoTime::Unit, long> &&
              makes_a_time<KvoTime::Unit, unsigned>);
// A unit alone, which would be so many frames.
static_assert(!makes_a_time<KvoTime::Unit>);
static_assert(!std::is_convertible_v<KvoTime::Unit, KvoTime>);
static_assert(std::is_convertible_v<int, KvoTime> &&
              std::is_convertible_v<long, KvoTime> &&
              std::is_convertible_v<double, KvoTime>);

template <class Left, class Right, class = void>
constexpr bool can_multiply = false;
template <class Left, class Right>
constexpr bool can_multiply<
    Left, Right,
    std::void_t<decltype(std::declval<Left>() * std::declval<Right>())>> = true;

template <class Left, class Right, class = void>
constexpr bool can_divide = false;
template <class Left, class Right>
constexpr bool can_divide<
    Left, Right,
    std::void_t<decltype(std::declval<Left>() / std::declval<Right>())>> = true;

template <class Left, class Right, class = void>
constexpr bool can_add = false;
template <class Left, class Right>
constexpr bool can_add<
    Left, Right,
    std::void_t<decltype(std::declval<Left>() + std::declval<Right>())>> = true;

static_assert(can_multiply<KvoTime, int> && can_divide<KvoTime, int> &&
              can_multiply<KvoTime, short> && can_divide<KvoTime, long>);
// A factor with a fraction, which would lose it.
static_assert(!can_multiply<KvoTime, double> && !can_divide<KvoTime, double> &&
              !can_multiply<KvoTime, float> && !can_divide<KvoTime, float>);
static_assert(!can_multiply<KvoTime, KvoTime> && !can_divide<KvoTime, KvoTime>);
static_assert(can_add<KvoTime, int> && can_add<int, KvoTime> &&
              can_add<KvoTime, double> && !can_add<KvoTime, KvoTime::Unit>);

#if __cplusplus >= 202002L
static_assert((one <=> one) == std::strong_ordering::equal);
static_assert((least <=> most) == std::strong_ordering::less);
#endif

// The constants above hold when this file compiles; what runs shows that the
// same calls choose the same constructors.
TEST(KvoTimeCalls, LiteralsChooseTheMeaningOfTheirType)
{
    EXPECT_EQ(KvoTime(0).Ticks(), 0);
    EXPECT_EQ(KvoTime(2).Ticks(), 400);
    EXPECT_EQ(KvoTime(2L).Ticks(), 400);
    EXPECT_EQ(KvoTime(2u).Ticks(), 400);
    EXPECT_EQ(KvoTime(2.5).Ticks(), 500);
    EXPECT_EQ(KvoTime(2.5f).Ticks(), 500);
    EXPECT_EQ(KvoTime("0:0:2:0").Ticks(), 12000);
    EXPECT_EQ(KvoTime(KvoTime::seconds, 2).Ticks(), 12000);
    EXPECT_EQ(KvoTime(KvoTime::seconds, 2.5).Ticks(), 15000);
    EXPECT_EQ(KvoTime(nullptr).Ticks(), 0);
}

TEST(KvoTimeCalls, SmallerTypesTakeTheWholeRange)
{
    EXPECT_EQ(KvoTime(static_cast<signed char>(-128), 6000).Ticks(), -128);
    EXPECT_EQ(KvoTime(static_cast<unsigned short>(65535), 6000).Ticks(), 65535);
    EXPECT_EQ(KvoTime(UINT_MAX, 6000).Ticks(), -1);
}
