#ifndef ZT_PLATFORM_FILES_H
#define ZT_PLATFORM_FILES_H

/// \file
/// The door to the files of the system: access tests, reading and writing at
/// an offset, in a form that no interruption, no short transfer and no odd
/// kind of file can surprise.
///
/// `Files` is the seam: one call of the system each, with its faults. Rooms
/// use `InputFile` and `OutputFile`, which retry and complete. A file that is
/// not a regular one (a directory, a FIFO, a device) opens without waiting and
/// reads as an empty file.

#include <cstddef>
#include <cstdint>

namespace zt_platform {

/// What `Files::accessible` asks about a path.
enum class Access : int { Exists = 0, Read = 1, Write = 2, Execute = 3 };

/// What stands at a path, links followed.
enum class FileKind : int { Nothing = 0, Regular = 1, Other = 2 };

/// The system's file calls. Handles count from 0, -1 is none.
class Files
{
public:
    /// Tells whether the calling process may do this to the file at `path`;
    /// a null path is never accessible.
    virtual bool accessible(const char* path, Access access) = 0;

    /// Opens the file at `path` for reading without ever waiting for it, not
    /// even for the other end of a FIFO.
    ///
    /// Units:   `bytes` is its length; 0 for what is not a regular file.
    /// Returns: a handle, or -1 with `errno` set.
    virtual int open_input(const char* path, std::uint64_t& bytes) = 0;

    /// Reads once, from `offset` on.
    ///
    /// Returns: how many bytes came, fewer than asked for at any time, 0 at
    ///          the end; -1 with `errno` set.
    virtual std::ptrdiff_t read_at(int handle, void* to, std::size_t bytes,
                                   std::uint64_t offset) = 0;

    /// Makes the file at `path`, or empties it, for writing; never waits.
    ///
    /// Returns: a handle, or -1 with `errno` set.
    virtual int open_output(const char* path) = 0;

    /// Writes once, from `offset` on; a hole in between reads as zeros. A full
    /// disk or a limit on the file's length is a fault, never a signal.
    ///
    /// Returns: how many bytes went, at least one, perhaps fewer than asked
    ///          for; -1 with `errno` set.
    virtual std::ptrdiff_t write_at(int handle, const void* from,
                                    std::size_t bytes,
                                    std::uint64_t offset) = 0;

    /// Writes once, behind what was written before, also to what has no
    /// offsets, like a pipe; otherwise as `write_at`.
    virtual std::ptrdiff_t write_next(int handle, const void* from,
                                      std::size_t bytes) = 0;

    /// Tells what stands at `path`.
    virtual FileKind kind(const char* path) = 0;

    /// Gives the path without links that leads to what stands at `path`.
    ///
    /// Owner:   the caller, who releases it with `free`.
    /// Returns: null when nothing stands there, or for lack of memory.
    virtual char* resolve(const char* path) = 0;

    /// Makes a file at `path`, where nothing may stand, for writing, with the
    /// permissions of the file at `like` if there is one.
    ///
    /// Returns: a handle, or -1 with `errno` set.
    virtual int open_new(const char* path, const char* like) = 0;

    /// Moves the file at `from` to `to` in one step, in the place of what
    /// stands there.
    virtual bool move(const char* from, const char* to) = 0;

    /// Removes the file at `path`.
    virtual bool remove(const char* path) = 0;

    /// Closes the handle, which is gone afterwards in either case.
    ///
    /// Returns: false when the system could not keep all that was written.
    virtual bool close(int handle) = 0;

    /// Gives the calls in use: the system's, or those that a test installed.
    static Files& current();

    /// Installs other calls; null restores the system's.
    ///
    /// Owner:   the caller, who installs others before destroying them.
    /// Returns: what was installed before, null for the system's.
    static Files* install(Files* other);

protected:
    ~Files() = default;
};

/// A file that is open for reading, closed at the end of its scope.
class InputFile
{
public:
    /// Opens the file at `path`; null cannot be opened.
    explicit InputFile(const char* path);
    ~InputFile();
    InputFile(const InputFile&) = delete;
    InputFile& operator=(const InputFile&) = delete;

    bool is_open() const { return handle >= 0; }

    /// Gives the length that the file had when it was opened; 0 for what is
    /// not open or not a regular file.
    std::uint64_t size() const { return bytes; }

    /// Reads from `offset` on until `count` bytes are there, the file ends or
    /// a fault stops it; interruptions are retried.
    ///
    /// Returns: how many bytes came; the rest of `to` is untouched.
    std::size_t read_at(std::uint64_t offset, void* to,
                        std::size_t count) const;

    /// Gives the handle away, open.
    ///
    /// Owner: the caller, who closes it through `Files`.
    int release();

private:
    std::uint64_t bytes;
    int handle;
};

/// A file that is being written, closed at the end of its scope.
class OutputFile
{
public:
    /// Makes or empties the file at `path`; null cannot be made.
    explicit OutputFile(const char* path);
    ~OutputFile();
    OutputFile(const OutputFile&) = delete;
    OutputFile& operator=(const OutputFile&) = delete;

    bool is_open() const { return handle >= 0; }

    /// Writes all the bytes from `offset` on; interruptions are retried.
    ///
    /// Returns: false when they could not all be written.
    bool write_at(std::uint64_t offset, const void* from, std::size_t count);

    /// Closes the file.
    ///
    /// Returns: true when it was open, everything was written and the close
    ///          succeeded too.
    bool close();

private:
    int handle;
    bool sound; ///< Whether everything so far was written.
};

} // namespace zt_platform

#endif
