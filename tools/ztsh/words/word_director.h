#ifndef ZTSH_WORDS_WORD_DIRECTOR_H
#define ZTSH_WORDS_WORD_DIRECTOR_H

/// \file
/// What the shell's own directors have in common: a table of words that checks
/// the number of arguments and answers `Help`.

#include <ZT/directive.h>

#include <ostream>
#include <string>
#include <vector>

namespace ztsh {

/// A command word. Its place in a director's table is its selector.
struct Word
{
    const char* name;
    const char* arguments; ///< As `Help` shows them; empty for none.
    const char* help;      ///< What it does, lines parted by newlines.
    int least = 0;         ///< Arguments it needs.
    int most = 0;          ///< Arguments it takes.
};

/// How much `Info` writes about a word.
enum InfoNumber : int {
    InfoUsage = 0, ///< One line: four blanks, the word and its arguments.
    InfoHelp = 1,  ///< After that, eight blanks and each line of its help.
};

/// Writes about `word` as much as `number` says.
void WriteInfo(std::ostream& out, const Word& word, int number);

/// A director that registers the words of a table.
class WordDirector : public ZtDirector
{
public:
    /// Requires: `word_table` outlives the director.
    WordDirector(ZtDispatcher& home_dispatcher,
                 const std::vector<Word>& word_table);

    /// Carries a statement out if the number of its arguments is right.
    ///
    /// Reports: an error that says what was expected if it is not.
    void Act(KvoStatement* statement, int selector) final;

    void Info(std::ostream& out, char* name, int selector, int number) final;

protected:
    /// What `AddEach` is given by a director that wants to see every
    /// statement.
    static constexpr int each_selector = -1;

    /// Carries out a statement whose number of arguments is right.
    virtual void Do(KvoStatement& statement, int selector) = 0;

    /// Sees every statement before its word; does nothing here.
    virtual void SeeEach(KvoStatement& statement);

    /// Reports an error that says how the word of `selector` is used.
    void Expected(int selector) const;

private:
    const std::vector<Word>& table;
};

/// Reads a whole decimal number.
///
/// Returns: false, with `number` as it was, if `text` is anything else or
///          outside `least` to `most`.
bool ReadNumber(const char* text, long least, long most, long& number);

/// Reads a number with or without a fraction likewise.
bool ReadReal(const char* text, double least, double most, double& number);

} // namespace ztsh

#endif
