#ifndef ZT_PLATFORM_PIXEL_LANES_H
#define ZT_PLATFORM_PIXEL_LANES_H

/// \file
/// Work on rows of pixels that a processor can do for many pixels at a time.
///
/// The class itself does all of it one pixel after the other, on any
/// processor, and is what everything else is held to: a derived class does the
/// same in wider steps and gives the same bits. Which one is in use is decided
/// once, by what the processor can do.

#include <cstddef>
#include <cstdint>

namespace zt_platform {

/// A row of bytes in packets, and where the bytes go.
///
/// A packet begins with a byte that holds a count in its low seven bits. With
/// the high bit that many bytes follow; without it one byte follows that
/// stands for as many. Count 0 ends the row.
struct PackedRow
{
    const unsigned char* packets;
    const unsigned char* packets_end;
    unsigned char* values;
    unsigned char* values_end;

    static constexpr unsigned literal_bit = 0x80;
    static constexpr unsigned count_bits = 0x7F;
};

/// Four rows of bytes that are to be joined into words; the first are the
/// lowest.
struct Joining
{
    const unsigned char* bytes[4];
    std::uint32_t* words;
    std::size_t count;
};

class PixelLanes
{
public:
    /// Gives a name for tests and measurements.
    virtual const char* name() const;

    /// Makes words of four rows of bytes; `bytes[0]` are the lowest.
    virtual void join(const unsigned char* const (&bytes)[4],
                      std::uint32_t* words, std::size_t count) const;

    /// Unpacks four rows, and joins four others beside: unpacking waits for
    /// one packet after the other, joining for memory.
    ///
    /// Requires: `packet_slack` bytes behind the packets that may be read and
    ///           behind the values that may be written.
    /// Returns:  whether the packets filled all of their rows exactly; if not,
    ///           neither values nor words mean anything.
    static constexpr std::size_t packet_slack = 128;
    enum class Packets : int { Short = 0, Long = 1 }; ///< Most of them.
    virtual bool unpack(const PackedRow (&rows)[4], Packets packets,
                        const Joining& beside) const;

    /// Takes words apart into four rows of bytes; `bytes[0]` are the lowest.
    virtual void split(const std::uint32_t* words,
                       unsigned char* const (&bytes)[4],
                       std::size_t count) const;

    /// Gives the position of the first of three equal bytes in a row, `count`
    /// if there are none.
    virtual std::size_t find_three_equal(const unsigned char* bytes,
                                         std::size_t count) const;

    /// Gives how many bytes from the first on are equal.
    ///
    /// Requires: at least one byte.
    virtual std::size_t count_equal(const unsigned char* bytes,
                                    std::size_t count) const;

    /// Turns a block of 8 rows of 8 words, so that its columns become rows.
    ///
    /// Units: the strides, from one row to the next, in words.
    static constexpr std::size_t turned = 8;
    virtual void turn(const std::uint32_t* words, std::size_t stride,
                      std::uint32_t* columns, std::size_t columns_stride) const;

    /// Picks the words at these places.
    ///
    /// Requires: places of at least 0, in `words`, none below the one before.
    virtual void pick(const std::uint32_t* words, const int* places,
                      std::uint32_t* picked, std::size_t count) const;

    /// Averages lines of words, the three low bytes of each word by itself;
    /// the high byte of the result is 0.
    ///
    /// With w the value of a byte: if `whole` is 0 the result is
    /// ((w0 * head + w1 * (1 - head)) * tail) * scale; otherwise the first
    /// line's (w0 * head + w1 * (1 - head)) * head, then all of the lines 1 to
    /// whole - 1, then w * tail of line `whole`, summed up in this order and
    /// times `scale`; cut to an integer.
    ///
    /// Requires: lines[0] to lines[max(whole, 1)].
    struct Average
    {
        const std::uint32_t* const* lines;
        std::size_t whole;
        double head;
        double tail;
        double scale;
    };
    virtual void average(const Average& lines, std::uint32_t* averages,
                         std::size_t count) const;

    /// Gives what is in use: the fastest that this processor can do, or what a
    /// test installed.
    static const PixelLanes& current();

    /// Installs others; null restores the fastest.
    ///
    /// Owner: the caller, who installs others before destroying them.
    static void install(const PixelLanes* other);

    /// Gives those that do one pixel after the other.
    static const PixelLanes& plain();

    /// Gives the fastest that this processor can do.
    static const PixelLanes& fastest();

protected:
    ~PixelLanes() = default;

    /// Averages the words from number `at` on.
    static void average_from(const Average& lines, std::uint32_t* averages,
                             std::size_t at, std::size_t count);
};

} // namespace zt_platform

#endif
