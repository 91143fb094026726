#include "support/InAChild.h"

#include <csignal>
#include <cstdlib>
#include <cstring>

#include <gtest/gtest-spi.h>
#include <gtest/gtest.h>

namespace {

TEST(InAChild, ABodyThatDoesWellIsNoFailure)
{
    int here = 1;

    RunInAChild([&] { here = 2; });

    EXPECT_EQ(here, 1);
}

TEST(InAChild, ACheckThatFailsIsAFailure)
{
    auto run_and_tell = [] {
        RunInAChild([] { EXPECT_EQ(1, 2); });
        std::_Exit(testing::Test::HasFailure() ? 7 : 0);
    };

    EXPECT_EXIT(run_and_tell(), testing::ExitedWithCode(7), "");
}

TEST(InAChild, AnEndOfTheProcessIsAFailure)
{
    EXPECT_NONFATAL_FAILURE(RunInAChild([] { std::_Exit(3); }),
                            "the child failed");
}

TEST(InAChild, ASignalIsAFailure)
{
    testing::TestPartResultArray results;
    {
        testing::ScopedFakeTestPartResultReporter keep(
            testing::ScopedFakeTestPartResultReporter::
                INTERCEPT_ONLY_CURRENT_THREAD,
            &results);
        RunInAChild([] { raise(SIGKILL); });
    }

    ASSERT_GE(results.size(), 1);
    EXPECT_NE(std::strstr(results.GetTestPartResult(0).message(), "signal 9"),
              nullptr);
}

TEST(InAChild, TooMuchTimeIsAFailure)
{
    testing::TestPartResultArray results;
    {
        testing::ScopedFakeTestPartResultReporter keep(
            testing::ScopedFakeTestPartResultReporter::
                INTERCEPT_ONLY_CURRENT_THREAD,
            &results);
        RunInAChild([] {
            for (volatile int forever = 1; forever;)
                ;
        });
    }

    EXPECT_GE(results.size(), 1);
}

} // namespace
