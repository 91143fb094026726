#include "ZT/dircom.h"

#include <clocale>
#include <cstdlib>
#include <iostream>
#include <sstream>
#include <string>

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include "support/CapturedStderr.h"
#include "support/ErrorTrap.h"
#include "support/FailingMemory.h"
#include "support/FakeClock.h"
#include "support/FakeProcesses.h"
#include "support/OtherLocale.h"
#include "support/TempDir.h"
#include "support/ThrowingStderr.h"

namespace {

/// Puts another text in front of standard input; gives the old one back.
class StandardInput
{
public:
    explicit StandardInput(const std::string& text) : buffer(text)
    {
        before = std::cin.rdbuf(&buffer);
        std::cin.clear();
    }
    ~StandardInput()
    {
        std::cin.rdbuf(before);
        std::cin.clear();
    }

private:
    std::stringbuf buffer;
    std::streambuf* before;
};

/// A directive that keeps the statements it is given.
class Recorder : public ZtDirective
{
public:
    explicit Recorder(const char* word) : ZtDirective(word) {}

    void Act(KvoStatement* statement) override
    {
        std::ostringstream text;
        statement->Write(text);
        story += text.str() + "|";
    }

    std::string story;
};

class ScriptTest : public testing::Test
{
protected:
    ScriptTest() { dispatcher.Add(recorder); }

    /// Hands every statement of `text` to the dispatcher and gives what is
    /// written to standard error.
    std::string Told(const std::string& text)
    {
        CapturedStderr captured;
        std::istringstream in(text);
        KvoStatement statement;
        for (statement.Read(in); in.good(); statement.Read(in))
            dispatcher.Delegate(&statement);
        return captured.Text();
    }

    FakeClock clock;
    FakeProcesses processes;
    ZtDispatcher dispatcher;
    ZtCommonDirectives common{dispatcher};
    Recorder* recorder = new Recorder("note"); // the dispatcher's
    TempDir directory;
};

using CommonDirectives = ScriptTest;
using Include = ScriptTest;

} // namespace

// --- the table -------------------------------------------------------------

TEST_F(CommonDirectives, RegistersItsFiveCommands)
{
    std::ostringstream out;

    dispatcher.Info(out, 0);

    EXPECT_EQ(out.str(), "    cd\n    Echo\n    Include\n    note\n"
                         "    System\n    Timer\n");
}

TEST_F(CommonDirectives, KnowsItsCommandsInEitherCase)
{
    EXPECT_EQ(Told("ECHO a\necho b\nEcho c\n"), "a\nb\nc\n");
}

TEST_F(CommonDirectives, AnotherSelectorDoesNothing)
{
    ErrorTrap reports;
    CapturedStderr captured;
    KvoStatement statement("word");

    common.Act(&statement, 5);
    common.Act(&statement, -1);
    common.Act(nullptr, ZtCommonDirectives::Echo);

    EXPECT_EQ(captured.Text(), "");
    EXPECT_EQ(reports.Text(), "");
    EXPECT_EQ(statement.Count(), 1);
}

TEST_F(CommonDirectives, SelectorsAreTheRowsOfTheTable)
{
    CapturedStderr captured;
    KvoStatement echo("echo"), timer("timer"), change("cd"), shell("system");
    change.AddArg("/tmp");
    shell.AddArg("ls");

    common.Act(&timer, 0);
    common.Act(&echo, 1);
    common.Act(&change, 3);
    common.Act(&shell, 4);

    EXPECT_EQ(captured.Text(), " 0\n\n");
    EXPECT_EQ(processes.directories.size(), 1u);
    EXPECT_EQ(processes.commands.size(), 1u);
}

// --- Echo and Timer --------------------------------------------------------

TEST_F(CommonDirectives, EchoWritesItsWordsWithSingleBlanks)
{
    EXPECT_EQ(Told("Echo   a \t  b\n"), "a b\n");
}

TEST_F(CommonDirectives, EchoWithoutWordsWritesANewline)
{
    EXPECT_EQ(Told("Echo\n"), "\n");
}

TEST_F(CommonDirectives, EchoDoesNotRestoreQuotes)
{
    EXPECT_EQ(Told("Echo \"a  b\" 'c;d' \\;\n"), "a  b c;d ;\n");
}

TEST_F(CommonDirectives, EchoWritesFormatsAsTheyStand)
{
    EXPECT_EQ(Told("Echo %n%s%s\n"), "%n%s%s\n");
}

TEST_F(CommonDirectives, EchoWritesNothingToStandardOutput)
{
    testing::internal::CaptureStdout();

    Told("Echo a\nTimer a\n");

    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
}

TEST_F(CommonDirectives, TimerWritesTheSecondsSinceTheTimerBefore)
{
    clock.AdvanceMicroseconds(2500000);
    const std::string since_the_start = Told("Timer\n");
    clock.AdvanceMicroseconds(100000);
    const std::string since_then = Told("Timer frame 12\n");

    EXPECT_EQ(since_the_start, " 2.5\n");
    EXPECT_EQ(since_then, "frame 12 0.1\n");
}

TEST_F(CommonDirectives, TimerWritesSixSignificantDigits)
{
    clock.AdvanceMicroseconds(123456789012);

    EXPECT_EQ(Told("Timer\n"), " 123457\n");
}

TEST_F(CommonDirectives, TimerWritesAPointInEveryLocale)
{
    OtherLocale german("de_DE");
    clock.AdvanceMicroseconds(2500000);

    EXPECT_EQ(Told("Timer\n"), " 2.5\n");
}

TEST_F(CommonDirectives, TimerReadsNegativeWhenTheClockIsSetBack)
{
    clock.AdvanceMicroseconds(-1500000);

    EXPECT_EQ(Told("Timer\n"), " -1.5\n");
}

TEST_F(CommonDirectives, NothingThrowsWhenStandardErrorDoes)
{
    ErrorTrap reports;
    KvoStatement timer("timer"), echo("echo"), script("include");
    echo.AddArg("a");
    script.AddArg("nofile");
    const ThrowingStderr no_output;

    EXPECT_NO_THROW(dispatcher.Delegate(&timer));
    EXPECT_NO_THROW(dispatcher.Delegate(&echo));
    EXPECT_NO_THROW(dispatcher.Delegate(&script));
    EXPECT_TRUE(std::cerr.bad());
}

// --- cd and System ---------------------------------------------------------

TEST_F(CommonDirectives, CdChangesToItsFirstWord)
{
    EXPECT_EQ(Told("cd /tmp /usr\n"), "");

    EXPECT_EQ(processes.directories, (std::vector<std::string>{"/tmp"}));
}

TEST_F(CommonDirectives, CdWithoutAWordChangesNothing)
{
    Told("cd\n");

    EXPECT_TRUE(processes.directories.empty());
}

TEST_F(CommonDirectives, FailuresOfCdAndSystemAreSilent)
{
    ErrorTrap reports;
    processes.result = -1;
    zt_platform::Processes::install(nullptr);
    const std::string of_cd = Told("cd /no/such/directory\n");
    zt_platform::Processes::install(&processes);

    EXPECT_EQ(of_cd, "");
    EXPECT_EQ(Told("System ls\n"), "");
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(CommonDirectives, SystemGivesItsWordsAndANewlineToTheShell)
{
    Told("system   ls \t -l\n");

    EXPECT_EQ(processes.commands, (std::vector<std::string>{"ls -l\n"}));
}

TEST_F(CommonDirectives, SystemWithoutWordsGivesALoneNewline)
{
    Told("System\n");

    EXPECT_EQ(processes.commands, (std::vector<std::string>{"\n"}));
}

TEST_F(CommonDirectives, SystemDoesNotRestoreQuotes)
{
    Told("System echo \"a;b\" $(id)\n");

    EXPECT_EQ(processes.commands,
              (std::vector<std::string>{"echo a;b $(id)\n"}));
}

TEST_F(CommonDirectives, SystemRunsTheShell)
{
    zt_platform::Processes::install(nullptr);
    const std::string told = Told("System echo shown >&2\n");
    zt_platform::Processes::install(&processes);

    EXPECT_EQ(told, "shown\n");
}

TEST_F(CommonDirectives, SystemCanBeCalledByAHost)
{
    KvoStatement statement("system");
    statement.AddArg("ls");

    common.System(&statement);
    common.System(nullptr);

    EXPECT_EQ(processes.commands, (std::vector<std::string>{"ls\n"}));
    EXPECT_EQ(statement.Count(), 1);
}

TEST_F(CommonDirectives, SystemWithoutMemoryRunsNothing)
{
    KvoStatement statement("system");
    statement.AddArg(std::string(5000, 'x').c_str());

    {
        FailingMemory none;
        common.System(&statement);
    }

    EXPECT_TRUE(processes.commands.empty());
}

// --- Include ---------------------------------------------------------------

TEST_F(Include, ReadsTheStatementsOfAFile)
{
    const std::string script =
        directory.Write("script", "note a\n# not this\n\nnote b; note c\n");

    Told("Include " + script + "\nnote d\n");

    EXPECT_EQ(recorder->story, "note a|note b|note c|note d|");
}

TEST_F(Include, RunsAnInnerScriptToItsEndFirst)
{
    const std::string inner = directory.Write("inner", "note b\nnote c\n");
    const std::string outer =
        directory.Write("outer", "note a\nInclude " + inner + "\nnote d\n");

    Told("Include " + outer + "\n");

    EXPECT_EQ(recorder->story, "note a|note b|note c|note d|");
}

TEST_F(Include, ALastLineWithoutNewlineIsNotCarriedOut)
{
    const std::string script = directory.Write("script", "Echo a\nEcho x");

    EXPECT_EQ(Told("Include " + script + "\n"), "a\n");
}

TEST_F(Include, ALastLineEndedByASemicolonIsCarriedOut)
{
    const std::string script = directory.Write("script", "Echo a\nEcho x;");

    EXPECT_EQ(Told("Include " + script + "\n"), "a\nx\n");
}

TEST_F(Include, AMissingScriptIsToldAndTheOuterGoesOn)
{
    ErrorTrap reports;
    const std::string script =
        directory.Write("script", "Include nofile\nEcho on\n");

    EXPECT_EQ(Told("Include " + script + "\n"),
              "Error - ZtDispatcher: Cannot open file nofile\non\n");
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(Include, AFilesNameIsToldAsItStands)
{
    EXPECT_EQ(Told("Include '%n%s a'\n"),
              "Error - ZtDispatcher: Cannot open file %n%s a\n");
    EXPECT_EQ(Told("Include \"\"\n"),
              "Error - ZtDispatcher: Cannot open file \n");
}

TEST_F(Include, AMinusIsStandardInput)
{
    StandardInput input("note a\nnote b\nnote never");

    Told("include -\nnote c\n");

    EXPECT_EQ(recorder->story, "note a|note b|note c|");
    EXPECT_TRUE(std::cin.eof());
}

TEST_F(Include, NoNameIsStandardInputToo)
{
    StandardInput input("note a\n");

    Told("Include\nnote b\n");

    EXPECT_EQ(recorder->story, "note a|note b|");
}

TEST_F(Include, StandardInputAtItsEndGivesNothing)
{
    StandardInput input("");

    Told("Include\nInclude -\nnote b\n");

    EXPECT_EQ(recorder->story, "note b|");
}

TEST_F(Include, StandardInputIsReadOnByAnInnerInclude)
{
    StandardInput input("note a\nInclude -\nnote b\nnote c\n");

    Told("Include -\nnote d\n");

    EXPECT_EQ(recorder->story, "note a|note b|note c|note d|");
}

TEST_F(Include, AScriptThatIncludesItselfEndsAtTheFileLimit)
{
    rlimit before = {};
    getrlimit(RLIMIT_NOFILE, &before);
    const std::string script = directory.Path("script");
    directory.Write("script", "note down\nInclude " + script + "\nnote up\n");
    CapturedStderr captured;

    rlimit few = {40, before.rlim_max};
    setrlimit(RLIMIT_NOFILE, &few);
    common.Include(script.c_str());
    setrlimit(RLIMIT_NOFILE, &before);

    EXPECT_EQ(captured.Text(),
              "Error - ZtDispatcher: Cannot open file " + script + "\n");
    const std::size_t turn = recorder->story.find("note up");
    ASSERT_NE(turn, std::string::npos);
    const std::size_t depth = turn / std::string("note down|").size();
    EXPECT_GT(depth, 10u);
    EXPECT_EQ(recorder->story.size(),
              depth * std::string("note down|").size() +
                  depth * std::string("note up|").size());
}

TEST_F(Include, ADirectoryIsAnEmptyScript)
{
    EXPECT_EQ(Told("Include " + directory.Path("") + "\nnote a\n"), "");

    EXPECT_EQ(recorder->story, "note a|");
}

TEST_F(Include, APipeWithANameIsAScriptLikeOthers)
{
    const std::string pipe = directory.Path("pipe");
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    ASSERT_EQ(std::system(("(echo note a > " + pipe + ") &").c_str()), 0);

    Told("Include " + pipe + "\nnote b\n");

    EXPECT_EQ(recorder->story, "note a|note b|");
}

TEST_F(Include, AnUnknownCommandDoesNotEndTheScript)
{
    ErrorTrap reports;
    const std::string script =
        directory.Write("script", "frobnicate x\nnote a\n");

    Told("Include " + script + "\n");

    EXPECT_EQ(reports.Text(), "Warning: Unknown command: frobnicate x\n");
    EXPECT_EQ(recorder->story, "note a|");
}

TEST_F(Include, WithoutMemoryTheScriptCannotBeOpened)
{
    const std::string script = directory.Write("script", "note a\n");
    CapturedStderr captured;

    {
        FailingMemory none;
        common.Include(script.c_str());
    }

    EXPECT_EQ(recorder->story, "");
    common.Include(script.c_str());
    EXPECT_EQ(recorder->story, "note a|");
}
