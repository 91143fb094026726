#include "support/FakeSockets.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

#include <gtest/gtest.h>

namespace {
constexpr int handle_given = 77;
}

FakeSockets::FakeSockets() : before(install(this)) {}

FakeSockets::~FakeSockets()
{
    install(before);
}

int FakeSockets::open()
{
    errno = EMFILE;
    if (opens_fail)
        return -1;
    ++opened;
    return handle_given;
}

bool FakeSockets::find_host(const char* host, zt_platform::HostAddress& address)
{
    asked_host = host;
    if (host_is_known)
        address = {{127, 0, 0, 1}};
    return host_is_known;
}

bool FakeSockets::connect(int handle, const zt_platform::HostAddress&,
                          std::uint16_t port)
{
    EXPECT_EQ(handle, handle_given);
    asked_port = port;
    errno = ECONNREFUSED;
    return !connects_fail;
}

std::ptrdiff_t FakeSockets::send(int handle, const void* from,
                                 std::size_t bytes)
{
    EXPECT_EQ(handle, handle_given);
    if (interrupt())
        return -1;
    errno = EPIPE;
    if (sent.size() >= send_ends)
        return -1;
    const std::size_t part = std::min(part_of(bytes), send_ends - sent.size());
    sent.append(static_cast<const char*>(from), part);
    return static_cast<std::ptrdiff_t>(part);
}

std::ptrdiff_t FakeSockets::receive(int handle, void* to, std::size_t bytes)
{
    EXPECT_EQ(handle, handle_given);
    if (interrupt())
        return -1;
    errno = ECONNRESET;
    if (answered == answer.size())
        return receive_fails ? -1 : 0;
    const std::size_t part = std::min(part_of(bytes), answer.size() - answered);
    std::memcpy(to, answer.data() + answered, part);
    answered += part;
    return static_cast<std::ptrdiff_t>(part);
}

void FakeSockets::close(int handle)
{
    EXPECT_EQ(handle, handle_given);
    ++closed;
}

void FakeSockets::own_name(char (&own)[zt_platform::host_name_bytes])
{
    std::memset(own, 0, sizeof own);
    name.copy(own, sizeof own - 1);
}

bool FakeSockets::interrupt()
{
    next_goes_through = !next_goes_through;
    errno = EINTR;
    return interrupts && next_goes_through;
}

std::size_t FakeSockets::part_of(std::size_t bytes) const
{
    return std::min(bytes, most_at_once);
}
