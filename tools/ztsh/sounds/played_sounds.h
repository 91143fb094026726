#ifndef ZTSH_SOUNDS_PLAYED_SOUNDS_H
#define ZTSH_SOUNDS_PLAYED_SOUNDS_H

/// \file
/// Copies of sounds for the beat to play, so that scripts may change and forget
/// theirs meanwhile.

#include <KVO/KvoSound.h>

#include <memory>
#include <vector>

namespace ztsh {

/// Keeps copies for as long as the beat may look at them.
///
/// Requires: it outlives the timers that they are played on.
class PlayedSounds
{
public:
    /// Gives a copy of `sound`.
    ///
    /// Owner: this; the copy lasts until it is not used any more.
    KvoSound* Copy(const KvoSound& sound);

private:
    std::vector<std::unique_ptr<KvoSound>> copies;
};

} // namespace ztsh

#endif
