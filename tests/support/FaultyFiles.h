#ifndef ZT_TESTS_FAULTYFILES_H
#define ZT_TESTS_FAULTYFILES_H

#include "platform/files.h"

#include <cerrno>
#include <cstddef>
#include <cstdint>

/// The system's files with faults of the test's choice; in use while it lives.
class FaultyFiles : public zt_platform::Files
{
public:
    static constexpr std::uint64_t never = ~std::uint64_t{0};

    FaultyFiles();
    ~FaultyFiles();
    FaultyFiles(const FaultyFiles&) = delete;
    FaultyFiles& operator=(const FaultyFiles&) = delete;

    bool accessible(const char* path, zt_platform::Access access) override;
    int open_input(const char* path, std::uint64_t& bytes) override;
    std::ptrdiff_t read_at(int handle, void* to, std::size_t bytes,
                           std::uint64_t offset) override;
    int open_output(const char* path) override;
    std::ptrdiff_t write_at(int handle, const void* from, std::size_t bytes,
                            std::uint64_t offset) override;
    std::ptrdiff_t write_next(int handle, const void* from,
                              std::size_t bytes) override;
    zt_platform::FileKind kind(const char* path) override;
    char* resolve(const char* path) override;
    int open_new(const char* path, const char* like) override;
    bool move(const char* from, const char* to) override;
    bool remove(const char* path) override;
    bool close(int handle) override;

    std::size_t most_at_once = ~std::size_t{0}; ///< Bytes a call transfers.
    bool interrupts = false;          ///< Whether every other call fails first.
    std::uint64_t read_ends = never;  ///< Reads from here on fail with EIO.
    std::uint64_t bytes_left = never; ///< Writes beyond these many fail.
    int write_error = ENOSPC;         ///< What they fail with.
    bool close_fails = false;
    bool opens_fail = false;
    bool moves_fail = false;

    int open_count = 0; ///< Files that are open now.
    int reads = 0;      ///< Calls that reached the system.
    std::uint64_t bytes_read = 0;
    int writes = 0;

private:
    bool interrupt();

    /// Gives how many of `bytes` the next write may take; 0 with `errno` set
    /// when it has to fail.
    std::size_t allowed(std::size_t bytes);

    /// Counts what a write that reached the system took.
    std::ptrdiff_t written(std::ptrdiff_t went);

    zt_platform::Files* before;
    zt_platform::Files& system;
    bool next_goes_through = false;
};

#endif
