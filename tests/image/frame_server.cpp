#include "image/frame_server.h"

#include <arpa/inet.h>
#include <cerrno>
#include <csignal>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <random>
#include <sys/socket.h>
#include <unistd.h>

#include <gtest/gtest.h>

namespace {

constexpr std::uint16_t port = 5333;
constexpr int segment_bytes = 536;
constexpr int buffer_bytes = 4096;

/// Any address of this machine: tests that run at the same time do not meet.
sockaddr_in AnyAddress()
{
    static std::random_device device;
    sockaddr_in address = {};
    address.sin_family = AF_INET;
    address.sin_port = htons(port);
    address.sin_addr.s_addr = htonl(0x7F010000 + device() % 0xFC0000 + 1);
    return address;
}

std::string TextOf(const sockaddr_in& address)
{
    char text[INET_ADDRSTRLEN] = {};
    inet_ntop(AF_INET, &address.sin_addr, text, sizeof text);
    return text;
}

void Pause(int milliseconds)
{
    if (milliseconds > 0)
        poll(nullptr, 0, milliseconds);
}

} // namespace

std::string FrameServer::Client::Read(std::size_t bytes, std::size_t at_once,
                                      int pause)
{
    std::string all;
    while (all.size() < bytes) {
        std::string part(std::min(at_once, bytes - all.size()), '\0');
        const ssize_t got = recv(socket, part.data(), part.size(), 0);
        if (got <= 0)
            break;
        all.append(part, 0, static_cast<std::size_t>(got));
        Pause(pause);
    }
    return all;
}

void FrameServer::Client::Send(const std::string& bytes)
{
    const ssize_t sent = send(socket, bytes.data(), bytes.size(), MSG_NOSIGNAL);
    EXPECT_EQ(sent, static_cast<ssize_t>(bytes.size()));
}

void FrameServer::Client::EndSending()
{
    shutdown(socket, SHUT_WR);
}

std::string FrameServer::Client::Finish()
{
    EndSending();
    return Read(std::string::npos);
}

void FrameServer::Client::Reset()
{
    const linger at_once = {1, 0};
    setsockopt(socket, SOL_SOCKET, SO_LINGER, &at_once, sizeof at_once);
}

bool FrameServer::Client::Stirs(int milliseconds)
{
    pollfd wait = {socket, POLLIN, 0};
    return poll(&wait, 1, milliseconds) > 0;
}

FrameServer::FrameServer(Behaviour behaviour)
    : listener(socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0))
{
    // What is set here holds for the connections that are accepted.
    setsockopt(listener, SOL_SOCKET, SO_RCVBUF, &buffer_bytes,
               sizeof buffer_bytes);
    setsockopt(listener, IPPROTO_TCP, TCP_MAXSEG, &segment_bytes,
               sizeof segment_bytes);
    sockaddr_in own = AnyAddress();
    while (bind(listener, reinterpret_cast<sockaddr*>(&own), sizeof own) != 0 &&
           errno == EADDRINUSE)
        own = AnyAddress();
    EXPECT_EQ(listen(listener, 1), 0);
    address = TextOf(own);

    // The beat is not for the server.
    sigset_t all;
    sigset_t before;
    sigfillset(&all);
    pthread_sigmask(SIG_BLOCK, &all, &before);
    thread =
        std::thread([this, treat = std::move(behaviour)] { serve(treat); });
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

FrameServer::~FrameServer()
{
    // Wakes a server that still waits for its client.
    shutdown(listener, SHUT_RDWR);
    thread.join();
    close(listener);
}

void FrameServer::serve(const Behaviour& behaviour) const
{
    const int connected = accept(listener, nullptr, nullptr);
    if (connected < 0)
        return;
    Client client(connected);
    behaviour(client);
    close(connected);
}

std::string AddressWithoutServer()
{
    return TextOf(AnyAddress());
}
