#include "sound/file_port.h"

#include <algorithm>
#include <chrono>
#include <cstring>
#include <new>
#include <thread>

#include "ZT/error.h"
#include "platform/audio_file.h"
#include "platform/pages.h"
#include "platform/sample_lanes.h"
#include "sound/aifc_header.h"

namespace zt_sound {

namespace {

using zt_platform::AudioDirection;
using zt_platform::AudioFiles;
using zt_platform::NewFile;
using zt_platform::Pages;

// So much may have been played before the thread comes by.
constexpr long most_spooled = 1L << 20;
constexpr std::chrono::milliseconds between_looks(5);
constexpr long samples_at_a_time = 4096;
constexpr std::size_t sample_bytes = 2;

std::size_t bytes_of(std::int64_t frames, int channels)
{
    return static_cast<std::size_t>(frames) *
           static_cast<std::size_t>(channels) * sample_bytes;
}

} // namespace

void FilePort::use_files(const char* played_to, const char* recorded_from)
{
    output_wish = played_to;
    input_wish = recorded_from;
}

void FilePort::settle()
{
    while (thread.runs() && !is_released && phase == Phase::Finishing)
        std::this_thread::sleep_for(between_looks);
    if (is_released)
        thread.join();
    if (has_failed.exchange(false))
        ZtError("Failed to write audio file [%s].\n", output);
}

void FilePort::end()
{
    if (!thread.runs())
        return;
    release();
    thread.join();
}

bool FilePort::get_ready()
{
    thread.join(); // it has nothing left to do
    is_released = false;
    return config.direction == AudioDirection::Play ? get_ready_to_play()
                                                    : read_input();
}

bool FilePort::get_ready_to_play()
{
    const std::size_t length = output_wish ? std::strlen(output_wish) : 0;
    if (length == 0 || length >= sizeof output)
        return false;
    std::memcpy(output, output_wish, length + 1);
    file.reset(new (std::nothrow) NewFile(output));
    bytes_kept = 0;
    phase = Phase::Waiting;
    if (file && file->is_open() && spool.make(most_spooled) &&
        thread.start(run, this, zt_platform::QuietThread::Output::Shared))
        return true;
    file.reset();
    return false;
}

// A file that says more than it holds ends in silence.
bool FilePort::read_input()
{
    forget_input();
    if (!input_wish)
        return true; // nothing is heard
    zt_platform::AudioFormat about = {};
    AudioFiles& files = AudioFiles::current();
    void* const sound = files.open(input_wish, about);
    if (!sound)
        return false;
    // No sample takes less than a quarter of a bit in a file.
    constexpr std::uint64_t most_frames_a_byte = 32;
    const std::uint64_t frames =
        std::min(about.frames, about.bytes * most_frames_a_byte);
    if (about.channels == 1 || about.channels == 2)
        input = static_cast<std::int16_t*>(Pages::current().map(
            bytes_of(static_cast<std::int64_t>(frames), about.channels)));
    if (input) {
        input_channels = about.channels;
        input_frames = static_cast<std::int64_t>(frames);
        files.read(sound, input, frames);
    }
    files.close(sound);
    return input;
}

void FilePort::forget_input()
{
    Pages::current().unmap(input, bytes_of(input_frames, input_channels));
    input = nullptr;
    input_frames = 0;
    heard_frames = 0;
}

bool FilePort::can_open()
{
    return phase != Phase::Finishing;
}

void FilePort::opened()
{
    heard_frames = 0;
    if (config.direction != AudioDirection::Play)
        return;
    output_channels = config.channels;
    output_rate = config.rate;
    phase = Phase::Playing;
}

void FilePort::closed()
{
    if (config.direction == AudioDirection::Play)
        phase = Phase::Finishing;
}

void FilePort::play(long count)
{
    std::int16_t some[samples_at_a_time];
    for (long left = std::min(count, spool.fillable()); left > 0;) {
        const long here = queue.read(some, std::min(left, samples_at_a_time));
        spool.write(some, here);
        left -= here;
    }
}

std::int16_t FilePort::heard_sample(std::int64_t frame, int channel) const
{
    if (frame >= input_frames)
        return 0;
    if (input_channels == 1)
        return input[frame];
    if (config.channels == 2)
        return input[2 * frame + channel];
    return static_cast<std::int16_t>((input[2 * frame] + input[2 * frame + 1]) /
                                     2);
}

// What does not fit into the queue is lost.
void FilePort::hear(long count)
{
    const long frames = count / config.channels;
    const long fit = std::min(frames, queue.fillable() / config.channels);
    for (long number = 0; number < fit; ++number)
        for (int channel = 0; channel < config.channels; ++channel) {
            const std::int16_t sample =
                heard_sample(heard_frames + number, channel);
            queue.write(&sample, 1);
        }
    heard_frames += frames;
}

void FilePort::given_back()
{
    if (config.direction == AudioDirection::Play)
        is_released = true;
    else
        become_free();
}

void FilePort::run(void* data)
{
    auto* const port = static_cast<FilePort*>(data);
    for (;;) {
        // Looked at first: what came before it is there.
        const bool is_last = port->is_released;
        const Phase now = port->phase;
        port->keep_what_came();
        if (now == Phase::Finishing) {
            port->finish_file();
            port->phase = Phase::Waiting;
        }
        if (is_last)
            break;
        std::this_thread::sleep_for(between_looks);
    }
    port->file.reset();
    port->become_free();
}

void FilePort::keep_what_came()
{
    std::int16_t some[samples_at_a_time];
    while (const long count = spool.read(some, samples_at_a_time))
        keep(some, count);
}

void FilePort::keep(const std::int16_t* samples, long count)
{
    unsigned char bytes[samples_at_a_time * sample_bytes];
    if (!file)
        file.reset(new (std::nothrow) NewFile(output));
    if (!file)
        return;
    if (bytes_kept == 0) {
        const unsigned char no_header[aifc_header_bytes] = {};
        file->append(no_header, aifc_header_bytes);
    }
    const std::size_t size = static_cast<std::size_t>(count) * sample_bytes;
    if (bytes_kept + size > most_aifc_bytes)
        return; // no file can hold more
    zt_platform::SampleLanes::current().to_big_bytes(
        samples, bytes, static_cast<std::size_t>(count));
    file->append(bytes, size);
    bytes_kept += size;
}

void FilePort::finish_file()
{
    unsigned char header[aifc_header_bytes];
    store_aifc_header(header, {output_channels, output_rate, sample_bytes,
                               static_cast<std::uint32_t>(bytes_kept)});
    if (!file)
        file.reset(new (std::nothrow) NewFile(output));
    if (file && bytes_kept == 0)
        file->append(header, aifc_header_bytes);
    has_failed = !file || !file->rewrite_beginning(header, aifc_header_bytes) ||
                 !file->finish();
    file.reset();
    bytes_kept = 0;
}

} // namespace zt_sound
