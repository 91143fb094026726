#include "prompt/history_file.h"
#include "support/TempDir.h"

#include <cstdlib>
#include <filesystem>
#include <optional>

#include <gtest/gtest.h>

using ztsh::HistoryFile;
using ztsh::HistoryPath;

namespace {

using Lines = std::vector<std::string>;

/// Sets an environment variable for a while; null unsets it.
class Environment
{
public:
    Environment(const char* own_name, const char* value) : name(own_name)
    {
        if (const char* present = std::getenv(name))
            former = present;
        if (value)
            setenv(name, value, 1);
        else
            unsetenv(name);
    }
    ~Environment()
    {
        if (former)
            setenv(name, former->c_str(), 1);
        else
            unsetenv(name);
    }

private:
    const char* name;
    std::optional<std::string> former;
};

int ModeOf(const std::string& name)
{
    return static_cast<int>(std::filesystem::status(name).permissions());
}

} // namespace

TEST(HistoryPath, IsUnderTheStateDirectory)
{
    Environment state("XDG_STATE_HOME", "/state");
    Environment home("HOME", "/home/me");

    EXPECT_EQ(HistoryPath(), "/state/ztsh/history");
}

TEST(HistoryPath, IsUnderTheHomeDirectoryOtherwise)
{
    Environment home("HOME", "/home/me");
    {
        Environment state("XDG_STATE_HOME", nullptr);
        EXPECT_EQ(HistoryPath(), "/home/me/.local/state/ztsh/history");
    }
    Environment state("XDG_STATE_HOME", "relative");
    EXPECT_EQ(HistoryPath(), "/home/me/.local/state/ztsh/history");
}

TEST(HistoryPath, IsNowhereWithoutEither)
{
    Environment state("XDG_STATE_HOME", nullptr);
    Environment home("HOME", nullptr);

    EXPECT_EQ(HistoryPath(), "");
}

TEST(HistoryFile, MakesFileAndDirectoriesForTheirOwnerOnly)
{
    TempDir dir;
    HistoryFile file(dir.Path("state/ztsh/history"));

    file.Append("Echo one");
    file.Append("Echo two");

    EXPECT_EQ(dir.Read("state/ztsh/history"), "Echo one\nEcho two\n");
    EXPECT_EQ(ModeOf(dir.Path("state/ztsh/history")), 0600);
    EXPECT_EQ(ModeOf(dir.Path("state/ztsh")), 0700);
    EXPECT_EQ(ModeOf(dir.Path("state")), 0700);
    EXPECT_EQ(file.Load(), (Lines{"Echo one", "Echo two"}));
}

TEST(HistoryFile, ClosesAFileThatIsOpenToOthers)
{
    TempDir dir;
    std::string path = dir.Write("history", "Echo one\n");
    std::filesystem::permissions(path, std::filesystem::perms(0644));

    HistoryFile(path).Append("Echo two");

    EXPECT_EQ(ModeOf(path), 0600);
}

TEST(HistoryFile, KeepsTheNewestLines)
{
    TempDir dir;
    std::string lines;
    for (std::size_t i = 0; i < HistoryFile::most_lines + 5; ++i)
        lines += std::to_string(i) + "\n";
    std::string path = dir.Write("history", lines);

    Lines kept = HistoryFile(path).Load();

    ASSERT_EQ(kept.size(), HistoryFile::most_lines);
    EXPECT_EQ(kept.front(), "5");
    EXPECT_EQ(kept.back(), std::to_string(HistoryFile::most_lines + 4));
    EXPECT_EQ(HistoryFile(path).Load(), kept);
}

TEST(HistoryFile, DoesNothingWhereNoFileCanBe)
{
    TempDir dir;
    dir.Write("file", "");

    HistoryFile("").Append("x");
    HistoryFile(dir.Path("file/history")).Append("x");
    HistoryFile(dir.Path("")).Append("x");

    EXPECT_EQ(HistoryFile("").Load(), Lines{});
    EXPECT_EQ(HistoryFile(dir.Path("none")).Load(), Lines{});
    EXPECT_EQ(dir.Read("file"), "");
}
