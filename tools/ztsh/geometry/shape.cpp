#include "geometry/shape.h"

#include <charconv>

namespace ztsh {

namespace {

void add_edges(Shape& shape,
               std::initializer_list<std::pair<std::size_t, std::size_t>> edges)
{
    for (auto [from, to] : edges)
        shape.edges.push_back({from, to, {}});
}

Shape cube()
{
    Shape shape;
    for (float z : {-1.0f, 1.0f})
        for (float y : {-1.0f, 1.0f})
            for (float x : {-1.0f, 1.0f})
                shape.points.emplace_back(x, y, z);
    // Two corners share an edge when their numbers differ in one bit.
    for (std::size_t corner = 0; corner < 8; ++corner)
        for (std::size_t bit : {1u, 2u, 4u})
            if (!(corner & bit))
                add_edges(shape, {{corner, corner | bit}});
    return shape;
}

Shape pyramid()
{
    Shape shape;
    shape.points = {KvoVec3(-1, -1, -1), KvoVec3(1, -1, -1), KvoVec3(1, -1, 1),
                    KvoVec3(-1, -1, 1), KvoVec3(0, 1, 0)};
    add_edges(shape, {{0, 1}, {1, 2}, {2, 3}, {3, 0}});
    add_edges(shape, {{0, 4}, {1, 4}, {2, 4}, {3, 4}});
    return shape;
}

/// Each axis has a head of two strokes, in the plane of the next axis.
Shape axes()
{
    constexpr ZtPixel colours[] = {0xFF4040FF, 0x40E040FF, 0x5080FFFF};
    constexpr float back = 0.85f;
    constexpr float aside = 0.06f;
    Shape shape;
    for (int axis = 0; axis < 3; ++axis) {
        std::size_t first = shape.points.size();
        shape.points.resize(first + 4);
        shape.points[first + 1][axis] = 1;
        for (std::size_t side : {2u, 3u}) {
            KvoVec3& point = shape.points[first + side];
            point[axis] = back;
            point[(axis + 1) % 3] = side == 2 ? aside : -aside;
        }
        for (std::size_t other : {0u, 2u, 3u})
            shape.edges.push_back({first + other, first + 1, colours[axis]});
    }
    return shape;
}

Shape grid()
{
    constexpr int cells = 10;
    Shape shape;
    for (int line = 0; line <= cells; ++line) {
        float at = static_cast<float>(2 * line - cells) / cells;
        std::size_t first = shape.points.size();
        shape.points.insert(shape.points.end(),
                            {KvoVec3(at, 0, -1), KvoVec3(at, 0, 1),
                             KvoVec3(-1, 0, at), KvoVec3(1, 0, at)});
        add_edges(shape, {{first, first + 1}, {first + 2, first + 3}});
    }
    return shape;
}

/// Rings from south to north, with meridians between the poles.
Shape sphere()
{
    constexpr std::size_t meridians = 16;
    constexpr std::size_t rings = 7;
    constexpr float half_turn = 180;
    Shape shape;
    shape.points = {KvoVec3(0, -1, 0)};
    for (std::size_t ring = 0; ring < rings; ++ring) {
        std::size_t first = shape.points.size();
        float tilt = half_turn * static_cast<float>(ring + 1) / (rings + 1);
        for (std::size_t i = 0; i < meridians; ++i) {
            float turn = 2 * half_turn * static_cast<float>(i) / meridians;
            KvoMat place = KvoMat().InitXrot(-tilt).Yrot(turn, 1);
            shape.points.push_back(KvoVec3(KvoVec4(0, -1, 0, 1) * place));
            std::size_t below = ring == 0 ? 0 : first + i - meridians;
            add_edges(shape, {{below, first + i},
                              {first + i, first + (i + 1) % meridians}});
        }
    }
    std::size_t pole = shape.points.size();
    shape.points.emplace_back(0.0f, 1.0f, 0.0f);
    for (std::size_t i = 1; i <= meridians; ++i)
        add_edges(shape, {{pole - i, pole}});
    return shape;
}

} // namespace

std::optional<Shape> KnownShape(const std::string& name)
{
    if (name == "cube")
        return cube();
    if (name == "pyramid")
        return pyramid();
    if (name == "axes")
        return axes();
    if (name == "grid")
        return grid();
    if (name == "sphere")
        return sphere();
    return std::nullopt;
}

void Transform(Shape& shape, const KvoMat& matrix)
{
    matrix.Transform(shape.points.data(), shape.points.data(),
                     shape.points.size());
}

std::optional<ZtPixel> ReadColour(const std::string& text)
{
    constexpr std::size_t digits = 6;
    constexpr int base = 16;
    constexpr ZtPixel opaque = 0xFF;
    ZtPixel colour = 0;
    const char* end = text.data() + text.size();
    auto [stop, fault] = std::from_chars(text.data(), end, colour, base);
    if (text.size() != digits || fault != std::errc() || stop != end)
        return std::nullopt;
    return colour << 8 | opaque;
}

} // namespace ztsh
