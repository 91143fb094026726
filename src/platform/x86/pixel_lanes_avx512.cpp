#include "platform/x86/pixel_lanes_avx512.h"

#include "platform/x86/pixel_lanes_avx2.h"

#if defined(__x86_64__) || defined(__i386__)

#include "platform/unpack_rows.h"

#include <immintrin.h>

#if !defined(__clang__)
// g++ 12 takes the undefined registers of its own header for faults.
#pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#pragma GCC diagnostic ignored "-Wuninitialized"
#endif

namespace zt_platform {

namespace {

constexpr std::size_t register_bytes = 64;

[[gnu::target("avx512f,avx512bw")]] __m512i load(const void* from)
{
    return _mm512_loadu_si512(from);
}

[[gnu::target("avx512f,avx512bw")]] void store(void* to, __m512i value)
{
    _mm512_storeu_si512(to, value);
}

/// Gives 64 bytes of a row, where interleaving wants them: it works in the
/// four quarters of a register by themselves, so each quarter gets four bytes
/// of what will be the first, the second, the third and the last 16 words.
[[gnu::target("avx512f,avx512bw")]] __m512i load_spread(const void* from)
{
    const __m512i order =
        _mm512_setr_epi32(0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15);
    return _mm512_permutexvar_epi32(order, load(from));
}

/// Registers of 64 bytes.
struct Avx512Wide
{
    static constexpr std::size_t block = register_bytes;

    [[gnu::target("avx512f,avx512bw")]] static void
    copy(unsigned char* to, const unsigned char* from, std::size_t)
    {
        store(to, load(from));
        store(to + block, load(from + block));
    }

    [[gnu::target("avx512f,avx512bw")]] static void
    fill(unsigned char* to, unsigned char value, std::size_t count)
    {
        constexpr std::size_t most_often = block / 2;
        const __m512i values = _mm512_set1_epi8(static_cast<char>(value));
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(to),
                            _mm512_castsi512_si256(values));
        if (count > most_often) {
            store(to + most_often, values);
            store(to + block, values);
        }
    }

    [[gnu::target("avx512f,avx512bw")]] static void
    join(const unsigned char* const (&rows)[4], std::size_t at,
         std::uint32_t* words)
    {
        const __m512i byte0 = load_spread(rows[0] + at);
        const __m512i byte1 = load_spread(rows[1] + at);
        const __m512i byte2 = load_spread(rows[2] + at);
        const __m512i byte3 = load_spread(rows[3] + at);
        const __m512i low01 = _mm512_unpacklo_epi8(byte0, byte1);
        const __m512i low23 = _mm512_unpacklo_epi8(byte2, byte3);
        const __m512i high01 = _mm512_unpackhi_epi8(byte0, byte1);
        const __m512i high23 = _mm512_unpackhi_epi8(byte2, byte3);
        store(words, _mm512_unpacklo_epi16(low01, low23));
        store(words + 16, _mm512_unpackhi_epi16(low01, low23));
        store(words + 32, _mm512_unpacklo_epi16(high01, high23));
        store(words + 48, _mm512_unpackhi_epi16(high01, high23));
    }
};

class Avx512PixelLanes final : public Avx2PixelLanes
{
public:
    const char* name() const override { return "avx512"; }

    [[gnu::target("avx512f,avx512bw")]] void
    join(const unsigned char* const (&bytes)[4], std::uint32_t* words,
         std::size_t count) const override
    {
        std::size_t at = 0;
        for (; at + Avx512Wide::block <= count; at += Avx512Wide::block)
            Avx512Wide::join(bytes, at, words + at);
        Avx2PixelLanes::join(
            {bytes[0] + at, bytes[1] + at, bytes[2] + at, bytes[3] + at},
            words + at, count - at);
    }

    [[gnu::target("avx512f,avx512bw,prfchw")]] bool
    unpack(const PackedRow (&rows)[4], Packets packets,
           const Joining& beside) const override
    {
        return unpack_rows<Avx512Wide>(*this, rows, packets, beside);
    }
};

constinit const Avx512PixelLanes avx512_lanes;

} // namespace

const PixelLanes* avx512_pixel_lanes()
{
    __builtin_cpu_init(); // Static objects may ask before it was done.
    return __builtin_cpu_supports("avx512f") &&
                   __builtin_cpu_supports("avx512bw") && avx2_pixel_lanes()
               ? &avx512_lanes
               : nullptr;
}

} // namespace zt_platform

#else

namespace zt_platform {

const PixelLanes* avx512_pixel_lanes()
{
    return nullptr;
}

} // namespace zt_platform

#endif
