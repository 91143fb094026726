#ifndef ZT_PLATFORM_PACED_PORT_H
#define ZT_PLATFORM_PACED_PORT_H

/// \file
/// Ports that keep the pace of a real device by the clock alone: how much was
/// played or recorded is worked out whenever the port is used.

#include "platform/audio_port.h"
#include "platform/audio_queue.h"

namespace zt_platform {

/// A port of a device without hardware. What becomes of the samples is up to
/// the classes derived from it.
class PacedPort : public AudioPort
{
public:
    constexpr PacedPort() = default;
    PacedPort(const PacedPort&) = delete;
    PacedPort& operator=(const PacedPort&) = delete;

    /// Takes a port that is free and makes it ready.
    ///
    /// Requires: `device_parameters` lives as long as the port.
    /// Returns:  false if it is not free, there is no memory, or
    ///           `get_ready` refuses.
    /// Context:  not inside the beat.
    bool take(const AudioPortConfig& wanted,
              const AudioParameters& device_parameters);

    bool open(const AudioPortConfig& wanted) override;
    void close() override;
    long filled() override;
    long fillable() override;
    long write(const std::int16_t* samples, long count) override;
    long read(std::int16_t* samples, long count) override;
    void release() override;

protected:
    ~PacedPort() = default;

    /// Does what else must be done for a port to be ready.
    virtual bool get_ready() { return true; }

    /// Tells whether the device is there to be opened.
    ///
    /// Context: may run inside the beat, as all that follows.
    virtual bool can_open() { return true; }

    /// Takes the oldest samples of the queue as played: all of `count`, or
    /// fewer, which makes the others wait.
    virtual void play(long count) { queue.drop(count); }

    /// Puts what the next `count` samples recorded into the queue, as far as
    /// they fit.
    virtual void hear(long count);

    virtual void opened() {}
    virtual void closed() {}

    /// Gives the port back, now or later, by calling `become_free`.
    virtual void given_back() { become_free(); }

    void become_free() { is_free = true; }

    AudioQueue queue;
    AudioPortConfig config;

private:
    void advance();
    std::uint64_t frames_since(std::uint64_t now) const;
    long current_rate() const;

    const AudioParameters* parameters = nullptr;
    std::atomic<bool> is_free = true;
    bool is_open = false;
    long rate = 0;                   ///< By which the pace is reckoned.
    std::uint64_t since = 0;         ///< When that began.
    std::uint64_t frames_so_far = 0; ///< That went by since then.
};

} // namespace zt_platform

#endif
