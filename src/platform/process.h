#ifndef ZT_PLATFORM_PROCESS_H
#define ZT_PLATFORM_PROCESS_H

/// \file
/// The process: its directory, its rights, and the shells that it starts.
///
/// `Processes` is the seam: what the system does, with its faults. Rooms that
/// want the output of a shell line use `ShellOutput`, which no interruption
/// and no short transfer can surprise.

#include <cstddef>

namespace zt_platform {

/// A shell line that was started with its standard output in a pipe.
struct ShellLine
{
    int pipe = -1;     ///< Where its output comes out.
    long process = -1; ///< The shell.
};

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

    /// Starts `command` in the system's shell, as `run_shell` does but for the
    /// terminal's signals, which reach both, with its standard output in a
    /// pipe. Nothing else that is started meanwhile gets hold of the pipe.
    ///
    /// Owner:   the caller, who calls `end_shell` when it was started.
    /// Returns: false with `errno` set, and nothing started, when it could not
    ///          be, also for null.
    virtual bool start_shell(const char* command, ShellLine& line) = 0;

    /// Reads once from the output of a shell line; waits until there is some.
    ///
    /// Returns: how many bytes came, fewer than asked for at any time, 0 at
    ///          the end; -1 with `errno` set.
    virtual std::ptrdiff_t read_output(const ShellLine& line, void* to,
                                       std::size_t bytes) = 0;

    /// Closes the pipe and waits for the shell to end, however it does.
    virtual void end_shell(ShellLine& line) = 0;

    /// Tells whether the file at `path` is one that can be started: a regular
    /// file, links followed, that the process may execute. Null is none.
    virtual bool is_program(const char* path) = 0;

    /// Tells whether the process runs with more rights than the user who
    /// started it, who must not choose what it does with them.
    virtual bool has_raised_rights() = 0;

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

/// A shell line's output, read while it runs. The line has ended when this
/// does.
class ShellOutput
{
public:
    /// Starts `command`; null cannot be started.
    explicit ShellOutput(const char* command);

    /// Reads what is left of the output, so that no line is cut off while it
    /// still writes, and waits for the shell to end. A line that never ends
    /// is waited for as long.
    ~ShellOutput();

    ShellOutput(const ShellOutput&) = delete;
    ShellOutput& operator=(const ShellOutput&) = delete;

    /// Tells whether it could be started.
    bool was_started() const { return started; }

    /// Reads the next bytes of the output, at most `bytes`; interruptions are
    /// retried.
    ///
    /// Returns: how many came; 0 at the end, after a fault, and when nothing
    ///          was started.
    std::size_t read(void* to, std::size_t bytes);

private:
    ShellLine line;
    bool started;
    bool ended; ///< Whether there is nothing more to read.
};

} // namespace zt_platform

#endif
