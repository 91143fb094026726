#include "plugins/plugin_table.h"

#include <algorithm>
#include <filesystem>
#include <utility>

namespace ztsh {

namespace {

bool same(const PluginTable::Entry& a, const PluginTable::Entry& b)
{
    return a.kind == b.kind && a.name == b.name;
}

void append(std::vector<PluginTable::Entry>& entries, const char* kind,
            ZtPlugCatalog& catalog)
{
    for (const char* name = catalog.HeadKey(); name; name = catalog.NextKey()) {
        const char* const path = catalog.FindPlugPath(name);
        entries.push_back({name, kind, path ? path : ""});
    }
}

} // namespace

PluginTable::PluginTable(ZtDispatcher& dispatcher) : directives(dispatcher) {}

std::vector<PluginTable::Entry>
PluginTable::Load(const std::string& directories)
{
    const std::vector<Entry> before = Entries();
    directives.ScanDirectory(directories.c_str());
    recognizers.ScanDirectory(directories.c_str());
    std::vector<Entry> entries = Entries();
    const auto was_there = [&before](const Entry& entry) {
        return std::any_of(
            before.begin(), before.end(),
            [&entry](const Entry& other) { return same(entry, other); });
    };
    entries.erase(std::remove_if(entries.begin(), entries.end(), was_there),
                  entries.end());
    return entries;
}

std::vector<PluginTable::Entry> PluginTable::Entries()
{
    std::vector<Entry> entries;
    append(entries, "directive", directives);
    append(entries, "recognizer", recognizers);
    return entries;
}

std::string PluginTable::HelpFile(const std::string& name,
                                  const char* extension)
{
    for (ZtPlugCatalog* catalog : {static_cast<ZtPlugCatalog*>(&directives),
                                   static_cast<ZtPlugCatalog*>(&recognizers)})
        if (const char* file =
                catalog->FindPlugHelpFilename(name.c_str(), extension))
            return file;
    return {};
}

bool PluginTable::Has(const std::string& name)
{
    return directives.FindPlug(name.c_str()) ||
           recognizers.FindPlug(name.c_str());
}

std::string InstalledPlugins()
{
    std::error_code fault;
    const auto program = std::filesystem::read_symlink("/proc/self/exe", fault);
    return (program.parent_path() / ZTSH_PLUGIN_DIR).lexically_normal();
}

} // namespace ztsh
