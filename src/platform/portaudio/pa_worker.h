#ifndef ZT_PLATFORM_PORTAUDIO_PA_WORKER_H
#define ZT_PLATFORM_PORTAUDIO_PA_WORKER_H

/// \file
/// The thread on which everything happens that the PortAudio library is asked
/// for, so that its threads, signals and messages are no concern of the host's.

#include <condition_variable>
#include <mutex>

#include "platform/quiet_thread.h"

namespace zt_platform {

/// A thread that does one thing at a time for a client who waits, and looks
/// after its things in between.
class PaWorker
{
public:
    using Work = void (*)(void* data);

    /// Will call `tend_all(its_data)` on the thread every so often while that
    /// returns true, and after every call that was made for a client; and
    /// `finish_all(its_data)` last.
    PaWorker(bool (*tend_all)(void*), void (*finish_all)(void*), void* its_data)
        : tend(tend_all), finish(finish_all), tended(its_data)
    {}

    /// Calls `work(data)` on the thread and waits until it is done. The first
    /// call starts the thread.
    ///
    /// Returns: false if there is no thread; then nothing was called.
    /// Context: client code, from one thread at a time.
    bool call(Work work, void* data);

    /// Ends the thread, once nothing is left to tend.
    void end();

private:
    static void run(void* worker);
    void loop();

    bool (*tend)(void*);
    void (*finish)(void*);
    void* tended;
    QuietThread thread;
    std::mutex mutex;
    std::condition_variable changed;
    Work work_to_do = nullptr;
    void* work_data = nullptr;
    bool is_ending = false;
};

} // namespace zt_platform

#endif
