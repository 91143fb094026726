#ifndef ZTSH_SOUNDS_SOUND_STEPS_H
#define ZTSH_SOUNDS_SOUND_STEPS_H

/// \file
/// What scripts do with sounds, one step after the other: the words are read
/// and checked first, so that a statement that is wrong does nothing.

#include <KVO/KvoSound.h>
#include <KVO/KvoStatement.h>

#include <string>

namespace ztsh {

/// What a step does.
enum class SoundAction {
    // These make a sound.
    Load,
    Noise,
    Silence,
    Leader,
    Copy,
    // These change one.
    Mono,
    Left,
    Right,
    Stereo,
    Pair,
    Join,
    Match,
    Resample,
    Speed,
    Double,
    Trim,
    Snip,
    Insert,
    Reverse,
    PreEmphasis,
    LoPass,
    HiPass,
    BandPass,
    Window,
    // These look at one.
    Extract,
    Save,
    Stats,
    Volume,
    Peaks
};

/// One step with its arguments; which ones count depends on the action.
struct SoundStep
{
    SoundAction action = SoundAction::Mono;
    std::string text; ///< A file, or the name of a sound.
    KvoTime first;
    KvoTime second;
    long number = 0;
    long other_number = 0;
    float factor = 0;
    KvoSound::WindowType window = KvoSound::Rectangular;
    bool is_part = false; ///< Whether the window is around a time.
};

/// Which steps can stand somewhere.
enum class SoundStepKind { Makes, Uses };

/// Reads a step of a kind from position `next` of a statement of the command
/// `word`; `next` then stands behind it.
///
/// Returns: false if there is none.
/// Reports: an error if there is none that says why.
bool TakeSoundStep(const char* word, const KvoStatement& statement, int& next,
                   SoundStepKind kind, SoundStep& step);

/// Tells whether a step needs a second sound, named by its text.
bool NeedsOther(SoundAction action);

/// Changes a sound; `other` is the second one where one is needed.
///
/// Requires: an action that changes one.
void ChangeSound(KvoSound& sound, const SoundStep& step, KvoSound* other);

} // namespace ztsh

#endif
