#include <cmath>
#include <cstring>
#include <limits>
#include <sstream>
#include <string>
#include <type_traits>
#include <utility>

#include <gtest/gtest.h>

#include "ZT/math.h"
#include "geometry/components.h"
#include "geometry/samples.h"
#include "support/ErrorTrap.h"

namespace {
constexpr float infinity = std::numeric_limits<float>::infinity();
constexpr float epsilon = std::numeric_limits<float>::epsilon();

template <class Left, class Right, class = void>
constexpr bool multiplies = false;
template <class Left, class Right>
constexpr bool multiplies<
    Left, Right,
    std::void_t<decltype(std::declval<Left>() * std::declval<Right>())>> = true;

template <class Value>
std::string Written(const Value& value)
{
    std::ostringstream stream;
    stream << value;
    return stream.str();
}

} // namespace

// Construction and assignment.

TEST(KvoVec3, StartsAtZero)
{
    EXPECT_EQ(Components(KvoVec3()), (Three{0, 0, 0}));
}

TEST(KvoVec4, StartsAtZero)
{
    EXPECT_EQ(Components(KvoVec4()), (Four{0, 0, 0, 0}));
}

TEST(KvoVec3, CopiesEveryComponent)
{
    const KvoVec3 v(1, 2, 3);

    KvoVec3 copy(v);
    KvoVec3 assigned;
    assigned = v;

    EXPECT_EQ(Components(copy), (Three{1, 2, 3}));
    EXPECT_EQ(Components(assigned), (Three{1, 2, 3}));
}

TEST(KvoVec4, CopiesEveryComponent)
{
    const KvoVec4 v(1, 2, 3, 4);

    KvoVec4 copy(v);
    KvoVec4 assigned;
    assigned = v;

    EXPECT_EQ(Components(copy), (Four{1, 2, 3, 4}));
    EXPECT_EQ(Components(assigned), (Four{1, 2, 3, 4}));
}

TEST(KvoVec3, OneNumberSetsEveryComponent)
{
    EXPECT_EQ(Components(KvoVec3(2)), (Three{2, 2, 2}));
    EXPECT_EQ(Components(KvoVec3(0.5)), (Three{0.5f, 0.5f, 0.5f}));
    EXPECT_EQ(Components(KvoVec3(7L)), (Three{7, 7, 7}));
}

TEST(KvoVec4, OneNumberSetsEveryComponent)
{
    EXPECT_EQ(Components(KvoVec4(2)), (Four{2, 2, 2, 2}));
    EXPECT_EQ(Components(KvoVec4(0.5)), (Four{0.5f, 0.5f, 0.5f, 0.5f}));
}

TEST(KvoVec3, LiteralZeroIsANumberAndNotAPointer)
{
    EXPECT_EQ(Components(KvoVec3(0)), (Three{0, 0, 0}));
    EXPECT_EQ(Components(KvoVec4(0)), (Four{0, 0, 0, 0}));
    EXPECT_FALSE((std::is_constructible_v<KvoVec3, std::nullptr_t>));
    EXPECT_FALSE((std::is_constructible_v<KvoVec3, const double*>));
}

TEST(KvoVec3, TakesTheFirstThreeFloatsOfAnArray)
{
    float changeable[] = {1, 2, 3, 4};
    const float* pointer = changeable + 1;

    EXPECT_EQ(Components(KvoVec3(changeable)), (Three{1, 2, 3}));
    EXPECT_EQ(Components(KvoVec3(pointer)), (Three{2, 3, 4}));
}

TEST(KvoVec4, TakesTheFirstFourFloatsOfAnArray)
{
    const float numbers[] = {1, 2, 3, 4, 5};

    EXPECT_EQ(Components(KvoVec4(numbers)), (Four{1, 2, 3, 4}));
    EXPECT_EQ(Components(KvoVec4(numbers + 1)), (Four{2, 3, 4, 5}));
}

TEST(KvoVec3, NullArrayReadsAsZeros)
{
    const float* none = nullptr;

    EXPECT_EQ(Components(KvoVec3(none)), (Three{0, 0, 0}));
    EXPECT_EQ(Components(KvoVec4(none)), (Four{0, 0, 0, 0}));
}

TEST(KvoVec3, OfFourComponentsDropsWWithoutDividing)
{
    EXPECT_EQ(Components(KvoVec3(KvoVec4(2, 4, 6, 2))), (Three{2, 4, 6}));
}

TEST(KvoVec4, OfThreeComponentsIsAPoint)
{
    EXPECT_EQ(Components(KvoVec4(KvoVec3(1, 2, 3))), (Four{1, 2, 3, 1}));
}

TEST(KvoVec3, AssigningANumberSetsEveryComponent)
{
    KvoVec3 v(1, 2, 3);

    KvoVec3& result = v = 4;

    EXPECT_EQ(Components(v), (Three{4, 4, 4}));
    EXPECT_EQ(&result, &v);
}

TEST(KvoVec4, AssigningANumberSetsEveryComponent)
{
    KvoVec4 v(1, 2, 3, 4);

    KvoVec4& result = v = 0;

    EXPECT_EQ(Components(v), (Four{0, 0, 0, 0}));
    EXPECT_EQ(&result, &v);
}

TEST(KvoVec3, IsAPlainValueOfItsFloats)
{
    const KvoVec3 pair[] = {KvoVec3(1, 2, 3), KvoVec3(4, 5, 6)};
    float numbers[6];

    std::memcpy(numbers, pair, sizeof pair);

    EXPECT_EQ(numbers[5], 6);
    EXPECT_EQ(sizeof(KvoVec4), 4 * sizeof(float));
    EXPECT_FALSE(std::is_polymorphic_v<KvoVec3>);
}

// Comparison.

TEST(KvoVec3, EqualsWhatDiffersByLessThanTheTolerance)
{
    EXPECT_TRUE(KvoVec3(1, 2, 3) == KvoVec3(1, 2, 3.0000001f));
    EXPECT_TRUE(KvoVec3(0, 0, 0) == KvoVec3(1e-7f, -1e-7f, 1e-7f));
}

TEST(KvoVec3, DiffersWhenAnyComponentDoesByAMillionth)
{
    for (int i = 0; i < 3; ++i) {
        KvoVec3 v(1, 2, 3);
        v[i] += 1e-6f;

        EXPECT_FALSE(v == KvoVec3(1, 2, 3)) << i;
        EXPECT_FALSE(KvoVec3(1, 2, 3) == v) << i;
        EXPECT_TRUE(v != KvoVec3(1, 2, 3)) << i;
    }
}

TEST(KvoVec4, DiffersWhenAnyComponentDoesByAMillionth)
{
    for (int i = 0; i < 4; ++i) {
        KvoVec4 v(1, 2, 3, 4);
        v[i] += 2e-6f;

        EXPECT_FALSE(v == KvoVec4(1, 2, 3, 4)) << i;
        EXPECT_TRUE(v != KvoVec4(1, 2, 3, 4)) << i;
    }
    EXPECT_TRUE(KvoVec4(1, 2, 3, 4) == KvoVec4(1, 2, 3.0000001f, 4));
}

TEST(KvoVec3, ToleranceIsStrictOnBothSides)
{
    const float below = std::nextafter(epsilon, 0.0f);

    EXPECT_FALSE(KvoVec3(epsilon, 0, 0) == KvoVec3());
    EXPECT_FALSE(KvoVec3(-epsilon, 0, 0) == KvoVec3());
    EXPECT_TRUE(KvoVec3(below, 0, 0) == KvoVec3());
    EXPECT_TRUE(KvoVec3(-below, 0, 0) == KvoVec3());
    EXPECT_EQ(epsilon, 1.1920929e-07f);
}

TEST(KvoVec3, UnequalIsTheNegationOfEqualForEveryPair)
{
    Samples samples;
    for (int i = 0; i < 10000; ++i) {
        const KvoVec4 a = samples.AnyVec4();
        const KvoVec4 b = samples.AnyVec4();

        EXPECT_EQ(a != b, !(a == b));
        EXPECT_EQ(KvoVec3(a) != KvoVec3(b), !(KvoVec3(a) == KvoVec3(b)));
    }
}

TEST(KvoVec3, NothingEqualsNanOrTheSameInfinity)
{
    EXPECT_FALSE(KvoVec3(NAN) == KvoVec3(NAN));
    EXPECT_FALSE(KvoVec3(infinity) == KvoVec3(infinity));
    EXPECT_TRUE(KvoVec3(infinity) != KvoVec3(infinity));
}

TEST(KvoVec3, ComparesWithANumber)
{
    const KvoVec3 zero;
    const KvoVec4 ones(1);

    EXPECT_TRUE(zero == 0);
    EXPECT_FALSE(zero == 1);
    EXPECT_TRUE(ones == 1.0);
    EXPECT_TRUE(ones != 0);
}

// Indices.

TEST(KvoVec3, IndexGivesTheComponent)
{
    KvoVec3 v(1, 2, 3);
    const KvoVec3& seen = v;

    v[1] = 7;

    EXPECT_EQ(seen[0], 1);
    EXPECT_EQ(seen[1], 7);
    EXPECT_EQ(seen[2], 3);
    EXPECT_EQ(&v[2], &v.z);
}

TEST(KvoVec4, IndexGivesTheComponent)
{
    KvoVec4 v(1, 2, 3, 4);
    const KvoVec4& seen = v;

    v[3] = 7;

    EXPECT_EQ(seen[0], 1);
    EXPECT_EQ(seen[1], 2);
    EXPECT_EQ(seen[2], 3);
    EXPECT_EQ(seen[3], 7);
    EXPECT_EQ(&v[0], &v.x);
}

TEST(KvoVec3, BadIndexWarnsAndGivesTheSharedFloat)
{
    KvoVec3 v(1, 2, 3);
    ErrorTrap reports;

    float& shared = v[3];

    EXPECT_EQ(reports.Text(), "Warning: KvoVec3 - Illegal index [3].\n");
    EXPECT_EQ(reports.reports.at(0).level, 3);
    shared = 5;
    EXPECT_EQ(Components(v), (Three{1, 2, 3}));
}

TEST(KvoVec4, BadIndexWarnsAndGivesTheSharedFloat)
{
    KvoVec4 v(1, 2, 3, 4);
    ErrorTrap reports;

    float& shared = v[-1];

    EXPECT_EQ(reports.Text(), "Warning: KvoVec4 - Illegal index [-1].\n");
    shared = 5;
    EXPECT_EQ(Components(v), (Four{1, 2, 3, 4}));
}

TEST(KvoVec3, AllBadIndicesOfAllVectorsShareOneFloat)
{
    KvoVec3 three;
    KvoVec4 four;
    const KvoVec3 constant3;
    const KvoVec4 constant4;
    ErrorTrap reports;

    float& shared = three[3];
    shared = 42;

    EXPECT_EQ(&three[-1], &shared);
    EXPECT_EQ(&four[4], &shared);
    EXPECT_EQ(constant3[1000], 42);
    EXPECT_EQ(constant4[std::numeric_limits<int>::min()], 42);
    EXPECT_EQ(reports.reports.size(), 5u);
    EXPECT_EQ(reports.reports[3].text,
              "Warning: KvoVec3 - Illegal index [1000].\n");
    EXPECT_EQ(reports.reports[4].text,
              "Warning: KvoVec4 - Illegal index [-2147483648].\n");
}

// Expressions as hosts write them.

TEST(KvoVec3, MixedExpressionsNeedAConversionInWords)
{
    const KvoVec3 three(1, 2, 3);
    const KvoVec4 four(1, 2, 3, 4);

    EXPECT_FALSE((multiplies<KvoVec3, KvoVec4>));
    EXPECT_FALSE((multiplies<KvoVec4, KvoVec3>));
    EXPECT_FALSE((multiplies<KvoMat, KvoQuat>));
    EXPECT_TRUE((multiplies<KvoVec3, KvoVec3>));
    EXPECT_EQ(Components(KvoVec4(three) * four), (Four{1, 4, 9, 4}));
    EXPECT_EQ(Components(three * KvoVec3(four)), (Three{1, 4, 9}));
}

TEST(KvoVec3, IsComputedWhileCompiling)
{
    constexpr KvoVec3 v = 2 * KvoVec3(1, 2, 3) - KvoVec3(1);
    constexpr KvoVec4 w = KvoVec4(v) / 2;

    static_assert(v == KvoVec3(1, 3, 5));
    static_assert(v[1] == 3 && w[3] == 0.5f);
    static_assert(v.Cross(KvoVec3(1, 0, 0)).Dot(v) == 0);
}

// Streams.

TEST(KvoVec3, WritesInBracketsAndLeavesThePrecisionAtTen)
{
    std::ostringstream stream;
    stream.precision(3);

    stream << KvoVec3(1, 2, 3) << ' ' << 0.1f;

    EXPECT_EQ(stream.str(), "[ 1, 2, 3 ] 0.1000000015");
    EXPECT_EQ(stream.precision(), 10);
}

TEST(KvoVec4, WritesInBracketsAndLeavesThePrecisionAtTen)
{
    std::ostringstream stream;
    stream.precision(3);

    stream << KvoVec4(1, -2.5, 0.1f, 4e9f);

    EXPECT_EQ(stream.str(), "[ 1, -2.5, 0.1000000015, 4000000000 ]");
    EXPECT_EQ(stream.precision(), 10);
}

TEST(KvoVec3, WritesThroughTheStreamsOwnFlags)
{
    std::ostringstream stream;

    stream << std::fixed << KvoVec3(1, 2, 3);

    EXPECT_EQ(stream.str(), "[ 1.0000000000, 2.0000000000, 3.0000000000 ]");
}

TEST(KvoVec3, ReadsBareNumbers)
{
    std::istringstream stream(" 1.5\n-2\t3e1 4");
    KvoVec3 v;

    stream >> v;

    EXPECT_EQ(Components(v), (Three{1.5f, -2, 30}));
    float next = 0;
    stream >> next;
    EXPECT_EQ(next, 4);
}

TEST(KvoVec4, ReadsBareNumbers)
{
    std::istringstream stream("1 2 3 4");
    KvoVec4 v;

    stream >> v;

    EXPECT_EQ(Components(v), (Four{1, 2, 3, 4}));
    EXPECT_TRUE(stream.eof());
    EXPECT_FALSE(stream.fail());
}

TEST(KvoVec3, ReadingKeepsTheOldValueWhenTheStreamFails)
{
    for (const char* text :
         {"", "1", "1 2", "1 2 x", "[ 1, 2, 3 ]", "1, 2, 3"}) {
        std::istringstream stream(text);
        KvoVec3 v(7, 8, 9);

        stream >> v;

        EXPECT_EQ(Components(v), (Three{7, 8, 9})) << text;
        EXPECT_TRUE(stream.fail()) << text;
    }
}

TEST(KvoVec4, ReadingKeepsTheOldValueWhenTheStreamFails)
{
    for (const char* text : {"", "1 2 3", "1 2 3 w"}) {
        std::istringstream stream(text);
        KvoVec4 v(6, 7, 8, 9);

        stream >> v;

        EXPECT_EQ(Components(v), (Four{6, 7, 8, 9})) << text;
        EXPECT_TRUE(stream.fail()) << text;
    }
}

TEST(KvoVec3, ReadingFromABadStreamKeepsTheOldValue)
{
    std::istringstream stream("1 2 3");
    stream.setstate(std::ios::badbit);
    KvoVec3 v(7, 8, 9);

    stream >> v;

    EXPECT_EQ(Components(v), (Three{7, 8, 9}));
}

TEST(KvoVec3, ReadsBackTheNumbersThatItWrote)
{
    Samples samples;
    for (int i = 0; i < 500; ++i) {
        const KvoVec4 v = samples.Vec4(1000);
        std::string text = Written(v);
        for (char& character : text)
            if (character == '[' || character == ']' || character == ',')
                character = ' ';
        std::istringstream stream(text);
        KvoVec4 back;

        stream >> back;

        EXPECT_TRUE(SameBits(back, v)) << text;
    }
}
