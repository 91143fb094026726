#ifndef ZT_PAGES_COMMAND_H
#define ZT_PAGES_COMMAND_H

/// \file
/// What is to be said about a program: the contents of its help, taken apart.

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace zt_pages {

/// An option, or the words that follow the options.
struct Option
{
    std::vector<std::string> names; ///< With their hyphens; none of the words.
    std::string value;              ///< What it takes, as help shows it.
    std::string help;
    bool repeats = false;

    /// What can stand for the value: words, or the names of files.
    std::vector<std::string> choices = {};
    bool files = false;
};

/// A part of the manual that help does not have.
///
/// A line begins a paragraph, or an entry if four blanks stand before it; the
/// text of the entry has eight.
struct Section
{
    std::string title;
    std::string text;
};

/// A program.
struct Command
{
    std::string name;
    std::string version; ///< As the foot of the manual shows it.
    std::string purpose; ///< One sentence.
    std::string footer;  ///< What help says below the options.
    std::vector<Option> options;
    Option words; ///< Behind the options; without a value if there are none.
    std::vector<Section> sections;

    /// Finds the option that goes by `wanted`, null if none does.
    Option* Find(const std::string& wanted);
};

/// Takes the help of an application apart. Options without a group are hidden
/// there, and left out here.
Command CommandOf(const CLI::App& app);

/// Adds the hidden option `--page`, whose value, one of the kinds below, goes
/// to `kind`.
void AddPageOption(CLI::App& app, std::string& kind);

} // namespace zt_pages

#endif
