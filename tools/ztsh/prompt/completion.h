#ifndef ZTSH_PROMPT_COMPLETION_H
#define ZTSH_PROMPT_COMPLETION_H

/// \file
/// What the word before the cursor could become: a command word at the start
/// of a statement and behind `Help`, the name of a file elsewhere.

#include <string>
#include <string_view>
#include <vector>

namespace ztsh {

/// The word that the cursor stands behind.
struct WordAtCursor
{
    std::size_t start = 0; ///< Where it begins, in bytes.
    std::string text;      ///< Without quotes and escapes.
    char quote = '\0';     ///< The quote that is open, 0 if none is.
    bool is_command = false;
};

/// Finds the last word of `line`, which may be empty.
WordAtCursor FindWord(std::string_view line);

/// What the word could become.
struct Completion
{
    std::size_t start = 0; ///< Where the word begins, in bytes.
    std::string text;      ///< What all candidates have in common, quoted as
                           ///< needed; complete if there is one candidate.
    std::vector<std::string> candidates; ///< In order, as a person reads them.
};

/// Completes the last word of `line`; `commands` are the command words.
Completion Complete(std::string_view line,
                    const std::vector<std::string>& commands);

/// Sets `words` in columns that fill lines of `columns` cells, going down
/// first.
std::string InColumns(const std::vector<std::string>& words, int columns);

} // namespace ztsh

#endif
