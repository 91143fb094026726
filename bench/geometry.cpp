// How do products, inverses, point transforms and slerp compare with their
// literal formulas and with other libraries, in a host that is built with -O2?
//
// A benchmark walks over the same few values, which fit the first cache, and
// gives the time of one operation; "million" passes over a million points, of
// four floats or, behind "also", of three. The
// peers see the same numbers in memory: a row of ours is a column of those who
// keep columns, so each of them multiplies in its own natural way.

#include <cmath>
#include <cstddef>
#include <cstring>
#include <random>
#include <vector>

#include <benchmark/benchmark.h>

#ifdef ZT_BENCH_GLM
#include <glm/glm.hpp>
#include <glm/gtc/quaternion.hpp>
#endif
#ifdef ZT_BENCH_EIGEN
#include <Eigen/Dense>
#endif
#ifdef ZT_BENCH_IMATH
#include <Imath/ImathMatrix.h>
#include <Imath/ImathQuat.h>
#include <Imath/ImathVec.h>
#endif

#include "KVO/KvoVec.h"
#include "geometry/literal.h"
#include "geometry/samples.h"
#include "require.h"

namespace {
constexpr std::size_t few = 64;
constexpr std::size_t million = 1000000;

/// Makes `count` values of random numbers, the same ones for every type of the
/// same size. Quaternions are of length 1 and all in one half of the sphere,
/// so that everybody takes the same arc between them.
template <class Value>
std::vector<Value> values(std::size_t count, unsigned seed, bool unit = false)
{
    constexpr std::size_t floats = sizeof(Value) / sizeof(float);
    std::mt19937 random(seed);
    std::uniform_real_distribution<float> any(-2, 2);
    std::vector<Value> made(count);
    for (Value& value : made) {
        float numbers[floats];
        float squares = 0;
        for (float& number : numbers) {
            number = any(random);
            squares += number * number;
        }
        for (float& number : numbers)
            if (unit)
                number = std::abs(number) / std::sqrt(squares);
        std::memcpy(static_cast<void*>(&value), numbers, sizeof value);
    }
    return made;
}

template <class Left, class Right, class Operation>
void pairs(benchmark::State& state, Operation operation, bool unit = false)
{
    const std::vector<Left> left = values<Left>(few, 1, unit);
    const std::vector<Right> right = values<Right>(few, 2, unit);
    using Result = decltype(operation(left[0], right[0]));
    std::vector<Result> results(few);
    while (state.KeepRunningBatch(few)) {
        for (std::size_t i = 0; i < few; ++i)
            results[i] = operation(left[i], right[i]);
        benchmark::ClobberMemory();
    }
}

template <class Point, class Matrix, class Operation>
void all_points(benchmark::State& state, Operation operation)
{
    const std::vector<Point> points = values<Point>(million, 3);
    const Matrix matrix = values<Matrix>(1, 4)[0];
    std::vector<Point> results(million);
    for (auto _ : state) {
        operation(points, results, matrix);
        benchmark::ClobberMemory();
    }
}

/// As `all_points`, for those who have no operation for many points.
template <class Point, class Matrix, class Operation>
void each_point(benchmark::State& state, Operation operation)
{
    all_points<Point, Matrix>(
        state, [operation](const std::vector<Point>& points,
                           std::vector<Point>& results, const Matrix& matrix) {
            for (std::size_t i = 0; i < million; ++i)
                results[i] = operation(points[i], matrix);
        });
}

// Ours and literal.

const auto our_product = [](const KvoMat& a, const KvoMat& b) { return a * b; };
const auto our_inverse = [](const KvoMat& a, const KvoMat&) {
    return a.Invert();
};
const auto our_point = [](const KvoVec4& v, const KvoMat& m) { return v * m; };
const auto our_slerp = [](const KvoQuat& a, const KvoQuat& b) {
    return Slerp(a, b, 0.3f);
};
const auto literal_inverse = [](const KvoMat& a, const KvoMat&) {
    return literal::inverse(a);
};
const auto literal_slerp = [](const KvoQuat& a, const KvoQuat& b) {
    return literal::slerp(a, b, 0.3f);
};

void register_ours()
{
    using benchmark::RegisterBenchmark;
    RegisterBenchmark("matrix_product/ours",
                      pairs<KvoMat, KvoMat, decltype(our_product)>, our_product,
                      false);
    RegisterBenchmark("matrix_product/literal",
                      pairs<KvoMat, KvoMat, decltype(&literal::product)>,
                      literal::product, false);
    RegisterBenchmark("matrix_inverse/ours",
                      pairs<KvoMat, KvoMat, decltype(our_inverse)>, our_inverse,
                      false);
    RegisterBenchmark("matrix_inverse/literal",
                      pairs<KvoMat, KvoMat, decltype(literal_inverse)>,
                      literal_inverse, false);
    RegisterBenchmark("point_transform/ours",
                      pairs<KvoVec4, KvoMat, decltype(our_point)>, our_point,
                      false);
    RegisterBenchmark("point_transform/literal",
                      pairs<KvoVec4, KvoMat, decltype(&literal::row_times)>,
                      literal::row_times, false);
    RegisterBenchmark("slerp/ours",
                      pairs<KvoQuat, KvoQuat, decltype(our_slerp)>, our_slerp,
                      true);
    RegisterBenchmark("slerp/literal",
                      pairs<KvoQuat, KvoQuat, decltype(literal_slerp)>,
                      literal_slerp, true);

    const auto batch = [](const auto& points, auto& results, const KvoMat& m) {
        m.Transform(points.data(), results.data(), million);
    };
    const auto copy = [](const auto& points, auto& results, const KvoMat&) {
        std::memcpy(static_cast<void*>(results.data()), points.data(),
                    million * sizeof points[0]);
    };
    RegisterBenchmark("point_million/ours",
                      all_points<KvoVec4, KvoMat, decltype(batch)>, batch);
    RegisterBenchmark(
        "point_million/literal",
        each_point<KvoVec4, KvoMat, decltype(&literal::row_times)>,
        literal::row_times);
    RegisterBenchmark("point_million/limit",
                      all_points<KvoVec4, KvoMat, decltype(copy)>, copy);
    RegisterBenchmark("also/million3/ours",
                      all_points<KvoVec3, KvoMat, decltype(batch)>, batch);
    RegisterBenchmark("also/million3/limit",
                      all_points<KvoVec3, KvoMat, decltype(copy)>, copy);
}

/// Registers one peer's rows; what it cannot do is a null pointer.
template <class Matrix, class Point, class Quaternion, class Product,
          class Inverse, class Transform, class Slerp>
void register_peer(const std::string& name, Product product, Inverse inverse,
                   Transform transform, Slerp slerp)
{
    using benchmark::RegisterBenchmark;
    RegisterBenchmark(("matrix_product/" + name).c_str(),
                      pairs<Matrix, Matrix, Product>, product, false);
    RegisterBenchmark(("matrix_inverse/" + name).c_str(),
                      pairs<Matrix, Matrix, Inverse>, inverse, false);
    RegisterBenchmark(("point_transform/" + name).c_str(),
                      pairs<Point, Matrix, Transform>, transform, false);
    RegisterBenchmark(("slerp/" + name).c_str(),
                      pairs<Quaternion, Quaternion, Slerp>, slerp, true);
    RegisterBenchmark(("point_million/" + name).c_str(),
                      each_point<Point, Matrix, Transform>, transform);
}

void register_peers()
{
#ifdef ZT_BENCH_GLM
    register_peer<glm::mat4, glm::vec4, glm::quat>(
        "glm", [](const glm::mat4& a, const glm::mat4& b) { return a * b; },
        [](const glm::mat4& a, const glm::mat4&) { return glm::inverse(a); },
        [](const glm::vec4& v, const glm::mat4& m) {
            const glm::vec4 result = m * v;
            return result / result.w;
        },
        [](const glm::quat& a, const glm::quat& b) {
            return glm::slerp(a, b, 0.3f);
        });
#endif
#ifdef ZT_BENCH_EIGEN
    register_peer<Eigen::Matrix4f, Eigen::Vector4f, Eigen::Quaternionf>(
        "eigen",
        [](const Eigen::Matrix4f& a, const Eigen::Matrix4f& b) {
            return Eigen::Matrix4f(a * b);
        },
        [](const Eigen::Matrix4f& a, const Eigen::Matrix4f&) {
            return Eigen::Matrix4f(a.inverse());
        },
        [](const Eigen::Vector4f& v, const Eigen::Matrix4f& m) {
            const Eigen::Vector4f result = m * v;
            return Eigen::Vector4f(result / result.w());
        },
        [](const Eigen::Quaternionf& a, const Eigen::Quaternionf& b) {
            return a.slerp(0.3f, b);
        });
#endif
#ifdef ZT_BENCH_IMATH
    register_peer<Imath::M44f, Imath::V4f, Imath::Quatf>(
        "imath",
        [](const Imath::M44f& a, const Imath::M44f& b) { return a * b; },
        [](const Imath::M44f& a, const Imath::M44f&) { return a.inverse(); },
        [](const Imath::V4f& v, const Imath::M44f& m) {
            const Imath::V4f result = v * m;
            return result / result.w;
        },
        [](const Imath::Quatf& a, const Imath::Quatf& b) {
            return Imath::slerp(a, b, 0.3f);
        });
#endif
}

/// A time is worth nothing if the bits are not those of the formula.
void require_the_same_bits()
{
    constexpr std::size_t count = 10000;
    const auto m = values<KvoMat>(count, 1);
    const auto n = values<KvoMat>(count, 2);
    const auto p = values<KvoVec4>(count, 3);
    const auto a = values<KvoQuat>(count, 1, true);
    const auto b = values<KvoQuat>(count, 2, true);
    std::vector<KvoVec4> all(count);
    for (std::size_t i = 0; i < count; ++i) {
        Require(SameBits(our_product(m[i], n[i]), literal::product(m[i], n[i])),
                "matrix product");
        Require(SameBits(our_inverse(m[i], m[i]), literal::inverse(m[i])),
                "inverse");
        Require(SameBits(our_point(p[i], m[i]), literal::row_times(p[i], m[i])),
                "row vector times matrix");
        Require(SameBits(our_slerp(a[i], b[i]), literal_slerp(a[i], b[i])),
                "slerp");
    }
    for (const KvoMat& matrix : {m[0], m[1], n[0], n[1]}) {
        matrix.Transform(p.data(), all.data(), count);
        for (std::size_t i = 0; i < count; ++i)
            Require(SameBits(all[i], literal::row_times(p[i], matrix)),
                    "many points");
    }
}
} // namespace

int main(int argc, char** argv)
{
    require_the_same_bits();
    register_ours();
    register_peers();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
