#ifndef ZT_FRAMESTORE_SYSTEM_SIGNALS_H
#define ZT_FRAMESTORE_SYSTEM_SIGNALS_H

/// \file
/// Interrupt, termination and hang-up, which stop the server between two steps
/// of its work.

#include <chrono>
#include <optional>
#include <vector>

namespace framestore {

/// Has the signals that stop noted instead of obeyed; they arrive during
/// `Wait` only. Clients that go away and files that grow too large make calls
/// fail from now on, they end nothing.
void CatchSignals();

/// Gives the signal that asks the server to stop, 0 if there is none.
int StopSignal();

/// A descriptor that is watched for input.
struct Watched
{
    int descriptor;
    bool ready = false; ///< It has input, or has ended.
};

/// Waits until one of the descriptors is ready, the deadline has passed or a
/// signal was caught. One that came before is not missed.
void Wait(std::vector<Watched>& watched,
          const std::optional<std::chrono::steady_clock::time_point>& deadline);

} // namespace framestore

#endif
