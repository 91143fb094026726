#ifndef ZT_FRAMESTORE_SERVER_H
#define ZT_FRAMESTORE_SERVER_H

/// \file
/// The server: takes frames from several clients at once, one for each
/// connection, all in one thread.

#include "reception.h"
#include "system/lock_file.h"
#include "system/sockets.h"

#include <chrono>
#include <memory>
#include <optional>
#include <ostream>
#include <string>
#include <vector>

namespace framestore {

/// What the command line settles.
struct Settings
{
    std::string address = "127.0.0.1";
    int port = 5333; ///< 0 has the system choose.
    Storage storage;
    std::string lock; ///< Empty for none.
    int most_clients = 16;
    double timeout = 60; ///< Seconds that a client may take for everything.
};

/// Listens from its making on. A client takes about a kilobyte of memory,
/// whatever it sends: frames are written as they come.
class Server
{
public:
    /// Requires: `server_settings` and `server_log` outlive the server.
    /// Reports:  prints a line if it cannot listen; `Ready` is then false.
    Server(const Settings& server_settings, std::ostream& server_log);
    Server(const Server&) = delete;
    Server& operator=(const Server&) = delete;

    bool Ready() const { return listener.IsOpen(); }

    /// Serves until a signal asks it to stop. Frames that are not complete
    /// then leave nothing behind.
    void Run();

private:
    using Clock = std::chrono::steady_clock;

    struct Client
    {
        Socket socket;
        std::string address;
        std::unique_ptr<Reception> reception;
        Clock::time_point deadline;
        bool answered = false; ///< Only its closing is waited for.
        bool gone = false;
    };

    void wait();
    void accept_all();
    void read(Client& client);
    void finish(Client& client);
    void drop_late();
    void drop(Client& client, const char* end, const char* why);
    void say(const std::string& line);

    const Settings& settings;
    std::ostream& log;
    Socket listener;
    LockFile lock;
    std::vector<Client> clients;
    std::vector<char> buffer;                    ///< For all clients in turn.
    std::optional<Clock::time_point> full_until; ///< The system had no room.
};

} // namespace framestore

#endif
