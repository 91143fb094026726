#ifndef ZTSH_PLUGINS_PLUGIN_TABLE_H
#define ZTSH_PLUGINS_PLUGIN_TABLE_H

/// \file
/// The shell's catalogs of plug-ins, one for each kind.

#include <KVO/KvoRecognizer.h>
#include <ZT/plug.h>

#include <string>
#include <vector>

namespace ztsh {

/// Holds what scripts have loaded. Destroying it withdraws the words that came
/// from plug-ins, deletes the plugs, and unloads the plug-ins.
class PluginTable
{
public:
    /// One plug, as scripts see it.
    struct Entry
    {
        std::string name;
        std::string kind;
        std::string directory;
    };

    /// Requires: `dispatcher` outlives the table.
    explicit PluginTable(ZtDispatcher& dispatcher);

    /// Loads the plug-ins of all kinds from `directories`, parted by ":".
    ///
    /// Returns: what was not there before, kind by kind, by name.
    std::vector<Entry> Load(const std::string& directories);

    /// Gives all plugs, kind by kind, by name.
    std::vector<Entry> Entries();

    /// Finds the help file about a plug, of whatever kind.
    ///
    /// Returns: its path, or the empty text.
    std::string HelpFile(const std::string& name, const char* extension);

    /// Tells whether there is a plug of that name.
    bool Has(const std::string& name);

    KvoRecognizerCatalog recognizers;
    ZtDirectiveCatalog directives;
};

/// Gives the directory that plug-ins are installed to together with this
/// program.
std::string InstalledPlugins();

} // namespace ztsh

#endif
