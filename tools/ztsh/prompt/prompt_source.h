#ifndef ZTSH_PROMPT_PROMPT_SOURCE_H
#define ZTSH_PROMPT_PROMPT_SOURCE_H

/// \file
/// Statements typed at a prompt.
///
/// The statement reader itself asks for the next line when it needs one, so a
/// statement goes on over lines exactly as it does in a script.

#include "prompt/line_editor.h"
#include "prompt/quote_state.h"
#include "script/source.h"

#include <istream>
#include <streambuf>
#include <string>

namespace ztsh {

/// Asks a line editor for statements.
class PromptSource : public StatementSource
{
public:
    static constexpr const char* first_prompt = "ztsh> ";
    static constexpr const char* further_prompt = "....> ";

    /// Requires: `line_editor` outlives the source.
    explicit PromptSource(LineEditor& line_editor);

    /// Reads a statement; one that is cancelled takes back the whole line and
    /// those that it continues.
    Next Read(KvoStatement& statement) override;

    /// Names no place: the user sees what was typed.
    Place Where() override { return {}; }

    /// Changes to the prompt of further lines inside a block.
    void EnterBlock(int depth) override { block_depth = depth; }

private:
    /// Fetches a line whenever the last one is used up.
    class Buffer : public std::streambuf
    {
    public:
        explicit Buffer(PromptSource& own_source);

        /// Throws away what is left of the line.
        void Drop();

    protected:
        int_type underflow() override;

    private:
        PromptSource& source;
        std::string line; ///< One character to go back to, then the line.
    };

    LineEditor& editor;
    Buffer buffer;
    std::istream in;
    QuoteState quotes;
    int block_depth = 0;
    bool cancelled = false;
};

} // namespace ztsh

#endif
