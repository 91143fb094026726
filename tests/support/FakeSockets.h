#ifndef ZT_TESTS_FAKESOCKETS_H
#define ZT_TESTS_FAKESOCKETS_H

#include "platform/socket.h"

#include <cstddef>
#include <cstdint>
#include <string>

/// A server that exists in the test only, with faults of the test's choice; in
/// use while it lives. It allocates nothing once `Expect` was called.
class FakeSockets : public zt_platform::Sockets
{
public:
    static constexpr std::size_t never = ~std::size_t{0};

    FakeSockets();
    ~FakeSockets();
    FakeSockets(const FakeSockets&) = delete;
    FakeSockets& operator=(const FakeSockets&) = delete;

    int open() override;
    bool find_host(const char* name,
                   zt_platform::HostAddress& address) override;
    bool connect(int handle, const zt_platform::HostAddress& address,
                 std::uint16_t port) override;
    std::ptrdiff_t send(int handle, const void* from,
                        std::size_t bytes) override;
    std::ptrdiff_t receive(int handle, void* to, std::size_t bytes) override;
    void close(int handle) override;
    void own_name(char (&name)[zt_platform::host_name_bytes]) override;

    /// Makes room for a message of so many bytes.
    void Expect(std::size_t bytes) { sent.reserve(bytes); }

    bool opens_fail = false;
    bool host_is_known = true;
    bool connects_fail = false;
    bool interrupts = false; ///< Whether every other transfer fails first.
    std::size_t most_at_once = never; ///< Bytes a call transfers.
    std::size_t send_ends = never;    ///< Writes from here on fail.
    bool receive_fails = false;       ///< Behind the answer, else it ends.
    std::string answer{"OK\0\0", 4};
    std::string name{"workstation"}; ///< At most 63 characters.

    std::string sent;       ///< What was written.
    std::string asked_host; ///< What was looked up last.
    std::uint16_t asked_port = 0;
    int opened = 0;
    int closed = 0;
    std::size_t answered = 0; ///< Bytes of the answer that were read.

private:
    bool interrupt();
    std::size_t part_of(std::size_t bytes) const;

    zt_platform::Sockets* before;
    bool next_goes_through = false;
};

#endif
