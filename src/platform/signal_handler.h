#ifndef ZT_PLATFORM_SIGNAL_HANDLER_H
#define ZT_PLATFORM_SIGNAL_HANDLER_H

/// \file
/// Signals: who gets one, how ordinary code keeps them out for a few
/// instructions, and the little that code inside a signal may do.
///
/// Everything here may run in a signal: nothing allocates, locks or touches a
/// stream.

#include <cstddef>
#include <string_view>

namespace zt_platform {

/// What a signal is sent to. Default, ignored and failure are the system's own
/// special values of this type.
using SignalFunction = void (*)(int);

/// The system's calls that send a signal somewhere.
class SignalHandlers
{
public:
    /// Sends `signal` to `handler` until another is set. The signal is held
    /// back while the handler runs, and interrupted system calls go on.
    ///
    /// Returns: the handler before; the failure value with `errno` set for a
    ///          signal that cannot be caught.
    virtual SignalFunction set(int signal, SignalFunction handler) = 0;

    /// Gives the value that puts a signal back to the system's default.
    virtual SignalFunction by_default() = 0;

    /// Gives the calls in use: the system's, or those that a test installed.
    static SignalHandlers& current();

    /// Installs other calls; null restores the system's.
    ///
    /// Owner:   the caller, who installs others before destroying them.
    /// Returns: what was installed before, null for the system's.
    static SignalHandlers* install(SignalHandlers* other);

protected:
    ~SignalHandlers() = default;
};

/// Holds every signal back from this thread while it lives, but for those that
/// report a fault of the running instruction. What was held back before stays
/// so afterwards.
class SignalsHeld
{
public:
    SignalsHeld();
    ~SignalsHeld();
    SignalsHeld(const SignalsHeld&) = delete;
    SignalsHeld& operator=(const SignalsHeld&) = delete;

private:
    static constexpr std::size_t mask_bytes = 128;
    alignas(long) unsigned char before[mask_bytes];
};

/// Keeps `errno` as it was for the code that a signal interrupted.
class ErrnoKept
{
public:
    ErrnoKept();
    ~ErrnoKept();
    ErrnoKept(const ErrnoKept&) = delete;
    ErrnoKept& operator=(const ErrnoKept&) = delete;

private:
    int kept;
};

/// Writes `text` to standard error, past every stream.
void write_standard_error(std::string_view text);

} // namespace zt_platform

#endif
