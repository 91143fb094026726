#include <cmath>
#include <limits>

#include <gtest/gtest.h>

#include "KVO/KvoVec.h"
#include "geometry/components.h"
#include "geometry/samples.h"
#include "support/ErrorTrap.h"

namespace {
constexpr float infinity = std::numeric_limits<float>::infinity();
} // namespace

// Compound assignment.

TEST(KvoVec3, CompoundsWorkInPlaceComponentByComponent)
{
    KvoVec3 v(1, 2, 3);

    EXPECT_EQ(&(v += KvoVec3(10, 20, 30)), &v);
    EXPECT_EQ(Components(v), (Three{11, 22, 33}));
    EXPECT_EQ(&(v -= KvoVec3(1, 2, 3)), &v);
    EXPECT_EQ(Components(v), (Three{10, 20, 30}));
    EXPECT_EQ(&(v *= KvoVec3(1, 2, 3)), &v);
    EXPECT_EQ(Components(v), (Three{10, 40, 90}));
    EXPECT_EQ(&(v /= KvoVec3(2, 4, 3)), &v);
    EXPECT_EQ(Components(v), (Three{5, 10, 30}));
}

TEST(KvoVec4, CompoundsWorkInPlaceComponentByComponent)
{
    KvoVec4 v(1, 2, 3, 4);

    EXPECT_EQ(&(v += KvoVec4(10, 20, 30, 40)), &v);
    EXPECT_EQ(Components(v), (Four{11, 22, 33, 44}));
    EXPECT_EQ(&(v -= KvoVec4(1, 2, 3, 4)), &v);
    EXPECT_EQ(Components(v), (Four{10, 20, 30, 40}));
    EXPECT_EQ(&(v *= KvoVec4(1, 2, 3, 4)), &v);
    EXPECT_EQ(Components(v), (Four{10, 40, 90, 160}));
    EXPECT_EQ(&(v /= KvoVec4(2, 4, 3, 8)), &v);
    EXPECT_EQ(Components(v), (Four{5, 10, 30, 20}));
}

TEST(KvoVec3, CompoundsTakeNumbersAndTheVectorItself)
{
    KvoVec3 v(1, 2, 4);
    const KvoVec3& itself = v;

    v *= 2;
    v += 1;
    v -= 0.5;
    EXPECT_EQ(Components(v), (Three{2.5f, 4.5f, 8.5f}));
    v /= itself;
    EXPECT_EQ(Components(v), (Three{1, 1, 1}));
    v -= itself;
    EXPECT_EQ(Components(v), (Three{0, 0, 0}));
}

TEST(KvoVec3, CompoundDivisionDoesNotLookForZeros)
{
    KvoVec3 v(1, 2, 0);
    ErrorTrap reports;

    v /= KvoVec3(1, 0, 0);

    EXPECT_EQ(v.x, 1);
    EXPECT_EQ(v.y, infinity);
    EXPECT_TRUE(std::isnan(v.z));
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoVec4, CompoundDivisionDoesNotLookForZeros)
{
    KvoVec4 v(1, 2, -3, 0);
    ErrorTrap reports;

    v /= 0;

    EXPECT_EQ(v.y, infinity);
    EXPECT_EQ(v.z, -infinity);
    EXPECT_TRUE(std::isnan(v.w));
    EXPECT_EQ(reports.Text(), "");
}

// Products, lengths, directions.

TEST(KvoVec3, DotSumsTheProducts)
{
    EXPECT_EQ(KvoVec3(1, 2, 3).Dot(KvoVec3(4, 5, 6)), 32);
}

TEST(KvoVec4, DotSumsFourProducts)
{
    EXPECT_EQ(KvoVec4(1, 2, 3, 4).Dot(KvoVec4(4, 5, 6, 7)), 60);
}

TEST(KvoVec3, DotSumsFromLeftToRight)
{
    // 1 is lost next to 2 to the power 24, unless it comes after the large
    // ones have gone.
    EXPECT_EQ(KvoVec3(1, 16777216, -16777216).Dot(1), 0);
    EXPECT_EQ(KvoVec3(16777216, -16777216, 1).Dot(1), 1);
    EXPECT_EQ(KvoVec4(1, 16777216, -16777216, 1).Dot(1), 1);
}

TEST(KvoVec3, CrossIsThePerpendicularOfTheTwo)
{
    EXPECT_EQ(Components(KvoVec3(1, 0, 0).Cross(KvoVec3(0, 1, 0))),
              (Three{0, 0, 1}));
    EXPECT_EQ(Components(KvoVec3(1, 2, 3).Cross(KvoVec3(4, 5, 7))),
              (Three{-1, 5, -3}));
}

TEST(KvoVec4, CrossLeavesWOutAndGivesZeroThere)
{
    EXPECT_EQ(Components(KvoVec4(1, 2, 3, 9).Cross(KvoVec4(4, 5, 7, 9))),
              (Four{-1, 5, -3, 0}));
}

TEST(KvoVec3, CrossIsPerpendicularToBothForRandomVectors)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 a = samples.Vec3();
        const KvoVec3 b = samples.Vec3();

        const KvoVec3 c = a.Cross(b);

        EXPECT_NEAR(c.Dot(a), 0, 1e-5);
        EXPECT_NEAR(c.Dot(b), 0, 1e-5);
        EXPECT_NEAR(c.MagSquared(),
                    double(a.MagSquared()) * b.MagSquared() -
                        double(a.Dot(b)) * a.Dot(b),
                    1e-3);
    }
}

TEST(KvoVec3, MagIsTheLength)
{
    EXPECT_EQ(KvoVec3(2, 3, 6).Mag(), 7);
    EXPECT_EQ(KvoVec3(2, 3, 6).MagSquared(), 49);
    EXPECT_EQ(KvoVec3().Mag(), 0);
}

TEST(KvoVec4, MagTakesAllFourComponents)
{
    EXPECT_EQ(KvoVec4(1, 3, 3, 9).Mag(), 10);
    EXPECT_EQ(KvoVec4(1, 3, 3, 9).MagSquared(), 100);
}

TEST(KvoVec3, MagIsTheRootOfTheSumInFloat)
{
    Samples samples;
    for (int i = 0; i < 1000; ++i) {
        const KvoVec3 v = samples.Vec3(100);
        const double exact = std::sqrt(double(v.x) * v.x + double(v.y) * v.y +
                                       double(v.z) * v.z);

        EXPECT_NEAR(v.Mag(), exact, exact * 2e-7);
        EXPECT_EQ(v.Mag(), sqrtf(v.x * v.x + v.y * v.y + v.z * v.z));
    }
}

TEST(KvoVec3, DirHasLengthOneAndLeavesTheVector)
{
    const KvoVec3 v(0, 3, 4);

    EXPECT_EQ(Components(v.Dir()), (Three{0, 0.6f, 0.8f}));
    EXPECT_EQ(Components(v), (Three{0, 3, 4}));
}

TEST(KvoVec3, DirOfZeroIsZero)
{
    ErrorTrap reports;

    EXPECT_EQ(Components(KvoVec3().Dir()), (Three{0, 0, 0}));
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoVec4, DirHasLengthOneInFourDimensions)
{
    EXPECT_EQ(Components(KvoVec4(1, 1, 1, 1).Dir()),
              (Four{0.5f, 0.5f, 0.5f, 0.5f}));
}

TEST(KvoVec4, DirOfZeroIsNotGuarded)
{
    ErrorTrap reports;

    const KvoVec4 v = KvoVec4().Dir();

    for (int i = 0; i < 4; ++i)
        EXPECT_TRUE(std::isnan(v[i])) << i;
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoVec3, UnitDividesInPlaceByTheLength)
{
    KvoVec3 v(0, 3, 4);

    KvoVec3& result = v.Unit();

    EXPECT_EQ(Components(v), (Three{0, 0.6f, 0.8f}));
    EXPECT_EQ(&result, &v);
}

TEST(KvoVec3, UnitLeavesLengthZeroAndOne)
{
    ErrorTrap reports;

    EXPECT_EQ(Components(KvoVec3().Unit()), (Three{0, 0, 0}));
    EXPECT_EQ(Components(KvoVec3(0, -1, 0).Unit()), (Three{0, -1, 0}));
    EXPECT_EQ(Components(KvoVec4().Unit()), (Four{0, 0, 0, 0}));
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoVec4, UnitDividesInPlaceByTheLength)
{
    KvoVec4 v(2, 2, -2, 2);

    KvoVec4& result = v.Unit();

    EXPECT_EQ(Components(v), (Four{0.5f, 0.5f, -0.5f, 0.5f}));
    EXPECT_EQ(&result, &v);
}

TEST(KvoVec3, UnitAndDirDivideRatherThanMultiplyByTheReciprocal)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 v = samples.Vec3();
        const float length = v.Mag();
        const KvoVec3 divided(v.x / length, v.y / length, v.z / length);

        EXPECT_TRUE(SameBits(v.Dir(), divided));
        EXPECT_TRUE(SameBits(KvoVec3(v).Unit(), divided));
    }
}

TEST(KvoVec3, NegateTurnsItRoundInPlace)
{
    KvoVec3 v(1, -2, 3);
    KvoVec4 w(1, -2, 3, 4);

    EXPECT_EQ(&v.Negate(), &v);
    EXPECT_EQ(&w.Negate(), &w);

    EXPECT_EQ(Components(v), (Three{-1, 2, -3}));
    EXPECT_EQ(Components(w), (Four{-1, 2, -3, -4}));
}

TEST(KvoVec3, MinusGivesTheOppositeAndLeavesTheVector)
{
    const KvoVec3 v(1, -2, 0);

    EXPECT_TRUE(SameBits(-v, KvoVec3(-1, 2, -0.0f)));
    EXPECT_EQ(Components(-KvoVec4(1, 2, 3, 4)), (Four{-1, -2, -3, -4}));
    EXPECT_EQ(Components(v), (Three{1, -2, 0}));
}

TEST(KvoVec3, ScaleGivesItThatLength)
{
    KvoVec3 same(3, 4, 0);
    KvoVec3 twice(3, 4, 0);

    EXPECT_EQ(&same.Scale(5), &same);
    twice.Scale(10);

    EXPECT_EQ(Components(same), (Three{3, 4, 0}));
    EXPECT_EQ(Components(twice), (Three{6, 8, 0}));
}

TEST(KvoVec4, ScaleGivesItThatLengthInFourDimensions)
{
    KvoVec4 v(1, 3, 3, 9);

    EXPECT_EQ(&v.Scale(20), &v);

    EXPECT_EQ(Components(v), (Four{2, 6, 6, 18}));
}

TEST(KvoVec3, ScaleLeavesLengthZero)
{
    EXPECT_EQ(Components(KvoVec3().Scale(5)), (Three{0, 0, 0}));
    EXPECT_EQ(Components(KvoVec4().Scale(5)), (Four{0, 0, 0, 0}));
}

TEST(KvoVec3, ScaleMultipliesByOneQuotient)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 v = samples.Vec3();
        const float factor = 3 / v.Mag();

        EXPECT_TRUE(
            SameBits(KvoVec3(v).Scale(3),
                     KvoVec3(v.x * factor, v.y * factor, v.z * factor)));
    }
}

TEST(KvoVec4, LengthAndDirectionHaveTheBitsOfTheFormula)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec4 v = samples.Vec4();
        const float squared = v.x * v.x + v.y * v.y + v.z * v.z + v.w * v.w;
        const float length = sqrtf(squared);
        const float factor = 3 / length;
        const KvoVec4 divided(v.x / length, v.y / length, v.z / length,
                              v.w / length);

        EXPECT_EQ(v.MagSquared(), squared);
        EXPECT_EQ(v.Mag(), length);
        EXPECT_TRUE(SameBits(v.Dir(), divided));
        EXPECT_TRUE(SameBits(KvoVec4(v).Unit(), divided));
        EXPECT_TRUE(
            SameBits(KvoVec4(v).Scale(3), KvoVec4(v.x * factor, v.y * factor,
                                                  v.z * factor, v.w * factor)));
    }
}

// Directions as matrix and angles.

TEST(KvoVec3, VecToRotmatrixTakesTheZAxisIntoTheDirection)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 v = samples.Vec3();
        const double length = std::sqrt(double(v.x) * v.x + double(v.y) * v.y +
                                        double(v.z) * v.z);
        const double x = v.x / length, y = v.y / length, z = v.z / length;
        const double d = std::sqrt(y * y + z * z);
        const double want[4][4] = {{d, -x * y / d, -x * z / d, 0},
                                   {0, z / d, -y / d, 0},
                                   {x, y, z, 1},
                                   {0, 0, 0, 1}};

        const KvoMat m = v.VecToRotmatrix();

        for (int r = 0; r < 4; ++r)
            for (int c = 0; c < 4; ++c)
                EXPECT_NEAR(m[r][c], want[r][c], 2e-6 / d);
    }
}

TEST(KvoVec3, VecToRotmatrixFollowsTheFormulaInWrittenOrder)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 v = samples.Vec3();
        const KvoVec3 u = KvoVec3(v).Unit();
        const float d = sqrtf(u.y * u.y + u.z * u.z);
        const KvoMat want(KvoVec4(d, -(u.x * u.y) / d, -(u.x * u.z) / d, 0),
                          KvoVec4(0, u.z / d, -u.y / d, 0),
                          KvoVec4(u.x, u.y, u.z, 1), KvoVec4(0, 0, 0, 1));

        EXPECT_TRUE(SameBits(v.VecToRotmatrix(), want));
    }
}

TEST(KvoVec3, VecToRotmatrixEndsRowTwoInOne)
{
    const KvoVec3 v(0, 0, 2);

    const KvoMat m = v.VecToRotmatrix();

    EXPECT_EQ(Components(m[0]), (Four{1, 0, 0, 0}));
    EXPECT_EQ(Components(m[1]), (Four{0, 1, 0, 0}));
    EXPECT_EQ(Components(m[2]), (Four{0, 0, 1, 1}));
    EXPECT_EQ(Components(m[3]), (Four{0, 0, 0, 1}));
    EXPECT_EQ(Components(v), (Three{0, 0, 2}));
}

TEST(KvoVec3, VecToRotmatrixOfTheXAxisDividesByZero)
{
    ErrorTrap reports;

    const KvoMat m = KvoVec3(3, 0, 0).VecToRotmatrix();

    EXPECT_EQ(m[0][0], 0);
    EXPECT_TRUE(std::isnan(m[0][1]));
    EXPECT_TRUE(std::isnan(m[0][2]));
    EXPECT_TRUE(std::isnan(m[1][1]));
    EXPECT_TRUE(std::isnan(m[1][2]));
    EXPECT_EQ(Components(m[2]), (Four{1, 0, 0, 1}));
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoVec3, VecToAnglesOfTheZAxis)
{
    EXPECT_EQ(Components(KvoVec3(0, 0, 1).VecToAngles()), (Three{-90, -90, 0}));
}

TEST(KvoVec3, VecToAnglesGivesDegreesAndAThirdOfZero)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 v = samples.Vec3();

        const KvoVec3 angles = v.VecToAngles();

        EXPECT_NEAR(angles.x, -std::atan2(double(v.z), v.y) * 180 / M_PI, 1e-3);
        EXPECT_NEAR(angles.y, -std::atan2(double(v.z), v.x) * 180 / M_PI, 1e-3);
        EXPECT_EQ(angles.z, 0);
    }
}

TEST(KvoVec3, VecToAnglesTakesTheUnitVectorAndADoubleProduct)
{
    constexpr double factor = 57.29577951308232;
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 v = samples.Vec3();
        const KvoVec3 u = KvoVec3(v).Unit();

        const KvoVec3 angles = v.VecToAngles();

        EXPECT_EQ(angles.x, static_cast<float>(-atan2f(u.z, u.y) * factor));
        EXPECT_EQ(angles.y, static_cast<float>(-atan2f(u.z, u.x) * factor));
    }
    // Its length is infinite, so that nothing is left of its direction.
    EXPECT_EQ(Components(KvoVec3(0, 1e30f, 1e30f).VecToAngles()),
              (Three{0, 0, 0}));
}

// Free operators.

TEST(KvoVec3, SumsDifferencesAndProductsGoComponentByComponent)
{
    const KvoVec3 a(1, 2, 3);
    const KvoVec3 b(10, 20, 40);

    EXPECT_EQ(Components(a + b), (Three{11, 22, 43}));
    EXPECT_EQ(Components(a - b), (Three{-9, -18, -37}));
    EXPECT_EQ(Components(a * b), (Three{10, 40, 120}));
    EXPECT_EQ(Components(b / a), (Three{10, 10, 40.0f / 3}));
}

TEST(KvoVec4, SumsDifferencesAndProductsGoComponentByComponent)
{
    const KvoVec4 a(1, 2, 3, 4);
    const KvoVec4 b(10, 20, 40, 80);

    EXPECT_EQ(Components(a + b), (Four{11, 22, 43, 84}));
    EXPECT_EQ(Components(a - b), (Four{-9, -18, -37, -76}));
    EXPECT_EQ(Components(a * b), (Four{10, 40, 120, 320}));
    EXPECT_EQ(Components(b / a), (Four{10, 10, 40.0f / 3, 20}));
}

TEST(KvoVec3, ANumberOnTheRightMeetsEveryComponent)
{
    const KvoVec3 v(2, 4, 8);

    EXPECT_EQ(Components(v + 1), (Three{3, 5, 9}));
    EXPECT_EQ(Components(v - 1), (Three{1, 3, 7}));
    EXPECT_EQ(Components(v * 2), (Three{4, 8, 16}));
    EXPECT_EQ(Components(v * 0.5), (Three{1, 2, 4}));
    EXPECT_EQ(Components(v / 2), (Three{1, 2, 4}));
}

TEST(KvoVec4, ANumberOnTheRightMeetsEveryComponent)
{
    const KvoVec4 v(2, 4, 8, 16);

    EXPECT_EQ(Components(v + 1), (Four{3, 5, 9, 17}));
    EXPECT_EQ(Components(v - 1), (Four{1, 3, 7, 15}));
    EXPECT_EQ(Components(v * 2), (Four{4, 8, 16, 32}));
    EXPECT_EQ(Components(v * 0.5), (Four{1, 2, 4, 8}));
    EXPECT_EQ(Components(v / 2), (Four{1, 2, 4, 8}));
}

TEST(KvoVec3, ANumberOnTheLeftStaysOnTheLeft)
{
    const KvoVec3 v(2, 4, 8);

    EXPECT_EQ(Components(1 + v), (Three{3, 5, 9}));
    EXPECT_EQ(Components(1 - v), (Three{-1, -3, -7}));
    EXPECT_EQ(Components(2 * v), (Three{4, 8, 16}));
    EXPECT_EQ(Components(0.5 * v), (Three{1, 2, 4}));
    EXPECT_EQ(Components(8 / v), (Three{4, 2, 1}));
}

TEST(KvoVec4, ANumberOnTheLeftStaysOnTheLeft)
{
    const KvoVec4 v(2, 4, 8, 16);

    EXPECT_EQ(Components(1 + v), (Four{3, 5, 9, 17}));
    EXPECT_EQ(Components(1 - v), (Four{-1, -3, -7, -15}));
    EXPECT_EQ(Components(2 * v), (Four{4, 8, 16, 32}));
    EXPECT_EQ(Components(0.5 * v), (Four{1, 2, 4, 8}));
    EXPECT_EQ(Components(16 / v), (Four{8, 4, 2, 1}));
}

TEST(KvoVec3, DivisionDividesRatherThanMultipliesByTheReciprocal)
{
    EXPECT_EQ((KvoVec3(5, 7, 9) / 3).x, 5.0f / 3);
    EXPECT_NE(5.0f / 3, 5.0f * (1.0f / 3));
    EXPECT_EQ((KvoVec4(5, 7, 9, 5) / 3).w, 5.0f / 3);
}

TEST(KvoVec3, DividingByAZeroWarnsOnceAndGivesZero)
{
    const KvoVec3 v(1, 2, 3);
    for (const KvoVec3& divisor : {KvoVec3(0, 1, 1), KvoVec3(1, 0, 1),
                                   KvoVec3(1, 1, -0.0f), KvoVec3(0)}) {
        ErrorTrap reports;

        EXPECT_EQ(Components(v / divisor), (Three{0, 0, 0}));
        EXPECT_EQ(Components(5 / divisor), (Three{0, 0, 0}));

        EXPECT_EQ(reports.Text(), "Warning: KvoVec3 - Division by zero.\n"
                                  "Warning: KvoVec3 - Division by zero.\n");
    }
}

TEST(KvoVec4, DividingByAZeroWarnsOnceAndGivesZero)
{
    const KvoVec4 v(1, 2, 3, 4);
    for (const KvoVec4& divisor : {KvoVec4(0, 1, 1, 1), KvoVec4(1, 0, 1, 1),
                                   KvoVec4(1, 1, 0, 1), KvoVec4(1, 1, 1, 0)}) {
        ErrorTrap reports;

        EXPECT_EQ(Components(v / divisor), (Four{0, 0, 0, 0}));
        EXPECT_EQ(Components(5 / divisor), (Four{0, 0, 0, 0}));

        EXPECT_EQ(reports.Text(), "Warning: KvoVec4 - Division by zero.\n"
                                  "Warning: KvoVec4 - Division by zero.\n");
    }
}

TEST(KvoVec3, DividingByTheNumberZeroWarnsOnceAndGivesZero)
{
    ErrorTrap reports;

    EXPECT_EQ(Components(KvoVec3(1, 2, 3) / 0), (Three{0, 0, 0}));
    EXPECT_EQ(Components(KvoVec4(1, 2, 3, 4) / 0.0), (Four{0, 0, 0, 0}));

    ASSERT_EQ(reports.reports.size(), 2u);
    EXPECT_EQ(reports.reports[0].text,
              "Warning: KvoVec3 - Division by zero.\n");
    EXPECT_EQ(reports.reports[0].level, 3);
    EXPECT_EQ(reports.reports[1].text,
              "Warning: KvoVec4 - Division by zero.\n");
}

TEST(KvoVec3, DividingByNanIsNoDivisionByZero)
{
    ErrorTrap reports;

    EXPECT_TRUE(std::isnan((KvoVec3(1, 2, 3) / NAN).x));
    EXPECT_EQ(reports.Text(), "");
}
