#ifndef ZT_BENCH_SOUND_PEERS_H
#define ZT_BENCH_SOUND_PEERS_H

/// \file
/// Other libraries that convert the rate of a sound, at their fastest quality
/// that interpolates: those that were there when this was built.

#include <vector>

/// One of them.
struct ResamplePeer
{
    const char* name;

    /// Converts 16-bit samples from 44100 to 48000 frames a second.
    ///
    /// Requires: room for twice as many samples.
    /// Returns:  false if it failed.
    bool (*run)(const short* in, long frames, int channels, short* out);
};

std::vector<ResamplePeer> ResamplePeers();

#endif
