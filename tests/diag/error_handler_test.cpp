#include "ZT/error.h"

#include <cstring>
#include <iostream>
#include <memory>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "diag/Reports.h"
#include "support/ErrorTrap.h"
#include "support/FailingMemory.h"
#include "support/SlotOf.h"
#include "support/ThrowingStderr.h"

namespace {

/// Says who handles an error, then passes it on.
class Teller : public ZtErrHandler
{
public:
    explicit Teller(const char* own_name, int hold_back = 0)
        : ZtErrHandler(hold_back), name(own_name)
    {}

    void Handle(ZtErr* error) override
    {
        std::cerr << name << ": ";
        ZtErrHandler::Handle(error);
    }

private:
    const char* name;
};

/// Counts how many of its kind were deleted.
class Telltale : public ZtErr
{
public:
    Telltale(const char* text, int severity) : ZtErr(text, 0, severity) {}
    ~Telltale() override
    {
        ++deleted;
        if (tells)
            std::cerr << "deleted\n";
    }

    static void Posted(const char* text, int severity)
    {
        (new Telltale(text, severity))->Post();
    }

    static inline int deleted = 0;
    static inline bool tells = false;
};

} // namespace

TEST(ZtErrHandler, GoesOnTopAndComesOff)
{
    ZtErrHandler* const before = ZtErrHandler::handlerStack;
    {
        ZtErrHandler one(0);
        ZtErrHandler two(1);

        EXPECT_EQ(ZtErrHandler::handlerStack, &two);
        EXPECT_EQ(two.next, &one);
        EXPECT_EQ(one.next, before);
        EXPECT_EQ(one.held, 0);
        EXPECT_EQ(two.held, 1);
        EXPECT_EQ(two.queue.count, 0);
    }
    EXPECT_EQ(ZtErrHandler::handlerStack, before);
}

TEST(ZtErrHandler, PassesOnWhatItDoesNotOverride)
{
    ErrorTrap below;
    ZtErrHandler plain;

    PostText("Warning: first\n", 3);
    PostText("Debug: second\n", 1);

    EXPECT_EQ(below.Text(), "Warning: first\nDebug: second\n");
}

TEST(ZtErrHandler, PassesOnToAHandlerThatHoldsBack)
{
    ErrorTrap below;
    below.Hold();
    ZtErrHandler plain;

    PostText("Warning: first\n");

    EXPECT_EQ(below.Text(), "");
    EXPECT_EQ(below.queue.count, 1);
    below.Release();
    EXPECT_EQ(below.Text(), "Warning: first\n");
}

TEST(ZtErrHandler, ASubclassSeesEverythingAndTheOnesBelowWhatItPassesOn)
{
    class OnlyErrors : public ZtErrHandler
    {
    public:
        void Handle(ZtErr* error) override
        {
            ++seen;
            if (error->level >= 4)
                next->Deliver(error);
            else
                delete error;
        }
        int seen = 0;
    };
    ErrorTrap below;
    OnlyErrors top;

    ZtDebug("a\n");
    ZtWarning("b\n");
    ZtError("c\n");
    ZtStatus("d\n");

    EXPECT_EQ(top.seen, 4);
    EXPECT_EQ(below.Text(), "Error: c\n");
}

TEST(ZtErrHandler, HoldsBackUntilItReleasesOldestFirst)
{
    Teller teller("t", 1);

    const std::string while_held = Printed([] {
        PostText("one\n");
        PostText("two\n");
        PostText("three\n");
    });
    const std::string released = Printed([&] { teller.Release(); });

    EXPECT_EQ(while_held, "");
    EXPECT_EQ(released, "t: one\nt: two\nt: three\n");
    EXPECT_EQ(teller.held, 0);
}

TEST(ZtErrHandler, HoldsBackFromHoldOn)
{
    ErrorTrap reports;

    PostText("one\n");
    reports.Hold();
    PostText("two\n");

    EXPECT_EQ(reports.held, 1);
    EXPECT_EQ(reports.Text(), "one\n");
    reports.Release();
    EXPECT_EQ(reports.Text(), "one\ntwo\n");
}

TEST(ZtErrHandler, HandlesAtOnceWhatArrivesDuringARelease)
{
    class Echoing : public ErrorTrap
    {
    public:
        void Handle(ZtErr* error) override
        {
            const bool first = reports.empty();
            ErrorTrap::Handle(error);
            if (first)
                PostText("echo ");
        }
    };
    Echoing handler;
    handler.Hold();
    PostText("one ");
    PostText("two ");

    handler.Release();

    EXPECT_EQ(handler.Text(), "one echo two ");
}

TEST(ZtErrHandler, ReleaseWithoutHeldErrorsDoesNothing)
{
    ErrorTrap reports;

    reports.Hold();
    reports.Release();
    reports.Release();

    EXPECT_EQ(reports.held, 0);
    EXPECT_EQ(reports.Text(), "");
}

TEST(ZtErrHandler, DeliverToAnyHandlerWorksWithoutTheStack)
{
    ErrorTrap below, top;

    below.Deliver(new ZtErr("straight\n", 0, 1));
    below.Deliver(nullptr);

    EXPECT_EQ(below.Text(), "straight\n");
    EXPECT_EQ(top.Text(), "");
}

TEST(ZtErrHandler, PopTakesTheOldestAndPopTailTheNewest)
{
    ErrorTrap reports;
    reports.Hold();
    PostText("one");
    PostText("two");
    PostText("three");

    std::unique_ptr<ZtErr> oldest(reports.Pop());
    std::unique_ptr<ZtErr> newest(reports.PopTail());
    reports.Release();

    EXPECT_STREQ(oldest->Message(), "one");
    EXPECT_STREQ(newest->Message(), "three");
    EXPECT_EQ(reports.Text(), "two");
    EXPECT_EQ(reports.Pop(), nullptr);
    EXPECT_EQ(reports.PopTail(), nullptr);
}

TEST(ZtErrHandler, ReleasesBeforeItGoes)
{
    ErrorTrap below;
    {
        ZtErrHandler holding(1);
        PostText("one ");
        PostText("two ");
    }

    EXPECT_EQ(below.Text(), "one two ");
}

TEST(ZtErrHandler, DestroyedOutOfOrderIsReportedAndAborts)
{
    auto* one = new ZtErrHandler;
    auto* two = new ZtErrHandler;

    EXPECT_EXIT(delete one, aborted, "^Error: handler stack confused\n$");

    delete two;
    delete one;
}

TEST(ZtErrHandler, DestroyedOutOfOrderIsAMessageOfLevelFour)
{
    class Telling : public ZtErrHandler
    {
    public:
        void Handle(ZtErr* error) override
        {
            std::cerr << "kind " << error->code << " level " << error->level
                      << ' ';
            ZtErrHandler::Handle(error);
        }
    };
    auto* one = new ZtErrHandler;
    auto* two = new Telling;

    EXPECT_EXIT(delete one, aborted,
                "^kind 0 level 4 Error: handler stack confused\n$");

    delete two;
    delete one;
}

TEST(ZtErrHandler, DestroyedOutOfOrderReleasesWhatItHoldsFirst)
{
    const auto build_and_destroy = [] {
        auto* one = new ZtErrHandler(1);
        PostText("one\n");
        new ZtErrHandler;
        delete one;
    };

    EXPECT_EXIT(build_and_destroy(), aborted,
                "^one\nError: handler stack confused\n$");
}

TEST(ZtErrHandler, ASubclassIsNoLongerItselfWhenItsBaseReleases)
{
    ErrorTrap below;
    const std::string told = Printed([] {
        Teller teller("t", 1);
        PostText("one");
    });

    EXPECT_EQ(told, "");
    EXPECT_EQ(below.Text(), "one");
}

TEST(ZtErrHandler, HoldsBackForEveryFlagButZero)
{
    for (const int flag : {2, -1}) {
        ErrorTrap below;
        ZtErrHandler holding(flag);

        PostText("one");

        EXPECT_EQ(holding.held, flag);
        EXPECT_EQ(holding.queue.count, 1);
        EXPECT_EQ(below.Text(), "");
    }
}

TEST(ZtErrHandler, TheBottomDeletesWhatItPrintsAndWhatItDrops)
{
    Telltale::deleted = 0;
    Printed([] { Telltale::Posted("printed\n", 3); });
    const int after_printed = Telltale::deleted;
    Telltale::Posted("dropped\n", 1);

    EXPECT_EQ(after_printed, 1);
    EXPECT_EQ(Telltale::deleted, 2);
}

TEST(ZtErrHandler, TheBottomDeletesAFatalErrorBeforeItAborts)
{
    const auto build_and_fail = [] {
        auto* below = new ZtErrHandler;
        new ZtErrHandler(1);
        PostText("held\n");
        Telltale::tells = true;
        below->Deliver(new Telltale("fatal\n", 5));
    };

    EXPECT_EXIT(build_and_fail(), aborted, "^fatal\ndeleted\nheld\n$");
}

TEST(ZtErrHandler, AbortReleasesEveryHandlerTheTopFirst)
{
    const auto build_and_abort = [] {
        auto* bottom = new Teller("bottom", 1);
        PostText("one\n");
        new Teller("top", 1);
        PostText("two\n");
        ASSERT_EQ(bottom->queue.count, 1);
        ZtErrHandler::Abort();
    };

    EXPECT_EXIT(build_and_abort(), aborted,
                "^top: bottom: one\nbottom: two\n$");
}

TEST(ZtErrHandler, PrintsFromTheOutputLevelUp)
{
    const SettingsKept kept;
    EXPECT_EQ(Printed([] { PostText("2", 2); }), "");
    EXPECT_EQ(Printed([] { PostText("3", 3); }), "3");
    EXPECT_EQ(Printed([] { PostText("4", 4); }), "4");
    ZtErrHandler::outputLevel = 4;
    EXPECT_EQ(Printed([] { PostText("3", 3); }), "");
    EXPECT_EQ(Printed([] { PostText("4", 4); }), "4");
    ZtErrHandler::outputLevel = 0;
    EXPECT_EQ(Printed([] { PostText("0", 0); }), "0");
    EXPECT_EQ(Printed([] { PostText("-1", -1); }), "");
}

TEST(ZtErrHandler, AbortsFromTheAbortLevelUp)
{
    const SettingsKept kept;
    ZtErrHandler::abortLevel = 3;

    EXPECT_EQ(Printed([] { PostText("2", 2); }), "");
    EXPECT_EXIT(PostText("Warning: 3\n", 3), aborted, "^Warning: 3\n$");
    EXPECT_EXIT(PostText("Error: 4\n", 4), aborted, "^Error: 4\n$");
}

TEST(ZtErrHandler, AbortsSilentlyBelowTheOutputLevel)
{
    const SettingsKept kept;
    ZtErrHandler::abortLevel = 1;

    EXPECT_EXIT(ZtDebug("lost\n"), aborted, "^$");
}

TEST(ZtErrHandler, AHandlerOnTopDecidesWhetherAFatalErrorAborts)
{
    ErrorTrap reports;

    ZtErr::Check(0, "no way on", 5);

    EXPECT_EQ(reports.Text(), "Error: no way on\n");
}

TEST(ZtErrHandler, ReleasesWhatIsHeldBeforeAFatalErrorEndsAll)
{
    const auto build_and_fail = [] {
        auto* below = new ZtErrHandler;
        new ZtErrHandler(1);
        PostText("one\n");
        below->Deliver(new ZtErr("fatal\n", 0, 5));
    };

    EXPECT_EXIT(build_and_fail(), aborted, "^fatal\none\n$");
}

TEST(ZtErrHandler, PrintsToStandardErrorWhateverTheOutputStream)
{
    const SettingsKept kept;
    std::ostringstream elsewhere;
    ZtErrHandler::SetOutputStream(&elsewhere);

    EXPECT_EQ(Printed([] { PostText("Error: lost\n"); }), "Error: lost\n");

    EXPECT_EQ(elsewhere.str(), "");
    EXPECT_EQ(ZtErrHandler::output, &elsewhere);
}

TEST(ZtErrHandler, NothingThrowsWhenStandardErrorDoes)
{
    const ThrowingStderr no_output;

    EXPECT_NO_THROW(PostText("Error: lost\n"));

    EXPECT_TRUE(std::cerr.bad());
}

TEST(ZtErrHandler, SetOutputStreamToNullIsStandardError)
{
    const SettingsKept kept;
    std::ostringstream elsewhere;

    EXPECT_EQ(ZtErrHandler::output, &std::cerr);
    ZtErrHandler::SetOutputStream(&elsewhere);
    EXPECT_EQ(ZtErrHandler::output, &elsewhere);
    ZtErrHandler::SetOutputStream(nullptr);
    EXPECT_EQ(ZtErrHandler::output, &std::cerr);
}

TEST(ZtErrHandler, SetsANullOutputStreamToStandardError)
{
    const SettingsKept kept;
    for (int level : {1, 4}) { // dropped, and printed
        ZtErrHandler::output = nullptr;

        Printed([&] { PostText("text\n", level); });

        EXPECT_EQ(ZtErrHandler::output, &std::cerr) << level;
    }
    ZtErrHandler::output = nullptr;
    ZtDebug("dropped\n");
    EXPECT_EQ(ZtErrHandler::output, &std::cerr);
}

TEST(ZtErrHandler, PrintsTextsAsTheyStand)
{
    EXPECT_EQ(Printed([] { PostText("%n%s%s\\n"); }), "%n%s%s\\n");
}

TEST(ZtErrHandler, AnswersAsAPlainObject)
{
    ZtErrHandler handler;

    EXPECT_STREQ(handler.ClassName(), "KvoObject");
}

TEST(ZtErrHandler, HandleStandsBehindTheOperationsOfObjects)
{
    EXPECT_EQ(SlotOf(&ZtErrHandler::Handle), 11);
}

TEST(ZtErrHandler, WithoutMemoryForTheMessagePrintsItOutOfTheStream)
{
    auto* const error = new ZtErr("Error: lost\n", 0, 4);
    error->stream.write("\0more", 5);
    CapturedStderr captured;

    {
        FailingMemory none;
        error->Post();
    }

    EXPECT_EQ(captured.Text(), "Error: lost\n");
}

TEST(ZtErrHandler, WithoutMemoryToHoldBackHandlesAtOnce)
{
    class Counting : public ZtErrHandler
    {
    public:
        void Handle(ZtErr* error) override
        {
            ++seen;
            delete error;
        }
        int seen = 0;
    };
    Counting handler;
    handler.Hold();
    auto* error = new ZtErr("one", 0, 4);
    handler.queue.Clear();

    {
        FailingMemory none;
        ZtErrHandler::Post(error);
        EXPECT_EQ(handler.seen + handler.queue.count, 1);
    }
    handler.Release();

    EXPECT_EQ(handler.seen, 1);
}
