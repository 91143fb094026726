#ifndef ZTSH_PROMPT_LINE_EDITOR_H
#define ZTSH_PROMPT_LINE_EDITOR_H

/// \file
/// Lines typed at a terminal, with editing, history and completion.

#include "script/idle.h"

#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace ztsh {

/// What came of asking for a line.
enum class Typed {
    Line,      ///< There is one.
    End,       ///< The user ended the input, or a signal ends the shell.
    Cancelled, ///< The user took the line back.
};

/// Asks for lines.
class LineEditor
{
public:
    LineEditor() = default;
    LineEditor(const LineEditor&) = delete;
    LineEditor& operator=(const LineEditor&) = delete;
    virtual ~LineEditor() = default;

    /// Shows `prompt` and takes a line, without its newline.
    virtual Typed Ask(const std::string& prompt, std::string& line) = 0;
};

/// Gives the command words to complete with.
using WordLister = std::function<std::vector<std::string>()>;

/// Makes the line editor of the terminal on standard input. Lines are kept in
/// the history file `history_path`, unless that is empty. While it waits for a
/// key it does what there is to do in `waiting_idle`, with the line out of the
/// way.
///
/// Requires: `waiting_idle` outlives the editor.
std::unique_ptr<LineEditor> MakeTerminalEditor(const std::string& history_path,
                                               WordLister words,
                                               Idle& waiting_idle);

} // namespace ztsh

#endif
