#ifndef ZT_TESTS_GEOMETRY_COMPONENTS_H
#define ZT_TESTS_GEOMETRY_COMPONENTS_H

#include <array>

#include "KVO/KvoVec.h"

/// Components to compare exactly, where `==` of vectors has its tolerance.
using Three = std::array<float, 3>;
using Four = std::array<float, 4>;

inline Three Components(const KvoVec3& v)
{
    return {v.x, v.y, v.z};
}

inline Four Components(const KvoVec4& v)
{
    return {v.x, v.y, v.z, v.w};
}

#endif
