#ifndef ZTSH_GEOMETRY_VALUE_H
#define ZTSH_GEOMETRY_VALUE_H

/// \file
/// What the geometry words compute with: numbers, vectors, matrices and
/// quaternions, and their texts. No text here depends on the locale.

#include <KVO/KvoVec.h>

#include <map>
#include <string>
#include <variant>

namespace ztsh {

/// The kinds of values, by their places in `Value`.
enum class ValueKind { Number, Vector3, Vector4, Matrix, Quaternion };

using Value = std::variant<float, KvoVec3, KvoVec4, KvoMat, KvoQuat>;

/// Values by name.
using ValueTable = std::map<std::string, Value>;

ValueKind KindOf(const Value& value);

/// Says what a kind is, as in "a vector of 3".
const char* NameOf(ValueKind kind);

/// Gives the text that the library's stream operators write, without a line's
/// end; of a number the shortest text that reads back as it.
std::string StreamText(const Value& value);

/// Gives the bare numbers in turn, each as the shortest text that reads back as
/// it, with a blank between two. The library and `ReadFloat` read them.
std::string BareText(const Value& value);

/// Tells whether `word` can only be meant as a number: it begins with a digit,
/// or with a sign or point and a digit.
bool LooksLikeNumber(const std::string& word);

/// Reads a whole word as a number in decimal, with or without an exponent.
///
/// Returns: false, with `number` as it was, if it is anything else, or too
///          large for single precision. What is too small is 0.
bool ReadFloat(const std::string& word, float& number);

/// Lists what a table holds for an error text, as in "are: a, b" or "are none".
template <class Thing>
std::string ThereAre(const std::map<std::string, Thing>& table)
{
    std::string known;
    for (const auto& entry : table)
        known += (known.empty() ? "are: " : ", ") + entry.first;
    return known.empty() ? "are none" : known;
}

} // namespace ztsh

#endif
