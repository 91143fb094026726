#ifndef KVO_KVOSTATEMENT_H
#define KVO_KVOSTATEMENT_H

/// \file
/// Statements of the command language: a command word and its arguments, read
/// from a script or built by a program.
///
/// Surprising: a statement that runs into the end of input, because its last
/// line has no newline and no ";", keeps its comment and continuation tokens
/// and leaves the stream failed. Scripts end with a newline.

#include <KVO/KvoToken.h>

#include <iosfwd>

/// A command word followed by arguments.
///
/// In a script, blanks separate words and an unquoted ";" or newline ends the
/// statement. A word that begins with "!" or "#" begins a comment up to the
/// statement's end. A backslash before a newline continues the statement on
/// the next line, which must begin with a blank. Empty statements are skipped.
///
/// Statements compare by their command word, ignoring case; `Matches` and the
/// look-ups by text mind the case. Taking arguments one by one from the front
/// uses position 1 each time, since later ones move down.
class ZT_API KvoStatement : public KvoTokenList
{
public:
    /// Makes an empty statement or, if `text` is not null, one of the single
    /// word `text`, blanks and all: it is not split.
    explicit KvoStatement(const char* text = nullptr);

    /// Makes a statement of the words argv[0] to argv[argc - 1], unsplit.
    KvoStatement(int argc, const char* const* argv);

    /// Reads one statement that is not empty and adds its words after those
    /// already held.
    ///
    /// Comments and continuations are dropped, over the whole statement.
    ///
    /// Cursor:    behind the end character; at the end of input the stream's
    ///            end and fail bits are set.
    /// By design: a word that was quoted begins a comment all the same
    ///            (KvoStatement.AQuotedHashBeginsACommentToo); of two
    ///            continuations in a row the second stays
    ///            (KvoStatement.TheSecondOfTwoContinuationsStays); a statement
    ///            that ends at the end of input is not cleaned
    ///            (KvoStatement.AtTheEndOfInputCommentsStay); quotes count in
    ///            comments
    ///            (KvoStatement.AnApostropheInACommentSwallowsUpToTheNext).
    void Append(std::istream& in);

    /// Empties the statement, then does as `Append`.
    void Read(std::istream& in) override;

    /// Gives the command word; cast it to `const char*`.
    ///
    /// Owner:   the first token, or static for an empty statement.
    /// Returns: the empty text when there is no word, never null.
    void* Key() override;

    /// Compares the command word with `key`, a NUL-terminated string, ignoring
    /// the case of ASCII letters; a null key is the empty text.
    int Compare(void* key) override;

    /// Tells whether the word at `index` is `text`, case included.
    ///
    /// Returns: 1 or 0; 0 for null and out of range.
    int Matches(const char* text, int index);

    /// Adds `text` as one word, unsplit and unquoted; null is the empty word.
    void AddArg(const char* text);

    /// Adds `value` in decimal.
    void AddArg(int value);

    /// Adds `value` with up to six significant digits, in the classic locale.
    void AddArg(float value);

    /// Narrows `value` to single precision and adds it.
    void AddArg(double value);

    /// Removes the first word equal to `text`.
    ///
    /// Returns: its former position; -1 if there is none, also for null.
    int Extract(const char* text);

    /// Removes the word at `index` and gives a copy of it.
    ///
    /// Owner:   the caller, who frees it with `delete[]`.
    /// Returns: null if the index is out of range.
    char* ExtractText(int index);

    /// Removes the word at `index` and gives its value as `ArgInt` does.
    ///
    /// Returns: 0 if the index is out of range.
    int ExtractInt(int index);

    /// Removes the word at `index` and gives its value as `ArgFloat` does.
    ///
    /// Returns: 0.0 if the index is out of range.
    float ExtractFloat(int index);

    /// Removes the word at `index`; does nothing if it is out of range.
    void EatArg(int index);

private:
    int drop_comments_and_continuations();
};

/// Skips the statements of a block whose opening "begin" has been read, up to
/// and including the "end" that belongs to it.
///
/// Blocks inside the block are skipped with it; "begin" and "end" mind the
/// case. The end of input ends the skipping without complaint.
///
/// Cursor: behind the statement "end".
ZT_API void ZtEatBeginEndBlock(std::istream& in);

#endif
