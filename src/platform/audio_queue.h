#ifndef ZT_PLATFORM_AUDIO_QUEUE_H
#define ZT_PLATFORM_AUDIO_QUEUE_H

/// \file
/// Samples on their way from one thread to one other, say from the beat to the
/// thread of the sound device.
///
/// Neither side ever waits, locks or allocates. We wrote it ourselves, since
/// the packages that hold such a class bring a hundred megabytes of others.

#include <atomic>
#include <cstddef>
#include <cstdint>

namespace zt_platform {

/// A ring with one writer and one reader.
///
/// Two counters that only grow, modulo 2^32, say how much was ever written and
/// taken; each side advances its own after it has moved the samples. What the
/// writer discards is marked by a third and passed over by the reader, who may
/// be in the middle of copying it; so the ring has twice the room, and can be
/// filled anew at once.
///
/// Units: samples, throughout; counts below 0 are 0.
class AudioQueue
{
public:
    constexpr AudioQueue() = default;
    ~AudioQueue();
    AudioQueue(const AudioQueue&) = delete;
    AudioQueue& operator=(const AudioQueue&) = delete;

    static constexpr long most_capacity = 1L << 28;

    /// Makes it an empty queue for `capacity` samples.
    ///
    /// Requires: neither side uses it meanwhile.
    /// Units:    1 to `most_capacity`.
    /// Returns:  false when there is no memory; then nothing fits.
    /// Context:  any.
    bool make(long capacity);

    long capacity() const { return limit; }

    /// Tells how many samples wait. They grow by the writer only and shrink by
    /// either side.
    ///
    /// Context: either side.
    long filled() const
    {
        // What was taken or discarded was written before, so it is looked at
        // first.
        const std::uint32_t from = front(taken.load(std::memory_order_acquire));
        return static_cast<long>(written.load(std::memory_order_acquire) -
                                 from);
    }

    /// Tells how many more fit: `capacity` less `filled`.
    long fillable() const { return limit - filled(); }

    /// Puts as many of the samples in as fit.
    ///
    /// Returns: how many that were.
    /// Context: the writer.
    long write(const std::int16_t* from, long count);

    /// Throws away what waits.
    ///
    /// Context: the writer; the reader does it with `drop`.
    void discard();

    /// Takes the oldest samples out, as many as there are.
    ///
    /// Returns: how many that were.
    /// Context: the reader.
    long read(std::int16_t* to, long count);

    /// Takes the oldest samples out and forgets them.
    ///
    /// Returns: how many that were.
    /// Context: the reader.
    long drop(long count);

private:
    /// Gives where the oldest sample lies that was not discarded.
    std::uint32_t front(std::uint32_t taken_now) const
    {
        const std::uint32_t mark = discarded.load(std::memory_order_acquire);
        return static_cast<std::int32_t>(mark - taken_now) > 0 ? mark
                                                               : taken_now;
    }

    static constexpr std::size_t cache_line = 64;

    std::int16_t* ring = nullptr;
    std::uint32_t places = 0; ///< A power of two.
    long limit = 0;
    alignas(cache_line) std::atomic<std::uint32_t> written = 0;
    std::atomic<std::uint32_t> discarded = 0;
    alignas(cache_line) std::atomic<std::uint32_t> taken = 0;
};

} // namespace zt_platform

#endif
