#include "support/FaultyFiles.h"

#include <algorithm>

FaultyFiles::FaultyFiles()
    : before(zt_platform::Files::install(nullptr)),
      system(zt_platform::Files::current())
{
    zt_platform::Files::install(this);
}

FaultyFiles::~FaultyFiles()
{
    zt_platform::Files::install(before);
}

bool FaultyFiles::accessible(const char* path, zt_platform::Access access)
{
    return system.accessible(path, access);
}

int FaultyFiles::open_input(const char* path, std::uint64_t& bytes)
{
    errno = EMFILE;
    int handle = opens_fail ? -1 : system.open_input(path, bytes);
    open_count += handle >= 0;
    return handle;
}

std::ptrdiff_t FaultyFiles::read_at(int handle, void* to, std::size_t bytes,
                                    std::uint64_t offset)
{
    if (interrupt())
        return -1;
    if (offset >= read_ends) {
        errno = EIO;
        return -1;
    }
    ++reads;
    std::uint64_t most =
        std::min<std::uint64_t>(most_at_once, read_ends - offset);
    std::ptrdiff_t got = system.read_at(
        handle, to,
        static_cast<std::size_t>(std::min<std::uint64_t>(bytes, most)), offset);
    if (got > 0)
        bytes_read += static_cast<std::uint64_t>(got);
    return got;
}

int FaultyFiles::open_output(const char* path)
{
    errno = EMFILE;
    int handle = opens_fail ? -1 : system.open_output(path);
    open_count += handle >= 0;
    return handle;
}

std::ptrdiff_t FaultyFiles::write_at(int handle, const void* from,
                                     std::size_t bytes, std::uint64_t offset)
{
    if (interrupt())
        return -1;
    std::uint64_t most = std::min<std::uint64_t>(most_at_once, bytes_left);
    if (most == 0) {
        errno = write_error;
        return -1;
    }
    ++writes;
    std::ptrdiff_t went = system.write_at(
        handle, from,
        static_cast<std::size_t>(std::min<std::uint64_t>(bytes, most)), offset);
    if (went > 0 && bytes_left != never)
        bytes_left -= static_cast<std::uint64_t>(went);
    return went;
}

bool FaultyFiles::close(int handle)
{
    --open_count;
    return system.close(handle) && !close_fails;
}

bool FaultyFiles::interrupt()
{
    next_goes_through = !next_goes_through;
    if (!interrupts || !next_goes_through)
        return false;
    errno = EINTR;
    return true;
}
