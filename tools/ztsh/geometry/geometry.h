#ifndef ZTSH_GEOMETRY_GEOMETRY_H
#define ZTSH_GEOMETRY_GEOMETRY_H

/// \file
/// All that the geometry words hold by name.

#include "geometry/shape.h"
#include "geometry/value.h"

namespace ztsh {

/// Values and shapes; a copy costs little.
struct Geometry
{
    ValueTable values;
    ShapeTable shapes;
};

} // namespace ztsh

#endif
