#include "system/terminal.h"

#include <cstdlib>
#include <cstring>
#include <sys/ioctl.h>
#include <unistd.h>

namespace ztsh {

bool IsTerminal(int descriptor)
{
    return isatty(descriptor) == 1;
}

bool CanRedraw(int descriptor)
{
    const char* kind = std::getenv("TERM");
    return IsTerminal(descriptor) && kind && *kind != '\0' &&
           std::strcmp(kind, "dumb") != 0;
}

WindowSize SizeOfWindow(int descriptor)
{
    struct winsize size = {};
    if (ioctl(descriptor, TIOCGWINSZ, &size) != 0 || size.ws_col == 0 ||
        size.ws_row == 0)
        return {80, 24};
    return {size.ws_col, size.ws_row};
}

} // namespace ztsh
