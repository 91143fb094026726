#ifndef ZTSH_WORDS_CLOCK_WORDS_H
#define ZTSH_WORDS_CLOCK_WORDS_H

/// \file
/// The word for the library's timers.

#include "script/runner.h"
#include "time/clock_table.h"
#include "words/word_director.h"

namespace ztsh {

/// Clock: makes, drives and shows clocks, and has them run statements.
class ClockWords : public WordDirector
{
public:
    /// Requires: `script_runner` and `clock_table` outlive the director.
    ClockWords(Runner& script_runner, ClockTable& clock_table);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    bool act(KvoStatement& statement, const Statements& block);
    bool make(const KvoStatement& statement);
    bool look(const char* name, Clock& clock, const KvoStatement& statement);
    bool ask(const char* name, Clock& clock, const KvoStatement& statement);
    bool react(Clock& clock, const KvoStatement& statement,
               const Statements& block);
    bool take_reaction(const KvoStatement& statement, int next,
                       const Statements& block, Statements& reaction);
    void list();
    void watch(const std::string& name);

    Runner& runner;
    ClockTable& clocks;
};

} // namespace ztsh

#endif
