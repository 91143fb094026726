#ifndef ZT_PAGES_PAGES_H
#define ZT_PAGES_PAGES_H

/// \file
/// Pages about a program: the manual, and what the shells complete.

#include "pages/command.h"

#include <iosfwd>

namespace zt_pages {

/// Writes the source of the manual page, of section 1.
void WriteManual(std::ostream& out, const Command& command);

/// Write the completions for one shell each.
void WriteBashCompletion(std::ostream& out, const Command& command);
void WriteZshCompletion(std::ostream& out, const Command& command);
void WriteFishCompletion(std::ostream& out, const Command& command);

/// Writes the page of a kind: `man`, `bash`, `zsh` or `fish`.
void Write(std::ostream& out, const std::string& kind, const Command& command);

} // namespace zt_pages

#endif
