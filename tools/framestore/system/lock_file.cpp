#include "system/lock_file.h"

#include <fcntl.h>
#include <unistd.h>
#include <utility>

namespace framestore {

LockFile::LockFile(std::string lock_path) : path(std::move(lock_path)) {}

LockFile::~LockFile()
{
    Be(false);
}

void LockFile::Be(bool there)
{
    if (path.empty() || there == ours)
        return;
    if (!there) {
        unlink(path.c_str());
        ours = false;
        return;
    }
    const int made =
        open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0644);
    ours = made >= 0;
    if (ours)
        close(made);
}

} // namespace framestore
