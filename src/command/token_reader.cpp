#include "command/token_reader.h"

#include <bit>
#include <cstring>

#include "command/ordinary_run.h"

namespace {
/// Reaches the read pointers of any stream buffer: they are protected, and a
/// pointer to a member that is named through a derived class is the language's
/// own way to them.
struct BufferView : std::streambuf
{
    static char* start(const std::streambuf& buffer)
    {
        return (buffer.*&BufferView::eback)();
    }
    static char* next(const std::streambuf& buffer)
    {
        return (buffer.*&BufferView::gptr)();
    }
    static char* limit(const std::streambuf& buffer)
    {
        return (buffer.*&BufferView::egptr)();
    }
    static void move(std::streambuf& buffer, const char* next)
    {
        char* first = start(buffer);
        (buffer.*&BufferView::setg)(first, first + (next - first),
                                    limit(buffer));
    }
};
} // namespace

// A tied output stream is flushed before the first character, as the first
// `get` would do. A stream that is not good shows no characters, so that the
// first `get` fails by itself and the buffer is not touched.
KvoTokenReader::KvoTokenReader(std::istream& stream)
    : in(stream), at(nullptr), limit(nullptr), pending(Pending::Nothing)
{
    if (in.good() && in.tie()) {
        try {
            const std::istream::sentry flushes_the_tied_stream(in, true);
        } catch (...) {
            // The state bits tell.
        }
    }
    view_buffer();
}

// The last step is done once more by the stream itself, so that its count of
// characters is that of the last `get` or `putback` too.
KvoTokenReader::~KvoTokenReader()
{
    char character;
    switch (pending) {
    case Pending::Took:
        --at;
        take_from_stream(character);
        break;
    case Pending::PutBack:
        character = *at++;
        put_back_into_stream(character);
        break;
    case Pending::Nothing:
        tell_buffer();
        break;
    }
}

void KvoTokenReader::view_buffer()
{
    at = limit = nullptr;
    if (in.good()) {
        at = BufferView::next(*in.rdbuf());
        limit = BufferView::limit(*in.rdbuf());
    }
}

void KvoTokenReader::tell_buffer()
{
    if (at && at != BufferView::next(*in.rdbuf()))
        BufferView::move(*in.rdbuf(), at);
}

bool KvoTokenReader::take(char& character)
{
    if (at == limit)
        return take_from_stream(character);
    character = *at++;
    pending = Pending::Took;
    return true;
}

// A stream may have been told to throw; its state bits are set all the same.
bool KvoTokenReader::take_from_stream(char& character)
{
    tell_buffer();
    try {
        in.get(character);
    } catch (...) {
        // The state bits tell.
    }
    view_buffer();
    pending = Pending::Nothing;
    return !in.fail();
}

void KvoTokenReader::put_back(char character)
{
    if (pending != Pending::Took)
        return put_back_into_stream(character);
    --at;
    pending = Pending::PutBack;
}

void KvoTokenReader::put_back_into_stream(char character)
{
    tell_buffer();
    try {
        in.putback(character);
    } catch (...) {
        // The state bits tell.
    }
    view_buffer();
    pending = Pending::Nothing;
}

void KvoTokenReader::read(KvoToken& token)
{
    const KvoToken::ActionTable& table = *token.table;
    token.quote = 0;
    token.clear_text();
    skip_blanks(table);
    char character;
    while (take(character)) {
        const int action = table.ActionOf(character);
        if (action & KvoToken::ActionTable::Special) {
            if (token.quote || token.length > 0)
                put_back(character);
            else
                token.append_text(&character, 1);
            return;
        }
        if (action & KvoToken::ActionTable::QuoteOrEscape) {
            token.quote = character;
            if (character == '\\')
                take_escaped(token);
            else
                take_quoted(token);
        } else if (action & KvoToken::ActionTable::Blank) {
            return;
        } else {
            token.append_text(&character, 1);
            take_ordinary(token);
        }
    }
}

// The character that stops the skipping goes back. In view it only has to be
// left; one that the stream gave out is put back into it, which may fail.
void KvoTokenReader::skip_blanks(const KvoToken::ActionTable& table)
{
    constexpr int blank_or_special =
        KvoToken::ActionTable::Blank | KvoToken::ActionTable::Special;
    char character;
    do {
        while (at != limit && (table.ActionOf(*at) & blank_or_special) ==
                                  KvoToken::ActionTable::Blank)
            ++at;
        if (at != limit || !take_from_stream(character))
            return;
    } while ((table.ActionOf(character) & blank_or_special) ==
             KvoToken::ActionTable::Blank);
    put_back_into_stream(character);
}

// Takes what is in view of a run of ordinary characters. What comes behind the
// view is another round of `read_pieces`.
void KvoTokenReader::take_ordinary(KvoToken& token)
{
    const KvoToken::ActionTable& table = *token.table;
    const char* end = at;
    if (table.vector_scannable)
        end = zt_command::skip_ordinary_chunks(end, limit, table.vector_stops);
    while (end != limit && table.ActionOf(*end) == 0)
        ++end;
    if (end == at)
        return;
    token.append_text(at, static_cast<std::size_t>(end - at));
    at = end;
    pending = Pending::Took;
}

// Takes everything up to the next quote character of the same kind, which is
// dropped, or to the end of input.
void KvoTokenReader::take_quoted(KvoToken& token)
{
    const char closing = token.quote;
    char character;
    for (;;) {
        if (at != limit) {
            const auto seen = static_cast<std::size_t>(limit - at);
            const void* found = std::memchr(at, closing, seen);
            const char* end = found ? static_cast<const char*>(found) : limit;
            token.append_text(at, static_cast<std::size_t>(end - at));
            at = found ? end + 1 : end;
            pending = Pending::Took;
            if (found)
                return;
        }
        if (!take_from_stream(character) || character == closing)
            return;
        token.append_text(&character, 1);
    }
}

void KvoTokenReader::take_escaped(KvoToken& token)
{
    char character;
    if (take(character))
        token.append_text(&character, 1);
}

void KvoTokenReader::read_plain_tokens(KvoTokenList& list, char mark)
{
    const KvoToken::ActionTable& table = *list.model.table;
    if (!table.vector_scannable)
        return;
    while (limit - at >= zt_command::block_bytes) {
        const std::uint64_t ends =
            zt_command::ends_in_block(at, table.vector_stops);
        if (ends == 0 || !read_mapped_tokens(list, ends, mark))
            return;
    }
}

// Most tokens are a few ordinary characters before a blank or a special one.
// `ends` is a map of the characters in view that end such a run: the length of
// a token is the number of clear bits at its low end, and what is taken is
// shifted out. The position is kept in a variable of the function's own, since
// every copy into a token could change a member for all the compiler knows.
//
// Returns: whether everything in the map was taken, but for a token that goes
//          on behind it.
bool KvoTokenReader::read_mapped_tokens(KvoTokenList& list, std::uint64_t ends,
                                        char mark)
{
    const KvoToken::ActionTable& table = *list.model.table;
    const char* here = at;
    while (ends != 0) {
        const int bytes = std::countr_zero(ends);
        const int stop = table.ActionOf(here[bytes]);
        const bool blank = stop == KvoToken::ActionTable::Blank;
        if (bytes > 0) {
            if (*here == mark ||
                !(blank || stop & KvoToken::ActionTable::Special) ||
                !add_plain_token(list, here, bytes))
                break;
        } else if (!blank) {
            break;
        }
        here += bytes;
        ends >>= bytes;
        pending = Pending::PutBack;
        if (blank) [[likely]] {
            ++here;
            ends >>= 1;
            pending = Pending::Took;
        }
    }
    at = here;
    return ends == 0;
}

// A copy of one size, whatever the token's, costs least; so the token must fit
// it and there must be as much in view.
bool KvoTokenReader::add_plain_token(KvoTokenList& list, const char* from,
                                     int bytes) const
{
    constexpr int copied = KvoToken::room_bytes;
    if (bytes >= copied || limit - from < copied)
        return false;
    KvoToken* token = list.spare_token();
    if (!token)
        return false;
    std::memcpy(token->text, from, copied);
    token->text[bytes] = '\0';
    token->length = static_cast<std::size_t>(bytes);
    token->quote = 0;
    ++list.count;
    return true;
}

bool KvoTokenReader::take_end(const KvoTokenList& list)
{
    if (at == limit || !list.is_end_character(*at))
        return false;
    ++at;
    pending = Pending::Took;
    return true;
}
