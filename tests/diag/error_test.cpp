#include "ZT/error.h"

#include <cerrno>
#include <cstring>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "diag/Reports.h"
#include "support/ErrorTrap.h"
#include "support/FailingMemory.h"

// --- errors ----------------------------------------------------------------

TEST(ZtErr, KeepsItsKindLevelAndText)
{
    ZtErr error("Error: ", 3, 4);

    EXPECT_EQ(error.code, 3);
    EXPECT_EQ(error.level, 4);
    EXPECT_EQ(error.message, nullptr);
    EXPECT_STREQ(error.Message(), "Error: ");
}

TEST(ZtErr, OfANullTextIsEmpty)
{
    ZtErr error(nullptr, 0, 1);

    EXPECT_STREQ(error.Message(), "");
}

TEST(ZtErr, KeepsTheLastSystemFailureBeforeIt)
{
    errno = ENOENT;
    ZtErr error("", 0, 1);
    errno = EPERM;

    EXPECT_EQ(error.SystemError(), ENOENT);
    EXPECT_EQ(oserror(), EPERM);
    errno = 0;
}

TEST(ZtErr, CountsEveryErrorEverMade)
{
    const int before = ZtErr::count;

    {
        ZtErr one("", 0, 1), other("", 0, 4);
    }
    ZtErr third("", 0, 1);

    EXPECT_EQ(ZtErr::count, before + 3);
}

TEST(ZtErr, TakesWhatIsWrittenToItsStream)
{
    ZtErr error("Warning: ", 0, 3);

    error.stream << "frame " << 12 << '\n';

    EXPECT_STREQ(error.Message(), "Warning: frame 12\n");
}

TEST(ZtErr, FreezesItsTextWhenItIsFirstAsked)
{
    ZtErr error("one", 0, 3);

    char* first = error.Message();
    error.stream << " two";
    char* second = error.Message();

    EXPECT_EQ(first, second);
    EXPECT_EQ(error.message, first);
    EXPECT_STREQ(second, "one");
}

TEST(ZtErr, EndsItsTextAtTheFirstNul)
{
    ZtErr error("one", 0, 3);

    error.stream.write("\0two", 4);

    EXPECT_STREQ(error.Message(), "one");
}

TEST(ZtErr, WithoutMemoryHasTheEmptyText)
{
    ZtErr error("one", 0, 3);
    FailingMemory none;

    EXPECT_STREQ(error.Message(), "");
}

TEST(ZtErr, PostGivesItToTheTopHandler)
{
    ErrorTrap below, top;

    PostText("Error: lost\n", 4);

    EXPECT_EQ(top.Text(), "Error: lost\n");
    EXPECT_EQ(below.Text(), "");
}

TEST(ZtErr, AbortPostsItAndAborts)
{
    EXPECT_EXIT((new ZtErr("Error: lost\n", 0, 4))->Abort(), aborted,
                "^Error: lost\n$");
}

TEST(ZtErr, AbortPrintsNothingBelowTheOutputLevel)
{
    EXPECT_EXIT((new ZtErr("Debug: lost\n", 0, 1))->Abort(), aborted, "^$");
}

TEST(ZtErr, AnswersAsAPlainObject)
{
    ZtErr error("", 0, 1);

    EXPECT_STREQ(error.ClassName(), "KvoObject");
    EXPECT_EQ(error.Key(), &error);
}

// --- checks ----------------------------------------------------------------

TEST(ZtErrCheck, OfAValueReportsZero)
{
    ErrorTrap reports;

    EXPECT_EQ(ZtErr::Check(0, nullptr, 4), 1);

    ASSERT_EQ(reports.reports.size(), 1u);
    EXPECT_EQ(reports.Text(), "Error: bad value\n");
    EXPECT_EQ(reports.reports[0].code, 1);
    EXPECT_EQ(reports.reports[0].level, 4);
}

TEST(ZtErrCheck, OfAValueUsesTheTextGiven)
{
    ErrorTrap reports;

    EXPECT_EQ(ZtErr::Check(0, "no such frame", 3), 1);

    EXPECT_EQ(reports.Text(), "Error: no such frame\n");
    EXPECT_EQ(reports.reports[0].level, 3);
}

TEST(ZtErrCheck, OfAValueIsSilentOtherwise)
{
    ErrorTrap reports;

    EXPECT_EQ(ZtErr::Check(1, "no such frame", 4), 0);
    EXPECT_EQ(ZtErr::Check(-1, nullptr, 5), 0);

    EXPECT_TRUE(reports.reports.empty());
}

TEST(ZtErrCheck, OfAValuePrintsWithTheDefaults)
{
    int result = 0;

    EXPECT_EQ(Printed([&] { result = ZtErr::Check(0, nullptr, 4); }),
              "Error: bad value\n");
    EXPECT_EQ(result, 1);
    EXPECT_EQ(Printed([&] { result = ZtErr::Check(3, nullptr, 4); }), "");
    EXPECT_EQ(result, 0);
}

TEST(ZtErrCheck, OfAPointerReportsNull)
{
    ErrorTrap reports;
    int thing = 0;

    EXPECT_EQ(ZtErr::Check(static_cast<void*>(nullptr), nullptr, 4), 1);
    EXPECT_EQ(ZtErr::Check(nullptr, "no sound", 3), 1);
    EXPECT_EQ(ZtErr::Check(&thing, "no sound", 4), 0);

    ASSERT_EQ(reports.reports.size(), 2u);
    EXPECT_EQ(reports.reports[0].text, "Error: bad pointer\n");
    EXPECT_EQ(reports.reports[0].code, 2);
    EXPECT_EQ(reports.reports[1].text, "Error: no sound\n");
    EXPECT_EQ(reports.reports[1].level, 3);
}

TEST(ZtErrCheck, OfAStreamReportsEveryBitOfItsState)
{
    for (const auto state :
         {std::ios::eofbit, std::ios::failbit, std::ios::badbit}) {
        ErrorTrap reports;
        std::istringstream in("text");
        in.setstate(state);

        EXPECT_EQ(ZtErr::Check(in, nullptr, 3), 1);

        ASSERT_EQ(reports.reports.size(), 1u);
        EXPECT_EQ(reports.Text(), "Stream Error: failed i/o\n");
        EXPECT_EQ(reports.reports[0].code, 3);
        EXPECT_EQ(reports.reports[0].level, 3);
    }
}

TEST(ZtErrCheck, OfAStreamIsSilentWhenItIsGood)
{
    ErrorTrap reports;
    std::ostringstream out;

    EXPECT_EQ(ZtErr::Check(out, "cannot write", 4), 0);

    EXPECT_TRUE(reports.reports.empty());
}

TEST(ZtErrCheck, OfAStreamAtItsEndPrintsWithTheDefaults)
{
    std::istringstream in("");
    in.get();

    EXPECT_EQ(Printed([&] { ZtErr::Check(in, nullptr, 3); }),
              "Stream Error: failed i/o\n");
    EXPECT_EQ(Printed([&] { ZtErr::Check(in, "cut short", 3); }),
              "Stream Error: cut short\n");
}

TEST(ZtErrCheck, OfTheSystemReportsItsLastFailure)
{
    ErrorTrap reports;

    errno = ENOENT;
    EXPECT_EQ(ZtErr::CheckSystem(nullptr, 4), 1);
    errno = EACCES;
    EXPECT_EQ(ZtErr::CheckSystem("cannot read it", 3), 1);
    errno = 0;

    ASSERT_EQ(reports.reports.size(), 2u);
    EXPECT_EQ(reports.reports[0].text,
              "System Error: " + std::string(std::strerror(ENOENT)) + "\n");
    EXPECT_EQ(reports.reports[0].code, 4);
    EXPECT_EQ(reports.reports[0].system_error, ENOENT);
    EXPECT_EQ(reports.reports[1].text, "System Error: cannot read it\n");
    EXPECT_EQ(reports.reports[1].level, 3);
    EXPECT_EQ(reports.reports[1].system_error, EACCES);
}

TEST(ZtErrCheck, OfTheSystemIsSilentWithoutAFailure)
{
    ErrorTrap reports;
    errno = 0;

    EXPECT_EQ(ZtErr::CheckSystem("cannot read it", 4), 0);

    EXPECT_TRUE(reports.reports.empty());
}

TEST(ZtErrCheck, OfTheSystemKnowsFailuresWithoutAName)
{
    ErrorTrap reports;
    errno = 99999;

    ZtErr::CheckSystem(nullptr, 4);
    errno = 0;

    EXPECT_EQ(reports.reports[0].system_error, 99999);
    EXPECT_EQ(reports.Text().substr(0, 14), "System Error: ");
    EXPECT_GT(reports.Text().size(), 15u);
}

TEST(ZtErrCheck, AtTheAbortLevelPrintsAndAborts)
{
    EXPECT_EXIT(ZtErr::Check(0, "no way on", 5), aborted,
                "^Error: no way on\n$");
    EXPECT_EXIT(ZtErr::Check(nullptr, "no way on", 6), aborted,
                "^Error: no way on\n$");
}

TEST(ZtErrCheck, BelowTheOutputLevelOnlyCounts)
{
    const int before = ZtErr::count;
    int result = 0;

    EXPECT_EQ(Printed([&] { result = ZtErr::Check(0, nullptr, 2); }), "");

    EXPECT_EQ(result, 1);
    EXPECT_EQ(ZtErr::count, before + 1);
}
