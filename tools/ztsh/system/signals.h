#ifndef ZTSH_SYSTEM_SIGNALS_H
#define ZTSH_SYSTEM_SIGNALS_H

/// \file
/// Interrupt, termination and hang-up, turned into a flag that the shell looks
/// at between two statements.
///
/// Reads that wait are cut short, so that a shell which waits for input stops
/// at once. A second such signal before the first was answered ends the
/// process on the spot.

namespace ztsh {

/// Starts to catch SIGINT, SIGTERM and SIGHUP, except those that whoever
/// started the shell has them ignored. A file that grows beyond the limit of
/// the process fails to be written from now on, it does not end the shell.
void CatchStopSignals();

/// Gives the signal that asks the shell to stop, 0 if there is none.
int StopSignal();

/// Forgets the signal: it has been answered.
void ClearStopSignal();

/// Covers a wait for a command that the library runs in the system's shell.
///
/// The library lets the terminal's interrupt reach the command only. This
/// keeps it for the shell as well, until the command has ended. Termination
/// and hang-up end the shell on the spot: the command may take for ever.
class CommandWait
{
public:
    CommandWait();
    ~CommandWait();
    CommandWait(const CommandWait&) = delete;
    CommandWait& operator=(const CommandWait&) = delete;
};

} // namespace ztsh

#endif
