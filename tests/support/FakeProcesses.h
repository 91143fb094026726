#ifndef ZT_TESTS_FAKEPROCESSES_H
#define ZT_TESTS_FAKEPROCESSES_H

#include <string>
#include <vector>

#include "platform/process.h"

/// Keeps the commands and directories that it is given, and carries none out;
/// in use while it lives.
class FakeProcesses : public zt_platform::Processes
{
public:
    FakeProcesses();
    ~FakeProcesses();
    FakeProcesses(const FakeProcesses&) = delete;
    FakeProcesses& operator=(const FakeProcesses&) = delete;

    int run_shell(const char* command) override;
    bool change_directory(const char* path) override;

    int result = 0;                       ///< What `run_shell` answers.
    std::vector<std::string> commands;    ///< Oldest first.
    std::vector<std::string> directories; ///< Oldest first; "(null)" for null.

private:
    zt_platform::Processes* before;
};

#endif
