#include "image/file_window.h"

#include <random>

#include <gtest/gtest.h>

#include "image/sgi_bytes.h"
#include "support/FaultyFiles.h"
#include "support/TempDir.h"

namespace {

/// Bytes that are not the same wherever one looks.
std::string Varied(std::size_t count)
{
    std::mt19937 random(19);
    std::string bytes;
    while (bytes.size() < count)
        bytes += static_cast<char>(random());
    return bytes;
}

std::string Seen(zt_image::FileWindow& window, std::uint64_t offset,
                 std::size_t count)
{
    const unsigned char* bytes = window.at(offset, count);
    EXPECT_NE(bytes, nullptr);
    return bytes ? std::string(bytes, bytes + count) : std::string();
}

TEST(FileWindow, AnyStretchIsThatOfTheFileAndThenZeros)
{
    TempDir directory;
    std::string bytes = Varied(900000);
    zt_platform::InputFile file(directory.Write("a", bytes).c_str());
    zt_image::FileWindow window(file);
    std::string padded = bytes + Fill(400000, 0);
    std::mt19937 random(20);
    std::size_t at = 0;
    for (int i = 0; i < 5000; ++i) {
        std::size_t count =
            random() % 50 == 0 ? random() % 300000 : random() % 3000;
        if (random() % 20 == 0)
            at = random() % 950000;
        if (at + count > padded.size())
            at = 0;

        ASSERT_EQ(Seen(window, at, count), padded.substr(at, count)) << i;
        at += count;
    }
}

TEST(FileWindow, OffsetsFarBeyondTheEndAreZeros)
{
    TempDir directory;
    zt_platform::InputFile file(directory.Write("a", "abc").c_str());
    zt_image::FileWindow window(file);

    EXPECT_EQ(Seen(window, 2, 3), "c" + Fill(2, 0));
    EXPECT_EQ(Seen(window, 0xFFFFFFFF, 4), Fill(4, 0));
    EXPECT_EQ(Seen(window, ~std::uint64_t{0} - 100000, 4), Fill(4, 0));
    EXPECT_EQ(Seen(window, 0, 2), "ab");
}

TEST(FileWindow, NothingIsAStretchToo)
{
    TempDir directory;
    zt_platform::InputFile file(directory.Write("a", "").c_str());
    zt_image::FileWindow window(file);

    EXPECT_NE(window.at(0, 0), nullptr);
}

TEST(FileWindow, ReadingInOrderTakesFewReads)
{
    TempDir directory;
    std::string path = directory.Write("a", Varied(2000000));
    FaultyFiles files;
    zt_platform::InputFile file(path.c_str());
    zt_image::FileWindow window(file);

    for (std::size_t at = 0; at < 2000000; at += 100)
        window.at(at, 100);

    EXPECT_LE(files.reads, 16);
}

TEST(FileWindow, JumpingReadsLittle)
{
    TempDir directory;
    std::string path = directory.Write("a", Varied(2000000));
    FaultyFiles files;
    zt_platform::InputFile file(path.c_str());
    zt_image::FileWindow window(file);

    for (std::size_t at = 0; at < 1000000; at += 10000) {
        window.at(at, 3);
        window.at(1990000 - at, 3);
    }

    EXPECT_LE(files.bytes_read, 201u * 4096u);
}

} // namespace
