#ifndef ZT_PLATFORM_PROCESS_H
#define ZT_PLATFORM_PROCESS_H

/// \file
/// The process: its directory, and the shells that it starts.

namespace zt_platform {

/// The system's calls about processes.
class Processes
{
public:
    /// Runs `command` in the system's shell and waits for it to end. The
    /// waiting is not cut short by signals; meanwhile interrupt and quit from
    /// the terminal reach the command only.
    ///
    /// The command starts with no signal held back and with the alarm signal
    /// at its default, whatever the beat does to it in this process.
    ///
    /// Returns: what the system tells of the command's end; -1 with `errno`
    ///          set when it could not be started, also for null.
    virtual int run_shell(const char* command) = 0;

    /// Changes the directory of the process.
    ///
    /// Returns: false with `errno` set when it could not, also for null.
    virtual bool change_directory(const char* path) = 0;

    /// Gives the calls in use: the system's, or those that a test installed.
    static Processes& current();

    /// Installs other calls; null restores the system's.
    ///
    /// Owner:   the caller, who installs others before destroying them.
    /// Returns: what was installed before, null for the system's.
    static Processes* install(Processes* other);

protected:
    ~Processes() = default;
};

} // namespace zt_platform

#endif
