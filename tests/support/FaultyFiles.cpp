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

std::size_t FaultyFiles::allowed(std::size_t bytes)
{
    if (interrupt())
        return 0;
    errno = write_error;
    return static_cast<std::size_t>(
        std::min<std::uint64_t>({bytes, most_at_once, bytes_left}));
}

std::ptrdiff_t FaultyFiles::written(std::ptrdiff_t went)
{
    ++writes;
    if (went > 0 && bytes_left != never)
        bytes_left -= static_cast<std::uint64_t>(went);
    return went;
}

std::ptrdiff_t FaultyFiles::write_at(int handle, const void* from,
                                     std::size_t bytes, std::uint64_t offset)
{
    const std::size_t most = allowed(bytes);
    return most ? written(system.write_at(handle, from, most, offset)) : -1;
}

std::ptrdiff_t FaultyFiles::write_next(int handle, const void* from,
                                       std::size_t bytes)
{
    const std::size_t most = allowed(bytes);
    return most ? written(system.write_next(handle, from, most)) : -1;
}

zt_platform::FileKind FaultyFiles::kind(const char* path)
{
    return system.kind(path);
}

char* FaultyFiles::resolve(const char* path)
{
    return system.resolve(path);
}

int FaultyFiles::open_new(const char* path, const char* like)
{
    errno = EMFILE;
    int handle = opens_fail ? -1 : system.open_new(path, like);
    open_count += handle >= 0;
    return handle;
}

bool FaultyFiles::move(const char* from, const char* to)
{
    return !moves_fail && system.move(from, to);
}

bool FaultyFiles::remove(const char* path)
{
    return system.remove(path);
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
