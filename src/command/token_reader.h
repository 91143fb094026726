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

/// Takes tokens from one stream, from its construction to its destruction; in
/// between nobody else touches the stream.
class KvoTokenReader
{
public:
    explicit KvoTokenReader(std::istream& stream);

    /// Leaves the stream where the last token ended.
    ~KvoTokenReader();

    KvoTokenReader(const KvoTokenReader&) = delete;
    KvoTokenReader& operator=(const KvoTokenReader&) = delete;

    /// Reads the next token with the token's own action table.
    void read(KvoToken& token);

    /// Adds to `list` the plain tokens that come next: a few ordinary
    /// characters, the first of them not `mark`, before a blank or a special
    /// one, all in the stream's buffer. Anything else is left to `read`.
    void read_plain_tokens(KvoTokenList& list, char mark);

    /// Takes the next character if it is in the stream's buffer and ends the
    /// list's run.
    ///
    /// Returns: whether it was taken.
    bool take_end(const KvoTokenList& list);

private:
    /// What was last done to the characters in view and not yet to the stream.
    enum class Pending { Nothing, Took, PutBack };

    bool take(char& character);
    bool take_from_stream(char& character);
    void put_back(char character);
    void put_back_into_stream(char character);
    void view_buffer();
    void tell_buffer();

    void skip_blanks(const KvoToken::ActionTable& table);
    bool read_mapped_tokens(KvoTokenList& list, std::uint64_t ends, char mark);
    bool add_plain_token(KvoTokenList& list, const char* from, int bytes) const;
    void take_ordinary(KvoToken& token);
    void take_quoted(KvoToken& token);
    void take_escaped(KvoToken& token);

    std::istream& in;
    const char* at;    ///< The next character in view.
    const char* limit; ///< Behind the last one; equal to `at` if none is.
    Pending pending;
};

#endif
