#ifndef ZTSH_PLUGINS_PLUGIN_CHECK_H
#define ZTSH_PLUGINS_PLUGIN_CHECK_H

/// \file
/// A plug-in loaded, entered and unloaded in a process of its own, and what is
/// wrong with it.

#include "plugins/plugin_kind.h"

#include <string>
#include <vector>

namespace ztsh {

/// What there is to say about a plug-in.
struct PluginReport
{
    std::vector<std::string> good; ///< What is well, a line each.
    std::vector<std::string> bad;  ///< What is wrong, a line each.
    bool readable = true;          ///< False: there is no such file.
};

/// Checks the plug-in at `file`, which is to be of `kind`; of the kind that its
/// name tells if that is null.
///
/// The plug-ins of the directories `beside`, parted by ":", are loaded first,
/// so that names that they take are told.
PluginReport CheckPlugin(const std::string& file, const PluginKind* kind,
                         const std::string& beside);

} // namespace ztsh

#endif
