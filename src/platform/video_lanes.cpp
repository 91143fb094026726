#include "platform/video_lanes.h"

#include "platform/x86/video_lanes_avx2.h"
#include "platform/x86/video_lanes_avx512.h"

#include <algorithm>

namespace zt_platform {

namespace {

struct PlainLanes final : VideoLanes
{};

constinit const PlainLanes plain_lanes;
constinit const VideoLanes* in_use = nullptr; ///< Null before the first use.

/// The channels of a pixel as numbers.
struct Channels
{
    explicit Channels(std::uint32_t pixel)
        : red(static_cast<int>(pixel >> 24)),
          green(static_cast<int>(pixel >> 16 & 0xFF)),
          blue(static_cast<int>(pixel >> 8 & 0xFF))
    {}

    int weighed(const ChannelWeights& weights) const
    {
        return weights.red * red + weights.green * green + weights.blue * blue;
    }

    int red;
    int green;
    int blue;
};

/// Adds the fraction that was carried and carries the new one.
///
/// Returns: the whole part of the sum and the offset, modulo 256.
unsigned char whole_part(int sum, std::uint32_t& fraction, int offset)
{
    sum += static_cast<int>(fraction);
    fraction = static_cast<std::uint32_t>(sum) & 0xFFFF;
    return static_cast<unsigned char>((sum >> 16) + offset);
}

/// What the chromas of a pair add to each channel.
struct ChromaSums
{
    ChromaSums(const unsigned char* group, const VideoColors& colors)
    {
        const int first = group[0] - colors.chroma_offset;
        const int second = group[2] - colors.chroma_offset;
        auto sum = [=](const VideoColors::Chromas& weights) {
            return weights.first * first + weights.second * second;
        };
        red = sum(colors.red);
        green = sum(colors.green);
        blue = sum(colors.blue);
    }

    int red;
    int green;
    int blue;
};

std::uint32_t clamped_whole(int sum)
{
    return static_cast<std::uint32_t>(std::clamp(sum >> 16, 0, 0xFF));
}

std::uint32_t colored(int luma, const ChromaSums& chromas,
                      const VideoColors& colors)
{
    const int grey = std::max(luma - colors.luma_offset, 0) * colors.luma;
    const std::uint32_t red = clamped_whole(grey + chromas.red);
    const std::uint32_t green = clamped_whole(grey + chromas.green);
    const std::uint32_t blue = clamped_whole(grey + chromas.blue);
    return colors.red_lowest ? red | green << 8 | blue << 16
                             : red << 24 | green << 16 | blue << 8;
}

} // namespace

const char* VideoLanes::name() const
{
    return "plain";
}

void VideoLanes::mix(const std::uint32_t* pixels, unsigned char* groups,
                     std::size_t pairs, const VideoMix& video,
                     VideoCarry& carry) const
{
    VideoCarry now = carry;
    for (std::size_t pair = 0; pair < pairs; ++pair) {
        const Channels first(pixels[2 * pair]);
        const Channels second(pixels[2 * pair + 1]);
        unsigned char* group = groups + 4 * pair;
        for (std::size_t i = 0; i < 2; ++i) {
            const VideoMix::Chroma& chroma = video.chroma[i];
            const int before = now.second[i];
            now.second[i] = second.weighed(chroma.second);
            group[2 * i] =
                whole_part(before + first.weighed(chroma.first) + now.second[i],
                           now.chroma[i], chroma.offset);
        }
        group[1] =
            whole_part(first.weighed(video.luma), now.luma, video.luma_offset);
        group[3] =
            whole_part(second.weighed(video.luma), now.luma, video.luma_offset);
    }
    carry = now;
}

void VideoLanes::color(const unsigned char* groups, std::uint32_t* pixels,
                       std::size_t pairs, const VideoColors& colors) const
{
    for (std::size_t pair = 0; pair < pairs; ++pair) {
        const unsigned char* group = groups + 4 * pair;
        const ChromaSums chromas(group, colors);
        pixels[2 * pair] = colored(group[1], chromas, colors);
        pixels[2 * pair + 1] = colored(group[3], chromas, colors);
    }
}

const VideoLanes& VideoLanes::plain()
{
    return plain_lanes;
}

const VideoLanes& VideoLanes::fastest()
{
    if (const VideoLanes* widest = avx512_video_lanes())
        return *widest;
    const VideoLanes* wide = avx2_video_lanes();
    return wide ? *wide : plain_lanes;
}

const VideoLanes& VideoLanes::current()
{
    if (!in_use)
        in_use = &fastest();
    return *in_use;
}

void VideoLanes::install(const VideoLanes* other)
{
    in_use = other;
}

} // namespace zt_platform
