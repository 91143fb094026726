// Reports and class records before `main`: an object that is made before any
// other of the program uses them, when not even the standard streams are ready.

#include "ZT/error.h"

#include <cstring>
#include <iostream>

#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

namespace {

/// A class of a host's, declared like the library's own.
class Hosted : public KvoNamedObject
{
public:
    KVO_DECLARE_CLASS_INFO();
};

struct Early
{
    bool named_can_cast = false;
    bool names_are_there = false;
    bool hosts_class_is_there = false;
    bool levels_are_there = false;
    bool output_is_there = false;
    char printed[64] = "";

    Early()
    {
        named_can_cast =
            KvoObject::classInfo.CanCast(&KvoNamedObject::classInfo) &&
            !KvoNamedObject::classInfo.CanCast(&KvoObject::classInfo);
        KvoNamedObject object;
        names_are_there =
            std::strcmp(object.ClassName(), "KvoNamedObject") == 0 &&
            std::strcmp(object.name, "NoName") == 0;
        Hosted hosted;
        hosts_class_is_there = std::strcmp(hosted.ClassName(), "Hosted") == 0 &&
                               KvoObject::classInfo.Cast(&hosted) == &hosted;
        levels_are_there =
            ZtErrHandler::outputLevel == 3 && ZtErrHandler::abortLevel == 5;
        output_is_there = ZtErrHandler::output == &std::cerr;
        report();
    }

    void report()
    {
        const int file = memfd_create("early", 0);
        const int kept = dup(2);
        dup2(file, 2);
        ZtDebug("dropped\n");
        ZtWarning("early %d\n", 1);
        dup2(kept, 2);
        close(kept);
        const ssize_t bytes = pread(file, printed, sizeof printed - 1, 0);
        printed[bytes < 0 ? 0 : bytes] = '\0';
        close(file);
    }
};

__attribute__((init_priority(101))) Early early;

KVO_DEFINE_CLASS_INFO(Hosted, &KvoNamedObject::classInfo);

} // namespace

TEST(BeforeMain, ClassRecordsAreReady)
{
    EXPECT_TRUE(early.named_can_cast);
    EXPECT_TRUE(early.names_are_there);
    EXPECT_TRUE(early.hosts_class_is_there);
}

TEST(BeforeMain, LevelsAndOutputAreReady)
{
    EXPECT_TRUE(early.levels_are_there);
    EXPECT_TRUE(early.output_is_there);
}

TEST(BeforeMain, ReportsArePrinted)
{
    EXPECT_STREQ(early.printed, "Warning: early 1\n");
    EXPECT_EQ(ZtErr::count, 2);
}
