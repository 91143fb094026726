#include "platform/portaudio/pa_port.h"

#include <algorithm>
#include <cstring>

namespace zt_platform {

namespace {

constexpr int most_channels = 2;
constexpr double widest_step = 1000.0;

double step_between(std::int32_t wanted, long given)
{
    if (wanted <= 0 || given <= 0)
        return 0;
    return std::min(static_cast<double>(wanted) / static_cast<double>(given),
                    widest_step);
}

// One frame with another number of channels.
void convert_frame(const std::int16_t* from, int from_channels,
                   std::int16_t* to, int to_channels)
{
    if (from_channels == to_channels)
        std::memcpy(to, from,
                    static_cast<std::size_t>(to_channels) * sizeof *to);
    else if (from_channels == 1)
        to[0] = to[1] = from[0];
    else
        to[0] = static_cast<std::int16_t>((from[0] + from[1]) / 2);
}

long samples_in(unsigned long frames, int channels)
{
    return static_cast<long>(frames) * channels;
}

} // namespace

void apply_levels(std::int16_t* samples, unsigned long frames, int channels,
                  std::int32_t left, std::int32_t right)
{
    constexpr std::int32_t full = AudioParameters::full;
    if (left == full && (right == full || channels == 1))
        return;
    const std::int32_t levels[most_channels] = {left, right};
    for (unsigned long number = 0; number < frames; ++number)
        for (int channel = 0; channel < channels; ++channel, ++samples)
            *samples = static_cast<std::int16_t>(
                *samples * levels[channel % most_channels] / full);
}

bool PaPort::open(const AudioPortConfig& config)
{
    if (state != State::Ready || is_gone || is_open ||
        config.direction != direction ||
        (config.channels != 1 && config.channels != 2))
        return false;
    channels = config.channels;
    if (direction == AudioDirection::Record)
        queue.drop(queue.filled()); // the stream may have been about to close
    is_open = true;
    return true;
}

void PaPort::close()
{
    is_open = false;
    if (direction == AudioDirection::Play)
        queue.discard();
    else
        queue.drop(queue.filled());
}

long PaPort::filled()
{
    return is_gone && direction == AudioDirection::Play ? 0 : queue.filled();
}

long PaPort::fillable()
{
    return queue.capacity() - filled();
}

long PaPort::write(const std::int16_t* samples, long count)
{
    if (!is_open || direction != AudioDirection::Play)
        return 0;
    return is_gone ? std::max(count, 0L) : queue.write(samples, count);
}

long PaPort::read(std::int16_t* samples, long count)
{
    return direction == AudioDirection::Record ? queue.read(samples, count) : 0;
}

void PaPort::release()
{
    close();
    state = State::Released;
}

bool PaPort::begin(const AudioPortConfig& config,
                   const AudioParameters& device_parameters)
{
    direction = config.direction;
    parameters = &device_parameters;
    monitor = nullptr;
    released_at = 0;
    channels = config.channels;
    is_open = false;
    is_gone = false;
    has_played = false;
    phase = 0;
    frame[0] = frame[1] = 0;
    return queue.make(config.queue_size);
}

int PaPort::on_stream(const void* input, void* output, unsigned long frames,
                      const PaStreamCallbackTimeInfo*, PaStreamCallbackFlags,
                      void* data)
{
    auto* const port = static_cast<PaPort*>(data);
    ++port->heartbeats;
    if (output)
        port->play(static_cast<std::int16_t*>(output), frames);
    if (input)
        port->record(static_cast<const std::int16_t*>(input), frames);
    return paContinue;
}

void PaPort::on_end_of_stream(void* port)
{
    static_cast<PaPort*>(port)->give_up();
}

void PaPort::play(std::int16_t* to, unsigned long frames)
{
    const long count = samples_in(frames, stream_channels);
    std::memset(to, 0, static_cast<std::size_t>(count) * sizeof *to);
    if (!is_open)
        return;
    const std::int32_t rate = parameters->get(audio_output_rate);
    if (rate == stream_rate && channels == stream_channels) {
        if (queue.read(to, count) > 0)
            has_played = true;
    } else {
        play_converted(to, frames, step_between(rate, stream_rate));
    }
    apply_levels(to, frames, stream_channels, parameters->get(audio_left_gain),
                 parameters->get(audio_right_gain));
}

// Every frame of the stream is the one at which the sound stands then.
void PaPort::play_converted(std::int16_t* to, unsigned long frames, double step)
{
    const int from_channels = channels;
    for (unsigned long number = 0; number < frames; ++number) {
        for (phase += step; phase >= 1; phase -= 1)
            if (!next_frame())
                frame[0] = frame[1] = 0;
        convert_frame(frame, from_channels, to, stream_channels);
        to += stream_channels;
    }
}

bool PaPort::next_frame()
{
    if (queue.read(frame, channels) == 0)
        return false;
    has_played = true;
    return true;
}

void PaPort::record(const std::int16_t* from, unsigned long frames)
{
    AudioQueue* const heard = monitor;
    if (heard && parameters->get(audio_monitor) == 1)
        heard->write(from, samples_in(frames, stream_channels));
    if (!is_open)
        return;
    const std::int32_t rate = parameters->get(audio_input_rate);
    if (rate != stream_rate || channels != stream_channels)
        return record_converted(from, frames, step_between(rate, stream_rate));
    // What does not fit is lost, in whole frames.
    const long room = queue.fillable() / stream_channels * stream_channels;
    queue.write(from, std::min(samples_in(frames, stream_channels), room));
}

// Every frame of the stream counts as often as it is heard.
void PaPort::record_converted(const std::int16_t* from, unsigned long frames,
                              double step)
{
    const int to_channels = channels;
    for (unsigned long number = 0; number < frames; ++number) {
        convert_frame(from, stream_channels, frame, to_channels);
        from += stream_channels;
        for (phase += step; phase >= 1; phase -= 1)
            if (queue.fillable() >= to_channels)
                queue.write(frame, to_channels);
    }
}

} // namespace zt_platform
