// The source of a manual page.

#include "pages/pages.h"

#include <sstream>

#include <gtest/gtest.h>

namespace {

std::string ManualOf(const zt_pages::Command& command)
{
    std::ostringstream out;
    zt_pages::WriteManual(out, command);
    return out.str();
}

zt_pages::Command Tool()
{
    zt_pages::Command command;
    command.name = "zt-tool";
    command.version = "zt 1";
    command.purpose = "Does one thing.";
    return command;
}

} // namespace

TEST(Manual, OfACommandWithoutOptionsIsItsFrame)
{
    EXPECT_EQ(ManualOf(Tool()),
              ".TH \"ZT\\-TOOL\" 1 \"\" \"zt 1\"\n"
              ".SH NAME\nzt\\-tool \\- Does one thing\n"
              ".SH SYNOPSIS\n\\fBzt\\-tool\\fR [\\fIOPTIONS\\fR]\n"
              ".SH \"DESCRIPTION\"\nDoes one thing.\n"
              ".SH OPTIONS\n");
}

TEST(Manual, ShowsAnOptionWithItsNamesAndItsValue)
{
    zt_pages::Command command = Tool();
    command.options.push_back({{"-n", "--number"}, "N", "How many"});

    EXPECT_NE(ManualOf(command).find(
                  ".TP\n\\fB\\-n\\fR, \\fB\\-\\-number\\fR \\fIN\\fR\n"
                  "How many.\n"),
              std::string::npos);
}

TEST(Manual, HidesWhatTheFormatterWouldTakeForItsOwn)
{
    zt_pages::Command command = Tool();
    command.footer = ".dot\na\\b 'c' ^~`";

    EXPECT_NE(ManualOf(command).find(".PP\n\\&.dot\na\\eb \\(aqc\\(aq "
                                     "\\(ha\\(ti\\(ga\n"),
              std::string::npos);
}

TEST(Manual, MakesASectionOfAListInTheFooter)
{
    zt_pages::Command command = Tool();
    command.footer = "Words.\n\nExit codes:\n  0    all well\n  1    not\n"
                     "The rest.";

    std::string manual = ManualOf(command);

    EXPECT_NE(manual.find(".SH \"DESCRIPTION\"\nDoes one thing.\n.PP\nWords.\n"
                          ".SH OPTIONS\n"),
              std::string::npos);
    EXPECT_NE(manual.find(".SH \"EXIT CODES\"\n.TP\n\\fB0\\fR\nall well\n"
                          ".TP\n\\fB1\\fR\nnot\n.PP\nThe rest.\n"),
              std::string::npos);
}

TEST(Manual, KeepsTheLinesOfATableInASection)
{
    zt_pages::Command command = Tool();
    command.sections.push_back(
        {"words",
         "    Do THIS\n        Does it:\n        a    b\n        c  d\n"
         "        in words.\n"});

    EXPECT_NE(ManualOf(command).find(".SH \"WORDS\"\n.TP\n\\fBDo\\fR THIS\n"
                                     "Does it:\n.nf\na    b\nc  d\n.fi\n"
                                     "in words.\n"),
              std::string::npos);
}
