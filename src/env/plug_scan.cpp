#include <cstdlib>
#include <cstring>
#include <exception>
#include <initializer_list>
#include <iostream>
#include <memory>
#include <new>

#include "ZT/error.h"
#include "ZT/util.h"

#include "core/joined_text.h"
#include "core/write_text.h"
#include "env/plug_candidate.h"
#include "platform/dynlib.h"

namespace {

using zt_core::joined_text;
using zt_platform::Dynlib;

constexpr char id_symbol[] = "KvoPluginIDString";
constexpr char entry_symbol[] = "KvoInitializePlugin";

// What the names in a listing end in. A listing is complete before the first
// of its files is loaded, so a plug-in that scans may replace it.
constinit char* suffix = nullptr;
constinit std::size_t suffix_length = 0;

bool set_suffix(const char* extension)
{
    auto text = joined_text({".", extension ? extension : "", ".so"});
    if (!text)
        return false;
    delete[] suffix;
    suffix = text.release();
    suffix_length = std::strlen(suffix);
    return true;
}

bool has_suffix(const char* name)
{
    const std::size_t length = std::strlen(name);
    return length > suffix_length &&
           std::strcmp(name + length - suffix_length, suffix) == 0;
}

bool is_asked_for(const char* variable)
{
    const char* const value = std::getenv(variable);
    return value && std::strcmp(value, "1") == 0;
}

// One line on standard error, in one piece, so that lines of several processes
// stay whole.
void say(std::initializer_list<std::string_view> pieces)
{
    const auto line = joined_text(pieces);
    if (line)
        zt_core::write_text(std::cerr, line.get());
}

zt_platform::Binding binding()
{
    return is_asked_for("ZT_PLUGIN_BIND_NOW") ? zt_platform::Binding::Now
                                              : zt_platform::Binding::Lazy;
}

// The id that the shared object shows, or null with the reason.
const char* id_of(void* handle, const char*& reason)
{
    Dynlib& loader = Dynlib::current();
    const void* const symbol = loader.symbol(handle, id_symbol);
    std::size_t bytes = 0;
    const char* id = nullptr;
    if (!symbol)
        reason = "no id";
    else if (!loader.is_variable(symbol, bytes) || bytes != sizeof id)
        reason = "the id is no pointer";
    else {
        std::memcpy(&id, symbol, sizeof id);
        reason = "the id is null";
    }
    return id;
}

using Entry = void (*)(ZtPlugCatalog*);

// The function that the shared object is entered by, or null with the reason.
Entry entry_of(void* handle, const char*& reason)
{
    Dynlib& loader = Dynlib::current();
    void* const symbol = loader.symbol(handle, entry_symbol);
    std::size_t bytes = 0;
    if (!symbol)
        reason = "no entry";
    else if (loader.is_variable(symbol, bytes))
        reason = "the entry is no function";
    else
        return reinterpret_cast<Entry>(symbol);
    return nullptr;
}

// Calls the entry. What it throws is gone when this returns, while its code is
// still there.
bool enter(Entry entry, ZtPlugCatalog& catalog, const char* file)
{
    try {
        entry(&catalog);
        return true;
    } catch (const std::exception& fault) {
        ZtWarning("Plug-in %s threw an exception: %s\n", file, fault.what());
    } catch (...) {
        ZtWarning("Plug-in %s threw an exception\n", file);
    }
    return false;
}

} // namespace

void ZtPlugCatalog::ScanDirectory(const char* path)
{
    // A copy: a plug-in may change or free what the caller gave.
    const auto list = joined_text({path ? path : ""});
    char* dir = list.get();
    while (dir) {
        char* const colon = std::strchr(dir, ':');
        if (colon)
            *colon = '\0';
        ScanOneDir(dir);
        dir = colon ? colon + 1 : nullptr;
    }
}

void ZtPlugCatalog::ScanOneDir(const char* dir)
{
    // The plug-ins that this loads may scan too, and replace what is stored.
    const auto scanned = joined_text({dir && *dir ? dir : "."});
    if (!scanned || !set_directory(scanned.get()) || !set_suffix(Extension()))
        return;
    zt_platform::NameList names;
    if (!Dynlib::current().list_directory(scanned.get(), has_suffix, names))
        return;
    for (const char* name = names.first(); name; name = names.next(name)) {
        const auto file = joined_text({scanned.get(), "/", name});
        if (file)
            load(file.get());
    }
}

int ZtPlugCatalog::ScanFile(const char* file)
{
    const std::string_view given = file ? file : "";
    const std::size_t slash = given.rfind('/');
    const bool bare = slash == std::string_view::npos;
    const auto head =
        joined_text({bare ? "." : given.substr(0, slash == 0 ? 1 : slash)});
    const auto path = joined_text({bare ? "./" : "", given});
    if (!head || !path || !set_directory(head.get()))
        return 0;
    return load(path.get()) ? 1 : 0;
}

bool ZtPlugCatalog::set_directory(const char* dir)
{
    auto copy = joined_text({dir});
    if (!copy)
        return false;
    delete[] directory;
    directory = copy.release();
    return true;
}

// Loads the file and keeps it if it registers something.
bool ZtPlugCatalog::load(const char* file)
{
    Candidate candidate;
    candidate.file = file;
    open(candidate);
    const bool kept = candidate.handle && adopt(candidate);
    if (is_asked_for("ZT_PLUGIN_TRACE"))
        say({file, ": id ", candidate.plug_id ? candidate.plug_id : "none",
             ", wanted ", own_id ? own_id : "", ": ", candidate.verdict, "\n"});
    if (candidate.handle && !kept)
        Dynlib::current().close(candidate.handle);
    return kept;
}

void ZtPlugCatalog::open(Candidate& candidate)
{
    Dynlib& loader = Dynlib::current();
    const char* const file = candidate.file;
    if (loader.is_special_file(file)) {
        candidate.verdict = "no regular file";
        return;
    }
    if (zt_platform::object_extent(file) == zt_platform::ObjectExtent::Cut) {
        candidate.verdict = "shorter than its segments";
        say({file, ": file too short\n"});
        return;
    }
    candidate.handle = loader.open(file, binding());
    if (!candidate.handle) {
        candidate.verdict = "not loaded";
        say({loader.error_text(), "\n"});
    }
}

bool ZtPlugCatalog::adopt(Candidate& candidate)
{
    for (const Candidate* outer = running; outer; outer = outer->outer)
        if (outer->handle == candidate.handle) {
            candidate.verdict = "its entry is running";
            return false;
        }
    candidate.plug_id = id_of(candidate.handle, candidate.verdict);
    if (!candidate.plug_id)
        return false;
    if (!plug_id_matches(candidate.plug_id)) {
        candidate.verdict = "another id";
        return false;
    }
    const Entry entry = entry_of(candidate.handle, candidate.verdict);
    if (!entry)
        return false;
    const int before = plugs.count;
    candidate.outer = running;
    running = &candidate;
    const bool returned = enter(entry, *this, candidate.file);
    running = candidate.outer;
    if (plugs.count == before) {
        candidate.verdict = !returned         ? "threw, registered nothing"
                            : candidate.taken ? "its names are taken"
                                              : "registered nothing";
        return false;
    }
    candidate.verdict = returned ? "loaded" : "threw, loaded";
    keep(candidate.handle);
    return true;
}

// Without memory for its node the shared object stays open for ever: its plugs
// are in use.
void ZtPlugCatalog::keep(void* handle)
{
    DSONode* const node = new (std::nothrow) DSONode(handle);
    if (!node)
        return;
    const int before = shared_objects.count;
    shared_objects.Push(node);
    if (shared_objects.count == before) {
        node->handle = nullptr;
        delete node;
    }
}
