#include "plugins/plugin_check.h"

#include "system/child.h"
#include "system/files.h"

#include <KVO/KvoRecognizer.h>
#include <ZT/directive.h>
#include <ZT/plug.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <memory>
#include <sstream>

namespace ztsh {

namespace {

constexpr int longest_check_seconds = 30;

/// What the child puts before what it says itself, among what the loader and
/// the plug-in say.
constexpr char mark = '\x01';

/// Marks that say how far the child has come.
constexpr char unloading[] = "unloading";
constexpr char unloaded[] = "unloaded";

std::unique_ptr<ZtPlugCatalog> catalog_of(const PluginKind& kind,
                                          ZtDispatcher& dispatcher)
{
    if (std::strcmp(kind.id, ZtDirectiveCatalog::plug_name) == 0)
        return std::make_unique<ZtDirectiveCatalog>(dispatcher);
    return std::make_unique<KvoRecognizerCatalog>();
}

void say(const std::string& text)
{
    std::cerr << mark << text << "\n" << std::flush;
}

std::vector<std::string> names_in(ZtPlugCatalog& catalog)
{
    std::vector<std::string> names;
    for (const char* name = catalog.HeadKey(); name; name = catalog.NextKey())
        names.emplace_back(name);
    return names;
}

/// Has each factory that is new make a recognizer.
void try_recognizers(KvoRecognizerCatalog& catalog,
                     const std::vector<std::string>& before)
{
    for (const std::string& name : names_in(catalog)) {
        if (std::find(before.begin(), before.end(), name) != before.end())
            continue;
        const std::unique_ptr<KvoRecognizer> made(
            catalog.FetchRecognizer(name.c_str()));
        if (made)
            say("makes the recognizer " + name);
        else
            std::cerr << name << " makes no recognizer\n";
    }
}

/// Loads the file and tells what it has registered; runs in the child.
int load(const std::string& file, const PluginKind& kind,
         const std::string& beside, bool bind_now)
{
    ZtDispatcher dispatcher;
    {
        auto catalog = catalog_of(kind, dispatcher);
        if (!beside.empty())
            catalog->ScanDirectory(beside.c_str());
        const auto before = names_in(*catalog);
        setenv("ZT_PLUGIN_TRACE", "1", 1);
        setenv("ZT_PLUGIN_BIND_NOW", bind_now ? "1" : "0", 1);
        catalog->ScanFile(file.c_str());
        for (const std::string& name : names_in(*catalog))
            if (std::find(before.begin(), before.end(), name) == before.end())
                say("registers " + name);
        if (auto* recognizers =
                dynamic_cast<KvoRecognizerCatalog*>(catalog.get()))
            try_recognizers(*recognizers, before);
        say(unloading);
    }
    say(unloaded);
    return 0;
}

/// What a verdict of the catalog means to the author of the plug-in. The ones
/// that are missing here are told by the loader, in its own words.
struct Verdict
{
    const char* text;
    const char* meaning;
};

constexpr char shorter[] = "shorter than its segments";

constexpr Verdict verdicts[] = {
    {"no regular file", "is no regular file"},
    {shorter, "is truncated: it ends before its segments"},
    {"no id", "has no id: nothing in it is called KvoPluginIDString"},
    {"the id is no pointer", "has an id that is no pointer to a text"},
    {"the id is null", "has a null pointer for its id"},
    {"no entry", "has no entry: nothing in it is called KvoInitializePlugin"},
    {"the entry is no function", "has an entry that is no function"},
    {"registered nothing", "registers nothing"},
    {"its names are taken", "registers nothing: its names are taken"},
    {"threw, registered nothing", "throws an exception out of its entry"},
    {"threw, loaded", "throws an exception out of its entry"},
};

std::string meaning_of(const std::string& verdict)
{
    for (const Verdict& known : verdicts)
        if (verdict == known.text)
            return known.meaning;
    return "is refused: " + verdict;
}

/// What the loader says about files that are none of its own.
bool tells_of_another_format(const std::string& text)
{
    return text == "invalid ELF header" || text == "file too short" ||
           text.rfind("wrong ELF class", 0) == 0 ||
           text.rfind("cannot read file data", 0) == 0;
}

/// Understands what the child and the library wrote.
class Reading
{
public:
    Reading(std::string checked_file, const PluginKind& checked_kind)
        : file(std::move(checked_file)), kind(checked_kind),
          path(file.find('/') == std::string::npos ? "./" + file : file)
    {}

    void read(const ChildEnd& end, PluginReport& report)
    {
        undefined = false;
        bool is_unloading = false;
        bool is_unloaded = false;
        std::istringstream lines(end.errors);
        for (std::string line; std::getline(lines, line);) {
            if (!line.empty() && line[0] == mark) {
                line.erase(0, 1);
                is_unloading = is_unloading || line == unloading;
                is_unloaded = is_unloaded || line == unloaded;
                if (line != unloading && line != unloaded)
                    report.good.push_back(line);
            } else if (line.rfind(path + ": id ", 0) == 0) {
                read_verdict(line, report);
            } else {
                read_other(line, report);
            }
        }
        const char* stage = is_unloaded    ? "after it was unloaded"
                            : is_unloading ? "while it was unloaded"
                                           : "while it was loaded";
        if (end.timed_out)
            report.bad.push_back(std::string("does not come to an end ") +
                                 stage);
        else if (end.signal != 0)
            report.bad.push_back("ends the program " + std::string(stage) +
                                 ", by signal " + std::to_string(end.signal));
        else if (end.code != 0 || !is_unloaded)
            report.bad.push_back("ends the program " + std::string(stage) +
                                 ", with code " + std::to_string(end.code));
    }

    bool undefined = false; ///< A symbol is, which lazy binding may live with.

private:
    void read_verdict(const std::string& line, PluginReport& report)
    {
        const std::string wanted = std::string(", wanted ") + kind.id + ": ";
        const std::size_t at = line.find(wanted);
        if (at == std::string::npos)
            return;
        const std::size_t start = path.size() + 5;
        const std::string id = line.substr(start, at - start);
        const std::string verdict = line.substr(at + wanted.size());
        if (verdict == "another id")
            report.bad.push_back("has the id " + id + ", not " + kind.id);
        else if (verdict == "loaded")
            report.good.push_back("has the id " + id);
        else if (verdict == shorter)
            report.bad.back() = meaning_of(verdict); // for the loader's words
        else if (verdict != "not loaded" || report.bad.empty())
            report.bad.push_back(meaning_of(verdict));
    }

    void read_other(const std::string& line, PluginReport& report)
    {
        const bool own = line.rfind(path + ": ", 0) == 0;
        const std::string text = own ? line.substr(path.size() + 2) : line;
        if (text.rfind("undefined symbol", 0) == 0)
            undefined = true;
        const std::string fault = !own        ? "says: " + text
                                  : undefined ? "has an " + text
                                  : tells_of_another_format(text)
                                      ? "is no shared object: " + text
                                      : "cannot be loaded: " + text;
        if (std::find(report.bad.begin(), report.bad.end(), fault) ==
            report.bad.end())
            report.bad.push_back(fault);
    }

    std::string file;
    const PluginKind& kind;
    std::string path; ///< As the library calls it.
};

} // namespace

PluginReport CheckPlugin(const std::string& file, const PluginKind* kind,
                         const std::string& beside)
{
    PluginReport report;
    const std::string why = WhyNotReadable(file);
    if (!why.empty()) {
        report.bad.push_back(why);
        report.readable = false;
        return report;
    }
    const PluginKind* by_name = KindOfFile(file);
    if (!by_name || (kind && kind != by_name))
        report.bad.push_back(
            std::string("is not found by scans: its name does not end in ") +
            (kind ? kind->suffix : ".d.so or .r.so"));
    if (!kind)
        kind = by_name ? by_name : &plugin_kinds[0];
    Reading reading(file, *kind);
    for (const bool bind_now : {true, false}) {
        const ChildEnd end =
            RunInChild([&] { return load(file, *kind, beside, bind_now); },
                       longest_check_seconds);
        if (!end.started) {
            report.bad.emplace_back("cannot be checked: no process for it");
            break;
        }
        reading.read(end, report);
        // Without the missing function, is it well otherwise?
        if (!reading.undefined)
            break;
    }
    return report;
}

} // namespace ztsh
