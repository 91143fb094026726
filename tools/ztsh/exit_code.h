#ifndef ZTSH_EXIT_CODE_H
#define ZTSH_EXIT_CODE_H

/// \file
/// What the shell answers to whoever started it.

namespace ztsh {

/// The exit codes. Where several apply the highest one is given; a shell that
/// a signal ended gives 128 and the signal's number.
enum ExitCode : int {
    ExitWell = 0,         ///< Nothing was reported.
    ExitReported = 1,     ///< A warning or an error was reported.
    ExitUsage = 2,        ///< The command line was wrong; nothing was run.
    ExitCannotRead = 3,   ///< A script could not be read.
    ExitCannotWrite = 4,  ///< A file or standard output could not be written.
    ExitSignalBase = 128, ///< Added to the number of a signal.
};

} // namespace ztsh

#endif
