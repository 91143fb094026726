#ifndef ZT_TESTS_GEOMETRY_REFERENCE_H
#define ZT_TESTS_GEOMETRY_REFERENCE_H

/// \file
/// Matrices in double precision, worked out in other ways than the library's:
/// determinant and inverse by elimination, rotations from what they do to the
/// axes, views from the directions of the eye.

#include <array>
#include <cmath>
#include <utility>

#include <gtest/gtest.h>

#include "KVO/KvoVec.h"

namespace reference {
using Matrix = std::array<std::array<double, 4>, 4>;
using Vector = std::array<double, 3>;

inline Matrix Of(const KvoMat& m)
{
    Matrix result;
    for (std::size_t i = 0; i < 4; ++i) {
        const KvoVec4& row = m.rows[i];
        result[i] = {row.x, row.y, row.z, row.w};
    }
    return result;
}

inline Vector Of(const KvoVec3& v)
{
    return {v.x, v.y, v.z};
}

/// Makes a matrix of the images of the three axes and of the origin.
inline Matrix OfImages(const Vector& x, const Vector& y, const Vector& z,
                       const Vector& origin = {0, 0, 0})
{
    return {{{x[0], x[1], x[2], 0},
             {y[0], y[1], y[2], 0},
             {z[0], z[1], z[2], 0},
             {origin[0], origin[1], origin[2], 1}}};
}

inline Matrix Identity()
{
    return OfImages({1, 0, 0}, {0, 1, 0}, {0, 0, 1});
}

inline Matrix Product(const Matrix& a, const Matrix& b)
{
    Matrix result{};
    for (std::size_t i = 0; i < 4; ++i)
        for (std::size_t j = 0; j < 4; ++j)
            for (std::size_t k = 0; k < 4; ++k)
                result[i][j] += a[i][k] * b[k][j];
    return result;
}

/// Brings `m` to the identity by steps on its rows, and does the same steps to
/// `other`.
///
/// Returns: the determinant of `m`.
inline double Eliminate(Matrix m, Matrix& other)
{
    double determinant = 1;
    for (std::size_t k = 0; k < 4; ++k) {
        std::size_t best = k;
        for (std::size_t i = k + 1; i < 4; ++i)
            if (std::abs(m[i][k]) > std::abs(m[best][k]))
                best = i;
        if (m[best][k] == 0)
            return 0;
        if (best != k) {
            std::swap(m[best], m[k]);
            std::swap(other[best], other[k]);
            determinant = -determinant;
        }
        const double pivot = m[k][k];
        determinant *= pivot;
        for (std::size_t j = 0; j < 4; ++j) {
            m[k][j] /= pivot;
            other[k][j] /= pivot;
        }
        for (std::size_t i = 0; i < 4; ++i) {
            const double factor = i == k ? 0 : m[i][k];
            for (std::size_t j = 0; j < 4; ++j) {
                m[i][j] -= factor * m[k][j];
                other[i][j] -= factor * other[k][j];
            }
        }
    }
    return determinant;
}

inline double Determinant(const Matrix& m)
{
    Matrix ignored = Identity();
    return Eliminate(m, ignored);
}

inline Matrix Inverse(const Matrix& m)
{
    Matrix result = Identity();
    Eliminate(m, result);
    return result;
}

inline double Dot(const Vector& a, const Vector& b)
{
    return a[0] * b[0] + a[1] * b[1] + a[2] * b[2];
}

inline Vector Cross(const Vector& a, const Vector& b)
{
    return {a[1] * b[2] - a[2] * b[1], a[2] * b[0] - a[0] * b[2],
            a[0] * b[1] - a[1] * b[0]};
}

inline Vector Unit(const Vector& v)
{
    const double length = std::sqrt(Dot(v, v));
    return {v[0] / length, v[1] / length, v[2] / length};
}

/// Turns `v` about an axis, counter-clockwise for who looks against it.
inline Vector Turned(const Vector& v, const Vector& axis, double degrees)
{
    const Vector u = Unit(axis);
    const double angle = degrees * std::acos(-1.0) / 180;
    const Vector side = Cross(u, v);
    const double along = Dot(u, v) * (1 - std::cos(angle));
    Vector result;
    for (std::size_t i = 0; i < 3; ++i)
        result[i] =
            v[i] * std::cos(angle) + side[i] * std::sin(angle) + u[i] * along;
    return result;
}

inline Matrix Rotation(const Vector& axis, double degrees)
{
    return OfImages(Turned({1, 0, 0}, axis, degrees),
                    Turned({0, 1, 0}, axis, degrees),
                    Turned({0, 0, 1}, axis, degrees));
}

inline Matrix Translation(double x, double y, double z)
{
    return OfImages({1, 0, 0}, {0, 1, 0}, {0, 0, 1}, {x, y, z});
}

inline Matrix Scaling(double x, double y, double z)
{
    return OfImages({x, 0, 0}, {0, y, 0}, {0, 0, z});
}

/// The view of an eye that stands at `view`, looks towards `point` with y
/// upwards, and is then turned by `twist` about its own line of sight.
inline Matrix View(const Vector& view, const Vector& point, double twist)
{
    const Vector back =
        Unit({view[0] - point[0], view[1] - point[1], view[2] - point[2]});
    const Vector right = Unit(Cross({0, 1, 0}, back));
    const Vector up = Cross(back, right);
    const Matrix looking =
        OfImages({right[0], up[0], back[0]}, {right[1], up[1], back[1]},
                 {right[2], up[2], back[2]},
                 {-Dot(view, right), -Dot(view, up), -Dot(view, back)});
    return Product(looking, Rotation({0, 0, 1}, -twist));
}

inline void ExpectNear(const KvoMat& m, const Matrix& want, double tolerance)
{
    const Matrix have = Of(m);
    for (std::size_t i = 0; i < 4; ++i)
        for (std::size_t j = 0; j < 4; ++j)
            EXPECT_NEAR(have[i][j], want[i][j], tolerance)
                << "row " << i << ", column " << j;
}
} // namespace reference

#endif
