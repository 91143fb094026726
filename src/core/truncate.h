#ifndef ZT_CORE_TRUNCATE_H
#define ZT_CORE_TRUNCATE_H

/// \file
/// The one way in which a floating-point number becomes a tick, a frame or a
/// sample count.

#include <limits>

namespace zt_core {
/// Truncates `value` toward zero, whatever the rounding mode is.
///
/// Returns: the nearest end of the range of `Integer` for a number beyond it;
///          0 for not-a-number.
template <class Integer>
constexpr Integer truncate_to(double value)
{
    using limits = std::numeric_limits<Integer>;
    // The upper end of a 64-bit type rounds up to a number beyond it, which
    // the comparison then leaves out as well.
    if (value >= static_cast<double>(limits::max()))
        return limits::max();
    if (value <= static_cast<double>(limits::min()))
        return limits::min();
    return value == value ? static_cast<Integer>(value) : 0;
}
} // namespace zt_core

#endif
