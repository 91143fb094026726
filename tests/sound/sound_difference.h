#ifndef ZT_TESTS_SOUND_SOUND_DIFFERENCE_H
#define ZT_TESTS_SOUND_SOUND_DIFFERENCE_H

#include <string>

/// Loads these bytes as a sound file, saves and loads what came, and works on
/// copies of it.
///
/// Returns: the empty text, or what was wrong: a sound that contradicts itself,
///          one that does not come back as it was saved, or an operation that
///          leaves more samples than it has frames.
std::string SoundDifferenceOn(const std::string& file);

#endif
