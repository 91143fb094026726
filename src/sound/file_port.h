#ifndef ZT_SOUND_FILE_PORT_H
#define ZT_SOUND_FILE_PORT_H

/// \file
/// A port whose samples go to a sound file or come from one.

#include <memory>

#include "platform/new_file.h"
#include "platform/paced_port.h"
#include "platform/quiet_thread.h"

namespace zt_sound {

/// The port keeps its pace by the clock. What was played goes on to a thread
/// that writes the file, since the beat must not; what is recorded was read
/// beforehand.
class FilePort final : public zt_platform::PacedPort
{
public:
    static constexpr int longest_path = 4096;

    /// Sets the files for the next time the port is made ready. Null is none.
    ///
    /// Owner: the caller keeps the texts until then.
    void use_files(const char* played_to, const char* recorded_from);

    /// Waits until what was played before the port was closed is in its file.
    ///
    /// Reports: an error "Failed to write audio file [NAME].\n" once for what
    ///          could not be kept.
    void settle();

    /// Gives everything back and ends the thread.
    void end();

private:
    /// What the thread has to do.
    enum class Phase : int {
        Waiting = 0,  ///< Nothing was played since the last file was finished.
        Playing = 1,  ///< Samples come.
        Finishing = 2 ///< No more come; the file is to be finished.
    };

    bool get_ready() override;
    bool can_open() override;
    void opened() override;
    void closed() override;
    void play(long count) override;
    void hear(long count) override;
    void given_back() override;

    bool get_ready_to_play();
    bool read_input();
    void forget_input();
    std::int16_t heard_sample(std::int64_t frame, int channel) const;

    // On the thread:
    static void run(void* port);
    void keep_what_came();
    void keep(const std::int16_t* samples, long count);
    void finish_file();

    const char* output_wish = nullptr;
    const char* input_wish = nullptr;
    char output[longest_path] = {};

    std::atomic<Phase> phase = Phase::Waiting;
    std::atomic<bool> is_released = false;
    std::atomic<bool> has_failed = false;
    std::atomic<int> output_channels = 1;
    std::atomic<long> output_rate = 0;
    zt_platform::AudioQueue spool;
    zt_platform::QuietThread thread;
    std::unique_ptr<zt_platform::NewFile> file;
    std::uint64_t bytes_kept = 0;

    std::int16_t* input = nullptr; ///< Mapped.
    std::int64_t input_frames = 0;
    int input_channels = 1;
    std::int64_t heard_frames = 0;
};

} // namespace zt_sound

#endif
