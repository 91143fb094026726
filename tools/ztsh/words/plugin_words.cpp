#include "words/plugin_words.h"

#include "system/files.h"
#include "words/language_words.h"

#include <ZT/error.h>

#include <algorithm>
#include <fstream>
#include <iostream>
#include <strings.h>

namespace ztsh {

namespace {

enum Selector : int { Load, List, Help };

const std::vector<Word> words = {
    {"LoadPlugins", "[DIRECTORIES]",
     "Loads the plug-ins of the directories, parted by \":\"; without them, "
     "of\n"
     "the directory that plug-ins are installed to. Words that they bring can\n"
     "be used from then on; the first plug-in with a name keeps it.",
     0, 1},
    {"Plugins", "",
     "Lists what plug-ins have brought: name, kind and directory."},
    {"PluginHelp", "NAME [EXTENSION] [into VARIABLE]",
     "Shows the help file about what a plug-in has brought, NAME.d.EXTENSION\n"
     "or NAME.r.EXTENSION; EXTENSION is txt if it is not given. With into it\n"
     "sets a variable to the file's path instead.",
     1, 4},
};

constexpr char default_extension[] = "txt";

} // namespace

PluginWords::PluginWords(Runner& script_runner, PluginTable& plugin_table)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      plugins(plugin_table)
{}

void PluginWords::Do(KvoStatement& statement, int selector)
{
    if (selector == Load)
        load(statement.ArgText(1));
    else if (selector == List)
        list();
    else
        help(statement);
}

/// The code of a plug-in may do anything, so a safe shell loads none.
void PluginWords::load(const char* directories)
{
    if (runner.settings.safe) {
        ZtError("LoadPlugins: not allowed in a safe shell (--safe)\n");
        return;
    }
    const std::vector<std::string> before = CommandWords(runner.dispatcher);
    const auto is_word = [&before](const std::string& name) {
        return std::any_of(
            before.begin(), before.end(), [&name](const std::string& word) {
                return strcasecmp(word.c_str(), name.c_str()) == 0;
            });
    };
    for (const PluginTable::Entry& entry :
         plugins.Load(directories ? directories : InstalledPlugins()))
        if (entry.kind == "directive" && is_word(entry.name))
            ZtWarning("LoadPlugins: %s in %s: there is a word of that name "
                      "already, which goes on acting\n",
                      entry.name.c_str(), entry.directory.c_str());
}

void PluginWords::list()
{
    for (const PluginTable::Entry& entry : plugins.Entries())
        std::cout << entry.name << " " << entry.kind << " " << entry.directory
                  << "\n";
}

void PluginWords::help(const KvoStatement& statement)
{
    int next = 2;
    const auto text = [&](int at) { return statement.ArgText(at); };
    const char* extension = default_extension;
    if (text(next) && std::string(text(next)) != "into")
        extension = text(next++);
    const char* variable = nullptr;
    if (text(next) && std::string(text(next)) == "into") {
        variable = text(next + 1);
        next += 2;
        if (!variable || !Variables::IsName(variable))
            next = -1;
    }
    if (next != statement.Count()) {
        Expected(Help);
        return;
    }
    const char* name = text(1);
    if (!plugins.Has(name)) {
        ZtError("PluginHelp: no plug-in has brought %s\n", name);
        return;
    }
    const std::string file = plugins.HelpFile(name, extension);
    const std::string why = file.empty() ? "" : WhyNotReadable(file);
    if (file.empty()) {
        ZtError("PluginHelp: there is no help about %s\n", name);
    } else if (variable) {
        runner.variables.Set(variable, file);
    } else if (!why.empty()) {
        ZtError("PluginHelp: %s: %s\n", file.c_str(), why.c_str());
    } else {
        std::ifstream in(file, std::ios::binary);
        if (in.peek() != std::ifstream::traits_type::eof())
            std::cout << in.rdbuf();
    }
}

} // namespace ztsh
