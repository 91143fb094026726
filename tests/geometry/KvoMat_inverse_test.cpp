#include <cmath>
#include <limits>

#include <gtest/gtest.h>

#include "KVO/KvoVec.h"
#include "geometry/components.h"
#include "geometry/literal.h"
#include "geometry/reference.h"
#include "geometry/samples.h"
#include "support/ErrorTrap.h"

namespace {
constexpr float epsilon = std::numeric_limits<float>::epsilon();

/// 1 to 16, row by row.
const KvoMat counted(KvoVec4(1, 2, 3, 4), KvoVec4(5, 6, 7, 8),
                     KvoVec4(9, 10, 11, 12), KvoVec4(13, 14, 15, 16));

KvoMat Diagonal(float x, float y, float z, float w)
{
    return KvoMat(KvoVec4(x, 0, 0, 0), KvoVec4(0, y, 0, 0), KvoVec4(0, 0, z, 0),
                  KvoVec4(0, 0, 0, w));
}

KvoMat Filled(float value)
{
    return KvoMat(KvoVec4(value), KvoVec4(value), KvoVec4(value),
                  KvoVec4(value));
}
} // namespace

TEST(KvoMat, DetOfWholeNumbersIsExact)
{
    const KvoMat m(KvoVec4(2, 0, 1, 3), KvoVec4(1, 4, 0, -1),
                   KvoVec4(0, 2, 5, 1), KvoVec4(3, 1, -2, 0));

    EXPECT_EQ(KvoMat().Det(), 1);
    EXPECT_EQ(Diagonal(2, 3, 4, 5).Det(), 120);
    EXPECT_EQ(counted.Det(), 0);
    EXPECT_EQ(m.Det(), -102);
    EXPECT_EQ(m.Transpose().Det(), -102);
}

TEST(KvoMat, DetIsThatOfElimination)
{
    Samples samples;
    for (int i = 0; i < 5000; ++i) {
        const KvoMat m = samples.Mat();

        EXPECT_NEAR(m.Det(), reference::Determinant(reference::Of(m)), 1e-4);
    }
}

TEST(KvoMat, MatrixTimesAdjointIsDetTimesIdentity)
{
    Samples samples;
    for (int i = 0; i < 5000; ++i) {
        const KvoMat m = samples.Mat();
        const double det = reference::Determinant(reference::Of(m));
        reference::Matrix want = reference::Scaling(det, det, det);
        want[3][3] = det;

        const KvoMat adjoint = m.Adjoint();

        const reference::Matrix have =
            reference::Product(reference::Of(m), reference::Of(adjoint));
        for (std::size_t r = 0; r < 4; ++r)
            for (std::size_t c = 0; c < 4; ++c)
                EXPECT_NEAR(have[r][c], want[r][c], 2e-4);
    }
}

TEST(KvoMat, AdjointOfASingularMatrixStillHoldsItsCofactors)
{
    KvoMat m = Diagonal(2, 3, 5, 0);
    ErrorTrap reports;

    EXPECT_TRUE(SameBits(m.Adjoint(), Diagonal(0, 0, 0, 30)));
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoMat, AdjointHasTheBitsOfTheLiteralFormula)
{
    Samples samples;
    for (int i = 0; i < 20000; ++i) {
        const KvoMat m = i % 2 ? samples.Mat() : samples.AnyMat();

        EXPECT_TRUE(SameBits(m.Adjoint(), literal::adjoint(m))) << m;
    }
}

TEST(KvoMat, InvertIsThatOfElimination)
{
    Samples samples;
    for (int i = 0; i < 5000; ++i) {
        const KvoMat m = samples.Mat();
        if (std::abs(reference::Determinant(reference::Of(m))) < 0.1)
            continue;

        reference::ExpectNear(m.Invert(), reference::Inverse(reference::Of(m)),
                              1e-3);
    }
}

TEST(KvoMat, InvertUndoesTheTransformation)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const float angle = samples.Number(360);
        const KvoVec3 axis = samples.Vec3();
        const KvoMat m = KvoMat()
                             .InitRotate(axis, angle)
                             .Scale(2, 3, 4, 1)
                             .Trans(samples.Vec3(), 1);

        reference::ExpectNear(m * m.Invert(), reference::Identity(), 1e-5);
        reference::ExpectNear(m.Invert() * m, reference::Identity(), 1e-5);
    }
}

TEST(KvoMat, InvertHasTheBitsOfTheLiteralFormula)
{
    Samples samples;
    ErrorTrap reports;
    for (int i = 0; i < 20000; ++i) {
        const KvoMat m = i % 2 ? samples.Mat() : samples.AnyMat();

        EXPECT_TRUE(SameBits(m.Invert(), literal::inverse(m))) << m;
    }
}

TEST(KvoMat, InverseOfTheIdentityHasNoNegativeZeros)
{
    EXPECT_TRUE(SameBits(KvoMat().Invert(), KvoMat()));
    EXPECT_TRUE(SameBits(Diagonal(2, 4, 8, 16).Invert(),
                         Diagonal(0.5, 0.25, 0.125, 0.0625)));
}

TEST(KvoMat, InvertOfTheZeroMatrixWarnsAndGivesZero)
{
    ErrorTrap reports;

    EXPECT_TRUE(Filled(0).Invert() == Filled(0));

    EXPECT_EQ(reports.Text(), "Warning: KvoMat - Singular matrix.\n");
    EXPECT_EQ(reports.reports.at(0).level, 3);
}

TEST(KvoMat, InvertOfASingularMatrixGivesItsAdjointUnscaled)
{
    ErrorTrap reports;

    EXPECT_TRUE(SameBits(Diagonal(2, 3, 5, 0).Invert(), Diagonal(0, 0, 0, 30)));

    EXPECT_EQ(reports.Text(), "Warning: KvoMat - Singular matrix.\n");
}

TEST(KvoMat, DeterminantOfExactlyTheToleranceIsNotSingular)
{
    ErrorTrap reports;

    EXPECT_EQ(Diagonal(epsilon, 1, 1, 1).Invert()[0][0], 8388608);
    EXPECT_EQ(Diagonal(-epsilon, 1, 1, 1).Invert()[0][0], -8388608);
    EXPECT_EQ(reports.Text(), "");

    const float less = std::nextafter(epsilon, 0.0f);
    EXPECT_EQ(Diagonal(less, 1, 1, 1).Invert()[0][0], 1);
    EXPECT_EQ(Diagonal(-less, 1, 1, 1).Invert()[0][0], 1);
    EXPECT_EQ(reports.reports.size(), 2u);
}
