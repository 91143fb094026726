#ifndef ZT_PLATFORM_PORTAUDIO_PA_PORT_H
#define ZT_PLATFORM_PORTAUDIO_PA_PORT_H

/// \file
/// A port whose samples a stream of the PortAudio library takes or brings.
///
/// The stream runs from the time the port is made ready; while the port is
/// closed it plays silence and what it records is dropped. What the stream
/// cannot do, a rate, a number of channels, a volume, is done on its way.

#include "platform/audio_port.h"
#include "platform/audio_queue.h"

#include <portaudio.h>

namespace zt_platform {

class PaPort final : public AudioPort
{
public:
    enum class State : int {
        Free = 0,
        Ready = 1,
        Released = 2 ///< Its stream is still to be closed.
    };

    constexpr PaPort() = default;

    bool open(const AudioPortConfig& config) override;
    void close() override;
    long filled() override;
    long fillable() override;
    long write(const std::int16_t* samples, long count) override;
    long read(std::int16_t* samples, long count) override;
    void release() override;

    /// Makes it a port without a stream yet.
    ///
    /// Returns: false when there is no memory.
    /// Context: the thread of the device, as all that follows down to the
    ///          data.
    bool begin(const AudioPortConfig& config,
               const AudioParameters& device_parameters);

    /// Says that the device is gone: nobody is to wait for it.
    void give_up() { is_gone = true; }

    /// What the stream calls, with the port as its data.
    static int on_stream(const void* input, void* output, unsigned long frames,
                         const PaStreamCallbackTimeInfo*, PaStreamCallbackFlags,
                         void* port);
    static void on_end_of_stream(void* port);

    std::atomic<State> state = State::Free;
    PaStream* stream = nullptr;
    int stream_channels = 0;
    long stream_rate = 0;
    std::atomic<bool> has_played = false; ///< Anything since `begin`.
    std::atomic<unsigned> heartbeats = 0; ///< Calls of the stream.
    unsigned heartbeats_seen = 0;
    std::uint64_t moment = 0;      ///< When they were last seen to grow.
    std::uint64_t released_at = 0; ///< When that was seen; 0 before.
    std::atomic<AudioQueue*> monitor = nullptr; ///< Where it can be heard.
    AudioDirection direction = AudioDirection::Play;

private:
    void play(std::int16_t* to, unsigned long frames);
    void play_converted(std::int16_t* to, unsigned long frames, double step);
    bool next_frame();
    void record(const std::int16_t* from, unsigned long frames);
    void record_converted(const std::int16_t* from, unsigned long frames,
                          double step);

    const AudioParameters* parameters = nullptr;
    AudioQueue queue;
    std::atomic<int> channels = 1;
    std::atomic<bool> is_open = false;
    std::atomic<bool> is_gone = false;
    double phase = 0;           ///< Between two frames, when converting.
    std::int16_t frame[2] = {}; ///< The one that stands there.
};

/// Multiplies interleaved samples by the levels of their channels.
///
/// Units: levels 0 to `AudioParameters::full`.
void apply_levels(std::int16_t* samples, unsigned long frames, int channels,
                  std::int32_t left, std::int32_t right);

} // namespace zt_platform

#endif
