#include "platform/files.h"

#include <csignal>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <string>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "support/FaultyFiles.h"
#include "support/InAChild.h"
#include "support/TempDir.h"

namespace {

using zt_platform::Access;
using zt_platform::Files;
using zt_platform::InputFile;
using zt_platform::OutputFile;

bool Accessible(const std::string& path, Access access)
{
    return Files::current().accessible(path.c_str(), access);
}

std::string ReadAt(const InputFile& file, std::uint64_t offset,
                   std::size_t count)
{
    std::string bytes(count, '.');
    bytes.resize(file.read_at(offset, bytes.data(), count));
    return bytes;
}

TEST(Files, AccessIsWhatTheModeBitsSay)
{
    TempDir directory;
    std::string path = directory.Write("a", "");

    EXPECT_TRUE(Accessible(path, Access::Exists));
    EXPECT_TRUE(Accessible(path, Access::Read));
    EXPECT_TRUE(Accessible(path, Access::Write));
    EXPECT_FALSE(Accessible(path, Access::Execute));
    chmod(path.c_str(), 0700);
    EXPECT_TRUE(Accessible(path, Access::Execute));
}

TEST(Files, NothingMayBeDoneToWhatIsNotThere)
{
    TempDir directory;

    for (Access access :
         {Access::Exists, Access::Read, Access::Write, Access::Execute}) {
        EXPECT_FALSE(Accessible(directory.Path("none"), access));
        EXPECT_FALSE(Files::current().accessible(nullptr, access));
    }
}

TEST(Files, ATestInstallsItsOwnAndRestoresTheSystems)
{
    FaultyFiles mine;

    EXPECT_EQ(&Files::current(), &mine);
    EXPECT_EQ(Files::install(nullptr), &mine);
    EXPECT_NE(&Files::current(), &mine);
    Files::install(&mine);
}

TEST(InputFile, BytesAreReadFromAnyOffset)
{
    TempDir directory;
    InputFile file(directory.Write("a", "0123456789").c_str());

    ASSERT_TRUE(file.is_open());
    EXPECT_EQ(file.size(), 10u);
    EXPECT_EQ(ReadAt(file, 0, 10), "0123456789");
    EXPECT_EQ(ReadAt(file, 4, 3), "456");
    EXPECT_EQ(ReadAt(file, 8, 5), "89");
    EXPECT_EQ(ReadAt(file, 10, 5), "");
    EXPECT_EQ(ReadAt(file, ~std::uint64_t{0} - 2, 5), "");
}

TEST(InputFile, WhatIsNotThereIsNotOpen)
{
    TempDir directory;

    EXPECT_FALSE(InputFile(directory.Path("none").c_str()).is_open());
    EXPECT_FALSE(InputFile(nullptr).is_open());
    EXPECT_EQ(InputFile(nullptr).size(), 0u);
}

TEST(InputFile, WhatIsNoRegularFileOpensAndReadsAsEmptyInAChild)
{
    TempDir directory;
    std::string fifo = directory.Path("fifo");
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    RunInAChild([&] {
        for (const std::string& path :
             {directory.Path(""), fifo, std::string("/dev/zero")}) {
            InputFile file(path.c_str());

            EXPECT_TRUE(file.is_open()) << path;
            EXPECT_EQ(file.size(), 0u);
            EXPECT_EQ(ReadAt(file, 0, 5), "");
        }
    });
}

TEST(InputFile, ShortReadsAreCompletedAndInterruptionsRetried)
{
    TempDir directory;
    std::string path = directory.Write("a", "0123456789");
    FaultyFiles files;
    files.most_at_once = 1;
    files.interrupts = true;
    InputFile file(path.c_str());

    EXPECT_EQ(ReadAt(file, 2, 100), "23456789");
}

TEST(InputFile, AFaultEndsTheReading)
{
    TempDir directory;
    std::string path = directory.Write("a", "0123456789");
    FaultyFiles files;
    files.read_ends = 6;
    InputFile file(path.c_str());

    EXPECT_EQ(ReadAt(file, 2, 100), "2345");
}

TEST(InputFile, AFileThatShrinksEndsTheReading)
{
    TempDir directory;
    std::string path = directory.Write("a", "0123456789");
    InputFile file(path.c_str());
    std::filesystem::resize_file(path, 4);

    EXPECT_EQ(ReadAt(file, 2, 8), "23");
}

TEST(InputFile, ItIsClosedAtTheEndUnlessItWasReleased)
{
    TempDir directory;
    std::string path = directory.Write("a", "x");
    FaultyFiles files;
    {
        InputFile file(path.c_str());
        EXPECT_EQ(files.open_count, 1);
    }
    EXPECT_EQ(files.open_count, 0);

    int handle = -1;
    {
        InputFile file(path.c_str());
        handle = file.release();
        EXPECT_FALSE(file.is_open());
        EXPECT_EQ(file.size(), 0u);
    }
    EXPECT_EQ(files.open_count, 1);
    EXPECT_TRUE(files.close(handle));
}

TEST(InputFile, ItIsNotInheritedByOtherPrograms)
{
    TempDir directory;
    InputFile file(directory.Write("a", "x").c_str());

    int handle = file.release();

    EXPECT_TRUE(fcntl(handle, F_GETFD) & FD_CLOEXEC);
    Files::current().close(handle);
}

TEST(OutputFile, BytesAreWrittenAtAnyOffset)
{
    TempDir directory;
    OutputFile file(directory.Path("a").c_str());

    EXPECT_TRUE(file.is_open());
    EXPECT_TRUE(file.write_at(5, "567", 3));
    EXPECT_TRUE(file.write_at(0, "012", 3));
    EXPECT_TRUE(file.close());

    EXPECT_FALSE(file.is_open());
    EXPECT_EQ(directory.Read("a"), std::string("012\0\000567", 8));
}

TEST(OutputFile, AFileThatIsThereIsEmptied)
{
    TempDir directory;
    OutputFile file(directory.Write("a", "before").c_str());

    EXPECT_TRUE(file.close());

    EXPECT_EQ(directory.Read("a"), "");
}

TEST(OutputFile, WhatCannotBeMadeIsNotOpen)
{
    TempDir directory;

    EXPECT_FALSE(OutputFile(directory.Path("none/a").c_str()).is_open());
    EXPECT_FALSE(OutputFile(directory.Path("").c_str()).is_open());
    OutputFile nowhere(nullptr);
    EXPECT_FALSE(nowhere.is_open());
    EXPECT_FALSE(nowhere.write_at(0, "0", 1));
    EXPECT_FALSE(nowhere.close());
}

TEST(OutputFile, ShortWritesAreCompletedAndInterruptionsRetried)
{
    TempDir directory;
    FaultyFiles files;
    files.most_at_once = 1;
    files.interrupts = true;
    OutputFile file(directory.Path("a").c_str());

    EXPECT_TRUE(file.write_at(0, "0123456789", 10));
    EXPECT_TRUE(file.close());
    EXPECT_EQ(directory.Read("a"), "0123456789");
}

TEST(OutputFile, AFaultIsRememberedUntilTheClose)
{
    TempDir directory;
    FaultyFiles files;
    files.bytes_left = 4;
    OutputFile file(directory.Path("a").c_str());

    EXPECT_FALSE(file.write_at(0, "0123456789", 10));
    files.bytes_left = FaultyFiles::never;
    EXPECT_FALSE(file.write_at(4, "4", 1));
    EXPECT_FALSE(file.close());

    EXPECT_EQ(directory.Read("a"), "0123");
    EXPECT_EQ(files.open_count, 0);
}

TEST(OutputFile, AFailingCloseIsAFault)
{
    TempDir directory;
    FaultyFiles files;
    files.close_fails = true;
    OutputFile file(directory.Path("a").c_str());

    EXPECT_TRUE(file.write_at(0, "0", 1));
    EXPECT_FALSE(file.close());
}

TEST(OutputFile, ItIsClosedAtTheEnd)
{
    TempDir directory;
    FaultyFiles files;
    {
        OutputFile file(directory.Path("a").c_str());
        EXPECT_EQ(files.open_count, 1);
    }
    EXPECT_EQ(files.open_count, 0);
}

TEST(OutputFile, AFullDiskIsAFault)
{
    OutputFile file("/dev/full");

    EXPECT_TRUE(file.is_open());
    EXPECT_FALSE(file.write_at(0, "0", 1));
    EXPECT_FALSE(file.close());
}

bool Pending(int signal)
{
    sigset_t pending;
    sigpending(&pending);
    return sigismember(&pending, signal) == 1;
}

TEST(OutputFile, ALimitOnTheLengthIsAFaultAndNoSignalInAChild)
{
    TempDir directory;
    std::string path = directory.Path("a");
    RunInAChild([&] {
        rlimit short_files = {10, 10};
        setrlimit(RLIMIT_FSIZE, &short_files);
        OutputFile file(path.c_str());

        EXPECT_FALSE(file.write_at(0, "0123456789ABCDEF", 16));
        EXPECT_FALSE(file.close());
        EXPECT_FALSE(Pending(SIGXFSZ));
    });
    EXPECT_EQ(directory.Read("a"), "0123456789");
}

TEST(OutputFile, ASignalThatWasPendingBeforeStaysPendingInAChild)
{
    TempDir directory;
    std::string path = directory.Path("a");
    RunInAChild([&] {
        sigset_t held;
        sigemptyset(&held);
        sigaddset(&held, SIGXFSZ);
        sigprocmask(SIG_BLOCK, &held, nullptr);
        raise(SIGXFSZ);
        OutputFile file(path.c_str());

        EXPECT_TRUE(file.write_at(0, "0", 1));

        EXPECT_TRUE(Pending(SIGXFSZ));
        sigset_t blocked;
        sigprocmask(SIG_BLOCK, nullptr, &blocked);
        EXPECT_TRUE(sigismember(&blocked, SIGXFSZ));
    });
}

TEST(OutputFile, APipeIsAFaultAndNeverAWaitInAChild)
{
    TempDir directory;
    std::string path = directory.Path("fifo");
    ASSERT_EQ(mkfifo(path.c_str(), 0600), 0);
    RunInAChild([&] {
        EXPECT_FALSE(OutputFile(path.c_str()).is_open());

        int reader = open(path.c_str(), O_RDONLY | O_NONBLOCK);
        OutputFile file(path.c_str());
        EXPECT_TRUE(file.is_open());
        EXPECT_FALSE(file.write_at(0, "0", 1));
        close(reader);
    });
}

} // namespace
