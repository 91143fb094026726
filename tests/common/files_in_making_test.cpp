#include "common/files.h"

#include <filesystem>
#include <fstream>
#include <sys/stat.h>

#include <gtest/gtest.h>

#include "support/TempDir.h"

using zt_tools::FileInMaking;
using zt_tools::WhyNotReadable;
using zt_tools::WhyNotWritable;

namespace {

void Put(const std::string& name, const std::string& text)
{
    std::ofstream(name) << text;
}

std::ptrdiff_t FilesIn(const TempDir& directory)
{
    std::filesystem::directory_iterator files(directory.Path(""));
    return std::distance(begin(files), end(files));
}

} // namespace

TEST(FileInMaking, IsThereOnlyWhenItIsComplete)
{
    TempDir dir;
    std::string name = dir.Path("a");
    {
        FileInMaking making(name);
        Put(making.Name(), "new");
        EXPECT_FALSE(std::filesystem::exists(name));
        EXPECT_EQ(making.PutInPlace(), "");
    }
    EXPECT_EQ(dir.Read("a"), "new");
    EXPECT_EQ(FilesIn(dir), 1);
}

TEST(FileInMaking, WhatIsNotPutInPlaceIsRemoved)
{
    TempDir dir;
    std::string name = dir.Write("a", "old");
    {
        FileInMaking making(name);
        Put(making.Name(), "new");
    }
    EXPECT_EQ(dir.Read("a"), "old");
    EXPECT_EQ(FilesIn(dir), 1);
}

TEST(FileInMaking, SeveralForOnePlaceDoNotMeet)
{
    TempDir dir;
    std::string name = dir.Path("a");
    FileInMaking first(name);
    FileInMaking second(name);

    EXPECT_NE(first.Name(), second.Name());
}

TEST(FileInMaking, SaysWhyItCannotBePutInPlace)
{
    TempDir dir;
    FileInMaking making(dir.Path("a"));

    EXPECT_EQ(making.PutInPlace(), "No such file or directory");
}

TEST(WhyNotWritable, AnOrdinaryFileIsWhetherItIsThereOrNot)
{
    TempDir dir;

    EXPECT_EQ(WhyNotWritable(dir.Path("a")), "");
    EXPECT_EQ(WhyNotWritable(dir.Write("b", "")), "");
}

TEST(WhyNotWritable, OtherThingsAreNot)
{
    TempDir dir;
    std::string pipe = dir.Path("pipe");
    ASSERT_EQ(mkfifo(pipe.c_str(), 0666), 0);

    EXPECT_EQ(WhyNotWritable(dir.Path("")), "it is a directory");
    EXPECT_EQ(WhyNotWritable(pipe), "it is a pipe");
    EXPECT_EQ(WhyNotWritable("/dev/null"), "it is a device");
    EXPECT_EQ(WhyNotWritable(dir.Path("no/a")),
              "its directory: No such file or directory");
}

TEST(WhyNotReadable, OnlyAnOrdinaryFileIs)
{
    TempDir dir;

    EXPECT_EQ(WhyNotReadable(dir.Write("b", "")), "");
    EXPECT_EQ(WhyNotReadable(dir.Path("a")), "No such file or directory");
    EXPECT_EQ(WhyNotReadable(dir.Path("")), "it is a directory");
    EXPECT_EQ(WhyNotReadable("/dev/zero"), "it is a device");
}
