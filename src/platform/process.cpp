#include "platform/process.h"

#include <cerrno>

namespace zt_platform {

ShellOutput::ShellOutput(const char* command)
    : started(Processes::current().start_shell(command, line)), ended(!started)
{}

ShellOutput::~ShellOutput()
{
    char dropped[4096];
    while (read(dropped, sizeof dropped) != 0)
        ;
    if (started)
        Processes::current().end_shell(line);
}

std::size_t ShellOutput::read(void* to, std::size_t bytes)
{
    std::ptrdiff_t got = 0;
    if (!ended && bytes != 0) {
        do
            got = Processes::current().read_output(line, to, bytes);
        while (got < 0 && errno == EINTR);
        ended = got <= 0;
    }
    return ended ? 0 : static_cast<std::size_t>(got);
}

} // namespace zt_platform
