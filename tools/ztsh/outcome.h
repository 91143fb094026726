#ifndef ZTSH_OUTCOME_H
#define ZTSH_OUTCOME_H

/// \file
/// How the work has gone so far, which becomes the exit code at the end.

#include "exit_code.h"

namespace ztsh {

/// Collects what went wrong and whether the script asked to stop.
class Outcome
{
public:
    /// Notes that `code` applies; the highest one noted is kept.
    void Note(int code);

    /// Counts one report of a warning or an error.
    void CountReport();

    /// Gives the number of warnings and errors so far.
    long Reports() const { return reports; }

    /// Asks for the end of the run; the code comes from what went wrong.
    void Quit();

    /// Asks for the end of the run with exit code `code`.
    ///
    /// Units: `code` 0..255.
    void Quit(int code);

    /// Tells whether the run was asked to end.
    bool Quitting() const { return quitting; }

    /// Gives the code of `Quit`, if one was given, or else the highest noted.
    int Code() const { return quit_code >= 0 ? quit_code : noted; }

private:
    int noted = ExitWell;
    long reports = 0;
    bool quitting = false;
    int quit_code = -1; ///< -1 as long as none was given.
};

} // namespace ztsh

#endif
