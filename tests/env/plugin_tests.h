#ifndef ZT_TESTS_PLUGIN_TESTS_H
#define ZT_TESTS_PLUGIN_TESTS_H

#include "ZT/plug.h"

#include <cstdlib>
#include <filesystem>
#include <string>
#include <utility>
#include <vector>

#include "env/plugins/told.h"
#include "support/TempDir.h"

/// What the plug-ins have told since it was taken last.
std::vector<std::string> TakeTold();

/// Tells whether the shared object at `path` is in memory.
bool IsLoaded(const std::string& path);

/// How many file descriptors the process has open.
int OpenDescriptors();

/// The kind that the plug-ins of the tests are of.
class TestCatalog : public ZtPlugCatalog
{
public:
    explicit TestCatalog(const char* id = "Test:2.1") : ZtPlugCatalog(id) {}
    void InitializePlug(Plug* plug) override
    {
        initialized.emplace_back(plug->name);
    }
    const char* Extension() override { return "t"; }

    using ZtPlugCatalog::parse_id;
    using ZtPlugCatalog::plug_id_matches;

    std::vector<std::string> Names()
    {
        std::vector<std::string> names;
        for (const char* name = HeadKey(); name; name = NextKey())
            names.emplace_back(name);
        return names;
    }

    std::vector<std::string> initialized; ///< By `InitializePlug`, in order.
};

/// A directory of copies of the test plug-ins. Each is a file of its own to
/// the loader.
class PluginDir : public TempDir
{
public:
    PluginDir() = default;
    explicit PluginDir(const std::string& plugin) { Add(plugin); }

    /// Puts `plugin` in as `name`, by default as one of kind "t".
    std::string Add(const std::string& plugin, std::string name = {}) const
    {
        if (name.empty())
            name = plugin + ".t.so";
        std::filesystem::copy_file(
            std::string(ZT_TEST_PLUGINS "/") + plugin + ".so", Path(name));
        return Path(name);
    }

    std::string Dir() const
    {
        std::string path = Path("");
        path.pop_back();
        return path;
    }
};

/// A variable of the environment, for as long as this lives.
class SetVariable
{
public:
    SetVariable(const char* variable, const char* value) : name(variable)
    {
        if (const char* const present = std::getenv(name)) {
            before = present;
            was_set = true;
        }
        if (value)
            setenv(name, value, 1);
        else
            unsetenv(name);
    }
    ~SetVariable()
    {
        if (was_set)
            setenv(name, before.c_str(), 1);
        else
            unsetenv(name);
    }
    SetVariable(const SetVariable&) = delete;
    SetVariable& operator=(const SetVariable&) = delete;

private:
    const char* name;
    std::string before;
    bool was_set = false;
};

/// Another current directory, for as long as this lives.
class CurrentDirectory
{
public:
    explicit CurrentDirectory(const std::string& path)
        : before(std::filesystem::current_path())
    {
        std::filesystem::current_path(path);
    }
    ~CurrentDirectory() { std::filesystem::current_path(before); }
    CurrentDirectory(const CurrentDirectory&) = delete;
    CurrentDirectory& operator=(const CurrentDirectory&) = delete;

private:
    std::filesystem::path before;
};

using Names = std::vector<std::string>;

#endif
