#ifndef ZTSH_PLUGINS_PLUGIN_TEMPLATE_H
#define ZTSH_PLUGINS_PLUGIN_TEMPLATE_H

/// \file
/// The beginning of a new plug-in: a source, a build and a test that work.

#include "plugins/plugin_kind.h"

#include <string>
#include <vector>

namespace ztsh {

struct TemplateFile
{
    std::string name;
    std::string text;
};

/// Tells whether a plug-in may have this name, which becomes the name of a
/// file, of a class and of what it registers: a letter, then letters, digits
/// and underscores.
bool IsPluginName(const std::string& name);

/// Makes the files of a new plug-in.
///
/// Requires: `IsPluginName(name)`.
std::vector<TemplateFile> TemplateFiles(const std::string& name,
                                        const PluginKind& kind);

} // namespace ztsh

#endif
