#include "platform/files.h"

#include <cerrno>
#include <fcntl.h>
#include <signal.h>
#include <stdio.h>
#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

namespace zt_platform {

namespace {

/// Keeps the two signals that a write can raise, for a file that grows too
/// long and for a pipe that nobody reads, from reaching the process: they are
/// held back during the write and taken away after it.
class WriteSignalsHeld
{
public:
    WriteSignalsHeld()
    {
        sigemptyset(&held);
        sigaddset(&held, SIGXFSZ);
        sigaddset(&held, SIGPIPE);
        sigset_t pending;
        sigpending(&pending);
        // What is pending already was raised for another reason.
        if (sigismember(&pending, SIGXFSZ))
            sigdelset(&held, SIGXFSZ);
        if (sigismember(&pending, SIGPIPE))
            sigdelset(&held, SIGPIPE);
        pthread_sigmask(SIG_BLOCK, &held, &before);
    }

    ~WriteSignalsHeld()
    {
        int kept = errno;
        sigset_t pending;
        sigpending(&pending);
        if (sigismember(&pending, SIGXFSZ) || sigismember(&pending, SIGPIPE)) {
            const timespec no_wait = {0, 0};
            while (sigtimedwait(&held, nullptr, &no_wait) > 0 || errno == EINTR)
                ;
        }
        pthread_sigmask(SIG_SETMASK, &before, nullptr);
        errno = kept;
    }

    WriteSignalsHeld(const WriteSignalsHeld&) = delete;
    WriteSignalsHeld& operator=(const WriteSignalsHeld&) = delete;

private:
    sigset_t held;
    sigset_t before;
};

/// Opens without waiting, past interruptions. The handle then waits as usual.
int open_now(const char* path, int flags)
{
    int handle;
    do
        handle = ::open(path, flags | O_NONBLOCK | O_CLOEXEC | O_NOCTTY, 0666);
    while (handle < 0 && errno == EINTR);
    return handle;
}

class PosixFiles final : public Files
{
public:
    bool accessible(const char* path, Access access) override
    {
        static constexpr int modes[] = {F_OK, R_OK, W_OK, X_OK};
        return path && ::access(path, modes[static_cast<int>(access)]) == 0;
    }

    int open_input(const char* path, std::uint64_t& bytes) override
    {
        bytes = 0;
        int handle = open_now(path, O_RDONLY);
        struct stat about;
        if (handle >= 0 && ::fstat(handle, &about) == 0 &&
            S_ISREG(about.st_mode) && about.st_size > 0)
            bytes = static_cast<std::uint64_t>(about.st_size);
        return handle;
    }

    std::ptrdiff_t read_at(int handle, void* to, std::size_t bytes,
                           std::uint64_t offset) override
    {
        return ::pread(handle, to, bytes, static_cast<off_t>(offset));
    }

    int open_output(const char* path) override
    {
        int handle = open_now(path, O_WRONLY | O_CREAT | O_TRUNC);
        if (handle >= 0)
            ::fcntl(handle, F_SETFL, 0);
        return handle;
    }

    std::ptrdiff_t write_at(int handle, const void* from, std::size_t bytes,
                            std::uint64_t offset) override
    {
        WriteSignalsHeld quiet;
        return ::pwrite(handle, from, bytes, static_cast<off_t>(offset));
    }

    std::ptrdiff_t write_next(int handle, const void* from,
                              std::size_t bytes) override
    {
        WriteSignalsHeld quiet;
        return ::write(handle, from, bytes);
    }

    FileKind kind(const char* path) override
    {
        struct stat about;
        if (!path || ::stat(path, &about) != 0)
            return FileKind::Nothing;
        return S_ISREG(about.st_mode) ? FileKind::Regular : FileKind::Other;
    }

    char* resolve(const char* path) override
    {
        return ::realpath(path, nullptr);
    }

    int open_new(const char* path, const char* like) override
    {
        int handle = open_now(path, O_WRONLY | O_CREAT | O_EXCL);
        struct stat about;
        if (handle >= 0 && ::stat(like, &about) == 0) {
            // Best effort: a file system may know no permissions.
            [[maybe_unused]] int changed =
                ::fchmod(handle, about.st_mode & 07777);
        }
        return handle;
    }

    bool move(const char* from, const char* to) override
    {
        return ::rename(from, to) == 0;
    }

    bool remove(const char* path) override { return ::unlink(path) == 0; }

    bool close(int handle) override
    {
        // An interrupted close has closed: a second one could hit a handle
        // that somebody else was given meanwhile.
        return ::close(handle) == 0 || errno == EINTR;
    }
};

constinit PosixFiles posix_files;
constinit Files* installed = nullptr;

} // namespace

Files& Files::current()
{
    return installed ? *installed : posix_files;
}

Files* Files::install(Files* other)
{
    Files* before = installed;
    installed = other;
    return before;
}

} // namespace zt_platform
