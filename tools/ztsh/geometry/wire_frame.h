#ifndef ZTSH_GEOMETRY_WIRE_FRAME_H
#define ZTSH_GEOMETRY_WIRE_FRAME_H

/// \file
/// Draws wire frames: from points through a matrix to the cube from -1 to 1,
/// and from there to pixels.
///
/// Clipping comes before the division by w, since what lies behind the eye
/// would be in front of it afterwards. It is done in double precision, where
/// sums of any floats are finite.

#include "geometry/shape.h"

namespace ztsh {

/// A point before its division by w.
struct Homogeneous
{
    double x;
    double y;
    double z;
    double w;
};

/// A pixel's place; (0, 0) is at the bottom left.
struct Pixel
{
    int column;
    int row;

    bool operator==(const Pixel&) const = default;
};

/// Gives the product of a point with a matrix, not divided by w.
Homogeneous Multiply(const KvoVec3& point, const KvoMat& matrix);

/// Cuts a segment to what lies in the cube from -1 to 1, in front of the eye.
///
/// Returns: false if nothing does, or an end is not finite.
bool ClipToCube(Homogeneous& from, Homogeneous& to);

/// Gives the pixel that a point lies in; outside of the cube the nearest one.
///
/// Requires: finite numbers; w above 0; a size of at least 1.
Pixel PixelOf(const Homogeneous& point, int width, int height);

/// Draws a line of one pixel's width, the same from either end.
///
/// Draws nothing unless both ends lie in the picture.
void DrawLine(ZtImageSGI& image, Pixel from, Pixel to, ZtPixel colour);

/// Draws a shape.
///
/// `to_cube` takes what is to be seen to the cube from -1 to 1, as the library
/// projects. Edges without a colour of their own get `colour`.
///
/// Returns: the number of edges that are not drawn because an end is infinite
///          or not a number.
std::size_t DrawShape(ZtImageSGI& image, const Shape& shape,
                      const KvoMat& to_cube, ZtPixel colour);

} // namespace ztsh

#endif
