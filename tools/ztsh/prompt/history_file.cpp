#include "prompt/history_file.h"

#include "system/files.h"

#include <cerrno>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <sys/stat.h>
#include <unistd.h>

namespace ztsh {

namespace {

constexpr mode_t file_mode = 0600;
constexpr mode_t directory_mode = 0700;

/// Makes a directory and those above it that are missing.
void make_directories(const std::filesystem::path& directory)
{
    if (directory.empty() || directory == directory.root_path())
        return;
    std::error_code ignored;
    if (std::filesystem::is_directory(directory, ignored))
        return;
    make_directories(directory.parent_path());
    (void)mkdir(directory.c_str(), directory_mode);
}

void write_all(int descriptor, const std::string& text)
{
    std::size_t done = 0;
    while (done < text.size()) {
        ssize_t put = write(descriptor, text.data() + done, text.size() - done);
        if (put > 0)
            done += static_cast<std::size_t>(put);
        else if (errno != EINTR)
            return;
    }
}

} // namespace

std::string HistoryPath()
{
    const char* state = std::getenv("XDG_STATE_HOME");
    if (state && state[0] == '/')
        return std::string(state) + "/ztsh/history";
    const char* home = std::getenv("HOME");
    if (home && home[0] == '/')
        return std::string(home) + "/.local/state/ztsh/history";
    return {};
}

HistoryFile::HistoryFile(const std::string& file_path) : path(file_path) {}

std::vector<std::string> HistoryFile::Load()
{
    std::vector<std::string> lines;
    if (path.empty() || !WhyNotReadable(path).empty())
        return lines;
    std::ifstream in(path);
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    if (lines.size() <= most_lines)
        return lines;

    lines.erase(lines.begin(),
                lines.end() - static_cast<std::ptrdiff_t>(most_lines));
    std::string kept;
    for (const std::string& line : lines)
        kept += line + "\n";
    int descriptor = open_file(O_TRUNC);
    if (descriptor >= 0) {
        write_all(descriptor, kept);
        close(descriptor);
    }
    return lines;
}

void HistoryFile::Append(const std::string& line)
{
    int descriptor = open_file(O_APPEND);
    if (descriptor < 0)
        return;
    write_all(descriptor, line + "\n");
    close(descriptor);
}

int HistoryFile::open_file(int flags)
{
    if (path.empty())
        return -1;
    make_directories(std::filesystem::path(path).parent_path());
    int descriptor =
        open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC | O_NONBLOCK | flags,
             file_mode);
    struct stat status = {};
    if (descriptor >= 0 &&
        (fstat(descriptor, &status) != 0 || !S_ISREG(status.st_mode))) {
        close(descriptor);
        return -1;
    }
    // A file that somebody else made may be open to others.
    if (descriptor >= 0 && (status.st_mode & 07777) != file_mode)
        (void)fchmod(descriptor, file_mode);
    return descriptor;
}

} // namespace ztsh
