#include "platform/audio_port.h"

#include <algorithm>

namespace zt_platform {

namespace {

constinit AudioDevice* installed = nullptr;
constinit AudioDevice* chosen = nullptr;

bool is_level(std::int32_t parameter)
{
    return parameter == audio_left_gain || parameter == audio_right_gain ||
           parameter == audio_left_monitor || parameter == audio_right_monitor;
}

} // namespace

void AudioParameters::set(std::int32_t parameter, std::int32_t value)
{
    if (parameter >= 0 && parameter < count)
        values[parameter] =
            is_level(parameter) ? std::clamp(value, 0, full) : value;
}

std::int32_t AudioParameters::get(std::int32_t parameter) const
{
    return parameter >= 0 && parameter < count ? values[parameter].load() : 0;
}

AudioDevice& AudioDevice::current()
{
    if (installed)
        return *installed;
    return chosen ? *chosen : null_audio_device();
}

void AudioDevice::choose(AudioDevice* other)
{
    chosen = other;
}

bool AudioDevice::is_installed()
{
    return installed;
}

AudioDevice* AudioDevice::install(AudioDevice* other)
{
    AudioDevice* const before = installed;
    installed = other;
    return before;
}

} // namespace zt_platform
