#include <cmath>
#include <limits>
#include <vector>

#include <gtest/gtest.h>

#include "KVO/KvoVec.h"
#include "geometry/components.h"
#include "geometry/literal.h"
#include "geometry/reference.h"
#include "geometry/samples.h"
#include "platform/point_lanes.h"

namespace {
constexpr float infinity = std::numeric_limits<float>::infinity();

/// A projection that makes every kind of w: 0, 1 and others.
const KvoMat depth_to_w(KvoVec4(1, 0, 0, 0), KvoVec4(0, 1, 0, 0),
                        KvoVec4(0, 0, 1, 1), KvoVec4(0, 0, 0, 0));

std::vector<KvoVec4> AnyPoints(std::size_t count)
{
    Samples samples;
    std::vector<KvoVec4> points(count);
    for (KvoVec4& point : points) {
        point = samples.AnyVec4();
        if (std::signbit(point.x))
            point.z =
                static_cast<float>(static_cast<int>(&point - &points[0]) % 3);
    }
    return points;
}
} // namespace

// Products of matrices.

TEST(KvoMat, ProductDoesTheLeftOneFirst)
{
    const KvoMat moved = KvoMat().InitTrans(1, 2, 3);
    const KvoMat doubled = KvoMat().InitScale(2);

    EXPECT_EQ(Components(KvoVec4(1, 1, 1, 1) * (moved * doubled)),
              (Four{4, 6, 8, 1}));
    EXPECT_EQ(Components(KvoVec4(1, 1, 1, 1) * (doubled * moved)),
              (Four{3, 4, 5, 1}));
}

TEST(KvoMat, ProductIsThatOfDoubles)
{
    Samples samples;
    for (int i = 0; i < 5000; ++i) {
        const KvoMat a = samples.Mat();
        const KvoMat b = samples.Mat();

        reference::ExpectNear(
            a * b, reference::Product(reference::Of(a), reference::Of(b)),
            1e-5);
    }
}

TEST(KvoMat, ProductHasTheBitsOfTheLiteralFormula)
{
    Samples samples;
    for (int i = 0; i < 50000; ++i) {
        const KvoMat a = i % 2 ? samples.Mat() : samples.AnyMat();
        const KvoMat b = i % 2 ? samples.Mat() : samples.AnyMat();

        ASSERT_TRUE(SameBits(a * b, literal::product(a, b))) << a << b;
    }
}

TEST(KvoMat, ProductInPlaceIsTheProductAlsoWithItself)
{
    Samples samples;
    const KvoMat a = samples.Mat();
    const KvoMat b = samples.Mat();
    KvoMat m = a;
    KvoMat squared = a;

    EXPECT_EQ(&(m *= b), &m);
    squared *= squared;

    EXPECT_TRUE(SameBits(m, a * b));
    EXPECT_TRUE(SameBits(squared, a * a));
}

// One point.

TEST(KvoMat, RowVectorIsMovedByTheLastRow)
{
    EXPECT_EQ(Components(KvoVec4(1, 2, 3, 1) * KvoMat().InitTrans(10, 20, 30)),
              (Four{11, 22, 33, 1}));
}

TEST(KvoMat, ColumnVectorMeetsTheRows)
{
    const KvoMat m(KvoVec4(1, 2, 3, 4), KvoVec4(0, 1, 0, 0),
                   KvoVec4(0, 0, 1, 0), KvoVec4(0, 0, 0, 1));

    EXPECT_EQ(Components(m * KvoVec4(1, 1, 1, 1)), (Four{10, 1, 1, 1}));
}

TEST(KvoMat, TransformedPointsAreDividedByW)
{
    const KvoMat identity;

    EXPECT_EQ(Components(KvoVec4(2, 4, 6, 2) * identity), (Four{1, 2, 3, 1}));
    EXPECT_EQ(Components(identity * KvoVec4(2, 4, 6, 2)), (Four{1, 2, 3, 1}));
    EXPECT_EQ(Components(KvoVec4(2, 4, 6, -2) * identity),
              (Four{-1, -2, -3, 1}));
}

TEST(KvoMat, WOfZeroOrOneIsNotDividedBy)
{
    const KvoMat identity;

    EXPECT_EQ(Components(KvoVec4(2, 4, 6, 0) * identity), (Four{2, 4, 6, 0}));
    EXPECT_EQ(Components(identity * KvoVec4(2, 4, 6, 0)), (Four{2, 4, 6, 0}));
    EXPECT_EQ(Components(KvoVec4(2, 4, 6, 1) * identity), (Four{2, 4, 6, 1}));
}

TEST(KvoMat, WThatIsInfiniteOrNotANumberBecomesOne)
{
    const KvoMat w_only(KvoVec4(), KvoVec4(), KvoVec4(), KvoVec4(0, 0, 0, 1));

    EXPECT_EQ((KvoVec4(1, 2, 3, infinity) * w_only).w, 1);
    EXPECT_EQ((KvoVec4(1, 2, 3, NAN) * w_only).w, 1);
    EXPECT_EQ((w_only * KvoVec4(1, 2, 3, NAN)).w, 1);
}

TEST(KvoMat, PointsAreThoseOfDoubles)
{
    Samples samples;
    for (int i = 0; i < 5000; ++i) {
        const KvoMat m = samples.Mat();
        const KvoVec4 v = samples.Vec4();
        double row[4] = {}, column[4] = {};
        for (int j = 0; j < 4; ++j)
            for (int k = 0; k < 4; ++k) {
                row[j] += double(v[k]) * m[k][j];
                column[j] += double(v[k]) * m[j][k];
            }

        const KvoVec4 from_row = v * m;
        const KvoVec4 from_column = m * v;

        for (int j = 0; j < 3; ++j) {
            if (std::abs(row[3]) > 0.1) {
                EXPECT_NEAR(from_row[j], row[j] / row[3], 1e-3);
            }
            if (std::abs(column[3]) > 0.1) {
                EXPECT_NEAR(from_column[j], column[j] / column[3], 1e-3);
            }
        }
        EXPECT_EQ(from_row.w, 1);
        EXPECT_EQ(from_column.w, 1);
    }
}

TEST(KvoMat, PointsHaveTheBitsOfTheLiteralFormula)
{
    Samples samples;
    for (int i = 0; i < 50000; ++i) {
        const KvoMat m = i % 3 == 0   ? samples.Mat()
                         : i % 3 == 1 ? samples.AnyMat()
                                      : depth_to_w;
        const KvoVec4 v = i % 2 ? samples.Vec4() : samples.AnyVec4();

        ASSERT_TRUE(SameBits(v * m, literal::row_times(v, m))) << v << m;
        ASSERT_TRUE(SameBits(m * v, literal::times_column(m, v))) << v << m;
    }
}

TEST(KvoMat, ShortVectorsAreTransformedAsPoints)
{
    const KvoMat m = KvoMat().InitTrans(10, 20, 30);

    const KvoVec3 moved(KvoVec3(1, 2, 3) * m);

    EXPECT_EQ(Components(moved), (Three{11, 22, 33}));
}

// Many points.

TEST(KvoMat, TransformGivesEachPointTimesTheMatrix)
{
    const std::vector<KvoVec4> points = AnyPoints(300);
    Samples samples;
    for (std::size_t count = 0; count <= points.size();
         count += count < 20 ? 1 : 93) {
        const KvoMat m = count % 2 ? samples.Mat() : depth_to_w;
        std::vector<KvoVec4> results(points.size(), KvoVec4(99));

        m.Transform(points.data(), results.data(), count);

        for (std::size_t i = 0; i < results.size(); ++i)
            ASSERT_TRUE(SameBits(results[i],
                                 i < count ? literal::row_times(points[i], m)
                                           : KvoVec4(99)))
                << points[i] << m;
    }
}

TEST(KvoMat, TransformHasTheBitsOfTheLiteralFormulaInWhateverLanes)
{
    using zt_platform::PointLanes;
    const std::vector<KvoVec4> points = AnyPoints(1001);
    for (const PointLanes* lanes :
         {&PointLanes::plain(), &PointLanes::fastest()}) {
        Samples samples;
        PointLanes::install(lanes);
        for (int round = 0; round < 60; ++round) {
            const KvoMat m = round % 3 == 0   ? samples.Mat()
                             : round % 3 == 1 ? samples.AnyMat()
                                              : depth_to_w;
            std::vector<KvoVec4> results(points.size());

            m.Transform(points.data(), results.data(), points.size());

            for (std::size_t i = 0; i < points.size(); ++i)
                EXPECT_TRUE(
                    SameBits(results[i], literal::row_times(points[i], m)))
                    << lanes->name() << points[i] << m;
        }
        PointLanes::install(nullptr);
    }
}

TEST(KvoMat, TransformWorksInPlace)
{
    const std::vector<KvoVec4> points = AnyPoints(103);
    std::vector<KvoVec4> changed = points;
    Samples samples;
    const KvoMat m = samples.Mat();

    m.Transform(changed.data(), changed.data(), changed.size());

    for (std::size_t i = 0; i < points.size(); ++i)
        EXPECT_TRUE(SameBits(changed[i], literal::row_times(points[i], m)));
}

TEST(KvoMat, TransformMayOverwriteItsOwnRows)
{
    KvoMat m = KvoMat().InitTrans(1, 2, 3);
    const KvoMat before = m;
    const KvoVec4 points[4] = {KvoVec4(1, 0, 0, 1), KvoVec4(0, 1, 0, 1),
                               KvoVec4(0, 0, 1, 1), KvoVec4(0, 0, 0, 1)};

    m.Transform(points, m.rows, 4);

    for (int i = 0; i < 4; ++i)
        EXPECT_TRUE(SameBits(m.rows[i], points[i] * before));
}

TEST(KvoMat, TransformOfNothingTouchesNothing)
{
    KvoMat().Transform(static_cast<const KvoVec4*>(nullptr), nullptr, 0);
    KvoMat().Transform(static_cast<const KvoVec3*>(nullptr), nullptr, 0);
}

TEST(KvoMat, TransformOfShortVectorsDropsTheWOfTheResultsInWhateverLanes)
{
    using zt_platform::PointLanes;
    for (const PointLanes* lanes :
         {&PointLanes::plain(), &PointLanes::fastest()}) {
        Samples samples;
        PointLanes::install(lanes);
        for (int round = 0; round < 60; ++round) {
            const KvoMat m = round % 3 == 0   ? samples.Mat()
                             : round % 3 == 1 ? samples.AnyMat()
                                              : depth_to_w;
            std::vector<KvoVec3> points;
            for (const KvoVec4& point : AnyPoints(103))
                points.push_back(KvoVec3(point));
            std::vector<KvoVec3> results(points.size());
            std::vector<KvoVec3> changed = points;

            m.Transform(points.data(), results.data(), points.size());
            m.Transform(changed.data(), changed.data(), changed.size());

            for (std::size_t i = 0; i < points.size(); ++i) {
                const KvoVec3 want(literal::row_times(KvoVec4(points[i]), m));
                EXPECT_TRUE(SameBits(results[i], want)) << lanes->name();
                EXPECT_TRUE(SameBits(changed[i], want)) << lanes->name();
            }
        }
        PointLanes::install(nullptr);
    }
}
