#include "words/common_words.h"

#include "system/signals.h"
#include "words/word_director.h"

namespace ztsh {

namespace {

/// By the selectors of the base class.
constexpr Word words[] = {
    {"Timer", "[WORD...]",
     "Writes the words and the seconds since the Timer before to standard\n"
     "error."},
    {"Echo", "[WORD...]",
     "Writes the words to standard error, one blank between two."},
    {"Include", "[FILE]",
     "Runs the script FILE and goes on here; without FILE, or with -, runs\n"
     "standard input. A last line without a newline is not run."},
    {"cd", "[DIRECTORY]",
     "Changes the directory; says nothing if that cannot be done."},
    {"System", "[WORD...]",
     "Gives the words to the system's shell. Quotes are not restored, so\n"
     "what stands between quotes is interpreted too."},
};

} // namespace

CommonWords::CommonWords(Runner& script_runner)
    : ZtCommonDirectives(script_runner.dispatcher), runner(script_runner)
{}

void CommonWords::Act(KvoStatement* statement, int selector)
{
    bool refused = selector == ChangeDirectory || selector == Shell;
    if (runner.settings.safe && refused) {
        ZtError("%s: not allowed in a safe shell (--safe)\n",
                words[selector].name);
    } else if (selector == Included) {
        include(*statement);
    } else if (selector == Shell) {
        CommandWait wait;
        ZtCommonDirectives::Act(statement, selector);
    } else {
        ZtCommonDirectives::Act(statement, selector);
    }
}

void CommonWords::Info(std::ostream& out, char* name, int selector, int number)
{
    if (selector < 0 || selector >= static_cast<int>(std::size(words)))
        ZtCommonDirectives::Info(out, name, selector, number);
    else
        WriteInfo(out, words[selector], number);
}

void CommonWords::include(KvoStatement& statement)
{
    const char* name = statement.ArgText(1);
    if (runner.Include(name) == ztsh::Included::NotFound) {
        // The library says so in its own words.
        Include(name);
        TellPlace(runner.Where());
    }
}

} // namespace ztsh
