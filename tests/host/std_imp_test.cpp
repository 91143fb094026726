#include "ZT/std_imp.h"

#include <string>

#include <gtest/gtest.h>

namespace {

std::string story;

class Implementation : public ZtStdImp
{
public:
    explicit Implementation(const char* own_name) : name(own_name)
    {
        story += "+" + name;
    }
    ~Implementation() override { story += "-" + name; }

private:
    std::string name;
};

} // namespace

TEST(ZtStdImp, ThereIsNoneAtFirst)
{
    EXPECT_EQ(ZtStdImp::theImp, nullptr);
}

TEST(ZtStdImp, TheLatestWinsAndTheOneBeforeIsDeleted)
{
    story.clear();

    ZtStdImp* first = new Implementation("first");
    EXPECT_EQ(ZtStdImp::theImp, first);
    ZtStdImp* second = new Implementation("second");

    EXPECT_EQ(ZtStdImp::theImp, second);
    EXPECT_EQ(story, "+first-first+second");
    delete second;
}

TEST(ZtStdImp, DeletingItLeavesNone)
{
    ZtStdImp* only = new Implementation("only");

    delete only;

    EXPECT_EQ(ZtStdImp::theImp, nullptr);
}
