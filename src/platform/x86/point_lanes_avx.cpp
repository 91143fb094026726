#include "platform/x86/point_lanes_avx.h"

#if defined(__x86_64__) || defined(__i386__)

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
            fetch_ahead(points, products, at, count);
            transform_pair(points + 4 * at, products + 4 * at, rows);
            transform_pair(points + 4 * at + 8, products + 4 * at + 8, rows);
        }
        PointLanes::transform(points + 4 * at, products + 4 * at, count - at,
                              matrix);
    }
};

constinit const AvxPointLanes avx_lanes;

} // namespace

const PointLanes* avx_point_lanes()
{
    __builtin_cpu_init(); // Static objects may ask before it was done.
    return __builtin_cpu_supports("avx") ? &avx_lanes : nullptr;
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
