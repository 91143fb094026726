// How the query program is found and started, and what is made of what it
// prints; each test runs a program of its own.

#include <filesystem>
#include <string>

#include <gtest/gtest.h>

#include "env/Installation.h"

namespace {

namespace fs = std::filesystem;

/// An installation that QUARN_LOCATION does not name; the search path is
/// `path`, in which {dir} is the directory the probe runs in.
class OnThePath : public Installation
{
public:
    explicit OnThePath(std::string path)
    {
        for (std::size_t at; (at = path.find("{dir}")) != path.npos;)
            path.replace(at, 5, directory.Path(""));
        // The program is a script and needs no other.
        environment = {"PATH=" + path};
    }
};

/// What the probe finds for the misc directory with a query program that
/// prints this for QUARN_WIRE_DIR, QUARN_INPUT_PIX_DIR and QUARN_MISC_DIR.
Lines WithFirstLine(const std::string& printing)
{
    Installation installation;
    installation.Program("case $1 in QUARN_WIRE_DIR) " + printing +
                         ";;\n*) echo $1;; esac");
    return installation.Ask(
        {"variable", "QUARN_WIRE_DIR", "", "variable", "QUARN_MISC_DIR", ""});
}

const char misc[] = "QUARN_MISC_DIR";

} // namespace

TEST(KvoPrefsQuery, WithoutALocationTheProgramIsFoundThroughTheSearchPath)
{
    OnThePath installation("/nowhere:{dir}none:{dir}second:{dir}third");
    installation.ProgramAt(installation.directory.Path("second"), "echo 2");
    installation.ProgramAt(installation.directory.Path("third"), "echo 3");

    EXPECT_EQ(installation.Ask({"variable", "A", "", "help"}),
              (Lines{"2", "/usr/quarn/Help"}));
}

TEST(KvoPrefsQuery, AnEmptyEntryOfTheSearchPathIsTheCurrentDirectory)
{
    for (const char* path : {":/nowhere", "/nowhere:", "/nowhere::/no", ""}) {
        OnThePath installation(path);
        installation.ProgramAt(installation.directory.Path(""), "echo here");
        EXPECT_EQ(installation.Ask({"variable", "A", ""}), Lines{"here"})
            << path;
    }
}

TEST(KvoPrefsQuery, ARelativeEntryOfTheSearchPathWorks)
{
    OnThePath installation("/nowhere:tools/bin");
    installation.ProgramAt(installation.directory.Path("tools/bin"),
                           "echo relative");

    EXPECT_EQ(installation.Ask({"variable", "A", ""}), Lines{"relative"});
}

TEST(KvoPrefsQuery, ARelativeLocationWorks)
{
    Installation installation;
    installation.Program("echo relative");
    installation.environment = {"QUARN_LOCATION=quarn"};

    EXPECT_EQ(installation.Ask({"variable", "A", ""}), Lines{"relative"});
}

TEST(KvoPrefsQuery, ALocationIsNotLookedForOnTheSearchPath)
{
    OnThePath installation("{dir}tools");
    installation.ProgramAt(installation.directory.Path("tools"), "echo no");
    installation.Set("QUARN_LOCATION=/nowhere");

    EXPECT_EQ(installation.Ask({"variable", "A", "", "children"}),
              (Lines{"", "none"}));
}

TEST(KvoPrefsQuery, WithoutASearchPathThereIsStillAPlainOne)
{
    Installation installation;
    installation.environment.clear();

    EXPECT_EQ(installation.Ask({"variable", "A", "", "children"}),
              (Lines{"", "none"}));
}

TEST(KvoPrefsQuery, WhatMayNotBeExecutedIsNoProgram)
{
    Installation installation;
    installation.Program("echo no");
    fs::permissions(installation.location + "/bin/get_quarn_variable",
                    fs::perms::owner_read);

    EXPECT_EQ(installation.Ask({"variable", "A", "", "children"}),
              (Lines{"", "none"}));
}

TEST(KvoPrefsQuery, ADirectoryOfThatNameIsNoProgram)
{
    Installation installation;
    fs::create_directories(installation.location + "/bin/get_quarn_variable");

    EXPECT_EQ(installation.Ask({"variable", "A", "", "children"}),
              (Lines{"", "none"}));
}

TEST(KvoPrefsQuery, TheSearchPassesOverWhatIsNoProgram)
{
    OnThePath installation("{dir}directory:{dir}file:{dir}program");
    fs::create_directories(
        installation.directory.Path("directory/get_quarn_variable"));
    installation.ProgramAt(installation.directory.Path("file"), "echo no");
    fs::permissions(installation.directory.Path("file/get_quarn_variable"),
                    fs::perms::owner_read);
    installation.ProgramAt(installation.directory.Path("program"), "echo yes");

    EXPECT_EQ(installation.Ask({"variable", "A", ""}), Lines{"yes"});
}

TEST(KvoPrefsQuery, TheProgramIsLookedForBeforeEachStart)
{
    Installation installation;
    installation.Program("case $1 in QUARN_COORD_SYS) rm \"$0\";; esac\n"
                         "echo there");

    EXPECT_EQ(installation.Ask(
                  {"variable", "QUARN_WIRE_DIR", "", "variable", "A", ""}),
              (Lines{"there", ""}));
}

TEST(KvoPrefsQuery, ALocationWithCharactersOfTheShellsWorks)
{
    for (const char* folder : {"with blank",
                               "q'uote",
                               "q\"uote",
                               "back`tick",
                               "a;b",
                               "dol$HOME",
                               "new\nline",
                               "back\\slash",
                               "st*r",
                               "-minus",
                               "a=b",
                               "~tilde",
                               "#no",
                               "!no",
                               "$(touch made)",
                               "`touch made`",
                               "\xC3\xA4",
                               "%1",
                               "'",
                               "''"}) {
        Installation installation(folder);
        installation.Program("echo found");
        EXPECT_EQ(installation.Ask({"variable", "A", ""}), Lines{"found"})
            << folder;
    }
}

TEST(KvoPrefsQuery, ARelativeLocationThatLooksLikeSomethingElseWorks)
{
    for (const char* folder : {"a=b", "-c", "~", "#", "%1", "if"}) {
        Installation installation(folder);
        installation.Program("echo found");
        installation.environment = {"QUARN_LOCATION=" + std::string(folder)};
        EXPECT_EQ(installation.Ask({"variable", "A", ""}), Lines{"found"})
            << folder;
    }
}

TEST(KvoPrefsQuery, ALocationIsNeverRunAsACommand)
{
    for (const char* location :
         {"`touch made; true`", "$(touch made)", "; touch made;",
          "\ntouch made\n", "x' ; touch made ; '", "touch made; "}) {
        Installation installation;
        installation.environment = {"PATH=/usr/bin:/bin",
                                    "QUARN_LOCATION=" + std::string(location)};
        EXPECT_EQ(installation.Ask({"variable", "A", "", "children"}),
                  (Lines{"", "none"}));
        // Not even with the program there.
        installation.ProgramAt(
            installation.directory.Path(std::string(location) + "/bin"),
            "echo found");
        EXPECT_EQ(installation.Ask({"variable", "A", ""}), Lines{"found"});
        EXPECT_FALSE(fs::exists(installation.directory.Path("made")));
    }
}

TEST(KvoPrefsQuery, NamesWithOtherCharactersNeverReachTheShell)
{
    for (const char* name : {"A;touch made", "$(touch made)", "`touch made`",
                             "A B", "A-B", "A\n", "\xC3\xA4", "A/B", ""}) {
        Installation installation;
        installation.Program("echo found");
        EXPECT_EQ(installation.Ask({"variable", name, "default"}), Lines{""})
            << name;
        EXPECT_EQ(installation.Asked(), asked_at_load) << name;
        EXPECT_FALSE(fs::exists(installation.directory.Path("made")));
    }
}

TEST(KvoPrefsQuery, NamesOfLettersDigitsAndUnderscoresAreAskedFor)
{
    Installation installation;
    installation.Program("echo =$1");

    EXPECT_EQ(installation.Ask({"variable", "azAZ_09", "", "variable", "0", "",
                                "variable", "_", ""}),
              (Lines{"=azAZ_09", "=0", "=_"}));
}

TEST(KvoPrefsQuery, TheEnvironmentMayHaveAVariableOfAnyName)
{
    Installation installation;
    installation.Set("A-B=c");

    EXPECT_EQ(installation.Ask({"variable", "A-B", ""}), Lines{"c"});
}

TEST(KvoPrefsQuery, TheFirstWordOfALineIsTheValue)
{
    EXPECT_EQ(WithFirstLine("echo one two three"), (Lines{"one", misc}));
    EXPECT_EQ(WithFirstLine("printf ' \\t one\\n'"), (Lines{"one", misc}));
    EXPECT_EQ(WithFirstLine("echo '\"one two\" three'"),
              (Lines{"one two", misc}));
    EXPECT_EQ(WithFirstLine("echo 'one\\ two'"), (Lines{"one two", misc}));
    EXPECT_EQ(WithFirstLine("echo \"a;b!c#d'e f'\""),
              (Lines{"a;b!c#de f", misc}));
}

TEST(KvoPrefsQuery, AQuotedNewlineEndsNoLine)
{
    Installation installation;
    installation.Program("case $1 in A) printf '\"one\\ntwo\"\\nthree\\n';;\n"
                         "*) echo; esac");

    EXPECT_EQ(installation.Ask({"variable", "A", ""}), (Lines{"one", "two"}));
}

TEST(KvoPrefsQuery, AnEmptyLineGivesNoValue)
{
    EXPECT_EQ(WithFirstLine("echo"), (Lines{"", misc}));
    EXPECT_EQ(WithFirstLine("echo '   '"), (Lines{"", misc}));
}

TEST(KvoPrefsQuery, AnAnswerThatIsMissingMovesTheLaterOnesUp)
{
    Installation installation;
    installation.Program("case $1 in QUARN_WIRE_DIR) ;; *) echo $1;; esac");

    EXPECT_EQ(installation.Ask({"variable", "QUARN_WIRE_DIR", "", "variable",
                                "QUARN_INPUT_PIX_DIR", "",
                                "default-project-member", "coord-sys"}),
              (Lines{"QUARN_INPUT_PIX_DIR", misc, "QUARN_COORD_SYS", "0"}));
}

TEST(KvoPrefsQuery, FewerLinesLeaveTheLastWithoutValues)
{
    Installation installation;
    installation.Program("case $1 in QUARN_WIRE_DIR) echo wire;; "
                         "QUARN_INPUT_PIX_DIR) printf pix;; esac");

    EXPECT_EQ(installation.Ask({"wire", "pix", "misc", "project", "coord-sys"}),
              (Lines{"./user_data/demo/wire", "./user_data/demo/pix",
                     "./user_data/demo/", "demo", "0"}));
}

TEST(KvoPrefsQuery, FurtherLinesAreDropped)
{
    Installation installation;
    installation.Program("echo one; echo two; echo three");

    EXPECT_EQ(installation.Ask({"variable", "QUARN_WIRE_DIR", "", "variable",
                                "QUARN_INPUT_PIX_DIR", "", "project",
                                "variable", "A", ""}),
              (Lines{"one", "two", "one", "one"}));
}

TEST(KvoPrefsQuery, AProgramThatPrintsNothingLeavesTheValuesEmpty)
{
    Installation installation;
    installation.Program("exit 0");

    EXPECT_EQ(
        installation.Ask({"wire", "pix", "misc", "stage", "project",
                          "coord-sys", "children"}),
        (Lines{"./user_data/demo/", "./user_data/demo/", "./user_data/demo/",
               "./user_data/demo/", "demo", "0", "some"}));
}

TEST(KvoPrefsQuery, HowTheProgramEndsDoesNotMatter)
{
    for (const char* end : {"exit 7", "kill -KILL $$", "kill -TERM $$"}) {
        Installation installation;
        installation.Program("echo /$1; " + std::string(end));
        const Ended ended = RunProgram(ZT_PROBE, {"wire", "stage", "coord-sys"},
                                       installation.environment);
        EXPECT_EQ(ended.status, 0);
        EXPECT_EQ(ended.output, "/QUARN_WIRE_DIR\n/QUARN_STAGE_DIR\n1\n");
    }
}

TEST(KvoPrefsQuery, AProgramThatWritesOnIsNotCutOff)
{
    Installation installation;
    installation.Program("echo first; head -c 200000 /dev/zero | tr '\\0' x\n"
                         "echo; echo whole >> '" +
                         installation.directory.Path("ended") + "'");

    EXPECT_EQ(installation.Ask({"variable", "A", ""}), Lines{"first"});
    EXPECT_EQ(LinesOf(installation.directory.Read("ended")).size(), 6u);
}

TEST(KvoPrefsQuery, TheProgramHasEndedWhenTheValueIsThere)
{
    Installation installation;
    installation.Program("echo early; exec >&-; sleep 0.05\n"
                         "echo late >> '" +
                         installation.directory.Path("ended") + "'");

    EXPECT_EQ(installation.Ask({"variable", "A", ""}), Lines{"early"});
    EXPECT_EQ(LinesOf(installation.directory.Read("ended")).size(), 6u);
}

TEST(KvoPrefsQuery, NulBytesPartWordsAsBlanksDo)
{
    EXPECT_EQ(WithFirstLine("printf 'one\\000two\\n'"), (Lines{"one", misc}));
    EXPECT_EQ(WithFirstLine("printf '\\000\\000one\\n'"), (Lines{"one", misc}));
    EXPECT_EQ(WithFirstLine("printf '\\000\\n'"), (Lines{"", misc}));
    EXPECT_EQ(WithFirstLine("printf '\"one\\000two\"\\n'"),
              (Lines{"one", misc}));
}

TEST(KvoPrefsQuery, BytesAboveAsciiAreKept)
{
    EXPECT_EQ(WithFirstLine("printf '\\377\\200\\303\\244\\n'"),
              (Lines{"\xFF\x80\xC3\xA4", misc}));
}

TEST(KvoPrefsQuery, TheProgramReadsNothingOfOursButHasItsErrorsSeen)
{
    Installation installation;
    installation.Program("case $1 in A) echo oops >&2; esac; echo x");

    const Ended ended =
        RunProgram(ZT_PROBE, {"variable", "A", ""}, installation.environment);

    EXPECT_EQ(ended.output, "x\n");
    EXPECT_EQ(ended.errors, "oops\n");
}
