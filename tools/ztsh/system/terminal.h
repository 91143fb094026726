#ifndef ZTSH_SYSTEM_TERMINAL_H
#define ZTSH_SYSTEM_TERMINAL_H

/// \file
/// What the shell asks about the terminal it may run in.

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

} // namespace ztsh

#endif
