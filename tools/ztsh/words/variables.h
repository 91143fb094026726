#ifndef ZTSH_WORDS_VARIABLES_H
#define ZTSH_WORDS_VARIABLES_H

/// \file
/// The values that a script names with `$name` and `${name}`.

#include <map>
#include <string>
#include <vector>

namespace ztsh {

/// Named texts.
class Variables
{
public:
    /// Tells whether `name` is a letter or underscore followed by letters,
    /// digits and underscores.
    static bool IsName(const std::string& name);

    /// Gives the value of `name`, null if there is none.
    ///
    /// Owner: this object, until the variable is set again.
    const std::string* Find(const std::string& name) const;

    /// Sets `name` to `value`.
    void Set(const std::string& name, const std::string& value);

    /// Forgets `name`.
    void Remove(const std::string& name);

    /// Replaces each `$name` and `${name}` in `text` by the value. A name that
    /// is not set stays as it is written and is added to `unknown`; a "$" with
    /// no name behind it is an ordinary character.
    std::string Expand(const std::string& text,
                       std::vector<std::string>& unknown) const;

    /// Gives all variables in the order of their names.
    const std::map<std::string, std::string>& All() const { return values; }

private:
    std::map<std::string, std::string> values;
};

} // namespace ztsh

#endif
