#include "support/FakeProcesses.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

FakeProcesses::FakeProcesses() : before(install(this)) {}

FakeProcesses::~FakeProcesses()
{
    install(before);
}

int FakeProcesses::run_shell(const char* command)
{
    commands.emplace_back(command ? command : "(null)");
    return result;
}

bool FakeProcesses::start_shell(const char* command,
                                zt_platform::ShellLine& line)
{
    commands.emplace_back(command ? command : "(null)");
    if (start_error != 0) {
        errno = start_error;
        return false;
    }
    at = 0;
    line = {3, 1};
    ++running;
    return true;
}

std::ptrdiff_t FakeProcesses::read_output(const zt_platform::ShellLine&,
                                          void* to, std::size_t bytes)
{
    if (interrupts && !next_goes_through) {
        next_goes_through = true;
        errno = EINTR;
        return -1;
    }
    next_goes_through = false;
    if (at >= read_ends) {
        errno = EIO;
        return -1;
    }
    const std::size_t count =
        std::min({bytes, most_at_once, output.size() - at, read_ends - at});
    std::memcpy(to, output.data() + at, count);
    at += count;
    return static_cast<std::ptrdiff_t>(count);
}

void FakeProcesses::end_shell(zt_platform::ShellLine& line)
{
    line = {};
    --running;
}

bool FakeProcesses::is_program(const char* path)
{
    asked.emplace_back(path ? path : "(null)");
    return std::find(programs.begin(), programs.end(), asked.back()) !=
           programs.end();
}

bool FakeProcesses::change_directory(const char* path)
{
    directories.emplace_back(path ? path : "(null)");
    return path != nullptr;
}
