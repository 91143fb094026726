#ifndef ZTSH_WORDS_TIME_WORDS_H
#define ZTSH_WORDS_TIME_WORDS_H

/// \file
/// The words that reckon with times.

#include "script/runner.h"
#include "words/word_director.h"

namespace ztsh {

/// Time: reckons with times and converts them. Rate: sets the rate that holds
/// where none is given.
class TimeWords : public WordDirector
{
public:
    /// Requires: `script_runner` outlives the director.
    explicit TimeWords(Runner& script_runner);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    struct Order;

    void time(const KvoStatement& statement);
    bool read_order(const KvoStatement& statement, Order& order);
    void rate(const char* fps);

    Runner& runner;
};

} // namespace ztsh

#endif
