#ifndef ZTSH_SOUNDS_SOUND_PLOT_H
#define ZTSH_SOUNDS_SOUND_PLOT_H

/// \file
/// Sounds drawn into pictures: how they run, and what they are made of.

#include <KVO/KvoSound.h>
#include <ZT/image_sgi.h>

namespace ztsh {

/// Draws how a sound runs, from left to right over the whole picture, the left
/// channel above the right one: in each column from the lowest to the highest
/// of its samples.
///
/// Requires: a sound with frames, a black picture with pixels.
void DrawWaveform(const KvoSound& sound, ZtImageSGI& picture);

/// Draws how loud each frequency of a sound is, from 0 at the left to half the
/// rate at the right, from -96 decibels at the bottom to a full sine at the
/// top; the mean of some windows of 2048 frames, of both channels together.
///
/// Requires: a sound with frames, a black picture with pixels.
void DrawSpectrum(const KvoSound& sound, ZtImageSGI& picture);

} // namespace ztsh

#endif
