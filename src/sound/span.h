#ifndef ZT_SOUND_SPAN_H
#define ZT_SOUND_SPAN_H

/// \file
/// Spans of frames that are copied out of a sound, or are all it keeps.

#include <KVO/KvoSound.h>

#include <cstdint>

namespace zt_sound {

/// Copies the frames from `first` to `last`, both included; those outside the
/// sound are zeros.
///
/// Owner:   the caller, who frees it with `delete[]`.
/// Returns: null for none, for too many, and without memory.
short* copy_span(const KvoSound& sound, std::int64_t first, std::int64_t last);

/// Leaves a sound these frames; none empty it.
///
/// Returns: false, with the sound unchanged, where `copy_span` fails.
bool keep_span(KvoSound& sound, std::int64_t first, std::int64_t last);

/// Leaves a sound the frames between two times, but none past its end.
bool trim(KvoSound& sound, KvoTime from, KvoTime to);

} // namespace zt_sound

#endif
