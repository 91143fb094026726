#ifndef ZTSH_SCRIPT_SCRIPT_BUFFER_H
#define ZTSH_SCRIPT_SCRIPT_BUFFER_H

/// \file
/// The characters of a script on their way to the statement reader, with the
/// line numbers that reports need.
///
/// A block of the script stands in the stream buffer as it was read, so the
/// tokenizer scans it in place. Lines are counted when somebody asks, and once
/// a block when the next one takes its place.

#include "script/idle.h"

#include <streambuf>
#include <string>
#include <vector>

namespace ztsh {

/// A stream buffer over a file descriptor or a text.
class ScriptBuffer : public std::streambuf
{
public:
    /// Reads from `script_descriptor`, which stays the caller's; while it
    /// waits, does what there is to do in `waiting_idle`, if that is not null.
    ///
    /// A caught signal that asks the shell to stop is the end of the input, as
    /// is a wait that is given up.
    ///
    /// Requires: `waiting_idle` outlives the buffer.
    explicit ScriptBuffer(int script_descriptor, Idle* waiting_idle = nullptr);

    /// Reads a copy of `text`.
    explicit ScriptBuffer(const std::string& text);

    /// Remembers that the next character is the first one of a statement.
    void Mark();

    /// Gives the line of the mark, counted from 1.
    long MarkedLine();

protected:
    int_type underflow() override;

private:
    void show_block(std::size_t bytes);
    long line_of(const char* place);
    std::size_t read_more();

    int descriptor;          ///< -1 for a text.
    Idle* idle;              ///< Null for none.
    std::vector<char> block; ///< One character to go back to, then the block.
    const char* mark;        ///< In the block, or null.
    long mark_line;          ///< Of a mark that is no longer in the block.
    long lines_before;       ///< Newlines before the block.
    const char* counted_to;  ///< In the block.
    long counted;            ///< Newlines from the block's start to there.
};

} // namespace ztsh

#endif
