#ifndef ZTSH_OPTIONS_H
#define ZTSH_OPTIONS_H

/// \file
/// The command line.

#include "script/runner.h"

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace ztsh {

/// What the command line asks for.
struct Options
{
    Settings settings;
    std::vector<std::string> texts;   ///< Of the option -c, in order.
    std::vector<std::string> scripts; ///< In order; "-" is standard input.
    std::string page; ///< The kind of page about the shell to write, if any.
    bool finished = false; ///< There is nothing to run.
    int code = 0;          ///< The exit code if so.
};

/// Describes the command line to `app`, which will fill `options`.
void AddOptions(CLI::App& app, Options& options);

/// Reads the command line. Writes help and version to standard output, and to
/// standard error a line about what is wrong.
Options ReadOptions(int argc, const char* const* argv);

} // namespace ztsh

#endif
