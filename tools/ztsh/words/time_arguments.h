#ifndef ZTSH_WORDS_TIME_ARGUMENTS_H
#define ZTSH_WORDS_TIME_ARGUMENTS_H

/// \file
/// What the words that deal with time have in common.

#include "script/runner.h"

#include <KVO/KvoTime.h>

namespace ztsh {

/// Takes the word `text` from position `next`, which then stands behind it.
///
/// Returns: false if another one is there, or none.
bool TakeWord(const KvoStatement& statement, const char* text, int& next);

/// Takes a time at the default rate from position `next` on, which then stands
/// behind it.
///
/// Reports: an error, as from the command `word`, if there is none; `next` is
///          then anywhere.
bool TakeTime(const char* word, const KvoStatement& statement, int& next,
              KvoTime& time);

/// Takes the last word of a statement, the name of a variable, and sets it.
///
/// Returns: false if there is none, if it is no name, or if more stands behind
///          it.
bool TakeInto(Runner& runner, const KvoStatement& statement, int& next,
              KvoTime time);

/// Tells whether a sequence runs, in which `word` has no place.
///
/// Reports: an error if it does.
bool InSequence(const Runner& runner, const char* word);

/// Reports that what stands behind the command `word` and a name makes no
/// sense.
void TellNotUnderstood(const char* word);

} // namespace ztsh

#endif
