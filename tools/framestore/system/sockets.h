#ifndef ZT_FRAMESTORE_SYSTEM_SOCKETS_H
#define ZT_FRAMESTORE_SYSTEM_SOCKETS_H

/// \file
/// TCP sockets that never wait.

#include <cstddef>
#include <string>

namespace framestore {

/// A socket, closed at the end of its scope.
class Socket
{
public:
    explicit Socket(int owned_descriptor = -1) : descriptor(owned_descriptor) {}
    ~Socket();
    Socket(Socket&& other) noexcept;
    Socket& operator=(Socket&& other) noexcept;

    bool IsOpen() const { return descriptor >= 0; }
    int Descriptor() const { return descriptor; }

    /// What came of reading.
    struct Received
    {
        std::size_t bytes; ///< How many came.
        bool ended;        ///< No more will ever come.
    };

    /// Reads what is there, at most `most` bytes.
    Received Receive(char* to, std::size_t most);

    /// Sends a few bytes, and nothing more after them.
    void SendLast(const char* bytes, std::size_t count);

private:
    int descriptor;
};

/// Listens on an address in dotted form and a port.
///
/// Units:   `port` 0 has the system choose one; it is then that one.
/// Returns: a socket that is not open, with `why` set, if it cannot be done.
Socket Listen(const std::string& address, int& port, std::string& why);

/// What came of accepting a connection.
enum class Accepted {
    Client, ///< There is one.
    Nobody, ///< There is none now.
    Full,   ///< The system has no room for one now.
};

/// Accepts a connection.
///
/// Returns: what came of it; of a client its socket and address in dotted form.
Accepted Accept(const Socket& listener, Socket& client, std::string& address);

} // namespace framestore

#endif
