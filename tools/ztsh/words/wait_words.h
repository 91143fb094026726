#ifndef ZTSH_WORDS_WAIT_WORDS_H
#define ZTSH_WORDS_WAIT_WORDS_H

/// \file
/// The word for waiting.

#include "script/runner.h"
#include "time/clock_table.h"
#include "words/word_director.h"

namespace ztsh {

/// Wait: waits for a time, or for a clock to stop; what becomes due is run
/// meanwhile.
class WaitWords : public WordDirector
{
public:
    /// Requires: `script_runner` and `clock_table` outlive the director.
    WaitWords(Runner& script_runner, ClockTable& clock_table);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    void wait_for(KvoTime time);
    void wait_until_rest(const std::string& name);

    Runner& runner;
    ClockTable& clocks;
};

} // namespace ztsh

#endif
