#ifndef ZT_PLATFORM_AUDIO_FILE_H
#define ZT_PLATFORM_AUDIO_FILE_H

/// \file
/// The door to the library that reads sound files.
///
/// A port delivers every file as 16-bit samples: narrower ones moved up, wider
/// ones without their low bits, floating-point ones times 32768, clamped and
/// truncated. It never waits for the other end of a pipe and survives any
/// content.

#include <cstdint>

namespace zt_platform {

/// What a sound file says about itself.
struct AudioFormat
{
    std::uint64_t frames; ///< As claimed; more than can be true is possible.
    int channels;
    long rate; ///< Frames a second, cut to an integer.
    int width; ///< 1 for 8 bits, 2 for 16 and companded ones, 4 for more.
    std::uint64_t bytes; ///< Length of the file.
};

/// The reader of sound files.
class AudioFiles
{
public:
    /// Opens the file at `path`.
    ///
    /// Owner:   the caller, who closes what is given.
    /// Returns: null for what cannot be opened or is no sound file.
    virtual void* open(const char* path, AudioFormat& about) = 0;

    /// Reads the next `frames` frames of a file of one or two channels.
    ///
    /// Returns: how many came, fewer only at the end or at a fault.
    virtual std::uint64_t read(void* file, short* to, std::uint64_t frames) = 0;

    virtual void close(void* file) = 0;

    /// Gives the reader in use: the system's, or one that a test installed.
    static AudioFiles& current();

    /// Installs another reader; null restores the system's.
    ///
    /// Owner:   the caller, who installs another before destroying it.
    /// Returns: what was installed before, null for the system's.
    static AudioFiles* install(AudioFiles* other);

protected:
    ~AudioFiles() = default;
};

} // namespace zt_platform

#endif
