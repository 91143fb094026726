#include "sequence/progress_bar.h"
#include "support/CapturedStderr.h"

#include <iostream>

#include <gtest/gtest.h>

using ztsh::ProgressBar;
using ztsh::ProgressLine;

TEST(ProgressLine, SaysHowFarHowFastAndHowLongStill)
{
    EXPECT_EQ(ProgressLine({25, 100, 0, 5.0}, 79),
              "[#######.......................] 25/100  5.0/s  0:15 left");
}

TEST(ProgressLine, SaysHowManyHaveFailed)
{
    EXPECT_EQ(ProgressLine({100, 100, 3, 50.0}, 79),
              "[##############################] 100/100, 3 failed  2.0/s  "
              "0:00 left");
}

TEST(ProgressLine, WritesHoursWhenThereAreSome)
{
    EXPECT_EQ(ProgressLine({1, 3601, 0, 2.0}, 79),
              "[..............................] 1/3601  0.5/s  2:00:00 left");
}

TEST(ProgressLine, LeavesTheRateOutBeforeThereIsOne)
{
    EXPECT_EQ(ProgressLine({0, 4, 0, 0.0}, 79),
              "[..............................] 0/4");
    EXPECT_EQ(ProgressLine({0, 4, 0, 1.0}, 79),
              "[..............................] 0/4");
}

TEST(ProgressLine, FitsIntoANarrowWindow)
{
    EXPECT_EQ(ProgressLine({1, 4, 0, 1.0}, 30),
              "[#.....] 1/4  1.0/s  0:03 left");
    EXPECT_EQ(ProgressLine({1, 4, 0, 1.0}, 12), "1/4  1.0/s  ");
    EXPECT_EQ(ProgressLine({1, 4, 0, 1.0}, 0), "");
}

TEST(ProgressBar, IsTakenAwayBeforeSomethingElseIsWritten)
{
    CapturedStderr errors;
    {
        ProgressBar bar(4, true);
        bar.Show(0, 0);
        std::cerr << "a report\n";
        std::cerr << "another\n";
    }
    std::cerr << "later\n";

    EXPECT_EQ(errors.Text(), "\r[..............................] 0/4\033[K"
                             "\r\033[Ka report\nanother\nlater\n");
}

TEST(ProgressBar, StaysWhenNothingIsWritten)
{
    CapturedStderr errors;
    ProgressBar bar(4, true);
    bar.Show(0, 0);

    std::cerr << "" << std::flush;
    std::cout << std::string() << std::flush;

    EXPECT_EQ(errors.Text(), "\r[..............................] 0/4\033[K");
}

TEST(ProgressBar, ShowsNothingWhenItIsNotVisible)
{
    CapturedStderr errors;
    {
        ProgressBar bar(4, false);
        bar.Show(2, 1);
        std::cerr << "a report\n";
    }

    EXPECT_EQ(errors.Text(), "a report\n");
}

TEST(ProgressBar, KeepsTheStateOfTheStreams)
{
    std::cout.setstate(std::ios::failbit);
    {
        ProgressBar bar(4, true);
        EXPECT_TRUE(std::cout.fail());
    }

    EXPECT_TRUE(std::cout.fail());
    std::cout.clear();
}

TEST(ProgressBar, ACopyOfTheProcessForgetsIt)
{
    CapturedStderr errors;
    ProgressBar bar(4, true);
    bar.Show(0, 0);

    bar.Forget();
    std::cerr << "from the copy\n";

    EXPECT_EQ(errors.Text(), "\r[..............................] 0/4\033[K"
                             "from the copy\n");
}
