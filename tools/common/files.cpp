#include "common/files.h"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <sys/stat.h>
#include <unistd.h>

namespace zt_tools {

namespace {

std::string kind_of(mode_t mode)
{
    if (S_ISDIR(mode))
        return "it is a directory";
    if (S_ISFIFO(mode))
        return "it is a pipe";
    if (S_ISSOCK(mode))
        return "it is a socket";
    return "it is a device";
}

/// The directory of `name` as it would be written before the last slash.
std::string directory_of(const std::string& name)
{
    std::string directory = std::filesystem::path(name).parent_path().string();
    return directory.empty() ? "." : directory;
}

} // namespace

std::string WhyNotReadable(const std::string& name)
{
    struct stat status = {};
    if (stat(name.c_str(), &status) != 0)
        return std::strerror(errno);
    if (!S_ISREG(status.st_mode))
        return kind_of(status.st_mode);
    if (access(name.c_str(), R_OK) != 0)
        return std::strerror(errno);
    return {};
}

std::string WhyNotWritable(const std::string& name)
{
    struct stat status = {};
    if (stat(name.c_str(), &status) == 0) {
        if (!S_ISREG(status.st_mode))
            return kind_of(status.st_mode);
        if (access(name.c_str(), W_OK) != 0)
            return std::strerror(errno);
    } else if (errno != ENOENT) {
        return std::strerror(errno);
    }
    // The file is written beside its place first, so the directory counts
    // also when the file is there.
    if (access(directory_of(name).c_str(), W_OK | X_OK) != 0)
        return "its directory: " + std::string(std::strerror(errno));
    return {};
}

FileInMaking::FileInMaking(const std::string& name)
    : place(name), in_place(false)
{
    std::error_code fault;
    if (std::filesystem::is_symlink(name, fault)) {
        std::filesystem::path target =
            std::filesystem::weakly_canonical(name, fault);
        if (!fault)
            place = target.string();
    }
    static unsigned serial = 0;
    std::string part = ".zt-" + std::to_string(getpid()) + "-" +
                       std::to_string(++serial) + ".part";
    beside = (std::filesystem::path(place).parent_path() / part).string();
}

FileInMaking::~FileInMaking()
{
    if (!in_place)
        unlink(beside.c_str());
}

std::string FileInMaking::PutInPlace()
{
    struct stat former = {};
    if (stat(place.c_str(), &former) == 0)
        (void)chmod(beside.c_str(), former.st_mode & 07777);
    if (rename(beside.c_str(), place.c_str()) != 0)
        return std::strerror(errno);
    in_place = true;
    return {};
}

} // namespace zt_tools
