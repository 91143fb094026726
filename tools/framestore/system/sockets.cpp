#include "system/sockets.h"

#include <arpa/inet.h>
#include <cerrno>
#include <cstring>
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>
#include <utility>

namespace framestore {

Socket::~Socket()
{
    if (descriptor >= 0)
        close(descriptor);
}

Socket::Socket(Socket&& other) noexcept
    : descriptor(std::exchange(other.descriptor, -1))
{}

Socket& Socket::operator=(Socket&& other) noexcept
{
    std::swap(descriptor, other.descriptor);
    return *this;
}

Socket::Received Socket::Receive(char* to, std::size_t most)
{
    const ssize_t got = recv(descriptor, to, most, 0);
    if (got > 0)
        return {static_cast<std::size_t>(got), false};
    const bool later =
        got < 0 && (errno == EAGAIN || errno == EWOULDBLOCK || errno == EINTR);
    return {0, !later};
}

void Socket::SendLast(const char* bytes, std::size_t count)
{
    // So few bytes always find room in a connection that was not written to.
    // Where they do not arrive the client knows that something went wrong.
    [[maybe_unused]] const ssize_t sent =
        send(descriptor, bytes, count, MSG_NOSIGNAL);
    shutdown(descriptor, SHUT_WR);
}

Socket Listen(const std::string& address, int& port, std::string& why)
{
    sockaddr_in own = {};
    own.sin_family = AF_INET;
    own.sin_port = htons(static_cast<std::uint16_t>(port));
    socklen_t bytes = sizeof own;
    if (inet_pton(AF_INET, address.c_str(), &own.sin_addr) != 1) {
        why = "it is no address in dotted form";
        return Socket();
    }
    Socket listener(
        socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    const int yes = 1;
    if (!listener.IsOpen() ||
        setsockopt(listener.Descriptor(), SOL_SOCKET, SO_REUSEADDR, &yes,
                   sizeof yes) != 0 ||
        bind(listener.Descriptor(), reinterpret_cast<sockaddr*>(&own), bytes) !=
            0 ||
        listen(listener.Descriptor(), SOMAXCONN) != 0 ||
        getsockname(listener.Descriptor(), reinterpret_cast<sockaddr*>(&own),
                    &bytes) != 0) {
        why = std::strerror(errno);
        return Socket();
    }
    port = ntohs(own.sin_port);
    return listener;
}

Accepted Accept(const Socket& listener, Socket& client, std::string& address)
{
    sockaddr_in other = {};
    socklen_t bytes = sizeof other;
    Socket accepted(accept4(listener.Descriptor(),
                            reinterpret_cast<sockaddr*>(&other), &bytes,
                            SOCK_CLOEXEC | SOCK_NONBLOCK));
    if (!accepted.IsOpen()) {
        const bool full = errno == EMFILE || errno == ENFILE ||
                          errno == ENOBUFS || errno == ENOMEM;
        return full ? Accepted::Full : Accepted::Nobody;
    }
    char text[INET_ADDRSTRLEN] = {};
    inet_ntop(AF_INET, &other.sin_addr, text, sizeof text);
    address = text;
    client = std::move(accepted);
    return Accepted::Client;
}

} // namespace framestore
