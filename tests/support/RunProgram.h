#ifndef ZT_TESTS_RUNPROGRAM_H
#define ZT_TESTS_RUNPROGRAM_H

#include <string>
#include <vector>

/// How a program ended and what it wrote.
struct Ended
{
    int status = -1; ///< As `waitpid` gives it; -1 if it could not be started.
    std::string output;
    std::string errors;
};

/// Runs the program at `path` with these arguments and, as "NAME=value", this
/// whole environment, in `directory` if it is not empty, and waits for its end.
Ended RunProgram(const std::string& path,
                 const std::vector<std::string>& arguments,
                 const std::vector<std::string>& environment,
                 const std::string& directory = "");

#endif
