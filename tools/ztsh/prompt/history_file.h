#ifndef ZTSH_PROMPT_HISTORY_FILE_H
#define ZTSH_PROMPT_HISTORY_FILE_H

/// \file
/// The lines typed in earlier sessions, one a line of a file that only its
/// owner can read.

#include <string>
#include <vector>

namespace ztsh {

/// Gives the path of the history file: `ztsh/history` under $XDG_STATE_HOME if
/// that is an absolute path, else under `.local/state` in $HOME.
///
/// Returns: the empty text when neither is set.
std::string HistoryPath();

/// The history file. Without a path, or where no file can be made, everything
/// here does nothing.
class HistoryFile
{
public:
    /// How many lines a file keeps from one session to the next.
    static constexpr std::size_t most_lines = 1000;

    explicit HistoryFile(const std::string& file_path);

    /// Reads the lines, the oldest first; a file that has grown beyond
    /// `most_lines` is cut to the newest ones.
    std::vector<std::string> Load();

    /// Adds one line at the end, at once, so that sessions side by side and
    /// one that is killed lose nothing. Makes the file with mode 0600 and the
    /// directories that are missing with mode 0700.
    void Append(const std::string& line);

private:
    int open_file(int flags);

    std::string path;
};

} // namespace ztsh

#endif
