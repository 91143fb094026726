#include "geometry/wire_frame.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdlib>
#include <tuple>
#include <utility>

namespace ztsh {

namespace {

bool is_finite(const Homogeneous& p)
{
    return std::isfinite(p.x) && std::isfinite(p.y) && std::isfinite(p.z) &&
           std::isfinite(p.w);
}

constexpr std::size_t plane_count = 7;

/// How far a point is on the inner side of the faces of the cube, times w. The
/// last one keeps off a w of 0, which nothing can be divided by.
std::array<double, plane_count> distances(const Homogeneous& p)
{
    constexpr double least_w = 1e-30;
    return {p.w + p.x, p.w - p.x, p.w + p.y,    p.w - p.y,
            p.w + p.z, p.w - p.z, p.w - least_w};
}

Homogeneous between(const Homogeneous& a, const Homogeneous& b, double t)
{
    return {a.x + t * (b.x - a.x), a.y + t * (b.y - a.y), a.z + t * (b.z - a.z),
            a.w + t * (b.w - a.w)};
}

/// Gives the pixel of a coordinate from -1 to 1.
int pixel_of(double coordinate, int size)
{
    double inside = std::clamp(coordinate, -1.0, 1.0);
    return std::min(static_cast<int>((inside + 1) / 2 * size), size - 1);
}

bool lies_in(const ZtImageSGI& image, Pixel place)
{
    return place.column >= 0 && place.column < image.width && place.row >= 0 &&
           place.row < image.height;
}

} // namespace

Homogeneous Multiply(const KvoVec3& point, const KvoMat& matrix)
{
    const KvoVec4* rows = matrix.rows;
    KvoVec4 product =
        point.x * rows[0] + point.y * rows[1] + point.z * rows[2] + rows[3];
    return {product.x, product.y, product.z, product.w};
}

// The method of Cyrus and Beck: each plane takes away from one end of the
// segment, and what is left between the two, if anything, is inside of all.
bool ClipToCube(Homogeneous& from, Homogeneous& to)
{
    if (!is_finite(from) || !is_finite(to))
        return false;
    const auto at_from = distances(from);
    const auto at_to = distances(to);
    double enters = 0;
    double leaves = 1;
    for (std::size_t i = 0; i < plane_count; ++i) {
        const double a = at_from[i];
        const double b = at_to[i];
        if (a < 0 && b < 0)
            return false;
        if (a < 0)
            enters = std::max(enters, a / (a - b));
        else if (b < 0)
            leaves = std::min(leaves, a / (a - b));
    }
    if (enters > leaves)
        return false;
    const Homogeneous first = between(from, to, enters);
    const Homogeneous last = between(from, to, leaves);
    from = enters > 0 ? first : from;
    to = leaves < 1 ? last : to;
    return from.w > 0 && to.w > 0;
}

Pixel PixelOf(const Homogeneous& point, int width, int height)
{
    return {pixel_of(point.x / point.w, width),
            pixel_of(point.y / point.w, height)};
}

// Bresenham's line: `error` is how far the line is from the pixel in hand, in
// units that need no fractions.
void DrawLine(ZtImageSGI& image, Pixel from, Pixel to, ZtPixel colour)
{
    if (!lies_in(image, from) || !lies_in(image, to))
        return;
    if (std::tie(to.column, to.row) < std::tie(from.column, from.row))
        std::swap(from, to);
    const int across = to.column - from.column;
    const int up = std::abs(to.row - from.row);
    const int row_step = to.row < from.row ? -1 : 1;
    const auto width = static_cast<std::size_t>(image.width);
    int error = across - up;
    for (Pixel at = from;;) {
        image.pixels[static_cast<std::size_t>(at.row) * width +
                     static_cast<std::size_t>(at.column)] = colour;
        if (at == to)
            return;
        const int twice = 2 * error;
        if (twice > -up) {
            error -= up;
            ++at.column;
        }
        if (twice < across) {
            error += across;
            at.row += row_step;
        }
    }
}

std::size_t DrawShape(ZtImageSGI& image, const Shape& shape,
                      const KvoMat& to_cube, ZtPixel colour)
{
    std::vector<Homogeneous> points;
    points.reserve(shape.points.size());
    for (const KvoVec3& point : shape.points)
        points.push_back(Multiply(point, to_cube));
    std::size_t lost = 0;
    for (const Edge& edge : shape.edges) {
        Homogeneous from = points[edge.from];
        Homogeneous to = points[edge.to];
        if (!is_finite(from) || !is_finite(to))
            ++lost;
        else if (ClipToCube(from, to))
            DrawLine(image, PixelOf(from, image.width, image.height),
                     PixelOf(to, image.width, image.height),
                     edge.colour.value_or(colour));
    }
    return lost;
}

} // namespace ztsh
