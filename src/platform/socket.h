#ifndef ZT_PLATFORM_SOCKET_H
#define ZT_PLATFORM_SOCKET_H

/// \file
/// The door to servers: one TCP connection at a time, opened by a host's name
/// and a port, with writes and reads that no interruption and no short
/// transfer can cut.
///
/// `Sockets` is the seam: one call of the system each, with its faults. Rooms
/// use `Connection`, which retries and completes. Nothing here ever gives up
/// because of the time it takes.

#include <cstddef>
#include <cstdint>

namespace zt_platform {

/// The address of a host, its bytes in the order in which they are written.
struct HostAddress
{
    unsigned char bytes[4];
};

/// So much of a host's name is told to others, the closing NUL included.
constexpr std::size_t host_name_bytes = 64;

/// The system's socket calls. Handles count from 0, -1 is none.
class Sockets
{
public:
    /// Makes a socket for a TCP connection; programs that the process starts
    /// do not inherit it.
    ///
    /// Returns: a handle, or -1 with `errno` set.
    virtual int open() = 0;

    /// Looks up a host by its name, or by its address in dotted form.
    ///
    /// Returns: false if there is none of that name; `address`, which else is
    ///          its first one, is untouched then.
    virtual bool find_host(const char* name, HostAddress& address) = 0;

    /// Connects, however long it takes and however often it is interrupted.
    ///
    /// Returns: false with `errno` set if there is no connection now.
    virtual bool connect(int handle, const HostAddress& address,
                         std::uint16_t port) = 0;

    /// Writes once. A connection that the other side has closed is a fault,
    /// never a signal.
    ///
    /// Returns: how many bytes went, at least one, perhaps fewer than asked
    ///          for; -1 with `errno` set.
    virtual std::ptrdiff_t send(int handle, const void* from,
                                std::size_t bytes) = 0;

    /// Reads once, waiting for the first byte.
    ///
    /// Returns: how many bytes came, fewer than asked for at any time, 0 when
    ///          the other side has closed; -1 with `errno` set.
    virtual std::ptrdiff_t receive(int handle, void* to, std::size_t bytes) = 0;

    /// Closes the handle, which is gone afterwards in any case.
    virtual void close(int handle) = 0;

    /// Gives this machine's own name, cut to what there is room for; the rest
    /// is zeros, at least one of them.
    virtual void own_name(char (&name)[host_name_bytes]) = 0;

    /// Gives the calls in use: the system's, or those that a test installed.
    static Sockets& current();

    /// Gives the system's, for stand-ins that replace only a part of them.
    static Sockets& system();

    /// Installs other calls; null restores the system's.
    ///
    /// Owner:   the caller, who installs others before destroying them.
    /// Returns: what was installed before, null for the system's.
    static Sockets* install(Sockets* other);

protected:
    ~Sockets() = default;
};

/// A TCP connection, closed at the end of its scope.
class Connection
{
public:
    /// Makes the socket; nothing is connected yet.
    Connection();
    ~Connection();
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    /// Tells whether there is a socket.
    bool is_open() const { return handle >= 0; }

    /// Connects to a host; see `Sockets::connect`.
    bool connect(const HostAddress& address, std::uint16_t port);

    /// Writes all the bytes; interruptions are retried.
    ///
    /// Returns: false when a fault stopped it.
    bool send(const void* from, std::size_t bytes);

    /// Reads so many bytes; interruptions are retried.
    ///
    /// Returns: false when the other side closed before, or a fault stopped
    ///          it; what came until then is in `to`.
    bool receive(void* to, std::size_t bytes);

private:
    int handle;
};

} // namespace zt_platform

#endif
