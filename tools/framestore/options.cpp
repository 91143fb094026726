#include "options.h"

#include "common/number_option.h"
#include "pages/pages.h"

#include <iostream>

#include <CLI/CLI.hpp>

namespace framestore {

namespace {

constexpr int last_port = 65535;
constexpr int most_clients_allowed = 1000;
constexpr double shortest_timeout = 0.01;
constexpr double longest_timeout = 86400;

constexpr const char* footer =
    "Writes each frame as DIR/frame.NNNNNN.yuv, its number in at least six\n"
    "digits, and one line about it to standard output. Stops at SIGINT,\n"
    "SIGTERM and SIGHUP; a frame that is not complete leaves no file.\n"
    "\n"
    "Exit codes:\n"
    "  0      stopped by a signal\n"
    "  1      cannot listen, cannot write to DIR, or cannot make FILE\n"
    "  2      the command line is wrong";

/// Checks that a name is one: the empty one would mean the root directory.
CLI::Validator not_empty()
{
    return CLI::Validator(
        [](const std::string& name) {
            return std::string(name.empty() ? "the name is empty" : "");
        },
        "");
}

void add_options(CLI::App& app, Options& options)
{
    Settings& settings = options.settings;
    app.name("zt-framestore");
    app.description("Receives video frames over TCP and writes them to disk.");
    app.footer(footer);
    app.set_version_flag("--version", "zt-framestore " ZT_FRAMESTORE_VERSION);
    app.add_option("--listen", settings.address,
                   "Address to listen on, in dotted form (default: 127.0.0.1)")
        ->option_text("ADDRESS");
    app.add_option("--port", settings.port,
                   "Port to listen on; 0 has the system choose one, which is "
                   "printed (default: 5333)")
        ->option_text("N")
        ->check(CLI::Range(0, last_port));
    app.add_option("--directory", settings.storage.directory,
                   "Where frames are written (default: here)")
        ->option_text("DIR")
        ->check(not_empty());
    app.add_flag("--png", settings.storage.png,
                 "Also write each frame as a PNG file, its lines in order");
    app.add_flag("--interleave", settings.storage.interleaved,
                 "Write the lines of a frame in the order of the picture, not "
                 "one field after the other as they come");
    app.add_option("--lock", settings.lock,
                   "A file that is there, to have clients wait, while as many "
                   "are connected as --clients says (default: none)")
        ->option_text("FILE")
        ->check(not_empty());
    app.add_option("--clients", settings.most_clients,
                   "How many clients are served at a time; others are left "
                   "waiting (default: 16)")
        ->option_text("N")
        ->check(CLI::Range(1, most_clients_allowed));
    app.add_option("--timeout", settings.timeout,
                   "How long a client may take for its frame, in seconds "
                   "(default: 60)")
        ->option_text("SECONDS")
        ->check(zt_tools::NumberFromTo(shortest_timeout, longest_timeout));
    zt_pages::AddPageOption(app, options.page);
}

void write_page(const CLI::App& app, const std::string& kind)
{
    zt_pages::Command command = zt_pages::CommandOf(app);
    command.version = "libzt_util2 " ZT_FRAMESTORE_VERSION;
    for (const char* name : {"--directory", "--lock"})
        command.Find(name)->files = true;
    command.sections.push_back(
        {"see also", "ztsh(1). The message is described byte by byte in\n"
                     "docs/frame-store.md, with the library's other guides."});
    zt_pages::Write(std::cout, kind, command);
}

} // namespace

Options ReadOptions(int argc, const char* const* argv)
{
    Options options;
    CLI::App app;
    add_options(app, options);
    try {
        app.parse(argc, argv);
        if (!options.page.empty()) {
            write_page(app, options.page);
            options.finished = true;
        }
    } catch (const CLI::Success& done) {
        options.finished = true;
        options.code = app.exit(done, std::cout, std::cerr);
    } catch (const CLI::ParseError& fault) {
        std::cerr << "zt-framestore: " << fault.what()
                  << "; see zt-framestore --help\n";
        options.finished = true;
        options.code = ExitUsage;
    }
    return options;
}

} // namespace framestore
