// What shells are told to complete; the tests of the pages have them do it.

#include "pages/pages.h"

#include <sstream>

#include <gtest/gtest.h>

namespace {

std::string PageOf(const char* kind, const zt_pages::Command& command)
{
    std::ostringstream out;
    zt_pages::Write(out, kind, command);
    return out.str();
}

/// A tool with a hyphen in its name and an option of two words.
zt_pages::Command Tool()
{
    zt_pages::Command command;
    command.name = "zt-tool";
    command.options.push_back({{"-m", "--mode"}, "MODE", "How it's [done]"});
    command.options[0].choices = {"fast", "slow"};
    return command;
}

bool Holds(const std::string& text, const char* part)
{
    return text.find(part) != std::string::npos;
}

} // namespace

TEST(Completions, ForBashOfferOptionsAndTheirValues)
{
    std::string page = PageOf("bash", Tool());

    EXPECT_TRUE(Holds(page, "_zt_tool()\n")) << page;
    EXPECT_TRUE(Holds(page, "-m | --mode)\n")) << page;
    EXPECT_TRUE(Holds(page, "compgen -W 'fast slow' --")) << page;
    EXPECT_TRUE(Holds(page, "compgen -W '-m --mode' --")) << page;
    EXPECT_TRUE(Holds(page, "complete -o default -F _zt_tool zt-tool\n"))
        << page;
}

TEST(Completions, ForZshQuoteWhatItWouldTakeForItsOwn)
{
    EXPECT_EQ(PageOf("zsh", Tool()),
              "#compdef zt-tool\n_arguments -s \\\n"
              "    '(-m --mode)-m[How it'\\''s \\[done\\]]:MODE:(fast slow)'"
              " \\\n"
              "    '(-m --mode)--mode[How it'\\''s \\[done\\]]:MODE:"
              "(fast slow)'\n");
}

TEST(Completions, ForFishOfferFilesOnlyWhereThereAreSome)
{
    zt_pages::Command command = Tool();

    EXPECT_EQ(PageOf("fish", command),
              "complete -c zt-tool -f\n"
              "complete -c zt-tool -s m -l mode -x -a 'fast slow' "
              "-d 'How it\\'s [done]'\n");

    command.words.files = true;

    EXPECT_FALSE(Holds(PageOf("fish", command), "zt-tool -f\n"));
}
