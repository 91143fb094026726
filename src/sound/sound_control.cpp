#include "ZT/sound.h"

#include <algorithm>
#include <limits>

#include "core/truncate.h"
#include "platform/clock.h"
#include "sound/sample_buffer.h"
#include "sound/sound_device.h"
#include "sound/sound_pick.h"
#include "time/beat_context.h"

constinit float ZtSoundControl::play_speed = 1.0F;
constinit std::int16_t ZtSoundControl::play_buffer[queue_size] = {};
constinit std::int16_t ZtSoundControl::record_buffer[queue_size] = {};
constinit std::int32_t ZtSoundControl::pv_buf[4] = {};
constinit std::int32_t ZtSoundControl::input_rate = 0;
constinit std::int32_t ZtSoundControl::output_rate = 0;

namespace {
using zt_core::truncate_to;
using zt_platform::AudioDevice;
using zt_platform::AudioPort;
using zt_time::BeatHeld;

constexpr double full_volume = 255.0;

// Hands the first pairs of `pv_buf` to the device.
void set_parameters(int pairs)
{
    AudioDevice& device = AudioDevice::current();
    for (int place = 0; place < 2 * pairs; place += 2)
        device.parameters().set(ZtSoundControl::pv_buf[place],
                                ZtSoundControl::pv_buf[place + 1]);
    device.parameters_changed();
}

void set_parameter(ZtSoundControl::Parameter code, std::int32_t value)
{
    zt_sound::begin_call();
    const BeatHeld held;
    ZtSoundControl::pv_buf[0] = code;
    ZtSoundControl::pv_buf[1] = value;
    set_parameters(1);
}

void set_both(ZtSoundControl::Parameter left, ZtSoundControl::Parameter right,
              float volume)
{
    zt_sound::begin_call();
    const BeatHeld held;
    const auto level = truncate_to<std::int32_t>(double{volume} * full_volume);
    ZtSoundControl::pv_buf[0] = left;
    ZtSoundControl::pv_buf[1] = level;
    ZtSoundControl::pv_buf[2] = right;
    ZtSoundControl::pv_buf[3] = level;
    set_parameters(2);
}

std::int32_t get_parameter(ZtSoundControl::Parameter code)
{
    zt_sound::begin_call();
    const BeatHeld held;
    ZtSoundControl::pv_buf[0] = code;
    ZtSoundControl::pv_buf[1] =
        AudioDevice::current().parameters().get(ZtSoundControl::pv_buf[0]);
    return ZtSoundControl::pv_buf[1];
}

float get_volume(ZtSoundControl::Parameter code)
{
    return static_cast<float>(get_parameter(code) / full_volume);
}

std::int32_t narrowed(long rate)
{
    using limits = std::numeric_limits<std::int32_t>;
    return static_cast<std::int32_t>(
        std::clamp(rate, long{limits::min()}, long{limits::max()}));
}

// The waits of blocking playback.
void sleep_ticks(int clock_ticks)
{
    constexpr std::uint64_t clock_tick = 10000000; // in nanoseconds
    zt_platform::Clock::current().sleep_nanoseconds(
        static_cast<std::uint64_t>(clock_ticks) * clock_tick);
}

constexpr int ticks_between_looks = 10;
constexpr long free_before_a_block = 50000;
constexpr std::int64_t samples_in_block = 10000;

/// Plays all of a sound through an open port, block by block.
void play_through(AudioPort& port, const KvoSound& sound)
{
    const std::int16_t* source = sound.samples;
    std::int64_t remaining =
        source ? static_cast<std::int64_t>(zt_sound::samples_of(sound)) : 0;
    while (remaining > 0 && ZtSoundControl::play_speed > 0) {
        while (port.fillable() < free_before_a_block)
            sleep_ticks(ticks_between_looks);
        // The beat may play something of its own through the same buffer.
        const BeatHeld held;
        const float speed = ZtSoundControl::play_speed;
        const auto out = static_cast<long>(
            std::min(zt_sound::scaled(remaining, speed), samples_in_block));
        const auto in = static_cast<long>(
            std::min(zt_sound::divided(out, speed), remaining));
        zt_sound::pick(ZtSoundControl::play_buffer, out, source, in);
        port.write(ZtSoundControl::play_buffer, out);
        if (in == 0)
            break; // it would go on like this for ever
        source += in;
        remaining -= in;
    }
    while (port.filled() > 0)
        sleep_ticks(ticks_between_looks);
}
} // namespace

void ZtSoundControl::OutputRate(long rate)
{
    output_rate = narrowed(rate);
    set_parameter(OutputRateCode, output_rate);
}

long ZtSoundControl::OutputRate()
{
    return get_parameter(OutputRateCode);
}

void ZtSoundControl::InputRate(long rate)
{
    input_rate = narrowed(rate);
    set_parameter(InputRateCode, input_rate);
}

long ZtSoundControl::InputRate()
{
    return get_parameter(InputRateCode);
}

void ZtSoundControl::MonitorVolume(float volume)
{
    set_both(LeftMonitorCode, RightMonitorCode, volume);
}

float ZtSoundControl::MonitorVolume()
{
    return get_volume(LeftMonitorCode);
}

void ZtSoundControl::JackVolume(float volume)
{
    set_both(LeftJackCode, RightJackCode, volume);
}

float ZtSoundControl::JackVolume()
{
    return get_volume(LeftJackCode);
}

void ZtSoundControl::Monitor(int on)
{
    set_parameter(MonitorCode, on ? 1 : 0);
}

int ZtSoundControl::Monitor()
{
    return get_parameter(MonitorCode) == 1;
}

void ZtSoundControl::PlaySpeed(float speed)
{
    play_speed = speed;
}

void ZtSoundControl::DisableAudioLibraryErrors()
{
    zt_sound::begin_call();
    AudioDevice::current().silence_errors();
}

void ZtSoundControl::Play(KvoSound* sound)
{
    zt_sound::begin_call();
    if (!sound)
        return;
    const zt_platform::AudioPortConfig config = zt_sound::port_for(*sound);
    AudioPort* const port = zt_sound::ready(config);
    if (!port || !port->open(config)) {
        if (port)
            port->release();
        zt_sound::no_port_for_writing.post();
        return;
    }
    OutputRate(sound->rate);
    // At no rate nothing would ever leave the queue.
    if (sound->rate > 0)
        play_through(*port, *sound);
    port->release();
    AudioDevice::current().settle();
}

void ZtSoundControl::play_resample(short* source, long count)
{
    const long wanted = std::clamp(count, 0L, long{queue_size});
    const std::int64_t used = zt_sound::scaled(wanted, play_speed);
    // No sound has more; nobody can have meant it.
    constexpr std::int64_t most = std::numeric_limits<std::uint32_t>::max();
    zt_sound::pick(play_buffer, wanted, source,
                   used <= most ? static_cast<long>(used) : 0);
}
