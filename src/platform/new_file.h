#ifndef ZT_PLATFORM_NEW_FILE_H
#define ZT_PLATFORM_NEW_FILE_H

/// \file
/// A file that takes the place of another one when it is complete, not before:
/// whoever looks sees the old file or the whole new one.

#include <cstddef>

namespace zt_platform {

/// A file in the making, written from its beginning to its end.
///
/// It stands beside the place it is for, under a name that begins ".zt_new_",
/// until it is finished. A device or a pipe is written as it is; of those
/// nothing can be taken back.
class NewFile
{
public:
    /// Begins a file for `path`; links are followed. Fails for null, for a
    /// file that may not be written, for a directory that takes no new file,
    /// and for lack of memory.
    explicit NewFile(const char* path);

    /// Removes what is not finished.
    ~NewFile();

    NewFile(const NewFile&) = delete;
    NewFile& operator=(const NewFile&) = delete;

    bool is_open() const { return handle >= 0; }

    /// Writes all the bytes behind those before; interruptions are retried.
    ///
    /// Returns: false when any byte so far could not be written.
    bool append(const void* from, std::size_t bytes);

    /// Writes the first bytes of the file anew, of which there are at least so
    /// many; a device or a pipe keeps what it was given.
    ///
    /// Returns: false when any byte so far could not be written.
    bool rewrite_beginning(const void* from, std::size_t bytes);

    /// Closes the file and puts it in its place.
    ///
    /// Returns: true when every byte was kept; otherwise nothing of it is left
    ///          and what stood in its place still does.
    bool finish();

private:
    void open_beside();

    char* place;     ///< Where it goes; null for what is written as it is.
    char* temporary; ///< Where it stands until then.
    int handle;
    bool sound; ///< Whether everything so far was written.
};

} // namespace zt_platform

#endif
