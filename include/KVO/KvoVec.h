#ifndef KVO_KVOVEC_H
#define KVO_KVOVEC_H

/// \file
/// Vectors of three and four components, 4 x 4 matrices and quaternions, all of
/// single precision: plain values, copied freely, with the usual operators.
///
/// A point is a row vector that stands on the left, `v * m`, so in `a * b` the
/// matrix `a` acts first, and a translation sits in row 3. `*` of two vectors
/// multiplies component by component. Angles of matrices are degrees; only the
/// field of view is radians.
///
/// Formulas are evaluated in float and in the order in which they are written
/// here, so every machine gives the same bits, as long as the compiler does
/// not fuse a product with a sum. A host that is built for processors which
/// can passes `-ffp-contract=off -mno-fma`; the second, since g++ 12 fuses now
/// and then in spite of the first. Indices are checked, and a bad one reported;
/// the components themselves are public for those who know what they do.

#include <KVO/KvoCommon.h>

#include <cmath>
#include <cstddef>
#include <iosfwd>
#include <type_traits>

class KvoMat;
class KvoQuat;
class KvoVec3;
class KvoVec4;

/// How a builder combines its transformation T with a matrix M: 0 puts T
/// before, T * M, so that T acts first; everything else, usually 1, puts it
/// after, M * T.
typedef int KvoMatMultType;

/// What the types below share; not for hosts.
namespace zt_geometry {
/// Below this two numbers are equal, and a determinant is singular: 2 to the
/// power -23, one unit in the last place of 1.
inline constexpr float tolerance = 1.1920929e-07f;

/// Says whether `value` lies strictly within the tolerance of 0; NaN does not.
constexpr bool small(float value)
{
    return -tolerance < value && value < tolerance;
}

/// Converts degrees; the product is taken in double precision.
constexpr float radians(float degrees)
{
    return static_cast<float>(static_cast<double>(degrees) *
                              0.017453292519943295);
}

/// Gives the float that stands in for every component that does not exist.
///
/// Reports: a warning "`type` - Illegal index [`index`].\n".
ZT_API float& illegal_component(const char* type, int index);

/// Gives the row that stands in for every row that does not exist.
///
/// Reports: a warning "KvoMat - Illegal index [`index`].\n".
ZT_API KvoVec4& illegal_row(int index);

/// Reports a warning "`type` - Division by zero.\n".
ZT_API void division_by_zero(const char* type);

/// Lets a pointer of this very type through, and no literal 0.
template <class Given, class Wanted>
using only = std::enable_if_t<std::is_same_v<Given, Wanted>, int>;
} // namespace zt_geometry

/// A vector of three components.
class KvoVec3
{
public:
    constexpr KvoVec3() : x(0), y(0), z(0) {}
    constexpr KvoVec3(const KvoVec3&) = default;

    /// Sets every component to `value`.
    constexpr KvoVec3(float value) : x(value), y(value), z(value) {}

    /// Takes the components.
    constexpr KvoVec3(float x0, float y0, float z0) : x(x0), y(y0), z(z0) {}

    /// Takes the first three floats of an array; null gives zeros.
    ///
    /// A template, so that `KvoVec3(0)` means the number.
    template <class T, zt_geometry::only<T, float> = 0>
    constexpr KvoVec3(const T* values)
        : x(values ? values[0] : 0), y(values ? values[1] : 0),
          z(values ? values[2] : 0)
    {}

    /// Takes x, y and z and drops w: nothing is divided by it.
    constexpr KvoVec3(const KvoVec4& v);

    constexpr KvoVec3& operator=(const KvoVec3&) = default;

    /// Sets every component to `value`.
    constexpr KvoVec3& operator=(float value)
    {
        x = y = z = value;
        return *this;
    }

    /// Gives the sum of the products of the components.
    constexpr float Dot(const KvoVec3& v) const
    {
        return x * v.x + y * v.y + z * v.z;
    }

    /// Gives the cross product.
    constexpr KvoVec3 Cross(const KvoVec3& v) const
    {
        return KvoVec3(y * v.z - z * v.y, z * v.x - x * v.z, x * v.y - y * v.x);
    }

    /// Gives the length.
    float Mag() const { return std::sqrt(MagSquared()); }

    /// Gives the sum of the squares of the components.
    constexpr float MagSquared() const { return x * x + y * y + z * z; }

    /// Gives a vector of length 1 in the same direction.
    ///
    /// Returns: the zero vector when the length is 0.
    KvoVec3 Dir() const;

    /// Makes the length 1; a length of exactly 0 stays as it is.
    KvoVec3& Unit();

    /// Turns the vector round.
    constexpr KvoVec3& Negate() { return *this = -*this; }

    /// Makes the length `length`; a length of 0 stays as it is.
    KvoVec3& Scale(float length);

    /// Gives a matrix that turns the z axis into the direction of this vector.
    ///
    /// By design: row 2 ends in 1, since it is the direction taken as a point
    ///            (KvoVec3.VecToRotmatrixEndsRowTwoInOne); along the x axis
    ///            and without a direction it divides by zero
    ///            (KvoVec3.VecToRotmatrixOfTheXAxisDividesByZero).
    KvoMat VecToRotmatrix() const;

    /// Gives the angles of the direction about the x and the y axis.
    ///
    /// Units:   degrees.
    /// Returns: the two angles, and 0 as the third.
    KvoVec3 VecToAngles() const;

    /// Gives the vector with every component negated.
    constexpr KvoVec3 operator-() const { return KvoVec3(-x, -y, -z); }

    /// Says whether each component differs by less than 2 to the power -23.
    constexpr bool operator==(const KvoVec3& v) const
    {
        return zt_geometry::small(x - v.x) && zt_geometry::small(y - v.y) &&
               zt_geometry::small(z - v.z);
    }
    constexpr bool operator!=(const KvoVec3& v) const { return !(*this == v); }

    /// Gives the component of an index from 0 to 2.
    ///
    /// Returns: for any other index a float that all bad indices of all
    ///          vectors share; what is written to it is read from it again.
    /// Reports: a warning "KvoVec3 - Illegal index [3].\n", say.
    constexpr float& operator[](int index)
    {
        return index == 0   ? x
               : index == 1 ? y
               : index == 2 ? z
                            : zt_geometry::illegal_component("KvoVec3", index);
    }

    /// Gives the value of the component of an index from 0 to 2; otherwise as
    /// above.
    constexpr float operator[](int index) const
    {
        return index == 0   ? x
               : index == 1 ? y
               : index == 2 ? z
                            : zt_geometry::illegal_component("KvoVec3", index);
    }

    /// Operate component by component, in place.
    constexpr KvoVec3& operator+=(const KvoVec3& v);
    constexpr KvoVec3& operator-=(const KvoVec3& v);
    constexpr KvoVec3& operator*=(const KvoVec3& v);

    /// Divides component by component.
    ///
    /// By design: does not look for zeros, as `/` does; such a component
    ///            becomes infinite or NaN
    ///            (KvoVec3.CompoundDivisionDoesNotLookForZeros).
    constexpr KvoVec3& operator/=(const KvoVec3& v);

    float x; ///< The first component.
    float y; ///< The second component.
    float z; ///< The third component.
};

/// A vector of four components, or a point with its homogeneous divisor w.
class KvoVec4
{
public:
    constexpr KvoVec4() : x(0), y(0), z(0), w(0) {}
    constexpr KvoVec4(const KvoVec4&) = default;

    /// Sets every component to `value`.
    constexpr KvoVec4(float value) : x(value), y(value), z(value), w(value) {}

    /// Takes the components.
    constexpr KvoVec4(float x0, float y0, float z0, float w0)
        : x(x0), y(y0), z(z0), w(w0)
    {}

    /// Takes the first four floats of an array; null gives zeros.
    ///
    /// A template, so that `KvoVec4(0)` means the number.
    template <class T, zt_geometry::only<T, float> = 0>
    constexpr KvoVec4(const T* values)
        : x(values ? values[0] : 0), y(values ? values[1] : 0),
          z(values ? values[2] : 0), w(values ? values[3] : 0)
    {}

    /// Makes a point: w is 1.
    constexpr KvoVec4(const KvoVec3& v) : x(v.x), y(v.y), z(v.z), w(1) {}

    constexpr KvoVec4& operator=(const KvoVec4&) = default;

    /// Sets every component to `value`.
    constexpr KvoVec4& operator=(float value)
    {
        x = y = z = w = value;
        return *this;
    }

    /// Gives the sum of the products of the four components.
    constexpr float Dot(const KvoVec4& v) const
    {
        return x * v.x + y * v.y + z * v.z + w * v.w;
    }

    /// Gives the cross product of x, y and z, with w = 0.
    constexpr KvoVec4 Cross(const KvoVec4& v) const
    {
        return KvoVec4(y * v.z - z * v.y, z * v.x - x * v.z, x * v.y - y * v.x,
                       0);
    }

    /// Gives the length in four dimensions.
    float Mag() const { return std::sqrt(MagSquared()); }

    /// Gives the sum of the squares of the four components.
    constexpr float MagSquared() const { return x * x + y * y + z * z + w * w; }

    /// Gives the vector divided by its length.
    ///
    /// By design: does not look for a length of 0, which gives NaN
    ///            (KvoVec4.DirOfZeroIsNotGuarded).
    KvoVec4 Dir() const;

    /// Makes the length 1; a length of exactly 0 stays as it is.
    KvoVec4& Unit();

    /// Turns the vector round.
    constexpr KvoVec4& Negate() { return *this = -*this; }

    /// Makes the length `length`; a length of 0 stays as it is.
    KvoVec4& Scale(float length);

    /// Gives the vector with every component negated.
    constexpr KvoVec4 operator-() const { return KvoVec4(-x, -y, -z, -w); }

    /// Says whether each component differs by less than 2 to the power -23.
    constexpr bool operator==(const KvoVec4& v) const
    {
        return zt_geometry::small(x - v.x) && zt_geometry::small(y - v.y) &&
               zt_geometry::small(z - v.z) && zt_geometry::small(w - v.w);
    }
    constexpr bool operator!=(const KvoVec4& v) const { return !(*this == v); }

    /// Gives the component of an index from 0 to 3.
    ///
    /// Returns: for any other index a float that all bad indices of all
    ///          vectors share; what is written to it is read from it again.
    /// Reports: a warning "KvoVec4 - Illegal index [4].\n", say.
    constexpr float& operator[](int index)
    {
        return index == 0   ? x
               : index == 1 ? y
               : index == 2 ? z
               : index == 3 ? w
                            : zt_geometry::illegal_component("KvoVec4", index);
    }

    /// Gives the value of the component of an index from 0 to 3; otherwise as
    /// above.
    constexpr float operator[](int index) const
    {
        return index == 0   ? x
               : index == 1 ? y
               : index == 2 ? z
               : index == 3 ? w
                            : zt_geometry::illegal_component("KvoVec4", index);
    }

    /// Operate component by component, in place.
    constexpr KvoVec4& operator+=(const KvoVec4& v);
    constexpr KvoVec4& operator-=(const KvoVec4& v);
    constexpr KvoVec4& operator*=(const KvoVec4& v);

    /// Divides component by component.
    ///
    /// By design: does not look for zeros, as `/` does
    ///            (KvoVec4.CompoundDivisionDoesNotLookForZeros).
    constexpr KvoVec4& operator/=(const KvoVec4& v);

    float x; ///< The first component.
    float y; ///< The second component.
    float z; ///< The third component.
    float w; ///< The fourth: 1 in a point, 0 in a direction.
};

/// A 4 x 4 matrix that transforms row vectors; `m[r][c]` is column c of row r.
///
/// Every transformation X comes as `InitX`, which makes the matrix X; as `X`,
/// which combines the matrix with X before or after it; and as a const `X`,
/// which gives that combination and leaves the matrix as it is. A matrix that
/// is not const uses the second: for the third it is made const or copied.
class KvoMat
{
public:
    /// Makes the identity.
    constexpr KvoMat();
    constexpr KvoMat(const KvoMat&) = default;

    /// Makes a rotation part of three rows; the rest is the identity's.
    constexpr KvoMat(const KvoVec3& row0, const KvoVec3& row1,
                     const KvoVec3& row2);

    /// Makes a rotation part and a translation; the last column is the
    /// identity's.
    constexpr KvoMat(const KvoVec3& row0, const KvoVec3& row1,
                     const KvoVec3& row2, const KvoVec3& row3);

    /// Takes four rows as they are.
    constexpr KvoMat(const KvoVec4& row0, const KvoVec4& row1,
                     const KvoVec4& row2, const KvoVec4& row3);

    /// Takes 16 numbers row by row; null gives zeros.
    constexpr KvoMat(const float* values);
    constexpr KvoMat(const float values[][4]);

    /// Takes 16 numbers row by row, rounded to float; null gives zeros.
    constexpr KvoMat(const double* values);
    constexpr KvoMat(const double values[][4]);

    /// Makes the rotation of a quaternion of length 1.
    ///
    /// By design: with y in the vector part, `m[2][2]` is not the rotation's:
    ///            it is 1 - 2(x x - y y)
    ///            (KvoMat.OfAQuaternionHasItsSignInTwoTwo).
    constexpr KvoMat(const KvoQuat& q);

    constexpr KvoMat& operator=(const KvoMat&) = default;

    /// Gives the determinant.
    constexpr float Det() const;

    /// Gives the transposed matrix of the cofactors: `m * m.Adjoint()` is the
    /// identity times `m.Det()`.
    ZT_API KvoMat Adjoint() const;

    /// Gives the inverse.
    ///
    /// Returns: the adjoint, not divided, of a matrix whose determinant is
    ///          within 2 to the power -23 of 0.
    /// Reports: a warning "KvoMat - Singular matrix.\n" in that case.
    ZT_API KvoMat Invert() const;

    /// Gives the matrix with rows and columns exchanged.
    constexpr KvoMat Transpose() const;

    /// Gives the angles about x, y and z that the rotation part is made of, in
    /// this order: `InitXrot(x)`, then y and z after it.
    ///
    /// Units: degrees.
    KvoVec3 Rotations() const;

    /// Gives the angles as above and the cosine of the second.
    void Rotations(KvoVec3& angles, float& cosine) const;

    /// Gives the three angles as above, one by one.
    void Rotations(float& x, float& y, float& z) const;

    /// Gives the translation.
    constexpr void ExtractPos(KvoVec3& position) const;

    /// Sets the translation and nothing else.
    constexpr KvoMat& SetPos(const KvoVec3& position);

    /// Gives the matrix with a translation before it, along its own axes.
    constexpr KvoMat TransRel(float x, float y, float z) const;
    constexpr KvoMat TransRel(const KvoVec3& v) const;

    /// Transforms `count` points: each result is `point * m`, divided by its w
    /// as there.
    ///
    /// Requires: both arrays hold `count`, and are the same or do not overlap.
    ZT_API void Transform(const KvoVec4* points, KvoVec4* results,
                          std::size_t count) const;

    /// Transforms `count` points with w = 1; the w of the results is dropped.
    ///
    /// Requires: as above.
    ZT_API void Transform(const KvoVec3* points, KvoVec3* results,
                          std::size_t count) const;

    /// Makes the identity.
    constexpr KvoMat& InitIdentity() { return *this = KvoMat(); }

    /// Makes a translation.
    constexpr KvoMat& InitTrans(float x, float y, float z);
    constexpr KvoMat& InitTrans(const KvoVec3& v);

    /// Makes a rotation about the x axis, which turns y towards z.
    KvoMat& InitXrot(float degrees);

    /// Makes a rotation about the y axis, which turns z towards x.
    KvoMat& InitYrot(float degrees);

    /// Makes a rotation about the z axis, which turns x towards y.
    KvoMat& InitZrot(float degrees);

    /// Makes a rotation about an axis of any length.
    KvoMat& InitRotate(const KvoVec3& axis, float degrees);

    /// Makes a scaling.
    constexpr KvoMat& InitScale(float scale);
    constexpr KvoMat& InitScale(float x, float y, float z);
    constexpr KvoMat& InitScale(const KvoVec3& v);

    /// Makes a perspective projection; the eye looks along the negative z.
    ///
    /// Units: `fovy`, the whole angle seen from bottom to top, in radians;
    ///        `aspect` is width over height; `near` and `far` are distances.
    KvoMat& InitPerspective(float fovy, float aspect, float near, float far);

    /// Makes a perspective projection of the window given at distance `near`.
    constexpr KvoMat& InitWindow(float left, float right, float bottom,
                                 float top, float near, float far);

    /// Makes a parallel projection of a box.
    constexpr KvoMat& InitOrtho(float left, float right, float bottom,
                                float top, float near, float far);

    /// Makes a parallel projection of a rectangle; z changes its sign only.
    constexpr KvoMat& InitOrtho2(float left, float right, float bottom,
                                 float top);

    /// Makes a view of the origin from a distance: turns by twist, incidence
    /// and azimuth, with a translation by -dist along z before all of them.
    ///
    /// Units:     azimuth, incidence and twist in degrees.
    /// By design: the translation acts first, so that the scene swings round
    ///            the eye (KvoMat.InitPolarviewSwingsRoundTheOrigin); for an
    ///            eye that goes round the scene combine `InitZrot(-azim)`,
    ///            `Xrot(-inc, 1)`, `Zrot(-twist, 1)` and `Trans(0, 0, -dist,
    ///            1)`.
    KvoMat& InitPolarview(float dist, float azim, float inc, float twist);

    /// Makes the view of an eye that looks from one point towards another.
    ///
    /// Units:     `twist` in degrees.
    /// By design: looking straight up or down divides by zero
    ///            (KvoMat.LookingStraightUpIsNotGuarded).
    KvoMat& InitLookat(float vx, float vy, float vz, float px, float py,
                       float pz, float twist);
    KvoMat& InitLookat(const KvoVec3& view, const KvoVec3& point, float twist);

    /// Combines the matrix with a translation: before it, row 3 changes; after
    /// it, the first three columns do.
    constexpr KvoMat& Trans(float x, float y, float z, KvoMatMultType type);
    constexpr KvoMat& Trans(const KvoVec3& v, KvoMatMultType type);

    /// Combine the matrix with a rotation about one axis: before it, the two
    /// rows of the other axes change; after it, their columns do.
    KvoMat& Xrot(float degrees, KvoMatMultType type);
    KvoMat& Yrot(float degrees, KvoMatMultType type);
    KvoMat& Zrot(float degrees, KvoMatMultType type);

    /// Combines the matrix with a rotation about an axis of any length.
    KvoMat& Rotate(const KvoVec3& axis, float degrees, KvoMatMultType type);

    /// Combines the matrix with a scaling: before it, the first three rows
    /// change; after it, the first three columns do.
    constexpr KvoMat& Scale(float scale, KvoMatMultType type);
    constexpr KvoMat& Scale(float x, float y, float z, KvoMatMultType type);
    constexpr KvoMat& Scale(const KvoVec3& v, KvoMatMultType type);

    /// Combines the matrix with a perspective projection.
    ///
    /// By design: before the matrix (type 0) it is not the product with
    ///            `InitPerspective`: columns 1 to 3 of row 2 subtract the new
    ///            `m[3][0]` in place of their own row 3
    ///            (KvoMat.PerspectiveBeforeInPlaceIsNotTheProduct).
    KvoMat& Perspective(float fovy, float aspect, float near, float far,
                        KvoMatMultType type);

    /// Combine the matrix with what the builder of the same name makes.
    constexpr KvoMat& Window(float left, float right, float bottom, float top,
                             float near, float far, KvoMatMultType type);
    constexpr KvoMat& Ortho(float left, float right, float bottom, float top,
                            float near, float far, KvoMatMultType type);
    constexpr KvoMat& Ortho2(float left, float right, float bottom, float top,
                             KvoMatMultType type);
    KvoMat& Polarview(float dist, float azim, float inc, float twist,
                      KvoMatMultType type);
    KvoMat& Lookat(float vx, float vy, float vz, float px, float py, float pz,
                   float twist, KvoMatMultType type);
    KvoMat& Lookat(const KvoVec3& view, const KvoVec3& point, float twist,
                   KvoMatMultType type);

    /// Give the same combinations and leave the matrix as it is, quirks
    /// included.
    constexpr KvoMat Trans(float x, float y, float z,
                           KvoMatMultType type) const;
    constexpr KvoMat Trans(const KvoVec3& v, KvoMatMultType type) const;
    KvoMat Xrot(float degrees, KvoMatMultType type) const;
    KvoMat Yrot(float degrees, KvoMatMultType type) const;
    KvoMat Zrot(float degrees, KvoMatMultType type) const;
    KvoMat Rotate(const KvoVec3& axis, float degrees,
                  KvoMatMultType type) const;
    constexpr KvoMat Scale(float scale, KvoMatMultType type) const;
    constexpr KvoMat Scale(float x, float y, float z,
                           KvoMatMultType type) const;
    constexpr KvoMat Scale(const KvoVec3& v, KvoMatMultType type) const;
    KvoMat Perspective(float fovy, float aspect, float near, float far,
                       KvoMatMultType type) const;
    constexpr KvoMat Window(float left, float right, float bottom, float top,
                            float near, float far, KvoMatMultType type) const;
    constexpr KvoMat Ortho(float left, float right, float bottom, float top,
                           float near, float far, KvoMatMultType type) const;
    constexpr KvoMat Ortho2(float left, float right, float bottom, float top,
                            KvoMatMultType type) const;
    KvoMat Polarview(float dist, float azim, float inc, float twist,
                     KvoMatMultType type) const;
    KvoMat Lookat(float vx, float vy, float vz, float px, float py, float pz,
                  float twist, KvoMatMultType type) const;
    KvoMat Lookat(const KvoVec3& view, const KvoVec3& point, float twist,
                  KvoMatMultType type) const;

    /// Gives the matrix with every element negated.
    constexpr KvoMat operator-() const;

    /// Gives the matrix with rows and columns exchanged.
    constexpr KvoMat operator~() const { return Transpose(); }

    /// Says whether each element differs by less than 2 to the power -23.
    constexpr bool operator==(const KvoMat& m) const;
    constexpr bool operator!=(const KvoMat& m) const { return !(*this == m); }

    /// Gives the row of an index from 0 to 3.
    ///
    /// Returns: for any other index a row that all bad indices of all matrices
    ///          share; what is written to it is read from it again.
    /// Reports: a warning "KvoMat - Illegal index [4].\n", say.
    constexpr KvoVec4& operator[](int index)
    {
        return index >= 0 && index <= 3 ? rows[index]
                                        : zt_geometry::illegal_row(index);
    }
    constexpr const KvoVec4& operator[](int index) const
    {
        return index >= 0 && index <= 3 ? rows[index]
                                        : zt_geometry::illegal_row(index);
    }

    /// Do what the operator without `=` does, in place.
    constexpr KvoMat& operator+=(const KvoMat& m);
    constexpr KvoMat& operator-=(const KvoMat& m);
    constexpr KvoMat& operator*=(const KvoMat& m);
    constexpr KvoMat& operator/=(const KvoMat& m);

    KvoVec4 rows[4]; ///< Row 0 first; indexed without a check.

private:
    constexpr KvoMat& combine(const KvoMat& m, KvoMatMultType type);
};

/// A quaternion: a scalar part s and a vector part v. With s the cosine and v
/// the unit axis times the sine of half an angle it is a rotation.
class KvoQuat
{
public:
    /// Makes the zero quaternion, which is not the identity.
    constexpr KvoQuat() : s(0) {}
    constexpr KvoQuat(const KvoQuat&) = default;

    /// Takes the parts as they are: a number and three more, not an angle and
    /// an axis; null gives zeros.
    ///
    /// Templates, so that `KvoQuat(1, 0)` means the numbers.
    template <class T, zt_geometry::only<T, float> = 0>
    constexpr KvoQuat(float scalar, const T* vector) : s(scalar), v(vector)
    {}

    /// Takes the parts as above, rounded to float.
    template <class T, zt_geometry::only<T, double> = 0>
    constexpr KvoQuat(double scalar, const T* vector)
        : s(static_cast<float>(scalar)),
          v(vector ? static_cast<float>(vector[0]) : 0,
            vector ? static_cast<float>(vector[1]) : 0,
            vector ? static_cast<float>(vector[2]) : 0)
    {}

    /// Takes the parts as they are.
    constexpr KvoQuat(float scalar, const KvoVec3& vector)
        : s(scalar), v(vector)
    {}

    /// Takes s, x, y and z, in this order.
    constexpr KvoQuat(const KvoVec4& q) : s(q.x), v(q.y, q.z, q.w) {}

    /// Makes the quaternion of the rotation part of a matrix.
    ///
    /// Requires: a rotation; a matrix with a trace below -1 gives NaN.
    KvoQuat(const KvoMat& m);

    constexpr KvoQuat& operator=(const KvoQuat&) = default;

    /// Makes the identity: s = 1, v = 0.
    constexpr KvoQuat& InitIdentity()
    {
        s = 1;
        v = 0;
        return *this;
    }

    /// Divides by the length; a length within 2 to the power -23 of 0 stays.
    KvoQuat& Normalize();

    /// Gives the middle between this and `q`: their sum, divided by its length
    /// unless that is exactly 0.
    KvoQuat qbisect(const KvoQuat& q) const;

    /// Gives this reflected through `q`, as far on the other side.
    constexpr KvoQuat qdouble(const KvoQuat& q) const;

    float s;   ///< The scalar part.
    KvoVec3 v; ///< The vector part.
};

/// Operate component by component; a number stands for a vector of it.
///
/// `*` is not a dot product.
constexpr KvoVec3 operator+(const KvoVec3& a, const KvoVec3& b)
{
    return KvoVec3(a.x + b.x, a.y + b.y, a.z + b.z);
}
constexpr KvoVec3 operator+(const KvoVec3& a, float b)
{
    return KvoVec3(a.x + b, a.y + b, a.z + b);
}
constexpr KvoVec3 operator+(float a, const KvoVec3& b)
{
    return KvoVec3(a + b.x, a + b.y, a + b.z);
}
constexpr KvoVec3 operator-(const KvoVec3& a, const KvoVec3& b)
{
    return KvoVec3(a.x - b.x, a.y - b.y, a.z - b.z);
}
constexpr KvoVec3 operator-(const KvoVec3& a, float b)
{
    return KvoVec3(a.x - b, a.y - b, a.z - b);
}
constexpr KvoVec3 operator-(float a, const KvoVec3& b)
{
    return KvoVec3(a - b.x, a - b.y, a - b.z);
}
constexpr KvoVec3 operator*(const KvoVec3& a, const KvoVec3& b)
{
    return KvoVec3(a.x * b.x, a.y * b.y, a.z * b.z);
}
constexpr KvoVec3 operator*(const KvoVec3& a, float b)
{
    return KvoVec3(a.x * b, a.y * b, a.z * b);
}
constexpr KvoVec3 operator*(float a, const KvoVec3& b)
{
    return KvoVec3(a * b.x, a * b.y, a * b.z);
}
constexpr KvoVec4 operator+(const KvoVec4& a, const KvoVec4& b)
{
    return KvoVec4(a.x + b.x, a.y + b.y, a.z + b.z, a.w + b.w);
}
constexpr KvoVec4 operator+(const KvoVec4& a, float b)
{
    return KvoVec4(a.x + b, a.y + b, a.z + b, a.w + b);
}
constexpr KvoVec4 operator+(float a, const KvoVec4& b)
{
    return KvoVec4(a + b.x, a + b.y, a + b.z, a + b.w);
}
constexpr KvoVec4 operator-(const KvoVec4& a, const KvoVec4& b)
{
    return KvoVec4(a.x - b.x, a.y - b.y, a.z - b.z, a.w - b.w);
}
constexpr KvoVec4 operator-(const KvoVec4& a, float b)
{
    return KvoVec4(a.x - b, a.y - b, a.z - b, a.w - b);
}
constexpr KvoVec4 operator-(float a, const KvoVec4& b)
{
    return KvoVec4(a - b.x, a - b.y, a - b.z, a - b.w);
}
constexpr KvoVec4 operator*(const KvoVec4& a, const KvoVec4& b)
{
    return KvoVec4(a.x * b.x, a.y * b.y, a.z * b.z, a.w * b.w);
}
constexpr KvoVec4 operator*(const KvoVec4& a, float b)
{
    return KvoVec4(a.x * b, a.y * b, a.z * b, a.w * b);
}
constexpr KvoVec4 operator*(float a, const KvoVec4& b)
{
    return KvoVec4(a * b.x, a * b.y, a * b.z, a * b.w);
}

/// Divide component by component; a number stands for a vector of it.
///
/// Returns: the zero vector when a component of the divisor is 0.
/// Reports: a warning "KvoVec3 - Division by zero.\n" in that case.
constexpr KvoVec3 operator/(const KvoVec3& a, const KvoVec3& b)
{
    if (b.x == 0 || b.y == 0 || b.z == 0) {
        zt_geometry::division_by_zero("KvoVec3");
        return KvoVec3();
    }
    return KvoVec3(a.x / b.x, a.y / b.y, a.z / b.z);
}
constexpr KvoVec3 operator/(const KvoVec3& a, float b)
{
    return a / KvoVec3(b);
}
constexpr KvoVec3 operator/(float a, const KvoVec3& b)
{
    return KvoVec3(a) / b;
}

/// Divide component by component; a number stands for a vector of it.
///
/// Returns: the zero vector when a component of the divisor is 0.
/// Reports: a warning "KvoVec4 - Division by zero.\n" in that case.
constexpr KvoVec4 operator/(const KvoVec4& a, const KvoVec4& b)
{
    if (b.x == 0 || b.y == 0 || b.z == 0 || b.w == 0) {
        zt_geometry::division_by_zero("KvoVec4");
        return KvoVec4();
    }
    return KvoVec4(a.x / b.x, a.y / b.y, a.z / b.z, a.w / b.w);
}
constexpr KvoVec4 operator/(const KvoVec4& a, float b)
{
    return a / KvoVec4(b);
}
constexpr KvoVec4 operator/(float a, const KvoVec4& b)
{
    return KvoVec4(a) / b;
}

/// Operate element by element; a number stands for every element.
constexpr KvoMat operator+(const KvoMat& a, const KvoMat& b);
constexpr KvoMat operator+(const KvoMat& a, float b);
constexpr KvoMat operator+(float a, const KvoMat& b);
constexpr KvoMat operator-(const KvoMat& a, const KvoMat& b);
constexpr KvoMat operator-(const KvoMat& a, float b);
constexpr KvoMat operator-(float a, const KvoMat& b);

/// Gives the product: what `a` does and then what `b` does.
constexpr KvoMat operator*(const KvoMat& a, const KvoMat& b);

/// Multiply every element.
constexpr KvoMat operator*(const KvoMat& a, float b);
constexpr KvoMat operator*(float a, const KvoMat& b);

/// Gives the sums over k of `a[i][k] / b[k][j]`.
///
/// By design: this is the pattern of the product with divisions, not the
///            product with the inverse, and nothing is looked at for zero
///            (KvoMat.DividedByAMatrixIsTheProductPatternWithDivisions).
constexpr KvoMat operator/(const KvoMat& a, const KvoMat& b);

/// Divides every element.
///
/// Returns: the zero matrix when `b` is 0.
/// Reports: a warning "KvoMat - Division by zero.\n" in that case.
constexpr KvoMat operator/(const KvoMat& a, float b);

/// Divides `a` by every element; zero elements give infinities.
constexpr KvoMat operator/(float a, const KvoMat& b);

/// Transforms a row vector and divides x, y and z by w.
///
/// Returns: w = 1; when w comes out as exactly 0 or 1, the vector as it is.
constexpr KvoVec4 operator*(const KvoVec4& v, const KvoMat& m);

/// Transforms a column vector, and divides by w in the same way.
constexpr KvoVec4 operator*(const KvoMat& m, const KvoVec4& v);

/// Adds part by part.
constexpr KvoQuat operator+(const KvoQuat& a, const KvoQuat& b);

/// Gives the product of quaternions.
constexpr KvoQuat operator*(const KvoQuat& a, const KvoQuat& b);

/// Goes from `a` at t = 0 to `b` at t = 1 at an even speed along the arc.
///
/// Requires:  quaternions of length 1 that differ.
/// By design: takes the longer arc if `b` lies there
///            (KvoQuat.SlerpTakesTheArcThatIsGiven), and has no special case
///            for equal ones
///            (KvoQuat.SlerpOfTheIdentityWithItselfIsNotANumber).
KvoQuat Slerp(const KvoQuat& a, const KvoQuat& b, float t);

/// Goes from `q1` at t = 0 to `q2` at t = 1 along a smooth curve that passes
/// the whole sequence of keys without a corner.
///
/// Requires: quaternions of length 1; neighbours differ, as in `Slerp`.
/// Returns:  `q1` itself for t below 2 to the power -23, `q2` itself for t
///           above 1 less that.
KvoQuat Interp(const KvoQuat& q0, const KvoQuat& q1, const KvoQuat& q2,
               const KvoQuat& q3, float t);

/// Write "[ 1, 2, 3 ]", say, without a line's end.
///
/// By design: leave the stream's precision at 10
///            (KvoVec3.WritesInBracketsAndLeavesThePrecisionAtTen).
ZT_API std::ostream& operator<<(std::ostream& stream, const KvoVec3& v);
ZT_API std::ostream& operator<<(std::ostream& stream, const KvoVec4& v);

/// Writes the four rows, each with a line's end behind it.
ZT_API std::ostream& operator<<(std::ostream& stream, const KvoMat& m);

/// Writes "[ 1, [ 0, 0, 0 ] ]", say.
ZT_API std::ostream& operator<<(std::ostream& stream, const KvoQuat& q);

/// Read the bare numbers in turn, without brackets and commas; a quaternion's
/// s comes first.
///
/// Returns: the stream; if it has failed, the value is as it was.
ZT_API std::istream& operator>>(std::istream& stream, KvoVec3& v);
ZT_API std::istream& operator>>(std::istream& stream, KvoVec4& v);
ZT_API std::istream& operator>>(std::istream& stream, KvoMat& m);
ZT_API std::istream& operator>>(std::istream& stream, KvoQuat& q);

// ---------------------------------------------------------------------------
// Vectors

constexpr KvoVec3::KvoVec3(const KvoVec4& v4) : x(v4.x), y(v4.y), z(v4.z) {}

inline KvoVec3 KvoVec3::Dir() const
{
    const float length = Mag();
    if (length == 0)
        return KvoVec3();
    return KvoVec3(x / length, y / length, z / length);
}

inline KvoVec3& KvoVec3::Unit()
{
    const float length = Mag();
    if (length != 0 && length != 1)
        *this /= length;
    return *this;
}

inline KvoVec3& KvoVec3::Scale(float length)
{
    const float old_length = Mag();
    if (old_length != 0)
        *this *= length / old_length;
    return *this;
}

inline KvoVec3 KvoVec3::VecToAngles() const
{
    constexpr double degrees_per_radian = 57.29577951308232;
    const KvoVec3 u = KvoVec3(*this).Unit();
    return KvoVec3(
        static_cast<float>(-static_cast<double>(std::atan2(u.z, u.y)) *
                           degrees_per_radian),
        static_cast<float>(-static_cast<double>(std::atan2(u.z, u.x)) *
                           degrees_per_radian),
        0);
}

inline KvoMat KvoVec3::VecToRotmatrix() const
{
    const KvoVec3 u = KvoVec3(*this).Unit();
    const float d = std::sqrt(u.y * u.y + u.z * u.z);
    return KvoMat(KvoVec4(d, -(u.x * u.y) / d, -(u.x * u.z) / d, 0),
                  KvoVec4(0, u.z / d, -u.y / d, 0), KvoVec4(u),
                  KvoVec4(0, 0, 0, 1));
}

constexpr KvoVec3& KvoVec3::operator+=(const KvoVec3& v)
{
    return *this = *this + v;
}

constexpr KvoVec3& KvoVec3::operator-=(const KvoVec3& v)
{
    return *this = *this - v;
}

constexpr KvoVec3& KvoVec3::operator*=(const KvoVec3& v)
{
    return *this = *this * v;
}

constexpr KvoVec3& KvoVec3::operator/=(const KvoVec3& v)
{
    return *this = KvoVec3(x / v.x, y / v.y, z / v.z);
}

inline KvoVec4 KvoVec4::Dir() const
{
    const float length = Mag();
    return KvoVec4(x / length, y / length, z / length, w / length);
}

inline KvoVec4& KvoVec4::Unit()
{
    const float length = Mag();
    if (length != 0 && length != 1)
        *this /= length;
    return *this;
}

inline KvoVec4& KvoVec4::Scale(float length)
{
    const float old_length = Mag();
    if (old_length != 0)
        *this *= length / old_length;
    return *this;
}

constexpr KvoVec4& KvoVec4::operator+=(const KvoVec4& v)
{
    return *this = *this + v;
}

constexpr KvoVec4& KvoVec4::operator-=(const KvoVec4& v)
{
    return *this = *this - v;
}

constexpr KvoVec4& KvoVec4::operator*=(const KvoVec4& v)
{
    return *this = *this * v;
}

constexpr KvoVec4& KvoVec4::operator/=(const KvoVec4& v)
{
    return *this = KvoVec4(x / v.x, y / v.y, z / v.z, w / v.w);
}

// ---------------------------------------------------------------------------
// Matrices

namespace zt_geometry {
/// Four floats that are computed together, each exactly as it would be alone.
/// The compiler makes of it what the processor has.
typedef float Lanes __attribute__((vector_size(16)));

/// The rows of a matrix in lanes.
struct LaneRows
{
    Lanes row0;
    Lanes row1;
    Lanes row2;
    Lanes row3;
};

inline LaneRows lanes(const KvoMat& m)
{
    return {__builtin_bit_cast(Lanes, m.rows[0]),
            __builtin_bit_cast(Lanes, m.rows[1]),
            __builtin_bit_cast(Lanes, m.rows[2]),
            __builtin_bit_cast(Lanes, m.rows[3])};
}

/// Gives the row vector `v` times a matrix, each sum from left to right.
///
/// Takes the components one by one: a vector has often just been put together
/// from them, and reading it whole would have to wait for that.
inline Lanes transformed(const KvoVec4& v, const LaneRows& m)
{
    return v.x * m.row0 + v.y * m.row1 + v.z * m.row2 + v.w * m.row3;
}

/// Gives the same for a row of a matrix, which is read whole.
inline Lanes transformed(const Lanes& v, const LaneRows& m)
{
    return v[0] * m.row0 + v[1] * m.row1 + v[2] * m.row2 + v[3] * m.row3;
}

/// Gives the same, for constant expressions.
constexpr KvoVec4 transformed(const KvoVec4& v, const KvoMat& m)
{
    return v.x * m.rows[0] + v.y * m.rows[1] + v.z * m.rows[2] +
           v.w * m.rows[3];
}

inline KvoMat product(const KvoMat& a, const KvoMat& b)
{
    const LaneRows left = lanes(a);
    const LaneRows right = lanes(b);
    return __builtin_bit_cast(KvoMat, LaneRows{transformed(left.row0, right),
                                               transformed(left.row1, right),
                                               transformed(left.row2, right),
                                               transformed(left.row3, right)});
}

inline KvoVec4 point(const KvoVec4& v, const KvoMat& m)
{
    Lanes result = transformed(v, lanes(m));
    const float w = result[3];
    if (w != 0 && w != 1) {
        result /= w;
        result[3] = 1;
    }
    return __builtin_bit_cast(KvoVec4, result);
}

/// Divides x, y and z by w unless that is 0 or 1.
constexpr KvoVec4 divided_by_w(const KvoVec4& v)
{
    if (v.w == 0 || v.w == 1)
        return v;
    return KvoVec4(v.x / v.w, v.y / v.w, v.z / v.w, 1);
}

/// Gives the quotients without looking for zeros.
constexpr KvoVec4 quotients(const KvoVec4& a, const KvoVec4& b)
{
    return KvoVec4(a.x / b.x, a.y / b.y, a.z / b.z, a.w / b.w);
}

/// Turns the pair (a, b) by the angle whose cosine and sine are given.
template <class Number>
constexpr void turn(Number& a, Number& b, float cosine, float sine)
{
    const Number old = a;
    a = cosine * a + sine * b;
    b = cosine * b - sine * old;
}

/// Turns two columns against each other, in every row.
constexpr void turn_columns(KvoMat& m, float KvoVec4::*a, float KvoVec4::*b,
                            float cosine, float sine)
{
    for (KvoVec4& row : m.rows)
        turn(row.*a, row.*b, cosine, sine);
}

constexpr KvoVec4 narrowed(const double* values)
{
    return values ? KvoVec4(static_cast<float>(values[0]),
                            static_cast<float>(values[1]),
                            static_cast<float>(values[2]),
                            static_cast<float>(values[3]))
                  : KvoVec4();
}

template <class Number>
constexpr const Number* skip(const Number* array, int n)
{
    return array ? array + n : array;
}

template <class Number>
constexpr const Number* row_of(const Number array[][4], int row)
{
    return array ? array[row] : nullptr;
}
} // namespace zt_geometry

constexpr KvoMat::KvoMat()
    : rows{KvoVec4(1, 0, 0, 0), KvoVec4(0, 1, 0, 0), KvoVec4(0, 0, 1, 0),
           KvoVec4(0, 0, 0, 1)}
{}

constexpr KvoMat::KvoMat(const KvoVec3& row0, const KvoVec3& row1,
                         const KvoVec3& row2)
    : KvoMat(row0, row1, row2, KvoVec3())
{}

constexpr KvoMat::KvoMat(const KvoVec3& row0, const KvoVec3& row1,
                         const KvoVec3& row2, const KvoVec3& row3)
    : rows{KvoVec4(row0.x, row0.y, row0.z, 0),
           KvoVec4(row1.x, row1.y, row1.z, 0),
           KvoVec4(row2.x, row2.y, row2.z, 0), KvoVec4(row3)}
{}

constexpr KvoMat::KvoMat(const KvoVec4& row0, const KvoVec4& row1,
                         const KvoVec4& row2, const KvoVec4& row3)
    : rows{row0, row1, row2, row3}
{}

constexpr KvoMat::KvoMat(const float* values)
    : rows{KvoVec4(values), KvoVec4(zt_geometry::skip(values, 4)),
           KvoVec4(zt_geometry::skip(values, 8)),
           KvoVec4(zt_geometry::skip(values, 12))}
{}

constexpr KvoMat::KvoMat(const float values[][4])
    : rows{KvoVec4(zt_geometry::row_of(values, 0)),
           KvoVec4(zt_geometry::row_of(values, 1)),
           KvoVec4(zt_geometry::row_of(values, 2)),
           KvoVec4(zt_geometry::row_of(values, 3))}
{}

constexpr KvoMat::KvoMat(const double* values)
    : rows{zt_geometry::narrowed(values),
           zt_geometry::narrowed(zt_geometry::skip(values, 4)),
           zt_geometry::narrowed(zt_geometry::skip(values, 8)),
           zt_geometry::narrowed(zt_geometry::skip(values, 12))}
{}

constexpr KvoMat::KvoMat(const double values[][4])
    : rows{zt_geometry::narrowed(zt_geometry::row_of(values, 0)),
           zt_geometry::narrowed(zt_geometry::row_of(values, 1)),
           zt_geometry::narrowed(zt_geometry::row_of(values, 2)),
           zt_geometry::narrowed(zt_geometry::row_of(values, 3))}
{}

constexpr KvoMat::KvoMat(const KvoQuat& q)
    : KvoMat(KvoVec3(1 - 2 * (q.v.y * q.v.y + q.v.z * q.v.z),
                     2 * (q.v.x * q.v.y + q.v.z * q.s),
                     2 * (q.v.x * q.v.z - q.v.y * q.s)),
             KvoVec3(2 * (q.v.x * q.v.y - q.v.z * q.s),
                     1 - 2 * (q.v.x * q.v.x + q.v.z * q.v.z),
                     2 * (q.v.y * q.v.z + q.v.x * q.s)),
             KvoVec3(2 * (q.v.x * q.v.z + q.v.y * q.s),
                     2 * (q.v.y * q.v.z - q.v.x * q.s),
                     1 - 2 * (q.v.x * q.v.x - q.v.y * q.v.y)))
{}

constexpr float KvoMat::Det() const
{
    // The six 2 x 2 minors of rows 2 and 3, named for their columns.
    const KvoVec4& c = rows[2];
    const KvoVec4& d = rows[3];
    const float xy = c.x * d.y - c.y * d.x;
    const float xz = c.x * d.z - c.z * d.x;
    const float xw = c.x * d.w - c.w * d.x;
    const float yz = c.y * d.z - c.z * d.y;
    const float yw = c.y * d.w - c.w * d.y;
    const float zw = c.z * d.w - c.w * d.z;

    const KvoVec4& a = rows[0];
    const KvoVec4& b = rows[1];
    return a.x * (b.y * zw - b.z * yw + b.w * yz) -
           a.y * (b.x * zw - b.z * xw + b.w * xz) +
           a.z * (b.x * yw - b.y * xw + b.w * xy) -
           a.w * (b.x * yz - b.y * xz + b.z * xy);
}

constexpr KvoMat KvoMat::Transpose() const
{
    return KvoMat(KvoVec4(rows[0].x, rows[1].x, rows[2].x, rows[3].x),
                  KvoVec4(rows[0].y, rows[1].y, rows[2].y, rows[3].y),
                  KvoVec4(rows[0].z, rows[1].z, rows[2].z, rows[3].z),
                  KvoVec4(rows[0].w, rows[1].w, rows[2].w, rows[3].w));
}

inline KvoVec3 KvoMat::Rotations() const
{
    KvoVec3 angles;
    float cosine = 0;
    Rotations(angles, cosine);
    return angles;
}

inline void KvoMat::Rotations(KvoVec3& angles, float& cosine) const
{
    constexpr float degrees_per_radian = 57.29578f;
    KvoVec3 radians;
    radians.y = std::asin(-rows[0].z);
    const float cosine_of_y = std::cos(radians.y);
    if (cosine_of_y == 0) {
        radians.x = std::atan2(rows[1].x, rows[1].y);
    } else {
        radians.x = std::atan2(rows[1].z, rows[2].z);
        radians.z = std::atan2(rows[0].y, rows[0].x);
    }
    angles = radians * degrees_per_radian;
    cosine = cosine_of_y;
}

inline void KvoMat::Rotations(float& x, float& y, float& z) const
{
    const KvoVec3 angles = Rotations();
    x = angles.x;
    y = angles.y;
    z = angles.z;
}

constexpr void KvoMat::ExtractPos(KvoVec3& position) const
{
    position = KvoVec3(rows[3]);
}

constexpr KvoMat& KvoMat::SetPos(const KvoVec3& position)
{
    rows[3] = KvoVec4(position.x, position.y, position.z, rows[3].w);
    return *this;
}

constexpr KvoMat KvoMat::TransRel(float x, float y, float z) const
{
    return Trans(x, y, z, 0);
}

constexpr KvoMat KvoMat::TransRel(const KvoVec3& v) const
{
    return Trans(v, 0);
}

constexpr KvoMat& KvoMat::combine(const KvoMat& m, KvoMatMultType type)
{
    return *this = type == 0 ? m * *this : *this * m;
}

// The builders that overwrite the matrix.

constexpr KvoMat& KvoMat::InitTrans(float x, float y, float z)
{
    InitIdentity();
    return SetPos(KvoVec3(x, y, z));
}

constexpr KvoMat& KvoMat::InitTrans(const KvoVec3& v)
{
    return InitTrans(v.x, v.y, v.z);
}

inline KvoMat& KvoMat::InitXrot(float degrees)
{
    const float c = std::cos(zt_geometry::radians(degrees));
    const float s = std::sin(zt_geometry::radians(degrees));
    return *this =
               KvoMat(KvoVec3(1, 0, 0), KvoVec3(0, c, s), KvoVec3(0, -s, c));
}

inline KvoMat& KvoMat::InitYrot(float degrees)
{
    const float c = std::cos(zt_geometry::radians(degrees));
    const float s = std::sin(zt_geometry::radians(degrees));
    return *this =
               KvoMat(KvoVec3(c, 0, -s), KvoVec3(0, 1, 0), KvoVec3(s, 0, c));
}

inline KvoMat& KvoMat::InitZrot(float degrees)
{
    const float c = std::cos(zt_geometry::radians(degrees));
    const float s = std::sin(zt_geometry::radians(degrees));
    return *this =
               KvoMat(KvoVec3(c, s, 0), KvoVec3(-s, c, 0), KvoVec3(0, 0, 1));
}

inline KvoMat& KvoMat::InitRotate(const KvoVec3& axis, float degrees)
{
    const float c = std::cos(zt_geometry::radians(degrees));
    const float s = std::sin(zt_geometry::radians(degrees));
    const float t = 1 - c;
    const KvoVec3 u = KvoVec3(axis).Unit();
    return *this = KvoMat(KvoVec3(t * u.x * u.x + c, t * u.x * u.y + s * u.z,
                                  t * u.x * u.z - s * u.y),
                          KvoVec3(t * u.x * u.y - s * u.z, t * u.y * u.y + c,
                                  t * u.y * u.z + s * u.x),
                          KvoVec3(t * u.x * u.z + s * u.y,
                                  t * u.y * u.z - s * u.x, t * u.z * u.z + c));
}

constexpr KvoMat& KvoMat::InitScale(float scale)
{
    return InitScale(scale, scale, scale);
}

constexpr KvoMat& KvoMat::InitScale(float x, float y, float z)
{
    return *this = KvoMat(KvoVec3(x, 0, 0), KvoVec3(0, y, 0), KvoVec3(0, 0, z));
}

constexpr KvoMat& KvoMat::InitScale(const KvoVec3& v)
{
    return InitScale(v.x, v.y, v.z);
}

inline KvoMat& KvoMat::InitPerspective(float fovy, float aspect, float near,
                                       float far)
{
    const float cotangent = 1 / std::tan(fovy / 2);
    return *this = KvoMat(KvoVec4(cotangent / aspect, 0, 0, 0),
                          KvoVec4(0, cotangent, 0, 0),
                          KvoVec4(0, 0, -(far + near) / (far - near), -1),
                          KvoVec4(0, 0, -(2 * far * near) / (far - near), 0));
}

constexpr KvoMat& KvoMat::InitWindow(float left, float right, float bottom,
                                     float top, float near, float far)
{
    return *this = KvoMat(KvoVec4(2 * near / (right - left), 0, 0, 0),
                          KvoVec4(0, 2 * near / (top - bottom), 0, 0),
                          KvoVec4((right + left) / (right - left),
                                  (top + bottom) / (top - bottom),
                                  -(far + near) / (far - near), -1),
                          KvoVec4(0, 0, -(2 * far * near) / (far - near), 0));
}

constexpr KvoMat& KvoMat::InitOrtho(float left, float right, float bottom,
                                    float top, float near, float far)
{
    InitOrtho2(left, right, bottom, top);
    rows[2].z = -2 / (far - near);
    rows[3].z = -(far + near) / (far - near);
    return *this;
}

constexpr KvoMat& KvoMat::InitOrtho2(float left, float right, float bottom,
                                     float top)
{
    return *this = KvoMat(KvoVec3(2 / (right - left), 0, 0),
                          KvoVec3(0, 2 / (top - bottom), 0), KvoVec3(0, 0, -1),
                          KvoVec3(-(right + left) / (right - left),
                                  -(top + bottom) / (top - bottom), 0));
}

inline KvoMat& KvoMat::InitPolarview(float dist, float azim, float inc,
                                     float twist)
{
    return InitZrot(-azim).Xrot(-inc, 0).Zrot(-twist, 0).Trans(0, 0, -dist, 0);
}

inline KvoMat& KvoMat::InitLookat(float vx, float vy, float vz, float px,
                                  float py, float pz, float twist)
{
    const float dx = px - vx;
    const float dy = py - vy;
    const float dz = pz - vz;
    const float h = std::sqrt(dx * dx + dz * dz);
    const float d = std::sqrt(dx * dx + dy * dy + dz * dz);
    InitTrans(-vx, -vy, -vz);
    *this *= KvoMat(KvoVec3(-dz / h, 0, -dx / h), KvoVec3(0, 1, 0),
                    KvoVec3(dx / h, 0, -dz / h));
    *this *= KvoMat(KvoVec3(1, 0, 0), KvoVec3(0, h / d, -dy / d),
                    KvoVec3(0, dy / d, h / d));
    return Zrot(-twist, 1);
}

inline KvoMat& KvoMat::InitLookat(const KvoVec3& view, const KvoVec3& point,
                                  float twist)
{
    return InitLookat(view.x, view.y, view.z, point.x, point.y, point.z, twist);
}

// The builders that combine in place.

constexpr KvoMat& KvoMat::Trans(float x, float y, float z, KvoMatMultType type)
{
    if (type == 0) {
        rows[3] += x * rows[0] + y * rows[1] + z * rows[2];
        return *this;
    }
    for (KvoVec4& row : rows) {
        row.x += row.w * x;
        row.y += row.w * y;
        row.z += row.w * z;
    }
    return *this;
}

constexpr KvoMat& KvoMat::Trans(const KvoVec3& v, KvoMatMultType type)
{
    return Trans(v.x, v.y, v.z, type);
}

inline KvoMat& KvoMat::Xrot(float degrees, KvoMatMultType type)
{
    const float c = std::cos(zt_geometry::radians(degrees));
    const float s = std::sin(zt_geometry::radians(degrees));
    if (type == 0)
        zt_geometry::turn(rows[1], rows[2], c, s);
    else
        zt_geometry::turn_columns(*this, &KvoVec4::z, &KvoVec4::y, c, s);
    return *this;
}

inline KvoMat& KvoMat::Yrot(float degrees, KvoMatMultType type)
{
    const float c = std::cos(zt_geometry::radians(degrees));
    const float s = std::sin(zt_geometry::radians(degrees));
    if (type == 0)
        zt_geometry::turn(rows[2], rows[0], c, s);
    else
        zt_geometry::turn_columns(*this, &KvoVec4::x, &KvoVec4::z, c, s);
    return *this;
}

inline KvoMat& KvoMat::Zrot(float degrees, KvoMatMultType type)
{
    const float c = std::cos(zt_geometry::radians(degrees));
    const float s = std::sin(zt_geometry::radians(degrees));
    if (type == 0)
        zt_geometry::turn(rows[0], rows[1], c, s);
    else
        zt_geometry::turn_columns(*this, &KvoVec4::y, &KvoVec4::x, c, s);
    return *this;
}

inline KvoMat& KvoMat::Rotate(const KvoVec3& axis, float degrees,
                              KvoMatMultType type)
{
    return combine(KvoMat().InitRotate(axis, degrees), type);
}

constexpr KvoMat& KvoMat::Scale(float scale, KvoMatMultType type)
{
    return Scale(scale, scale, scale, type);
}

constexpr KvoMat& KvoMat::Scale(float x, float y, float z, KvoMatMultType type)
{
    if (type == 0) {
        rows[0] *= x;
        rows[1] *= y;
        rows[2] *= z;
        return *this;
    }
    for (KvoVec4& row : rows) {
        row.x *= x;
        row.y *= y;
        row.z *= z;
    }
    return *this;
}

constexpr KvoMat& KvoMat::Scale(const KvoVec3& v, KvoMatMultType type)
{
    return Scale(v.x, v.y, v.z, type);
}

inline KvoMat& KvoMat::Perspective(float fovy, float aspect, float near,
                                   float far, KvoMatMultType type)
{
    const KvoMat projection = KvoMat().InitPerspective(fovy, aspect, near, far);
    if (type != 0)
        return combine(projection, type);

    // Column by column, from the left: row 3 has lost its first element to the
    // new value by the time that the other columns subtract it.
    const float depth = projection.rows[2].z;
    const float shift = projection.rows[3].z;
    const KvoVec4 old_row = rows[2];
    rows[0] *= projection.rows[0].x;
    rows[1] *= projection.rows[1].y;
    rows[2].x = depth * old_row.x - rows[3].x;
    rows[3] = shift * old_row;
    rows[2].y = depth * old_row.y - rows[3].x;
    rows[2].z = depth * old_row.z - rows[3].x;
    rows[2].w = depth * old_row.w - rows[3].x;
    return *this;
}

constexpr KvoMat& KvoMat::Window(float left, float right, float bottom,
                                 float top, float near, float far,
                                 KvoMatMultType type)
{
    return combine(KvoMat().InitWindow(left, right, bottom, top, near, far),
                   type);
}

constexpr KvoMat& KvoMat::Ortho(float left, float right, float bottom,
                                float top, float near, float far,
                                KvoMatMultType type)
{
    return combine(KvoMat().InitOrtho(left, right, bottom, top, near, far),
                   type);
}

constexpr KvoMat& KvoMat::Ortho2(float left, float right, float bottom,
                                 float top, KvoMatMultType type)
{
    return combine(KvoMat().InitOrtho2(left, right, bottom, top), type);
}

inline KvoMat& KvoMat::Polarview(float dist, float azim, float inc, float twist,
                                 KvoMatMultType type)
{
    return combine(KvoMat().InitPolarview(dist, azim, inc, twist), type);
}

inline KvoMat& KvoMat::Lookat(float vx, float vy, float vz, float px, float py,
                              float pz, float twist, KvoMatMultType type)
{
    return combine(KvoMat().InitLookat(vx, vy, vz, px, py, pz, twist), type);
}

inline KvoMat& KvoMat::Lookat(const KvoVec3& view, const KvoVec3& point,
                              float twist, KvoMatMultType type)
{
    return combine(KvoMat().InitLookat(view, point, twist), type);
}

// The builders that give the combination.

constexpr KvoMat KvoMat::Trans(float x, float y, float z,
                               KvoMatMultType type) const
{
    return KvoMat(*this).Trans(x, y, z, type);
}

constexpr KvoMat KvoMat::Trans(const KvoVec3& v, KvoMatMultType type) const
{
    return KvoMat(*this).Trans(v, type);
}

inline KvoMat KvoMat::Xrot(float degrees, KvoMatMultType type) const
{
    return KvoMat(*this).Xrot(degrees, type);
}

inline KvoMat KvoMat::Yrot(float degrees, KvoMatMultType type) const
{
    return KvoMat(*this).Yrot(degrees, type);
}

inline KvoMat KvoMat::Zrot(float degrees, KvoMatMultType type) const
{
    return KvoMat(*this).Zrot(degrees, type);
}

inline KvoMat KvoMat::Rotate(const KvoVec3& axis, float degrees,
                             KvoMatMultType type) const
{
    return KvoMat(*this).Rotate(axis, degrees, type);
}

constexpr KvoMat KvoMat::Scale(float scale, KvoMatMultType type) const
{
    return KvoMat(*this).Scale(scale, type);
}

constexpr KvoMat KvoMat::Scale(float x, float y, float z,
                               KvoMatMultType type) const
{
    return KvoMat(*this).Scale(x, y, z, type);
}

constexpr KvoMat KvoMat::Scale(const KvoVec3& v, KvoMatMultType type) const
{
    return KvoMat(*this).Scale(v, type);
}

inline KvoMat KvoMat::Perspective(float fovy, float aspect, float near,
                                  float far, KvoMatMultType type) const
{
    return KvoMat(*this).Perspective(fovy, aspect, near, far, type);
}

constexpr KvoMat KvoMat::Window(float left, float right, float bottom,
                                float top, float near, float far,
                                KvoMatMultType type) const
{
    return KvoMat(*this).Window(left, right, bottom, top, near, far, type);
}

constexpr KvoMat KvoMat::Ortho(float left, float right, float bottom, float top,
                               float near, float far, KvoMatMultType type) const
{
    return KvoMat(*this).Ortho(left, right, bottom, top, near, far, type);
}

constexpr KvoMat KvoMat::Ortho2(float left, float right, float bottom,
                                float top, KvoMatMultType type) const
{
    return KvoMat(*this).Ortho2(left, right, bottom, top, type);
}

inline KvoMat KvoMat::Polarview(float dist, float azim, float inc, float twist,
                                KvoMatMultType type) const
{
    return KvoMat(*this).Polarview(dist, azim, inc, twist, type);
}

inline KvoMat KvoMat::Lookat(float vx, float vy, float vz, float px, float py,
                             float pz, float twist, KvoMatMultType type) const
{
    return KvoMat(*this).Lookat(vx, vy, vz, px, py, pz, twist, type);
}

inline KvoMat KvoMat::Lookat(const KvoVec3& view, const KvoVec3& point,
                             float twist, KvoMatMultType type) const
{
    return KvoMat(*this).Lookat(view, point, twist, type);
}

// Operators of matrices.

constexpr KvoMat KvoMat::operator-() const
{
    return KvoMat(-rows[0], -rows[1], -rows[2], -rows[3]);
}

constexpr bool KvoMat::operator==(const KvoMat& m) const
{
    return rows[0] == m.rows[0] && rows[1] == m.rows[1] &&
           rows[2] == m.rows[2] && rows[3] == m.rows[3];
}

constexpr KvoMat& KvoMat::operator+=(const KvoMat& m)
{
    return *this = *this + m;
}

constexpr KvoMat& KvoMat::operator-=(const KvoMat& m)
{
    return *this = *this - m;
}

constexpr KvoMat& KvoMat::operator*=(const KvoMat& m)
{
    return *this = *this * m;
}

constexpr KvoMat& KvoMat::operator/=(const KvoMat& m)
{
    return *this = *this / m;
}

constexpr KvoMat operator+(const KvoMat& a, const KvoMat& b)
{
    return KvoMat(a.rows[0] + b.rows[0], a.rows[1] + b.rows[1],
                  a.rows[2] + b.rows[2], a.rows[3] + b.rows[3]);
}

constexpr KvoMat operator+(const KvoMat& a, float b)
{
    return KvoMat(a.rows[0] + b, a.rows[1] + b, a.rows[2] + b, a.rows[3] + b);
}

constexpr KvoMat operator+(float a, const KvoMat& b)
{
    return KvoMat(a + b.rows[0], a + b.rows[1], a + b.rows[2], a + b.rows[3]);
}

constexpr KvoMat operator-(const KvoMat& a, const KvoMat& b)
{
    return KvoMat(a.rows[0] - b.rows[0], a.rows[1] - b.rows[1],
                  a.rows[2] - b.rows[2], a.rows[3] - b.rows[3]);
}

constexpr KvoMat operator-(const KvoMat& a, float b)
{
    return KvoMat(a.rows[0] - b, a.rows[1] - b, a.rows[2] - b, a.rows[3] - b);
}

constexpr KvoMat operator-(float a, const KvoMat& b)
{
    return KvoMat(a - b.rows[0], a - b.rows[1], a - b.rows[2], a - b.rows[3]);
}

constexpr KvoMat operator*(const KvoMat& a, const KvoMat& b)
{
    if (!__builtin_is_constant_evaluated())
        return zt_geometry::product(a, b);
    return KvoMat(zt_geometry::transformed(a.rows[0], b),
                  zt_geometry::transformed(a.rows[1], b),
                  zt_geometry::transformed(a.rows[2], b),
                  zt_geometry::transformed(a.rows[3], b));
}

constexpr KvoMat operator*(const KvoMat& a, float b)
{
    return KvoMat(a.rows[0] * b, a.rows[1] * b, a.rows[2] * b, a.rows[3] * b);
}

constexpr KvoMat operator*(float a, const KvoMat& b)
{
    return KvoMat(a * b.rows[0], a * b.rows[1], a * b.rows[2], a * b.rows[3]);
}

constexpr KvoMat operator/(const KvoMat& a, const KvoMat& b)
{
    KvoMat result;
    for (int i = 0; i < 4; ++i) {
        const KvoVec4& row = a.rows[i];
        result.rows[i] = zt_geometry::quotients(row.x, b.rows[0]) +
                         zt_geometry::quotients(row.y, b.rows[1]) +
                         zt_geometry::quotients(row.z, b.rows[2]) +
                         zt_geometry::quotients(row.w, b.rows[3]);
    }
    return result;
}

constexpr KvoMat operator/(const KvoMat& a, float b)
{
    if (b == 0) {
        zt_geometry::division_by_zero("KvoMat");
        return KvoMat(KvoVec4(), KvoVec4(), KvoVec4(), KvoVec4());
    }
    return KvoMat(zt_geometry::quotients(a.rows[0], b),
                  zt_geometry::quotients(a.rows[1], b),
                  zt_geometry::quotients(a.rows[2], b),
                  zt_geometry::quotients(a.rows[3], b));
}

constexpr KvoMat operator/(float a, const KvoMat& b)
{
    return KvoMat(zt_geometry::quotients(a, b.rows[0]),
                  zt_geometry::quotients(a, b.rows[1]),
                  zt_geometry::quotients(a, b.rows[2]),
                  zt_geometry::quotients(a, b.rows[3]));
}

constexpr KvoVec4 operator*(const KvoVec4& v, const KvoMat& m)
{
    if (__builtin_is_constant_evaluated())
        return zt_geometry::divided_by_w(zt_geometry::transformed(v, m));
    return zt_geometry::point(v, m);
}

constexpr KvoVec4 operator*(const KvoMat& m, const KvoVec4& v)
{
    return zt_geometry::divided_by_w(KvoVec4(v.Dot(m.rows[0]), v.Dot(m.rows[1]),
                                             v.Dot(m.rows[2]),
                                             v.Dot(m.rows[3])));
}

// ---------------------------------------------------------------------------
// Quaternions

inline KvoQuat::KvoQuat(const KvoMat& m) : s(0)
{
    const KvoVec4* r = m.rows;
    float t = (r[0].x + 1 + r[1].y + r[2].z) * 0.25f;
    if (!zt_geometry::small(t)) {
        s = std::sqrt(t);
        v = KvoVec3((r[1].z - r[2].y) / (4 * s), (r[2].x - r[0].z) / (4 * s),
                    (r[0].y - r[1].x) / (4 * s));
        return;
    }
    t = -(r[1].y + r[2].z) * 0.5f;
    if (!zt_geometry::small(t)) {
        v.x = std::sqrt(t);
        v.y = r[0].y / (2 * v.x);
        v.z = r[0].z / (2 * v.x);
        return;
    }
    t = (1 - r[2].z) * 0.5f;
    if (!zt_geometry::small(t)) {
        v.y = std::sqrt(t);
        v.z = r[1].z / (2 * v.y);
        return;
    }
    v.z = 1;
}

namespace zt_geometry {
inline float length(const KvoQuat& q)
{
    return std::sqrt(q.s * q.s + q.v.x * q.v.x + q.v.y * q.v.y + q.v.z * q.v.z);
}
} // namespace zt_geometry

inline KvoQuat& KvoQuat::Normalize()
{
    const float length = zt_geometry::length(*this);
    if (!zt_geometry::small(length)) {
        s /= length;
        v /= length;
    }
    return *this;
}

inline KvoQuat KvoQuat::qbisect(const KvoQuat& q) const
{
    KvoQuat sum = *this + q;
    const float length = zt_geometry::length(sum);
    if (length != 0 && length != 1) {
        sum.s /= length;
        sum.v /= length;
    }
    return sum;
}

constexpr KvoQuat KvoQuat::qdouble(const KvoQuat& q) const
{
    const float d = 2 * (v.Dot(q.v) + s * q.s);
    return KvoQuat(d * q.s - s, d * q.v - v);
}

constexpr KvoQuat operator+(const KvoQuat& a, const KvoQuat& b)
{
    return KvoQuat(a.s + b.s, a.v + b.v);
}

constexpr KvoQuat operator*(const KvoQuat& a, const KvoQuat& b)
{
    return KvoQuat(a.s * b.s - a.v.Dot(b.v),
                   a.s * b.v + b.s * a.v + a.v.Cross(b.v));
}

inline KvoQuat Slerp(const KvoQuat& a, const KvoQuat& b, float t)
{
    const float omega = std::acos(a.s * b.s + a.v.Dot(b.v));
    const float sine = std::sin(omega);
    const float wa = std::sin((1 - t) * omega) / sine;
    const float wb = std::sin(t * omega) / sine;
    return __builtin_bit_cast(
        KvoQuat, wa * __builtin_bit_cast(zt_geometry::Lanes, a) +
                     wb * __builtin_bit_cast(zt_geometry::Lanes, b));
}

inline KvoQuat Interp(const KvoQuat& q0, const KvoQuat& q1, const KvoQuat& q2,
                      const KvoQuat& q3, float t)
{
    if (zt_geometry::small(t) || t < 0)
        return q1;
    if (zt_geometry::small(t - 1) || t > 1)
        return q2;

    const KvoQuat a = q0.qdouble(q1).qbisect(q2);
    const KvoQuat b = q1.qdouble(q2).qbisect(q3).qdouble(q2);
    const KvoQuat p1 = Slerp(q1, a, t);
    const KvoQuat p2 = Slerp(a, b, t);
    const KvoQuat p3 = Slerp(b, q2, t);
    return Slerp(Slerp(p1, p2, t), Slerp(p2, p3, t), t);
}

#endif
