#ifndef ZTSH_PLUGINS_PLUGIN_COMMAND_H
#define ZTSH_PLUGINS_PLUGIN_COMMAND_H

/// \file
/// The command line `ztsh plugin ...`, for authors of plug-ins.
///
/// Only a first argument that is exactly `plugin` means this. A script of that
/// name is run as `ztsh ./plugin`.

namespace ztsh {

/// Tells whether the command line is one for authors of plug-ins.
bool IsPluginCommand(int argc, const char* const* argv);

/// Carries it out: `plugin new` writes the beginning of a plug-in, `plugin
/// check` loads plug-ins and says what is wrong with them.
///
/// Requires: `IsPluginCommand`.
/// Returns:  an exit code.
int RunPluginCommand(int argc, const char* const* argv);

} // namespace ztsh

#endif
