#ifndef ZT_SOUND_AIFC_WRITER_H
#define ZT_SOUND_AIFC_WRITER_H

/// \file
/// The writer of sound files: AIFF-C without compression.

#include <KVO/KvoSound.h>

namespace zt_sound {

/// What became of a file.
enum class Written : int {
    Whole = 0,
    NotOpened = 1, ///< There is none.
    NotKept = 2    ///< It was begun and taken back.
};

/// Writes a sound with a buffer, of two channels unless it has one.
Written write_aifc(const KvoSound& sound, const char* name);

} // namespace zt_sound

#endif
