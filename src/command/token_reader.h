#ifndef ZT_COMMAND_TOKEN_READER_H
#define ZT_COMMAND_TOKEN_READER_H

/// \file
/// Reads tokens from a stream as fast as its buffer allows.
///
/// What is promised to callers is the behaviour of one `get` a character and at
/// most one `putback` after it. As long as the stream's buffer holds unread
/// characters they are looked at in place, many at a time; the stream is told
/// at the end. Where the buffer runs out, or has nothing to look at, the
/// stream's own `get` and `putback` take over, so that state bits, refills and
/// position are the stream's own work in every case.

#include <KVO/KvoToken.h>

#include <cstddef>
#include <cstdint>
#include <istream>
#include <streambuf>

/// Takes tokens from one stream; while it does nobody else touches the stream.
class KvoTokenReader
{
public:
    /// Reads the next token with the token's own action table.
    static void read_token(std::istream& in, KvoToken& token);

    /// Reads tokens up to the list's end character, which is dropped, or to the
    /// end of input, and adds them to the list.
    ///
    /// Returns: what sort of tokens they are, with `mark` as the mark.
    static KvoTokenList::Run read_run(std::istream& in, KvoTokenList& list,
                                      char mark);

private:
    class SpareTokens;

    /// What was last done to the characters in view and not yet to the stream.
    enum class Pending { Nothing, Took, PutBack };

    /// What stands behind the words that were added.
    enum class Ahead {
        Unknown, ///< It has not been looked at yet.
        Other,   ///< Something that is no plain token, or not for certain.
        Nothing  ///< The run has ended.
    };

    explicit KvoTokenReader(std::istream& stream);
    ~KvoTokenReader();
    KvoTokenReader(const KvoTokenReader&) = delete;
    KvoTokenReader& operator=(const KvoTokenReader&) = delete;

    bool take(char& character);
    bool take_from_stream(char& character);
    void put_back(char character);
    void put_back_into_stream(char character);
    void view_buffer();
    void tell_buffer();

    void read(KvoToken& token);
    void skip_blanks(const KvoToken::ActionTable& table);
    void take_ordinary(KvoToken& token);
    void take_quoted(KvoToken& token);
    void take_escaped(KvoToken& token);

    KvoTokenList::Run read_all(KvoTokenList& list, char mark);
    bool read_in_view(KvoTokenList& list, char mark);
    Ahead read_block(KvoTokenList& list, char mark);
    const char* add_words(KvoTokenList& list, const char* block,
                          std::uint64_t edges, char mark);
    bool add_special(KvoTokenList& list);
    void drop_run(const KvoTokenList& list);

    std::istream& in;
    const char* at; ///< The next character in view.
    // These stand between the two pointers for speed: side by side, they would
    // be copied as one from the buffer's, of which one has just been written,
    // and the processor would wait for that to reach the cache.
    Pending pending;
    KvoTokenList::Run run; ///< What has been added to the list so far.
    const char* limit;     ///< Behind the last one; equal to `at` if none is.
};

#endif
