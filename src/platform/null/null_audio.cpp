#include "platform/audio_port.h"

#include <cstdio>

#include "platform/paced_port.h"

namespace zt_platform {

namespace {

class NullPort final : public PacedPort
{
public:
    constexpr NullPort() = default;
};

class NullAudioDevice final : public AudioDevice
{
public:
    constexpr NullAudioDevice() = default;

    const char* name() override { return "null"; }

    AudioPort* prepare(const AudioPortConfig& config) override
    {
        for (NullPort& port : ports)
            if (port.take(config, values))
                return &port;
        return nullptr;
    }

    AudioParameters& parameters() override { return values; }

    bool member_name(int index, char* text, std::size_t bytes) override
    {
        if (index != 0)
            return false;
        std::snprintf(text, bytes, "%s", name());
        return true;
    }

private:
    static constexpr int most_ports = 64;
    AudioParameters values;
    NullPort ports[most_ports];
};

// Made before any code runs and never destroyed: the last beat may come while
// the process exits.
union Kept
{
    constexpr Kept() : device() {}
    ~Kept() {}
    NullAudioDevice device;
};

constinit Kept kept;

} // namespace

AudioDevice& null_audio_device()
{
    return kept.device;
}

} // namespace zt_platform
