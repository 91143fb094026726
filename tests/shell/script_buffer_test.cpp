#include "script/script_buffer.h"
#include "support/TempDir.h"

#include <fcntl.h>
#include <istream>
#include <unistd.h>

#include <gtest/gtest.h>

using ztsh::ScriptBuffer;

namespace {

/// A file that is open for reading.
class OpenFile
{
public:
    explicit OpenFile(const std::string& bytes)
        : descriptor(open(dir.Write("script", bytes).c_str(), O_RDONLY))
    {}
    ~OpenFile() { close(descriptor); }

    TempDir dir;
    int descriptor;
};

std::string AllOf(std::streambuf& buffer)
{
    std::string text;
    for (int c; (c = buffer.sbumpc()) != std::streambuf::traits_type::eof();)
        text += static_cast<char>(c);
    return text;
}

/// Lines of 50 bytes, more than one block of them.
std::string ManyLines(int count)
{
    std::string text;
    for (int i = 0; i < count; ++i)
        text += std::string(49, static_cast<char>('a' + i % 26)) + "\n";
    return text;
}

} // namespace

TEST(ScriptBuffer, GivesTheBytesOfAFile)
{
    std::string bytes = ManyLines(5000) + std::string("\0\xFF", 2);
    OpenFile file(bytes);
    ScriptBuffer buffer(file.descriptor);

    EXPECT_EQ(AllOf(buffer), bytes);
    EXPECT_EQ(buffer.sgetc(), std::streambuf::traits_type::eof());
}

TEST(ScriptBuffer, GivesTheBytesOfAText)
{
    ScriptBuffer buffer("one\ntwo");

    EXPECT_EQ(AllOf(buffer), "one\ntwo");
    EXPECT_EQ(AllOf(buffer), "");
}

TEST(ScriptBuffer, TakesACharacterBackAtTheStartOfABlock)
{
    OpenFile file(ManyLines(5000));
    ScriptBuffer buffer(file.descriptor);

    for (int i = 0; i < 5000 * 50; ++i) {
        int taken = buffer.sbumpc();
        ASSERT_EQ(buffer.sungetc(), taken) << i;
        ASSERT_EQ(buffer.sbumpc(), taken) << i;
    }
}

TEST(ScriptBuffer, KnowsTheLineOfTheMark)
{
    ScriptBuffer buffer("a\nb\n\nc");

    buffer.Mark();
    EXPECT_EQ(buffer.MarkedLine(), 1);
    buffer.sbumpc(); // a
    buffer.Mark();
    EXPECT_EQ(buffer.MarkedLine(), 1);
    buffer.sbumpc(); // the newline
    buffer.Mark();
    EXPECT_EQ(buffer.MarkedLine(), 2);
    AllOf(buffer);
    EXPECT_EQ(buffer.MarkedLine(), 2);
    buffer.Mark();
    EXPECT_EQ(buffer.MarkedLine(), 4);
}

TEST(ScriptBuffer, KnowsTheLineOfAMarkInABlockThatIsGone)
{
    OpenFile file(ManyLines(10000));
    ScriptBuffer buffer(file.descriptor);

    for (int line = 1; line <= 10000; ++line) {
        buffer.Mark();
        for (int i = 0; i < 50; ++i)
            buffer.sbumpc();
        if (line % 7 == 0) {
            ASSERT_EQ(buffer.MarkedLine(), line);
        }
    }
    EXPECT_EQ(buffer.sgetc(), std::streambuf::traits_type::eof());
    EXPECT_EQ(buffer.MarkedLine(), 10000);
}

TEST(ScriptBuffer, KnowsTheLineOfAMarkAtTheEndOfABlock)
{
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    ScriptBuffer buffer(ends[0]);
    ASSERT_EQ(write(ends[1], "a\n", 2), 2);
    buffer.sbumpc();
    buffer.sbumpc();

    buffer.Mark();
    ASSERT_EQ(write(ends[1], "b\nc\n", 4), 4);
    close(ends[1]);
    EXPECT_EQ(buffer.sbumpc(), 'b');
    EXPECT_EQ(buffer.MarkedLine(), 2);

    EXPECT_EQ(AllOf(buffer), "\nc\n");
    EXPECT_EQ(buffer.MarkedLine(), 2);
    close(ends[0]);
}
