#include "platform/point_lanes.h"

#include "platform/x86/point_lanes_avx.h"

namespace zt_platform {

namespace {

struct PlainLanes final : PointLanes
{};

constinit const PlainLanes plain_lanes;
constinit const PointLanes* in_use = nullptr; ///< Null before the first use.

/// Four floats, each computed as it would be alone.
typedef float Quad __attribute__((vector_size(16)));

Quad load(const float* from)
{
    Quad quad;
    __builtin_memcpy(&quad, from, sizeof quad);
    return quad;
}

} // namespace

const char* PointLanes::name() const
{
    return "plain";
}

void PointLanes::transform(const float* points, float* products,
                           std::size_t count, const float* matrix) const
{
    const Quad row0 = load(matrix);
    const Quad row1 = load(matrix + 4);
    const Quad row2 = load(matrix + 8);
    const Quad row3 = load(matrix + 12);
    for (std::size_t at = 0; at < count; ++at) {
        if (at % points_in_line == 0)
            fetch_ahead(points, products, 4 * at, 4 * count);
        const Quad point = load(points + 4 * at);
        Quad product = point[0] * row0 + point[1] * row1 + point[2] * row2 +
                       point[3] * row3;
        const float w = product[3];
        if (w != 0 && w != 1) {
            product /= w;
            product[3] = 1;
        }
        __builtin_memcpy(products + 4 * at, &product, sizeof product);
    }
}

void PointLanes::transform3(const float* points, float* products,
                            std::size_t count, const float* matrix) const
{
    const Quad row0 = load(matrix);
    const Quad row1 = load(matrix + 4);
    const Quad row2 = load(matrix + 8);
    const Quad row3 = load(matrix + 12);
    for (std::size_t at = 0; at < 3 * count; at += 3) {
        // A product with 1 is the number itself, so row 3 needs none.
        Quad product = points[at] * row0 + points[at + 1] * row1 +
                       points[at + 2] * row2 + row3;
        const float w = product[3];
        if (w != 0 && w != 1)
            product /= w;
        __builtin_memcpy(products + at, &product, 3 * sizeof(float));
    }
}

const PointLanes& PointLanes::plain()
{
    return plain_lanes;
}

const PointLanes& PointLanes::fastest()
{
    const PointLanes* wide = avx_point_lanes();
    return wide ? *wide : plain_lanes;
}

const PointLanes& PointLanes::current()
{
    if (!in_use)
        in_use = &fastest();
    return *in_use;
}

void PointLanes::install(const PointLanes* other)
{
    in_use = other;
}

} // namespace zt_platform
