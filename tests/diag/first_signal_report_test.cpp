#include <gtest/gtest.h>

#include "ZT/error.h"
#include "diag/signal_report.h"
#include "support/CapturedStderr.h"

namespace {

constinit zt_diag::SignalReport report("Error: ", "first.\n", 4);

// One test only: the first report of a process makes the default handler.
TEST(FirstReportInASignal, MakesTheDefaultHandler)
{
    CapturedStderr captured;
    report.reserve(1);
    EXPECT_EQ(ZtErrHandler::handlerStack, nullptr);

    {
        const zt_diag::SignalScope scope;
        report.post();
    }

    ASSERT_NE(ZtErrHandler::handlerStack, nullptr);
    EXPECT_EQ(ZtErrHandler::handlerStack->next, nullptr);
    EXPECT_EQ(captured.Text(), "Error: first.\n");
    ZtWarning("second\n");
    EXPECT_EQ(captured.Text(), "Error: first.\nWarning: second\n");
}

} // namespace
