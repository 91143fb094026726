// A load for which there is no memory. The memory is gone before the settings
// are read, and back again when the tests look.

#include "KVO/KvoPrefs.h"

#include <cstdlib>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/FailingMemory.h"
#include "support/FakeProcesses.h"

namespace {

class Poor : public FakeProcesses
{
public:
    Poor()
    {
        programs = {"/q/bin/get_quarn_variable", "/p/get_quarn_variable"};
        output = "value\n";
        setenv("QUARN_LOCATION", "/q", 1);
        setenv("QUARN_PROJECT", "shot1", 1);
        setenv("PATH", "/p", 1);
        FailingMemory none;
        const KvoPrefs first;
    }
};

Poor processes __attribute__((init_priority(101)));

} // namespace

TEST(KvoPrefsEarlyMemory, WithoutMemoryAtLoadEverySettingReadsAsEmpty)
{
    EXPECT_STREQ(KvoPrefs::Project(), "");
    EXPECT_STREQ(KvoPrefs::WorkEnv(), "");
    EXPECT_STREQ(KvoPrefs::ProjectDir(), "/user_data/");
    EXPECT_STREQ(KvoPrefs::HelpDir(), "/Help");
    EXPECT_EQ(KvoPrefs::Table().Search("QUARN_WIRE_DIR"), nullptr);
    EXPECT_EQ(KvoPrefs::coord_sys, 0);
}

TEST(KvoPrefsEarlyMemory, ALocationThatCouldNotBeKeptIsNotReplacedByThePath)
{
    EXPECT_STREQ(KvoPrefs::Variable("LIGHT", ""), "");
    EXPECT_EQ(processes.commands, std::vector<std::string>());
}
