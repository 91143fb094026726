#ifndef ZTSH_WORDS_BEAT_WORDS_H
#define ZTSH_WORDS_BEAT_WORDS_H

/// \file
/// The word for the beat that drives the clocks.

#include "script/runner.h"
#include "words/word_director.h"

namespace ztsh {

/// Beat: starts and stops the beat of the process and shows what it measures.
class BeatWords : public WordDirector
{
public:
    /// Requires: `script_runner` outlives the director.
    explicit BeatWords(Runner& script_runner);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    Runner& runner;
};

} // namespace ztsh

#endif
