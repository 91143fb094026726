#ifndef ZTSH_SYSTEM_WAITING_H
#define ZTSH_SYSTEM_WAITING_H

/// \file
/// Sleep that no signal is missed in.
///
/// The beat cuts every wait of the system short, 250 times a second, and what
/// its handler has marked a moment before the wait would be overlooked by one
/// that simply began. So signals are held back until the wait has begun.

#include <chrono>
#include <functional>
#include <optional>

namespace ztsh {

/// What ended a sleep.
enum class Woken { Input, Deadline, Signal };

/// Sleeps until the file descriptor has input or has ended, until the deadline
/// has passed, or until a signal was handled; not at all if `awake` says so
/// while signals are held back.
///
/// Units: `descriptor` below 0 is none.
Woken Sleep(
    int descriptor,
    const std::optional<std::chrono::steady_clock::time_point>& deadline,
    const std::function<bool()>& awake);

} // namespace ztsh

#endif
