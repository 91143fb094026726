#include "geometry/points.h"

namespace {
/// A line of the cache holds so many points.
constexpr std::size_t line = 4;

/// So many points lie between the one in hand and the one that is asked for:
/// far enough for memory to answer in time. Long arrays go through twice as
/// fast with it.
constexpr std::size_t ahead = 32 * line;

/// Asks for the line that will be needed later on. Always inline, since the
/// compiler takes it for a function without any effect and drops its calls.
[[gnu::always_inline]] inline void fetch_ahead(const KvoVec4* points,
                                               const KvoVec4* results,
                                               std::size_t i, std::size_t count)
{
    if (count - i > ahead) {
        __builtin_prefetch(points + i + ahead, 0);
        __builtin_prefetch(results + i + ahead, 1);
    }
}

#if defined(__x86_64__) || defined(__i386__)
/// Two points side by side.
typedef float Pair __attribute__((vector_size(32)));

struct PairRows
{
    Pair row0;
    Pair row1;
    Pair row2;
    Pair row3;
};

/// Gives a row in both halves.
[[gnu::target("avx")]] inline void repeat(Pair& pair, const KvoVec4& row)
{
    pair = Pair{row.x, row.y, row.z, row.w, row.x, row.y, row.z, row.w};
}

/// Transforms two points. What is divided by 1 stays as it is, so a w of 0 or
/// 1 needs no way of its own.
[[gnu::target("avx")]] inline void
transform_pair(const KvoVec4* points, KvoVec4* results, const PairRows& m)
{
    constexpr Pair zeros = {};
    constexpr Pair ones = {1, 1, 1, 1, 1, 1, 1, 1};
    Pair v;
    __builtin_memcpy(&v, points, sizeof v);
    const Pair sum =
        __builtin_shufflevector(v, v, 0, 0, 0, 0, 4, 4, 4, 4) * m.row0 +
        __builtin_shufflevector(v, v, 1, 1, 1, 1, 5, 5, 5, 5) * m.row1 +
        __builtin_shufflevector(v, v, 2, 2, 2, 2, 6, 6, 6, 6) * m.row2 +
        __builtin_shufflevector(v, v, 3, 3, 3, 3, 7, 7, 7, 7) * m.row3;
    const Pair w = __builtin_shufflevector(sum, sum, 3, 3, 3, 3, 7, 7, 7, 7);
    const Pair quotient = sum / (w == zeros ? ones : w);
    const Pair new_w = w == zeros ? w : ones;
    const Pair result =
        __builtin_shufflevector(quotient, new_w, 0, 1, 2, 11, 4, 5, 6, 15);
    __builtin_memcpy(static_cast<void*>(results), &result, sizeof result);
}

[[gnu::target("avx")]] std::size_t transform_with_avx(const KvoVec4* points,
                                                      KvoVec4* results,
                                                      std::size_t count,
                                                      const KvoMat& m)
{
    PairRows rows;
    repeat(rows.row0, m.rows[0]);
    repeat(rows.row1, m.rows[1]);
    repeat(rows.row2, m.rows[2]);
    repeat(rows.row3, m.rows[3]);
    std::size_t i = 0;
    for (; count - i >= line; i += line) {
        fetch_ahead(points, results, i, count);
        transform_pair(points + i, results + i, rows);
        transform_pair(points + i + 2, results + i + 2, rows);
    }
    return i;
}
#endif
} // namespace

void zt_geometry::transform_one_by_one(const KvoVec4* points, KvoVec4* results,
                                       std::size_t count, const KvoMat& m)
{
    for (std::size_t i = 0; i < count; ++i) {
        if (i % line == 0)
            fetch_ahead(points, results, i, count);
        results[i] = points[i] * m;
    }
}

std::size_t zt_geometry::transform_in_pairs(const KvoVec4* points,
                                            KvoVec4* results, std::size_t count,
                                            const KvoMat& m)
{
#if defined(__x86_64__) || defined(__i386__)
    if (__builtin_cpu_supports("avx"))
        return transform_with_avx(points, results, count, m);
#endif
    static_cast<void>(points);
    static_cast<void>(results);
    static_cast<void>(count);
    static_cast<void>(m);
    return 0;
}

void KvoMat::Transform(const KvoVec4* points, KvoVec4* results,
                       std::size_t count) const
{
    const KvoMat m(*this); // which may be among the results
    const std::size_t done =
        zt_geometry::transform_in_pairs(points, results, count, m);
    zt_geometry::transform_one_by_one(points + done, results + done,
                                      count - done, m);
}

void KvoMat::Transform(const KvoVec3* points, KvoVec3* results,
                       std::size_t count) const
{
    const KvoMat m(*this); // which may be among the results
    for (std::size_t i = 0; i < count; ++i)
        results[i] = KvoVec3(KvoVec4(points[i]) * m);
}
