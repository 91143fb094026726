#include <cmath>

#include <gtest/gtest.h>

#include "KVO/KvoVec.h"
#include "geometry/components.h"
#include "geometry/literal.h"
#include "geometry/reference.h"
#include "geometry/samples.h"
#include "support/ErrorTrap.h"

namespace {
constexpr double pi = 3.14159265358979323846;

/// A matrix that no builder may leave a trace of.
KvoMat Used()
{
    return KvoMat(KvoVec4(9), KvoVec4(9), KvoVec4(9), KvoVec4(9));
}

void ExpectPoint(const KvoVec4& point, double x, double y, double z,
                 double tolerance = 1e-5)
{
    EXPECT_NEAR(point.x, x, tolerance);
    EXPECT_NEAR(point.y, y, tolerance);
    EXPECT_NEAR(point.z, z, tolerance);
    EXPECT_EQ(point.w, 1);
}
} // namespace

TEST(KvoMat, InitIdentityOverwritesEverything)
{
    KvoMat m = Used();

    EXPECT_EQ(&m.InitIdentity(), &m);

    EXPECT_TRUE(SameBits(m, KvoMat()));
}

TEST(KvoMat, InitTransPutsTheTranslationIntoRowThree)
{
    KvoMat m = Used();
    KvoMat of_vector = Used();

    EXPECT_EQ(&m.InitTrans(10, 20, 30), &m);
    EXPECT_EQ(&of_vector.InitTrans(KvoVec3(10, 20, 30)), &of_vector);

    EXPECT_TRUE(
        SameBits(m, KvoMat(KvoVec4(1, 0, 0, 0), KvoVec4(0, 1, 0, 0),
                           KvoVec4(0, 0, 1, 0), KvoVec4(10, 20, 30, 1))));
    EXPECT_TRUE(SameBits(of_vector, m));
}

TEST(KvoMat, InitXrotTurnsYTowardsZ)
{
    KvoMat m = Used();

    EXPECT_EQ(&m.InitXrot(30), &m);

    const double c = std::sqrt(0.75);
    reference::ExpectNear(
        m, {{{1, 0, 0, 0}, {0, c, 0.5, 0}, {0, -0.5, c, 0}, {0, 0, 0, 1}}},
        1e-7);
}

TEST(KvoMat, InitYrotTurnsZTowardsX)
{
    KvoMat m = Used();

    EXPECT_EQ(&m.InitYrot(30), &m);

    const double c = std::sqrt(0.75);
    reference::ExpectNear(
        m, {{{c, 0, -0.5, 0}, {0, 1, 0, 0}, {0.5, 0, c, 0}, {0, 0, 0, 1}}},
        1e-7);
}

TEST(KvoMat, InitZrotTurnsXTowardsY)
{
    KvoMat m = Used();

    EXPECT_EQ(&m.InitZrot(30), &m);

    const double c = std::sqrt(0.75);
    reference::ExpectNear(
        m, {{{c, 0.5, 0, 0}, {-0.5, c, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}},
        1e-7);
}

TEST(KvoMat, InitZrotOfNinetyDegreesTakesXToY)
{
    ExpectPoint(KvoVec4(1, 0, 0, 1) * KvoMat().InitZrot(90), 0, 1, 0, 1e-7);
}

TEST(KvoMat, RotationsAboutAnAxisAreThoseOfDoubles)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const float degrees = samples.Number(720);
        const KvoVec3 axis = samples.Vec3();

        reference::ExpectNear(KvoMat().InitXrot(degrees),
                              reference::Rotation({1, 0, 0}, degrees), 2e-6);
        reference::ExpectNear(KvoMat().InitYrot(degrees),
                              reference::Rotation({0, 1, 0}, degrees), 2e-6);
        reference::ExpectNear(KvoMat().InitZrot(degrees),
                              reference::Rotation({0, 0, 1}, degrees), 2e-6);
        reference::ExpectNear(KvoMat().InitRotate(axis, degrees),
                              reference::Rotation(reference::Of(axis), degrees),
                              2e-6);
    }
}

TEST(KvoMat, DegreesBecomeRadiansInDoublePrecision)
{
    for (float degrees = 0; degrees < 100000; degrees += 37.7f) {
        const float radians =
            static_cast<float>(double(degrees) * 0.017453292519943295);

        const KvoMat m = KvoMat().InitXrot(degrees);

        EXPECT_EQ(m[1][1], cosf(radians)) << degrees;
        EXPECT_EQ(m[1][2], sinf(radians)) << degrees;
    }
}

TEST(KvoMat, InitRotateFollowsTheFormulaInWrittenOrder)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 axis = samples.Vec3();
        const float degrees = samples.Number(720);
        const float radians =
            static_cast<float>(double(degrees) * 0.017453292519943295);
        const float c = cosf(radians), s = sinf(radians), t = 1 - c;
        const KvoVec3 u = KvoVec3(axis).Unit();
        const float x = u.x, y = u.y, z = u.z;
        const KvoMat want(
            KvoVec3(t * x * x + c, t * x * y + s * z, t * x * z - s * y),
            KvoVec3(t * x * y - s * z, t * y * y + c, t * y * z + s * x),
            KvoVec3(t * x * z + s * y, t * y * z - s * x, t * z * z + c));

        EXPECT_TRUE(SameBits(KvoMat().InitRotate(axis, degrees), want));
    }
}

TEST(KvoMat, InitRotateLeavesTheAxisAndTheFourthColumn)
{
    KvoMat m = Used();
    const KvoVec3 axis(3, -2, 6);

    EXPECT_EQ(&m.InitRotate(axis, 50), &m);

    ExpectPoint(KvoVec4(axis) * m, 3, -2, 6);
    EXPECT_EQ(m[0].w, 0);
    EXPECT_EQ(m[1].w, 0);
    EXPECT_EQ(m[2].w, 0);
    EXPECT_EQ(Components(m[3]), (Four{0, 0, 0, 1}));
    EXPECT_EQ(Components(axis), (Three{3, -2, 6}));
}

TEST(KvoMat, InitRotateAboutAnAxisOfLengthZeroOnlyKeepsTheCosine)
{
    const KvoMat m = KvoMat().InitRotate(KvoVec3(0), 60);

    reference::ExpectNear(m, reference::Scaling(0.5, 0.5, 0.5), 1e-7);
}

TEST(KvoMat, InitScaleFillsTheDiagonal)
{
    KvoMat m = Used();
    KvoMat of_vector = Used();
    KvoMat even = Used();

    EXPECT_EQ(&m.InitScale(2, 3, 4), &m);
    EXPECT_EQ(&of_vector.InitScale(KvoVec3(2, 3, 4)), &of_vector);
    EXPECT_EQ(&even.InitScale(5), &even);

    EXPECT_TRUE(SameBits(
        m, KvoMat(KvoVec3(2, 0, 0), KvoVec3(0, 3, 0), KvoVec3(0, 0, 4))));
    EXPECT_TRUE(SameBits(of_vector, m));
    EXPECT_TRUE(SameBits(
        even, KvoMat(KvoVec3(5, 0, 0), KvoVec3(0, 5, 0), KvoVec3(0, 0, 5))));
}

TEST(KvoMat, InitPerspectiveTakesTheFrustumToTheCube)
{
    KvoMat m = Used();
    const float fovy = static_cast<float>(pi / 3);

    EXPECT_EQ(&m.InitPerspective(fovy, 1.5f, 2, 10), &m);

    const double top = 2 * std::tan(pi / 6);
    const double right = 1.5 * top;
    const KvoVec4 near_corner(static_cast<float>(right),
                              static_cast<float>(top), -2, 1);
    const KvoVec4 far_corner(static_cast<float>(-5 * right),
                             static_cast<float>(5 * top), -10, 1);
    ExpectPoint(near_corner * m, 1, 1, -1);
    ExpectPoint(far_corner * m, -1, 1, 1);
}

TEST(KvoMat, InitPerspectiveSetsSixElements)
{
    const KvoMat m = KvoMat().InitPerspective(1, 2, 3, 5);

    const double cotangent = 1 / std::tan(0.5);
    reference::ExpectNear(m,
                          {{{cotangent / 2, 0, 0, 0},
                            {0, cotangent, 0, 0},
                            {0, 0, -4, -1},
                            {0, 0, -15, 0}}},
                          1e-6);
}

TEST(KvoMat, InitWindowTakesTheWindowToTheSquare)
{
    KvoMat m = Used();

    EXPECT_EQ(&m.InitWindow(-1, 3, -2, 6, 2, 10), &m);

    ExpectPoint(KvoVec4(-1, -2, -2, 1) * m, -1, -1, -1);
    ExpectPoint(KvoVec4(3, 6, -2, 1) * m, 1, 1, -1);
    ExpectPoint(KvoVec4(15, -10, -10, 1) * m, 1, -1, 1);
    EXPECT_TRUE(
        SameBits(m, KvoMat(KvoVec4(1, 0, 0, 0), KvoVec4(0, 0.5, 0, 0),
                           KvoVec4(0.5, 0.5, -1.5, -1), KvoVec4(0, 0, -5, 0))));
}

TEST(KvoMat, InitOrthoTakesTheBoxToTheCube)
{
    KvoMat m = Used();

    EXPECT_EQ(&m.InitOrtho(-1, 3, -2, 6, 2, 10), &m);

    ExpectPoint(KvoVec4(-1, -2, -2, 1) * m, -1, -1, -1);
    ExpectPoint(KvoVec4(3, 6, -10, 1) * m, 1, 1, 1);
    EXPECT_TRUE(SameBits(
        m, KvoMat(KvoVec4(0.5, 0, 0, 0), KvoVec4(0, 0.25, 0, 0),
                  KvoVec4(0, 0, -0.25, 0), KvoVec4(-0.5, -0.5, -1.5, 1))));
}

TEST(KvoMat, InitOrtho2TurnsZRoundAndMovesItNowhere)
{
    KvoMat m = Used();

    EXPECT_EQ(&m.InitOrtho2(-1, 3, -2, 6), &m);

    ExpectPoint(KvoVec4(-1, -2, 7, 1) * m, -1, -1, -7);
    ExpectPoint(KvoVec4(3, 6, -7, 1) * m, 1, 1, 7);
    EXPECT_TRUE(
        SameBits(m, KvoMat(KvoVec4(0.5, 0, 0, 0), KvoVec4(0, 0.25, 0, 0),
                           KvoVec4(0, 0, -1, 0), KvoVec4(-0.5, -0.5, 0, 1))));
}

TEST(KvoMat, ProjectionsFollowTheirFormulasInWrittenOrder)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const float left = samples.Number(), right = samples.Number();
        const float bottom = samples.Number(), top = samples.Number();
        const float near = samples.Number(), far = samples.Number();
        const float fovy = samples.Number(), aspect = samples.Number();
        const KvoMat perspective(
            KvoVec4((1 / tanf(fovy / 2)) / aspect, 0, 0, 0),
            KvoVec4(0, 1 / tanf(fovy / 2), 0, 0),
            KvoVec4(0, 0, -(far + near) / (far - near), -1),
            KvoVec4(0, 0, -(2 * far * near) / (far - near), 0));
        const KvoMat window(KvoVec4(2 * near / (right - left), 0, 0, 0),
                            KvoVec4(0, 2 * near / (top - bottom), 0, 0),
                            KvoVec4((right + left) / (right - left),
                                    (top + bottom) / (top - bottom),
                                    -(far + near) / (far - near), -1),
                            KvoVec4(0, 0, -(2 * far * near) / (far - near), 0));
        KvoMat ortho(KvoVec4(2 / (right - left), 0, 0, 0),
                     KvoVec4(0, 2 / (top - bottom), 0, 0),
                     KvoVec4(0, 0, -2 / (far - near), 0),
                     KvoVec4(-(right + left) / (right - left),
                             -(top + bottom) / (top - bottom),
                             -(far + near) / (far - near), 1));

        EXPECT_TRUE(SameBits(KvoMat().InitPerspective(fovy, aspect, near, far),
                             perspective));
        EXPECT_TRUE(SameBits(
            KvoMat().InitWindow(left, right, bottom, top, near, far), window));
        EXPECT_TRUE(SameBits(
            KvoMat().InitOrtho(left, right, bottom, top, near, far), ortho));
        ortho[2][2] = -1;
        ortho[3][2] = 0;
        EXPECT_TRUE(
            SameBits(KvoMat().InitOrtho2(left, right, bottom, top), ortho));
    }
}

TEST(KvoMat, ViewsFollowTheirStepsInWrittenOrder)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 view = samples.Vec3(10), point = samples.Vec3(10);
        const float twist = samples.Number(180);
        const float azim = samples.Number(180), inc = samples.Number(180);
        const KvoVec3 v = point - view;
        const float h = sqrtf(v.x * v.x + v.z * v.z);
        const float d = sqrtf(v.x * v.x + v.y * v.y + v.z * v.z);
        KvoMat first, second;
        first[0] = KvoVec4(-v.z / h, 0, -v.x / h, 0);
        first[2] = KvoVec4(v.x / h, 0, -v.z / h, 0);
        second[1] = KvoVec4(0, h / d, -v.y / d, 0);
        second[2] = KvoVec4(0, v.y / d, h / d, 0);
        KvoMat lookat = literal::product(KvoMat().InitTrans(-view), first);
        lookat = literal::product(lookat, second).Zrot(-twist, 1);
        KvoMat polarview;
        polarview.InitZrot(-azim);
        polarview.Xrot(-inc, 0);
        polarview.Zrot(-twist, 0);
        polarview.Trans(0, 0, -view.x, 0);

        EXPECT_TRUE(SameBits(KvoMat().InitLookat(view, point, twist), lookat));
        EXPECT_TRUE(SameBits(KvoMat().InitPolarview(view.x, azim, inc, twist),
                             polarview));
    }
}

TEST(KvoMat, InitPolarviewSwingsRoundTheOrigin)
{
    Samples samples;
    for (int i = 0; i < 1000; ++i) {
        const float dist = samples.Number(10), azim = samples.Number(180),
                    inc = samples.Number(180), twist = samples.Number(180);
        const reference::Matrix want = reference::Product(
            reference::Product(reference::Translation(0, 0, -dist),
                               reference::Rotation({0, 0, 1}, -twist)),
            reference::Product(reference::Rotation({1, 0, 0}, -inc),
                               reference::Rotation({0, 0, 1}, -azim)));
        KvoMat m = Used();

        EXPECT_EQ(&m.InitPolarview(dist, azim, inc, twist), &m);

        reference::ExpectNear(m, want, 1e-5);
    }
}

TEST(KvoMat, InitLookatPutsTheEyeAtTheOriginAndThePointAhead)
{
    KvoMat m = Used();

    EXPECT_EQ(&m.InitLookat(1, 2, 3, 4, 6, 15, 40), &m);

    ExpectPoint(KvoVec4(1, 2, 3, 1) * m, 0, 0, 0);
    ExpectPoint(KvoVec4(4, 6, 15, 1) * m, 0, 0, -13);
    EXPECT_NEAR(m.Det(), 1, 1e-6);
}

TEST(KvoMat, InitLookatFromTheZAxisIsATranslation)
{
    const KvoMat m = KvoMat().InitLookat(KvoVec3(0, 0, 5), KvoVec3(0, 0, 0), 0);

    EXPECT_TRUE(m == KvoMat().InitTrans(0, 0, -5));
}

TEST(KvoMat, InitLookatIsTheViewOfDoubles)
{
    Samples samples;
    for (int i = 0; i < 2000; ++i) {
        const KvoVec3 view = samples.Vec3(10);
        const KvoVec3 point = samples.Vec3(10);
        const float twist = samples.Number(180);
        if (std::hypot(point.x - view.x, point.z - view.z) < 0.5)
            continue;

        const KvoMat m = KvoMat().InitLookat(view, point, twist);

        reference::ExpectNear(
            m,
            reference::View(reference::Of(view), reference::Of(point), twist),
            2e-5);
        EXPECT_TRUE(
            SameBits(m, KvoMat().InitLookat(view.x, view.y, view.z, point.x,
                                            point.y, point.z, twist)));
    }
}

TEST(KvoMat, LookingStraightUpIsNotGuarded)
{
    ErrorTrap reports;

    const KvoMat m = KvoMat().InitLookat(KvoVec3(0, 0, 0), KvoVec3(0, 5, 0), 0);

    EXPECT_TRUE(std::isnan(m[0][0]));
    EXPECT_EQ(reports.Text(), "");
}
