#include "system/terminal.h"

#include <cstdlib>
#include <cstring>
#include <poll.h>
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

KeysAtOnce::KeysAtOnce(int terminal_descriptor)
    : descriptor(terminal_descriptor), former{}
{
    tcgetattr(descriptor, &former);
    GoOn();
}

KeysAtOnce::~KeysAtOnce()
{
    Pause();
}

void KeysAtOnce::Pause()
{
    tcsetattr(descriptor, TCSADRAIN, &former);
}

void KeysAtOnce::GoOn()
{
    termios at_once = former;
    at_once.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
    at_once.c_cc[VMIN] = 1;
    at_once.c_cc[VTIME] = 0;
    tcsetattr(descriptor, TCSADRAIN, &at_once);
}

void KeysAtOnce::TakeKey()
{
    // Some keys send a sequence, which begins with the escape character and
    // comes in one piece.
    constexpr char escape = '\033';
    char bytes[32] = {};
    if (read(descriptor, bytes, 1) == 1 && bytes[0] == escape) {
        pollfd more = {descriptor, POLLIN, 0};
        if (poll(&more, 1, 0) > 0) [[maybe_unused]]
            ssize_t rest = read(descriptor, bytes, sizeof bytes);
    }
}

} // namespace ztsh
