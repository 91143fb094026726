#ifndef ZT_TESTS_IMAGE_FRAME_SERVER_H
#define ZT_TESTS_IMAGE_FRAME_SERVER_H

#include <cstddef>
#include <functional>
#include <string>
#include <thread>

/// A frame store on an address of this machine, port 5333, that does with its
/// one client what the test says.
///
/// What passes between them is cut into small pieces: segments of 536 bytes and
/// a buffer of 4 kB here. So nobody can write or read all at once.
class FrameServer
{
public:
    /// The client, as the server sees it.
    class Client
    {
    public:
        explicit Client(int connected_socket) : socket(connected_socket) {}

        /// Reads until so many bytes are there or the client has closed.
        ///
        /// Units: `at_once` in bytes, `pause` in milliseconds after each read.
        std::string Read(std::size_t bytes, std::size_t at_once = 65536,
                         int pause = 0);

        void Send(const std::string& bytes);

        /// Ends what is sent, so that the other side sees an end.
        void EndSending();

        /// Sends nothing more and waits for the client to close. What comes
        /// until then is given.
        std::string Finish();

        /// Ends the connection as a machine does that has gone down.
        void Reset();

        /// Tells whether the client closes or sends within so many
        /// milliseconds.
        bool Stirs(int milliseconds);

    private:
        int socket;
    };

    using Behaviour = std::function<void(Client& client)>;

    /// Waits for a client on a thread of its own, has `behaviour` treat it,
    /// and closes.
    explicit FrameServer(Behaviour behaviour);

    /// Waits for the behaviour to end; without a client it never began.
    ~FrameServer();
    FrameServer(const FrameServer&) = delete;
    FrameServer& operator=(const FrameServer&) = delete;

    /// Gives its address in dotted form.
    const std::string& Address() const { return address; }

private:
    void serve(const Behaviour& behaviour) const;

    int listener;
    std::string address;
    std::thread thread;
};

/// Gives an address of this machine in dotted form where nobody listens on
/// port 5333.
std::string AddressWithoutServer();

#endif
