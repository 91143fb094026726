#include "words/language_words.h"

#include <ZT/error.h>

#include <cstring>
#include <filesystem>
#include <iostream>
#include <sstream>
#include <strings.h>

namespace ztsh {

namespace {

enum Selector : int { Help, Set, Default, MkDir, Quit };

const std::vector<Word> words = {
    {"Help", "[WORD]", "Lists the command words, or says what WORD does.", 0,
     1},
    {"Set", "[NAME VALUE]",
     "Sets a variable, which $NAME and ${NAME} stand for from now on;\n"
     "without arguments lists the variables. Words between single quotes\n"
     "keep their $. $here is the directory of the script that runs.",
     0, 2},
    {"Default", "NAME VALUE", "Sets a variable unless it is set already.", 2,
     2},
    {"MkDir", "DIRECTORY",
     "Makes a directory and those above it, unless they are there.", 1, 1},
    {"Quit", "[CODE]",
     "Ends the shell, inside a sequence the frame. CODE, 0 to 255, becomes\n"
     "the exit code; without it that says how the script went.",
     0, 1},
};

/// The parts of a dispatcher's `Info`, each about one word.
std::vector<std::string> infos(ZtDispatcher& dispatcher, int number)
{
    std::ostringstream all;
    dispatcher.Info(all, number);
    std::istringstream in(all.str());
    std::vector<std::string> parts;
    for (std::string line; std::getline(in, line);) {
        bool begins = line.size() > 4 && line[4] != ' ';
        if (begins || parts.empty())
            parts.emplace_back();
        parts.back() += line + "\n";
    }
    return parts;
}

/// The word that a part of an `Info` is about.
std::string word_of(const std::string& info)
{
    std::istringstream in(info);
    std::string word;
    in >> word;
    return word;
}

} // namespace

LanguageWords::LanguageWords(Runner& script_runner)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner)
{
    AddEach(each_selector);
}

void LanguageWords::Do(KvoStatement& statement, int selector)
{
    const char* first = statement.ArgText(1);
    const char* second = statement.ArgText(2);
    switch (selector) {
    case Help:
        help(first);
        break;
    case Set:
        if (!first)
            list_variables();
        else if (!second)
            Expected(selector);
        else
            set(first, second);
        break;
    case Default:
        if (!runner.variables.Find(first))
            set(first, second);
        break;
    case MkDir:
        make_directory(first);
        break;
    case Quit:
        quit(first);
        break;
    default:
        break;
    }
}

void LanguageWords::SeeEach(KvoStatement& statement)
{
    for (int i = 0; KvoToken* word = statement.Find(i); ++i) {
        bool literal = word->Quote() == '\'' || word->Quote() == '\\';
        if (literal || !std::strchr(word->Text(), '$'))
            continue;
        std::vector<std::string> unknown;
        std::string text = runner.variables.Expand(word->Text(), unknown);
        for (const std::string& name : unknown)
            ZtWarning("No variable is named %s, so it stays as it is\n",
                      name.c_str());
        statement.Replace(i, text.c_str());
    }
}

void LanguageWords::help(const char* word)
{
    if (!word) {
        runner.dispatcher.Info(std::cout, InfoUsage);
        return;
    }
    for (const std::string& info : infos(runner.dispatcher, InfoHelp)) {
        if (strcasecmp(word_of(info).c_str(), word) == 0) {
            std::cout << info;
            return;
        }
    }
    ZtError("Help: no command word is %s\n", word);
}

void LanguageWords::set(const char* name, const char* value)
{
    if (Variables::IsName(name))
        runner.variables.Set(name, value);
    else
        ZtError("Set: a name is made of letters, digits and _ and does not "
                "begin with a digit, not %s\n",
                name);
}

void LanguageWords::list_variables()
{
    for (const std::string& name : runner.variables.Names())
        std::cout << "    " << name << " " << runner.variables.Find(name)
                  << "\n";
}

void LanguageWords::make_directory(const char* name)
{
    std::error_code fault;
    std::filesystem::create_directories(name, fault);
    if (!fault)
        return;
    ZtError("MkDir: cannot make %s: %s\n", name, fault.message().c_str());
    runner.outcome.Note(ExitCannotWrite);
}

void LanguageWords::quit(const char* code)
{
    long number = 0;
    constexpr long most = 255;
    if (!code)
        runner.outcome.Quit();
    else if (ReadNumber(code, 0, most, number))
        runner.outcome.Quit(static_cast<int>(number));
    else
        Expected(Quit);
}

std::vector<std::string> CommandWords(ZtDispatcher& dispatcher)
{
    std::vector<std::string> found;
    for (const std::string& info : infos(dispatcher, InfoUsage))
        found.push_back(word_of(info));
    return found;
}

} // namespace ztsh
