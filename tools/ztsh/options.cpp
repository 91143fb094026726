#include "options.h"

#include "common/number_option.h"
#include "exit_code.h"
#include "pages/command.h"

#include <iostream>
#include <thread>

#include <CLI/CLI.hpp>

namespace ztsh {

namespace {

/// As many as the stack surely has room for.
constexpr int most_includes_allowed = 1000;
constexpr int most_jobs_allowed = 256;
constexpr double shortest_timeout = 0.01;
constexpr double longest_timeout = 86400;

constexpr const char* footer =
    "Without scripts and -c, statements come from standard input: from a\n"
    "prompt if that is a terminal. -c is run before the scripts. The word "
    "Help\n"
    "lists the words of the language.\n"
    "\n"
    "ztsh plugin new and ztsh plugin check help authors of plug-ins; see\n"
    "ztsh plugin --help. A script called plugin is run as ./plugin.\n"
    "\n"
    "Exit codes:\n"
    "  0      all well\n"
    "  1      a warning or an error was reported\n"
    "  2      the command line is wrong\n"
    "  3      a script could not be read\n"
    "  4      a file or standard output could not be written\n"
    "  128+n  ended by signal n\n"
    "The highest that applies; Quit CODE gives its own.";

int cores()
{
    return std::clamp<int>(
        static_cast<int>(std::thread::hardware_concurrency()), 1,
        most_jobs_allowed);
}

} // namespace

void AddOptions(CLI::App& app, Options& options)
{
    options.settings.jobs = cores();
    app.name("ztsh");
    app.description("Runs scripts of the command language on pictures.");
    app.footer(footer);
    app.set_version_flag("--version", "ztsh " ZTSH_VERSION);
    app.add_option("script", options.scripts,
                   "Scripts to run, in order; - is standard input");
    app.add_option("-c,--command", options.texts,
                   "Statements to run; may be given several times")
        ->type_name("STATEMENTS")
        ->option_text("STATEMENTS")
        ->allow_extra_args(false);
    app.add_flag("--safe", options.settings.safe,
                 "No System, no cd, and Include only of relative paths below "
                 "the script's directory");
    app.add_option("--max-depth", options.settings.most_includes,
                   "How many scripts may be within each other by Include "
                   "(default: 200)")
        ->option_text("N")
        ->check(CLI::Range(1, most_includes_allowed));
    app.add_option("--jobs", options.settings.jobs,
                   "Worker processes of a sequence; 1 runs it in the shell "
                   "itself (default: the cores)")
        ->option_text("N")
        ->check(CLI::Range(1, most_jobs_allowed));
    app.add_option("--ddr-timeout", options.settings.ddr_timeout,
                   "Seconds that sending a frame to the frame store may take "
                   "(default: as long as it takes)")
        ->option_text("SECONDS")
        ->check(zt_tools::NumberFromTo(shortest_timeout, longest_timeout));
    zt_pages::AddPageOption(app, options.page);
}

Options ReadOptions(int argc, const char* const* argv)
{
    Options options;
    CLI::App app;
    AddOptions(app, options);
    try {
        app.parse(argc, argv);
    } catch (const CLI::Success& done) {
        options.finished = true;
        options.code = app.exit(done, std::cout, std::cerr);
    } catch (const CLI::ParseError& fault) {
        std::cerr << "ztsh: " << fault.what() << "; see ztsh --help\n";
        options.finished = true;
        options.code = ExitUsage;
    }
    return options;
}

} // namespace ztsh
