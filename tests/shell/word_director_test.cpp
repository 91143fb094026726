#include "support/CapturedStderr.h"
#include "words/word_director.h"

#include <ZT/error.h>

#include <sstream>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

const std::vector<Word> words = {
    {"Move", "NAME [PLACE]", "Moves a thing.\nOr not.", 1, 2},
    {"Stop", "", "Stops.", 0, 0},
};

class Mover : public WordDirector
{
public:
    explicit Mover(ZtDispatcher& home) : WordDirector(home, words)
    {
        AddEach(each_selector);
    }

    std::string done;
    int seen = 0;

protected:
    void Do(KvoStatement& statement, int selector) override
    {
        std::ostringstream text;
        statement.Write(text);
        done += std::to_string(selector) + ":" + text.str() + ";";
    }
    void SeeEach(KvoStatement&) override { ++seen; }
};

void Delegate(ZtDispatcher& dispatcher, const std::string& text)
{
    std::istringstream in(text + "\n");
    KvoStatement statement;
    statement.Read(in);
    dispatcher.Delegate(&statement);
}

} // namespace

TEST(WordDirector, CarriesOutStatementsWithTheRightCount)
{
    ZtDispatcher dispatcher;
    Mover mover(dispatcher);

    Delegate(dispatcher, "move a");
    Delegate(dispatcher, "Move a b");
    Delegate(dispatcher, "Stop");

    EXPECT_EQ(mover.done, "0:move a;0:Move a b;1:Stop;");
    EXPECT_EQ(mover.seen, 3);
}

TEST(WordDirector, SaysWhatWasExpectedForAWrongCount)
{
    ZtDispatcher dispatcher;
    Mover mover(dispatcher);
    CapturedStderr errors;

    Delegate(dispatcher, "move");
    Delegate(dispatcher, "move a b c");
    Delegate(dispatcher, "Stop now");

    EXPECT_EQ(errors.Text(), "Error: Move: expected: Move NAME [PLACE]\n"
                             "Error: Move: expected: Move NAME [PLACE]\n"
                             "Error: Stop: expected: Stop\n");
    EXPECT_EQ(mover.done, "");
}

TEST(WordDirector, WritesUsageOrHelp)
{
    ZtDispatcher dispatcher;
    Mover mover(dispatcher);
    std::ostringstream usage;
    std::ostringstream help;

    dispatcher.Info(usage, InfoUsage);
    dispatcher.Info(help, InfoHelp);

    EXPECT_EQ(usage.str(), "    Move NAME [PLACE]\n    Stop\n");
    EXPECT_EQ(help.str(), "    Move NAME [PLACE]\n        Moves a thing.\n"
                          "        Or not.\n    Stop\n        Stops.\n");
}

TEST(ReadNumber, TakesWholeDecimalNumbersInRange)
{
    long number = 5;

    EXPECT_TRUE(ReadNumber("12", 1, 12, number));
    EXPECT_EQ(number, 12);
    EXPECT_TRUE(ReadNumber("-3", -3, 12, number));
    EXPECT_EQ(number, -3);
}

TEST(ReadNumber, RefusesEverythingElseAndKeepsTheNumber)
{
    long number = 5;
    for (const char* text : {"", "13", "0", "x", "1x", " 1", "1 ", "+1", "1.0",
                             "0x1", "99999999999999999999"})
        EXPECT_FALSE(ReadNumber(text, 1, 12, number)) << text;

    EXPECT_EQ(number, 5);
}
