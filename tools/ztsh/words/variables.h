#ifndef ZTSH_WORDS_VARIABLES_H
#define ZTSH_WORDS_VARIABLES_H

/// \file
/// The values that a script names with `$name` and `${name}`.

#include <ZT/property.h>

#include <set>
#include <string>
#include <vector>

namespace ztsh {

/// Named texts. What is copied is a store of its own.
class Variables
{
public:
    Variables() = default;
    Variables(const Variables& other);
    Variables& operator=(const Variables& other);
    ~Variables() = default;

    /// Tells whether `name` is a letter or underscore followed by letters,
    /// digits and underscores.
    static bool IsName(const std::string& name);

    /// Gives the value of `name`, null if there is none.
    ///
    /// Owner: this object, until the variable is set again.
    const char* Find(const std::string& name) const;

    /// Sets `name` to `value`.
    void Set(const std::string& name, const std::string& value);

    /// Forgets `name`.
    void Remove(const std::string& name);

    /// Replaces each `$name` and `${name}` in `text` by the value. A name that
    /// is not set stays as it is written and is added to `unknown`; a "$" with
    /// no name behind it is an ordinary character.
    std::string Expand(const std::string& text,
                       std::vector<std::string>& unknown) const;

    /// Gives the names of all variables, in order.
    const std::set<std::string>& Names() const { return names; }

private:
    /// The library's store knows no list and forgets no name, so a value in it
    /// counts only while its name is here.
    std::set<std::string> names;
    ZtPropList values;
};

} // namespace ztsh

#endif
