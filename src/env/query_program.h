#ifndef ZT_ENV_QUERY_PROGRAM_H
#define ZT_ENV_QUERY_PROGRAM_H

/// \file
/// The installation's query program, which prints the value of each variable
/// that it is asked for on a line of its own.

#include <memory>
#include <span>

namespace zt_env {

/// What the program said about one variable: the first word of its line; null
/// if that line was empty or missing.
using Answer = std::unique_ptr<char[]>;

/// The program of one installation. Nothing here throws; without memory there
/// are no answers.
class QueryProgram
{
public:
    /// The program of the installation in the directory `location`; null is
    /// the one that the search path leads to.
    ///
    /// Owner: the caller, who keeps the text while this object is in use.
    explicit QueryProgram(const char* location);

    /// Asks for `names` with one shell line and waits for it to end. Nothing is
    /// started unless the program is there now.
    ///
    /// By design: the answers are taken by their lines, so when the program
    ///            prints nothing for one name, later answers move up to it
    ///            (KvoPrefsQuery.AnAnswerThatIsMissingMovesTheLaterOnesUp).
    /// Requires:  names of letters, digits and underscores; as many answers,
    ///            all null.
    void ask(std::span<const char* const> names,
             std::span<Answer> answers) const;

private:
    const char* installation;
};

/// Tells whether the query program may be asked for `name`: whether it is made
/// of letters, digits and underscores, at least one.
bool may_be_asked(const char* name);

} // namespace zt_env

#endif
