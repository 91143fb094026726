#include "image/frame_store.h"

#include <KVO/KvoPrefs.h>
#include <ZT/image_sgi.h>

#include "core/write_text.h"
#include "platform/byte_order.h"
#include "platform/clock.h"
#include "platform/files.h"

#include <cstdio>
#include <cstring>
#include <iostream>

namespace zt_image {

namespace {

constinit const char* lock_path = frame_store_lock;

/// What the server says when it has refused a frame or could not write it; it
/// is a text with its NUL, and every other answer means success.
constexpr char refusal[] = "BAD";
constexpr std::size_t answer_bytes = sizeof refusal;
static_assert(answer_bytes == 4);

void say(const char* line)
{
    zt_core::write_text(std::cerr, line);
}

void say_what_is_written(int number)
{
    char line[64];
    std::snprintf(line, sizeof line, "Writing to ddr frame %d\n", number);
    say(line);
}

bool is_of_right_size(const ZtImageSGI& image)
{
    return image.pixels && image.width == video_picture_width &&
           image.height == video_picture_height;
}

/// Waits until the recorder is free: as long as it takes.
void wait_for_lock()
{
    using namespace zt_platform;
    while (Files::current().accessible(lock_path, Access::Exists)) {
        say("Sleeping ...\n");
        Clock::current().sleep_nanoseconds(lock_wait_nanoseconds);
    }
}

/// Finds the frame store and connects to it.
///
/// Reports: prints why there is no connection.
bool connect(zt_platform::Connection& connection)
{
    zt_platform::HostAddress address;
    if (!connection.is_open()) {
        say("ERROR: Failed to open socket.\n");
        return false;
    }
    if (!zt_platform::Sockets::current().find_host(
            KvoPrefs::Variable(frame_store_host, nullptr), address)) {
        say("ERROR: Failed to get host information.\n");
        return false;
    }
    if (!connection.connect(address, frame_store_port)) {
        say("ERROR: Failed to connect to server\n");
        return false;
    }
    return true;
}

/// Sends the message and waits for the answer: as long as it takes.
///
/// What could not be sent is no failure by itself, since a server that has
/// heard enough may have answered before it closed.
///
/// Returns: whether there was an answer and it was no refusal.
bool deliver(const FrameMessage& message, zt_platform::Connection& connection)
{
    connection.send(&message, sizeof message);
    char answer[answer_bytes];
    return connection.receive(answer, sizeof answer) &&
           std::memcmp(answer, refusal, sizeof answer) != 0;
}

} // namespace

void use_frame_store_lock(const char* path)
{
    lock_path = path ? path : frame_store_lock;
}

} // namespace zt_image

void ZtImageSGI::ToDDR(int frame)
{
    using namespace zt_image;
    say_what_is_written(frame);
    if (!is_of_right_size(*this)) {
        say("Image is wrong size ...\n");
        return;
    }
    FrameMessage message;
    make_video_frame(pixels, message.frame);
    wait_for_lock();
    zt_platform::Connection connection;
    if (!connect(connection))
        return;
    zt_platform::Sockets::current().own_name(message.host_name);
    zt_platform::store_big_32(message.number,
                              static_cast<std::uint32_t>(frame));
    if (!deliver(message, connection))
        say("ERROR: QuickFrame write error.\n");
}
