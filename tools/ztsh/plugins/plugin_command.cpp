#include "plugins/plugin_command.h"

#include "exit_code.h"
#include "plugins/plugin_check.h"
#include "plugins/plugin_template.h"
#include "system/files.h"

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iostream>

#include <CLI/CLI.hpp>

namespace ztsh {

namespace {

constexpr const char* footer =
    "A script called plugin is run as: ztsh ./plugin\n"
    "\n"
    "Exit codes:\n"
    "  0      all well\n"
    "  1      something is wrong with a plug-in, or it is there already\n"
    "  2      the command line is wrong\n"
    "  3      a plug-in could not be read\n"
    "  4      a file could not be written";

struct Request
{
    std::string kind;
    std::string name;
    std::string directory;
    std::vector<std::string> files;
    std::string beside;
};

void add_kind(CLI::App& app, std::string& kind, const char* help)
{
    std::vector<std::string> names;
    for (const PluginKind& known : plugin_kinds)
        names.emplace_back(known.name);
    app.add_option("--kind", kind, help)
        ->option_text("KIND")
        ->check(CLI::IsMember(names));
}

/// Writes a file that is not there yet, and its directory if need be.
///
/// Returns: the empty text, or why it could not be done.
std::string write_new(const std::filesystem::path& path,
                      const std::string& text)
{
    std::error_code fault;
    std::filesystem::create_directories(path.parent_path(), fault);
    if (fault)
        return fault.message();
    std::string why = WhyNotWritable(path.string());
    if (!why.empty())
        return why;
    std::ofstream out(path, std::ios::binary);
    out << text << std::flush;
    return out ? "" : "cannot be written";
}

int write_template(const Request& request)
{
    if (!IsPluginName(request.name)) {
        std::cerr << "ztsh: " << request.name
                  << " is no name for a plug-in: a letter, then letters, "
                     "digits and underscores\n";
        return ExitUsage;
    }
    const std::filesystem::path directory =
        request.directory.empty() ? request.name : request.directory;
    const PluginKind* kind =
        KindByName(request.kind.empty() ? "directive" : request.kind);
    const auto files = TemplateFiles(request.name, *kind);
    // A path that cannot even be looked at is told when it is to be written.
    std::error_code unknown;
    for (const TemplateFile& file : files)
        if (std::filesystem::exists(directory / file.name, unknown)) {
            std::cerr << "ztsh: " << (directory / file.name).string()
                      << " is there already; nothing was written\n";
            return ExitReported;
        }
    for (const TemplateFile& file : files) {
        const std::filesystem::path path = directory / file.name;
        const std::string why = write_new(path, file.text);
        if (!why.empty()) {
            std::cerr << "ztsh: " << path.string() << ": " << why << "\n";
            return ExitCannotWrite;
        }
        std::cout << path.string() << "\n";
    }
    return ExitWell;
}

int check_plugins(const Request& request)
{
    int code = ExitWell;
    for (const std::string& file : request.files) {
        const PluginReport report =
            CheckPlugin(file, KindByName(request.kind), request.beside);
        for (const std::string& line : report.good)
            std::cout << file << ": " << line << "\n";
        for (const std::string& line : report.bad)
            std::cout << file << ": WRONG: " << line << "\n";
        if (report.bad.empty())
            std::cout << file << ": all well\n";
        else
            code = std::max<int>(code, report.readable ? ExitReported
                                                       : ExitCannotRead);
    }
    return std::cout.flush() ? code : ExitCannotWrite;
}

} // namespace

bool IsPluginCommand(int argc, const char* const* argv)
{
    return argc > 1 && std::strcmp(argv[1], "plugin") == 0;
}

int RunPluginCommand(int argc, const char* const* argv)
{
    Request request;
    CLI::App app("Helps authors of plug-ins.", "ztsh plugin");
    app.footer(footer);
    app.require_subcommand(1);
    CLI::App* make = app.add_subcommand(
        "new", "Writes the beginning of a plug-in: source, build and test");
    make->add_option("name", request.name, "What the plug-in registers")
        ->required();
    make->add_option("directory", request.directory,
                     "Where the files go (default: NAME)");
    add_kind(*make, request.kind,
             "directive (the default), a command word; or recognizer");
    CLI::App* check = app.add_subcommand(
        "check", "Loads plug-ins in a process of their own, unloads them, and "
                 "says line by line what is wrong with them");
    check->add_option("file", request.files, "The plug-ins")->required();
    add_kind(*check, request.kind,
             "directive or recognizer (default: what the name tells)");
    check
        ->add_option("--beside", request.beside,
                     "Load the plug-ins of these directories, parted by \":\", "
                     "first")
        ->option_text("DIRECTORIES");
    try {
        app.parse(argc - 1, argv + 1);
    } catch (const CLI::Success& done) {
        return app.exit(done, std::cout, std::cerr);
    } catch (const CLI::ParseError& fault) {
        std::cerr << "ztsh plugin: " << fault.what()
                  << "; see ztsh plugin --help\n";
        return ExitUsage;
    }
    return make->parsed() ? write_template(request) : check_plugins(request);
}

} // namespace ztsh
