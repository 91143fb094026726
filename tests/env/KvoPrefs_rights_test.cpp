// A process that has more rights than the user who started it. The stand-in is
// in place before the settings are read, and so is the user's environment.

#include "KVO/KvoPrefs.h"

#include <cstdlib>
#include <string>

#include <gtest/gtest.h>

#include "support/FakeProcesses.h"

namespace {

class Raised : public FakeProcesses
{
public:
    Raised()
    {
        raised_rights = true;
        programs = {"/evil/bin/get_quarn_variable", "get_quarn_variable"};
        setenv("QUARN_LOCATION", "/evil", 1);
        setenv("QUARN_WORKENV", "/show", 1);
        setenv("PATH", "", 1);
    }
};

Raised processes __attribute__((init_priority(101)));

} // namespace

TEST(KvoPrefsRights, RaisedRightsLeaveOutTheLocationAndTheQueryProgram)
{
    EXPECT_STREQ(KvoPrefs::location, "/usr/quarn");
    EXPECT_STREQ(KvoPrefs::HelpDir(), "/usr/quarn/Help");
    EXPECT_STREQ(KvoPrefs::Variable("LIGHT", ""), "");
    EXPECT_EQ(processes.asked, std::vector<std::string>());
    EXPECT_EQ(processes.commands, std::vector<std::string>());
}

TEST(KvoPrefsRights, RaisedRightsLeaveTheOtherSettings)
{
    EXPECT_STREQ(KvoPrefs::ProjectDir(), "/show/user_data/demo");
}
