#include "support/FakeAudioDevice.h"

#include <algorithm>
#include <cstdio>

namespace {
// Tests may look at what is kept, which so must not move.
template <class Item>
void keep(std::vector<Item>& items, const Item& item)
{
    if (items.size() < items.capacity())
        items.push_back(item);
}
} // namespace

long FakeAudioPort::write(const std::int16_t* samples, long count)
{
    keep(device->blocks, count);
    if (device->gone)
        return count;
    const long taken = PacedPort::write(samples, count);
    for (long place = 0; place < taken; ++place)
        keep(device->written, samples[place]);
    return taken;
}

long FakeAudioPort::read(std::int16_t* samples, long count)
{
    return device->gone ? 0 : PacedPort::read(samples, count);
}

long FakeAudioPort::filled()
{
    return device->gone ? 0 : PacedPort::filled();
}

long FakeAudioPort::fillable()
{
    return device->gone ? config.queue_size : PacedPort::fillable();
}

bool FakeAudioPort::can_open()
{
    return !device->refuses_opens && !device->gone;
}

void FakeAudioPort::play(long count)
{
    std::int16_t sample = 0;
    for (long place = 0; place < count; ++place) {
        queue.read(&sample, 1);
        keep(device->played, sample);
    }
}

void FakeAudioPort::hear(long count)
{
    const long injected = std::min(
        count, static_cast<long>(device->input.size() - device->heard));
    queue.write(device->input.data() + device->heard, injected);
    device->heard += static_cast<std::size_t>(injected);
    PacedPort::hear(count - injected);
}

void FakeAudioPort::opened()
{
    keep(device->opens, config);
    ++device->open_ports;
}

void FakeAudioPort::closed()
{
    --device->open_ports;
}

void FakeAudioPort::given_back()
{
    --device->ready_ports;
    become_free();
}

FakeAudioDevice::FakeAudioDevice()
    : before(zt_platform::AudioDevice::install(this))
{
    constexpr std::size_t most_calls = 10000;
    played.reserve(most_samples);
    written.reserve(most_samples);
    blocks.reserve(most_calls);
    opens.reserve(most_calls);
    for (FakeAudioPort& port : ports)
        port.device = this;
}

FakeAudioDevice::~FakeAudioDevice()
{
    zt_platform::AudioDevice::install(before);
}

zt_platform::AudioPort*
FakeAudioDevice::prepare(const zt_platform::AudioPortConfig& config)
{
    if (refuses_ports)
        return nullptr;
    for (FakeAudioPort& port : ports)
        if (port.take(config, values)) {
            ++ready_ports;
            return &port;
        }
    return nullptr;
}

bool FakeAudioDevice::member_name(int index, char* text, std::size_t bytes)
{
    if (index < 0 || index > 1)
        return false;
    std::snprintf(text, bytes, "fake %d", index);
    return true;
}
