#include "system/files.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace ztsh {

int OpenScript(const std::string& name, std::string& why)
{
    int descriptor = open(name.c_str(), O_RDONLY | O_CLOEXEC);
    if (descriptor < 0) {
        why = std::strerror(errno);
        return -1;
    }
    struct stat status = {};
    if (fstat(descriptor, &status) == 0 && S_ISDIR(status.st_mode)) {
        why = std::strerror(EISDIR);
        close(descriptor);
        return -1;
    }
    return descriptor;
}

DirectoryKeeper::DirectoryKeeper()
    : descriptor(open(".", O_RDONLY | O_DIRECTORY | O_CLOEXEC))
{}

DirectoryKeeper::~DirectoryKeeper()
{
    if (descriptor < 0)
        return;
    // It was there a moment ago; if it is gone nothing better can be done.
    [[maybe_unused]] int back = fchdir(descriptor);
    close(descriptor);
}

} // namespace ztsh
