#ifndef ZT_PLATFORM_X86_PIXEL_LANES_AVX2_H
#define ZT_PLATFORM_X86_PIXEL_LANES_AVX2_H

/// \file
/// Work on rows of pixels with the 256-bit registers of x86 processors.

#include "platform/pixel_lanes.h"

namespace zt_platform {

/// Returns: null where the processor has none, or is of another kind.
const PixelLanes* avx2_pixel_lanes();

#if defined(__x86_64__) || defined(__i386__)

/// What it says of the operations is said where they are first declared.
class Avx2PixelLanes : public PixelLanes
{
public:
    const char* name() const override;
    void join(const unsigned char* const (&bytes)[4], std::uint32_t* words,
              std::size_t count) const override;
    bool unpack(const PackedRow (&rows)[4], Packets packets,
                const Joining& beside) const override;
    void split(const std::uint32_t* words, unsigned char* const (&bytes)[4],
               std::size_t count) const override;
    std::size_t find_three_equal(const unsigned char* bytes,
                                 std::size_t count) const override;
    std::size_t count_equal(const unsigned char* bytes,
                            std::size_t count) const override;
    void turn(const std::uint32_t* words, std::size_t stride,
              std::uint32_t* columns,
              std::size_t columns_stride) const override;
    void pick(const std::uint32_t* words, const int* places,
              std::uint32_t* picked, std::size_t count) const override;
    void average(const Average& lines, std::uint32_t* averages,
                 std::size_t count) const override;

protected:
    ~Avx2PixelLanes() = default;
};

#endif

} // namespace zt_platform

#endif
