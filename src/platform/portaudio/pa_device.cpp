#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <new>

#include "platform/audio_port.h"
#include "platform/portaudio/pa_functions.h"
#include "platform/portaudio/pa_port.h"
#include "platform/portaudio/pa_worker.h"

namespace zt_platform {

namespace {

constexpr std::uint64_t millisecond = 1000000;

// In seconds. Less would break on a busy machine, and sounds that are fed every
// 100 ms gain nothing by it.
constexpr double least_latency = 0.1;

// By the real clock, whatever clock the process goes by: so does the device.
std::uint64_t real_nanoseconds()
{
    return static_cast<std::uint64_t>(
        std::chrono::duration_cast<std::chrono::nanoseconds>(
            std::chrono::steady_clock::now().time_since_epoch())
            .count());
}

class PaDevice final : public AudioDevice
{
public:
    PaDevice()
        : worker([](void* device) { return tended(device)->tend(); },
                 [](void* device) { tended(device)->finish(); }, this)
    {}

    const char* name() override { return "portaudio"; }
    AudioPort* prepare(const AudioPortConfig& config) override;
    AudioParameters& parameters() override { return values; }
    bool member_name(int index, char* text, std::size_t bytes) override;

    /// Closes everything; for the end of the process.
    void end();

private:
    static PaDevice* tended(void* device)
    {
        return static_cast<PaDevice*>(device);
    }

    // On the thread of the device:
    bool begin();
    bool has_streams() const;
    void look_again();
    PaPort* prepare_here(const AudioPortConfig& config);
    bool open_stream(PaPort& port, const AudioPortConfig& config);
    bool try_stream(PaPort& port, int channels, double rate);
    void close_stream(PaPort& port);
    bool tend();
    void finish();
    void tend_ready(PaPort& port, std::uint64_t now);
    void tend_released(PaPort& port, std::uint64_t now);
    void tend_monitor();
    void open_monitor(const PaPort& source);
    void close_monitor();
    PaPort* recording_port();

    static int on_monitor(const void*, void* output, unsigned long frames,
                          const PaStreamCallbackTimeInfo*,
                          PaStreamCallbackFlags, void* device);

    static constexpr int most_ports = 24;
    static constexpr long most_monitored = 10000; ///< Samples.

    AudioParameters values;
    PaWorker worker;
    PaPort ports[most_ports];
    bool has_begun = false;
    AudioQueue monitor_queue;
    PaStream* monitor_stream = nullptr;
    int monitor_channels = 1;
    PaPort* monitor_source = nullptr;
};

bool PaDevice::begin()
{
    const PaFunctions* const pa = PaFunctions::current();
    if (!pa)
        return false;
    if (!has_begun) {
        const StandardErrorAway away;
        has_begun =
            monitor_queue.make(most_monitored) && pa->initialize() == paNoError;
    }
    return has_begun;
}

bool PaDevice::has_streams() const
{
    return monitor_stream ||
           std::any_of(std::begin(ports), std::end(ports),
                       [](const PaPort& port) { return port.stream; });
}

// The library knows the devices that were there when it was initialised.
void PaDevice::look_again()
{
    if (!has_begun || has_streams())
        return;
    PaFunctions::current()->terminate();
    has_begun = false;
    begin();
}

bool PaDevice::try_stream(PaPort& port, int channels, double rate)
{
    const PaFunctions& pa = *PaFunctions::current();
    const bool plays = port.direction == AudioDirection::Play;
    const PaDeviceIndex index =
        plays ? pa.default_output() : pa.default_input();
    const PaDeviceInfo* const about =
        index == paNoDevice ? nullptr : pa.device_info(index);
    if (!about)
        return false;
    PaStreamParameters wanted = {};
    wanted.device = index;
    wanted.channelCount = std::min(channels, plays ? about->maxOutputChannels
                                                   : about->maxInputChannels);
    wanted.sampleFormat = paInt16;
    wanted.suggestedLatency =
        std::max(least_latency, plays ? about->defaultHighOutputLatency
                                      : about->defaultHighInputLatency);
    const double stream_rate = rate > 0 ? rate : about->defaultSampleRate;
    const StandardErrorAway away;
    if (wanted.channelCount < 1 ||
        pa.open_stream(&port.stream, plays ? nullptr : &wanted,
                       plays ? &wanted : nullptr, stream_rate,
                       paFramesPerBufferUnspecified, paClipOff,
                       PaPort::on_stream, &port) != paNoError) {
        port.stream = nullptr;
        return false;
    }
    port.stream_channels = wanted.channelCount;
    port.stream_rate = static_cast<long>(stream_rate);
    pa.on_finished(port.stream, PaPort::on_end_of_stream);
    if (pa.start_stream(port.stream) == paNoError)
        return true;
    pa.close_stream(port.stream);
    port.stream = nullptr;
    return false;
}

// A device that refuses the rate is taken at its own.
bool PaDevice::open_stream(PaPort& port, const AudioPortConfig& config)
{
    const auto rate = static_cast<double>(std::max(config.rate, 0L));
    return try_stream(port, config.channels, rate) ||
           try_stream(port, config.channels, 0) || try_stream(port, 2, 0);
}

void PaDevice::close_stream(PaPort& port)
{
    const PaFunctions& pa = *PaFunctions::current();
    const StandardErrorAway away;
    if (port.stream) {
        pa.stop_stream(port.stream);
        pa.close_stream(port.stream);
    }
    port.stream = nullptr;
    if (monitor_source == &port)
        monitor_source = nullptr;
    port.state = PaPort::State::Free;
}

PaPort* PaDevice::prepare_here(const AudioPortConfig& config)
{
    const auto free = std::find_if(
        std::begin(ports), std::end(ports),
        [](const PaPort& port) { return port.state == PaPort::State::Free; });
    if (free == std::end(ports) || !begin() || !free->begin(config, values))
        return nullptr;
    if (!open_stream(*free, config)) {
        look_again();
        if (!has_begun || !open_stream(*free, config))
            return nullptr;
    }
    free->moment = real_nanoseconds();
    free->state = PaPort::State::Ready;
    return &*free;
}

AudioPort* PaDevice::prepare(const AudioPortConfig& config)
{
    struct Call
    {
        PaDevice* device;
        const AudioPortConfig& config;
        PaPort* port;
    } call = {this, config, nullptr};
    worker.call(
        [](void* data) {
            auto* const wanted = static_cast<Call*>(data);
            wanted->port = wanted->device->prepare_here(wanted->config);
        },
        &call);
    return call.port;
}

bool PaDevice::member_name(int index, char* text, std::size_t bytes)
{
    struct Call
    {
        PaDevice* device;
        int index;
        char* text;
        std::size_t bytes;
        bool found;
    } call = {this, index, text, bytes, false};
    worker.call(
        [](void* data) {
            auto* const wanted = static_cast<Call*>(data);
            if (!wanted->device->begin() || wanted->index < 0)
                return;
            const PaFunctions& pa = *PaFunctions::current();
            if (pa.device_count() <= 0)
                wanted->device->look_again();
            const PaDeviceInfo* const about =
                wanted->index < pa.device_count()
                    ? pa.device_info(wanted->index)
                    : nullptr;
            if (!about)
                return;
            std::snprintf(wanted->text, wanted->bytes, "portaudio: %s",
                          about->name);
            wanted->found = true;
        },
        &call);
    return call.found;
}

// A stream that is not called any more belongs to a device that has gone
// without a word.
void PaDevice::tend_ready(PaPort& port, std::uint64_t now)
{
    constexpr std::uint64_t longest_silence = 5000 * millisecond;
    const unsigned heartbeats = port.heartbeats;
    if (heartbeats != port.heartbeats_seen) {
        port.heartbeats_seen = heartbeats;
        port.moment = now;
    } else if (now - port.moment > longest_silence) {
        port.give_up();
    }
}

// What the stream has taken is not yet what is heard: it goes on for a while,
// or the end of the sound would be cut off.
void PaDevice::tend_released(PaPort& port, std::uint64_t now)
{
    constexpr std::uint64_t least_rest = 200 * millisecond;
    std::uint64_t rest = 0;
    if (port.has_played && port.stream) {
        const PaStreamInfo* const about =
            PaFunctions::current()->stream_info(port.stream);
        const double latency = about ? about->outputLatency : 0;
        rest = least_rest +
               static_cast<std::uint64_t>(std::clamp(latency, 0.0, 1.0) * 1e9);
    }
    if (port.released_at == 0)
        port.released_at = now;
    if (now - port.released_at >= rest)
        close_stream(port);
}

PaPort* PaDevice::recording_port()
{
    const auto found = std::find_if(
        std::begin(ports), std::end(ports), [](const PaPort& port) {
            return port.stream && port.state == PaPort::State::Ready &&
                   port.direction == AudioDirection::Record;
        });
    return found == std::end(ports) ? nullptr : &*found;
}

void PaDevice::open_monitor(const PaPort& source)
{
    const PaFunctions& pa = *PaFunctions::current();
    const PaDeviceIndex index = pa.default_output();
    const PaDeviceInfo* const about =
        index == paNoDevice ? nullptr : pa.device_info(index);
    if (!about)
        return;
    monitor_queue.drop(monitor_queue.filled());
    PaStreamParameters wanted = {};
    wanted.device = index;
    wanted.channelCount = source.stream_channels;
    wanted.sampleFormat = paInt16;
    wanted.suggestedLatency = about->defaultLowOutputLatency;
    monitor_channels = wanted.channelCount;
    const StandardErrorAway away;
    if (pa.open_stream(&monitor_stream, nullptr, &wanted,
                       static_cast<double>(source.stream_rate),
                       paFramesPerBufferUnspecified, paClipOff, on_monitor,
                       this) != paNoError)
        monitor_stream = nullptr;
    else if (pa.start_stream(monitor_stream) != paNoError)
        close_monitor();
}

void PaDevice::close_monitor()
{
    const PaFunctions& pa = *PaFunctions::current();
    const StandardErrorAway away;
    pa.abort_stream(monitor_stream);
    pa.close_stream(monitor_stream);
    monitor_stream = nullptr;
}

// One recording at a time is heard. It stays the source until its stream is
// closed, so that no two ever write.
void PaDevice::tend_monitor()
{
    if (!monitor_source)
        monitor_source = recording_port();
    PaPort* const source = monitor_source;
    const bool wanted = source && values.get(audio_monitor) == 1;
    if (wanted && !monitor_stream)
        open_monitor(*source);
    else if (!wanted && monitor_stream)
        close_monitor();
    if (source)
        source->monitor = &monitor_queue;
}

bool PaDevice::tend()
{
    const std::uint64_t now = real_nanoseconds();
    for (PaPort& port : ports)
        if (port.state == PaPort::State::Ready)
            tend_ready(port, now);
        else if (port.state == PaPort::State::Released)
            tend_released(port, now);
    if (has_begun)
        tend_monitor();
    return has_streams();
}

int PaDevice::on_monitor(const void*, void* output, unsigned long frames,
                         const PaStreamCallbackTimeInfo*, PaStreamCallbackFlags,
                         void* data)
{
    auto* const device = static_cast<PaDevice*>(data);
    auto* const to = static_cast<std::int16_t*>(output);
    const long count = static_cast<long>(frames) * device->monitor_channels;
    const long heard = device->monitor_queue.read(to, count);
    std::memset(to + heard, 0,
                static_cast<std::size_t>(count - heard) * sizeof *to);
    apply_levels(to, frames, device->monitor_channels,
                 device->values.get(audio_left_monitor),
                 device->values.get(audio_right_monitor));
    return paContinue;
}

void PaDevice::finish()
{
    if (has_begun)
        PaFunctions::current()->terminate();
    has_begun = false;
}

void PaDevice::end()
{
    for (PaPort& port : ports)
        if (port.state == PaPort::State::Ready)
            port.release();
    worker.end();
}

// The room of the device, which is never destroyed: ports may be in use until
// the very end.
alignas(PaDevice) unsigned char room[sizeof(PaDevice)];
constinit PaDevice* device = nullptr;

/// Closes the streams when the process ends or the library is unloaded.
struct Ending
{
    ~Ending()
    {
        if (device)
            device->end();
    }
};

const Ending ending;

} // namespace

AudioDevice* portaudio_device()
{
    if (!PaFunctions::current())
        return nullptr;
    if (!device)
        device = new (room) PaDevice;
    return device;
}

} // namespace zt_platform
