#ifndef ZTSH_GEOMETRY_EXPRESSION_H
#define ZTSH_GEOMETRY_EXPRESSION_H

/// \file
/// Expressions of the geometry words, read from the words of a statement and
/// computed on the way.
///
///     sum      is  product, then + or - and a product, any number of times
///     product  is  operand, then * / cross or dot and an operand, likewise
///     operand  is  numbers, a name, a function and its arguments, or ( sum )
///
/// All numbers that follow each other are one operand: 1 is a number, 3 or 4
/// are a vector, 9, 12 or 16 a matrix row by row. Where a function takes a
/// number or a vector of 3 it takes no more numbers than it needs.

#include "geometry/functions.h"
#include "geometry/operators.h"
#include "geometry/value.h"

#include <KVO/KvoStatement.h>

#include <optional>
#include <string>
#include <vector>

namespace ztsh {

/// Reads expressions and single words from a statement, from the front on.
class ExpressionReader
{
public:
    /// Starts at the word at position `first`. Words with blanks in them, which
    /// variables may bring, count as several.
    ///
    /// Requires: `known_values` outlives the reader.
    ExpressionReader(const KvoStatement& statement, int first,
                     const ValueTable& known_values);

    /// Reads the longest expression that is there.
    ///
    /// Returns: nothing if there is none or it makes no sense; `Why` tells.
    /// Reports: what the library does.
    std::optional<Value> Read();

    /// Does the same where one kind is needed.
    std::optional<Value> Read(ValueKind kind);

    /// Reads three numbers, or another operand that is a vector of 3.
    ///
    /// Returns: as `Read`.
    std::optional<KvoVec3> ReadVector3();

    /// Takes `word` if it is the next one.
    bool Take(const char* word);

    /// Takes the next word; the empty text if there is none.
    std::string TakeAny();

    bool AtEnd() const { return next == words.size(); }

    /// Tells whether nothing is left; if not, `Why` says so.
    bool Ended();

    const std::string& Why() const { return why; }

private:
    std::optional<Value> sum();
    std::optional<Value> product();
    std::optional<Value> operand();
    std::optional<Value> in_parentheses();
    std::optional<Value> numbers(std::size_t count);
    std::optional<Value> all_numbers();
    std::optional<Value> call(const Function& function);
    std::optional<Value> argument(const Function& function, Argument kind);
    std::optional<Value> named(const std::string& word);
    std::optional<Value> apply(const Value& left, Operator sign,
                               const Value& right);
    std::optional<Operator> take_operator(Operator first, Operator last);
    std::size_t numbers_ahead() const;
    std::nullopt_t fail(const std::string& reason);

    const ValueTable& values;
    std::vector<std::string> words;
    std::size_t next = 0;
    int depth = 0;
    std::string why;
};

} // namespace ztsh

#endif
