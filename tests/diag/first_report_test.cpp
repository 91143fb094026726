// The first report of a process: it needs a process of its own.

#include "ZT/error.h"

#include <gtest/gtest.h>

#include "support/CapturedStderr.h"

TEST(FirstReport, MakesTheDefaultHandlerAndPrints)
{
    ASSERT_EQ(ZtErrHandler::handlerStack, nullptr);
    ASSERT_EQ(ZtErr::count, 0);
    CapturedStderr captured;

    ZtWarning("x %d\n", 1);

    EXPECT_EQ(captured.Text(), "Warning: x 1\n");
    ASSERT_NE(ZtErrHandler::handlerStack, nullptr);
    EXPECT_EQ(ZtErrHandler::handlerStack->next, nullptr);
    EXPECT_EQ(ZtErrHandler::handlerStack->held, 0);
    EXPECT_EQ(ZtErr::count, 1);
}

TEST(FirstReport, AHandlerOnAnEmptyStackIsTheBottomAndPrints)
{
    delete ZtErrHandler::handlerStack;
    ASSERT_EQ(ZtErrHandler::handlerStack, nullptr);
    ZtErrHandler bottom;
    CapturedStderr captured;

    ZtWarning("x\n");
    ZtDebug("y\n");

    EXPECT_EQ(bottom.next, nullptr);
    EXPECT_EQ(ZtErrHandler::handlerStack, &bottom);
    EXPECT_EQ(captured.Text(), "Warning: x\n");
}

TEST(FirstReport, OneThatIsDroppedMakesTheDefaultHandlerToo)
{
    delete ZtErrHandler::handlerStack;
    ASSERT_EQ(ZtErrHandler::handlerStack, nullptr);

    ZtDebug("dropped\n");

    EXPECT_NE(ZtErrHandler::handlerStack, nullptr);
}
