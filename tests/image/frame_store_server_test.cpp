// The way to a frame store over a real connection. The server reads and sends
// in small pieces; see `FrameServer`.

#include "image/frame_store.h"

#include <KVO/KvoPrefs.h>
#include <ZT/image_sgi.h>
#include <ZT/timer.h>

#include <chrono>
#include <csignal>
#include <filesystem>
#include <thread>
#include <unistd.h>

#include <gtest/gtest.h>

#include "image/frame_message.h"
#include "image/frame_server.h"
#include "image/pictures.h"
#include "platform/clock.h"
#include "support/CapturedStderr.h"
#include "support/TempDir.h"

namespace {

using Client = FrameServer::Client;

constexpr std::size_t message_bytes = 699908;
const std::string ok("OK\0\0", 4);
const std::string bad("BAD\0", 4);
const std::string started = "Writing to ddr frame 12\n";
const std::string write_error = "ERROR: QuickFrame write error.\n";

PixelList Picture()
{
    std::mt19937 random(64);
    return RandomPicture(random, 648, 486, Texture::Noise);
}

class frame_store_server : public testing::Test
{
protected:
    frame_store_server()
    {
        zt_image::use_frame_store_lock(lock.c_str());
        // Whoever started the test may have it ignored.
        std::signal(SIGPIPE, SIG_DFL);
    }
    ~frame_store_server() override { zt_image::use_frame_store_lock(nullptr); }

    /// Sends the picture to a host and gives what was printed.
    std::string SendTo(const std::string& host)
    {
        KvoPrefs::SetVariable("QUARN_DDR_HOST", host.c_str());
        CapturedStderr errors;
        image.ToDDR(12);
        return errors.Text();
    }

    /// Does so to a server that behaves in this way.
    std::string SendToServer(const FrameServer::Behaviour& behaviour)
    {
        FrameServer server(behaviour);
        return SendTo(server.Address());
    }

    std::string Message() const
    {
        char name[65] = {};
        gethostname(name, sizeof name - 1);
        return MessageOf(std::string(name, strnlen(name, 63)), 12, pixels);
    }

    const PixelList pixels = Picture();
    ZtImageSGI image{648, 486, NewPixels(pixels)};
    TempDir directory;
    const std::string lock = directory.Path("ddr_lock");
};

TEST_F(frame_store_server, GetsNameNumberAndFrameAndNothingElse)
{
    std::string received;

    EXPECT_EQ(SendToServer([&](Client& client) {
                  received = client.Read(message_bytes);
                  client.Send(ok);
                  received += client.Finish();
              }),
              started);

    EXPECT_TRUE(received == Message());
}

TEST_F(frame_store_server, MayReadSlowly)
{
    std::string received;

    EXPECT_EQ(SendToServer([&](Client& client) {
                  received = client.Read(message_bytes, 4096, 2);
                  client.Send(ok);
                  received += client.Finish();
              }),
              started);

    EXPECT_TRUE(received == Message());
}

TEST_F(frame_store_server, RefusesWithBad)
{
    EXPECT_EQ(SendToServer([](Client& client) {
                  client.Read(message_bytes);
                  client.Send(bad);
                  client.Finish();
              }),
              started + write_error);
}

TEST_F(frame_store_server, AnyOtherFourBytesAreSuccess)
{
    for (const std::string& answer :
         {std::string("BAD and more"), std::string("BADX"),
          std::string("OK\0\0OK\0\0", 8), std::string(4, '\0')})
        EXPECT_EQ(SendToServer([&](Client& client) {
                      client.Read(message_bytes);
                      client.Send(answer);
                      client.Finish();
                  }),
                  started)
            << answer;
}

TEST_F(frame_store_server, AnAnswerMayComeByteByByte)
{
    for (const std::string& answer : {ok, bad})
        EXPECT_EQ(SendToServer([&](Client& client) {
                      client.Read(message_bytes);
                      for (char byte : answer) {
                          EXPECT_FALSE(client.Stirs(30));
                          client.Send(std::string(1, byte));
                      }
                      client.Finish();
                  }),
                  answer == ok ? started : started + write_error);
}

TEST_F(frame_store_server, AnAnswerThatIsCutIsAFailure)
{
    for (const char* answer : {"", "BA", "OK", "BAD"})
        EXPECT_EQ(SendToServer([&](Client& client) {
                      client.Read(message_bytes);
                      client.Send(answer);
                      client.Finish();
                  }),
                  started + write_error)
            << answer;
}

TEST_F(frame_store_server, ASlowAnswerIsWaitedFor)
{
    EXPECT_EQ(SendToServer([](Client& client) {
                  client.Read(message_bytes);
                  EXPECT_FALSE(client.Stirs(1000));
                  client.Send(ok);
                  client.Finish();
              }),
              started);
}

TEST_F(frame_store_server, AResetAfterTheNameIsAFailureAndNoSignal)
{
    EXPECT_EQ(SendToServer([](Client& client) {
                  client.Read(64);
                  client.Reset();
              }),
              started + write_error);
}

// The one that the system answers with a signal, unless it is told not to.
TEST_F(frame_store_server, AResetAfterAnOrderlyEndIsAFailureAndNoSignal)
{
    EXPECT_EQ(SendToServer([](Client& client) {
                  client.Read(64);
                  client.EndSending();
                  client.Reset();
              }),
              started + write_error);
}

TEST_F(frame_store_server, AServerThatClosesHalfwayIsAFailureAndNoSignal)
{
    EXPECT_EQ(
        SendToServer([](Client& client) { client.Read(message_bytes / 2); }),
        started + write_error);
}

TEST_F(frame_store_server, AResetBeforeAnythingIsAFailure)
{
    EXPECT_EQ(SendToServer([](Client& client) { client.Reset(); }),
              started + write_error);
}

TEST_F(frame_store_server,
       AnAnswerBeforeTheFrameCountsIfTheFrameIsTakenAllTheSame)
{
    for (const std::string& answer : {ok, bad}) {
        std::string received;
        EXPECT_EQ(SendToServer([&](Client& client) {
                      received = client.Read(64);
                      client.Send(answer);
                      received += client.Finish();
                      client.Reset();
                  }),
                  answer == ok ? started : started + write_error);
        EXPECT_TRUE(received == Message());
    }
}

TEST_F(frame_store_server, IsNotThere)
{
    EXPECT_EQ(SendTo(AddressWithoutServer()),
              started + "ERROR: Failed to connect to server\n");
}

TEST_F(frame_store_server, HasAnUnknownHost)
{
    const std::string unknown =
        started + "ERROR: Failed to get host information.\n";

    EXPECT_EQ(SendTo(""), unknown);
    EXPECT_EQ(SendTo("no such host"), unknown);
    EXPECT_EQ(SendTo("256.1.1.1"), unknown);
    EXPECT_EQ(SendTo(std::string(5000, 'h')), unknown);
    EXPECT_EQ(SendTo("%s%n"), unknown);
}

/// Counts the files that this process has open.
std::ptrdiff_t OpenFiles()
{
    std::filesystem::directory_iterator files("/proc/self/fd");
    return std::distance(begin(files), end(files));
}

TEST_F(frame_store_server, NoSocketIsLeftOpen)
{
    const std::ptrdiff_t before = OpenFiles();

    SendTo("");
    SendTo(AddressWithoutServer());
    for (const std::string& answer : {ok, bad, std::string()})
        SendToServer([&](Client& client) {
            client.Read(message_bytes);
            client.Send(answer);
            client.Finish();
        });

    EXPECT_EQ(OpenFiles(), before);
}

TEST_F(frame_store_server, ABeatDuringTheWholeTransferCutsNothing)
{
    ZtTimerBeat::start();
    const std::int64_t before = ZtTimerBeat::Statistics().beats;
    std::string received;

    std::string text = SendToServer([&](Client& client) {
        received = client.Read(message_bytes, 4096, 2);
        EXPECT_FALSE(client.Stirs(50));
        client.Send("O");
        EXPECT_FALSE(client.Stirs(20));
        client.Send(std::string("K\0\0", 3));
        received += client.Finish();
    });

    const std::int64_t beats = ZtTimerBeat::Statistics().beats - before;
    ZtTimerBeat::stop();
    EXPECT_EQ(text, started);
    EXPECT_TRUE(received == Message());
    EXPECT_GT(beats, 20);
}

TEST_F(frame_store_server, ARealWaitForTheLockTakesFiveSecondsAlsoWithABeat)
{
    using namespace std::chrono;
    directory.Write("ddr_lock", "");
    FrameServer server([](Client& client) {
        client.Read(message_bytes);
        client.Send(ok);
        client.Finish();
    });
    std::thread other([this] {
        std::this_thread::sleep_for(milliseconds(300));
        std::filesystem::remove(lock);
    });
    ZtTimerBeat::start();
    const auto start = steady_clock::now();

    std::string text = SendTo(server.Address());

    ZtTimerBeat::stop();
    EXPECT_GE(steady_clock::now() - start, milliseconds(5000));
    EXPECT_EQ(text, started + "Sleeping ...\n");
    other.join();
}

} // namespace
