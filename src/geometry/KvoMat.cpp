#include <istream>
#include <ostream>
#include <type_traits>

#include "KVO/KvoVec.h"
#include "ZT/error.h"

#include "platform/point_lanes.h"

using zt_geometry::LaneRows;
using zt_geometry::Lanes;

static_assert(sizeof(KvoMat) == 16 * sizeof(float));
static_assert(std::is_standard_layout_v<KvoMat>);
static_assert(std::is_trivially_copyable_v<KvoMat>);

namespace {
template <int X, int Y, int Z, int W>
Lanes pick(const Lanes& from)
{
    return __builtin_shufflevector(from, from, X, Y, Z, W);
}

/// The 2 x 2 minors of two rows, each in the lane of the column whose cofactor
/// it belongs to. A cofactor needs three, one for each column that it keeps.
/// In the lanes of the odd columns the two columns of a minor are exchanged,
/// which gives those cofactors their sign.
struct Minors
{
    Minors(const Lanes& p, const Lanes& q)
        : first(pick<2, 3, 1, 2>(p) * pick<3, 2, 3, 1>(q) -
                pick<3, 2, 3, 1>(p) * pick<2, 3, 1, 2>(q)),
          second(pick<1, 3, 0, 2>(p) * pick<3, 0, 3, 0>(q) -
                 pick<3, 0, 3, 0>(p) * pick<1, 3, 0, 2>(q)),
          third(pick<1, 2, 0, 1>(p) * pick<2, 0, 1, 0>(q) -
                pick<2, 0, 1, 0>(p) * pick<1, 2, 0, 1>(q))
    {}

    /// Gives the cofactors of the row that is left over beside `row` and the
    /// two rows of the minors, if that is row 0 or 2.
    Lanes even_cofactors(const Lanes& row) const
    {
        return pick<1, 0, 0, 0>(row) * first - pick<2, 2, 1, 1>(row) * second +
               pick<3, 3, 3, 2>(row) * third;
    }

    /// Gives the same if that is row 1 or 3.
    Lanes odd_cofactors(const Lanes& row) const
    {
        return pick<2, 2, 1, 1>(row) * second - pick<1, 0, 0, 0>(row) * first -
               pick<3, 3, 3, 2>(row) * third;
    }

    Lanes first;
    Lanes second;
    Lanes third;
};

/// Gives the cofactors of a matrix, row by row.
LaneRows cofactors(const LaneRows& m)
{
    const Minors lower(m.row2, m.row3);
    const Minors upper(m.row0, m.row1);
    return {lower.even_cofactors(m.row1), lower.odd_cofactors(m.row0),
            upper.even_cofactors(m.row3), upper.odd_cofactors(m.row2)};
}

/// Gives a matrix whose columns are the given rows.
KvoMat transposed(const LaneRows& m)
{
    const Lanes low01 = __builtin_shufflevector(m.row0, m.row1, 0, 4, 1, 5);
    const Lanes high01 = __builtin_shufflevector(m.row0, m.row1, 2, 6, 3, 7);
    const Lanes low23 = __builtin_shufflevector(m.row2, m.row3, 0, 4, 1, 5);
    const Lanes high23 = __builtin_shufflevector(m.row2, m.row3, 2, 6, 3, 7);
    return __builtin_bit_cast(
        KvoMat, LaneRows{__builtin_shufflevector(low01, low23, 0, 1, 4, 5),
                         __builtin_shufflevector(low01, low23, 2, 3, 6, 7),
                         __builtin_shufflevector(high01, high23, 0, 1, 4, 5),
                         __builtin_shufflevector(high01, high23, 2, 3, 6, 7)});
}
} // namespace

KvoVec4& zt_geometry::illegal_row(int index)
{
    static KvoVec4 row;
    ZtWarning("KvoMat - Illegal index [%d].\n", index);
    return row;
}

KvoMat KvoMat::Adjoint() const
{
    return transposed(cofactors(zt_geometry::lanes(*this)));
}

KvoMat KvoMat::Invert() const
{
    const LaneRows m = zt_geometry::lanes(*this);
    const LaneRows c = cofactors(m);
    const Lanes terms = m.row0 * c.row0;
    const float det = terms[0] + terms[1] + terms[2] + terms[3];
    if (zt_geometry::small(det)) {
        ZtWarning("KvoMat - Singular matrix.\n");
        return transposed(c);
    }
    return transposed({c.row0 / det, c.row1 / det, c.row2 / det, c.row3 / det});
}

void KvoMat::Transform(const KvoVec4* points, KvoVec4* results,
                       std::size_t count) const
{
    if (count == 0)
        return;
    const KvoMat m(*this); // which may be among the results
    zt_platform::PointLanes::current().transform(&points->x, &results->x, count,
                                                 &m.rows[0].x);
}

void KvoMat::Transform(const KvoVec3* points, KvoVec3* results,
                       std::size_t count) const
{
    if (count == 0)
        return;
    const KvoMat m(*this); // which may be among the results
    zt_platform::PointLanes::current().transform3(&points->x, &results->x,
                                                  count, &m.rows[0].x);
}

std::ostream& operator<<(std::ostream& stream, const KvoMat& m)
{
    stream.precision(8);
    for (const KvoVec4& row : m.rows)
        stream << row << "\n";
    return stream;
}

std::istream& operator>>(std::istream& stream, KvoMat& m)
{
    KvoMat read;
    if (stream >> read.rows[0] >> read.rows[1] >> read.rows[2] >> read.rows[3])
        m = read;
    return stream;
}
