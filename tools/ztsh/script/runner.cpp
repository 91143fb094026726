#include "script/runner.h"

#include "system/files.h"
#include "system/signals.h"

#include <csignal>
#include <cstring>
#include <filesystem>
#include <iostream>
#include <unistd.h>

namespace ztsh {

namespace {

constexpr const char* here_variable = "here";

std::string directory_of(const std::string& name)
{
    std::string directory = std::filesystem::path(name).parent_path().string();
    return directory.empty() ? "." : directory;
}

/// The words of a statement as one short line.
std::string shortened(std::string words)
{
    constexpr std::size_t most = 60;
    for (char& character : words)
        if (static_cast<unsigned char>(character) < ' ')
            character = ' ';
    if (words.size() > most)
        words = words.substr(0, most) + "...";
    return words;
}

} // namespace

/// Puts a source on the stack for a while.
class Runner::SourceScope
{
public:
    SourceScope(Runner& own_runner, StatementSource& source)
        : runner(own_runner), former_place(own_runner.kept_place)
    {
        runner.sources.push_back(&source);
        runner.kept_place.reset();
    }
    ~SourceScope()
    {
        runner.sources.pop_back();
        runner.kept_place = former_place;
    }
    SourceScope(const SourceScope&) = delete;
    SourceScope& operator=(const SourceScope&) = delete;

private:
    Runner& runner;
    std::optional<Place> former_place;
};

/// Sets `$here` for a while.
class Runner::HereScope
{
public:
    HereScope(Runner& own_runner, const std::string& directory)
        : runner(own_runner)
    {
        if (const char* present = runner.variables.Find(here_variable))
            former = present;
        runner.variables.Set(here_variable, runner.shown_directory(directory));
    }
    ~HereScope()
    {
        if (former)
            runner.variables.Set(here_variable, *former);
        else
            runner.variables.Remove(here_variable);
    }
    HereScope(const HereScope&) = delete;
    HereScope& operator=(const HereScope&) = delete;

private:
    Runner& runner;
    std::optional<std::string> former;
};

Runner::Runner(const Settings& run_settings)
    : settings(run_settings), reports(outcome, [this] { return Where(); })
{
    variables.Set(here_variable, shown_directory("."));
}

void Runner::RunFile(const std::string& name)
{
    std::string why;
    int descriptor = OpenScript(name, why);
    if (descriptor < 0 && StopSignal() != 0)
        return; // The wait for somebody who writes to a pipe was cut short.
    if (descriptor < 0) {
        std::cerr << "ztsh: cannot read script " << name << ": " << why << "\n";
        outcome.Note(ExitCannotRead);
        return;
    }
    std::error_code ignored;
    safe_directory =
        std::filesystem::weakly_canonical(directory_of(name), ignored).string();
    HereScope here(*this, directory_of(name));
    ScriptBuffer buffer(descriptor, this);
    StreamSource source(name, buffer);
    run_to_end(source);
    close(descriptor);
    safe_directory.clear();
}

void Runner::RunStandardInput()
{
    run_to_end(standard_input());
}

void Runner::RunText(const std::string& text)
{
    ScriptBuffer buffer(text + "\n");
    StreamSource source("-c", buffer);
    run_to_end(source);
}

/// Runs a script that nothing includes.
void Runner::run_to_end(StreamSource& source)
{
    Run(source);
    if (Stopping() || source.Unfinished().empty())
        return;
    SourceScope scope(*this, source);
    ZtWarning("Last statement not run, it needs a newline behind it: %s\n",
              shortened(source.Unfinished()).c_str());
}

void Runner::Run(StatementSource& source)
{
    SourceScope scope(*this, source);
    KvoStatement statement;
    while (!Stopping()) {
        Next next = source.Read(statement);
        if (next == Next::End)
            return;
        if (next == Next::Got && StopSignal() == 0)
            delegate(statement);
        RunDue();
    }
}

void Runner::RunPrompt(StatementSource& source)
{
    SourceScope scope(*this, source);
    KvoStatement statement;
    while (!Stopping()) {
        Next next = source.Read(statement);
        if (next == Next::End)
            return;
        if (next == Next::Got)
            delegate(statement);
        RunDue();
        if (StopSignal() == SIGINT)
            ClearStopSignal();
    }
}

void Runner::delegate(KvoStatement& statement)
{
    dispatcher.Delegate(&statement);
    kept_place.reset();
    std::cout.flush();
}

void Runner::RunWhenDue(DueStatements* statements)
{
    due = statements;
}

bool Runner::Due() const
{
    return due && !running_due && sequence_depth == 0 && due->Any();
}

/// Runs only what is due at the start, so that what becomes due again and again
/// never keeps the script from going on.
void Runner::RunDue()
{
    if (!Due() || Stopping())
        return;
    running_due = true;
    for (const auto& taken : due->Take()) {
        std::shared_ptr<const Statements> statements = taken.lock();
        if (!statements || Stopping())
            continue;
        BlockSource source(*statements);
        Run(source);
    }
    running_due = false;
}

Included Runner::Include(const char* name)
{
    if (includes >= settings.most_includes) {
        ZtError("Include: more than %d scripts within each other, %s is not "
                "read\n",
                settings.most_includes, name ? name : "-");
        unwinding = true;
        return Included::Ran;
    }
    bool from_input = !name || std::strcmp(name, "-") == 0;
    if (from_input && running_due) {
        ZtError("Include: a statement that became due does not read standard "
                "input\n");
        return Included::Ran;
    }
    ++includes;
    Included came = Included::Ran;
    if (from_input)
        Run(standard_input());
    else
        came = include_file(name);
    --includes;
    if (includes == 0)
        unwinding = false;
    return came;
}

Included Runner::include_file(const std::string& name)
{
    if (settings.safe && !allowed_when_safe(name)) {
        ZtError("Include: %s is not a relative path below the script's "
                "directory (--safe)\n",
                name.c_str());
        return Included::Ran;
    }
    std::string why;
    int descriptor = OpenScript(name, why);
    if (descriptor < 0 && StopSignal() != 0)
        return Included::Ran;
    std::error_code ignored;
    if (descriptor < 0 && !std::filesystem::is_directory(name, ignored)) {
        outcome.Note(ExitCannotRead);
        return Included::NotFound;
    }
    if (descriptor < 0) {
        ZtError("Include: cannot read script %s: %s\n", name.c_str(),
                why.c_str());
        outcome.Note(ExitCannotRead);
        return Included::Ran;
    }
    HereScope here(*this, directory_of(name));
    {
        ScriptBuffer buffer(descriptor, this);
        StreamSource source(name, buffer);
        Run(source);
    }
    close(descriptor);
    return Included::Ran;
}

bool Runner::Stopping() const
{
    return outcome.Quitting() || unwinding || StopSignal() != 0;
}

StatementSource* Runner::Source() const
{
    return sources.empty() ? nullptr : sources.back();
}

Place Runner::Where() const
{
    if (kept_place)
        return *kept_place;
    return sources.empty() ? Place{} : sources.back()->Where();
}

void Runner::KeepPlace()
{
    kept_place = Where();
}

/// Standard input is one source, however often it is asked for: what one use
/// has read ahead the next one must find.
StreamSource& Runner::standard_input()
{
    if (!input) {
        input_buffer.emplace(STDIN_FILENO, this);
        input.emplace("standard input", *input_buffer);
    }
    return *input;
}

bool Runner::allowed_when_safe(const std::string& name) const
{
    std::error_code fault;
    std::filesystem::path base = safe_directory.empty()
                                     ? std::filesystem::current_path(fault)
                                     : std::filesystem::path(safe_directory);
    std::filesystem::path path = std::filesystem::weakly_canonical(name, fault);
    if (fault || std::filesystem::path(name).is_absolute())
        return false;
    std::string below = path.lexically_relative(base).string();
    return !below.empty() && below != ".." && below.rfind("../", 0) != 0;
}

/// A directory as `$here` gives it: whole, so that it stays right when the
/// script changes the directory; relative in a safe shell, which does not let
/// it and includes nothing else.
std::string Runner::shown_directory(const std::string& directory) const
{
    std::error_code fault;
    std::filesystem::path whole =
        std::filesystem::weakly_canonical(directory, fault);
    if (fault)
        return directory;
    if (!settings.safe)
        return whole.string();
    std::filesystem::path relative = std::filesystem::proximate(whole, fault);
    return fault ? directory : relative.string();
}

} // namespace ztsh
