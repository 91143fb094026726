#ifndef ZTSH_GEOMETRY_SHAPE_H
#define ZTSH_GEOMETRY_SHAPE_H

/// \file
/// Wire frames: points, and edges between them.

#include <KVO/KvoVec.h>
#include <ZT/image_sgi.h>

#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace ztsh {

/// An edge between two points, by their indices from 0.
struct Edge
{
    std::size_t from;
    std::size_t to;
    std::optional<ZtPixel> colour; ///< In object order; none of its own if not.
};

/// A wire frame. Every edge ends at points that are there.
struct Shape
{
    std::vector<KvoVec3> points;
    std::vector<Edge> edges;
};

/// Shapes by name. Nobody changes one that is in a table, so that copies of a
/// table share them.
using ShapeTable = std::map<std::string, std::shared_ptr<const Shape>>;

/// Makes a shape that the shell knows: cube (from -1 to 1), pyramid (in that
/// cube), axes (from 0 to 1, red green blue), grid (from -1 to 1 on the plane
/// of x and z) or sphere (of radius 1).
///
/// Returns: nothing if `name` is none of these.
std::optional<Shape> KnownShape(const std::string& name);

/// Moves every point to where `matrix` takes it.
void Transform(Shape& shape, const KvoMat& matrix);

/// Gives a colour that is written as in "ff8000": red, green and blue.
///
/// Returns: an opaque pixel in object order; nothing if it is no such text.
std::optional<ZtPixel> ReadColour(const std::string& text);

} // namespace ztsh

#endif
