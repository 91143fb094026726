#include "script/runner.h"
#include "support/CapturedStderr.h"
#include "support/TempDir.h"

#include <ZT/dircom.h>

#include <filesystem>
#include <random>
#include <sstream>

#include <gtest/gtest.h>

using ztsh::ExitCannotRead;
using ztsh::Place;
using ztsh::Runner;
using ztsh::Settings;

namespace {

/// Keeps every statement that is delegated.
class Recorder : public ZtDirector
{
public:
    explicit Recorder(ZtDispatcher& home) : ZtDirector(home) { AddEach(0); }

    void Act(KvoStatement* statement, int) override
    {
        std::ostringstream words;
        for (int i = 0; const char* word = statement->ArgText(i); ++i)
            words << "<" << word << ">";
        seen.push_back(words.str());
    }

    std::vector<std::string> seen;
};

std::string RandomScript(std::mt19937& random)
{
    static const char* const pieces[] = {
        "a",       "b c", " ",    "\n",   "\n\n", ";",    "!",   "#",
        "# x ",    "\\",  "\"",   "'",    "\\\n", "\t",   "\r",  "\\;",
        "\"q r\"", "'#'", "\x01", "\xE4", "\"\"", "!x\n", "#y\n"};
    std::string script;
    for (auto i = random() % 30; i > 0; --i)
        script += pieces[random() % std::size(pieces)];
    return script;
}

} // namespace

// The shell reads its scripts with a loop of its own, for the lines and the
// depth; the library's `Include` is what it has to agree with.
TEST(Runner, DelegatesWhatTheLibrarysIncludeDelegates)
{
    TempDir dir;
    std::mt19937 random(20);
    CapturedStderr silence;
    for (int i = 0; i < 1500; ++i) {
        std::string script = RandomScript(random);
        std::string name = dir.Write("script", script);
        ZtDispatcher dispatcher;
        ZtCommonDirectives common(dispatcher);
        Recorder expected(dispatcher);
        common.Include(name.c_str());

        Runner runner{Settings()};
        Recorder recorder(runner.dispatcher);
        runner.RunFile(name);

        ASSERT_EQ(recorder.seen, expected.seen) << script;
    }
}

TEST(Runner, NamesTheLineOfEachStatement)
{
    TempDir dir;
    std::string name = dir.Write("a.zt", "one\n# c\n\ntwo \"\n\"; three\nx");
    Runner runner{Settings()};
    CapturedStderr silence;
    class LineRecorder : public ZtDirector
    {
    public:
        explicit LineRecorder(Runner& own_runner)
            : ZtDirector(own_runner.dispatcher), runner(own_runner)
        {
            AddEach(0);
        }
        void Act(KvoStatement*, int) override
        {
            lines.push_back(runner.Where().line);
        }
        Runner& runner;
        std::vector<long> lines;
    } recorder(runner);

    runner.RunFile(name);

    EXPECT_EQ(recorder.lines, (std::vector<long>{1, 4, 5}));
    EXPECT_EQ(runner.Where().name, "");
}

TEST(Runner, NotesAScriptThatCannotBeRead)
{
    Runner runner{Settings()};
    CapturedStderr errors;

    runner.RunFile("/nonexistent/a.zt");

    EXPECT_EQ(errors.Text(), "ztsh: cannot read script /nonexistent/a.zt: No "
                             "such file or directory\n");
    EXPECT_EQ(runner.outcome.Code(), ExitCannotRead);
}

TEST(Runner, HereIsTheDirectoryOfTheScriptWhileItRuns)
{
    TempDir dir;
    std::filesystem::create_directory(dir.Path("sub"));
    std::string name = dir.Write("sub/a.zt", "x\n");
    Runner runner{Settings()};
    class HereRecorder : public ZtDirector
    {
    public:
        explicit HereRecorder(Runner& own_runner)
            : ZtDirector(own_runner.dispatcher), runner(own_runner)
        {
            AddDirective(0, "x");
        }
        void Act(KvoStatement*, int) override
        {
            here = runner.variables.Find("here");
        }
        Runner& runner;
        std::string here;
    } recorder(runner);
    std::string before = runner.variables.Find("here");

    runner.RunFile(name);

    EXPECT_EQ(recorder.here,
              std::filesystem::canonical(dir.Path("sub")).string());
    EXPECT_EQ(std::string(runner.variables.Find("here")), before);
}

TEST(ReportHandler, CountsWarningsAndErrorsOnly)
{
    Runner runner{Settings()};
    CapturedStderr silence;

    ZtInform("no\n");
    ZtStatus("no\n");
    ZtDebug("no\n");
    EXPECT_EQ(runner.outcome.Reports(), 0);
    EXPECT_EQ(runner.outcome.Code(), 0);
    ZtWarning("one\n");
    ZtError("two\n");

    EXPECT_EQ(runner.outcome.Reports(), 2);
    EXPECT_EQ(runner.outcome.Code(), 1);
    EXPECT_EQ(silence.Text(), "Warning: one\nError: two\n");
}

TEST(ReportHandler, TellsThePlaceOfReportsThatAreOnlyInformation)
{
    Runner runner{Settings()};
    CapturedStderr errors;
    class Informer : public ZtDirector
    {
    public:
        explicit Informer(ZtDispatcher& home) : ZtDirector(home)
        {
            AddDirective(0, "x");
        }
        void Act(KvoStatement*, int) override { ZtInform("told\n"); }
    } informer(runner.dispatcher);

    runner.RunText("x");
    ZtErrHandler::outputLevel = 2;
    runner.RunText("\nx");
    ZtErrHandler::outputLevel = 3;

    EXPECT_EQ(errors.Text(), "Info: told\n    at -c:2\n");
}

TEST(Outcome, TheHighestCodeThatAppliesIsGiven)
{
    ztsh::Outcome outcome;

    outcome.Note(3);
    outcome.CountReport();

    EXPECT_EQ(outcome.Code(), 3);
}

TEST(Outcome, TheCodeOfQuitHolds)
{
    ztsh::Outcome outcome;
    outcome.Note(4);

    outcome.Quit(0);

    EXPECT_TRUE(outcome.Quitting());
    EXPECT_EQ(outcome.Code(), 0);
}
