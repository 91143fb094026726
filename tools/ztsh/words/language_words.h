#ifndef ZTSH_WORDS_LANGUAGE_WORDS_H
#define ZTSH_WORDS_LANGUAGE_WORDS_H

/// \file
/// What the shell adds to the language itself: help, variables, directories to
/// write to, and the end.

#include "script/runner.h"
#include "words/word_director.h"

namespace ztsh {

/// Help, Set, Default, MkDir and Quit; and, before every statement, the
/// replacement of `$name` and `${name}` by the variables' values.
class LanguageWords : public WordDirector
{
public:
    /// Requires: `script_runner` outlives the director.
    explicit LanguageWords(Runner& script_runner);

protected:
    void Do(KvoStatement& statement, int selector) override;

    /// Replaces variables in each word that is not quoted with single quotes
    /// and not escaped.
    ///
    /// Reports: a warning for each name that is not set.
    void SeeEach(KvoStatement& statement) override;

private:
    void help(const char* word);
    void set(const char* name, const char* value);
    void list_variables();
    void make_directory(const char* name);
    void quit(const char* code);

    Runner& runner;
};

/// Gives the command words of a dispatcher in its order.
std::vector<std::string> CommandWords(ZtDispatcher& dispatcher);

} // namespace ztsh

#endif
