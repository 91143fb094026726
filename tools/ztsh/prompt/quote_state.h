#ifndef ZTSH_PROMPT_QUOTE_STATE_H
#define ZTSH_PROMPT_QUOTE_STATE_H

/// \file
/// Whether the lines typed so far make whole statements.

#include <string_view>

namespace ztsh {

/// Follows quotes and escapes as the tokenizer does, comments included: there
/// too a quote goes on until its like comes.
class QuoteState
{
public:
    /// Takes further characters.
    void Add(std::string_view text);

    /// Tells whether a quote is open or the last newline was escaped.
    bool Open() const { return quote != '\0' || escaped || continued; }

    /// Gives the quote character that is open, 0 if none is.
    char Quote() const { return quote; }

private:
    char quote = '\0';
    bool escaped = false;   ///< The next character is literal.
    bool continued = false; ///< The last character was an escaped newline.
};

} // namespace ztsh

#endif
