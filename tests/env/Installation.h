#ifndef ZT_TESTS_ENV_INSTALLATION_H
#define ZT_TESTS_ENV_INSTALLATION_H

/// \file
/// An installation of the test's own, with a query program that logs its runs,
/// and a program that asks the preferences from its start on.

#include <filesystem>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/RunProgram.h"
#include "support/TempDir.h"

using Lines = std::vector<std::string>;

inline Lines LinesOf(const std::string& text)
{
    Lines lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    return lines;
}

/// The installation, by default in a folder "quarn" and named by
/// QUARN_LOCATION. It has no query program until it is given one.
class Installation
{
public:
    explicit Installation(const std::string& folder = "quarn")
        : location(directory.Path(folder))
    {
        environment = {"PATH=/usr/bin:/bin", "QUARN_LOCATION=" + location};
    }

    /// Gives it a query program: a shell script, of which `body` is what comes
    /// after it has logged that it runs.
    void Program(const std::string& body)
    {
        ProgramAt(location + "/bin", body);
    }

    /// Puts the query program into some other folder.
    void ProgramAt(const std::string& folder, const std::string& body)
    {
        namespace fs = std::filesystem;
        fs::create_directories(folder);
        const std::string log = directory.Path("log");
        const std::string script = "#!/bin/sh --\necho \"$PPID $$ $1\" >> '" +
                                   log + "'\n" + body + "\n";
        const std::string written = directory.Write("script", script);
        fs::rename(written, folder + "/get_quarn_variable");
        fs::permissions(folder + "/get_quarn_variable", fs::perms::owner_all);
    }

    /// Gives it a query program that knows these variables, each a line
    /// "NAME value" as the program prints it.
    void Knows(const Lines& variables)
    {
        std::string body = "case \"$1\" in\n";
        for (const std::string& line : variables) {
            const std::size_t blank = line.find(' ');
            body += line.substr(0, blank) + ") echo '" +
                    line.substr(blank + 1) + "';;\n";
        }
        Program(body + "*) echo;;\nesac");
    }

    void Set(const std::string& setting) { environment.push_back(setting); }

    /// Runs the probe and gives its answers; fails the test if it prints
    /// anything else or does not end well.
    Lines Ask(const std::vector<std::string>& questions)
    {
        const Ended ended =
            RunProgram(ZT_PROBE, questions, environment, directory.Path(""));
        EXPECT_EQ(ended.status, 0);
        EXPECT_EQ(ended.errors, "");
        return LinesOf(ended.output);
    }

    /// Gives what the query program was asked for, in order.
    Lines Asked()
    {
        Lines names;
        for (const std::string& line : Log())
            names.push_back(line.substr(line.rfind(' ') + 1));
        return names;
    }

    /// Gives a line for each run of the query program: the process that
    /// started it, its own, and what it was asked for.
    Lines Log()
    {
        return std::filesystem::exists(directory.Path("log"))
                   ? LinesOf(directory.Read("log"))
                   : Lines();
    }

    TempDir directory;
    std::string location;
    Lines environment;
};

/// What is asked for at load.
inline const Lines asked_at_load = {"QUARN_WIRE_DIR", "QUARN_INPUT_PIX_DIR",
                                    "QUARN_MISC_DIR", "QUARN_DEFAULT_PROJECT",
                                    "QUARN_COORD_SYS"};

#endif
