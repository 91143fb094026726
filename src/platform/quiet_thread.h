#ifndef ZT_PLATFORM_QUIET_THREAD_H
#define ZT_PLATFORM_QUIET_THREAD_H

/// \file
/// Threads of the library's own that the host does not notice: no signal is
/// ever handled on one, and what libraries print there goes nowhere.

#include <cstdint>

namespace zt_platform {

/// One thread, started and waited for by ordinary code.
class QuietThread
{
public:
    enum class Output : int {
        Shared = 0, ///< Open files are those of the process.
        Away = 1    ///< The thread has open files of its own: at first only
                    ///< an empty input, and outputs that go nowhere.
    };

    constexpr QuietThread() = default;
    QuietThread(const QuietThread&) = delete;
    QuietThread& operator=(const QuietThread&) = delete;

    /// Calls `work(data)` on a new thread. It and all threads that it starts
    /// hold every signal back, but for those that report a fault.
    ///
    /// Requires: it does not run.
    /// Returns:  false when there is no thread to be had.
    bool start(void (*work)(void*), void* data, Output output);

    /// Tells whether it was started and not joined. In a child that was forked
    /// off meanwhile it was not.
    bool runs() const;

    /// Waits for its end. Nothing if it does not run.
    void join();

private:
    std::uintptr_t thread = 0;
    long process = 0; ///< Which started it; 0 for none.
};

/// Sends what the calling thread writes to standard error nowhere, until its
/// end. On a thread whose output is away that is nothing; elsewhere, where the
/// system cannot tell threads apart, it concerns the whole process.
class StandardErrorAway
{
public:
    StandardErrorAway();
    ~StandardErrorAway();
    StandardErrorAway(const StandardErrorAway&) = delete;
    StandardErrorAway& operator=(const StandardErrorAway&) = delete;

private:
    int kept; ///< The real one; -1 for none.
};

} // namespace zt_platform

#endif
