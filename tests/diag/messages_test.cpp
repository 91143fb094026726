#include "ZT/error.h"

#include <cerrno>
#include <functional>
#include <initializer_list>
#include <iostream>
#include <memory>
#include <string>

#include <gtest/gtest.h>

#include "diag/Reports.h"
#include "support/CapturedStderr.h"
#include "support/ErrorTrap.h"
#include "support/FailingMemory.h"

TEST(Messages, HaveTheirPrefixKindAndLevel)
{
    ErrorTrap trap;

    ZtDebug("x %d\n", 1);
    ZtInform("x %d\n", 2);
    ZtWarning("x %d\n", 3);
    ZtError("x %d\n", 4);
    ZtStatus("x %d\n", 5);

    ASSERT_EQ(trap.reports.size(), 5u);
    const char* const texts[] = {"Debug: x 1\n", "Info: x 2\n",
                                 "Warning: x 3\n", "Error: x 4\n", "x 5\n"};
    const int codes[] = {0, 0, 0, 0, 5};
    const int levels[] = {1, 2, 3, 4, 2};
    for (std::size_t i = 0; i < 5; ++i) {
        EXPECT_EQ(trap.reports[i].text, texts[i]);
        EXPECT_EQ(trap.reports[i].code, codes[i]);
        EXPECT_EQ(trap.reports[i].level, levels[i]);
    }
}

TEST(Messages, AreDroppedOrPrintedByTheDefaults)
{
    EXPECT_EQ(Printed([] {
                  ZtDebug("a\n");
                  ZtInform("b\n");
                  ZtStatus("c\n");
                  ZtWarning("d\n");
                  ZtError("e\n");
              }),
              "Warning: d\nError: e\n");
}

TEST(Messages, ArePrintedFromALowerOutputLevelUp)
{
    const SettingsKept kept;
    ZtErrHandler::outputLevel = 1;

    EXPECT_EQ(Printed([] {
                  ZtDebug("a\n");
                  ZtInform("b\n");
                  ZtStatus("c\n");
              }),
              "Debug: a\nInfo: b\nc\n");
}

TEST(Messages, AddNoNewline)
{
    ErrorTrap trap;

    ZtWarning("one");
    ZtStatus("%s", "");

    EXPECT_EQ(trap.Text(), "Warning: one");
    EXPECT_EQ(trap.reports.size(), 2u);
}

TEST(Messages, TakeTextOfAnyLength)
{
    for (const std::size_t length :
         std::initializer_list<std::size_t>{1023, 1024, 2047, 2048, 70000}) {
        const std::string text(length, 'x');
        ErrorTrap trap;

        ZtError("%s\n", text.c_str());

        EXPECT_EQ(trap.Text(), "Error: " + text + "\n");
    }
}

TEST(Messages, TakeArgumentsThatLookLikeFormatsAsTheyStand)
{
    ErrorTrap trap;

    ZtWarning("%s", "%n%s%s\n");

    EXPECT_EQ(trap.Text(), "Warning: %n%s%s\n");
}

TEST(Messages, OfANullFormatHaveOnlyTheirPrefix)
{
    ErrorTrap trap;
    const char* no_format = nullptr;

    std::invoke(ZtWarning, no_format);

    EXPECT_EQ(trap.Text(), "Warning: ");
}

TEST(Messages, KeepTheLastSystemFailureBeforeThem)
{
    ErrorTrap trap;

    errno = ENOENT;
    ZtWarning("%s\n", std::string(5000, 'x').c_str());
    errno = 0;

    EXPECT_EQ(trap.reports[0].system_error, ENOENT);
}

TEST(Messages, OfAFormatThatTheSystemRefusesComeOutAsItStands)
{
    const wchar_t unknown[] = {wchar_t(0x7fffffff), 0}; // is no character
    ErrorTrap trap;

    errno = ENOENT;
    ZtWarning("%ls!\n", unknown);
    errno = 0;

    EXPECT_EQ(trap.Text(), "Warning: %ls!\n");
    EXPECT_EQ(trap.reports[0].system_error, ENOENT); // not of the refusal
}

TEST(Messages, CountWhetherDroppedPrintedOrCaught)
{
    const int before = ZtErr::count;

    ZtDebug("dropped\n");
    Printed([] { ZtWarning("printed\n"); });
    ErrorTrap trap;
    ZtDebug("caught\n");

    EXPECT_EQ(ZtErr::count, before + 3);
    EXPECT_EQ(trap.Text(), "Debug: caught\n");
}

TEST(Messages, AgreeWithReportsThatAreAlwaysMade)
{
    const SettingsKept kept;
    // What was observed of one way of reporting.
    struct Observed
    {
        std::string printed;
        std::string caught;
        int counted;
        int queued;
        bool output_set;

        bool operator==(const Observed&) const = default;
    };
    const auto observe = [](bool message, int level, bool trap, bool hold) {
        Observed seen = {};
        ZtErrHandler::output = nullptr;
        CapturedStderr captured;
        std::unique_ptr<ErrorTrap> handler;
        if (trap)
            handler = std::make_unique<ErrorTrap>();
        ZtErrHandler* const top = ZtErrHandler::handlerStack;
        top->held = hold;
        const int before = ZtErr::count;
        if (message) {
            level == 1 ? ZtDebug("t\n") : ZtWarning("t\n");
        } else {
            auto* error =
                new ZtErr(level == 1 ? "Debug: " : "Warning: ", 0, level);
            error->stream << "t\n";
            error->Post();
        }
        seen.counted = ZtErr::count - before;
        seen.queued = top->queue.count;
        seen.output_set = ZtErrHandler::output == &std::cerr;
        top->Release();
        seen.caught = handler ? handler->Text() : "";
        seen.printed = captured.Text();
        return seen;
    };
    Printed([] { ZtWarning("the default handler is there\n"); });

    for (int round = 0; round < 2 * 2 * 2 * 6; ++round) {
        const int level = round % 2 ? 1 : 3;
        const bool trap = round / 2 % 2;
        const bool hold = round / 4 % 2;
        ZtErrHandler::outputLevel = round / 8;
        EXPECT_EQ(observe(true, level, trap, hold),
                  observe(false, level, trap, hold))
            << "level " << level << " output level " << round / 8 << " trap "
            << trap << " hold " << hold;
    }
}

TEST(Messages, BelowTheOutputLevelAreSeenByAHandlerThatHoldsBack)
{
    const SettingsKept kept;
    Printed([] { ZtWarning("the default handler is there\n"); });
    ZtErrHandler* const bottom = ZtErrHandler::handlerStack;
    ASSERT_NE(bottom, nullptr);

    bottom->Hold();
    ZtDebug("kept\n");

    EXPECT_EQ(bottom->queue.count, 1);
    ZtErrHandler::outputLevel = 1;
    EXPECT_EQ(Printed([&] { bottom->Release(); }), "Debug: kept\n");
}

TEST(Messages, BelowTheOutputLevelAreSeenByAHandlerPutUnderTheDefault)
{
    Printed([] { ZtWarning("the default handler is there\n"); });
    ZtErrHandler* const bottom = ZtErrHandler::handlerStack;
    ASSERT_NE(bottom, nullptr);
    std::string seen;
    {
        ErrorTrap trap;
        ZtErrHandler::handlerStack = bottom;
        trap.next = nullptr;
        bottom->next = &trap;
        ZtDebug("caught\n");
        seen = trap.Text();
        bottom->next = nullptr;
        ZtErrHandler::handlerStack = &trap;
        trap.next = bottom;
    }

    EXPECT_EQ(seen, "Debug: caught\n");
}

TEST(Messages, WithoutMemoryArePrintedStraightAway)
{
    Printed([] { ZtWarning("the default handler is there\n"); });
    CapturedStderr captured;

    {
        FailingMemory none;
        ZtWarning("no memory for %d\n", 5);
        ZtDebug("dropped\n");
    }

    EXPECT_EQ(captured.Text(), "Warning: no memory for 5\n");
}

TEST(Messages, SurviveEverySingleAllocationThatFails)
{
    const std::string text(3000, 'x');
    for (long spared = 0; spared < 20; ++spared) {
        CapturedStderr captured;
        bool failed = false;
        {
            FailingMemory once(spared, 1);
            ZtWarning("%s\n", text.c_str());
            failed = FailingMemory::Failed();
        }
        if (!failed)
            return;
        EXPECT_LE(captured.Text().size(), text.size() + 10);
    }
    FAIL() << "a report takes more allocations than it should";
}
