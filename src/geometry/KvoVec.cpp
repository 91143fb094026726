#include "KVO/KvoVec.h"

#include <cfloat>
#include <istream>
#include <ostream>
#include <type_traits>

#include "ZT/error.h"

// Wider intermediate results would give other bits than the formulas promise.
static_assert(FLT_EVAL_METHOD == 0, "float arithmetic must round to float");
static_assert(zt_geometry::tolerance == FLT_EPSILON);

// Hosts keep arrays of these and hand them on as plain floats.
static_assert(sizeof(KvoVec3) == 3 * sizeof(float));
static_assert(sizeof(KvoVec4) == 4 * sizeof(float));
static_assert(std::is_standard_layout_v<KvoVec3>);
static_assert(std::is_standard_layout_v<KvoVec4>);
static_assert(std::is_trivially_copyable_v<KvoVec3>);
static_assert(std::is_trivially_copyable_v<KvoVec4>);

float& zt_geometry::illegal_component(const char* type, int index)
{
    static float component;
    ZtWarning("%s - Illegal index [%d].\n", type, index);
    return component;
}

void zt_geometry::division_by_zero(const char* type)
{
    ZtWarning("%s - Division by zero.\n", type);
}

std::ostream& operator<<(std::ostream& stream, const KvoVec3& v)
{
    stream.precision(10);
    return stream << "[ " << v.x << ", " << v.y << ", " << v.z << " ]";
}

std::ostream& operator<<(std::ostream& stream, const KvoVec4& v)
{
    stream.precision(10);
    return stream << "[ " << v.x << ", " << v.y << ", " << v.z << ", " << v.w
                  << " ]";
}

std::istream& operator>>(std::istream& stream, KvoVec3& v)
{
    KvoVec3 read;
    if (stream >> read.x >> read.y >> read.z)
        v = read;
    return stream;
}

std::istream& operator>>(std::istream& stream, KvoVec4& v)
{
    KvoVec4 read;
    if (stream >> read.x >> read.y >> read.z >> read.w)
        v = read;
    return stream;
}
