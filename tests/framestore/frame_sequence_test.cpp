// The whole way: pictures sent by the library, received by the server, read
// back by the library, and compared as far as video can hold them.

#include <KVO/KvoPrefs.h>
#include <ZT/image_sgi.h>

#include <algorithm>
#include <array>
#include <csignal>
#include <cstdlib>
#include <random>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

#include <gtest/gtest.h>

#include "image/video_frame.h"
#include "support/CapturedStderr.h"
#include "support/TempDir.h"

namespace {

/// The server, on an address of its own, with its log in a file.
class Server
{
public:
    explicit Server(const TempDir& directory)
    {
        std::random_device random;
        do
            address = "127." + std::to_string(1 + random() % 250) + "." +
                      std::to_string(random() % 250) + "." +
                      std::to_string(1 + random() % 250);
        while (!Start(directory));
    }

    /// Stops it.
    ///
    /// Returns: its exit code, -1 if a signal has ended it.
    int Stop()
    {
        kill(process, SIGTERM);
        int status = 0;
        waitpid(process, &status, 0);
        process = -1;
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

    ~Server()
    {
        if (process > 0)
            Stop();
        close(unread_log);
    }
    Server(const Server&) = delete;
    Server& operator=(const Server&) = delete;

    std::string address;
    pid_t process = -1;

private:
    /// Starts it, and waits until it listens. Its port may be in use at this
    /// address.
    bool Start(const TempDir& directory)
    {
        int log[2] = {};
        EXPECT_EQ(pipe(log), 0);
        posix_spawn_file_actions_t actions;
        posix_spawn_file_actions_init(&actions);
        posix_spawn_file_actions_adddup2(&actions, log[1], 1);
        posix_spawn_file_actions_addclose(&actions, log[0]);
        const std::string place = directory.Path(".");
        const char* const words[] = {"zt-framestore", "--listen",
                                     address.c_str(), "--directory",
                                     place.c_str(),   nullptr};
        EXPECT_EQ(posix_spawn(&process, ZT_FRAMESTORE_PROGRAM, &actions,
                              nullptr, const_cast<char* const*>(words),
                              environ),
                  0);
        posix_spawn_file_actions_destroy(&actions);
        close(log[1]);
        char first = 0;
        if (read(log[0], &first, 1) != 1) {
            close(log[0]);
            waitpid(process, nullptr, 0);
            return false;
        }
        // The rest of the log is read by nobody: small enough for the pipe.
        unread_log = log[0];
        return true;
    }

    int unread_log = -1;
};

constexpr int width = 648;
constexpr int height = 486;

using Color = std::array<int, 3>;

ZtPixel PixelOf(const Color& color)
{
    return static_cast<ZtPixel>(color[0]) << 24 |
           static_cast<ZtPixel>(color[1]) << 16 |
           static_cast<ZtPixel>(color[2]) << 8 | 0xFF;
}

Color ColorOf(ZtPixel pixel)
{
    return {static_cast<int>(pixel >> 24), static_cast<int>(pixel >> 16 & 0xFF),
            static_cast<int>(pixel >> 8 & 0xFF)};
}

/// What is shown: a colour for each row, or a grey for each column. The other
/// direction is even, so that the chroma of a pair is that of its samples.
struct Scene
{
    explicit Scene(int number) : by_row(number % 2 == 0)
    {
        std::mt19937 random(static_cast<unsigned>(number));
        auto level = [&] { return static_cast<int>(random() % 256); };
        for (int i = 0; i < std::max(width, height); ++i) {
            const int grey = level();
            colors.push_back(by_row ? Color{level(), level(), level()}
                                    : Color{grey, grey, grey});
        }
    }

    const Color& At(int row, int column) const
    {
        return colors[static_cast<std::size_t>(by_row ? row : column)];
    }

    void Paint(ZtImageSGI& image) const
    {
        for (int row = 0; row < height; ++row)
            for (int column = 0; column < width; ++column)
                image.pixels[row * width + column] = PixelOf(At(row, column));
    }

    bool by_row;
    std::vector<Color> colors;
};

// A luma is off by less than 1 and counts 1.164, a chroma by less than 1 and
// counts 1.596 in red, 0.391 and 0.813 in green, 2.018 in blue; the first
// chroma is also up to 1.78 too large, by its blue weight. Cutting off takes 1.
constexpr Color largest_error = {1 + 1 + 2, 1 + 1 + 1 + 1, 1 + 1 + 6};

/// Gives by how much each channel differs at most. The first two samples of a
/// line are left out: their chroma is partly that of the line before.
Color Difference(const ZtImageSGI& received, const Scene& scene)
{
    Color difference = {};
    for (int row = 0; row < height; ++row) {
        const int line = zt_image::video_line_of(row);
        const ZtPixel* samples = received.pixels + (485 - line) * 720;
        for (int i = 2; i < 720; ++i) {
            const Color there = ColorOf(samples[i]);
            const Color& here = scene.At(row, 9 * i / 10);
            for (std::size_t channel = 0; channel < 3; ++channel)
                difference[channel] =
                    std::max(difference[channel],
                             std::abs(there[channel] - here[channel]));
        }
    }
    return difference;
}

TEST(frame_sequence, TwoHundredFramesComeBackAsTheyWere)
{
    constexpr int frames = 200;
    TempDir directory;
    Server server(directory);
    KvoPrefs::SetVariable("QUARN_DDR_HOST", server.address.c_str());
    std::string expected;
    std::string said;
    {
        CapturedStderr errors;
        ZtImageSGI image(width, height, nullptr);
        for (int number = 1; number <= frames; ++number) {
            Scene(number).Paint(image);
            image.ToDDR(number);
            expected += "Writing to ddr frame " + std::to_string(number) + "\n";
        }
        said = errors.Text();
    }
    EXPECT_EQ(said, expected);
    EXPECT_EQ(server.Stop(), 0);

    for (int number = 1; number <= frames; ++number) {
        std::string name = std::to_string(number);
        name = "frame." + std::string(6 - name.size(), '0') + name + ".yuv";
        const ZtImageSGI received(directory.Path(name).c_str(), 1);
        ASSERT_TRUE(received.pixels);

        const Color difference = Difference(received, Scene(number));

        for (std::size_t channel = 0; channel < 3; ++channel)
            ASSERT_LE(difference[channel], largest_error[channel])
                << name << " channel " << channel;
    }
}

} // namespace
