#ifndef ZT_TESTS_MEMORYFILE_H
#define ZT_TESTS_MEMORYFILE_H

#include "platform/files.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <string>

/// One file in memory that stands for every file; in use while it lives.
/// Nothing can be written.
class MemoryFile : public zt_platform::Files
{
public:
    /// Owner: the caller keeps `file_bytes` as long as this.
    explicit MemoryFile(const std::string& file_bytes)
        : content(file_bytes), before(install(this))
    {}
    ~MemoryFile() { install(before); }
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;

    bool accessible(const char*, zt_platform::Access) override { return true; }

    int open_input(const char*, std::uint64_t& bytes) override
    {
        bytes = content.size();
        return 0;
    }

    std::ptrdiff_t read_at(int, void* to, std::size_t bytes,
                           std::uint64_t offset) override
    {
        if (offset >= content.size())
            return 0;
        std::size_t start = static_cast<std::size_t>(offset);
        std::size_t count = std::min(bytes, content.size() - start);
        std::memcpy(to, content.data() + start, count);
        return static_cast<std::ptrdiff_t>(count);
    }

    int open_output(const char*) override
    {
        errno = EROFS;
        return -1;
    }

    std::ptrdiff_t write_at(int, const void*, std::size_t,
                            std::uint64_t) override
    {
        errno = EBADF;
        return -1;
    }

    std::ptrdiff_t write_next(int, const void*, std::size_t) override
    {
        errno = EBADF;
        return -1;
    }

    zt_platform::FileKind kind(const char*) override
    {
        return zt_platform::FileKind::Regular;
    }

    char* resolve(const char*) override { return nullptr; }

    int open_new(const char*, const char*) override
    {
        errno = EROFS;
        return -1;
    }

    bool move(const char*, const char*) override { return false; }

    bool remove(const char*) override { return false; }

    bool close(int) override { return true; }

private:
    const std::string& content;
    zt_platform::Files* before;
};

#endif
