// How fast do frames get through a connection to the disk of the frame-store
// server, against a plain socket that copies the same bytes to files?
//
// Both write into the directory for temporary files: either each frame to a new
// file, as the frames of a sequence are, which are removed now and then while
// the clock stands still; or each over the one before, which has the system
// send the former to the disk first.

#include <KVO/KvoPrefs.h>
#include <ZT/image_sgi.h>

#include <arpa/inet.h>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <iostream>
#include <netinet/in.h>
#include <random>
#include <spawn.h>
#include <string>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

#include <benchmark/benchmark.h>

#include "require.h"

namespace {

constexpr std::size_t message_bytes = 699908;
constexpr std::size_t frame_bytes = 699840;
constexpr std::uint16_t port = 5333;
constexpr int kept_frames = 16;

/// Where a frame goes.
enum class Files { New, Same };

/// A server in a process of its own, on an address of its own, writing to a
/// directory that goes at the end.
class Server
{
public:
    explicit Server(Files frame_files) : files(frame_files)
    {
        std::string pattern =
            (std::filesystem::temp_directory_path() / "zt_bench_XXXXXX")
                .string();
        directory = mkdtemp(pattern.data());
        std::random_device random;
        own.sin_family = AF_INET;
        own.sin_port = htons(port);
        own.sin_addr.s_addr = htonl(0x7F010000 + random() % 0xFC0000 + 1);
        char text[INET_ADDRSTRLEN] = {};
        inet_ntop(AF_INET, &own.sin_addr, text, sizeof text);
        address = text;
    }

    ~Server()
    {
        kill(process, SIGTERM);
        waitpid(process, nullptr, 0);
        std::filesystem::remove_all(directory);
    }
    Server(const Server&) = delete;
    Server& operator=(const Server&) = delete;

    /// Starts the frame-store server and waits until it listens.
    void StartFrameStore()
    {
        int log[2] = {};
        Require(pipe(log) == 0, "pipe");
        posix_spawn_file_actions_t actions;
        posix_spawn_file_actions_init(&actions);
        posix_spawn_file_actions_adddup2(&actions, log[1], 1);
        const char* const words[] = {"zt-framestore",   "--listen",
                                     address.c_str(),   "--directory",
                                     directory.c_str(), nullptr};
        Require(posix_spawn(&process, ZT_FRAMESTORE_PROGRAM, &actions, nullptr,
                            const_cast<char* const*>(words), environ) == 0,
                "zt-framestore");
        posix_spawn_file_actions_destroy(&actions);
        close(log[1]);
        char first = 0;
        Require(read(log[0], &first, 1) == 1, "zt-framestore");
        // Nobody reads the rest; the server does not mind.
        close(log[0]);
    }

    /// Starts a server that does no more than it must.
    void StartPlain()
    {
        const int listener = socket(AF_INET, SOCK_STREAM, 0);
        Require(bind(listener, reinterpret_cast<sockaddr*>(&own), sizeof own) ==
                        0 &&
                    listen(listener, 5) == 0,
                "listen");
        process = fork();
        if (process == 0)
            serve_plainly(listener);
        close(listener);
    }

    /// Gives the number of the next frame.
    int NextFrame() const { return files == Files::New ? frames + 1 : 1; }

    /// Makes sure now and then that the last frame is there, whole, and removes
    /// those that no other one will replace.
    void CheckFrame(benchmark::State& state, std::size_t bytes)
    {
        const int last = NextFrame();
        if (++frames % kept_frames != 0)
            return;
        state.PauseTiming();
        std::error_code none;
        Require(std::filesystem::file_size(FrameName(last), none) == bytes,
                "frame");
        for (int frame = last - kept_frames + 1;
             files == Files::New && frame <= last; ++frame)
            std::filesystem::remove(FrameName(frame));
        state.ResumeTiming();
    }

    /// Counts from 1.
    std::string FrameName(int frame) const
    {
        char name[32];
        std::snprintf(name, sizeof name, "/frame.%06d.yuv", frame);
        return directory + name;
    }

    sockaddr_in own = {};
    std::string address;

private:
    [[noreturn]] void serve_plainly(int listener) const
    {
        std::vector<char> buffer(std::size_t{256} << 10);
        for (int frame = 1;; frame += files == Files::New) {
            const int client = accept(listener, nullptr, nullptr);
            const int file = open(FrameName(frame).c_str(),
                                  O_WRONLY | O_CREAT | O_TRUNC, 0644);
            std::size_t left = message_bytes;
            while (left > 0) {
                const ssize_t got =
                    recv(client, buffer.data(), buffer.size(), 0);
                if (got <= 0 || write(file, buffer.data(),
                                      static_cast<std::size_t>(got)) != got)
                    _exit(1);
                left -= static_cast<std::size_t>(got);
            }
            close(file);
            if (send(client, "OK\0", 4, MSG_NOSIGNAL) != 4)
                _exit(1);
            close(client);
        }
    }

    const Files files;
    int frames = 0; ///< That were checked.
    pid_t process = -1;
    std::string directory;
};

/// Sends what the library says elsewhere while it lives.
class Silence
{
public:
    Silence() : kept(dup(2))
    {
        const int nothing = open("/dev/null", O_WRONLY);
        dup2(nothing, 2);
        close(nothing);
    }
    ~Silence()
    {
        dup2(kept, 2);
        close(kept);
    }
    Silence(const Silence&) = delete;
    Silence& operator=(const Silence&) = delete;

private:
    int kept;
};

void Send(benchmark::State& state, Files files)
{
    Server server(files);
    server.StartFrameStore();
    KvoPrefs::SetVariable("QUARN_DDR_HOST", server.address.c_str());
    ZtImageSGI image(648, 486, nullptr);
    {
        const Silence silence;
        for (auto _ : state) {
            image.ToDDR(server.NextFrame());
            server.CheckFrame(state, frame_bytes);
        }
    }
}

void SendPlainly(benchmark::State& state, Files files)
{
    Server server(files);
    server.StartPlain();
    const std::vector<char> message(message_bytes, 'x');
    for (auto _ : state) {
        const int connection = socket(AF_INET, SOCK_STREAM, 0);
        char answer[4];
        Require(connect(connection, reinterpret_cast<sockaddr*>(&server.own),
                        sizeof server.own) == 0,
                "connect");
        std::size_t sent = 0;
        while (sent < message.size()) {
            const ssize_t part = send(connection, message.data() + sent,
                                      message.size() - sent, MSG_NOSIGNAL);
            Require(part > 0, "send");
            sent += static_cast<std::size_t>(part);
        }
        Require(recv(connection, answer, sizeof answer, MSG_WAITALL) == 4,
                "answer");
        close(connection);
        server.CheckFrame(state, message_bytes);
    }
}

[[maybe_unused]] const bool registered = [] {
    const struct
    {
        const char* row;
        Files files;
    } rows[] = {{"frame_path", Files::Same}, {"frame_path_new", Files::New}};
    for (const auto& row : rows) {
        const std::string name = row.row;
        benchmark::RegisterBenchmark((name + "/ours").c_str(), Send, row.files)
            ->Unit(benchmark::kMicrosecond)
            ->UseRealTime();
        benchmark::RegisterBenchmark((name + "/plain socket").c_str(),
                                     SendPlainly, row.files)
            ->Unit(benchmark::kMicrosecond)
            ->UseRealTime();
    }
    return true;
}();

} // namespace
