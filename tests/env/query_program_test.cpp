#include "env/query_program.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "KVO/KvoToken.h"
#include "support/FailingMemory.h"
#include "support/FakeProcesses.h"
#include "support/InAChild.h"

using zt_env::Answer;
using zt_env::QueryProgram;

namespace {

using Texts = std::vector<std::string>;

/// The program at /q that answers through `FakeProcesses`.
class QueryProgramTest : public testing::Test
{
protected:
    QueryProgramTest() { processes.programs = {"/q/bin/get_quarn_variable"}; }

    FakeProcesses processes;
};

/// Asks for as many variables as there are names; "(null)" is no answer.
Texts Ask(const char* location, const std::vector<const char*>& names)
{
    std::vector<Answer> answers(names.size());
    QueryProgram(location).ask(names, answers);
    Texts texts;
    for (const Answer& answer : answers)
        texts.emplace_back(answer ? answer.get() : "(null)");
    return texts;
}

/// What a list of the line's words gives.
Texts FirstWordsByLists(const std::string& output, std::size_t lines)
{
    std::istringstream in(output);
    Texts texts;
    for (std::size_t i = 0; i < lines; ++i) {
        KvoTokenList line("", "\n");
        line.Read(in);
        const char* first = line.ArgText(0);
        texts.emplace_back(first ? first : "(null)");
    }
    return texts;
}

/// A search path of the test's own.
class SearchPath
{
public:
    explicit SearchPath(const char* path) : before(std::getenv("PATH"))
    {
        if (path)
            setenv("PATH", path, 1);
        else
            unsetenv("PATH");
    }

    ~SearchPath() { setenv("PATH", before.c_str(), 1); }

private:
    std::string before;
};

} // namespace

TEST_F(QueryProgramTest, AsksForAllNamesInOneLine)
{
    processes.output = "one\ntwo\n";

    const Texts texts = Ask("/q", {"A", "B"});

    EXPECT_EQ(texts, (Texts{"one", "two"}));
    EXPECT_EQ(processes.commands, Texts{"/q/bin/get_quarn_variable A;"
                                        "/q/bin/get_quarn_variable B"});
    EXPECT_EQ(processes.running, 0);
}

TEST_F(QueryProgramTest, IsAskedByItsBareNameWhenTheSearchPathLeadsToIt)
{
    SearchPath path("/a::b");
    processes.programs = {"b/get_quarn_variable"};

    Ask(nullptr, {"A"});

    EXPECT_EQ(processes.commands, Texts{"get_quarn_variable A"});
    EXPECT_EQ(processes.asked,
              (Texts{"/a/get_quarn_variable", "get_quarn_variable",
                     "b/get_quarn_variable"}));
}

TEST_F(QueryProgramTest, IsLookedForInPlainPlacesWithoutASearchPath)
{
    SearchPath none(nullptr);

    Ask(nullptr, {"A"});

    EXPECT_EQ(processes.asked, (Texts{"/bin/get_quarn_variable",
                                      "/usr/bin/get_quarn_variable"}));
    EXPECT_EQ(processes.commands, Texts());
}

TEST_F(QueryProgramTest, IsNotStartedUnlessItIsThere)
{
    processes.programs.clear();

    EXPECT_EQ(Ask("/q", {"A"}), Texts{"(null)"});
    EXPECT_EQ(processes.commands, Texts());
}

TEST_F(QueryProgramTest, IsQuotedOnlyForCharactersOfTheShells)
{
    const std::string tail = "/bin/get_quarn_variable";
    for (const auto& [location, command] :
         std::vector<std::pair<std::string, std::string>>{
             {"/az_AZ.09+,:@%-/x", "/az_AZ.09+,:@%-/x" + tail},
             {"", tail},
             {"/a b", "'/a b" + tail + "'"},
             {"/a=b", "'/a=b" + tail + "'"},
             {"/a'b", "'/a'\\''b" + tail + "'"},
             {"/`id`", "'/`id`" + tail + "'"},
             {"/\xC3\xA4", "'/\xC3\xA4" + tail + "'"},
             {"~", "'~" + tail + "'"}}) {
        processes.commands.clear();
        processes.programs = {location + tail};
        Ask(location.c_str(), {"A"});
        EXPECT_EQ(processes.commands, Texts{command + " A"});
    }
}

TEST_F(QueryProgramTest, AnswersAreTheSameInPiecesAndPastInterruptions)
{
    processes.output = "one two\n  \n\"three\nfour\" five\nsix";
    const Texts whole = Ask("/q", {"A", "B", "C", "D", "E"});
    processes.most_at_once = 1;
    processes.interrupts = true;

    const Texts pieces = Ask("/q", {"A", "B", "C", "D", "E"});

    EXPECT_EQ(whole, (Texts{"one", "(null)", "three\nfour", "six", "(null)"}));
    EXPECT_EQ(pieces, whole);
}

TEST_F(QueryProgramTest, AFaultOfThePipeEndsTheOutput)
{
    processes.output = "one\ntwo\nthree\n";
    processes.read_ends = 6;

    EXPECT_EQ(Ask("/q", {"A", "B", "C"}), (Texts{"one", "tw", "(null)"}));
    EXPECT_EQ(processes.running, 0);
}

TEST_F(QueryProgramTest, ThatCannotBeStartedGivesNoAnswers)
{
    for (const int error : {EMFILE, ENFILE, ENOMEM, EAGAIN, E2BIG}) {
        processes.start_error = error;
        EXPECT_EQ(Ask("/q", {"A", "B"}), (Texts{"(null)", "(null)"}));
    }
    EXPECT_EQ(processes.running, 0);
}

TEST_F(QueryProgramTest, WithoutMemoryThereAreNoAnswersAndNoneIsHalf)
{
    const std::string longer(100, 'x');
    processes.output = longer + "\ntwo\n";
    const std::vector<const char*> names = {"A", "B"};
    bool failed = true;
    for (long spared = 0; failed; ++spared) {
        std::vector<Answer> answers(2);
        {
            FailingMemory none(spared);
            QueryProgram("/q").ask(names, answers);
            failed = FailingMemory::Failed();
        }
        EXPECT_EQ(processes.running, 0);
        ASSERT_LT(spared, 1000);
        if (!failed) {
            EXPECT_EQ(answers[0].get(), longer);
            EXPECT_STREQ(answers[1].get(), "two");
        }
    }
}

TEST_F(QueryProgramTest, TakesTheFirstWordsThatListsOfTheLinesWouldTake)
{
    const std::string alphabet("ab \n\t\"'\\;!#\0\x80", 13);
    std::mt19937 dice(20240611);
    for (int round = 0; round < 5000; ++round) {
        processes.output.clear();
        for (auto length = dice() % 40; length != 0; --length)
            processes.output += alphabet[dice() % alphabet.size()];
        processes.most_at_once = 1 + dice() % 5;
        EXPECT_EQ(Ask("/q", {"A", "B", "C", "D", "E"}),
                  FirstWordsByLists(processes.output, 5))
            << testing::PrintToString(processes.output);
    }
}

namespace {

/// Writes 100 MB on one line, and a second line.
class LongLine : public FakeProcesses
{
public:
    explicit LongLine(std::string line_piece) : piece(line_piece) {}

    std::ptrdiff_t read_output(const zt_platform::ShellLine&, void* to,
                               std::size_t bytes) override
    {
        const std::string& next = left != 0 ? piece : last;
        if (left == 0 && done)
            return 0;
        EXPECT_GE(bytes, next.size());
        std::memcpy(to, next.data(), next.size());
        done = left == 0;
        left -= std::min(left, next.size());
        return static_cast<std::ptrdiff_t>(next.size());
    }

    static constexpr std::size_t total = 100'000'000;

private:
    std::string piece;
    std::string last = "\nsecond\n";
    std::size_t left = total;
    bool done = false;
};

} // namespace

TEST(QueryProgramLines, ALongLineOfManyWordsTakesLittleMemoryInAChild)
{
    RunInAChild(
        [] {
            LongLine processes(std::string(999, 'x') + " ");
            processes.programs = {"/q/bin/get_quarn_variable"};
            EXPECT_EQ(Ask("/q", {"A", "B"}),
                      (Texts{std::string(999, 'x'), "second"}));
        },
        {.memory_bytes = 8 << 20, .cpu_seconds = 20});
}

TEST(QueryProgramLines, AWordOfAHundredMegabytesIsAValueInAChild)
{
    RunInAChild(
        [] {
            LongLine processes(std::string(4000, 'x'));
            processes.programs = {"/q/bin/get_quarn_variable"};
            std::vector<Answer> answers(2);
            const std::vector<const char*> names = {"A", "B"};
            QueryProgram("/q").ask(names, answers);
            EXPECT_EQ(std::strlen(answers[0].get()), LongLine::total);
            EXPECT_STREQ(answers[1].get(), "second");
        },
        {.memory_bytes = std::size_t{1} << 30, .cpu_seconds = 20});
}

TEST(QueryProgramNames, AreLettersDigitsAndUnderscores)
{
    for (int c = 1; c < 256; ++c) {
        const char name[] = {'A', static_cast<char>(c), '\0'};
        const bool plain = std::strchr("ABCDEFGHIJKLMNOPQRSTUVWXYZ_"
                                       "abcdefghijklmnopqrstuvwxyz0123456789",
                                       c) != nullptr;
        EXPECT_EQ(zt_env::may_be_asked(name), plain) << c;
    }
    EXPECT_FALSE(zt_env::may_be_asked(""));
}
