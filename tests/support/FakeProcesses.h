#ifndef ZT_TESTS_FAKEPROCESSES_H
#define ZT_TESTS_FAKEPROCESSES_H

#include <cstddef>
#include <string>
#include <vector>

#include "platform/process.h"

/// Keeps the commands and directories that it is given, and carries none out;
/// a shell line writes what the test says. In use while it lives.
class FakeProcesses : public zt_platform::Processes
{
public:
    FakeProcesses();
    ~FakeProcesses();
    FakeProcesses(const FakeProcesses&) = delete;
    FakeProcesses& operator=(const FakeProcesses&) = delete;

    int run_shell(const char* command) override;
    bool start_shell(const char* command,
                     zt_platform::ShellLine& line) override;
    std::ptrdiff_t read_output(const zt_platform::ShellLine& line, void* to,
                               std::size_t bytes) override;
    void end_shell(zt_platform::ShellLine& line) override;
    bool is_program(const char* path) override;
    bool has_raised_rights() override { return raised_rights; }
    bool change_directory(const char* path) override;

    int result = 0;                       ///< What `run_shell` answers.
    std::vector<std::string> commands;    ///< Oldest first.
    std::vector<std::string> directories; ///< Oldest first; "(null)" for null.

    std::string output;                ///< What every shell line writes.
    std::vector<std::string> programs; ///< Paths of what can be started.
    std::vector<std::string> asked;    ///< Paths that `is_program` was given.
    bool raised_rights = false;
    int start_error = 0; ///< Not 0: no line can be started.
    std::size_t most_at_once = ~std::size_t{0}; ///< Bytes a read gives.
    bool interrupts = false; ///< Whether every other read fails first.
    std::size_t read_ends = ~std::size_t{0}; ///< Reads from here on fail.
    int running = 0; ///< Lines that were started, not ended.

private:
    zt_platform::Processes* before;
    std::size_t at = 0; ///< How much of the output was read.
    bool next_goes_through = false;
};

#endif
