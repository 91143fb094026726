#ifndef ZT_PLATFORM_AUDIO_PORT_H
#define ZT_PLATFORM_AUDIO_PORT_H

/// \file
/// The door to the machine's audio device: ports through which 16-bit samples
/// go in or out, each with a queue that can be asked how full it is, and
/// parameters of the device by number.
///
/// A port is made ready by ordinary code, which may take its time, and then
/// opened, used, closed and given back without any call of the device, so that
/// all of that may happen inside the beat.

#include <atomic>
#include <cstddef>
#include <cstdint>

namespace zt_platform {

/// Which way the samples of a port go.
enum class AudioDirection : int { Play = 0, Record = 1 };

/// What a port is to be like.
struct AudioPortConfig
{
    AudioDirection direction = AudioDirection::Play;
    int format = 1;           ///< Two's complement, the only one there is.
    int width = 2;            ///< Bytes of a sample in its file; 16 bits go.
    int channels = 1;         ///< 1 or 2, interleaved.
    long queue_size = 100000; ///< Samples.
    long rate = 8000; ///< To which the device is about to be set, in sample
                      ///< frames a second.
};

/// One way in or out.
///
/// Units:   samples, both channels counted; counts below 0 are 0.
/// Context: everything here may run inside the beat, and nothing waits. A port
///          is used by one thread and what interrupts it.
class AudioPort
{
public:
    /// Lets samples through from now on, with an empty queue.
    ///
    /// Returns: false if it cannot, for which a device that went away since it
    ///          was made ready is one reason.
    virtual bool open(const AudioPortConfig& config) = 0;

    /// Stops at once; what waits in the queue is thrown away.
    virtual void close() = 0;

    /// Gives how many samples wait, and how many more fit; together they are
    /// always the size of the queue. When the device is gone none wait, so that
    /// nobody waits for them.
    virtual long filled() = 0;
    virtual long fillable() = 0;

    /// Queues samples to be played, as many as fit.
    ///
    /// Returns: how many that were.
    virtual long write(const std::int16_t* samples, long count) = 0;

    /// Takes samples that were recorded, as many as there are.
    ///
    /// Returns: how many that were.
    virtual long read(std::int16_t* samples, long count) = 0;

    /// Closes the port and gives it back to its device; it is not touched by
    /// the caller again.
    virtual void release() = 0;

protected:
    ~AudioPort() = default;
};

/// The numbers of a device's parameters.
enum AudioParameter : int {
    audio_input_rate = 3,
    audio_output_rate = 4,
    audio_left_gain = 5, ///< Gains and levels are 0 to 255.
    audio_right_gain = 6,
    audio_monitor = 12, ///< 1 while the input is heard.
    audio_left_monitor = 13,
    audio_right_monitor = 14
};

/// The parameters of a device, for devices to keep them in. Rates begin at
/// 44100, gains and levels full, all others at 0.
///
/// Context: any, any thread.
class AudioParameters
{
public:
    constexpr AudioParameters() = default;

    static constexpr std::int32_t full = 255;

    /// Sets one; gains and levels to the nearest they may be. A number that is
    /// none is passed over.
    void set(std::int32_t parameter, std::int32_t value);

    /// Gives one; 0 for a number that is none.
    std::int32_t get(std::int32_t parameter) const;

private:
    static constexpr int count = 16;
    static constexpr std::int32_t rate_at_first = 44100;
    std::atomic<std::int32_t> values[count] = {
        0, 0, 0, rate_at_first, rate_at_first, full, full, 0, 0, 0,
        0, 0, 0, full,          full,          0};
};

/// A device that plays and records.
class AudioDevice
{
public:
    /// Gives what the device is called where one is chosen.
    ///
    /// Owner: a literal.
    virtual const char* name() = 0;

    /// Makes a port ready, closed.
    ///
    /// Owner:   the device; the caller calls `release`.
    /// Returns: null when there is no device, memory or port left.
    /// Context: not inside the beat.
    virtual AudioPort* prepare(const AudioPortConfig& config) = 0;

    /// Gives the parameters. What the device cannot do, it does in software.
    virtual AudioParameters& parameters() = 0;

    /// Acts upon parameters that were changed.
    ///
    /// Context: any.
    virtual void parameters_changed() {}

    /// Keeps the device's libraries from printing.
    ///
    /// Context: not inside the beat.
    virtual void silence_errors() {}

    /// Waits until what was played through ports that are closed is kept.
    ///
    /// Context: not inside the beat.
    virtual void settle() {}

    /// Tells the name of one of the machine's devices that this one stands for.
    ///
    /// Units:   `index` counts from 0; `bytes` is the room at `text`, into
    ///          which the name is cut.
    /// Returns: false past the last.
    /// Context: not inside the beat.
    virtual bool member_name(int index, char* text, std::size_t bytes) = 0;

    /// Gives the device in use: one that a test installed, else the chosen one,
    /// else the silent one.
    ///
    /// Context: any.
    static AudioDevice& current();

    /// Chooses a device; null chooses the silent one.
    static void choose(AudioDevice* other);

    /// Tells whether a test has installed its own.
    static bool is_installed();

    /// Installs another, whatever is chosen; null removes it.
    ///
    /// Owner:   the caller, who installs others before destroying it.
    /// Returns: what was installed before, null for none.
    static AudioDevice* install(AudioDevice* other);

protected:
    ~AudioDevice() = default;
};

/// Gives the device that is always there: what it plays goes nowhere, at the
/// pace of a real one, and what it records is silence.
AudioDevice& null_audio_device();

/// Gives the machine's own devices, through the PortAudio library. When there
/// is none it has no member, and makes no port ready until there is one.
///
/// Returns: null when the library is missing.
/// Context: not inside the beat.
AudioDevice* portaudio_device();

} // namespace zt_platform

#endif
