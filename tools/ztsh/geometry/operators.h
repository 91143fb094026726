#ifndef ZTSH_GEOMETRY_OPERATORS_H
#define ZTSH_GEOMETRY_OPERATORS_H

/// \file
/// The operators of the geometry words, as the library has them for the kinds
/// that meet.

#include "geometry/value.h"

#include <optional>

namespace ztsh {

enum class Operator { Add, Subtract, Multiply, Divide, Cross, Dot };

/// Finds the operator that `word` is.
std::optional<Operator> OperatorOf(const std::string& word);

/// Gives the word of an operator.
const char* NameOf(Operator sign);

/// Applies an operator of the library.
///
/// A vector of 3 beside a matrix is a point with w = 1, and the w of the
/// product is dropped.
///
/// Returns: nothing if there is no such operation between these kinds.
/// Reports: what the library does: divided by zero.
std::optional<Value> Apply(const Value& left, Operator sign,
                           const Value& right);

} // namespace ztsh

#endif
