#include "system/terminal.h"

#include <sys/ioctl.h>
#include <unistd.h>

namespace ztsh {

bool IsTerminal(int descriptor)
{
    return isatty(descriptor) == 1;
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
