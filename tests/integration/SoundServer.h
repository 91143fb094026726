#ifndef ZT_TESTS_INTEGRATION_SOUNDSERVER_H
#define ZT_TESTS_INTEGRATION_SOUNDSERVER_H

#include <cstdint>
#include <mutex>
#include <string>
#include <sys/types.h>
#include <thread>
#include <vector>

#include "support/TempDir.h"

/// A sound server of the test's own, whose only device plays into a pipe and
/// records from one, in real time; it is there, and the one that this process
/// finds, while this lives. It dies with the process in any case.
class SoundServer
{
public:
    static constexpr long rate = 44100; ///< Of its device, which is mono.

    SoundServer();
    ~SoundServer();
    SoundServer(const SoundServer&) = delete;
    SoundServer& operator=(const SoundServer&) = delete;

    /// Tells whether it has started.
    bool Runs() const { return runs; }

    /// Gives what has been played so far, but for silence.
    std::vector<std::int16_t> Played();

    /// Has the device hear these samples, again and again.
    void Hear(const std::vector<std::int16_t>& samples);

    /// Ends it, as if it had died.
    void Kill();

private:
    void ReadOutput();
    void WriteInput();

    TempDir folder;
    pid_t process = -1;
    bool runs = false;
    int output = -1;
    int input = -1;
    int stop_ends[2] = {-1, -1}; ///< A pipe whose closing ends the threads.
    std::mutex mutex;
    std::vector<std::int16_t> played;
    std::vector<std::int16_t> heard;
    std::thread reader;
    std::thread writer;
};

#endif
