#ifndef ZT_SOUND_FILE_DEVICE_H
#define ZT_SOUND_FILE_DEVICE_H

/// \file
/// An audio device of two sound files: what is played is kept in one, what is
/// recorded comes from the other.

#include "platform/audio_port.h"

namespace zt_sound {

/// Tells whether ZT_AUDIO asks for this device: `file:OUT` or `file:OUT,IN`.
bool is_file_wish(const char* wish);

/// Gives the device, for ports that are made ready from now on, with the files
/// of `wish`.
///
/// Each port that is opened makes OUT anew, with the sound's own rate and
/// channels, and what it plays is kept there at the pace of a real device;
/// until the port is closed OUT may be a fraction of a second behind. A port
/// does not open when OUT cannot be made, or IN cannot be read. Behind the end
/// of IN there is silence; its rate is not looked at, and its channels are
/// converted.
///
/// Requires: `is_file_wish(wish)`.
/// Context:  not inside the beat.
zt_platform::AudioDevice* file_device(const char* wish);

} // namespace zt_sound

#endif
