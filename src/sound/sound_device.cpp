#include "sound/sound_device.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "KVO/KvoSound.h"
#include "ZT/sound.h"
#include "ZT/util.h"
#include "sound/file_device.h"
#include "time/beat_context.h"

namespace zt_sound {

constinit zt_diag::SignalReport no_port_for_writing(
    "Error: ", "Failed to open an audio port for writing.\n", 4);

namespace {

using zt_platform::AudioDevice;

/// Stands in for a device that was asked for by name and is not there.
class NoAudioDevice final : public AudioDevice
{
public:
    constexpr NoAudioDevice() = default;
    const char* name() override { return "portaudio"; }
    zt_platform::AudioPort*
    prepare(const zt_platform::AudioPortConfig&) override
    {
        return nullptr;
    }
    zt_platform::AudioParameters& parameters() override { return values; }
    bool member_name(int, char*, std::size_t) override { return false; }

private:
    zt_platform::AudioParameters values;
};

constinit NoAudioDevice no_device;
constinit char* wish_before = nullptr; ///< What ZT_AUDIO was, or null.
constinit bool has_chosen = false;

bool wish_is_new(const char* wish)
{
    if (!has_chosen || !wish != !wish_before)
        return true;
    return wish && std::strcmp(wish, wish_before) != 0;
}

void remember(const char* wish)
{
    std::free(wish_before);
    wish_before = nullptr;
    if (wish) {
        const std::size_t bytes = std::strlen(wish) + 1;
        wish_before = static_cast<char*>(std::malloc(bytes));
        if (wish_before)
            std::memcpy(wish_before, wish, bytes);
    }
    has_chosen = true;
}

AudioDevice* device_of_the_machine()
{
    AudioDevice* const device = zt_platform::portaudio_device();
    char name[2];
    return device && device->member_name(0, name, sizeof name) ? device
                                                               : nullptr;
}

AudioDevice* device_called(const char* wish)
{
    if (wish && std::strcmp(wish, "null") == 0)
        return &zt_platform::null_audio_device();
    if (wish && is_file_wish(wish))
        return file_device(wish);
    AudioDevice* const device = device_of_the_machine();
    if (!device && wish && std::strcmp(wish, "portaudio") == 0)
        return &no_device;
    return device;
}

void choose_device()
{
    const char* const wish = std::getenv("ZT_AUDIO");
    if (!wish_is_new(wish))
        return;
    remember(wish);
    AudioDevice::choose(device_called(wish && *wish ? wish : nullptr));
}

} // namespace

void begin_call()
{
    if (zt_time::in_beat())
        return;
    if (!AudioDevice::is_installed())
        choose_device();
    let_go_of_plays();
    let_go_of_drags();
    let_go_of_recordings();
    AudioDevice::current().settle();
}

zt_platform::AudioPortConfig port_for(const KvoSound& sound)
{
    zt_platform::AudioPortConfig config;
    config.format = sound.format;
    config.width = sound.width;
    config.channels = sound.channels;
    config.queue_size = ZtSoundControl::queue_size;
    config.rate = sound.rate;
    return config;
}

zt_platform::AudioPort* ready(const zt_platform::AudioPortConfig& config)
{
    return zt_time::in_beat() ? nullptr
                              : AudioDevice::current().prepare(config);
}

bool WatchedTimer::lives() const
{
    const zt_time::BeatHeld held;
    if (ZtTimerBeat::list_find(id) == address)
        return true;
    for (int place = 0; place < ZtTimerBeat::defer_op_count; ++place) {
        const ZtTimerDeferOp& op = ZtTimerBeat::defer_ops[place];
        if (op.op == ZtTimerDeferOp::Add && op.timer == address)
            return true;
    }
    return false;
}

} // namespace zt_sound

const char* ZtSoundControl::DeviceName(int index)
{
    zt_sound::begin_call();
    using zt_platform::AudioDevice;
    constexpr std::size_t room = 300;
    char name[room];
    if (index < 0)
        return nullptr;
    AudioDevice* const machine = AudioDevice::is_installed()
                                     ? &AudioDevice::current()
                                     : zt_platform::portaudio_device();
    if (machine && machine->member_name(index, name, room))
        return ZtNewTempString(name);
    int members = 0;
    while (machine && machine->member_name(members, name, room))
        ++members;
    constexpr const char* always[] = {"null", "file"};
    const int place = index - members;
    return place < 2 ? ZtNewTempString(always[place]) : nullptr;
}

const char* ZtSoundControl::DeviceInUse()
{
    zt_sound::begin_call();
    return zt_platform::AudioDevice::current().name();
}
