#include <istream>
#include <ostream>
#include <type_traits>

#include "KVO/KvoVec.h"

static_assert(sizeof(KvoQuat) == 4 * sizeof(float));
static_assert(std::is_standard_layout_v<KvoQuat>);
static_assert(std::is_trivially_copyable_v<KvoQuat>);

std::ostream& operator<<(std::ostream& stream, const KvoQuat& q)
{
    stream.precision(10);
    return stream << "[ " << q.s << ", " << q.v << " ]";
}

std::istream& operator>>(std::istream& stream, KvoQuat& q)
{
    KvoQuat read;
    if (stream >> read.s >> read.v)
        q = read;
    return stream;
}
