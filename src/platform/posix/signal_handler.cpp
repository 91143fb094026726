#include "platform/signal_handler.h"

#include <cerrno>
#include <signal.h>
#include <unistd.h>

#include "platform/posix/signal_set.h"

namespace zt_platform {

namespace {

class PosixSignalHandlers final : public SignalHandlers
{
public:
    SignalFunction set(int signal, SignalFunction handler) override
    {
        struct sigaction wanted = {};
        struct sigaction before = {};
        wanted.sa_handler = handler;
        wanted.sa_flags = SA_RESTART;
        sigemptyset(&wanted.sa_mask);
        return sigaction(signal, &wanted, &before) == 0 ? before.sa_handler
                                                        : SIG_ERR;
    }

    SignalFunction by_default() override { return SIG_DFL; }
};

constinit PosixSignalHandlers posix_handlers;
constinit SignalHandlers* installed = nullptr;

} // namespace

SignalHandlers& SignalHandlers::current()
{
    return installed ? *installed : posix_handlers;
}

SignalHandlers* SignalHandlers::install(SignalHandlers* other)
{
    SignalHandlers* const before = installed;
    installed = other;
    return before;
}

SignalsHeld::SignalsHeld()
{
    static_assert(sizeof(sigset_t) <= mask_bytes);
    const sigset_t held = all_but_faults();
    pthread_sigmask(SIG_BLOCK, &held, reinterpret_cast<sigset_t*>(before));
}

SignalsHeld::~SignalsHeld()
{
    pthread_sigmask(SIG_SETMASK, reinterpret_cast<sigset_t*>(before), nullptr);
}

ErrnoKept::ErrnoKept() : kept(errno) {}

ErrnoKept::~ErrnoKept()
{
    errno = kept;
}

void write_standard_error(std::string_view text)
{
    const ErrnoKept errno_kept;
    while (!text.empty()) {
        const ssize_t went = write(STDERR_FILENO, text.data(), text.size());
        if (went < 0 && errno == EINTR)
            continue;
        if (went <= 0)
            return;
        text.remove_prefix(static_cast<std::size_t>(went));
    }
}

} // namespace zt_platform
