#include "ZT/sound.h"

#include <algorithm>
#include <cstring>
#include <new>

#include "platform/pages.h"
#include "sound/sound_device.h"
#include "time/beat_context.h"

// Recording. `Record` makes a port and the room for all chunks ready; the start
// callback opens the port, the continue callback takes a chunk out of it every
// 100 ms at most, and the end callback takes the rest.

constinit ZtSoundControl::SoundRecord ZtSoundControl::sound_record = {
    0, 0, 8000, 1, samples_in_chunk, 0, 0, nullptr, {}, nullptr};

namespace {
using zt_diag::SignalReport;
using zt_platform::AudioPort;
using zt_platform::AudioPortConfig;
using zt_sound::WatchedTimer;
using zt_time::BeatHeld;

constexpr long interval_of_taking = 100; // in milliseconds
constexpr int warning = 3;

constinit SignalReport frequency_is_fixed(
    "Warning: ", "Cannot change audio frequency during a record.\n", warning);
constinit SignalReport channels_are_fixed(
    "Warning: ", "Cannot change audio channel count during a record.\n",
    warning);
constinit SignalReport on_top("Warning: ",
                              "Oops, audio recording on top of recording.\n",
                              warning);
constinit SignalReport runs_backward(
    "Warning: ", "Cannot record audio on reverse running timer.\n", warning);
constinit SignalReport begins_too_early(
    "Warning: ", "Audio recording should not start before timer.\n", warning);
constinit SignalReport no_port_for_reading(
    "Error: ", "Failed to open an audio port for reading.\n", 4);

void reserve_reports()
{
    constexpr int of_each = 4;
    for (SignalReport* report :
         {&frequency_is_fixed, &channels_are_fixed, &on_top, &runs_backward,
          &begins_too_early, &no_port_for_reading})
        report->reserve(of_each);
}

/// A recording that waits for its timer to reach its time.
struct Waiting
{
    bool taken = false;
    WatchedTimer timer;
    AudioPort* port = nullptr;
};

constexpr int most_waiting = 16;
constinit Waiting waiting[most_waiting] = {};

/// The timer of the recording under way, and the number by which its callbacks
/// know that they belong to it.
constinit WatchedTimer recording_timer;
constinit std::uintptr_t recording_number = 0;

constinit std::int16_t* room = nullptr; ///< For all chunks; never given back.

void* token()
{
    // NOLINTNEXTLINE(performance-no-int-to-ptr): never followed
    return reinterpret_cast<void*>(recording_number);
}

bool is_under_way(const void* callback_data)
{
    return ZtSoundControl::sound_record.recording && callback_data == token();
}

void map_room()
{
    constexpr std::size_t bytes = std::size_t{ZtSoundControl::chunk_limit} *
                                  ZtSoundControl::samples_in_chunk *
                                  sizeof *room;
    if (!room)
        room = static_cast<std::int16_t*>(
            zt_platform::Pages::current().map(bytes));
}

AudioPortConfig recording_config()
{
    AudioPortConfig config;
    config.direction = zt_platform::AudioDirection::Record;
    config.channels = ZtSoundControl::sound_record.channels;
    config.queue_size = ZtSoundControl::queue_size;
    config.rate = ZtSoundControl::sound_record.rate;
    return config;
}

void let_go(Waiting& one)
{
    if (one.port)
        one.port->release();
    one = Waiting();
}

// Remembers that this timer will start a recording. Beyond the most there may
// be, it will find no port.
void wait_for(ZtTimer* timer, AudioPort* port)
{
    const BeatHeld held;
    for (Waiting& one : waiting)
        if (!one.taken) {
            one.taken = true;
            one.timer = WatchedTimer(timer);
            one.port = port;
            return;
        }
    if (port)
        port->release();
}

// Returns: null if no port is ready for this timer.
AudioPort* port_waiting_for(const ZtTimer* timer)
{
    for (Waiting& one : waiting)
        if (one.taken && one.timer.address == timer &&
            one.timer.id == timer->id) {
            AudioPort* const port = one.port;
            one = Waiting();
            return port;
        }
    return nullptr;
}

// Makes chunk number `chunk_count` the current one; there is none after the
// last.
void begin_chunk()
{
    ZtSoundControl::SoundRecord& record = ZtSoundControl::sound_record;
    const std::int32_t number = record.chunk_count;
    if (number >= ZtSoundControl::chunk_limit) {
        record.current_chunk = nullptr;
        return;
    }
    record.chunks[number] = room + std::ptrdiff_t{number} * record.chunk_size;
    record.current_chunk = record.chunks[number];
}

void begin_record()
{
    ZtSoundControl::SoundRecord& record = ZtSoundControl::sound_record;
    record.chunk_size = ZtSoundControl::samples_in_chunk;
    std::fill(std::begin(record.chunks), std::end(record.chunks), nullptr);
    record.current_chunk = nullptr;
    record.has_data = 1;
    record.last_count = 0;
    record.chunk_count = 0;
    if (room)
        begin_chunk();
}

// Takes a whole chunk; what comes after the last one is taken and dropped.
void take_chunk()
{
    ZtSoundControl::SoundRecord& record = ZtSoundControl::sound_record;
    if (!record.current_chunk) {
        record.port->read(ZtSoundControl::record_buffer, record.chunk_size);
        return;
    }
    record.port->read(record.current_chunk, record.chunk_size);
    ++record.chunk_count;
    begin_chunk();
}

void take_the_rest()
{
    ZtSoundControl::SoundRecord& record = ZtSoundControl::sound_record;
    while (record.current_chunk && record.port->filled() > record.chunk_size)
        take_chunk();
    if (!record.current_chunk)
        return;
    const long left = std::min<long>(record.port->filled(), record.chunk_size);
    record.last_count = static_cast<std::int32_t>(
        record.port->read(record.current_chunk, left));
}

void release_port()
{
    ZtSoundControl::SoundRecord& record = ZtSoundControl::sound_record;
    if (record.port)
        record.port->release();
    record.port = nullptr;
}

void post_the_rest(ZtTimer* timer)
{
    timer->post_repeat(ZtSoundControl::RecordContinueCB, token(),
                       interval_of_taking);
    if (timer->end_mode != ZtTimer::Endless)
        timer->post_trigger(ZtSoundControl::RecordEndCB, token(), timer->end);
    timer->post_stop(ZtSoundControl::RecordEndCB, token());
}
} // namespace

void zt_sound::let_go_of_recordings()
{
    const BeatHeld held;
    for (Waiting& one : waiting)
        if (one.taken && !one.timer.lives())
            let_go(one);
    if (ZtSoundControl::sound_record.recording && !recording_timer.lives()) {
        take_the_rest();
        release_port();
        ZtSoundControl::sound_record.recording = 0;
    }
}

void ZtSoundControl::RecordSetFrequency(int rate)
{
    zt_sound::begin_call();
    if (sound_record.recording)
        frequency_is_fixed.post();
    sound_record.rate = rate;
}

void ZtSoundControl::RecordSetStereo(int stereo)
{
    zt_sound::begin_call();
    if (sound_record.recording)
        channels_are_fixed.post();
    sound_record.channels = stereo ? 2 : 1;
}

void ZtSoundControl::Record(ZtTimer* timer, KvoTime time)
{
    zt_sound::begin_call();
    reserve_reports();
    if (!timer)
        return;
    if (sound_record.recording)
        return on_top.post();
    if (!timer->counting_up)
        return runs_backward.post();
    if (time < timer->start_time)
        return begins_too_early.post();
    if (timer->end_mode != ZtTimer::Endless && time >= timer->end)
        return;
    map_room();
    wait_for(timer, zt_sound::ready(recording_config()));
    timer->post_trigger(RecordStartCB, nullptr, time);
}

void ZtSoundControl::RecordStartCB(ZtTimer* timer, void*)
{
    AudioPort* const port = port_waiting_for(timer);
    if (sound_record.recording) {
        // Asked for twice; the one under way serves for both.
        if (port)
            port->release();
        timer->unpost(RecordStartCB, nullptr);
        return;
    }
    InputRate(sound_record.rate);
    begin_record();
    if (!port || !room || !port->open(recording_config())) {
        if (port)
            port->release();
        timer->unpost(RecordStartCB, nullptr);
        return no_port_for_reading.post();
    }
    sound_record.port = port;
    recording_timer = WatchedTimer(timer);
    ++recording_number;
    sound_record.recording = 1;
    post_the_rest(timer);
}

void ZtSoundControl::RecordContinueCB(ZtTimer*, void* callback_data)
{
    if (is_under_way(callback_data) &&
        sound_record.port->filled() >= sound_record.chunk_size)
        take_chunk();
}

void ZtSoundControl::RecordEndCB(ZtTimer* timer, void* callback_data)
{
    if (!is_under_way(callback_data))
        return;
    take_the_rest();
    release_port();
    sound_record.recording = 0;
    timer->unpost(RecordStartCB, nullptr);
    timer->unpost(RecordContinueCB, callback_data);
    timer->unpost(RecordEndCB, callback_data);
}

KvoSound* ZtSoundControl::RecordResult()
{
    zt_sound::begin_call();
    const BeatHeld held; // a recording may be about to begin
    const SoundRecord& record = sound_record;
    if (record.recording || !record.has_data)
        return nullptr;
    const long full = long{record.chunk_count} * record.chunk_size;
    const long count = full + record.last_count;
    const long places = count * record.channels;
    auto* const samples = new (
        std::nothrow) short[static_cast<std::size_t>(std::max(places, 1L))]();
    if (!samples)
        return nullptr;
    for (int number = 0; number < record.chunk_count; ++number)
        std::memcpy(
            samples + long{number} * record.chunk_size, record.chunks[number],
            static_cast<std::size_t>(record.chunk_size) * sizeof *samples);
    if (record.last_count > 0)
        std::memcpy(samples + full, record.chunks[record.chunk_count],
                    static_cast<std::size_t>(record.last_count) *
                        sizeof *samples);
    auto* const sound = new (std::nothrow)
        KvoSound(record.rate, record.channels, count, samples);
    if (!sound)
        delete[] samples;
    return sound;
}
