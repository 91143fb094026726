#include "command/token_reader.h"

#include <cstdio>
#include <cstring>
#include <fstream>
#include <functional>
#include <iostream>
#include <memory>
#include <random>
#include <sstream>
#include <string>
#include <unistd.h>
#include <vector>

#include <gtest/gtest.h>

#include "command/ordinary_run.h"
#include "support/OddStreams.h"
#include "support/TempDir.h"
#include "support/TokenizerDifference.h"

namespace {
/// Texts of words of all lengths, of the language's own characters, of them
/// many or few, and now and then of any byte.
class RandomText
{
public:
    std::string Of(std::size_t bytes)
    {
        static const std::string marks = " \n;!#\"'\\\t,/.:\v";
        const unsigned calm = Number(3) * Number(20) + 1;
        std::string text;
        while (text.size() < bytes) {
            text += word(Number(8) == 0 ? Number(90) : Number(10));
            text += Number(calm) ? ' ' : marks[dice() % marks.size()];
            if (Number(calm * 16) == 0)
                text += static_cast<char>(dice() % 256);
        }
        return text;
    }

    unsigned Number(unsigned limit)
    {
        return static_cast<unsigned>(dice()) % limit;
    }

private:
    std::string word(std::size_t bytes)
    {
        std::string text;
        while (text.size() < bytes)
            text += static_cast<char>('a' + dice() % 26);
        return text;
    }

    std::mt19937 dice{20240229};
};

using Maker =
    std::function<std::unique_ptr<std::istream>(const std::string& text)>;

struct Kind
{
    const char* name;
    Maker make;
};

template <typename Buffer, typename... Arguments>
Maker odd(Arguments... arguments)
{
    return [=](const std::string& text) {
        return std::make_unique<StreamOf<Buffer>>(text, arguments...);
    };
}

std::unique_ptr<std::istream> string_stream(const std::string& text)
{
    return std::make_unique<std::istringstream>(text);
}

std::unique_ptr<std::istream> two_way_string_stream(const std::string& text)
{
    auto stream = std::make_unique<std::stringstream>();
    *stream << text;
    return stream;
}

std::unique_ptr<std::istream> file_stream(const std::string& text)
{
    static const TempDir directory;
    static int count = 0;
    return std::make_unique<std::ifstream>(
        directory.Write("script" + std::to_string(count++ % 8), text),
        std::ios::binary);
}

/// A file whose buffer holds only a few bytes.
std::unique_ptr<std::istream> narrow_file_stream(const std::string& text)
{
    static char buffers[8][7];
    static int count = 0;
    auto opened = file_stream(text);
    auto stream = std::make_unique<std::ifstream>();
    char* buffer = buffers[count++ % 8];
    stream->rdbuf()->pubsetbuf(buffer, sizeof buffers[0]);
    static const TempDir directory;
    stream->open(directory.Write("narrow" + std::to_string(count % 8), text),
                 std::ios::binary);
    return stream;
}

std::unique_ptr<std::istream> throwing_stream(const std::string& text)
{
    auto stream = std::make_unique<std::istringstream>(text);
    stream->exceptions(std::ios::failbit | std::ios::badbit | std::ios::eofbit);
    return stream;
}

std::unique_ptr<std::istream> tied_stream(const std::string& text)
{
    static std::ostringstream output;
    auto stream = std::make_unique<std::istringstream>(text);
    stream->tie(&output);
    return stream;
}

/// Fails whenever it is flushed.
class BrokenOutput : public std::streambuf
{
protected:
    int sync() override { return -1; }
};

/// Is tied to an output of its own, which throws when it is flushed.
class StreamTiedToBroken : public std::istringstream
{
public:
    explicit StreamTiedToBroken(const std::string& text)
        : std::istringstream(text), output(&buffer)
    {
        output.exceptions(std::ios::badbit);
        tie(&output);
    }

private:
    BrokenOutput buffer;
    std::ostream output;
};

std::unique_ptr<std::istream> stream_tied_to_broken(const std::string& text)
{
    return std::make_unique<StreamTiedToBroken>(text);
}

const std::vector<Kind>& kinds()
{
    static const std::vector<Kind> all = {
        {"string", string_stream},
        {"string to write and read", two_way_string_stream},
        {"file", file_stream},
        {"file with a narrow buffer", narrow_file_stream},
        {"string told to throw", throwing_stream},
        {"string with a tied output", tied_stream},
        {"string with a broken tied output", stream_tied_to_broken},
        {"one by one", odd<OneByOneBuffer>(true)},
        {"one by one, nothing taken back", odd<OneByOneBuffer>(false)},
        {"chunks of one", odd<ChunkBuffer>(std::size_t{1})},
        {"chunks up to 5", odd<ChunkBuffer>(std::size_t{5})},
        {"chunks up to 100", odd<ChunkBuffer>(std::size_t{100})},
        {"device that breaks",
         odd<ChunkBuffer>(std::size_t{9}, std::size_t{40})},
    };
    return all;
}

TEST(KvoTokenReader, ReadsTokensOfEveryKindOfStreamAsOneGetAtATimeWould)
{
    const char* const specials[] = {"",      "!;\n", "/",
                                    ":.;\n", "'\" ", "abcdefg"};
    RandomText texts;

    for (const Kind& kind : kinds())
        for (int round = 0; round < 250; ++round) {
            const std::string text = texts.Of(texts.Number(300));
            const auto tested = kind.make(text);
            const auto reference = kind.make(text);
            const std::string special = specials[texts.Number(6)];

            TokenizerDifference difference(*tested, *reference);

            ASSERT_EQ(difference.OfTokens(special, 1000), "")
                << kind.name << ", " << testing::PrintToString(special) << ", "
                << testing::PrintToString(text);
        }
}

TEST(KvoTokenReader, ReadsStatementsOfEveryKindOfStreamAsOneGetAtATimeWould)
{
    RandomText texts;

    for (const Kind& kind : kinds())
        for (int round = 0; round < 250; ++round) {
            const std::string text = texts.Of(texts.Number(600));
            const auto tested = kind.make(text);
            const auto reference = kind.make(text);
            const int most = static_cast<int>(texts.Number(20));

            TokenizerDifference difference(*tested, *reference);

            ASSERT_EQ(difference.OfStatements(most), "")
                << kind.name << ", " << testing::PrintToString(text);
        }
}

TEST(KvoTokenReader, ReadsListsOfEveryKindOfStreamAsOneGetAtATimeWould)
{
    const std::vector<std::pair<std::string, std::string>> punctuation = {
        {"", ";"},     {"!", ";\n"},    {"/", ""},      {"", ""},
        {":.", "\n"},  {"'\" ", "!"},   {",:", "\t\v"}, {"\"", "'"},
        {"#", "\xff"}, {"aeiou", "!;"}, {"", " "},      {"\x01;", "\n"}};
    RandomText texts;

    for (const Kind& kind : kinds())
        for (int round = 0; round < 250; ++round) {
            const std::string text = texts.Of(texts.Number(600));
            const auto tested = kind.make(text);
            const auto reference = kind.make(text);
            const auto& [special, end] =
                punctuation[texts.Number(12)];

            TokenizerDifference difference(*tested, *reference);

            ASSERT_EQ(difference.OfLists(special, end, 1000), "")
                << kind.name << ", " << testing::PrintToString(special) << ", "
                << testing::PrintToString(end) << ", "
                << testing::PrintToString(text);
        }
}

TEST(KvoTokenReader, ReadsALargeFileAcrossAllBoundariesOfItsBuffer)
{
    RandomText texts;
    const std::string text = texts.Of(300000);
    const auto tested = file_stream(text);
    const auto reference = file_stream(text);

    TokenizerDifference difference(*tested, *reference);

    EXPECT_EQ(difference.OfStatements(1000000), "");
}

/// What is written to it is read from standard input, which ends there.
class InputPipe
{
public:
    explicit InputPipe(const std::string& text) : kept(dup(0))
    {
        int ends[2];
        EXPECT_EQ(pipe(ends), 0);
        EXPECT_EQ(write(ends[1], text.data(), text.size()),
                  static_cast<ssize_t>(text.size()));
        close(ends[1]);
        dup2(ends[0], 0);
        close(ends[0]);
        std::clearerr(stdin);
        std::cin.clear();
    }
    ~InputPipe()
    {
        dup2(kept, 0);
        close(kept);
        std::clearerr(stdin);
        std::cin.clear();
    }
    InputPipe(const InputPipe&) = delete;
    InputPipe& operator=(const InputPipe&) = delete;

private:
    int kept;
};

TEST(KvoTokenReader, ReadsStandardInputFromAPipeAsOneGetAtATimeWould)
{
    RandomText texts;

    for (int round = 0; round < 200; ++round) {
        const std::string text = texts.Of(texts.Number(600));
        const InputPipe pipe(text);
        StreamOf<OneByOneBuffer> reference(text, true);

        TokenizerDifference difference(std::cin, reference);

        ASSERT_EQ(difference.OfStatements(1000), "")
            << testing::PrintToString(text);
    }
}

TEST(KvoTokenReader, NeverLooksAtTheBufferOfAStreamThatIsNotGood)
{
    for (const auto state : {std::ios::eofbit, std::ios::failbit}) {
        std::istringstream in("abc def");
        in.setstate(state);
        KvoToken token;
        token.Set("old");

        token.Read(in);

        EXPECT_STREQ(token.Text(), "");
        EXPECT_EQ(in.rdstate(), state | std::ios::failbit);
        in.clear();
        EXPECT_EQ(RestOf(in), "abc def");
    }
}

TEST(KvoTokenReader, ReadsFromAStreamWithoutABuffer)
{
    std::istream in(nullptr);
    KvoToken token;

    token.Read(in);

    EXPECT_STREQ(token.Text(), "");
    EXPECT_TRUE(in.bad());
}

/// Counts how often it is flushed.
class FlushCounter : public std::streambuf
{
public:
    int flushes = 0;

protected:
    int sync() override
    {
        ++flushes;
        return 0;
    }
};

/// Notes how often the other buffer was flushed when its text is asked for.
class AnswerBuffer : public ChunkBuffer
{
public:
    explicit AnswerBuffer(const FlushCounter& prompt)
        : ChunkBuffer("yes\n", 100), counter(prompt)
    {}
    int flushes_before = -1;

protected:
    int_type underflow() override
    {
        if (flushes_before < 0)
            flushes_before = counter.flushes;
        return ChunkBuffer::underflow();
    }

private:
    const FlushCounter& counter;
};

TEST(KvoTokenReader, FlushesTheTiedStreamBeforeItReads)
{
    FlushCounter prompt;
    std::ostream output(&prompt);
    AnswerBuffer answer(prompt);
    std::istream in(&answer);
    in.tie(&output);
    KvoStatement statement;

    statement.Read(in);

    EXPECT_STREQ(statement.ArgText(0), "yes");
    EXPECT_GT(answer.flushes_before, 0);
}

TEST(KvoTokenReader, LeavesTheExceptionsOfTheStreamAsTheyAre)
{
    std::istringstream in("abc");
    in.exceptions(std::ios::badbit | std::ios::eofbit);
    KvoToken token;

    EXPECT_NO_THROW(token.Read(in));

    EXPECT_STREQ(token.Text(), "abc");
    EXPECT_EQ(in.exceptions(), std::ios::badbit | std::ios::eofbit);
    EXPECT_TRUE(in.eof());
}

TEST(KvoTokenReader, ATokenReadInPiecesFromABrokenDeviceEndsThere)
{
    StreamOf<ChunkBuffer> in("abcdefghijk", std::size_t{2}, std::size_t{6});
    KvoToken token;

    token.Read(in);

    EXPECT_STREQ(token.Text(), "abcdef");
    EXPECT_TRUE(in.bad());
}

TEST(OrdinaryRun, MapsBlanksAndStopsAsALookAtEachCharacterWould)
{
    zt_command::Stops stops;
    const char given[] = {'!', '\n', '\xff'};
    for (int i = 0; i < zt_command::given_stops; ++i)
        std::memset(stops[i], given[i], sizeof stops[i]);

    for (int code = 0; code < 256; ++code)
        for (int place = 0; place < zt_command::block_bytes; ++place) {
            std::string block(zt_command::block_bytes, 'x');
            block[static_cast<std::size_t>(place)] = static_cast<char>(code);
            const bool stop = code == '"' || code == '\'' || code == '\\' ||
                              code == '!' || code == '\n' || code == 255;
            const std::uint64_t here = std::uint64_t{1} << place;

            const zt_command::BlockMap map =
                zt_command::map_of_block(block.data(), stops);

            EXPECT_EQ(map.stops, stop ? here : 0) << code << " at " << place;
            EXPECT_EQ(map.blanks, code <= ' ' && !stop ? here : 0)
                << code << " at " << place;
        }
}
} // namespace
