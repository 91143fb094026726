#ifndef ZT_FRAMESTORE_OPTIONS_H
#define ZT_FRAMESTORE_OPTIONS_H

/// \file
/// The command line.

#include "server.h"

#include <string>

namespace framestore {

/// What the server answers to whoever started it.
enum ExitCode : int {
    ExitWell = 0,      ///< A signal has stopped it, as it should be.
    ExitNoService = 1, ///< It could not listen, or has no place for frames.
    ExitUsage = 2,     ///< The command line was wrong.
};

struct Options
{
    Settings settings;
    std::string page;      ///< A page about the program is wanted instead.
    bool finished = false; ///< There is nothing to do but to end with `code`.
    int code = ExitWell;
};

/// Reads the command line.
///
/// Reports: prints help, version, the page that was asked for, or what is
///          wrong.
Options ReadOptions(int argc, const char* const* argv);

} // namespace framestore

#endif
