#ifndef ZT_PLATFORM_VIDEO_LANES_H
#define ZT_PLATFORM_VIDEO_LANES_H

/// \file
/// Pixels mixed into luma and chroma and made of them, many at a time where the
/// processor can.
///
/// The class itself does one pair of pixels after the other, on any processor,
/// and is what everything else is held to: a derived class does the same in
/// wider steps and gives the same bits. Which one is in use is decided once,
/// by what the processor can do.

#include <cstddef>
#include <cstdint>

namespace zt_platform {

/// How much the channels of a pixel weigh, in units of 1/65536.
///
/// Units: red and blue -32768 to 32767, green -65536 to 65534.
struct ChannelWeights
{
    int red;
    int green;
    int blue;
};

/// How a pair of pixels becomes two lumas and two chromas.
///
/// Each luma is the weighed sum of its pixel. Each chroma is the sum of the
/// second pixel of the pair before, by its weights for a second pixel, of the
/// first and of the second pixel. Each of the three sums carries the fraction
/// of the sum of its kind before it, and gives its whole part and its offset,
/// modulo 256.
///
/// Requires: no sum of the largest channels leaves the range of 32 bits.
struct VideoMix
{
    struct Chroma
    {
        ChannelWeights first;
        ChannelWeights second;
        int offset;
    };

    ChannelWeights luma;
    int luma_offset;
    Chroma chroma[2];
};

/// What one line of pairs leaves to the next.
struct VideoCarry
{
    std::uint32_t luma = 0;           ///< A fraction, 0 to 65535.
    std::uint32_t chroma[2] = {0, 0}; ///< Fractions, 0 to 65535.
    int second[2] = {0, 0}; ///< What the last second pixel adds to a chroma.
};

/// How two lumas and two chromas become a pair of pixels.
///
/// Each channel of a pixel is a weighed sum of its luma and of the chromas of
/// the pair, both less their offsets, a luma below its offset counting as the
/// offset. Of the sum the whole part is taken, at most 255 and at least 0.
///
/// Units:    weights in 1/65536.
/// Requires: offsets of 0 to 255; no sum that bytes can give leaves the range
///           of 32 bits.
struct VideoColors
{
    struct Chromas
    {
        int first;
        int second;
    };

    int luma; ///< The weight of a luma in every channel.
    int luma_offset;
    Chromas red;
    Chromas green;
    Chromas blue;
    int chroma_offset;
    bool red_lowest; ///< Whether pixels are 0x00BBGGRR, else 0xRRGGBB00.
};

class VideoLanes
{
public:
    /// Gives a name for tests and measurements.
    virtual const char* name() const;

    /// Mixes pairs of pixels, 0xRRGGBBAA whose alpha is ignored, into groups
    /// of four bytes: first chroma, luma, second chroma, luma.
    ///
    /// Requires: 2 * `pairs` pixels and room for 4 * `pairs` bytes.
    virtual void mix(const std::uint32_t* pixels, unsigned char* groups,
                     std::size_t pairs, const VideoMix& video,
                     VideoCarry& carry) const;

    /// Makes pairs of pixels of groups of four bytes: first chroma, luma,
    /// second chroma, luma.
    ///
    /// Requires: 4 * `pairs` bytes and room for 2 * `pairs` pixels.
    virtual void color(const unsigned char* groups, std::uint32_t* pixels,
                       std::size_t pairs, const VideoColors& colors) const;

    /// Gives what is in use: the fastest that this processor can do, or what a
    /// test installed.
    static const VideoLanes& current();

    /// Installs others; null restores the fastest.
    ///
    /// Owner: the caller, who installs others before destroying them.
    static void install(const VideoLanes* other);

    /// Gives those that do one pair after the other.
    static const VideoLanes& plain();

    /// Gives the fastest that this processor can do.
    static const VideoLanes& fastest();

protected:
    ~VideoLanes() = default;
};

} // namespace zt_platform

#endif
