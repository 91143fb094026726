#include "ZT/sound.h"

#include <algorithm>

#include "core/truncate.h"
#include "sound/sound_device.h"
#include "sound/sound_pick.h"
#include "sound/token_pool.h"

// Scrubbing. A record lives until its timer is stopped by request, or gone,
// which a later call of the client finds out.

namespace {
using zt_core::truncate_to;
using zt_platform::AudioPort;
using zt_sound::WatchedTimer;

constexpr long most_samples_at_once = 15000;

struct DragRecord
{
    void begin() { *this = DragRecord(); }

    KvoSound* sound = nullptr;
    std::int64_t read = 0;     ///< The sample that is next.
    float last_position = 0;   ///< 0.0 to 1.0 of the sound.
    float* position = nullptr; ///< The client's.
    AudioPort* port = nullptr;
    long samples_an_interval = 0;
    WatchedTimer timer;
    std::int16_t out[most_samples_at_once] = {};
};

constinit zt_sound::TokenPool<DragRecord, 16> drags;

// By design without a newline.
constinit zt_diag::SignalReport must_be_mono(
    "Error: ", "Audio data for ZtSoundControl::PlayDrag() must be MONO.", 4);

constinit float drag_factor = 1.0F;

// So much queued is enough, and with nothing queued there is a gap.
constexpr long enough_queued = 101;

// Far beyond what can still be played a bit faster or slower; without an end
// the factor would never come back from a device that stands still.
constexpr float least_factor = 1.0F / most_samples_at_once;
constexpr float most_factor = most_samples_at_once;

void adapt_factor(long filled)
{
    if (filled >= enough_queued)
        drag_factor *= 0.99F;
    else if (filled == 0)
        drag_factor *= 1.01F;
    drag_factor = std::clamp(drag_factor, least_factor, most_factor);
}

float on_the_sound(float position)
{
    return position > 0.0F ? std::min(position, 1.0F) : 0.0F;
}

void give_back(DragRecord& record)
{
    if (record.port)
        record.port->release();
    drags.give_back(&record);
}

// Fills the record's buffer with what the position has passed over.
void fill(DragRecord& record, long out)
{
    const KvoSound& sound = *record.sound;
    const float before = record.last_position;
    const volatile float* const position = record.position;
    record.last_position = on_the_sound(*position);
    record.read = zt_sound::scaled(sound.frames, before);
    const std::int64_t in =
        zt_sound::scaled(sound.frames, record.last_position - before);
    zt_sound::pick_stretch(
        record.out, out, sound.samples, sound.samples ? sound.frames : 0,
        static_cast<long>(record.read), static_cast<long>(in));
    record.read += in;
}

DragRecord* new_drag(KvoSound* sound, ZtTimer* timer, long interval,
                     float* position)
{
    DragRecord* const record = drags.take();
    if (!record)
        return nullptr;
    record->sound = sound;
    record->timer = WatchedTimer(timer);
    record->position = position;
    record->last_position = on_the_sound(*position);
    record->samples_an_interval =
        truncate_to<long>(static_cast<double>(sound->rate) *
                          static_cast<double>(interval) / 1000.0);
    const zt_platform::AudioPortConfig config = zt_sound::port_for(*sound);
    record->port = zt_sound::ready(config);
    if (record->port && record->port->open(config))
        return record;
    give_back(*record);
    return nullptr;
}
} // namespace

void zt_sound::let_go_of_drags()
{
    drags.for_each([](DragRecord& record) {
        const zt_time::BeatHeld held;
        if (!record.timer.lives())
            give_back(record);
    });
}

bool zt_sound::drag_uses(const KvoSound* sound)
{
    bool uses = false;
    drags.for_each([&](const DragRecord& record) {
        uses = uses || record.sound == sound;
    });
    return uses;
}

void ZtSoundControl::PlayDrag(KvoSound* sound, ZtTimer* timer, long interval,
                              float* position)
{
    zt_sound::begin_call();
    if (!sound || !timer || !position)
        return;
    if (sound->channels != 1) {
        must_be_mono.post();
        return;
    }
    DragRecord* const record = new_drag(sound, timer, interval, position);
    if (!record) {
        zt_sound::no_port_for_writing.post();
        return;
    }
    OutputRate(sound->rate);
    void* const token = drags.token_of(record);
    timer->post_repeat(PlayDragCB, token, interval);
    timer->post_stop(PlayDragEndCB, token);
}

void ZtSoundControl::PlayDragCB(ZtTimer*, void* token)
{
    DragRecord* const record = drags.find(token);
    if (!record)
        return;
    adapt_factor(record->port->filled());
    const auto out = static_cast<long>(
        zt_sound::scaled(record->samples_an_interval, drag_factor));
    const long played = std::min(out, most_samples_at_once);
    fill(*record, played);
    if (played >= 0)
        record->port->write(record->out, played);
}

void ZtSoundControl::PlayDragEndCB(ZtTimer* timer, void* token)
{
    DragRecord* const record = drags.find(token);
    if (!record)
        return;
    timer->unpost(PlayDragCB, token);
    give_back(*record);
}
