#include "diag/reused_error.h"

#include <algorithm>
#include <cstring>
#include <functional>
#include <ios>
#include <locale>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

#include "ZT/error.h"
#include "core/slab.h"
#include "diag/Reports.h"
#include "diag/signal_report.h"
#include "support/FailingMemory.h"

namespace {

/// Shows every error to a function and deletes it.
class Visitor : public ZtErrHandler
{
public:
    explicit Visitor(std::function<void(ZtErr&)> visitor)
        : visit(std::move(visitor))
    {}

    void Handle(ZtErr* error) override
    {
        visit(*error);
        delete error;
    }

private:
    std::function<void(ZtErr&)> visit;
};

using Use = std::function<void(std::ostringstream&)>;

/// Shows the stream of one report to each of these, one after the other.
void ShowReports(const std::vector<Use>& uses)
{
    std::size_t next = 0;
    Visitor visitor([&](ZtErr& error) { uses[next++](error.stream); });
    for (std::size_t made = 0; made < uses.size(); ++made)
        ZtWarning("frame %d\n", 12);
}

std::ios& Base(std::ostringstream& stream)
{
    return stream;
}

/// What numbers look like in a country that does not exist.
std::locale StarLocale()
{
    struct Stars : std::numpunct<char>
    {
        char do_decimal_point() const override { return '*'; }
    };
    return {std::locale::classic(), new Stars};
}

/// Puts the whole process into another locale while it lives.
class GlobalLocale
{
public:
    explicit GlobalLocale(const std::locale& locale)
        : before(std::locale::global(locale))
    {}
    ~GlobalLocale() { std::locale::global(before); }
    GlobalLocale(const GlobalLocale&) = delete;
    GlobalLocale& operator=(const GlobalLocale&) = delete;

private:
    std::locale before;
};

/// Tells whether a report is made without asking for memory.
bool NextReportIsMadeOfAnother()
{
    int seen = 0;
    Visitor visitor([&](ZtErr&) { ++seen; });
    CapturedStderr captured;
    {
        FailingMemory none;
        ZtWarning("short\n");
    }
    return seen == 1;
}

// Where every use of freed memory is to be seen, nothing is used again.
constexpr bool errors_are_reused = !zt_core::pieces_are_separate;

int events = 0;

void CountEvent(std::ios_base::event, std::ios_base&, int)
{
    ++events;
}

} // namespace

// --- what is used again ----------------------------------------------------

TEST(ReusedError, IsTheNextReport)
{
    ShowReports({[](std::ostringstream& stream) { stream << 12; }});

    EXPECT_EQ(NextReportIsMadeOfAnother(), errors_are_reused);
    EXPECT_EQ(NextReportIsMadeOfAnother(), errors_are_reused);
}

TEST(ReusedError, CountsAsAnotherOne)
{
    Visitor visitor([](ZtErr&) {});
    const int before = ZtErr::count;

    ZtWarning("one\n");
    ZtWarning("two\n");
    ZtErr::Check(0, "three", 4);

    EXPECT_EQ(ZtErr::count, before + 3);
}

TEST(ReusedError, HasItsOwnKindLevelNumberAndText)
{
    std::vector<std::string> seen;
    Visitor visitor([&](ZtErr& error) {
        EXPECT_EQ(error.message, nullptr);
        std::ostringstream line;
        line << error.code << error.level << error.SystemError()
             << error.Message();
        seen.push_back(line.str());
    });

    errno = 7;
    ZtErr::CheckSystem("a longer text", 1);
    errno = 0;
    ZtErr::Check(0, "text", 4);
    ZtStatus("%c%c", 'o', 'k');

    EXPECT_EQ(seen,
              (std::vector<std::string>{"417System Error: a longer text\n",
                                        "140Error: text\n", "520ok"}));
}

TEST(ReusedError, TakesWhatIsWrittenToItsStream)
{
    const Use use = [](std::ostringstream& stream) {
        stream << "and " << 0.5 << ' ' << 1000000 << '\n';
        EXPECT_EQ(stream.str(), "Warning: frame 12\nand 0.5 1000000\n");
    };

    ShowReports({use, use, use});
}

TEST(ReusedError, LeavesATextThatItsHandlerTook)
{
    std::vector<char*> taken;
    {
        Visitor visitor([&](ZtErr& error) {
            error.Message();
            taken.push_back(std::exchange(error.message, nullptr));
        });
        ZtWarning("one\n");
        ZtWarning("two\n");
    }

    EXPECT_STREQ(taken[0], "Warning: one\n");
    EXPECT_STREQ(taken[1], "Warning: two\n");
    for (char* const text : taken)
        delete[] text;
}

TEST(ReusedError, IsNotOneThatIsStillInUse)
{
    std::vector<std::string> seen;
    int depth = 0;
    Visitor visitor([&](ZtErr& error) {
        if (depth < 3) {
            ++depth;
            ZtWarning("inside %d\n", depth);
            --depth;
        }
        seen.push_back(error.Message());
    });

    ZtWarning("outside\n");
    ZtWarning("again\n");

    EXPECT_EQ(seen, (std::vector<std::string>{
                        "Warning: inside 3\n", "Warning: inside 2\n",
                        "Warning: inside 1\n", "Warning: outside\n",
                        "Warning: inside 3\n", "Warning: inside 2\n",
                        "Warning: inside 1\n", "Warning: again\n"}));
}

TEST(ReusedError, IsNotOneThatIsHeldBack)
{
    std::string seen;
    Visitor visitor([&](ZtErr& error) { seen += error.Message(); });
    visitor.Hold();

    for (int frame = 0; frame < 5; ++frame)
        ZtWarning("%d\n", frame);
    visitor.Release();

    EXPECT_EQ(seen, "Warning: 0\nWarning: 1\nWarning: 2\nWarning: 3\n"
                    "Warning: 4\n");
}

TEST(ReusedError, DeletedInASignalIsFitForUse)
{
    std::string seen;
    Visitor visitor([&](ZtErr& error) {
        const zt_diag::SignalScope scope;
        seen += error.stream.str();
    });

    ZtWarning("one\n");
    ZtWarning("two\n");

    EXPECT_EQ(seen, "Warning: one\nWarning: two\n");
}

TEST(ReusedError, IsThereAtTheExit)
{
    const auto report = [] { ZtWarning("going\n"); };

    EXPECT_EXIT(
        {
            ZtWarning("leaving\n");
            std::atexit(report);
            std::exit(0);
        },
        testing::ExitedWithCode(0), "^Warning: leaving\nWarning: going\n$");
}

// --- what is not kept ------------------------------------------------------

TEST(ReusedError, KeepsNoFlags)
{
    ShowReports({[](std::ostringstream& stream) {
                     stream << std::hex << std::showbase << std::unitbuf;
                 },
                 [](std::ostringstream& stream) {
                     EXPECT_EQ(stream.flags(), std::ostringstream().flags());
                 }});
}

TEST(ReusedError, KeepsNoPrecision)
{
    ShowReports(
        {[](std::ostringstream& stream) { stream.precision(2); },
         [](std::ostringstream& stream) { EXPECT_EQ(stream.precision(), 6); }});
}

TEST(ReusedError, KeepsNoFill)
{
    ShowReports(
        {[](std::ostringstream& stream) { stream.fill('*'); },
         [](std::ostringstream& stream) { EXPECT_EQ(stream.fill(), ' '); }});
}

TEST(ReusedError, KeepsNoWidth)
{
    ShowReports(
        {[](std::ostringstream& stream) { stream.width(20); },
         [](std::ostringstream& stream) { EXPECT_EQ(stream.width(), 0); }});
}

TEST(ReusedError, KeepsNoLocale)
{
    const std::locale stars = StarLocale();

    ShowReports({[&](std::ostringstream& stream) { stream.imbue(stars); },
                 [](std::ostringstream& stream) {
                     EXPECT_EQ(stream.getloc(), std::locale());
                     stream << 0.5;
                     EXPECT_EQ(stream.str(), "Warning: frame 12\n0.5");
                 }});
}

TEST(ReusedError, KeepsNoLocaleOfItsBase)
{
    const std::locale stars = StarLocale();

    ShowReports({[&](std::ostringstream& stream) {
                     static_cast<std::ios_base&>(stream).imbue(stars);
                 },
                 [](std::ostringstream& stream) {
                     EXPECT_EQ(stream.getloc(), std::locale());
                 }});
}

TEST(ReusedError, KeepsNoLocaleOfItsBuffer)
{
    const std::locale stars = StarLocale();

    ShowReports(
        {[&](std::ostringstream& stream) { stream.rdbuf()->pubimbue(stars); },
         [](std::ostringstream& stream) {
             EXPECT_EQ(stream.rdbuf()->getloc(), std::locale());
         }});
}

TEST(ReusedError, HasTheLocaleOfTheProcessAsItIsNow)
{
    const Use classic = [](std::ostringstream& stream) {
        stream << 0.5;
        EXPECT_EQ(stream.str(), "Warning: frame 12\n0.5");
    };
    const Use starred = [](std::ostringstream& stream) {
        stream << 0.5;
        EXPECT_EQ(stream.str(), "Warning: frame 12\n0*5");
    };

    ShowReports({classic, classic});
    {
        const GlobalLocale stars(StarLocale());
        ShowReports({starred, starred});
    }
    ShowReports({classic, classic});
}

TEST(ReusedError, KeepsNoExceptionMask)
{
    ShowReports({[](std::ostringstream& stream) {
                     stream.exceptions(std::ios::failbit);
                 },
                 [](std::ostringstream& stream) {
                     EXPECT_EQ(stream.exceptions(), std::ios::goodbit);
                     EXPECT_NO_THROW(stream.setstate(std::ios::failbit));
                 }});
}

TEST(ReusedError, KeepsNoStateBit)
{
    for (const auto state :
         {std::ios::eofbit, std::ios::failbit, std::ios::badbit})
        ShowReports(
            {[&](std::ostringstream& stream) { stream.setstate(state); },
             [](std::ostringstream& stream) {
                 EXPECT_EQ(stream.rdstate(), std::ios::goodbit);
                 EXPECT_EQ(stream.str(), "Warning: frame 12\n");
             }});
}

TEST(ReusedError, KeepsNoTie)
{
    std::ostringstream tied;

    ShowReports(
        {[&](std::ostringstream& stream) { stream.tie(&tied); },
         [](std::ostringstream& stream) { EXPECT_EQ(stream.tie(), nullptr); }});
}

TEST(ReusedError, KeepsNoOtherBuffer)
{
    std::stringbuf other;

    ShowReports(
        {[&](std::ostringstream& stream) { Base(stream).rdbuf(&other); },
         [](std::ostringstream& stream) {
             EXPECT_EQ(Base(stream).rdbuf(), stream.rdbuf());
             stream << 'x';
             EXPECT_EQ(stream.str(), "Warning: frame 12\nx");
         }});
    EXPECT_EQ(other.str(), "");
}

TEST(ReusedError, KeepsNoArrayThatItsBufferWroteTo)
{
    char array[64] = {};

    ShowReports({[&](std::ostringstream& stream) {
                     stream.rdbuf()->pubsetbuf(array, sizeof array);
                     stream << "x";
                     std::memset(array, 0, sizeof array);
                 },
                 [](std::ostringstream& stream) {
                     EXPECT_EQ(stream.str(), "Warning: frame 12\n");
                 }});

    EXPECT_TRUE(std::all_of(array, array + sizeof array,
                            [](char c) { return c == '\0'; }));
}

TEST(ReusedError, KeepsNoModeOfABufferThatWasMovedIn)
{
    ShowReports({[](std::ostringstream& stream) {
                     stream = std::ostringstream("x", std::ios::ate);
                 },
                 [](std::ostringstream& stream) {
                     stream.str("abc");
                     stream << 'd';
                     EXPECT_EQ(stream.str(), "dbc");
                 }});
}

TEST(ReusedError, KeepsNothingOfAStreamThatWasSwapped)
{
    std::ostringstream other;
    other << std::hex << "theirs";

    ShowReports({[&](std::ostringstream& stream) { stream.swap(other); },
                 [](std::ostringstream& stream) {
                     EXPECT_EQ(stream.flags(), std::ostringstream().flags());
                     EXPECT_EQ(stream.str(), "Warning: frame 12\n");
                 }});

    EXPECT_EQ(other.str(), "Warning: frame 12\n");
}

TEST(ReusedError, KeepsNoPositionAndNoText)
{
    const Use untouched = [](std::ostringstream& stream) {
        EXPECT_EQ(stream.tellp(), std::streampos(18));
        EXPECT_EQ(stream.str(), "Warning: frame 12\n");
    };

    ShowReports({[](std::ostringstream& stream) { stream.seekp(0); }, untouched,
                 [](std::ostringstream& stream) { stream << "a longer text"; },
                 untouched, [](std::ostringstream& stream) { stream.str(""); },
                 untouched,
                 [](std::ostringstream& stream) { stream.write("\0x", 2); },
                 untouched,
                 [](std::ostringstream& stream) {
                     const std::string taken = std::move(stream).str();
                     EXPECT_EQ(taken, "Warning: frame 12\n");
                 },
                 untouched});
}

TEST(ReusedError, KeepsNoCallbacks)
{
    events = 0;

    ShowReports({[](std::ostringstream& stream) {
                     stream.register_callback(CountEvent, 1);
                 },
                 [](std::ostringstream& stream) {
                     EXPECT_EQ(events, 1); // the end of the stream before
                     stream.imbue(std::locale::classic());
                     EXPECT_EQ(events, 1);
                 }});
}

TEST(ReusedError, KeepsNoWordsOfTheHost)
{
    int object = 0;
    for (int made = 0; made < 20; ++made) {
        const int word = std::ios_base::xalloc();
        const Use clear = [=](std::ostringstream& stream) {
            EXPECT_EQ(stream.iword(word), 0) << word;
            EXPECT_EQ(stream.pword(word), nullptr) << word;
        };

        ShowReports(
            {[=](std::ostringstream& stream) { stream.iword(word) = 5; }, clear,
             [=, &object](std::ostringstream& stream) {
                 stream.pword(word) = &object;
             },
             clear});
    }
}

TEST(ReusedError, KeepsNothingThatWasCopiedFromAnotherStream)
{
    std::ostringstream other;
    other << std::hex;
    other.register_callback(CountEvent, 1);

    ShowReports({[&](std::ostringstream& stream) { stream.copyfmt(other); },
                 [](std::ostringstream& stream) {
                     EXPECT_EQ(stream.flags(), std::ostringstream().flags());
                     events = 0;
                     stream.imbue(std::locale::classic());
                     EXPECT_EQ(events, 0);
                 }});
}

TEST(ReusedError, KeepsNoGreatAmountOfMemory)
{
    ShowReports({[](std::ostringstream& stream) {
        stream << std::string(100000, 'x');
    }});

    EXPECT_FALSE(NextReportIsMadeOfAnother());
}

// --- memory ----------------------------------------------------------------

TEST(ReusedError, WithoutMemoryForItsTextIsPrintedStraightAway)
{
    const std::string text(2000, 'x');
    CapturedStderr captured;
    ShowReports({[](std::ostringstream&) {}});

    {
        Visitor visitor([](ZtErr&) { FAIL() << "it has not all of its text"; });
        FailingMemory none;
        ZtErr::Check(0, text.c_str(), 4);
    }

    EXPECT_EQ(captured.Text(), "Error: " + text + "\n");
}
