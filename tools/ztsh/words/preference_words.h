#ifndef ZTSH_WORDS_PREFERENCE_WORDS_H
#define ZTSH_WORDS_PREFERENCE_WORDS_H

/// \file
/// The words for the installation's settings and the project's directories.

#include "script/runner.h"
#include "words/word_director.h"

namespace ztsh {

/// Directories, Preference, Preferences, Project and WorkEnv. What they set is
/// the whole shell's, so a frame of a sequence may only ask.
class PreferenceWords : public WordDirector
{
public:
    /// Requires: `script_runner` outlives the director.
    explicit PreferenceWords(Runner& script_runner);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    void preference(const KvoStatement& statement);
    void set(const char* name, const char* value);

    Runner& runner;
};

} // namespace ztsh

#endif
