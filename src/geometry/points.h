#ifndef ZT_GEOMETRY_POINTS_H
#define ZT_GEOMETRY_POINTS_H

/// \file
/// The two ways of transforming many points; both give the bits of
/// `point * m`, one point after the other.

#include <cstddef>

#include "KVO/KvoVec.h"

namespace zt_geometry {
/// Transforms the points one by one; works everywhere.
void transform_one_by_one(const KvoVec4* points, KvoVec4* results,
                          std::size_t count, const KvoMat& m);

/// Transforms points two at a time in lanes of eight floats.
///
/// Returns: how many points, from the first on, it has done; up to three are
///          left over, and all of them where the processor has no such lanes.
std::size_t transform_in_pairs(const KvoVec4* points, KvoVec4* results,
                               std::size_t count, const KvoMat& m);
} // namespace zt_geometry

#endif
