#ifndef ZT_TESTS_TOKENIZERDIFFERENCE_H
#define ZT_TESTS_TOKENIZERDIFFERENCE_H

#include <istream>
#include <sstream>
#include <string>
#include <vector>

#include "KVO/KvoStatement.h"
#include "support/LiteralTokenizer.h"
#include "support/OddStreams.h"

/// Reads the library's tokens and the literal ones from two streams of the same
/// text and tells the first difference that shows; empty if there is none.
class TokenizerDifference
{
public:
    TokenizerDifference(std::istream& tested_stream,
                        std::istream& reference_stream)
        : tested(tested_stream), reference(reference_stream)
    {}

    /// Reads up to `most` tokens of a special set.
    std::string OfTokens(const std::string& special, int most)
    {
        const LiteralTokenizer literal(special, "");
        KvoToken token(special.c_str());
        for (int i = 0; i < most && difference.empty(); ++i) {
            token.Read(tested);
            compare(token, literal.ReadToken(reference));
            compare_streams();
            if (!tested.good() && i + 2 < most)
                i = most - 2; // once more from the stream that is not good
        }
        return difference;
    }

    /// Reads up to `most` lists, all into the same one.
    std::string OfLists(const std::string& special, const std::string& end,
                        int most)
    {
        const LiteralTokenizer literal(special, end);
        KvoTokenList list(special.c_str(), end.c_str());
        for (int i = 0; i < most && difference.empty() && tested.good(); ++i) {
            std::vector<LiteralToken> expected;
            literal.AppendList(reference, expected);
            list.Read(tested);
            compare(list, expected);
            compare_streams();
        }
        return difference;
    }

    /// Reads up to `most` statements, and compares what is left.
    std::string OfStatements(int most)
    {
        const LiteralTokenizer literal("!", ";\n");
        KvoStatement statement;
        for (int i = 0; i < most && difference.empty() && tested.good(); ++i) {
            std::vector<LiteralToken> expected;
            literal.AppendStatement(reference, expected);
            statement.Read(tested);
            compare(statement, expected);
            compare_streams();
        }
        if (difference.empty() && RestOf(tested) != RestOf(reference))
            note("rest", "another", "one");
        return difference;
    }

private:
    void compare(const KvoTokenList& list,
                 const std::vector<LiteralToken>& expected)
    {
        if (list.Count() != static_cast<int>(expected.size()))
            note("count", list.Count(), expected.size());
        for (int i = 0; i < list.Count() && difference.empty(); ++i)
            compare(*list.Find(i), expected[static_cast<std::size_t>(i)]);
    }

    void compare(const KvoToken& token, const LiteralToken& expected)
    {
        // Texts are C strings: what stands behind a NUL does not show.
        const std::string text = token.Text();
        if (text != expected.text.c_str())
            note("text", text, expected.text);
        if (token.Quote() != expected.quote)
            note("quote", token.Quote(), expected.quote);
    }

    void compare_streams()
    {
        if (tested.rdstate() != reference.rdstate())
            note("state", tested.rdstate(), reference.rdstate());
        if (tested.gcount() != reference.gcount())
            note("gcount", tested.gcount(), reference.gcount());
        if (tested.good() && tested.tellg() != reference.tellg())
            note("position", tested.tellg(), reference.tellg());
    }

    template <typename Value, typename Expected>
    void note(const char* what, const Value& value, const Expected& expected)
    {
        std::ostringstream text;
        text << what << ": " << value << " instead of " << expected;
        if (difference.empty())
            difference = text.str();
    }

    std::istream& tested;
    std::istream& reference;
    std::string difference;
};

/// Compares the two tokenizers on `text`: tokens and statements, from memory,
/// in chunks and character by character.
inline std::string TokenizerDifferenceOn(const std::string& text)
{
    using Chunks = StreamOf<ChunkBuffer>;
    using OneByOne = StreamOf<OneByOneBuffer>;
    std::string difference;
    const auto compare = [&](std::istream&& tested, std::istream&& reference,
                             const char* special) {
        if (!difference.empty())
            return;
        TokenizerDifference both(tested, reference);
        difference = special ? both.OfTokens(special, 1'000'000)
                             : both.OfStatements(1'000'000);
    };
    for (const char* special : {"/", "!;\n", "abcdef", ""}) {
        compare(std::istringstream(text), std::istringstream(text), special);
        compare(Chunks(text, std::size_t{70}), Chunks(text, std::size_t{70}),
                special);
    }
    compare(std::istringstream(text), std::istringstream(text), nullptr);
    compare(Chunks(text, std::size_t{70}), Chunks(text, std::size_t{70}),
            nullptr);
    compare(OneByOne(text, true), OneByOne(text, true), nullptr);
    compare(OneByOne(text, false), OneByOne(text, false), nullptr);
    return difference;
}

#endif
