#include "prompt/prompt_source.h"
#include "sequence/block.h"

#include <deque>
#include <sstream>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

/// Gives lines that were written down beforehand, and keeps the prompts.
class WrittenEditor : public LineEditor
{
public:
    explicit WrittenEditor(std::deque<std::string> written_lines)
        : lines(std::move(written_lines))
    {}

    Typed Ask(const std::string& prompt, std::string& line) override
    {
        prompts += prompt[0];
        if (lines.empty())
            return Typed::End;
        line = lines.front();
        lines.pop_front();
        return line == "^C" ? Typed::Cancelled : Typed::Line;
    }

    std::deque<std::string> lines;
    std::string prompts; ///< The first character of each.
};

/// Reads everything; a cancelled statement is a "^C".
std::string AllOf(PromptSource& source)
{
    std::string all;
    KvoStatement statement;
    for (;;) {
        Next next = source.Read(statement);
        if (next == Next::End)
            return all;
        std::ostringstream words;
        statement.Write(words);
        all += "[" + (next == Next::Got ? words.str() : "^C") + "]";
    }
}

} // namespace

TEST(PromptSource, GivesTheStatementsOfALine)
{
    WrittenEditor editor({"a b; c", "", "d"});
    PromptSource source(editor);

    EXPECT_EQ(AllOf(source), "[a b][c][d]");
    EXPECT_EQ(editor.prompts, "zzzz");
}

TEST(PromptSource, AsksOnWhileAQuoteIsOpen)
{
    WrittenEditor editor({"a 'b", "c' d", "e"});
    PromptSource source(editor);

    EXPECT_EQ(AllOf(source), "[a b\nc d][e]");
    EXPECT_EQ(editor.prompts, "z.zz");
}

TEST(PromptSource, AsksOnBehindABackslash)
{
    WrittenEditor editor({"a \\", " b", "c"});
    PromptSource source(editor);

    EXPECT_EQ(AllOf(source), "[a b][c]");
    EXPECT_EQ(editor.prompts, "z.zz");
}

TEST(PromptSource, AsksOnInsideABlock)
{
    WrittenEditor editor({"a", "end", "b"});
    PromptSource source(editor);
    std::vector<StoredStatement> block;

    EXPECT_EQ(ReadBlock(source, true, block), BlockRead::Whole);
    EXPECT_EQ(AllOf(source), "[b]");

    EXPECT_EQ(editor.prompts, "..zz");
}

TEST(PromptSource, ACancelledLineTakesItsStatementBack)
{
    WrittenEditor editor({"a 'b", "^C", "c", "^C", "d"});
    PromptSource source(editor);

    EXPECT_EQ(AllOf(source), "[^C][c][^C][d]");
    EXPECT_EQ(editor.prompts, "z.zzzz");
}

TEST(PromptSource, ACancelledLineEndsABlock)
{
    WrittenEditor editor({"a", "^C", "b"});
    PromptSource source(editor);
    std::vector<StoredStatement> block;

    EXPECT_EQ(ReadBlock(source, true, block), BlockRead::Cancelled);

    EXPECT_EQ(AllOf(source), "[b]");
    EXPECT_EQ(editor.prompts, "..zz");
}

TEST(PromptSource, TheEndInsideAQuoteIsTheEnd)
{
    WrittenEditor editor({"a 'b"});
    PromptSource source(editor);

    EXPECT_EQ(AllOf(source), "");
}

TEST(PromptSource, NamesNoPlace)
{
    WrittenEditor editor({"a"});
    PromptSource source(editor);
    KvoStatement statement;
    source.Read(statement);

    EXPECT_EQ(source.Where().name, "");
}
