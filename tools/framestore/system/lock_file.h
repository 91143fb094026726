#ifndef ZT_FRAMESTORE_SYSTEM_LOCK_FILE_H
#define ZT_FRAMESTORE_SYSTEM_LOCK_FILE_H

/// \file
/// The file that tells clients to wait.

#include <string>

namespace framestore {

/// A lock file that is there as long as the server wants clients to wait.
///
/// A file of that name that somebody else has made is left alone.
class LockFile
{
public:
    /// An empty path is no lock file at all.
    explicit LockFile(std::string lock_path);

    /// Removes the file if it is ours.
    ~LockFile();
    LockFile(const LockFile&) = delete;
    LockFile& operator=(const LockFile&) = delete;

    /// Has the file be there or not.
    void Be(bool there);

private:
    std::string path;
    bool ours = false;
};

} // namespace framestore

#endif
