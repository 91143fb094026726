#ifndef ZT_SOUND_SOUND_DEVICE_H
#define ZT_SOUND_SOUND_DEVICE_H

/// \file
/// Which audio device is in use, and what playback and recording share on it.

#include <cstdint>

#include "ZT/timer.h"
#include "diag/signal_report.h"
#include "platform/audio_port.h"

class KvoSound;

namespace zt_sound {

/// Chooses the device again if ZT_AUDIO has changed, and lets go of what
/// belongs to timers that are gone. Every operation of the client begins with
/// it.
///
/// Context: does nothing inside the beat.
void begin_call();

/// Says that no port could be opened for playing.
extern zt_diag::SignalReport no_port_for_writing;

/// Describes a port through which `sound` is played.
zt_platform::AudioPortConfig port_for(const KvoSound& sound);

/// Makes a port ready.
///
/// Returns: null if that is not possible; always null inside the beat.
zt_platform::AudioPort* ready(const zt_platform::AudioPortConfig& config);

/// A timer, for finding out later whether it is still there.
struct WatchedTimer
{
    WatchedTimer() = default;
    explicit WatchedTimer(const ZtTimer* timer) : address(timer), id(timer->id)
    {}

    /// Tells whether the beat drives it, or is asked to.
    bool lives() const;

    const ZtTimer* address = nullptr;
    int id = 0;
};

/// Tell whether a playback or a drag looks at a sound.
bool play_uses(const KvoSound* sound);
bool drag_uses(const KvoSound* sound);

/// What `begin_call` lets go of.
void let_go_of_plays();
void let_go_of_drags();
void let_go_of_recordings();

} // namespace zt_sound

#endif
