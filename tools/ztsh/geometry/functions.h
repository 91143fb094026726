#ifndef ZTSH_GEOMETRY_FUNCTIONS_H
#define ZTSH_GEOMETRY_FUNCTIONS_H

/// \file
/// The functions of the geometry words: the library's builders, conversions and
/// questions by name.

#include "geometry/value.h"

#include <optional>
#include <vector>

namespace ztsh {

/// What a function takes at a place.
enum class Argument : char {
    Number = 'n',
    Vector3 = 'v',
    Matrix = 'm',
    Quaternion = 'q',
    Four = '4', ///< Four numbers, or a value of any kind.
    Any = 'a',  ///< The function says which kinds it knows.
};

/// A function.
struct Function
{
    const char* name;
    const char* arguments; ///< A letter of `Argument` for each.

    /// Returns: nothing for a kind that the function does not know.
    /// Reports: what the library does.
    std::optional<Value> (*call)(const std::vector<Value>& arguments);
};

/// Finds a function by its name, case included; null if there is none.
const Function* FindFunction(const std::string& name);

/// Gives all functions.
const std::vector<Function>& Functions();

} // namespace ztsh

#endif
