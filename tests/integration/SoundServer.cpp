#include "integration/SoundServer.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdlib>
#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "platform/signal_handler.h"

namespace {

const char* const modules =
    "load-module module-pipe-sink sink_name=played file=$/out format=s16le "
    "rate=44100 channels=1 use_system_clock_for_timing=yes\n"
    "load-module module-pipe-source source_name=heard file=$/in format=s16le "
    "rate=44100 channels=1\n"
    "load-module module-native-protocol-unix\n"
    "set-default-sink played\n"
    "set-default-source heard\n";

// The library finds the server, and nothing else.
const char* const devices = "pcm.!default { type pulse }\n"
                            "ctl.!default { type pulse }\n";

std::string InFolder(std::string text, const std::string& folder)
{
    for (std::size_t at = text.find('$'); at != std::string::npos;
         at = text.find('$'))
        text.replace(at, 1, folder);
    return text;
}

void MakeFolder(const std::string& path)
{
    ASSERT_EQ(mkdir(path.c_str(), S_IRWXU), 0) << path;
}

[[noreturn]] void BecomeTheServer(const std::string& script)
{
    // No server survives its test, however that ends.
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    setsid();
    sigset_t none;
    sigemptyset(&none);
    sigprocmask(SIG_SETMASK, &none, nullptr);
    const int nowhere = open("/dev/null", O_RDWR);
    for (int standard = 0; standard <= 2; ++standard)
        dup2(nowhere, standard);
    execlp("pulseaudio", "pulseaudio", "-n", "-F", script.c_str(),
           "--daemonize=no", "--exit-idle-time=-1", "--realtime=no",
           "--high-priority=no", "--log-level=error", nullptr);
    _exit(127);
}

bool Exists(const std::string& path)
{
    struct stat about;
    return stat(path.c_str(), &about) == 0;
}

constexpr int one_look = 20000; // in microseconds

void Sleep()
{
    usleep(one_look); // cut short by a beat, which does no harm
}

} // namespace

SoundServer::SoundServer()
{
    // The name of a socket must be short.
    const std::string place = folder.Path("");
    MakeFolder(folder.Path("run"));
    MakeFolder(folder.Path("run/pulse"));
    MakeFolder(folder.Path("home"));
    const std::string script =
        folder.Write("start.pa", InFolder(modules, folder.Path(".")));
    setenv("ALSA_CONFIG_PATH", folder.Write("alsa.conf", devices).c_str(), 1);
    setenv("XDG_RUNTIME_DIR", folder.Path("run").c_str(), 1);
    setenv("PULSE_RUNTIME_PATH", folder.Path("run/pulse").c_str(), 1);
    setenv("HOME", folder.Path("home").c_str(), 1);

    process = fork();
    if (process == 0)
        BecomeTheServer(script);
    for (int look = 0; look < 1000 && !runs; ++look) {
        runs = Exists(folder.Path("run/pulse/native")) &&
               Exists(folder.Path("out")) && Exists(folder.Path("in"));
        Sleep();
    }
    output = open(folder.Path("out").c_str(), O_RDONLY | O_NONBLOCK);
    input = open(folder.Path("in").c_str(), O_RDWR | O_NONBLOCK);
    runs = runs && output >= 0 && input >= 0 && pipe(stop_ends) == 0;
    if (!runs)
        return;
    const zt_platform::SignalsHeld held; // for the threads
    reader = std::thread([this] { ReadOutput(); });
    writer = std::thread([this] { WriteInput(); });
}

SoundServer::~SoundServer()
{
    if (stop_ends[1] >= 0)
        close(stop_ends[1]);
    if (reader.joinable())
        reader.join();
    if (writer.joinable())
        writer.join();
    Kill();
    for (const int handle : {output, input, stop_ends[0]})
        if (handle >= 0)
            close(handle);
}

void SoundServer::Kill()
{
    if (process <= 0)
        return;
    kill(process, SIGKILL);
    int status = 0;
    while (waitpid(process, &status, 0) < 0 && errno == EINTR) {
    }
    process = -1;
}

std::vector<std::int16_t> SoundServer::Played()
{
    const std::lock_guard<std::mutex> lock(mutex);
    return played;
}

void SoundServer::Hear(const std::vector<std::int16_t>& samples)
{
    const std::lock_guard<std::mutex> lock(mutex);
    heard = samples;
}

void SoundServer::ReadOutput()
{
    std::vector<std::int16_t> block(4096);
    for (;;) {
        pollfd wanted[2] = {{output, POLLIN, 0}, {stop_ends[0], POLLIN, 0}};
        poll(wanted, 2, -1);
        if (wanted[1].revents)
            return;
        const ssize_t got =
            read(output, block.data(), block.size() * sizeof block[0]);
        if (got <= 0) {
            Sleep(); // the server is gone, or not yet there
            continue;
        }
        const std::lock_guard<std::mutex> lock(mutex);
        for (std::size_t at = 0; at < static_cast<std::size_t>(got) / 2; ++at)
            if (block[at] != 0)
                played.push_back(block[at]);
    }
}

// The server takes what comes as fast as it comes, so the pace is ours.
void SoundServer::WriteInput()
{
    const auto begin = std::chrono::steady_clock::now();
    std::int64_t written = 0;
    std::size_t at = 0;
    for (;;) {
        pollfd stop = {stop_ends[0], POLLIN, 0};
        if (poll(&stop, 1, one_look / 1000) > 0)
            return;
        const std::chrono::duration<double> passed =
            std::chrono::steady_clock::now() - begin;
        const auto due = static_cast<std::int64_t>(passed.count() * rate);
        std::vector<std::int16_t> block(
            static_cast<std::size_t>(due - written));
        written = due;
        {
            const std::lock_guard<std::mutex> lock(mutex);
            if (!heard.empty())
                for (std::int16_t& sample : block)
                    sample = heard[at++ % heard.size()];
        }
        const ssize_t went =
            write(input, block.data(), block.size() * sizeof block[0]);
        const std::size_t left =
            block.size() -
            static_cast<std::size_t>(std::max<ssize_t>(went, 0)) /
                sizeof block[0];
        written -= static_cast<std::int64_t>(left); // the next time, then
        at -= std::min(at, left);
        if (went < 0)
            Sleep(); // the server is gone, or too slow
    }
}
