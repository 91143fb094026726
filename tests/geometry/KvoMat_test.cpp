#include <cmath>
#include <limits>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "KVO/KvoVec.h"
#include "geometry/components.h"
#include "geometry/samples.h"
#include "support/ErrorTrap.h"

namespace {
constexpr float infinity = std::numeric_limits<float>::infinity();
constexpr float epsilon = std::numeric_limits<float>::epsilon();

/// 1 to 16, row by row.
const KvoMat counted(KvoVec4(1, 2, 3, 4), KvoVec4(5, 6, 7, 8),
                     KvoVec4(9, 10, 11, 12), KvoVec4(13, 14, 15, 16));

template <class Operation>
KvoMat Elementwise(const KvoMat& a, const KvoMat& b, Operation operation)
{
    KvoMat result;
    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j)
            result[i][j] = operation(a[i][j], b[i][j]);
    return result;
}

KvoMat Filled(float value)
{
    return KvoMat(KvoVec4(value), KvoVec4(value), KvoVec4(value),
                  KvoVec4(value));
}
} // namespace

// Construction.

TEST(KvoMat, StartsAsTheIdentity)
{
    const KvoMat m;

    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j)
            EXPECT_EQ(m[i][j], i == j ? 1 : 0);
}

TEST(KvoMat, CopiesEveryElement)
{
    KvoMat copy(counted);
    KvoMat assigned;

    KvoMat& result = assigned = counted;

    EXPECT_TRUE(SameBits(copy, counted));
    EXPECT_TRUE(SameBits(assigned, counted));
    EXPECT_EQ(&result, &assigned);
}

TEST(KvoMat, OfThreeRowsIsARotationPart)
{
    const KvoMat m(KvoVec3(1, 2, 3), KvoVec3(4, 5, 6), KvoVec3(7, 8, 9));

    EXPECT_EQ(Components(m[0]), (Four{1, 2, 3, 0}));
    EXPECT_EQ(Components(m[1]), (Four{4, 5, 6, 0}));
    EXPECT_EQ(Components(m[2]), (Four{7, 8, 9, 0}));
    EXPECT_EQ(Components(m[3]), (Four{0, 0, 0, 1}));
}

TEST(KvoMat, OfFourShortRowsHasATranslation)
{
    const KvoMat m(KvoVec3(1, 2, 3), KvoVec3(4, 5, 6), KvoVec3(7, 8, 9),
                   KvoVec3(10, 11, 12));

    EXPECT_EQ(Components(m[0]), (Four{1, 2, 3, 0}));
    EXPECT_EQ(Components(m[2]), (Four{7, 8, 9, 0}));
    EXPECT_EQ(Components(m[3]), (Four{10, 11, 12, 1}));
}

TEST(KvoMat, OfFourRowsTakesThemUnchanged)
{
    EXPECT_EQ(Components(counted[0]), (Four{1, 2, 3, 4}));
    EXPECT_EQ(Components(counted[1]), (Four{5, 6, 7, 8}));
    EXPECT_EQ(Components(counted[2]), (Four{9, 10, 11, 12}));
    EXPECT_EQ(Components(counted[3]), (Four{13, 14, 15, 16}));
}

TEST(KvoMat, TakesSixteenNumbersRowByRow)
{
    float flat[16];
    float rows[4][4];
    double flat_double[16];
    double rows_double[4][4];
    for (int i = 0; i < 16; ++i) {
        flat[i] = rows[i / 4][i % 4] = static_cast<float>(i + 1);
        flat_double[i] = rows_double[i / 4][i % 4] = i + 1;
    }
    const float* pointer = flat;

    EXPECT_TRUE(SameBits(KvoMat(flat), counted));
    EXPECT_TRUE(SameBits(KvoMat(pointer), counted));
    EXPECT_TRUE(SameBits(KvoMat(rows), counted));
    EXPECT_TRUE(SameBits(KvoMat(flat_double), counted));
    EXPECT_TRUE(SameBits(KvoMat(rows_double), counted));
}

TEST(KvoMat, RoundsDoublesToFloat)
{
    const double numbers[16] = {0.1, 1.0 / 3, 1e300, 16777217};

    const KvoMat m(numbers);

    EXPECT_EQ(m[0][0], 0.1f);
    EXPECT_EQ(m[0][1], 1.0f / 3);
    EXPECT_EQ(m[0][2], infinity);
    EXPECT_EQ(m[0][3], 16777216);
}

TEST(KvoMat, NullArraysReadAsZeros)
{
    const float(*rows)[4] = nullptr;
    const double(*rows_double)[4] = nullptr;

    EXPECT_TRUE(SameBits(KvoMat(static_cast<float*>(nullptr)), Filled(0)));
    EXPECT_TRUE(SameBits(KvoMat(static_cast<double*>(nullptr)), Filled(0)));
    EXPECT_TRUE(SameBits(KvoMat(rows), Filled(0)));
    EXPECT_TRUE(SameBits(KvoMat(rows_double), Filled(0)));
}

// Elements.

TEST(KvoMat, IndexGivesTheRow)
{
    KvoMat m = counted;
    const KvoMat& seen = m;

    m[2][3] = 99;

    EXPECT_EQ(seen[2][3], 99);
    EXPECT_EQ(&m[3], &m.rows[3]);
    EXPECT_EQ(&seen[0], &m.rows[0]);
}

TEST(KvoMat, BadIndexWarnsAndGivesTheSharedRow)
{
    KvoMat m = counted;
    const KvoMat other;
    ErrorTrap reports;

    KvoVec4& shared = m[4];
    shared = 42;

    EXPECT_EQ(&m[-1], &shared);
    EXPECT_EQ(&other[1000], &shared);
    EXPECT_EQ(other[-7][2], 42);
    EXPECT_EQ(reports.Text(), "Warning: KvoMat - Illegal index [4].\n"
                              "Warning: KvoMat - Illegal index [-1].\n"
                              "Warning: KvoMat - Illegal index [1000].\n"
                              "Warning: KvoMat - Illegal index [-7].\n");
    EXPECT_EQ(reports.reports.at(0).level, 3);
    EXPECT_TRUE(SameBits(m, counted));
}

TEST(KvoMat, BadColumnIsTheRowsBusiness)
{
    KvoMat m;
    ErrorTrap reports;

    m[0][4] = 3;

    EXPECT_EQ(reports.Text(), "Warning: KvoVec4 - Illegal index [4].\n");
    EXPECT_TRUE(SameBits(m, KvoMat()));
}

TEST(KvoMat, ExtractPosReadsTheTranslation)
{
    KvoVec3 position;

    counted.ExtractPos(position);

    EXPECT_EQ(Components(position), (Three{13, 14, 15}));
}

TEST(KvoMat, SetPosChangesTheTranslationAndNothingElse)
{
    KvoMat m = counted;
    KvoMat want = counted;
    want[3] = KvoVec4(20, 21, 22, 16);

    KvoMat& result = m.SetPos(KvoVec3(20, 21, 22));

    EXPECT_TRUE(SameBits(m, want));
    EXPECT_EQ(&result, &m);
}

// Comparison.

TEST(KvoMat, EqualsWithinTheToleranceOfEachElement)
{
    const KvoMat m = Filled(0);
    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j) {
            KvoMat close = m;
            KvoMat apart = m;
            close[i][j] = std::nextafter(epsilon, 0.0f);
            apart[i][j] = epsilon;

            EXPECT_TRUE(close == m);
            EXPECT_FALSE(close != m);
            EXPECT_FALSE(apart == m);
            EXPECT_TRUE(apart != m);
        }
}

TEST(KvoMat, UnequalIsTheNegationOfEqual)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoMat a = samples.AnyMat();
        const KvoMat b = i % 2 ? a : samples.AnyMat();

        EXPECT_EQ(a != b, !(a == b));
    }
}

// Operators of elements.

TEST(KvoMat, TransposeExchangesRowsAndColumns)
{
    const KvoMat turned = counted.Transpose();

    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j)
            EXPECT_EQ(turned[i][j], counted[j][i]);
    EXPECT_TRUE(SameBits(~counted, turned));
    EXPECT_TRUE(SameBits(~turned, counted));
}

TEST(KvoMat, MinusNegatesEveryElement)
{
    const KvoMat m = -counted;

    for (int i = 0; i < 4; ++i)
        EXPECT_EQ(Components(m[i]), Components(-counted[i]));
}

TEST(KvoMat, SumsAndDifferencesGoElementByElement)
{
    Samples samples;
    const KvoMat a = samples.Mat();
    const KvoMat b = samples.Mat();
    const KvoMat sum =
        Elementwise(a, b, [](float x, float y) { return x + y; });
    const KvoMat difference =
        Elementwise(a, b, [](float x, float y) { return x - y; });
    KvoMat added = a;
    KvoMat subtracted = a;

    EXPECT_EQ(&(added += b), &added);
    EXPECT_EQ(&(subtracted -= b), &subtracted);

    EXPECT_TRUE(SameBits(a + b, sum));
    EXPECT_TRUE(SameBits(a - b, difference));
    EXPECT_TRUE(SameBits(added, sum));
    EXPECT_TRUE(SameBits(subtracted, difference));
}

TEST(KvoMat, ANumberMeetsEveryElementFromItsOwnSide)
{
    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j) {
            const float element = counted[i][j];

            EXPECT_EQ((counted + 2)[i][j], element + 2);
            EXPECT_EQ((2 + counted)[i][j], 2 + element);
            EXPECT_EQ((counted - 2)[i][j], element - 2);
            EXPECT_EQ((2 - counted)[i][j], 2 - element);
            EXPECT_EQ((counted * 2)[i][j], element * 2);
            EXPECT_EQ((2 * counted)[i][j], element * 2);
            EXPECT_EQ((counted * 0.5)[i][j], element / 2);
            EXPECT_EQ((0.5 * counted)[i][j], element / 2);
            EXPECT_EQ((counted / 3)[i][j], element / 3);
            EXPECT_EQ((3 / counted)[i][j], 3 / element);
        }
}

TEST(KvoMat, DividingByTheNumberZeroWarnsOnceAndGivesZero)
{
    ErrorTrap reports;

    EXPECT_TRUE(SameBits(counted / 0, Filled(0)));
    EXPECT_EQ(reports.Text(), "Warning: KvoMat - Division by zero.\n");
    EXPECT_EQ(reports.reports.at(0).level, 3);

    EXPECT_TRUE(SameBits(counted / -0.0f, Filled(0)));
    EXPECT_EQ(reports.reports.size(), 2u);
}

TEST(KvoMat, ANumberDividedByZeroElementsGivesInfinities)
{
    ErrorTrap reports;

    const KvoMat m = 1 / KvoMat();

    EXPECT_EQ(Components(m[0]), (Four{1, infinity, infinity, infinity}));
    EXPECT_EQ(Components(m[3]), (Four{infinity, infinity, infinity, 1}));
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoMat, DividedByAMatrixIsTheProductPatternWithDivisions)
{
    const KvoMat twos = Filled(2);

    EXPECT_EQ(Components((counted / twos)[0]), (Four{5, 5, 5, 5}));
    EXPECT_EQ(Components((counted / twos)[3]), (Four{29, 29, 29, 29}));

    Samples samples;
    for (int i = 0; i < 5000; ++i) {
        const KvoMat a = samples.AnyMat();
        const KvoMat b = samples.AnyMat();
        KvoMat want;
        for (int r = 0; r < 4; ++r)
            for (int c = 0; c < 4; ++c)
                want[r][c] = a[r][0] / b[0][c] + a[r][1] / b[1][c] +
                             a[r][2] / b[2][c] + a[r][3] / b[3][c];
        KvoMat divided = a;

        EXPECT_EQ(&(divided /= b), &divided);

        EXPECT_TRUE(SameBits(a / b, want));
        EXPECT_TRUE(SameBits(divided, want));
    }
}

TEST(KvoMat, DividedByAMatrixDoesNotLookForZeros)
{
    ErrorTrap reports;

    const KvoMat m = Filled(1) / KvoMat();

    EXPECT_EQ(Components(m[0]), (Four{infinity, infinity, infinity, infinity}));
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoMat, IsComputedWhileCompiling)
{
    constexpr KvoMat moved =
        KvoMat().InitTrans(1, 2, 3) * KvoMat().InitScale(2);
    constexpr KvoVec4 point = KvoVec4(1, 1, 1, 1) * moved;

    static_assert(moved.Det() == 8);
    static_assert(point == KvoVec4(4, 6, 8, 1));
    static_assert((moved * point)[0] == 8.0f / 81);
}

// Streams.

TEST(KvoMat, WritesFourRowsAndLeavesThePrecisionAtTen)
{
    std::ostringstream stream;

    stream << KvoMat() << 0.1f;

    EXPECT_EQ(stream.str(), "[ 1, 0, 0, 0 ]\n"
                            "[ 0, 1, 0, 0 ]\n"
                            "[ 0, 0, 1, 0 ]\n"
                            "[ 0, 0, 0, 1 ]\n"
                            "0.1000000015");
    EXPECT_EQ(stream.precision(), 10);
}

TEST(KvoMat, ReadsFourRowsOfBareNumbers)
{
    std::istringstream stream("1 2 3 4\n5 6 7 8\n9 10 11 12\n13 14 15 16");
    KvoMat m;

    stream >> m;

    EXPECT_TRUE(SameBits(m, counted));
    EXPECT_FALSE(stream.fail());
}

TEST(KvoMat, ReadingKeepsTheOldValueWhenTheStreamFails)
{
    for (const char* text : {"", "1 2 3", "1 2 3 4 5 6 7 8 9 10 11 12 13 14 15",
                             "1 2 3 4 x", "[ 1, 0, 0, 0 ]"}) {
        std::istringstream stream(text);
        KvoMat m = counted;

        stream >> m;

        EXPECT_TRUE(SameBits(m, counted)) << text;
        EXPECT_TRUE(stream.fail()) << text;
    }
}

// The angles of a rotation.

TEST(KvoMat, RotationsFindsTheAnglesThatWerePutIn)
{
    Samples samples;
    for (int i = 0; i < 5000; ++i) {
        const KvoVec3 angles(samples.Number(179), samples.Number(85),
                             samples.Number(179));
        const KvoMat m =
            KvoMat().InitXrot(angles.x).Yrot(angles.y, 1).Zrot(angles.z, 1);

        const KvoVec3 found = m.Rotations();

        EXPECT_NEAR(found.x, angles.x, 1e-2);
        EXPECT_NEAR(found.y, angles.y, 1e-2);
        EXPECT_NEAR(found.z, angles.z, 1e-2);
    }
}

TEST(KvoMat, RotationsReadsSixElementsAndUsesAFloatConstant)
{
    Samples samples;
    for (int i = 0; i < 1000; ++i) {
        KvoMat m = samples.Mat();
        m[0][2] = samples.Number(1);

        const KvoVec3 found = m.Rotations();

        EXPECT_EQ(found.x, atan2f(m[1][2], m[2][2]) * 57.29578f);
        EXPECT_EQ(found.y, asinf(-m[0][2]) * 57.29578f);
        EXPECT_EQ(found.z, atan2f(m[0][1], m[0][0]) * 57.29578f);
    }
}

TEST(KvoMat, RotationsGivesTheCosineOfTheMiddleAngleToo)
{
    const KvoMat m = KvoMat().InitYrot(60);
    KvoVec3 angles(7);
    float cosine = 7;

    m.Rotations(angles, cosine);

    EXPECT_TRUE(SameBits(angles, m.Rotations()));
    EXPECT_NEAR(angles.y, 60, 1e-4);
    EXPECT_NEAR(cosine, 0.5, 1e-6);
}

TEST(KvoMat, RotationsOneByOneAreThoseOfTheVector)
{
    const KvoMat m = KvoMat().InitXrot(10).Yrot(20, 1).Zrot(30, 1);
    float x = 0, y = 0, z = 0;

    m.Rotations(x, y, z);

    EXPECT_TRUE(SameBits(KvoVec3(x, y, z), m.Rotations()));
    EXPECT_NEAR(x, 10, 1e-4);
    EXPECT_NEAR(y, 20, 1e-4);
    EXPECT_NEAR(z, 30, 1e-4);
}

TEST(KvoMat, RotationsAtNinetyDegreesDivideTheTurnAsBefore)
{
    // No float is exactly a right angle, so its cosine is not exactly 0.
    KvoMat m(KvoVec3(0, 0, -1), KvoVec3(0, 1, 0), KvoVec3(1, 0, 0));
    KvoVec3 angles;
    float cosine = 0;

    m.Rotations(angles, cosine);

    EXPECT_NE(cosine, 0);
    EXPECT_EQ(Components(angles), (Three{0, asinf(1) * 57.29578f, 0}));
}
