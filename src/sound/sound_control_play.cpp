#include "ZT/sound.h"

#include <algorithm>
#include <limits>

#include "platform/pages.h"
#include "sound/sample_buffer.h"
#include "sound/sound_device.h"
#include "sound/sound_pick.h"
#include "sound/token_pool.h"

// A sound in step with a timer. Its record is made ready by `Play`, filled in
// by the start callback, fed by the continue callback every 100 ms, and given
// back by the end callback, or by a later call of the client when the timer is
// gone.

namespace {
using zt_platform::AudioPort;
using zt_platform::Pages;
using zt_sound::no_port_for_writing;
using zt_sound::WatchedTimer;

constexpr long interval_of_feeding = 100; // in milliseconds
constexpr long samples_in_block = 50000;

struct PlayRecord
{
    void begin() { *this = PlayRecord(); }

    std::int64_t total() const
    {
        return sound->samples
                   ? static_cast<std::int64_t>(zt_sound::samples_of(*sound))
                   : 0;
    }

    KvoSound* sound = nullptr;
    const std::int16_t* read = nullptr; ///< The next sample.
    std::int16_t* reversed = nullptr;   ///< The copy for a backward timer.
    std::int64_t reversed_count = 0;
    AudioPort* port = nullptr;
    std::int64_t start_offset = 0; ///< In ticks.
    std::int64_t remaining = 0;    ///< Samples that are still to be queued.
    WatchedTimer timer;
    bool open = false;
    bool posted = false; ///< What goes on after the start.
};

constinit zt_sound::TokenPool<PlayRecord, 64> plays;

std::size_t bytes_of(std::int64_t samples)
{
    return static_cast<std::size_t>(samples) * sizeof(std::int16_t);
}

void free_reversed(PlayRecord& record)
{
    Pages::current().unmap(record.reversed, bytes_of(record.reversed_count));
    record.reversed = nullptr;
    record.reversed_count = 0;
}

// Ordinarily by the client; inside the beat only for a timer that was turned
// round after the sound was posted.
void make_reversed(PlayRecord& record)
{
    const std::int64_t count = record.total();
    if (record.reversed || count == 0)
        return;
    record.reversed =
        static_cast<std::int16_t*>(Pages::current().map(bytes_of(count)));
    if (!record.reversed)
        return;
    record.reversed_count = count;
    std::reverse_copy(record.sound->samples, record.sound->samples + count,
                      record.reversed);
}

void give_back(PlayRecord& record)
{
    if (record.port)
        record.port->release();
    free_reversed(record);
    plays.give_back(&record);
}

// Ends a playback from inside the beat. The stop record cannot be withdrawn;
// it will find nothing.
void end_play(PlayRecord& record, ZtTimer* timer)
{
    void* const token = plays.token_of(&record);
    timer->unpost(ZtSoundControl::PlayStartCB, token);
    if (record.posted) {
        timer->unpost(ZtSoundControl::PlayContinueCB, token);
        timer->unpost(ZtSoundControl::PlayEndCB, token);
    }
    give_back(record);
}

std::int64_t length_in_ticks(const KvoSound& sound)
{
    return sound.rate > 0 ? std::int64_t{sound.frames} *
                                KvoTime::ticks_per_second / sound.rate
                          : 0;
}

/// When a sound begins, and how much of it lies before that.
struct Entry
{
    bool plays;
    KvoTime at;
    std::int64_t start_offset; ///< In ticks.
};

// The timer runs through the sound from its end to its beginning, so it is the
// end that must lie on its way.
Entry entry_backward(const ZtTimer& timer, KvoTime time, const KvoSound& sound)
{
    const std::int64_t top = time.Ticks() + length_in_ticks(sound);
    const std::int64_t over = top - timer.start_time.Ticks();
    if (over > 0)
        return {true, timer.start_time, over};
    const bool on_the_way =
        timer.end_mode == ZtTimer::Endless || top > timer.end.Ticks();
    return {on_the_way && top >= std::numeric_limits<std::int32_t>::min(),
            KvoTime::FromTicks(static_cast<std::int32_t>(top)), 0};
}

Entry entry_forward(const ZtTimer& timer, KvoTime time)
{
    if (time < timer.start_time)
        return {true, timer.start_time,
                std::int64_t{timer.start_time.Ticks()} - time.Ticks()};
    const bool on_the_way =
        timer.end_mode == ZtTimer::Endless || time < timer.end;
    return {on_the_way, time, 0};
}

// Whole frames, so that a stereo sound begins with its left channel.
std::int64_t skipped_samples(const PlayRecord& record)
{
    const KvoSound& sound = *record.sound;
    const std::int64_t length = length_in_ticks(sound);
    if (length <= 0 || record.start_offset <= 0)
        return 0;
    if (record.start_offset >= length)
        return record.total();
    return record.start_offset * sound.frames / length * sound.channels;
}

// Places the read pointer.
//
// Returns: false for a backward timer when there is no memory for the copy.
bool begin_reading(PlayRecord& record, bool forward)
{
    std::int64_t total = record.total();
    const std::int16_t* samples = record.sound->samples;
    if (!forward && total > 0) {
        make_reversed(record);
        if (!record.reversed)
            return false;
        samples = record.reversed;
        total = std::min(total, record.reversed_count);
    }
    const std::int64_t skip = std::min(skipped_samples(record), total);
    record.read = samples ? samples + skip : nullptr;
    record.remaining = total - skip;
    return true;
}

// How many samples the rest makes at the present speed.
std::int64_t needed(const PlayRecord& record)
{
    return zt_sound::divided(record.remaining, ZtSoundControl::play_speed);
}

// Queues `count` samples made of as many of the rest as the speed says.
//
// Returns: how many of the rest those are.
std::int64_t feed(PlayRecord& record, std::int64_t count)
{
    const std::int64_t used = std::min(
        record.remaining, zt_sound::scaled(count, ZtSoundControl::play_speed));
    zt_sound::pick(ZtSoundControl::play_buffer, static_cast<long>(count),
                   record.read, static_cast<long>(used));
    record.port->write(ZtSoundControl::play_buffer, static_cast<long>(count));
    return used;
}

void feed_the_rest(PlayRecord& record, std::int64_t count)
{
    feed(record, count);
    record.remaining = 0;
}

// At a speed that uses no sample of the rest for a whole block, it would go on
// for ever: the rest is not played.
void feed_a_block(PlayRecord& record, std::int64_t count)
{
    const std::int64_t used = feed(record, count);
    record.remaining = used > 0 ? record.remaining - used : 0;
    record.read += used;
}

void feed_first(PlayRecord& record)
{
    if (record.remaining == 0 || !(ZtSoundControl::play_speed > 0))
        return;
    const std::int64_t count = needed(record);
    if (count <= ZtSoundControl::queue_size)
        feed_the_rest(record, count);
    else
        feed_a_block(record, ZtSoundControl::queue_size);
}

void post_the_rest(PlayRecord& record, ZtTimer* timer)
{
    if (record.posted)
        return;
    record.posted = true;
    void* const token = plays.token_of(&record);
    timer->post_repeat(ZtSoundControl::PlayContinueCB, token,
                       interval_of_feeding);
    if (timer->end_mode != ZtTimer::Endless)
        timer->post_trigger(ZtSoundControl::PlayEndCB, token, timer->end);
    timer->post_stop(ZtSoundControl::PlayEndCB, token);
}

bool start_play(PlayRecord& record, const ZtTimer& timer)
{
    return record.port && begin_reading(record, timer.counting_up) &&
           record.port->open(zt_sound::port_for(*record.sound));
}
} // namespace

void zt_sound::let_go_of_plays()
{
    plays.for_each([](PlayRecord& record) {
        const zt_time::BeatHeld held;
        if (!record.timer.lives())
            give_back(record);
    });
}

bool zt_sound::play_uses(const KvoSound* sound)
{
    bool uses = false;
    plays.for_each([&](const PlayRecord& record) {
        uses = uses || record.sound == sound;
    });
    return uses;
}

int ZtSoundControl::Playing(const KvoSound* sound)
{
    zt_sound::begin_call();
    const zt_time::BeatHeld held;
    bool playing = false;
    plays.for_each([&](const PlayRecord& record) {
        playing = playing ||
                  (record.sound == sound && (record.open || !record.posted));
    });
    return playing;
}

int ZtSoundControl::Uses(const KvoSound* sound)
{
    zt_sound::begin_call();
    const zt_time::BeatHeld held;
    return zt_sound::play_uses(sound) || zt_sound::drag_uses(sound);
}

void ZtSoundControl::Play(KvoSound* sound, ZtTimer* timer, KvoTime time)
{
    zt_sound::begin_call();
    if (!sound || !timer)
        return;
    const Entry entry = timer->counting_up
                            ? entry_forward(*timer, time)
                            : entry_backward(*timer, time, *sound);
    if (!entry.plays)
        return;
    AudioPort* const port = zt_sound::ready(zt_sound::port_for(*sound));
    PlayRecord* const record = plays.take();
    if (!record) {
        if (port)
            port->release();
        no_port_for_writing.post();
        return;
    }
    record->sound = sound;
    record->timer = WatchedTimer(timer);
    record->port = port;
    record->start_offset = entry.start_offset;
    if (!timer->counting_up)
        make_reversed(*record);
    no_port_for_writing.reserve(plays.taken_count());
    timer->post_trigger(PlayStartCB, plays.token_of(record), entry.at);
}

void ZtSoundControl::PlayStartCB(ZtTimer* timer, void* token)
{
    PlayRecord* const record = plays.find(token);
    if (!record || record->open)
        return;
    if (!start_play(*record, *timer)) {
        no_port_for_writing.post();
        end_play(*record, timer);
        return;
    }
    OutputRate(record->sound->rate);
    feed_first(*record);
    record->open = true;
    post_the_rest(*record, timer);
}

void ZtSoundControl::PlayContinueCB(ZtTimer*, void* token)
{
    PlayRecord* const record = plays.find(token);
    if (!record || !record->open)
        return;
    const long free = record->port->fillable();
    if (record->remaining == 0) {
        if (free < queue_size)
            return;
        record->port->close();
        free_reversed(*record);
        record->open = false;
        return;
    }
    if (!(play_speed > 0))
        return;
    const std::int64_t need = needed(*record);
    if (need <= free)
        feed_the_rest(*record, need);
    else if (free > samples_in_block && need >= samples_in_block)
        feed_a_block(*record, samples_in_block);
}

void ZtSoundControl::PlayEndCB(ZtTimer* timer, void* token)
{
    if (PlayRecord* const record = plays.find(token))
        end_play(*record, timer);
}
