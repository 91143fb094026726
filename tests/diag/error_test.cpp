#include "ZT/error.h"

#include <cerrno>
#include <csignal>
#include <cstring>
#include <functional>
#include <initializer_list>
#include <iostream>
#include <memory>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "support/CapturedStderr.h"
#include "support/ErrorTrap.h"
#include "support/FailingMemory.h"

namespace {

constexpr auto aborted = [](int status) {
    return testing::KilledBySignal(SIGABRT)(status);
};

/// Puts the levels and the output stream back.
class Reports : public testing::Test
{
protected:
    ~Reports() override
    {
        ZtErrHandler::outputLevel = 3;
        ZtErrHandler::abortLevel = 5;
        ZtErrHandler::SetOutputStream(nullptr);
    }

    /// What `action` prints on standard error.
    template <class Action>
    static std::string Printed(Action action)
    {
        CapturedStderr captured;
        action();
        return captured.Text();
    }
};

using ZtErrTest = Reports;
using ZtErrCheck = Reports;
using ZtErrHandlerTest = Reports;
using Messages = Reports;

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

void PostText(const char* text, int level = 4)
{
    (new ZtErr(text, 0, level))->Post();
}

template <class Operation>
std::ptrdiff_t SlotOf(Operation operation)
{
    std::ptrdiff_t word = 0;
    static_assert(sizeof operation == 2 * sizeof word);
    std::memcpy(&word, &operation, sizeof word);
    return (word - 1) / static_cast<std::ptrdiff_t>(sizeof(void*));
}

} // namespace

// --- errors ----------------------------------------------------------------

TEST_F(ZtErrTest, KeepsItsKindLevelAndText)
{
    ZtErr error("Error: ", 3, 4);

    EXPECT_EQ(error.code, 3);
    EXPECT_EQ(error.level, 4);
    EXPECT_EQ(error.message, nullptr);
    EXPECT_STREQ(error.Message(), "Error: ");
}

TEST_F(ZtErrTest, OfANullTextIsEmpty)
{
    ZtErr error(nullptr, 0, 1);

    EXPECT_STREQ(error.Message(), "");
}

TEST_F(ZtErrTest, KeepsTheLastSystemFailureBeforeIt)
{
    errno = ENOENT;
    ZtErr error("", 0, 1);
    errno = EPERM;

    EXPECT_EQ(error.SystemError(), ENOENT);
    EXPECT_EQ(oserror(), EPERM);
    errno = 0;
}

TEST_F(ZtErrTest, CountsEveryErrorEverMade)
{
    const int before = ZtErr::count;

    {
        ZtErr one("", 0, 1), other("", 0, 4);
    }
    ZtErr third("", 0, 1);

    EXPECT_EQ(ZtErr::count, before + 3);
}

TEST_F(ZtErrTest, TakesWhatIsWrittenToItsStream)
{
    ZtErr error("Warning: ", 0, 3);

    error.stream << "frame " << 12 << '\n';

    EXPECT_STREQ(error.Message(), "Warning: frame 12\n");
}

TEST_F(ZtErrTest, FreezesItsTextWhenItIsFirstAsked)
{
    ZtErr error("one", 0, 3);

    char* first = error.Message();
    error.stream << " two";
    char* second = error.Message();

    EXPECT_EQ(first, second);
    EXPECT_EQ(error.message, first);
    EXPECT_STREQ(second, "one");
}

TEST_F(ZtErrTest, EndsItsTextAtTheFirstNul)
{
    ZtErr error("one", 0, 3);

    error.stream.write("\0two", 4);

    EXPECT_STREQ(error.Message(), "one");
}

TEST_F(ZtErrTest, WithoutMemoryHasTheEmptyText)
{
    ZtErr error("one", 0, 3);
    FailingMemory none;

    EXPECT_STREQ(error.Message(), "");
}

TEST_F(ZtErrTest, PostGivesItToTheTopHandler)
{
    ErrorTrap below, top;

    PostText("Error: lost\n", 4);

    EXPECT_EQ(top.Text(), "Error: lost\n");
    EXPECT_EQ(below.Text(), "");
}

TEST_F(ZtErrTest, AbortPostsItAndAborts)
{
    EXPECT_EXIT((new ZtErr("Error: lost\n", 0, 4))->Abort(), aborted,
                "^Error: lost\n$");
}

TEST_F(ZtErrTest, AbortPrintsNothingBelowTheOutputLevel)
{
    EXPECT_EXIT((new ZtErr("Debug: lost\n", 0, 1))->Abort(), aborted, "^$");
}

TEST_F(ZtErrTest, AnswersAsAPlainObject)
{
    ZtErr error("", 0, 1);

    EXPECT_STREQ(error.ClassName(), "KvoObject");
    EXPECT_EQ(error.Key(), &error);
}

// --- checks ----------------------------------------------------------------

TEST_F(ZtErrCheck, OfAValueReportsZero)
{
    ErrorTrap reports;

    EXPECT_EQ(ZtErr::Check(0, nullptr, 4), 1);

    ASSERT_EQ(reports.reports.size(), 1u);
    EXPECT_EQ(reports.Text(), "Error: bad value\n");
    EXPECT_EQ(reports.reports[0].code, 1);
    EXPECT_EQ(reports.reports[0].level, 4);
}

TEST_F(ZtErrCheck, OfAValueUsesTheTextGiven)
{
    ErrorTrap reports;

    EXPECT_EQ(ZtErr::Check(0, "no such frame", 3), 1);

    EXPECT_EQ(reports.Text(), "Error: no such frame\n");
    EXPECT_EQ(reports.reports[0].level, 3);
}

TEST_F(ZtErrCheck, OfAValueIsSilentOtherwise)
{
    ErrorTrap reports;

    EXPECT_EQ(ZtErr::Check(1, "no such frame", 4), 0);
    EXPECT_EQ(ZtErr::Check(-1, nullptr, 5), 0);

    EXPECT_TRUE(reports.reports.empty());
}

TEST_F(ZtErrCheck, OfAValuePrintsWithTheDefaults)
{
    int result = 0;

    EXPECT_EQ(Printed([&] { result = ZtErr::Check(0, nullptr, 4); }),
              "Error: bad value\n");
    EXPECT_EQ(result, 1);
    EXPECT_EQ(Printed([&] { result = ZtErr::Check(3, nullptr, 4); }), "");
    EXPECT_EQ(result, 0);
}

TEST_F(ZtErrCheck, OfAPointerReportsNull)
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

TEST_F(ZtErrCheck, OfAStreamReportsEveryBitOfItsState)
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

TEST_F(ZtErrCheck, OfAStreamIsSilentWhenItIsGood)
{
    ErrorTrap reports;
    std::ostringstream out;

    EXPECT_EQ(ZtErr::Check(out, "cannot write", 4), 0);

    EXPECT_TRUE(reports.reports.empty());
}

TEST_F(ZtErrCheck, OfAStreamAtItsEndPrintsWithTheDefaults)
{
    std::istringstream in("");
    in.get();

    EXPECT_EQ(Printed([&] { ZtErr::Check(in, nullptr, 3); }),
              "Stream Error: failed i/o\n");
    EXPECT_EQ(Printed([&] { ZtErr::Check(in, "cut short", 3); }),
              "Stream Error: cut short\n");
}

TEST_F(ZtErrCheck, OfTheSystemReportsItsLastFailure)
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

TEST_F(ZtErrCheck, OfTheSystemIsSilentWithoutAFailure)
{
    ErrorTrap reports;
    errno = 0;

    EXPECT_EQ(ZtErr::CheckSystem("cannot read it", 4), 0);

    EXPECT_TRUE(reports.reports.empty());
}

TEST_F(ZtErrCheck, OfTheSystemKnowsFailuresWithoutAName)
{
    ErrorTrap reports;
    errno = 99999;

    ZtErr::CheckSystem(nullptr, 4);
    errno = 0;

    EXPECT_EQ(reports.reports[0].system_error, 99999);
    EXPECT_EQ(reports.Text().substr(0, 14), "System Error: ");
    EXPECT_GT(reports.Text().size(), 15u);
}

TEST_F(ZtErrCheck, AtTheAbortLevelPrintsAndAborts)
{
    EXPECT_EXIT(ZtErr::Check(0, "no way on", 5), aborted,
                "^Error: no way on\n$");
    EXPECT_EXIT(ZtErr::Check(nullptr, "no way on", 6), aborted,
                "^Error: no way on\n$");
}

TEST_F(ZtErrCheck, BelowTheOutputLevelOnlyCounts)
{
    const int before = ZtErr::count;
    int result = 0;

    EXPECT_EQ(Printed([&] { result = ZtErr::Check(0, nullptr, 2); }), "");

    EXPECT_EQ(result, 1);
    EXPECT_EQ(ZtErr::count, before + 1);
}

// --- handlers --------------------------------------------------------------

TEST_F(ZtErrHandlerTest, GoesOnTopAndComesOff)
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

TEST_F(ZtErrHandlerTest, PassesOnWhatItDoesNotOverride)
{
    ErrorTrap below;
    ZtErrHandler plain;

    PostText("Warning: first\n", 3);
    PostText("Debug: second\n", 1);

    EXPECT_EQ(below.Text(), "Warning: first\nDebug: second\n");
}

TEST_F(ZtErrHandlerTest, PassesOnToAHandlerThatHoldsBack)
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

TEST_F(ZtErrHandlerTest, ASubclassSeesEverythingAndTheOnesBelowWhatItPassesOn)
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

TEST_F(ZtErrHandlerTest, HoldsBackUntilItReleasesOldestFirst)
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

TEST_F(ZtErrHandlerTest, HoldsBackFromHoldOn)
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

TEST_F(ZtErrHandlerTest, HandlesAtOnceWhatArrivesDuringARelease)
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

TEST_F(ZtErrHandlerTest, ReleaseWithoutHeldErrorsDoesNothing)
{
    ErrorTrap reports;

    reports.Hold();
    reports.Release();
    reports.Release();

    EXPECT_EQ(reports.held, 0);
    EXPECT_EQ(reports.Text(), "");
}

TEST_F(ZtErrHandlerTest, DeliverToAnyHandlerWorksWithoutTheStack)
{
    ErrorTrap below, top;

    below.Deliver(new ZtErr("straight\n", 0, 1));
    below.Deliver(nullptr);

    EXPECT_EQ(below.Text(), "straight\n");
    EXPECT_EQ(top.Text(), "");
}

TEST_F(ZtErrHandlerTest, PopTakesTheOldestAndPopTailTheNewest)
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

TEST_F(ZtErrHandlerTest, ReleasesBeforeItGoes)
{
    ErrorTrap below;
    {
        ZtErrHandler holding(1);
        PostText("one ");
        PostText("two ");
    }

    EXPECT_EQ(below.Text(), "one two ");
}

TEST_F(ZtErrHandlerTest, DestroyedOutOfOrderIsReportedAndAborts)
{
    auto* one = new ZtErrHandler;
    auto* two = new ZtErrHandler;

    EXPECT_EXIT(delete one, aborted, "^Error: handler stack confused\n$");

    delete two;
    delete one;
}

TEST_F(ZtErrHandlerTest, AbortReleasesEveryHandlerTheTopFirst)
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

TEST_F(ZtErrHandlerTest, PrintsFromTheOutputLevelUp)
{
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

TEST_F(ZtErrHandlerTest, AbortsFromTheAbortLevelUp)
{
    ZtErrHandler::abortLevel = 3;

    EXPECT_EQ(Printed([] { PostText("2", 2); }), "");
    EXPECT_EXIT(PostText("Warning: 3\n", 3), aborted, "^Warning: 3\n$");
    EXPECT_EXIT(PostText("Error: 4\n", 4), aborted, "^Error: 4\n$");
}

TEST_F(ZtErrHandlerTest, AbortsSilentlyBelowTheOutputLevel)
{
    ZtErrHandler::abortLevel = 1;

    EXPECT_EXIT(ZtDebug("lost\n"), aborted, "^$");
}

TEST_F(ZtErrHandlerTest, AHandlerOnTopDecidesWhetherAFatalErrorAborts)
{
    ErrorTrap reports;

    ZtErr::Check(0, "no way on", 5);

    EXPECT_EQ(reports.Text(), "Error: no way on\n");
}

TEST_F(ZtErrHandlerTest, ReleasesWhatIsHeldBeforeAFatalErrorEndsAll)
{
    const auto build_and_fail = [] {
        auto* holding = new ZtErrHandler(1);
        PostText("one\n");
        holding->next->Deliver(new ZtErr("fatal\n", 0, 5));
    };

    EXPECT_EXIT(build_and_fail(), aborted, "^fatal\none\n$");
}

TEST_F(ZtErrHandlerTest, PrintsToStandardErrorWhateverTheOutputStream)
{
    std::ostringstream elsewhere;
    ZtErrHandler::SetOutputStream(&elsewhere);

    EXPECT_EQ(Printed([] { PostText("Error: lost\n"); }), "Error: lost\n");

    EXPECT_EQ(elsewhere.str(), "");
    EXPECT_EQ(ZtErrHandler::output, &elsewhere);
}

TEST_F(ZtErrHandlerTest, SetOutputStreamToNullIsStandardError)
{
    std::ostringstream elsewhere;

    EXPECT_EQ(ZtErrHandler::output, &std::cerr);
    ZtErrHandler::SetOutputStream(&elsewhere);
    EXPECT_EQ(ZtErrHandler::output, &elsewhere);
    ZtErrHandler::SetOutputStream(nullptr);
    EXPECT_EQ(ZtErrHandler::output, &std::cerr);
}

TEST_F(ZtErrHandlerTest, SetsANullOutputStreamToStandardError)
{
    for (int level : {1, 4}) { // dropped, and printed
        ZtErrHandler::output = nullptr;

        Printed([&] { PostText("text\n", level); });

        EXPECT_EQ(ZtErrHandler::output, &std::cerr) << level;
    }
    ZtErrHandler::output = nullptr;
    ZtDebug("dropped\n");
    EXPECT_EQ(ZtErrHandler::output, &std::cerr);
}

TEST_F(ZtErrHandlerTest, PrintsTextsAsTheyStand)
{
    EXPECT_EQ(Printed([] { PostText("%n%s%s\\n"); }), "%n%s%s\\n");
}

TEST_F(ZtErrHandlerTest, AnswersAsAPlainObject)
{
    ZtErrHandler handler;

    EXPECT_STREQ(handler.ClassName(), "KvoObject");
}

TEST_F(ZtErrHandlerTest, HandleStandsBehindTheOperationsOfObjects)
{
    EXPECT_EQ(SlotOf(&ZtErrHandler::Handle), 11);
}

TEST_F(ZtErrHandlerTest, WithoutMemoryToHoldBackHandlesAtOnce)
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

// --- message functions -----------------------------------------------------

TEST_F(Messages, HaveTheirPrefixKindAndLevel)
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

TEST_F(Messages, AreDroppedOrPrintedByTheDefaults)
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

TEST_F(Messages, ArePrintedFromALowerOutputLevelUp)
{
    ZtErrHandler::outputLevel = 1;

    EXPECT_EQ(Printed([] {
                  ZtDebug("a\n");
                  ZtInform("b\n");
                  ZtStatus("c\n");
              }),
              "Debug: a\nInfo: b\nc\n");
}

TEST_F(Messages, AddNoNewline)
{
    ErrorTrap trap;

    ZtWarning("one");
    ZtStatus("%s", "");

    EXPECT_EQ(trap.Text(), "Warning: one");
    EXPECT_EQ(trap.reports.size(), 2u);
}

TEST_F(Messages, TakeTextOfAnyLength)
{
    for (const std::size_t length :
         std::initializer_list<std::size_t>{1023, 1024, 2047, 2048, 70000}) {
        const std::string text(length, 'x');
        ErrorTrap trap;

        ZtError("%s\n", text.c_str());

        EXPECT_EQ(trap.Text(), "Error: " + text + "\n");
    }
}

TEST_F(Messages, TakeArgumentsThatLookLikeFormatsAsTheyStand)
{
    ErrorTrap trap;

    ZtWarning("%s", "%n%s%s\n");

    EXPECT_EQ(trap.Text(), "Warning: %n%s%s\n");
}

TEST_F(Messages, OfANullFormatHaveOnlyTheirPrefix)
{
    ErrorTrap trap;
    const char* no_format = nullptr;

    std::invoke(ZtWarning, no_format);

    EXPECT_EQ(trap.Text(), "Warning: ");
}

TEST_F(Messages, KeepTheLastSystemFailureBeforeThem)
{
    ErrorTrap trap;

    errno = ENOENT;
    ZtWarning("%s\n", std::string(5000, 'x').c_str());
    errno = 0;

    EXPECT_EQ(trap.reports[0].system_error, ENOENT);
}

TEST_F(Messages, CountWhetherDroppedPrintedOrCaught)
{
    const int before = ZtErr::count;

    ZtDebug("dropped\n");
    Printed([] { ZtWarning("printed\n"); });
    ErrorTrap trap;
    ZtDebug("caught\n");

    EXPECT_EQ(ZtErr::count, before + 3);
    EXPECT_EQ(trap.Text(), "Debug: caught\n");
}

TEST_F(Messages, BelowTheOutputLevelAreSeenByAHandlerThatHoldsBack)
{
    Printed([] { ZtWarning("the default handler is there\n"); });
    ZtErrHandler* const bottom = ZtErrHandler::handlerStack;
    ASSERT_NE(bottom, nullptr);

    bottom->Hold();
    ZtDebug("kept\n");

    EXPECT_EQ(bottom->queue.count, 1);
    ZtErrHandler::outputLevel = 1;
    EXPECT_EQ(Printed([&] { bottom->Release(); }), "Debug: kept\n");
}

TEST_F(Messages, BelowTheOutputLevelAreSeenByAHandlerPutUnderTheDefault)
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

TEST_F(Messages, WithoutMemoryArePrintedStraightAway)
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

TEST_F(Messages, SurviveEverySingleAllocationThatFails)
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
