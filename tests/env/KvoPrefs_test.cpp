// What a host finds from its start on: each test runs a program of its own, in
// an environment and with a query program of its own.

#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

#include "env/Installation.h"

TEST(KvoPrefs, DirectoriesAreBuiltOfWorkEnvironmentProjectAndVariable)
{
    Installation installation;
    installation.Knows({"QUARN_WIRE_DIR wire"});
    installation.Set("QUARN_WORKENV=/show");
    installation.Set("QUARN_PROJECT=shot1");

    EXPECT_EQ(installation.Ask({"wire"}), Lines{"/show/user_data/shot1/wire"});
}

TEST(KvoPrefs, AnAbsoluteProjectIsItsOwnDirectory)
{
    Installation installation;
    installation.Knows({"QUARN_WIRE_DIR wire"});
    installation.Set("QUARN_WORKENV=/show");
    installation.Set("QUARN_PROJECT=/proj/x");

    EXPECT_EQ(installation.Ask({"wire", "project-dir"}),
              (Lines{"/proj/x/wire", "/proj/x"}));
}

TEST(KvoPrefs, AnAbsoluteVariableIsItsOwnDirectory)
{
    Installation installation;
    installation.Set("QUARN_STAGE_DIR=/stage");

    EXPECT_EQ(installation.Ask({"stage"}), Lines{"/stage"});
}

TEST(KvoPrefs, AVariableThatNobodyKnowsGivesTheProjectsDirectoryAndASlash)
{
    Installation installation;
    installation.Knows({});
    installation.Set("QUARN_WORKENV=/show");
    installation.Set("QUARN_PROJECT=shot1");

    EXPECT_EQ(installation.Ask({"stage", "wire"}),
              (Lines{"/show/user_data/shot1/", "/show/user_data/shot1/"}));
}

TEST(KvoPrefs, TheWorkEnvironmentIsTheCurrentDirectoryUnlessItIsNamed)
{
    Installation installation;

    EXPECT_EQ(installation.Ask({"workenv", "set-workenv", "/other", "workenv",
                                "set-workenv", "(null)", "workenv",
                                "workenv-member"}),
              (Lines{".", "set", "/other", "set", ".", "."}));
}

TEST(KvoPrefs, SetProjectNullRestoresTheDefaultProject)
{
    Installation installation;
    installation.Set("QUARN_PROJECT=shot1");

    EXPECT_EQ(installation.Ask({"project", "set-project", "shot2", "project",
                                "set-project", "(null)", "project",
                                "project-member"}),
              (Lines{"shot1", "set", "shot2", "set", "demo", "demo"}));
}

TEST(KvoPrefs, TheInstallationNamesTheDefaultProject)
{
    Installation installation;
    installation.Knows({"QUARN_DEFAULT_PROJECT tour"});
    installation.Set("QUARN_DEFAULT_PROJECT=not this");

    EXPECT_EQ(
        installation.Ask({"default-project-member", "project", "set-project",
                          "x", "set-project", "(null)", "project"}),
        (Lines{"tour", "tour", "set", "set", "tour"}));
}

TEST(KvoPrefs, TheLocationIsTheEnvironmentsOrUsrQuarn)
{
    Installation installation;
    const Lines named = installation.Ask({"location-member", "help"});
    installation.environment = {"PATH=/nowhere"};
    const Lines unnamed = installation.Ask({"location-member", "help"});

    EXPECT_EQ(named,
              (Lines{installation.location, installation.location + "/Help"}));
    EXPECT_EQ(unnamed, (Lines{"/usr/quarn", "/usr/quarn/Help"}));
}

TEST(KvoPrefs, AnEmptyVariableOfTheEnvironmentIsSet)
{
    Installation installation;
    installation.Program("echo other");
    installation.Set("QUARN_WORKENV=");
    installation.Set("QUARN_PROJECT=");
    installation.Set("QUARN_STAGE_DIR=");

    const Lines answers = installation.Ask(
        {"workenv", "project", "project-dir", "stage", "origins"});
    const Lines asked = installation.Asked();
    installation.environment = {"PATH=/nowhere", "QUARN_LOCATION="};
    const Lines nowhere = installation.Ask({"location-member", "help"});

    EXPECT_EQ(answers, (Lines{"", "", "/user_data/", "/user_data//", "1211"}));
    EXPECT_EQ(asked, asked_at_load);
    EXPECT_EQ(nowhere, (Lines{"", "/Help"}));
}

TEST(KvoPrefs, TheAxesAreYUpUnlessTheInstallationSaysAnythingElse)
{
    for (const auto& [said, number] : std::vector<std::pair<Lines, Lines>>{
             {{}, {"0"}},
             {{"QUARN_COORD_SYS y_up"}, {"0"}},
             {{"QUARN_COORD_SYS y_up z"}, {"0"}},
             {{"QUARN_COORD_SYS z_up"}, {"1"}},
             {{"QUARN_COORD_SYS Y_UP"}, {"1"}},
             {{"QUARN_COORD_SYS \"\""}, {"1"}}}) {
        Installation installation;
        installation.Knows(said);
        installation.Set("QUARN_COORD_SYS=other");
        EXPECT_EQ(installation.Ask({"coord-sys"}), number);
    }
}

TEST(KvoPrefs, TheFirstFourComeFromTheQueryProgramAlone)
{
    Installation installation;
    installation.Knows(
        {"QUARN_WIRE_DIR a", "QUARN_INPUT_PIX_DIR b", "QUARN_COORD_SYS z_up"});
    for (const std::string& name : asked_at_load)
        installation.Set(name + "=/environment");

    EXPECT_EQ(installation.Ask({"wire", "pix", "misc", "variable",
                                "QUARN_COORD_SYS", "x", "table"}),
              (Lines{"./user_data/demo/a", "./user_data/demo/b",
                     "./user_data/demo/", "z_up",
                     "QUARN_COORD_SYS=y_up:2 QUARN_INPUT_PIX_DIR=pix:2 "
                     "QUARN_MISC_DIR=misc_data:5 QUARN_WIRE_DIR=wire:2"}));
    EXPECT_EQ(installation.Asked(), asked_at_load);
}

TEST(KvoPrefs, EachDirectoryHasItsVariable)
{
    Installation installation;
    const Lines kinds = {"stage",  "sla",     "sdl",    "anim",
                         "shader", "texture", "option", "plot"};
    for (const char* name :
         {"STAGE", "SLA", "SDL", "ANIM", "SHADER", "TEXTURE", "OPTION", "PLOT"})
        installation.Set("QUARN_" + std::string(name) + "_DIR=/" + name);
    installation.Knows({"QUARN_WIRE_DIR /WIRE", "QUARN_INPUT_PIX_DIR /PIX",
                        "QUARN_MISC_DIR /MISC"});

    const Lines environment = installation.Ask(kinds);
    const Lines program = installation.Ask({"wire", "pix", "misc"});

    EXPECT_EQ(environment, (Lines{"/STAGE", "/SLA", "/SDL", "/ANIM", "/SHADER",
                                  "/TEXTURE", "/OPTION", "/PLOT"}));
    EXPECT_EQ(program, (Lines{"/WIRE", "/PIX", "/MISC"}));
}

TEST(KvoPrefs, BuildSubdirJoinsWhatIsNotAbsolute)
{
    Installation installation;

    EXPECT_EQ(
        installation.Ask({"subdir", "(null)", "subdir", "/abs", "subdir", "rel",
                          "subdir", "", "set-project", "/p", "subdir", "(null)",
                          "subdir", "/abs", "subdir", "rel", "subdir", ""}),
        (Lines{"./user_data/demo", "/abs", "./user_data/demo/rel",
               "./user_data/demo/", "set", "/p", "/abs", "/p/rel", "/p/"}));
}

TEST(KvoPrefs, SetProjectAndSetWorkEnvChangeTheDirectories)
{
    Installation installation;
    installation.Knows({"QUARN_WIRE_DIR wire"});

    EXPECT_EQ(installation.Ask({"set-workenv", "/w", "wire", "set-project", "s",
                                "wire", "project-dir"}),
              (Lines{"set", "/w/user_data/demo/wire", "set",
                     "/w/user_data/s/wire", "/w/user_data/s"}));
}

TEST(KvoPrefs, AVariableIsTakenFromTheEnvironmentBeforeTheQueryProgram)
{
    Installation installation;
    installation.Knows({"SHADE dark", "LIGHT dim"});
    installation.Set("SHADE=bright as day");

    EXPECT_EQ(installation.Ask({"variable", "SHADE", "x", "variable", "LIGHT",
                                "x", "table"}),
              (Lines{"bright as day", "dim",
                     "LIGHT=x:2 QUARN_COORD_SYS=y_up:5 "
                     "QUARN_INPUT_PIX_DIR=pix:5 QUARN_MISC_DIR=misc_data:5 "
                     "QUARN_WIRE_DIR=wire:5 SHADE=x:1"}));
}

TEST(KvoPrefs, AVariableIsLookedUpOnce)
{
    Installation installation;
    installation.Knows({"LIGHT dim"});

    EXPECT_EQ(installation.Ask({"variable", "LIGHT", "", "setenv", "LIGHT",
                                "bright", "variable", "LIGHT", ""}),
              (Lines{"dim", "set", "dim"}));
    EXPECT_EQ(installation.Asked().size(), asked_at_load.size() + 1);
}

TEST(KvoPrefs, WhatNobodyKnowsIsNotLookedUpAgain)
{
    Installation installation;
    installation.Knows({});

    EXPECT_EQ(installation.Ask({"variable", "LIGHT", "", "setenv", "LIGHT",
                                "bright", "variable", "LIGHT", ""}),
              (Lines{"", "set", ""}));
    EXPECT_EQ(installation.Asked().size(), asked_at_load.size() + 1);
}

TEST(KvoPrefs, TheDefaultOfAVariableIsNeverUsed)
{
    Installation installation;

    EXPECT_EQ(installation.Ask({"variable", "LIGHT", "dim", "variable", "SHADE",
                                "(null)", "misc", "table"}),
              (Lines{"", "", "./user_data/demo/",
                     "LIGHT=dim:5 QUARN_COORD_SYS=y_up:5 "
                     "QUARN_INPUT_PIX_DIR=pix:5 QUARN_MISC_DIR=misc_data:5 "
                     "QUARN_WIRE_DIR=wire:5 SHADE=:5"}));
}

TEST(KvoPrefs, AVariableThatWasSetIsNotLookedUp)
{
    Installation installation;
    installation.Program("echo asked");
    installation.Set("LIGHT=bright");

    EXPECT_EQ(installation.Ask(
                  {"set", "LIGHT", "dim",    "variable", "LIGHT", "other",
                   "set", "LIGHT", "dark",   "variable", "LIGHT", "",
                   "set", "LIGHT", "(null)", "variable", "LIGHT", "",
                   "set", "SHADE", "(null)", "variable", "SHADE", ""}),
              (Lines{"set", "dim", "set", "dark", "set", "", "set", ""}));
    EXPECT_EQ(installation.Asked(), asked_at_load);
}

TEST(KvoPrefs, AVariableThatIsSetFirstGetsItsValueAsDefaultToo)
{
    Installation installation;

    EXPECT_EQ(installation.Ask({"set", "A", "one", "set", "A", "two",
                                "variable", "A", "three", "set",
                                "QUARN_WIRE_DIR", "w", "wire", "table"}),
              (Lines{"set", "set", "two", "set", "./user_data/demo/w",
                     "A=one:4 QUARN_COORD_SYS=y_up:5 "
                     "QUARN_INPUT_PIX_DIR=pix:5 QUARN_MISC_DIR=misc_data:5 "
                     "QUARN_WIRE_DIR=wire:4"}));
}

TEST(KvoPrefs, ANullNameIsTheEmptyOneAndIsNotAskedFor)
{
    Installation installation;
    installation.Program("echo something");

    EXPECT_EQ(
        installation.Ask({"variable", "(null)", "", "variable", "", "", "set",
                          "", "set here", "variable", "(null)", "x"}),
        (Lines{"", "", "set", "set here"}));
    EXPECT_EQ(installation.Asked(), asked_at_load);
}

TEST(KvoPrefs, ALaterInstanceReadsNothing)
{
    Installation installation;
    installation.Knows({});

    EXPECT_EQ(
        installation.Ask({"set-project", "mine", "setenv", "QUARN_PROJECT",
                          "new", "setenv", "QUARN_WORKENV", "/new", "construct",
                          "project", "workenv"}),
        (Lines{"set", "set", "set", "made", "mine", "."}));
    EXPECT_EQ(installation.Asked(), asked_at_load);
}

TEST(KvoPrefs, TheQueryCommandIsFixedAtLoad)
{
    Installation installation;
    installation.Knows({"LIGHT dim"});

    EXPECT_EQ(installation.Ask({"setenv", "QUARN_LOCATION", "/elsewhere",
                                "variable", "LIGHT", "", "help"}),
              (Lines{"set", "dim", installation.location + "/Help"}));
    EXPECT_EQ(installation.Ask({"overwrite", "QUARN_LOCATION", "variable",
                                "LIGHT", "", "help"}),
              (Lines{"overwritten", "dim", installation.location + "/Help"}));
}

TEST(KvoPrefs, TheSettingsAreReadAtLoadByOneShellLine)
{
    Installation installation;
    installation.Program("echo /$1");

    const Lines answers = installation.Ask(
        {"location-member", "default-project-member", "coord-sys", "children"});

    EXPECT_EQ(answers, (Lines{installation.location, "/QUARN_DEFAULT_PROJECT",
                              "1", "some"}));
    EXPECT_EQ(installation.Asked(), asked_at_load);
    // One shell started them all, but for the last, which it may have become.
    const Lines log = installation.Log();
    ASSERT_EQ(log.size(), 5u);
    const std::string shell = log[0].substr(0, log[0].find(' ') + 1);
    for (std::size_t run = 0; run < 4; ++run)
        EXPECT_EQ(log[run].compare(0, shell.size(), shell), 0) << log[run];
    EXPECT_NE((" " + log[4]).find(" " + shell), std::string::npos) << log[4];
}

TEST(KvoPrefs, OtherStaticObjectsMayAskBeforeTheSettingsAreRead)
{
    Installation installation;
    installation.Knows({"QUARN_WIRE_DIR wire"});

    EXPECT_EQ(installation.Ask({"early"}), Lines{"./user_data/demo/wire"});
    EXPECT_EQ(installation.Asked(), asked_at_load);
}

TEST(KvoPrefs, WhatOtherStaticObjectsSetBeforeTheSettingsAreReadStays)
{
    for (const auto& [what, directory] : std::vector<std::pair<Lines, Lines>>{
             {{"project"}, {"/show/user_data/early/wire"}},
             {{"workenv"}, {"early/user_data/shot1/wire"}},
             {{"variable"}, {"/show/user_data/shot1/early"}}}) {
        Installation installation;
        installation.Knows({"QUARN_WIRE_DIR wire"});
        installation.Set("QUARN_WORKENV=/show");
        installation.Set("QUARN_PROJECT=shot1");
        installation.Set("PROBE_SETS_FIRST=" + what[0]);

        EXPECT_EQ(installation.Ask({"wire"}), directory);
    }
}

TEST(KvoPrefs, WithoutQueryProgramNothingIsStartedAndNothingIsSaid)
{
    Installation installation;

    EXPECT_EQ(
        installation.Ask({"wire", "pix", "misc", "stage", "variable", "A", "x",
                          "coord-sys", "project", "children"}),
        (Lines{"./user_data/demo/", "./user_data/demo/", "./user_data/demo/",
               "./user_data/demo/", "", "0", "demo", "none"}));
}

TEST(KvoPrefs, OriginsOfTheSettings)
{
    Installation installation;
    installation.Knows({"QUARN_DEFAULT_PROJECT tour"});
    installation.Set("QUARN_WORKENV=/w");

    EXPECT_EQ(installation.Ask({"origins", "set-project", "a", "set-workenv",
                                "b", "origins", "set-project", "(null)",
                                "set-workenv", "(null)", "origins"}),
              (Lines{"1231", "set", "set", "1244", "set", "set", "1233"}));
    installation.environment = {"PATH=/nowhere", "QUARN_PROJECT=p"};
    EXPECT_EQ(installation.Ask({"origins"}), Lines{"3313"});
}
