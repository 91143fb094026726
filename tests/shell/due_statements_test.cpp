#include "script/runner.h"
#include "support/CapturedStderr.h"

#include <ZT/error.h>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

/// Gives out statements when it is told that they are due.
class Timetable : public DueStatements
{
public:
    bool Any() const override { return !due.empty(); }

    std::vector<std::weak_ptr<const Statements>> Take() override
    {
        std::vector<std::weak_ptr<const Statements>> taken(due.begin(),
                                                           due.end());
        kept.insert(kept.end(), due.begin(), due.end());
        due.clear();
        return taken;
    }

    void Add(const char* word)
    {
        Statements statements = {{KvoStatement(word), {"table", 7}}};
        due.push_back(std::make_shared<const Statements>(statements));
    }

    std::vector<std::shared_ptr<const Statements>> due;
    std::vector<std::shared_ptr<const Statements>> kept;
};

/// Notes every word, and does what is named after it.
class Words : public ZtDirector
{
public:
    Words(Runner& own_runner, Timetable& own_table)
        : ZtDirector(own_runner.dispatcher), runner(own_runner),
          table(own_table)
    {
        AddEach(0);
        for (const char* word :
             {"a", "b", "due", "again", "drop", "quit", "input", "bad", "two"})
            AddDirective(1, word);
    }

    void Act(KvoStatement* statement, int selector) override
    {
        std::string word = statement->ArgText(0);
        if (selector == 0) {
            seen += (seen.empty() ? "" : " ") + word;
            return;
        }
        if (word == "due")
            table.Add("again");
        if (word == "again" && times-- > 0)
            table.Add("again");
        if (word == "two")
            for (const char* each : {"drop", "b"})
                table.Add(each);
        if (word == "drop")
            table.kept.clear();
        if (word == "quit")
            runner.outcome.Quit();
        if (word == "input")
            runner.Include("-");
        if (word == "bad")
            ZtError("bad\n");
    }

    std::string seen;
    int times = 0;

private:
    Runner& runner;
    Timetable& table;
};

struct DueStatementsTest : testing::Test
{
    DueStatementsTest() : runner(Settings()), words(runner, table)
    {
        runner.RunWhenDue(&table);
    }
    ~DueStatementsTest() override { runner.RunWhenDue(nullptr); }

    Timetable table;
    Runner runner;
    Words words;
};

} // namespace

TEST_F(DueStatementsTest, AreRunBetweenTwoOthers)
{
    runner.RunText("a; due; a");

    EXPECT_EQ(words.seen, "a due again a");
}

TEST_F(DueStatementsTest, AreNotRunInsideEachOther)
{
    Statements three(3, {KvoStatement("due"), {}});
    table.due.push_back(std::make_shared<const Statements>(three));

    runner.RunText("a; a");

    EXPECT_EQ(words.seen, "a due due due a again again again");
}

TEST_F(DueStatementsTest, ThatBecomeDueAgainAndAgainLetTheScriptGoOn)
{
    words.times = 1000000;

    runner.RunText("due; a; a");

    EXPECT_EQ(words.seen, "due again a again a again");
}

TEST_F(DueStatementsTest, AreLeftOutIfTheyWereWithdrawnMeanwhile)
{
    runner.RunText("two; a");

    EXPECT_EQ(words.seen, "two drop a");
}

TEST_F(DueStatementsTest, AreNotRunInsideASequence)
{
    ++runner.sequence_depth;
    runner.RunText("due; a");
    EXPECT_EQ(words.seen, "due a");
    EXPECT_FALSE(runner.Due());

    --runner.sequence_depth;
    EXPECT_TRUE(runner.Due());
    runner.RunText("b");
    EXPECT_EQ(words.seen, "due a b again");
}

TEST_F(DueStatementsTest, MayEndTheRun)
{
    table.Add("quit");
    table.Add("a");

    runner.RunText("b; b");

    EXPECT_EQ(words.seen, "b quit");
    EXPECT_TRUE(runner.Over());
}

TEST_F(DueStatementsTest, DoNotTakeTheInputThatAnotherOneWaitsFor)
{
    CapturedStderr errors;
    table.Add("input");

    runner.RunText("a");

    EXPECT_EQ(errors.Text(), "Error: Include: a statement that became due does "
                             "not read standard input\n    at table:7\n");
}

TEST_F(DueStatementsTest, AreReportedWhereTheyStand)
{
    CapturedStderr errors;
    table.Add("bad");

    runner.RunText("a; bad");

    EXPECT_EQ(errors.Text(), "Error: bad\n    at table:7\n"
                             "Error: bad\n    at -c:1\n");
}
