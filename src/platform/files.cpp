#include "platform/files.h"

#include <cerrno>

namespace zt_platform {

InputFile::InputFile(const char* path) : bytes(0), handle(-1)
{
    if (path)
        handle = Files::current().open_input(path, bytes);
    if (handle < 0)
        bytes = 0;
}

InputFile::~InputFile()
{
    if (handle >= 0)
        Files::current().close(handle);
}

std::size_t InputFile::read_at(std::uint64_t offset, void* to,
                               std::size_t count) const
{
    std::size_t done = 0;
    while (done < count && offset + done < bytes) {
        std::ptrdiff_t got = Files::current().read_at(
            handle, static_cast<char*>(to) + done, count - done, offset + done);
        if (got < 0 && errno == EINTR)
            continue;
        if (got <= 0)
            break;
        done += static_cast<std::size_t>(got);
    }
    return done;
}

int InputFile::release()
{
    int given = handle;
    handle = -1;
    bytes = 0;
    return given;
}

OutputFile::OutputFile(const char* path) : handle(-1), sound(true)
{
    if (path)
        handle = Files::current().open_output(path);
}

OutputFile::~OutputFile()
{
    if (handle >= 0)
        Files::current().close(handle);
}

bool OutputFile::write_at(std::uint64_t offset, const void* from,
                          std::size_t count)
{
    sound = sound && is_open();
    std::size_t done = 0;
    while (sound && done < count) {
        std::ptrdiff_t went = Files::current().write_at(
            handle, static_cast<const char*>(from) + done, count - done,
            offset + done);
        if (went > 0)
            done += static_cast<std::size_t>(went);
        else if (went == 0 || errno != EINTR)
            sound = false;
    }
    return sound;
}

bool OutputFile::close()
{
    if (handle < 0)
        return false;
    bool closed = Files::current().close(handle);
    handle = -1;
    return closed && sound;
}

} // namespace zt_platform
