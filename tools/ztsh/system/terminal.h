#ifndef ZTSH_SYSTEM_TERMINAL_H
#define ZTSH_SYSTEM_TERMINAL_H

/// \file
/// What the shell asks about the terminal it may run in, and of it.

#include <termios.h>

namespace ztsh {

/// The size of a terminal's window, in character cells.
struct WindowSize
{
    int columns;
    int rows;
};

/// Tells whether the file descriptor is a terminal.
bool IsTerminal(int descriptor);

/// Tells whether the file descriptor is a terminal that can take back what it
/// shows.
bool CanRedraw(int descriptor);

/// Gives the window's size; 80 by 24 for one that does not say.
WindowSize SizeOfWindow(int descriptor);

/// Has a terminal give each key at once, and not show it, for as long as this
/// lives. Keys that make signals go on doing so.
class KeysAtOnce
{
public:
    /// Requires: `terminal_descriptor` is a terminal.
    explicit KeysAtOnce(int terminal_descriptor);
    ~KeysAtOnce();
    KeysAtOnce(const KeysAtOnce&) = delete;
    KeysAtOnce& operator=(const KeysAtOnce&) = delete;

    /// Gives the terminal back for a while.
    void Pause();
    void GoOn();

    /// Reads the key that was hit, whatever it sends.
    void TakeKey();

private:
    int descriptor;
    termios former;
};

} // namespace ztsh

#endif
