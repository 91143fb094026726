#include "support/TempDir.h"

#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdlib.h>

#include <gtest/gtest.h>

TempDir::TempDir()
{
    std::string pattern =
        (std::filesystem::temp_directory_path() / "zt_test_XXXXXX").string();
    directory = mkdtemp(pattern.data()) ? pattern : std::string();
    EXPECT_FALSE(directory.empty());
}

TempDir::~TempDir()
{
    std::error_code ignored;
    if (!directory.empty())
        std::filesystem::remove_all(directory, ignored);
}

std::string TempDir::Path(const std::string& name) const
{
    return directory + "/" + name;
}

std::string TempDir::Write(const std::string& name,
                           const std::string& bytes) const
{
    std::ofstream out(Path(name), std::ios::binary);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    out.close();
    EXPECT_TRUE(out.good()) << name;
    return Path(name);
}

std::string TempDir::Read(const std::string& name) const
{
    std::ifstream in(Path(name), std::ios::binary);
    EXPECT_TRUE(in.is_open()) << name;
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}
