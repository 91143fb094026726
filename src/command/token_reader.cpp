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

/// Hands out a list's spare tokens one after the other. What that takes of the
/// list is kept here meanwhile, since every copy into a token could change the
/// list for all the compiler knows.
class KvoTokenReader::SpareTokens
{
public:
    explicit SpareTokens(KvoTokenList& tokens_of)
        : list(tokens_of), table(*tokens_of.model.table)
    {
        look();
    }
    ~SpareTokens() { list.count = count; }
    SpareTokens(const SpareTokens&) = delete;
    SpareTokens& operator=(const SpareTokens&) = delete;

    /// Gives the next one the first `bytes` characters at `from` and adds it to
    /// the list.
    ///
    /// A copy of one size, whatever the token's, costs least.
    ///
    /// Requires: bytes < `KvoToken::room_bytes`, as many as which can be read.
    /// Returns:  whether there was memory for the token.
    bool Use(const char* from, std::size_t bytes)
    {
        if (count == held && !make())
            return false;
        auto* token = static_cast<KvoToken*>(all[count++]);
        std::memcpy(token->text, from, KvoToken::room_bytes);
        token->text[bytes] = '\0';
        token->length = bytes;
        token->quote = 0;
        token->table = &table;
        token->modified = 0;
        return true;
    }

    KvoTokenList& list;
    const KvoToken::ActionTable& table;

private:
    void look()
    {
        all = static_cast<KvoObject**>(list.tokens.data);
        held = list.tokens.size;
        count = list.count;
    }

    bool make()
    {
        list.count = count;
        const bool made = list.make_spare_token() != nullptr;
        look();
        return made;
    }

    KvoObject** all;
    int held;
    int count;
};

// A tied output stream is flushed before the first character, as the first
// `get` would do. A stream that is not good shows no characters, so that the
// first `get` fails by itself and the buffer is not touched.
inline KvoTokenReader::KvoTokenReader(std::istream& stream)
    : in(stream), at(nullptr), pending(Pending::Nothing),
      run(KvoTokenList::Run::Plain), limit(nullptr)
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

// The stream's count of characters must be that of the last `get` or `putback`
// too, which only the stream itself can set. Where it is not so already, from
// the token before as a rule, the last step is done once more by the stream.
inline KvoTokenReader::~KvoTokenReader()
{
    char character;
    if (pending == Pending::Took && in.gcount() != 1) {
        --at;
        take_from_stream(character);
    } else if (pending == Pending::PutBack && in.gcount() != 0) {
        character = *at++;
        put_back_into_stream(character);
    } else {
        tell_buffer();
    }
}

inline void KvoTokenReader::view_buffer()
{
    at = limit = nullptr;
    if (in.good()) {
        at = BufferView::next(*in.rdbuf());
        limit = BufferView::limit(*in.rdbuf());
    }
}

inline void KvoTokenReader::tell_buffer()
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

// Adds the words between each two of `edges`, which are bits for characters
// from `block` on.
//
// Returns: the first word that was not added, since it does not end or there
//          is no room for it; null if all were.
const char* KvoTokenReader::add_words(KvoTokenList& list, const char* block,
                                      std::uint64_t edges, char mark)
{
    SpareTokens spares(list);
    while (edges != 0) {
        const char* word = block + std::countr_zero(edges);
        edges &= edges - 1;
        const auto bytes = block + std::countr_zero(edges) - word;
        if (edges == 0 || bytes >= KvoToken::room_bytes ||
            !spares.Use(word, static_cast<std::size_t>(bytes)))
            return word;
        edges &= edges - 1;
        if (*word == mark)
            run = KvoTokenList::Run::Mixed;
    }
    return nullptr;
}

// Adds the special character that stands next, and goes behind it.
bool KvoTokenReader::add_special(KvoTokenList& list)
{
    if (!SpareTokens(list).Use(at, 1))
        return false;
    run = KvoTokenList::Run::Mixed;
    ++at;
    return true;
}

// Most tokens are a few ordinary characters before a blank or a special one. A
// map of the characters in view, gone through from stop to stop, says where
// such words begin and where they end: the edges. A word ends at the stop
// itself only if that is special, for a quote belongs to the word. A word at
// the end of the map that may prove to be short begins the next one.
inline KvoTokenReader::Ahead KvoTokenReader::read_block(KvoTokenList& list,
                                                        char mark)
{
    const KvoToken::ActionTable& table = *list.model.table;
    const char* const block = at;
    const zt_command::BlockMap map =
        zt_command::map_of_block(block, table.vector_stops);
    std::uint64_t ordinary = ~(map.blanks | map.stops);
    for (std::uint64_t stops = map.stops;; stops &= stops - 1) {
        const std::uint64_t stop = stops & (~stops + 1);
        const std::uint64_t words = ordinary & (stop - 1);
        at = block + std::countr_zero(stops);
        const bool special =
            stop != 0 && table.ActionOf(*at) & KvoToken::ActionTable::Special;
        const std::uint64_t edges = words ^ (words << 1);
        const char* const left =
            add_words(list, block, special ? edges : edges & ~stop, mark);
        if (left)
            at = left;
        if (stop == 0)
            return block + zt_command::block_bytes - at < KvoToken::room_bytes
                       ? Ahead::Unknown
                       : Ahead::Other;
        if (left || !special)
            return Ahead::Other;
        if (list.is_end_character(*at)) {
            ++at;
            pending = Pending::Took;
            return Ahead::Nothing;
        }
        if (!add_special(list))
            return Ahead::Other;
        ordinary &= ~(stop | (stop - 1));
    }
}

// Adds the tokens that come next, all in the stream's buffer, as long as they
// are plain. A block has to be in view, and behind it as much as is copied of
// its last word.
//
// Returns: whether the run has ended. If it has not, `read` must follow.
inline bool KvoTokenReader::read_in_view(KvoTokenList& list, char mark)
{
    constexpr int seen = zt_command::block_bytes + KvoToken::room_bytes;
    if (!list.model.table->vector_scannable)
        return false;
    Ahead ahead = Ahead::Unknown;
    while (ahead == Ahead::Unknown && limit - at >= seen)
        ahead = read_block(list, mark);
    return ahead == Ahead::Nothing;
}

// A token that is read stands behind the list's own until it proves to be more
// than the end of the run.
inline KvoTokenList::Run KvoTokenReader::read_all(KvoTokenList& list, char mark)
{
    do {
        if (read_in_view(list, mark))
            return run;
        KvoToken* token = list.spare_token();
        if (!token) {
            drop_run(list);
            return KvoTokenList::Run::Cut;
        }
        read(*token);
        list.long_texts = list.long_texts ||
                          token->capacity > KvoTokenList::most_spare_text_bytes;
        if (list.ends_run(*token))
            return run;
        ++list.count;
        run = KvoTokenList::Run::Mixed;
    } while (in.good());
    return run;
}

// Reads the rest of a run into a token that needs no memory to be made.
void KvoTokenReader::drop_run(const KvoTokenList& list)
{
    KvoToken dropped(list.model);
    do
        read(dropped);
    while (!list.ends_run(dropped) && in.good());
}

void KvoTokenReader::read_token(std::istream& in, KvoToken& token)
{
    KvoTokenReader(in).read(token);
}

KvoTokenList::Run KvoTokenReader::read_run(std::istream& in, KvoTokenList& list,
                                           char mark)
{
    return KvoTokenReader(in).read_all(list, mark);
}
