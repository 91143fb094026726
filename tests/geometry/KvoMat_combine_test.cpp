#include <cmath>
#include <limits>
#include <type_traits>

#include <gtest/gtest.h>

#include "KVO/KvoVec.h"
#include "geometry/components.h"
#include "geometry/literal.h"
#include "geometry/reference.h"
#include "geometry/samples.h"

namespace {
constexpr float infinity = std::numeric_limits<float>::infinity();

/// What an operation makes of a matrix before it (type 0) and after it.
enum class Before { IsTheProduct, HasItsTwist };

/// Checks both orders of one operation: in place it is the product with the
/// matrix `init` makes, the const form gives the same bits and leaves its
/// matrix, and every type but 0 is the order behind.
template <class Operation>
void ExpectCombines(const KvoMat& init, Operation operation,
                    Before before = Before::IsTheProduct)
{
    Samples samples;
    for (int round = 0; round < 200; ++round) {
        const KvoMat old = samples.Mat();
        for (const KvoMatMultType type : {0, 1, 2, -1}) {
            KvoMat m = old;
            const KvoMat want = type == 0 ? literal::product(init, old)
                                          : literal::product(old, init);

            KvoMat& result = operation(m, type);
            const KvoMat combined = operation(old, type);

            EXPECT_EQ(&result, &m);
            EXPECT_TRUE(SameBits(combined, m));
            if (type != 0 || before == Before::IsTheProduct)
                reference::ExpectNear(m, reference::Of(want), 1e-4);
        }
    }
}

/// Checks that an operation is exactly the product, but for the sign of zeros.
template <class Operation>
void ExpectExactlyTheProduct(const KvoMat& init, Operation operation)
{
    Samples samples;
    for (int round = 0; round < 500; ++round) {
        const KvoMat old = samples.Mat();

        for (int i = 0; i < 4; ++i) {
            EXPECT_EQ(Components(operation(old, 0)[i]),
                      Components(literal::product(init, old)[i]));
            EXPECT_EQ(Components(operation(old, 1)[i]),
                      Components(literal::product(old, init)[i]));
        }
    }
}

/// Checks that only the rows (before) and columns (after) that are named
/// change, though all the others hold infinity.
template <class Operation>
void ExpectTouchesOnly(std::initializer_list<int> rows,
                       std::initializer_list<int> columns, Operation operation)
{
    const auto holds = [](std::initializer_list<int> list, int n) {
        for (int entry : list)
            if (entry == n)
                return true;
        return false;
    };
    KvoMat by_rows;
    KvoMat by_columns;
    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j) {
            by_rows[i][j] = holds(rows, i) ? 1.0f : infinity;
            by_columns[i][j] = holds(columns, j) ? 1.0f : infinity;
        }

    operation(by_rows, 0);
    operation(by_columns, 1);

    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j) {
            EXPECT_EQ(std::isinf(by_rows[i][j]), !holds(rows, i)) << i << j;
            EXPECT_EQ(std::isinf(by_columns[i][j]), !holds(columns, j))
                << i << j;
            EXPECT_FALSE(std::isnan(by_rows[i][j])) << i << j;
            EXPECT_FALSE(std::isnan(by_columns[i][j])) << i << j;
        }
}

const auto trans = [](auto& m, KvoMatMultType type) -> decltype(auto) {
    return m.Trans(3, -4, 0.5, type);
};
const auto xrot = [](auto& m, KvoMatMultType type) -> decltype(auto) {
    return m.Xrot(25, type);
};
const auto yrot = [](auto& m, KvoMatMultType type) -> decltype(auto) {
    return m.Yrot(-130, type);
};
const auto zrot = [](auto& m, KvoMatMultType type) -> decltype(auto) {
    return m.Zrot(77.5, type);
};
const auto scale = [](auto& m, KvoMatMultType type) -> decltype(auto) {
    return m.Scale(2, -3, 0.7f, type);
};
const auto perspective = [](auto& m, KvoMatMultType type) -> decltype(auto) {
    return m.Perspective(1, 1.5, 2, 7, type);
};
} // namespace

TEST(KvoMat, TransCombinesInBothOrders)
{
    const KvoMat init = KvoMat().InitTrans(3, -4, 0.5);

    ExpectCombines(init, trans);
    ExpectExactlyTheProduct(init, trans);
    ExpectCombines(init, [](auto& m, int type) -> decltype(auto) {
        return m.Trans(KvoVec3(3, -4, 0.5), type);
    });
}

TEST(KvoMat, TransBeforeMovesAlongTheMatrixsOwnAxes)
{
    const KvoMat turned = KvoMat().InitZrot(90);
    const KvoVec3 v(1, 0, 0);
    KvoVec3 before, after;

    turned.Trans(v, 0).ExtractPos(before);
    turned.Trans(v, 1).ExtractPos(after);

    EXPECT_TRUE(before == KvoVec3(0, 1, 0));
    EXPECT_TRUE(after == KvoVec3(1, 0, 0));
}

TEST(KvoMat, TransAfterWeighsEveryRowByItsW)
{
    KvoMat m(KvoVec4(1, 2, 3, 10), KvoVec4(4, 5, 6, 0), KvoVec4(7, 8, 9, -1),
             KvoVec4(0, 0, 0, 2));

    m.Trans(1, 2, 3, 1);

    EXPECT_EQ(Components(m[0]), (Four{11, 22, 33, 10}));
    EXPECT_EQ(Components(m[1]), (Four{4, 5, 6, 0}));
    EXPECT_EQ(Components(m[2]), (Four{6, 6, 6, -1}));
    EXPECT_EQ(Components(m[3]), (Four{2, 4, 6, 2}));
}

TEST(KvoMat, TransTouchesRowThreeOrTheFirstThreeColumns)
{
    KvoMat before(KvoVec4(1), KvoVec4(1), KvoVec4(1), KvoVec4(infinity));
    KvoMat after(KvoVec4(1, 1, 1, infinity), KvoVec4(1), KvoVec4(1),
                 KvoVec4(1));

    before.Trans(1, 2, 3, 0);
    after.Trans(1, 2, 3, 1);

    EXPECT_EQ(Components(before[0]), (Four{1, 1, 1, 1}));
    EXPECT_EQ(Components(before[2]), (Four{1, 1, 1, 1}));
    EXPECT_EQ(before[3][0], infinity);
    EXPECT_EQ(Components(after[0]),
              (Four{infinity, infinity, infinity, infinity}));
    EXPECT_EQ(Components(after[1]), (Four{2, 3, 4, 1}));
}

TEST(KvoMat, TransRelMovesAlongTheMatrixsOwnAxes)
{
    Samples samples;
    const KvoMat m = samples.Mat();
    const KvoMat before = m;

    const KvoMat moved = m.TransRel(1, 2, 3);

    EXPECT_TRUE(SameBits(moved, m.Trans(1, 2, 3, 0)));
    EXPECT_TRUE(SameBits(m.TransRel(KvoVec3(1, 2, 3)), moved));
    EXPECT_TRUE(SameBits(m, before));
}

TEST(KvoMat, XrotCombinesInBothOrders)
{
    ExpectCombines(KvoMat().InitXrot(25), xrot);
    ExpectExactlyTheProduct(KvoMat().InitXrot(25), xrot);
    ExpectTouchesOnly({1, 2}, {1, 2}, xrot);
}

TEST(KvoMat, YrotCombinesInBothOrders)
{
    ExpectCombines(KvoMat().InitYrot(-130), yrot);
    ExpectExactlyTheProduct(KvoMat().InitYrot(-130), yrot);
    ExpectTouchesOnly({0, 2}, {0, 2}, yrot);
}

TEST(KvoMat, ZrotCombinesInBothOrders)
{
    ExpectCombines(KvoMat().InitZrot(77.5), zrot);
    ExpectExactlyTheProduct(KvoMat().InitZrot(77.5), zrot);
    ExpectTouchesOnly({0, 1}, {0, 1}, zrot);
}

TEST(KvoMat, XrotBeforeReplacesRowsOneAndTwo)
{
    Samples samples;
    const KvoMat old = samples.Mat();
    const float radians = static_cast<float>(25 * 0.017453292519943295);
    const float c = cosf(radians);
    const float s = sinf(radians);

    const KvoMat m = old.Xrot(25, 0);

    for (int j = 0; j < 4; ++j) {
        EXPECT_EQ(m[0][j], old[0][j]);
        EXPECT_EQ(m[1][j], c * old[1][j] + s * old[2][j]);
        EXPECT_EQ(m[2][j], c * old[2][j] - s * old[1][j]);
        EXPECT_EQ(m[3][j], old[3][j]);
    }
}

TEST(KvoMat, RotateCombinesInBothOrders)
{
    const KvoVec3 axis(1, -2, 3);

    ExpectCombines(KvoMat().InitRotate(axis, 100),
                   [&axis](auto& m, int type) -> decltype(auto) {
                       return m.Rotate(axis, 100, type);
                   });
}

TEST(KvoMat, ScaleCombinesInBothOrders)
{
    const KvoMat init = KvoMat().InitScale(2, -3, 0.7f);

    ExpectCombines(init, scale);
    ExpectExactlyTheProduct(init, scale);
    ExpectTouchesOnly({0, 1, 2}, {0, 1, 2},
                      [](KvoMat& m, int type) { m.Scale(0, type); });
    ExpectCombines(init, [](auto& m, int type) -> decltype(auto) {
        return m.Scale(KvoVec3(2, -3, 0.7f), type);
    });
    ExpectCombines(
        KvoMat().InitScale(5),
        [](auto& m, int type) -> decltype(auto) { return m.Scale(5, type); });
}

TEST(KvoMat, ScaleBeforeScalesRowsAndAfterScalesColumns)
{
    const KvoMat ones(KvoVec4(1), KvoVec4(1), KvoVec4(1), KvoVec4(1));

    const KvoMat before = ones.Scale(2, 0);
    const KvoMat after = ones.Scale(2, 1);

    EXPECT_EQ(Components(before[0]), (Four{2, 2, 2, 2}));
    EXPECT_EQ(Components(before[3]), (Four{1, 1, 1, 1}));
    for (int i = 0; i < 4; ++i)
        EXPECT_EQ(Components(after[i]), (Four{2, 2, 2, 1}));
}

TEST(KvoMat, WindowCombinesInBothOrders)
{
    ExpectCombines(KvoMat().InitWindow(-1, 2, -3, 4, 1, 9),
                   [](auto& m, int type) -> decltype(auto) {
                       return m.Window(-1, 2, -3, 4, 1, 9, type);
                   });
}

TEST(KvoMat, OrthoCombinesInBothOrders)
{
    ExpectCombines(KvoMat().InitOrtho(-1, 2, -3, 4, 1, 9),
                   [](auto& m, int type) -> decltype(auto) {
                       return m.Ortho(-1, 2, -3, 4, 1, 9, type);
                   });
}

TEST(KvoMat, Ortho2CombinesInBothOrders)
{
    ExpectCombines(KvoMat().InitOrtho2(-1, 2, -3, 4),
                   [](auto& m, int type) -> decltype(auto) {
                       return m.Ortho2(-1, 2, -3, 4, type);
                   });
}

TEST(KvoMat, PolarviewCombinesInBothOrders)
{
    ExpectCombines(KvoMat().InitPolarview(5, 10, 20, 30),
                   [](auto& m, int type) -> decltype(auto) {
                       return m.Polarview(5, 10, 20, 30, type);
                   });
}

TEST(KvoMat, LookatCombinesInBothOrders)
{
    const KvoVec3 view(1, 2, 3);
    const KvoVec3 point(-4, 0, 2);
    const KvoMat init = KvoMat().InitLookat(view, point, 15);

    ExpectCombines(init, [&](auto& m, int type) -> decltype(auto) {
        return m.Lookat(view, point, 15, type);
    });
    ExpectCombines(init, [](auto& m, int type) -> decltype(auto) {
        return m.Lookat(1, 2, 3, -4, 0, 2, 15, type);
    });
}

TEST(KvoMat, PerspectiveAfterIsTheProduct)
{
    ExpectCombines(KvoMat().InitPerspective(1, 1.5, 2, 7), perspective,
                   Before::HasItsTwist);
}

TEST(KvoMat, PerspectiveBeforeInPlaceIsNotTheProduct)
{
    const KvoMat projection = KvoMat().InitPerspective(1, 1.5, 2, 7);
    KvoMat m;

    m.Perspective(1, 1.5, 2, 7, 0);

    EXPECT_EQ(projection[2][3], -1);
    EXPECT_EQ(m[2][3], 0);
    EXPECT_FALSE(m == projection);
    EXPECT_TRUE(SameBits(KvoMat().Perspective(1, 1.5, 2, 7, 1), projection));
}

TEST(KvoMat, PerspectiveBeforeSubtractsTheNewFirstElementOfRowThree)
{
    Samples samples;
    for (int round = 0; round < 1000; ++round) {
        const KvoMat old = samples.Mat();
        const float fovy = 1, aspect = 1.5, near = 2, far = 7;
        const float a = (1 / tanf(fovy / 2)) / aspect;
        const float b = 1 / tanf(fovy / 2);
        const float f3 = -(far + near) / (far - near);
        const float f6 = -(2 * far * near) / (far - near);
        KvoMat want = old;
        for (int c = 0; c < 4; ++c) {
            const float q = want[3][0]; // replaced after the first column
            want[0][c] *= a;
            want[1][c] *= b;
            want[2][c] = f3 * old[2][c] - q;
            want[3][c] = f6 * old[2][c];
        }
        KvoMat m = old;

        m.Perspective(fovy, aspect, near, far, 0);

        EXPECT_TRUE(SameBits(m, want));
        EXPECT_TRUE(
            SameBits(old.Perspective(fovy, aspect, near, far, 0), want));
    }
}

TEST(KvoMat, BuildersChain)
{
    const KvoMat m = KvoMat().InitTrans(1, 2, 3).Scale(2, 1).Trans(1, 0, 0, 1);

    EXPECT_EQ(Components(KvoVec4(0, 0, 0, 1) * m), (Four{3, 4, 6, 1}));
    EXPECT_TRUE((std::is_same_v<KvoMatMultType, int>));
}
