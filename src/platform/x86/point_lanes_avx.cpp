#include "platform/x86/point_lanes_avx.h"

#if defined(__x86_64__) || defined(__i386__)

#include "platform/x86/processor.h"

#include <immintrin.h>

// AVX, not AVX2 and above: processors of that kind can fuse a product with a
// sum, and the compiler must not get the idea.

namespace zt_platform {

namespace {

/// The rows of a matrix, each in both halves of a register.
struct Rows
{
    __m256 row[4];
};

/// Multiplies two row vectors. What is divided by 1 stays as it is, so a last
/// element of 0 or 1 needs no way of its own.
[[gnu::target("avx")]] void transform_pair(const float* points, float* products,
                                           const Rows& rows)
{
    const __m256 zeros = _mm256_setzero_ps();
    const __m256 ones = _mm256_set1_ps(1);

    const __m256 pair = _mm256_loadu_ps(points);
    __m256 sum = _mm256_mul_ps(_mm256_permute_ps(pair, 0x00), rows.row[0]);
    sum = _mm256_add_ps(
        sum, _mm256_mul_ps(_mm256_permute_ps(pair, 0x55), rows.row[1]));
    sum = _mm256_add_ps(
        sum, _mm256_mul_ps(_mm256_permute_ps(pair, 0xAA), rows.row[2]));
    sum = _mm256_add_ps(
        sum, _mm256_mul_ps(_mm256_permute_ps(pair, 0xFF), rows.row[3]));

    // Chosen by the language's own operator: g++ 12 without AVX2 takes the
    // blend of the header for eight choices, one by one.
    const __m256 w = _mm256_permute_ps(sum, 0xFF);
    const __m256 quotient = _mm256_div_ps(sum, w == zeros ? ones : w);
    const __m256 new_w = w == zeros ? w : ones;
    constexpr int last_elements = 0x88;
    _mm256_storeu_ps(products, _mm256_blend_ps(quotient, new_w, last_elements));
}

/// Every element of a matrix, in all lanes.
struct Elements
{
    __m256 of[4][4];
};

/// Eight points of three floats by component, two times four of them: point 0
/// to 3 in the lower halves, 4 to 7 in the upper ones.
struct Components
{
    __m256 x;
    __m256 y;
    __m256 z;
};

/// Loads four floats into the lower half and, from 12 floats on, four into the
/// upper one.
[[gnu::target("avx")]] __m256 load_halves(const float* from)
{
    constexpr std::size_t four_points = 12;
    return _mm256_insertf128_ps(_mm256_castps128_ps256(_mm_loadu_ps(from)),
                                _mm_loadu_ps(from + four_points), 1);
}

[[gnu::target("avx")]] void store_halves(float* to, __m256 halves)
{
    constexpr std::size_t four_points = 12;
    _mm_storeu_ps(to, _mm256_castps256_ps128(halves));
    _mm_storeu_ps(to + four_points, _mm256_extractf128_ps(halves, 1));
}

/// Four points are twelve floats: x0 y0 z0 x1, y1 z1 x2 y2, z2 x3 y3 z3. In
/// each half two shuffles bring together what one more can pick from.
[[gnu::target("avx")]] Components parted(const float* points)
{
    const __m256 first = load_halves(points);
    const __m256 second = load_halves(points + 4);
    const __m256 third = load_halves(points + 8);
    const __m256 x2y2x3y3 =
        _mm256_shuffle_ps(second, third, _MM_SHUFFLE(2, 1, 3, 2));
    const __m256 y0z0y1z1 =
        _mm256_shuffle_ps(first, second, _MM_SHUFFLE(1, 0, 2, 1));
    return {_mm256_shuffle_ps(first, x2y2x3y3, _MM_SHUFFLE(2, 0, 3, 0)),
            _mm256_shuffle_ps(y0z0y1z1, x2y2x3y3, _MM_SHUFFLE(3, 1, 2, 0)),
            _mm256_shuffle_ps(y0z0y1z1, third, _MM_SHUFFLE(3, 0, 3, 1))};
}

/// Puts the components back into the order of points.
[[gnu::target("avx")]] void store_joined(float* products, const Components& c)
{
    const __m256 x0x2y0y2 =
        _mm256_shuffle_ps(c.x, c.y, _MM_SHUFFLE(2, 0, 2, 0));
    const __m256 y1y3z1z3 =
        _mm256_shuffle_ps(c.y, c.z, _MM_SHUFFLE(3, 1, 3, 1));
    const __m256 z0z2x1x3 =
        _mm256_shuffle_ps(c.z, c.x, _MM_SHUFFLE(3, 1, 2, 0));
    store_halves(products, _mm256_shuffle_ps(x0x2y0y2, z0z2x1x3,
                                             _MM_SHUFFLE(2, 0, 2, 0)));
    store_halves(products + 4, _mm256_shuffle_ps(y1y3z1z3, x0x2y0y2,
                                                 _MM_SHUFFLE(3, 1, 2, 0)));
    store_halves(products + 8, _mm256_shuffle_ps(z0z2x1x3, y1y3z1z3,
                                                 _MM_SHUFFLE(3, 1, 3, 1)));
}

/// Gives one column of eight products.
[[gnu::target("avx")]] __m256 column(const Components& p, const Elements& m,
                                     std::size_t j)
{
    const __m256 sum = _mm256_add_ps(_mm256_mul_ps(p.x, m.of[0][j]),
                                     _mm256_mul_ps(p.y, m.of[1][j]));
    return _mm256_add_ps(_mm256_add_ps(sum, _mm256_mul_ps(p.z, m.of[2][j])),
                         m.of[3][j]);
}

/// Multiplies eight points of three floats.
[[gnu::target("avx")]] void transform_eight(const float* points,
                                            float* products, const Elements& m)
{
    const Components p = parted(points);
    const __m256 w = column(p, m, 3);
    const __m256 divisor = w == _mm256_setzero_ps() ? _mm256_set1_ps(1) : w;
    store_joined(products, {_mm256_div_ps(column(p, m, 0), divisor),
                            _mm256_div_ps(column(p, m, 1), divisor),
                            _mm256_div_ps(column(p, m, 2), divisor)});
}

class AvxPointLanes final : public PointLanes
{
public:
    const char* name() const override { return "avx"; }

    [[gnu::target("avx")]] void transform(const float* points, float* products,
                                          std::size_t count,
                                          const float* matrix) const override
    {
        Rows rows;
        for (std::size_t i = 0; i < 4; ++i)
            rows.row[i] = _mm256_broadcast_ps(
                reinterpret_cast<const __m128*>(matrix + 4 * i));
        std::size_t at = 0;
        for (; count - at >= points_in_line; at += points_in_line) {
            fetch_ahead(points, products, 4 * at, 4 * count);
            transform_pair(points + 4 * at, products + 4 * at, rows);
            transform_pair(points + 4 * at + 8, products + 4 * at + 8, rows);
        }
        PointLanes::transform(points + 4 * at, products + 4 * at, count - at,
                              matrix);
    }

    [[gnu::target("avx")]] void transform3(const float* points, float* products,
                                           std::size_t count,
                                           const float* matrix) const override
    {
        Elements m;
        for (std::size_t i = 0; i < 16; ++i)
            m.of[i / 4][i % 4] = _mm256_set1_ps(matrix[i]);
        constexpr std::size_t step = 8;
        std::size_t at = 0;
        for (; count - at >= step; at += step) {
            fetch_ahead(points, products, 3 * at, 3 * count);
            fetch_ahead(points, products, 3 * at + floats_in_line, 3 * count);
            transform_eight(points + 3 * at, products + 3 * at, m);
        }
        PointLanes::transform3(points + 3 * at, products + 3 * at, count - at,
                               matrix);
    }
};

constinit const AvxPointLanes avx_lanes;

} // namespace

const PointLanes* avx_point_lanes()
{
    return processor_has_avx() ? &avx_lanes : nullptr;
}

} // namespace zt_platform

#else

namespace zt_platform {

const PointLanes* avx_point_lanes()
{
    return nullptr;
}

} // namespace zt_platform

#endif
