#ifndef ZT_TESTS_GEOMETRY_LITERAL_H
#define ZT_TESTS_GEOMETRY_LITERAL_H

/// \file
/// The formulas of the geometry room with no care for speed: one element at a
/// time, every index checked. What the library computes in lanes must give
/// the same bits.

#include <cmath>
#include <cstddef>

#include "KVO/KvoVec.h"

namespace literal {
inline KvoMat product(const KvoMat& a, const KvoMat& b)
{
    KvoMat result;
    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j) {
            float sum = a[i][0] * b[0][j];
            for (int k = 1; k < 4; ++k)
                sum = sum + a[i][k] * b[k][j];
            result[i][j] = sum;
        }
    return result;
}

inline KvoVec4 homogeneous(KvoVec4 v)
{
    if (v[3] != 0 && v[3] != 1) {
        v[0] = v[0] / v[3];
        v[1] = v[1] / v[3];
        v[2] = v[2] / v[3];
        v[3] = 1;
    }
    return v;
}

inline KvoVec4 row_times(const KvoVec4& v, const KvoMat& m)
{
    const KvoMat columns = m.Transpose();
    KvoVec4 result;
    for (int j = 0; j < 4; ++j)
        result[j] = v.Dot(columns[j]);
    return homogeneous(result);
}

inline KvoVec4 times_column(const KvoMat& m, const KvoVec4& v)
{
    KvoVec4 result;
    for (int i = 0; i < 4; ++i)
        result[i] = v.Dot(m[i]);
    return homogeneous(result);
}

/// The minor of two rows and two columns; exchanged columns negate it.
inline float minor(const KvoMat& m, int upper, int lower, int left, int right)
{
    return m[upper][left] * m[lower][right] - m[upper][right] * m[lower][left];
}

/// The cofactor, expanded along the row that is left over when its own row
/// and the other half of the matrix are gone. The sign of an odd column comes
/// from exchanged columns in the minors, that of an odd row from the order of
/// the terms, so that no zero is negated.
inline float cofactor(const KvoMat& m, int row, int column)
{
    const int lead = row ^ 1;
    const int upper = row < 2 ? 2 : 0;
    int kept[3];
    for (int c = 0, n = 0; c < 4; ++c)
        if (c != column)
            kept[n++] = c;

    float minors[3]; // without the first, the second, the third kept column
    for (int n = 0; n < 3; ++n) {
        const int left = kept[n == 0 ? 1 : 0];
        const int right = kept[n == 2 ? 1 : 2];
        minors[n] = column % 2 == 0 ? minor(m, upper, upper + 1, left, right)
                                    : minor(m, upper, upper + 1, right, left);
    }
    if (row % 2 == 0)
        return m[lead][kept[0]] * minors[0] - m[lead][kept[1]] * minors[1] +
               m[lead][kept[2]] * minors[2];
    return m[lead][kept[1]] * minors[1] - m[lead][kept[0]] * minors[0] -
           m[lead][kept[2]] * minors[2];
}

inline KvoMat adjoint(const KvoMat& m)
{
    KvoMat result;
    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j)
            result[j][i] = cofactor(m, i, j);
    return result;
}

/// Without the report of a singular matrix.
inline KvoMat inverse(const KvoMat& m)
{
    KvoMat result = adjoint(m);
    float det = m[0][0] * result[0][0];
    for (int k = 1; k < 4; ++k)
        det = det + m[0][k] * result[k][0];
    if (-zt_geometry::tolerance < det && det < zt_geometry::tolerance)
        return result;
    for (int i = 0; i < 4; ++i)
        for (int j = 0; j < 4; ++j)
            result[i][j] = result[i][j] / det;
    return result;
}

inline KvoQuat slerp(const KvoQuat& a, const KvoQuat& b, float t)
{
    const float omega = acosf(
        a.s * b.s + (a.v[0] * b.v[0] + a.v[1] * b.v[1] + a.v[2] * b.v[2]));
    const float wa = sinf((1 - t) * omega) / sinf(omega);
    const float wb = sinf(t * omega) / sinf(omega);
    KvoQuat result;
    result.s = wa * a.s + wb * b.s;
    for (int i = 0; i < 3; ++i)
        result.v[i] = wa * a.v[i] + wb * b.v[i];
    return result;
}
} // namespace literal

#endif
