#include "platform/paced_port.h"

#include <algorithm>
#include <limits>

#include "platform/clock.h"

namespace zt_platform {

namespace {

constexpr std::uint64_t second = 1000000000;
constexpr long silent_samples = 4096;
constexpr std::int16_t silence[silent_samples] = {};

} // namespace

bool PacedPort::take(const AudioPortConfig& wanted,
                     const AudioParameters& device_parameters)
{
    if (!is_free)
        return false;
    config = wanted;
    parameters = &device_parameters;
    is_open = false;
    if (!queue.make(wanted.queue_size) || !get_ready())
        return false;
    is_free = false;
    return true;
}

bool PacedPort::open(const AudioPortConfig& wanted)
{
    if (is_open || !can_open() || wanted.direction != config.direction ||
        (wanted.channels != 1 && wanted.channels != 2))
        return false;
    config.channels = wanted.channels;
    config.format = wanted.format;
    config.width = wanted.width;
    config.rate = wanted.rate;
    queue.drop(queue.filled());
    rate = current_rate();
    since = Clock::current().steady_nanoseconds();
    frames_so_far = 0;
    is_open = true;
    opened();
    return true;
}

void PacedPort::close()
{
    if (!is_open)
        return;
    advance();
    queue.drop(queue.filled());
    is_open = false;
    closed();
}

long PacedPort::filled()
{
    advance();
    return queue.filled();
}

long PacedPort::fillable()
{
    advance();
    return queue.fillable();
}

long PacedPort::write(const std::int16_t* samples, long count)
{
    if (!is_open || config.direction != AudioDirection::Play)
        return 0;
    advance();
    return queue.write(samples, count);
}

long PacedPort::read(std::int16_t* samples, long count)
{
    if (!is_open || config.direction != AudioDirection::Record)
        return 0;
    advance();
    return queue.read(samples, count);
}

void PacedPort::release()
{
    close();
    given_back();
}

void PacedPort::hear(long count)
{
    for (long left = std::min(count, queue.fillable()); left > 0;)
        left -= queue.write(silence, std::min(left, silent_samples));
}

long PacedPort::current_rate() const
{
    const std::int32_t set = parameters->get(
        config.direction == AudioDirection::Play ? audio_output_rate
                                                 : audio_input_rate);
    return std::max(set, 0);
}

// In whole seconds and a rest, each of which fits when multiplied.
std::uint64_t PacedPort::frames_since(std::uint64_t now) const
{
    const std::uint64_t passed = now > since ? now - since : 0;
    const auto frames = static_cast<std::uint64_t>(rate);
    return passed / second * frames + passed % second * frames / second;
}

// Lets the time go by that has passed since it was done last: samples that
// waited are played, and time for which there were none is gone.
void PacedPort::advance()
{
    if (!is_open)
        return;
    constexpr std::uint64_t most = std::numeric_limits<std::int32_t>::max() / 2;
    const std::uint64_t now = Clock::current().steady_nanoseconds();
    const std::uint64_t frames = frames_since(now);
    const long due = static_cast<long>(std::min(frames - frames_so_far, most)) *
                     config.channels;
    frames_so_far = frames;
    if (current_rate() != rate) {
        rate = current_rate();
        since = now;
        frames_so_far = 0;
    }
    if (due == 0)
        return;
    if (config.direction == AudioDirection::Play)
        play(std::min(due, queue.filled()));
    else
        hear(due);
}

} // namespace zt_platform
