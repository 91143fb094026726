#include "platform/socket.h"

#include <arpa/inet.h>
#include <cerrno>
#include <cstring>
#include <netdb.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

namespace zt_platform {

namespace {

/// Waits for a connection that is being made and was left alone by a signal.
///
/// Returns: whether it was made; if not, `errno` says why.
bool finish_connecting(int handle)
{
    pollfd made = {handle, POLLOUT, 0};
    int ready;
    do
        ready = ::poll(&made, 1, -1);
    while (ready < 0 && errno == EINTR);
    if (ready < 0)
        return false;
    int fault = 0;
    socklen_t bytes = sizeof fault;
    if (::getsockopt(handle, SOL_SOCKET, SO_ERROR, &fault, &bytes) != 0)
        return false;
    errno = fault;
    return fault == 0;
}

class PosixSockets final : public Sockets
{
public:
    int open() override
    {
        return ::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    }

    bool find_host(const char* name, HostAddress& address) override
    {
        // The resolver would go and ask the network who has no name.
        const hostent* host = name && *name ? ::gethostbyname(name) : nullptr;
        if (!host || host->h_addrtype != AF_INET ||
            host->h_length != sizeof address.bytes || !host->h_addr_list[0])
            return false;
        std::memcpy(address.bytes, host->h_addr_list[0], sizeof address.bytes);
        return true;
    }

    bool connect(int handle, const HostAddress& address,
                 std::uint16_t port) override
    {
        sockaddr_in to = {};
        to.sin_family = AF_INET;
        to.sin_port = htons(port);
        std::memcpy(&to.sin_addr, address.bytes, sizeof address.bytes);
        if (::connect(handle, reinterpret_cast<const sockaddr*>(&to),
                      sizeof to) == 0)
            return true;
        // It goes on by itself; a second call would be refused.
        return errno == EINTR && finish_connecting(handle);
    }

    std::ptrdiff_t send(int handle, const void* from,
                        std::size_t bytes) override
    {
        return ::send(handle, from, bytes, MSG_NOSIGNAL);
    }

    std::ptrdiff_t receive(int handle, void* to, std::size_t bytes) override
    {
        return ::recv(handle, to, bytes, 0);
    }

    void close(int handle) override
    {
        // An interrupted close has closed.
        ::close(handle);
    }

    void own_name(char (&name)[host_name_bytes]) override
    {
        std::memset(name, 0, sizeof name);
        // What does not fit may come without its end, or not at all.
        if (::gethostname(name, sizeof name - 1) != 0 && errno != ENAMETOOLONG)
            std::memset(name, 0, sizeof name);
    }
};

constinit PosixSockets posix_sockets;
constinit Sockets* installed = nullptr;

} // namespace

Sockets& Sockets::current()
{
    return installed ? *installed : posix_sockets;
}

Sockets& Sockets::system()
{
    return posix_sockets;
}

Sockets* Sockets::install(Sockets* other)
{
    Sockets* before = installed;
    installed = other;
    return before;
}

} // namespace zt_platform
