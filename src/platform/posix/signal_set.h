#ifndef ZT_PLATFORM_POSIX_SIGNAL_SET_H
#define ZT_PLATFORM_POSIX_SIGNAL_SET_H

/// \file
/// The set of signals that the beat and the code which shares data with it
/// hold back.

#include <initializer_list>
#include <signal.h>

namespace zt_platform {
/// Gives every signal but those that report a fault of the running
/// instruction, which cannot wait.
inline sigset_t all_but_faults()
{
    sigset_t set;
    sigfillset(&set);
    for (const int fault : {SIGBUS, SIGFPE, SIGILL, SIGSEGV, SIGTRAP})
        sigdelset(&set, fault);
    return set;
}
} // namespace zt_platform

#endif
