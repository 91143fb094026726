#include "support/RunProgram.h"

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>

#include "support/TempDir.h"

namespace {

std::vector<char*> pointers_to(const std::vector<std::string>& texts)
{
    std::vector<char*> pointers;
    for (const std::string& text : texts)
        pointers.push_back(const_cast<char*>(text.c_str()));
    pointers.push_back(nullptr);
    return pointers;
}

} // namespace

Ended RunProgram(const std::string& path,
                 const std::vector<std::string>& arguments,
                 const std::vector<std::string>& environment,
                 const std::string& directory)
{
    TempDir files;
    const std::string output = files.Write("output", "");
    const std::string errors = files.Write("errors", "");
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, 0, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&actions, 1, output.c_str(), O_WRONLY, 0);
    posix_spawn_file_actions_addopen(&actions, 2, errors.c_str(), O_WRONLY, 0);
    if (!directory.empty())
        posix_spawn_file_actions_addchdir_np(&actions, directory.c_str());
    std::vector<std::string> words = {path};
    words.insert(words.end(), arguments.begin(), arguments.end());

    pid_t child = -1;
    const int failure =
        posix_spawn(&child, path.c_str(), &actions, nullptr,
                    pointers_to(words).data(), pointers_to(environment).data());
    posix_spawn_file_actions_destroy(&actions);
    Ended ended;
    if (failure == 0)
        waitpid(child, &ended.status, 0);
    ended.output = files.Read("output");
    ended.errors = files.Read("errors");
    return ended;
}
