#include "server.h"

#include "system/signals.h"

#include <algorithm>
#include <iostream>

namespace framestore {

namespace {

constexpr std::size_t buffer_bytes = std::size_t{256} << 10;

/// After so long a try to accept is repeated that the system had no room for.
constexpr std::chrono::milliseconds patience(200);

} // namespace

Server::Server(const Settings& server_settings, std::ostream& server_log)
    : settings(server_settings), log(server_log), lock(settings.lock),
      buffer(buffer_bytes)
{
    std::string why;
    int port = settings.port;
    listener = Listen(settings.address, port, why);
    if (Ready())
        say("listening on " + settings.address + " port " +
            std::to_string(port));
    else
        std::cerr << "zt-framestore: cannot listen on " << settings.address
                  << " port " << port << ": " << why << "\n";
}

void Server::Run()
{
    while (StopSignal() == 0) {
        wait();
        drop_late();
        std::erase_if(clients, [](const Client& c) { return c.gone; });
        lock.Be(clients.size() >=
                static_cast<std::size_t>(settings.most_clients));
    }
    const auto unfinished =
        std::count_if(clients.begin(), clients.end(),
                      [](const Client& c) { return !c.answered; });
    clients.clear();
    lock.Be(false);
    say("stopped by signal " + std::to_string(StopSignal()) + ", " +
        std::to_string(unfinished) + " unfinished frames dropped");
}

/// Waits for clients and for what they send, and takes it.
void Server::wait()
{
    std::vector<Watched> watched;
    std::optional<Clock::time_point> deadline = full_until;
    for (const Client& client : clients) {
        watched.push_back({client.socket.Descriptor()});
        deadline =
            std::min(client.deadline, deadline.value_or(client.deadline));
    }
    // Clients that there is no room for are left waiting by the system.
    const bool accepting =
        !full_until &&
        clients.size() < static_cast<std::size_t>(settings.most_clients);
    if (accepting)
        watched.push_back({listener.Descriptor()});
    Wait(watched, deadline);

    for (std::size_t i = 0; i < clients.size(); ++i)
        if (watched[i].ready)
            read(clients[i]);
    if (accepting && watched.back().ready)
        accept_all();
    if (full_until && Clock::now() >= *full_until)
        full_until.reset();
}

void Server::accept_all()
{
    while (clients.size() < static_cast<std::size_t>(settings.most_clients)) {
        Client client;
        const Accepted accepted =
            Accept(listener, client.socket, client.address);
        if (accepted == Accepted::Full)
            full_until = Clock::now() + patience;
        if (accepted != Accepted::Client)
            return;
        client.reception = std::make_unique<Reception>(settings.storage);
        client.deadline =
            Clock::now() + std::chrono::duration_cast<Clock::duration>(
                               std::chrono::duration<double>(settings.timeout));
        clients.push_back(std::move(client));
    }
}

/// Takes what a client has sent, one buffer at most, so that the others get
/// their turn.
void Server::read(Client& client)
{
    const Socket::Received received =
        client.socket.Receive(buffer.data(), buffer.size());
    Reception& reception = *client.reception;
    if (!client.answered)
        reception.Take(buffer.data(), received.bytes);
    if (!client.answered && reception.Complete())
        finish(client);
    if (received.ended)
        drop(client, "closed", "");
}

/// Answers. The connection is closed by the client: closed from here, what it
/// may still be sending would make the system throw the answer away.
void Server::finish(Client& client)
{
    client.socket.SendLast(client.reception->Answer(), answer_bytes);
    client.answered = true;
    say(client.reception->Line(client.address));
}

/// Gives up clients whose time is over.
void Server::drop_late()
{
    const Clock::time_point now = Clock::now();
    for (Client& client : clients)
        if (!client.gone && client.deadline <= now)
            drop(client, "given up", ", it takes too long");
}

/// Ends a connection, and then says so if that was too early.
void Server::drop(Client& client, const char* end, const char* why)
{
    const std::size_t count = client.reception->Count();
    client.reception.reset();
    client.socket = Socket();
    client.gone = true;
    if (!client.answered)
        say(client.address + ": " + end + " after " + std::to_string(count) +
            " of " + std::to_string(message_bytes) + " bytes" + why);
}

void Server::say(const std::string& line)
{
    log << line + "\n" << std::flush;
}

} // namespace framestore
