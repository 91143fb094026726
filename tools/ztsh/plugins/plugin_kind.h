#ifndef ZTSH_PLUGINS_PLUGIN_KIND_H
#define ZTSH_PLUGINS_PLUGIN_KIND_H

/// \file
/// The kinds of plug-ins that the shell knows.

#include <string_view>

namespace ztsh {

struct PluginKind
{
    const char* name;   ///< As the command line and `zt_add_plugin` call it.
    const char* id;     ///< What its plug-ins say.
    const char* suffix; ///< What their files end in.
};

inline constexpr PluginKind plugin_kinds[] = {
    {"directive", "Directive:1.0", ".d.so"},
    {"recognizer", "Recognizer:2.1", ".r.so"},
};

/// Gives the kind of that name, or null.
constexpr const PluginKind* KindByName(std::string_view name)
{
    for (const PluginKind& kind : plugin_kinds)
        if (name == kind.name)
            return &kind;
    return nullptr;
}

/// Gives the kind whose scans find a file of that name, or null.
constexpr const PluginKind* KindOfFile(std::string_view file)
{
    for (const PluginKind& kind : plugin_kinds) {
        std::string_view suffix = kind.suffix;
        if (file.size() > suffix.size() &&
            file.substr(file.size() - suffix.size()) == suffix &&
            file[file.size() - suffix.size() - 1] != '/')
            return &kind;
    }
    return nullptr;
}

} // namespace ztsh

#endif
