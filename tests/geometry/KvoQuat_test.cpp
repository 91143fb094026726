#include <array>
#include <cmath>
#include <sstream>

#include <gtest/gtest.h>

#include "ZT/math.h"
#include "geometry/components.h"
#include "geometry/literal.h"
#include "geometry/reference.h"
#include "geometry/samples.h"
#include "support/ErrorTrap.h"

namespace {
constexpr float epsilon = 1.1920929e-07f;
constexpr double pi = 3.14159265358979323846;

Four Components(const KvoQuat& q)
{
    return {q.s, q.v.x, q.v.y, q.v.z};
}

/// The rotation by `degrees` about an axis.
KvoQuat About(const KvoVec3& axis, double degrees)
{
    const double half = degrees * pi / 360;
    return KvoQuat(static_cast<float>(std::cos(half)),
                   axis.Dir() * static_cast<float>(std::sin(half)));
}

void ExpectNear(const KvoQuat& q, const std::array<double, 4>& want,
                double tolerance)
{
    const Four have = Components(q);
    for (std::size_t i = 0; i < 4; ++i)
        EXPECT_NEAR(have[i], want[i], tolerance) << "part " << i;
}

void ExpectNear(const KvoQuat& q, const KvoQuat& want, double tolerance)
{
    ExpectNear(q, {want.s, want.v.x, want.v.y, want.v.z}, tolerance);
}

double Angle(const KvoQuat& a, const KvoQuat& b)
{
    double cosine = double(a.s) * b.s;
    for (int i = 0; i < 3; ++i)
        cosine += double(a.v[i]) * b.v[i];
    return std::acos(std::fmin(1, std::fmax(-1, cosine)));
}

/// The rotation matrix of a quaternion, with no sign changed: the rotated axes.
reference::Matrix TrueRotation(const KvoQuat& q)
{
    const double degrees = 2 * std::acos(double(q.s)) * 180 / pi;
    return reference::Rotation(reference::Of(q.v), degrees);
}
} // namespace

// Construction.

TEST(KvoQuat, StartsAtZeroAndNotAtTheIdentity)
{
    EXPECT_EQ(Components(KvoQuat()), (Four{0, 0, 0, 0}));
}

TEST(KvoQuat, InitIdentityMakesTheIdentity)
{
    KvoQuat q(5, KvoVec3(6, 7, 8));

    EXPECT_EQ(&q.InitIdentity(), &q);

    EXPECT_EQ(Components(q), (Four{1, 0, 0, 0}));
}

TEST(KvoQuat, CopiesEveryPart)
{
    const KvoQuat q(1, KvoVec3(2, 3, 4));

    KvoQuat copy(q);
    KvoQuat assigned;
    KvoQuat& result = assigned = q;

    EXPECT_EQ(Components(copy), (Four{1, 2, 3, 4}));
    EXPECT_EQ(Components(assigned), (Four{1, 2, 3, 4}));
    EXPECT_EQ(&result, &assigned);
}

TEST(KvoQuat, TakesANumberAndThreeMoreAsTheyAre)
{
    const float floats[] = {2, 3, 4};
    const double doubles[] = {0.1, 3, 4};

    EXPECT_EQ(Components(KvoQuat(1, floats)), (Four{1, 2, 3, 4}));
    EXPECT_EQ(Components(KvoQuat(90.0f, floats)), (Four{90, 2, 3, 4}));
    EXPECT_EQ(Components(KvoQuat(0.1, doubles)), (Four{0.1f, 0.1f, 3, 4}));
    EXPECT_EQ(Components(KvoQuat(1, KvoVec3(2, 3, 4))), (Four{1, 2, 3, 4}));
    EXPECT_EQ(Components(KvoQuat(1, 0)), (Four{1, 0, 0, 0}));
}

TEST(KvoQuat, NullArraysReadAsZeros)
{
    const float* no_floats = nullptr;
    const double* no_doubles = nullptr;

    EXPECT_EQ(Components(KvoQuat(1, no_floats)), (Four{1, 0, 0, 0}));
    EXPECT_EQ(Components(KvoQuat(1, no_doubles)), (Four{1, 0, 0, 0}));
}

TEST(KvoQuat, OfFourComponentsTakesTheScalarFirst)
{
    EXPECT_EQ(Components(KvoQuat(KvoVec4(1, 2, 3, 4))), (Four{1, 2, 3, 4}));
}

TEST(KvoQuat, ShowsItsParts)
{
    KvoQuat q;

    q.s = 1;
    q.v = KvoVec3(2, 3, 4);

    EXPECT_EQ(Components(q), (Four{1, 2, 3, 4}));
    EXPECT_EQ(sizeof(KvoQuat), 4 * sizeof(float));
}

// To a matrix and back.

TEST(KvoMat, OfAQuaternionIsItsRotation)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoQuat q = samples.Rotation();
        reference::Matrix want = TrueRotation(q);
        want[2][2] = 1 - 2 * (double(q.v.x) * q.v.x - double(q.v.y) * q.v.y);

        reference::ExpectNear(KvoMat(q), want, 1e-5);
    }
}

TEST(KvoMat, OfAQuaternionHasItsSignInTwoTwo)
{
    const KvoQuat about_y = About(KvoVec3(0, 1, 0), 90);
    const KvoQuat about_x = About(KvoVec3(1, 0, 0), 60);

    EXPECT_NEAR(KvoMat(about_y)[2][2], 2, 1e-6);
    EXPECT_NEAR(TrueRotation(about_y)[2][2], 0, 1e-6);
    reference::ExpectNear(KvoMat(about_x), reference::Rotation({1, 0, 0}, 60),
                          1e-6);
}

TEST(KvoMat, OfAQuaternionFollowsTheFormulaInWrittenOrder)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec4 sample = samples.Vec4();
        const float s = sample.x, x = sample.y, y = sample.z, z = sample.w;

        const KvoMat m{KvoQuat(sample)};

        EXPECT_EQ(Components(m[0]),
                  (Four{1 - 2 * (y * y + z * z), 2 * (x * y + z * s),
                        2 * (x * z - y * s), 0}));
        EXPECT_EQ(Components(m[1]),
                  (Four{2 * (x * y - z * s), 1 - 2 * (x * x + z * z),
                        2 * (y * z + x * s), 0}));
        EXPECT_EQ(Components(m[2]),
                  (Four{2 * (x * z + y * s), 2 * (y * z - x * s),
                        1 - 2 * (x * x - y * y), 0}));
        EXPECT_EQ(Components(m[3]), (Four{0, 0, 0, 1}));
    }
}

TEST(KvoQuat, OfAMatrixIsTheRotationThatItHolds)
{
    Samples samples;
    for (int i = 0; i < 5000; ++i) {
        const KvoVec3 axis = samples.Vec3();
        const float degrees = samples.Number(170);
        const KvoQuat want = About(axis, degrees);

        const KvoQuat q(KvoMat().InitRotate(axis, degrees));

        ExpectNear(q, want, 2e-5);
    }
}

TEST(KvoQuat, OfTheIdentityMatrixIsTheIdentity)
{
    EXPECT_EQ(Components(KvoQuat(KvoMat())), (Four{1, 0, 0, 0}));
}

TEST(KvoQuat, OfAHalfTurnTakesTheLargestAxisThatIsThere)
{
    const KvoMat about_x(KvoVec3(1, 0, 0), KvoVec3(0, -1, 0),
                         KvoVec3(0, 0, -1));
    const KvoMat about_y(KvoVec3(-1, 0, 0), KvoVec3(0, 1, 0),
                         KvoVec3(0, 0, -1));
    const KvoMat about_z(KvoVec3(-1, 0, 0), KvoVec3(0, -1, 0),
                         KvoVec3(0, 0, 1));

    EXPECT_EQ(Components(KvoQuat(about_x)), (Four{0, 1, 0, 0}));
    EXPECT_EQ(Components(KvoQuat(about_y)), (Four{0, 0, 1, 0}));
    EXPECT_EQ(Components(KvoQuat(about_z)), (Four{0, 0, 0, 1}));
}

TEST(KvoQuat, OfAHalfTurnFindsTheOtherComponentsFromTheFirst)
{
    // About (x, y, z) by half a turn: elements 2 v v, less 1 on the diagonal.
    const KvoMat about_xy(KvoVec3(0, 1, 0), KvoVec3(1, 0, 0),
                          KvoVec3(0, 0, -1));
    const KvoMat about_xz(KvoVec3(0, 0, 1), KvoVec3(0, -1, 0),
                          KvoVec3(1, 0, 0));
    const KvoMat about_yz(KvoVec3(-1, 0, 0), KvoVec3(0, 0, 1),
                          KvoVec3(0, 1, 0));
    const double half = std::sqrt(0.5);

    ExpectNear(KvoQuat(about_xy), {0, half, half, 0}, 1e-6);
    ExpectNear(KvoQuat(about_xz), {0, half, 0, half}, 1e-6);
    ExpectNear(KvoQuat(about_yz), {0, 0, half, half}, 1e-6);
}

TEST(KvoQuat, OfAMatrixWithAClearlyNegativeTraceIsNotANumber)
{
    const KvoMat mirror = KvoMat().InitScale(-1);

    EXPECT_TRUE(std::isnan(KvoQuat(mirror).s));
}

TEST(KvoQuat, OfAMatrixCountsATraceWithinTheToleranceAsNone)
{
    KvoMat m = KvoMat().InitScale(0, -1, 0);

    m[0][0] = 4 * epsilon;
    EXPECT_EQ(KvoQuat(m).s, sqrtf(epsilon));
    m[0][0] = 3 * epsilon;
    ExpectNear(KvoQuat(m), {0, std::sqrt(0.5), 0, 0}, 1e-6);
}

TEST(KvoQuat, OfAMatrixCountsWhatIsWithinTheToleranceAsNoneAtEveryStep)
{
    const float less = std::nextafter(epsilon, 0.0f);
    // Without a trace to speak of: the second step takes half of what is
    // missing in y and z for x x, the third half of what is missing in z.
    const auto of_y_and_z = [](float y, float z) {
        return KvoQuat(KvoMat().InitScale(-1, y, z));
    };

    EXPECT_EQ(of_y_and_z(-2 * epsilon, 0).v.x, sqrtf(epsilon));
    EXPECT_TRUE(std::isnan(of_y_and_z(2 * epsilon, 0).v.x));
    EXPECT_EQ(Components(of_y_and_z(-2 * less, 0)),
              (Four{0, 0, sqrtf(0.5f), 0}));
    EXPECT_EQ(Components(of_y_and_z(2 * less, 0)),
              (Four{0, 0, sqrtf(0.5f), 0}));
    EXPECT_EQ(of_y_and_z(2 * epsilon - 1, 1 - 2 * epsilon).v.y, sqrtf(epsilon));
    EXPECT_EQ(Components(of_y_and_z(epsilon - 1, 1 - epsilon)),
              (Four{0, 0, 0, 1}));
}

TEST(KvoQuat, OfAMatrixFollowsTheFormulaInWrittenOrder)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoMat m = KvoMat(samples.Rotation());
        const float t = (m[0][0] + 1 + m[1][1] + m[2][2]) * 0.25f;
        if (t < 0.01f)
            continue;
        const float s = sqrtf(t);

        EXPECT_EQ(Components(KvoQuat(m)),
                  (Four{s, (m[1][2] - m[2][1]) / (4 * s),
                        (m[2][0] - m[0][2]) / (4 * s),
                        (m[0][1] - m[1][0]) / (4 * s)}));
    }
}

// Length, middle, reflection.

TEST(KvoQuat, NormalizeDividesByTheLength)
{
    KvoQuat q(1, KvoVec3(3, -3, 9));

    EXPECT_EQ(&q.Normalize(), &q);

    EXPECT_EQ(Components(q), (Four{0.1f, 0.3f, -0.3f, 0.9f}));
}

TEST(KvoQuat, NormalizeLeavesZeroAndWhatIsWithinTheTolerance)
{
    const float below = std::nextafter(epsilon, 0.0f);

    EXPECT_EQ(Components(KvoQuat().Normalize()), (Four{0, 0, 0, 0}));
    EXPECT_EQ(Components(KvoQuat(below, 0).Normalize()),
              (Four{below, 0, 0, 0}));
    EXPECT_EQ(Components(KvoQuat(epsilon, 0).Normalize()), (Four{1, 0, 0, 0}));
    EXPECT_EQ(Components(KvoQuat(-epsilon, 0).Normalize()),
              (Four{-1, 0, 0, 0}));
}

TEST(KvoQuat, QbisectIsTheNormalizedSum)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoQuat a = samples.Rotation();
        const KvoQuat b = samples.Rotation();
        double sum[4], squares = 0;
        for (std::size_t k = 0; k < 4; ++k) {
            sum[k] = double(Components(a)[k]) + Components(b)[k];
            squares += sum[k] * sum[k];
        }
        const double length = std::sqrt(squares);
        if (length < 0.1)
            continue;

        ExpectNear(a.qbisect(b),
                   {sum[0] / length, sum[1] / length, sum[2] / length,
                    sum[3] / length},
                   1e-5);
    }
}

TEST(KvoQuat, QbisectLeavesASumOfLengthZeroOrOne)
{
    const KvoQuat q(0.5, KvoVec3(0.25, 0, 0));
    const KvoQuat opposite(-0.5, KvoVec3(-0.25, 0, 0));
    const KvoQuat half(0.5, 0);

    EXPECT_EQ(Components(q.qbisect(opposite)), (Four{0, 0, 0, 0}));
    EXPECT_EQ(Components(half.qbisect(half)), (Four{1, 0, 0, 0}));
}

TEST(KvoQuat, QbisectDividesAlsoWhatIsTiny)
{
    const KvoQuat tiny(1e-10f, 0);

    EXPECT_EQ(Components(tiny.qbisect(KvoQuat())), (Four{1, 0, 0, 0}));
}

TEST(KvoQuat, QdoubleGoesAsFarOnTheOtherSide)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoQuat p = samples.Rotation();
        const KvoQuat q = samples.Rotation();
        const double d = 2 * std::cos(Angle(p, q));

        const KvoQuat r = p.qdouble(q);

        ExpectNear(r,
                   {d * q.s - p.s, d * q.v.x - p.v.x, d * q.v.y - p.v.y,
                    d * q.v.z - p.v.z},
                   1e-5);
        EXPECT_NEAR(Angle(r, q), Angle(p, q), 1e-3);
        ExpectNear(r.qdouble(q), p, 1e-5);
    }
}

TEST(KvoQuat, MiddleAndReflectionFollowTheirFormulasInWrittenOrder)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoQuat p(samples.Vec4());
        const KvoQuat q(samples.Vec4());
        const KvoQuat sum(p.s + q.s, p.v + q.v);
        const float length = sqrtf(sum.s * sum.s + sum.v.x * sum.v.x +
                                   sum.v.y * sum.v.y + sum.v.z * sum.v.z);
        const float d =
            2 * ((p.v.x * q.v.x + p.v.y * q.v.y + p.v.z * q.v.z) + p.s * q.s);
        KvoQuat unit = sum;
        unit.Normalize();

        EXPECT_EQ(Components(p.qbisect(q)),
                  (Four{sum.s / length, sum.v.x / length, sum.v.y / length,
                        sum.v.z / length}));
        EXPECT_TRUE(SameBits(unit, p.qbisect(q)));
        EXPECT_EQ(Components(p.qdouble(q)),
                  (Four{d * q.s - p.s, d * q.v.x - p.v.x, d * q.v.y - p.v.y,
                        d * q.v.z - p.v.z}));
    }
}

// Sum and product.

TEST(KvoQuat, SumGoesPartByPart)
{
    const KvoQuat a(1, KvoVec3(2, 3, 4));
    const KvoQuat b(10, KvoVec3(20, 30, 40));

    EXPECT_EQ(Components(a + b), (Four{11, 22, 33, 44}));
}

TEST(KvoQuat, ProductFollowsTheRulesOfTheUnits)
{
    const KvoQuat i(0, KvoVec3(1, 0, 0));
    const KvoQuat j(0, KvoVec3(0, 1, 0));
    const KvoQuat k(0, KvoVec3(0, 0, 1));

    EXPECT_EQ(Components(i * j), (Four{0, 0, 0, 1}));
    EXPECT_EQ(Components(j * k), (Four{0, 1, 0, 0}));
    EXPECT_EQ(Components(k * i), (Four{0, 0, 1, 0}));
    EXPECT_EQ(Components(j * i), (Four{0, 0, 0, -1}));
    EXPECT_EQ(Components(i * i), (Four{-1, 0, 0, 0}));
}

TEST(KvoQuat, IdentityTimesAnyIsThat)
{
    Samples samples;
    for (int i = 0; i < 100; ++i) {
        const KvoQuat q = samples.Rotation();

        EXPECT_EQ(Components(KvoQuat(1, KvoVec3(0)) * q), Components(q));
        EXPECT_EQ(Components(q * KvoQuat(1, KvoVec3(0))), Components(q));
    }
}

TEST(KvoQuat, ProductIsThatOfDoubles)
{
    Samples samples;
    for (int i = 0; i < 5000; ++i) {
        const KvoQuat p(samples.Vec4());
        const KvoQuat q(samples.Vec4());
        const double a = p.s, b = p.v.x, c = p.v.y, d = p.v.z;
        const double e = q.s, f = q.v.x, g = q.v.y, h = q.v.z;

        ExpectNear(
            p * q,
            {a * e - b * f - c * g - d * h, a * f + b * e + c * h - d * g,
             a * g - b * h + c * e + d * f, a * h + b * g - c * f + d * e},
            1e-5);
    }
}

TEST(KvoQuat, ProductFollowsTheFormulaInWrittenOrder)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoQuat a(samples.Vec4());
        const KvoQuat b(samples.Vec4());
        const KvoVec3 cross = a.v.Cross(b.v);

        EXPECT_EQ(
            Components(a * b),
            (Four{a.s * b.s - (a.v.x * b.v.x + a.v.y * b.v.y + a.v.z * b.v.z),
                  a.s * b.v.x + b.s * a.v.x + cross.x,
                  a.s * b.v.y + b.s * a.v.y + cross.y,
                  a.s * b.v.z + b.s * a.v.z + cross.z}));
    }
}

TEST(KvoQuat, ProductOfRotationsActsRightFirst)
{
    const KvoQuat about_x = About(KvoVec3(1, 0, 0), 40);
    const KvoQuat about_z = About(KvoVec3(0, 0, 1), 70);
    const KvoMat both = KvoMat().InitXrot(40).Zrot(70, 1);

    ExpectNear(KvoQuat(both), about_z * about_x, 1e-5);
}

// Interpolation.

TEST(KvoQuat, SlerpGoesEvenlyAlongTheArc)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoQuat a = samples.Rotation();
        const KvoQuat b = samples.Rotation();
        const double whole = Angle(a, b);
        const float t = std::abs(samples.Number(1));
        if (whole < 0.1 || whole > 3)
            continue;
        const double wa = std::sin((1 - t) * whole) / std::sin(whole);
        const double wb = std::sin(t * whole) / std::sin(whole);

        const KvoQuat q = Slerp(a, b, t);

        ExpectNear(q,
                   {wa * a.s + wb * b.s, wa * a.v.x + wb * b.v.x,
                    wa * a.v.y + wb * b.v.y, wa * a.v.z + wb * b.v.z},
                   1e-4);
        EXPECT_NEAR(Angle(a, q), t * whole, 2e-3);
    }
}

TEST(KvoQuat, SlerpHasTheBitsOfTheLiteralFormula)
{
    Samples samples;
    for (int i = 0; i < 20000; ++i) {
        const KvoQuat a =
            i % 4 ? samples.Rotation() : KvoQuat(samples.AnyVec4());
        const KvoQuat b =
            i % 4 ? samples.Rotation() : KvoQuat(samples.AnyVec4());
        const float t = samples.Number();

        ASSERT_TRUE(SameBits(Slerp(a, b, t), literal::slerp(a, b, t)))
            << a << b << t;
    }
}

TEST(KvoQuat, SlerpStartsAndEndsAtTheKeys)
{
    const KvoQuat a = About(KvoVec3(1, 0, 0), 20);
    const KvoQuat b = About(KvoVec3(0, 1, 0), 80);

    ExpectNear(Slerp(a, b, 0), a, 1e-6);
    ExpectNear(Slerp(a, b, 1), b, 1e-6);
    ExpectNear(Slerp(a, b, 0.5), a.qbisect(b), 1e-6);
}

TEST(KvoQuat, SlerpTakesTheArcThatIsGiven)
{
    const KvoQuat a = About(KvoVec3(0, 0, 1), 0);
    const KvoQuat b = About(KvoVec3(0, 0, 1), 300);

    ExpectNear(Slerp(a, b, 0.5), About(KvoVec3(0, 0, 1), 150), 1e-6);
}

TEST(KvoQuat, SlerpOfTheIdentityWithItselfIsNotANumber)
{
    KvoQuat identity;
    identity.InitIdentity();

    const KvoQuat q = Slerp(identity, identity, 0.5);

    for (const float part : Components(q))
        EXPECT_TRUE(std::isnan(part));
}

TEST(KvoQuat, InterpGivesTheKeysThemselvesAtTheEnds)
{
    Samples samples;
    const KvoQuat q0 = samples.Rotation(), q1 = samples.Rotation();
    const KvoQuat q2 = samples.Rotation(), q3 = samples.Rotation();

    for (const float t :
         {0.0f, -0.5f, 1e-8f, -1e-8f, -100.0f, std::nextafter(epsilon, 0.0f)})
        EXPECT_TRUE(SameBits(Interp(q0, q1, q2, q3, t), q1)) << t;
    for (const float t : {1.0f, 2.0f, 1 - epsilon / 2, 1 + epsilon, 1e9f})
        EXPECT_TRUE(SameBits(Interp(q0, q1, q2, q3, t), q2)) << t;
    EXPECT_FALSE(SameBits(Interp(q0, q1, q2, q3, epsilon), q1));
    EXPECT_FALSE(SameBits(Interp(q0, q1, q2, q3, 1 - epsilon), q2));
}

TEST(KvoQuat, InterpIsTheBezierCurveOfItsControlPoints)
{
    Samples samples;
    for (int i = 0; i < 1000; ++i) {
        const KvoQuat q0 = samples.Rotation(), q1 = samples.Rotation();
        const KvoQuat q2 = samples.Rotation(), q3 = samples.Rotation();
        const float t = 0.01f + 0.98f * std::abs(samples.Number(1));
        const KvoQuat a = q0.qdouble(q1).qbisect(q2);
        const KvoQuat b = (q1.qdouble(q2).qbisect(q3)).qdouble(q2);
        const KvoQuat p1 = literal::slerp(q1, a, t);
        const KvoQuat p2 = literal::slerp(a, b, t);
        const KvoQuat p3 = literal::slerp(b, q2, t);
        const KvoQuat p4 = literal::slerp(p1, p2, t);
        const KvoQuat p5 = literal::slerp(p2, p3, t);

        EXPECT_TRUE(
            SameBits(Interp(q0, q1, q2, q3, t), literal::slerp(p4, p5, t)));
    }
}

TEST(KvoQuat, InterpAboutOneAxisIsABezierCurveOfAngles)
{
    const KvoVec3 axis(1, 2, 2);
    Samples samples;
    int compared = 0;
    for (int i = 0; i < 2000; ++i) {
        double key[4];
        for (double& angle : key)
            angle = 90 + samples.Number(60);
        const float t = 0.05f + 0.9f * std::abs(samples.Number(1));
        double control[4] = {key[1], (2 * key[1] - key[0] + key[2]) / 2,
                             2 * key[2] - (2 * key[2] - key[1] + key[3]) / 2,
                             key[2]};
        bool apart = true; // equal neighbours have no arc between them
        for (int left = 3; left > 0; --left)
            for (int k = 0; k < left; ++k) {
                apart = apart && std::abs(control[k + 1] - control[k]) > 2;
                control[k] += t * (control[k + 1] - control[k]);
            }
        if (!apart)
            continue;

        const KvoQuat q = Interp(About(axis, key[0]), About(axis, key[1]),
                                 About(axis, key[2]), About(axis, key[3]), t);

        ExpectNear(q, About(axis, control[0]), 1e-4);
        ++compared;
    }
    EXPECT_GT(compared, 500);
}

// Streams.

TEST(KvoQuat, WritesItsPartsAndLeavesThePrecisionAtTen)
{
    std::ostringstream stream;

    stream << KvoQuat(1, KvoVec3(0, 0.1f, -2));

    EXPECT_EQ(stream.str(), "[ 1, [ 0, 0.1000000015, -2 ] ]");
    EXPECT_EQ(stream.precision(), 10);
}

TEST(KvoQuat, WritesTheScalarWithTheSamePrecision)
{
    std::ostringstream stream;

    stream << KvoQuat(0.1f, 0);

    EXPECT_EQ(stream.str(), "[ 0.1000000015, [ 0, 0, 0 ] ]");
}

TEST(KvoQuat, ReadsFourBareNumbers)
{
    std::istringstream stream("1 2\n3 4");
    KvoQuat q;

    stream >> q;

    EXPECT_EQ(Components(q), (Four{1, 2, 3, 4}));
    EXPECT_FALSE(stream.fail());
}

TEST(KvoQuat, ReadingKeepsTheOldValueWhenTheStreamFails)
{
    for (const char* text :
         {"", "1", "1 2 3", "1 2 3 x", "[ 1, [ 0, 0, 0 ] ]"}) {
        std::istringstream stream(text);
        KvoQuat q(6, KvoVec3(7, 8, 9));

        stream >> q;

        EXPECT_EQ(Components(q), (Four{6, 7, 8, 9})) << text;
        EXPECT_TRUE(stream.fail()) << text;
    }
}
