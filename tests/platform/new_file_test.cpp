#include "platform/new_file.h"

#include <filesystem>

#include <gtest/gtest.h>

#include "support/FaultyFiles.h"
#include "support/TempDir.h"

namespace {

using zt_platform::NewFile;

std::ptrdiff_t EntriesOf(const TempDir& directory)
{
    return std::distance(
        std::filesystem::directory_iterator(directory.Path("")),
        std::filesystem::directory_iterator());
}

TEST(new_file, TheOldFileStandsUntilTheNewOneIsFinished)
{
    const TempDir directory;
    const std::string path = directory.Write("a", "old");
    NewFile file(path.c_str());

    ASSERT_TRUE(file.is_open());
    EXPECT_TRUE(file.append("ne", 2));
    EXPECT_TRUE(file.append("w", 1));
    EXPECT_EQ(directory.Read("a"), "old");
    EXPECT_TRUE(file.finish());

    EXPECT_EQ(directory.Read("a"), "new");
    EXPECT_EQ(EntriesOf(directory), 1);
}

TEST(new_file, WhatIsNotFinishedIsRemoved)
{
    const TempDir directory;
    const std::string path = directory.Write("a", "old");
    {
        NewFile file(path.c_str());
        EXPECT_TRUE(file.append("new", 3));
        EXPECT_EQ(EntriesOf(directory), 2);
    }

    EXPECT_EQ(directory.Read("a"), "old");
    EXPECT_EQ(EntriesOf(directory), 1);
}

TEST(new_file, TwoAtATimeDoNotMeet)
{
    const TempDir directory;
    NewFile first(directory.Path("a").c_str());
    NewFile second(directory.Path("a").c_str());
    NewFile other(directory.Path("b").c_str());

    EXPECT_TRUE(first.append("1", 1) && second.append("2", 1) &&
                other.append("3", 1));
    EXPECT_TRUE(second.finish() && first.finish() && other.finish());

    EXPECT_EQ(directory.Read("a"), "1");
    EXPECT_EQ(directory.Read("b"), "3");
    EXPECT_EQ(EntriesOf(directory), 2);
}

TEST(new_file, AFileFinishesOnce)
{
    const TempDir directory;
    NewFile file(directory.Path("a").c_str());

    EXPECT_TRUE(file.finish());
    EXPECT_FALSE(file.finish());
    EXPECT_FALSE(file.append("x", 1));

    EXPECT_EQ(directory.Read("a"), "");
}

TEST(new_file, PlacesThatTakeNoFileDoNotOpen)
{
    const TempDir directory;

    EXPECT_FALSE(NewFile(nullptr).is_open());
    EXPECT_FALSE(NewFile("").is_open());
    EXPECT_FALSE(NewFile(directory.Path("").c_str()).is_open());
    EXPECT_FALSE(NewFile(directory.Path("x/y").c_str()).is_open());
    EXPECT_FALSE(NewFile(directory.Path("x/").c_str()).is_open());
    EXPECT_EQ(EntriesOf(directory), 0);
}

TEST(new_file, ALongNameIsNoObstacle)
{
    const TempDir directory;
    const std::string name(255, 'n');
    NewFile file(directory.Path(name).c_str());

    EXPECT_TRUE(file.append("x", 1) && file.finish());

    EXPECT_EQ(directory.Read(name), "x");
}

TEST(new_file, AFaultInBetweenCountsForTheWhole)
{
    const TempDir directory;
    FaultyFiles files;
    files.bytes_left = 3;
    NewFile file(directory.Path("a").c_str());

    EXPECT_TRUE(file.append("abc", 3));
    EXPECT_FALSE(file.append("d", 1));
    files.bytes_left = FaultyFiles::never;
    EXPECT_FALSE(file.append("e", 1));
    EXPECT_FALSE(file.finish());

    EXPECT_EQ(EntriesOf(directory), 0);
}

TEST(new_file, NamesThatAreTakenAreTriedNoMoreThanAThousandTimes)
{
    const TempDir directory;
    for (int number = 0; number < 1000; ++number)
        directory.Write(".zt_new_" + std::to_string(number), "");

    EXPECT_FALSE(NewFile(directory.Path("a").c_str()).is_open());

    std::filesystem::remove(directory.Path(".zt_new_999"));
    EXPECT_TRUE(NewFile(directory.Path("a").c_str()).is_open());
}

} // namespace
