#ifndef ZT_SOUND_H
#define ZT_SOUND_H

/// \file
/// The machine's audio device: its rates, volumes and monitoring, and sounds
/// played straight through, played or recorded in step with a timer, or
/// scrubbed by moving a position.
///
/// Surprising: `PlaySpeed` works one way for `Play(sound)`, which makes
/// `play_speed` samples of each one, and the other way for a sound that follows
/// a timer, of which every `play_speed`-th sample is played. Both pick the
/// nearest sample of the interleaved buffer, whatever its channels.
///
/// The environment variable ZT_AUDIO chooses the device when it is first asked
/// for something, and again whenever it has changed: `portaudio`; `null`, which
/// plays into nothing and records silence, at the pace of a real one;
/// `file:OUT`, which keeps what is played last in the sound file OUT;
/// `file:OUT,IN`, which records from the sound file IN besides. Without it
/// that is the system's device where there is one, and `null` elsewhere.
/// Volumes start full and monitoring off, and both are done in software.
///
/// What follows a timer runs inside the beat, which makes no device call:
/// ports, reversed copies and room for what is recorded are made ready when the
/// client asks, and only switched on in time.

#include <KVO/KvoSound.h>
#include <ZT/timer.h>

#include <cstdint>

namespace zt_platform {
class AudioPort;
}

/// The audio device and all that plays and records on it.
///
/// One staging buffer serves all playback: what is played at the same time with
/// a speed of its own is not possible.
///
/// Context: what is not said to run inside the beat must not be called there;
///          if it is, no port is ready when the time comes, which is reported
///          like a device that does not open.
class ZT_API ZtSoundControl
{
public:
    ZtSoundControl() = delete;

    /// What stands in `pv_buf` for each thing that the device can be asked.
    enum Parameter : std::int32_t {
        InputRateCode = 3,
        OutputRateCode = 4,
        LeftJackCode = 5,
        RightJackCode = 6,
        MonitorCode = 12,
        LeftMonitorCode = 13,
        RightMonitorCode = 14
    };

    /// The samples that wait in a port at most.
    static constexpr long queue_size = 100000;

    /// The samples of a recording's chunk, and how many chunks there are.
    static constexpr int samples_in_chunk = 25000;
    static constexpr int chunk_limit = 100;

    /// Sets and gives the rate at which the device plays.
    ///
    /// Units:   sample frames a second; one that does not fit 32 bits is the
    ///          nearest that does.
    /// Context: may run inside the beat, like all that sets or gives a
    ///          parameter of the device.
    static void OutputRate(long rate);
    static long OutputRate();

    /// Sets and gives the rate at which the device records.
    static void InputRate(long rate);
    static long InputRate();

    /// Sets both, and gives the left, level at which the input is heard while
    /// monitoring is on.
    ///
    /// Units: 0.0 to 1.0, kept as 255ths, truncated; beyond is the nearest end.
    static void MonitorVolume(float volume);
    static float MonitorVolume();

    /// Sets both, and gives the left, gain of the speakers.
    ///
    /// Units: as of `MonitorVolume`.
    static void JackVolume(float volume);
    static float JackVolume();

    /// Sets and tells whether the input is heard: on unless `on` is 0.
    static void Monitor(int on);
    static int Monitor();

    /// Sets the factor of all playback. Nothing is played at a speed that is
    /// not above 0.
    ///
    /// Context: may run inside the beat; playback under way goes on with it.
    static void PlaySpeed(float speed);

    /// Keeps the audio libraries from printing reports of their own.
    static void DisableAudioLibraryErrors();

    /// Gives the name of a device of this machine, `null` and `file` included.
    ///
    /// Units:   `index` counts from 0.
    /// Owner:   a temporary string that lives through 99 further ones.
    /// Returns: null past the last device.
    static const char* DeviceName(int index);

    /// Gives the name of the device in use: "portaudio", "null" or "file".
    ///
    /// Owner: a literal.
    static const char* DeviceInUse();

    /// Plays a sound straight through and returns when all of it was played.
    ///
    /// At a speed other than 1 it lasts `play_speed` times as long; with a
    /// sample that is too short to make another of, it ends. A device that
    /// goes away takes the rest at once. A sound whose rate is not above 0 is
    /// not played.
    ///
    /// Requires: a sound.
    /// Reports:  an error "Failed to open an audio port for writing.\n"; then
    ///           nothing is played.
    static void Play(KvoSound* sound);

    /// Plays a sound in step with a timer: on one that counts up it begins at
    /// `time`, on one that counts down it is played backward and ends at
    /// `time`, so that it lies at the same place of the timeline.
    ///
    /// What lies before the timer's start is left out; a sound that would begin
    /// at the timer's end or behind it is not played. The sound stops when the
    /// timer stops or ends, and is played once: a restarted timer is silent.
    ///
    /// Requires: a sound and a timer; the sound stays as it is for as long as
    ///           `Uses` tells.
    /// Reports:  inside the beat, an error "Failed to open an audio port for
    ///           writing.\n"; then nothing is played.
    static void Play(KvoSound* sound, ZtTimer* timer, KvoTime time);

    /// Tells whether a sound that follows a timer waits for its time or is
    /// being played; not any more once all of it was.
    static int Playing(const KvoSound* sound);

    /// Tells whether something that follows a timer may still look at a sound,
    /// which must stay until then.
    static int Uses(const KvoSound* sound);

    /// Scrubs a mono sound: every `interval` of the running timer the part
    /// between the previous and the present `*position` is played, backward if
    /// that is the way it went.
    ///
    /// It ends when the timer is stopped or destroyed. A timer that reaches its
    /// end only interrupts it. At most 15000 samples are played an interval.
    ///
    /// Requires: all three; sound and position stay until the end.
    /// Units:    `interval` in milliseconds; `*position` 0.0 to 1.0 of the
    ///           sound, beyond is the nearest end, not-a-number is 0.
    /// Reports:  an error "Audio data for ZtSoundControl::PlayDrag() must be
    ///           MONO." without a newline for another sound; an error "Failed
    ///           to open an audio port for writing.\n". Nothing is played then.
    /// By design: that message ends without a newline
    ///            (DragTest.AStereoSoundIsReportedAndOpensNothing).
    static void PlayDrag(KvoSound* sound, ZtTimer* timer, long interval,
                         float* position);

    /// Sets the rate of recordings; 8000 at first.
    ///
    /// Units:     sample frames a second.
    /// Reports:   during a recording, a warning "Cannot change audio frequency
    ///            during a record.\n".
    /// Context:   may run inside the beat, like `RecordSetStereo`.
    /// By design: the rate is changed all the same, and the recording under way
    ///            will be given out with it
    ///            (RecordTest.AFrequencySetDuringARecordWarnsAndIsKept).
    static void RecordSetFrequency(int rate);

    /// Sets the channels of recordings: mono if `stereo` is 0, as at first.
    ///
    /// Reports:   during a recording, a warning "Cannot change audio channel
    ///            count during a record.\n".
    /// By design: it is changed all the same
    ///            (RecordTest.AChannelCountSetDuringARecordWarnsAndIsKept).
    static void RecordSetStereo(int stereo);

    /// Records from when the timer reaches `time` until it ends or is stopped,
    /// at most 2500000 samples. A timer records once, restarted or not.
    ///
    /// Requires: a timer.
    /// Reports:  a warning, and nothing is recorded, during a recording ("Oops,
    ///           audio recording on top of recording.\n"), on a timer that
    ///           counts down ("Cannot record audio on reverse running
    ///           timer.\n"), for a time before its start ("Audio recording
    ///           should not start before timer.\n"). A time at its end or
    ///           behind it records nothing and says nothing. Inside the beat,
    ///           an error "Failed to open an audio port for reading.\n".
    static void Record(ZtTimer* timer, KvoTime time);

    /// Gives what was recorded last.
    ///
    /// Owner:     the caller.
    /// Returns:   null while a recording runs, before the first one has begun,
    ///            and without memory.
    /// By design: its frame count is the number of samples, so that a stereo
    ///            recording is followed by as much silence
    ///            (RecordTest.AStereoResultCountsSamplesAsFrames).
    static KvoSound* RecordResult();

    /// Fills the first `count` samples of `play_buffer` with count * speed
    /// samples from `source` on, picked evenly; with zeros if that is none.
    ///
    /// Requires: so many samples.
    /// Units:    `count` 0 to `queue_size`; beyond is the nearest end.
    /// Context:  may run inside the beat.
    static void play_resample(short* source, long count);

    /// What timers call. Their data is a number by which the playback or the
    /// recording is found while there is one; others do nothing.
    ///
    /// Context: inside the beat.
    static void PlayStartCB(ZtTimer* timer, void* record);
    static void PlayContinueCB(ZtTimer* timer, void* record);
    static void PlayEndCB(ZtTimer* timer, void* record);
    static void PlayDragCB(ZtTimer* timer, void* record);
    static void PlayDragEndCB(ZtTimer* timer, void* record);
    static void RecordStartCB(ZtTimer* timer, void*);
    static void RecordContinueCB(ZtTimer* timer, void* record);
    static void RecordEndCB(ZtTimer* timer, void* record);

    /// The recording under way, or the latest one.
    struct SoundRecord
    {
        volatile std::int32_t recording; ///< 1 while the port is open.
        volatile std::int32_t has_data;  ///< 1 once a recording has started.
        std::int32_t rate;               ///< Sample frames a second.
        std::int32_t channels;           ///< 1 or 2.
        std::int32_t chunk_size;         ///< Samples in a chunk.
        std::int32_t last_count;         ///< Samples in the last, partial one.
        std::int32_t chunk_count;        ///< Full chunks.
        std::int16_t* current_chunk;     ///< The one being filled, or null.
        std::int16_t* chunks[chunk_limit]; ///< In order.
        zt_platform::AudioPort* port;      ///< The input, or null.
    };

    static float play_speed; ///< The factor of all playback.

    /// Where samples stand on their way to the device and from it.
    static std::int16_t play_buffer[queue_size];
    static std::int16_t record_buffer[queue_size];

    static std::int32_t pv_buf[4];   ///< Pairs of a code and a value.
    static std::int32_t input_rate;  ///< As it was set last, 0 at first.
    static std::int32_t output_rate; ///< As it was set last, 0 at first.
    static SoundRecord sound_record; ///< What recording is at.
};

#endif
