#ifndef ZTSH_SCRIPT_RUNNER_H
#define ZTSH_SCRIPT_RUNNER_H

/// \file
/// Runs scripts: takes statement after statement from a source and delegates
/// each, and keeps what all of that shares.

#include "outcome.h"
#include "script/due_statements.h"
#include "script/idle.h"
#include "script/reports.h"
#include "script/script_buffer.h"
#include "script/source.h"
#include "words/variables.h"

#include <ZT/directive.h>

#include <optional>
#include <string>
#include <vector>

namespace ztsh {

/// What the command line settles.
struct Settings
{
    bool safe = false;
    int most_includes = 200; ///< Scripts within each other.
    int jobs = 1;            ///< Worker processes of a sequence.
    double ddr_timeout = 0;  ///< Seconds for a frame to be sent; 0 is any.
};

/// What came of an `Include`.
enum class Included {
    Ran,      ///< The script was run, or its refusal was reported.
    NotFound, ///< It could not be opened; nothing was said.
};

/// The running of scripts.
///
/// Statements that become due by themselves are run between two others, and
/// while it waits; not inside each other, and not inside a sequence, whose
/// frames have nothing to do with them.
class Runner : public Idle
{
public:
    explicit Runner(const Settings& run_settings);

    /// Runs a script that the command line names.
    ///
    /// Reports: prints a line if it cannot be read; a warning if its last
    ///          statement has no newline and was therefore not run.
    void RunFile(const std::string& name);

    /// Runs standard input, as a script that the command line names.
    void RunStandardInput();

    /// Runs the statements of the option -c; the last one needs no newline.
    void RunText(const std::string& text);

    /// Runs statements until there are no more, or the run is to stop.
    void Run(StatementSource& source);

    /// Runs the statements of a prompt: an interrupt ends only the statement
    /// that runs.
    void RunPrompt(StatementSource& source);

    /// Runs a script for the directive `Include`; null and "-" are standard
    /// input.
    ///
    /// Reports: an error for a directory, for a script that a safe shell does
    ///          not read, for standard input by a statement that became due,
    ///          since another one may be waiting for it, and when too many
    ///          scripts include each other. The last unwinds all of them but
    ///          the outermost.
    Included Include(const char* name);

    /// Runs what becomes due in `statements` from now on; null for nothing.
    ///
    /// Requires: `statements` outlives its use here.
    void RunWhenDue(DueStatements* statements);

    bool Due() const override;
    void RunDue() override;
    bool Over() const override { return Stopping(); }

    /// Tells whether the statements that run are to be the last ones.
    bool Stopping() const;

    /// Gives the source of the statement that runs; null outside of `Run`.
    StatementSource* Source() const;

    /// Gives the place of the statement that runs.
    Place Where() const;

    /// Keeps the place of the statement that runs as it is now, though it goes
    /// on to read others from its source.
    void KeepPlace();

    const Settings settings;
    ZtDispatcher dispatcher;
    Outcome outcome;
    Variables variables;
    int sequence_depth = 0; ///< Sequences whose frames run, within each other.

private:
    class SourceScope;
    class HereScope;

    void run_to_end(StreamSource& source);
    void delegate(KvoStatement& statement);
    StreamSource& standard_input();
    Included include_file(const std::string& name);
    bool allowed_when_safe(const std::string& name) const;
    std::string shown_directory(const std::string& directory) const;

    DueStatements* due = nullptr;
    bool running_due = false;
    std::vector<StatementSource*> sources; ///< The innermost last.
    std::optional<Place> kept_place;       ///< Of its running statement.
    std::optional<ScriptBuffer> input_buffer;
    std::optional<StreamSource> input; ///< Standard input, once it was used.
    std::string safe_directory;        ///< Nothing outside it is included.
    int includes = 0;                  ///< Scripts within each other now.
    bool unwinding = false;
    ReportHandler reports;
};

} // namespace ztsh

#endif
