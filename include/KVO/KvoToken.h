#ifndef KVO_KVOTOKEN_H
#define KVO_KVOTOKEN_H

/// \file
/// The command language's characters and words: tokens, the tables that say
/// what each character does, and lists of tokens.
///
/// Surprising: a quote inside a word does not end it, so ab"c d"e is the one
/// token `abc de`; and comments are made of tokens too, so that a lone
/// apostrophe in a comment opens a quoted piece that swallows everything up to
/// the next one, newlines included.

#include <KVO/KvoObjArr.h>
#include <KVO/KvoObject.h>
#include <KVO/KvoSkipList.h>

#include <cstddef>
#include <iosfwd>

class KvoTokenReader;

/// One word of the command language: its text, and how it was quoted.
///
/// Texts are used as C strings: what follows a NUL in one is kept while it is
/// read but neither written, compared nor converted.
class ZT_API KvoToken : public KvoObject
{
public:
    /// Says for each character what the tokenizer does with it.
    ///
    /// A table's name, and so its key, is the string of special characters it
    /// was built for. Tokens of the same special characters share one table;
    /// tables live for the whole process.
    class ZT_API ActionTable : public KvoNamedObject
    {
    public:
        /// The bits of an action. A character may have several; when reading,
        /// special wins over quote and quote over blank.
        enum Action : int {
            Blank = 1,        ///< Separates tokens.
            Special = 2,      ///< A token of its own; ends the one in hand.
            QuoteOrEscape = 4 ///< A double or single quote or the backslash.
        };

        /// Builds the table for the characters in `special_characters`; null
        /// is the empty string.
        ///
        /// Blank are all control characters (codes 0 to 31) and the space.
        explicit ActionTable(const char* special_characters);

        /// Gives the sum of the `Action` bits of `character`, 0 if it is an
        /// ordinary one. Bytes from 128 up are ordinary.
        int ActionOf(char character) const
        {
            return actions[static_cast<unsigned char>(character)];
        }

    private:
        friend class KvoTokenReader;

        void note_vector_stops();

        unsigned char actions[256];
        /// What a scan of sixteen characters at a time compares with: up to
        /// three specials that are no quotes, each filling a row, the rows
        /// left over filled with the double quote.
        char vector_stops[3][16];
        bool vector_scannable; ///< Whether the specials fit above.
    };

    /// Makes an empty token that reads with the action table of
    /// `special_characters`; null is the empty string.
    explicit KvoToken(const char* special_characters = nullptr);

    /// Copies text, quote character and action table, not the modified flag.
    KvoToken(const KvoToken& other);

    /// Copies text, quote character and action table; the modified flag stays.
    KvoToken& operator=(const KvoToken& other);

    ~KvoToken() override;

    /// Changes to the action table of `special_characters`, made on first use;
    /// the text stays as it is. Null is the empty string.
    void SetSpecial(const char* special_characters);

    /// Replaces the text by a copy of `new_text`, which may be the present text
    /// itself, and forgets the quote character; null is the empty text.
    void Set(const char* new_text);

    /// Reads the next token: skips blanks, then takes characters up to a blank
    /// (consumed), a special character (left, unless it is the token) or the
    /// end of input.
    ///
    /// Between double or single quotes everything is literal up to the same
    /// quote; a backslash makes the next character literal. An unterminated
    /// quote runs to the end of input.
    ///
    /// A stream that its owner told to throw does not throw from here; its
    /// state bits say what happened.
    ///
    /// Cursor: the stream's state and position are as after taking one
    ///         character at a time with `get` and putting back at most one.
    ///         The end and fail bits are set when, and only when, the reading
    ///         ran into the end of input.
    void Read(std::istream& in) override;

    /// Writes the text with no quotes.
    void Write(std::ostream& out) override;

    /// Writes the text so that `Read` gives it back: between the quote
    /// characters it was read with, or between double quotes if it was not
    /// quoted but holds a blank; behind the backslash if it was escaped.
    ///
    /// By design: characters inside the text are never escaped, special
    ///            characters alone do not cause quoting, and the double quote
    ///            chosen for a blank stays with the token
    ///            (KvoToken.WriteQuotedNeverEscapes,
    ///            KvoToken.WriteQuotedKeepsTheQuoteItChose).
    virtual void WriteQuoted(std::ostream& out);

    /// Gives the text.
    ///
    /// Owner:   this token, until it is read or set again.
    /// Returns: never null.
    const char* Text() const { return text; }

    /// Gives the double quote, the single quote or the backslash, whichever
    /// last opened a quoted or escaped piece of the token or was chosen by
    /// `WriteQuoted`; 0 if none did.
    char Quote() const { return quote; }

    /// Gives the characters that are always blank: space, tab, form feed,
    /// newline, carriage return and vertical tab.
    static const char* Blanks();

    /// All action tables made so far, by their special characters.
    static KvoSkipList& actionList;

private:
    friend class KvoTokenList;
    friend class KvoTokenReader;
    static constexpr int room_bytes = 24;

    static KvoSkipList& action_tables();
    static const ActionTable* action_table(const char* special_characters);

    void clear_text();
    void assign_text(const char* from, std::size_t bytes);
    void append_text(const char* from, std::size_t bytes);
    bool grow_text(std::size_t more);
    void release_text();

    char quote; ///< 0 when not quoted.
    const ActionTable* table;
    char* text;            ///< Ends with NUL; `room` or a block of its own.
    std::size_t length;    ///< Bytes of `text` without the closing NUL.
    std::size_t capacity;  ///< Bytes that `text` can hold, NUL included.
    char room[room_bytes]; ///< Short texts live here.
};

/// A run of tokens with look-up by text and by position.
///
/// Positions count from 0. Texts compare exactly, case included.
class ZT_API KvoTokenList : public KvoObject
{
public:
    /// Makes an empty list whose tokens are parted by blanks and by the
    /// characters in `special_characters` and `end_characters`; reading stops
    /// after one of the latter. Null is the empty string.
    ///
    /// Owner: the list keeps copies of both.
    explicit KvoTokenList(const char* special_characters = nullptr,
                          const char* end_characters = nullptr);

    /// Copies the tokens as well; the modified flag starts at 0.
    KvoTokenList(const KvoTokenList& other);

    /// Copies the tokens as well; the modified flag stays.
    KvoTokenList& operator=(const KvoTokenList& other);

    ~KvoTokenList() override;

    /// Deletes every token.
    ///
    /// Owner: pointers to the tokens and their texts are dead.
    void Clear();

    /// Reads tokens up to an unquoted end character, which is consumed and not
    /// kept, or to the end of input, and adds them after those already held.
    ///
    /// Reads nothing from a stream that is not good. A quoted or escaped end
    /// character is a token like any other.
    ///
    /// Cursor: as after `KvoToken::Read` of each token; a last token that runs
    ///         into the end of input is kept.
    void Append(std::istream& in);

    /// Replaces the tokens by those that `Append` reads.
    void Read(std::istream& in) override;

    /// Writes the tokens without quotes, one space between two.
    void Write(std::ostream& out) override;

    /// Writes each token with its own `WriteQuoted`, one space between two.
    virtual void WriteQuoted(std::ostream& out);

    /// Gives the number of tokens.
    int Count() const { return count; }

    /// Finds the first token whose text equals `text`.
    ///
    /// Owner:   the list.
    /// Returns: null if there is none, also for a null text.
    KvoToken* Find(const char* text) const;

    /// Finds the token at `index`.
    ///
    /// Owner:   the list.
    /// Returns: null outside 0 .. `Count()` - 1.
    KvoToken* Find(int index) const;

    /// Finds the position of the first token whose text equals `text`.
    ///
    /// Returns: -1 if there is none, also for a null text.
    int FindPos(const char* text) const;

    /// Sets the first token equal to `old_text` to `text`, unquoted.
    ///
    /// Returns: 1, or 0 if there is none.
    int Replace(const char* old_text, const char* text);

    /// Sets the token at `index` to `text`, unquoted.
    ///
    /// Returns: 1, or 0 if the index is out of range.
    int Replace(int index, const char* text);

    /// Gives the text of the token at `index`.
    ///
    /// Owner:   the token.
    /// Returns: null if the index is out of range.
    const char* ArgText(int index) const;

    /// Converts the token at `index` to an integer as `atoi` does in the
    /// classic locale.
    ///
    /// Returns: 0 if the index is out of range or no number leads the text.
    int ArgInt(int index) const;

    /// Converts the token at `index` to a float as `atof` does in the classic
    /// locale, narrowed to single precision.
    ///
    /// Returns: 0.0 if the index is out of range or no number leads the text.
    float ArgFloat(int index) const;

protected:
    /// Adds a token that holds a copy of `text`, unquoted; null is the empty
    /// text.
    ///
    /// Owner:   the list.
    /// Returns: the token; null when there is no memory.
    KvoToken* append_token(const char* text);

    /// Deletes `removed` tokens from position `index` on.
    ///
    /// Requires: 0 <= index, 0 <= removed, index + removed <= `Count()`.
    void remove_tokens(int index, int removed);

    /// Gives the token at `index`.
    ///
    /// Requires: the position is in the list.
    KvoToken* token_at(int index) const;

    /// Exchanges two tokens.
    ///
    /// Requires: both positions are in the list.
    void swap_tokens(int one, int other);

    /// How the reading of a run went.
    enum class Run {
        Plain, ///< Every token is made of a few ordinary characters, the first
               ///< of them not the mark.
        Mixed, ///< There may be others.
        Cut    ///< There was no memory for a token; the rest was dropped.
    };

    /// Reads as `Append` does and says what sort of tokens were added.
    Run append_run(std::istream& in, char mark);

private:
    friend class KvoTokenReader;
    static constexpr std::size_t most_spare_text_bytes = 256;

    KvoToken* spare_token();
    KvoToken* make_spare_token();
    void copy_tokens(const KvoTokenList& other);
    void trim_spares(int fresh);
    bool is_end_character(char character) const;
    bool ends_run(const KvoToken& token) const;

    KvoToken model; ///< What every token that is read starts as a copy of.
    /// The list's tokens, then spare ones that wait for their next use, so
    /// that reading statement after statement needs no memory.
    KvoObjArray tokens;
    int count; ///< How many of `tokens` are the list's.
    /// Whether a token may have come to hold a text too long for a spare one.
    mutable bool long_texts;
    char* end; ///< The end characters, the list's own copy.
};

inline KvoToken* KvoTokenList::token_at(int index) const
{
    return static_cast<KvoToken*>(static_cast<KvoObject**>(tokens.data)[index]);
}

inline void KvoTokenList::swap_tokens(int one, int other)
{
    KvoObject** all = static_cast<KvoObject**>(tokens.data);
    KvoObject* kept = all[one];
    all[one] = all[other];
    all[other] = kept;
}

// Gives the first token behind the list's own, like the model in all but its
// text and quote character, which the caller sets; null when there is no memory
// for one.
inline KvoToken* KvoTokenList::spare_token()
{
    KvoToken* token =
        count < tokens.size ? token_at(count) : make_spare_token();
    if (token) {
        token->table = model.table;
        token->modified = 0;
    }
    return token;
}

inline bool KvoTokenList::is_end_character(char character) const
{
    for (const char* c = end; c && *c; ++c)
        if (*c == character)
            return true;
    return false;
}

inline bool KvoTokenList::ends_run(const KvoToken& token) const
{
    return !token.quote &&
           (token.length == 0 || is_end_character(token.text[0]));
}

#endif
