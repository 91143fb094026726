#include "platform/socket.h"

#include <cerrno>

namespace zt_platform {

Connection::Connection() : handle(Sockets::current().open()) {}

Connection::~Connection()
{
    if (is_open())
        Sockets::current().close(handle);
}

bool Connection::connect(const HostAddress& address, std::uint16_t port)
{
    return is_open() && Sockets::current().connect(handle, address, port);
}

bool Connection::send(const void* from, std::size_t bytes)
{
    const char* next = static_cast<const char*>(from);
    while (bytes > 0) {
        const std::ptrdiff_t sent =
            Sockets::current().send(handle, next, bytes);
        if (sent < 0 && errno == EINTR)
            continue;
        if (sent <= 0)
            return false;
        next += sent;
        bytes -= static_cast<std::size_t>(sent);
    }
    return true;
}

bool Connection::receive(void* to, std::size_t bytes)
{
    char* next = static_cast<char*>(to);
    while (bytes > 0) {
        const std::ptrdiff_t got =
            Sockets::current().receive(handle, next, bytes);
        if (got < 0 && errno == EINTR)
            continue;
        if (got <= 0)
            return false;
        next += got;
        bytes -= static_cast<std::size_t>(got);
    }
    return true;
}

} // namespace zt_platform
