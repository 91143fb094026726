#ifndef ZTSH_PAGES_H
#define ZTSH_PAGES_H

/// \file
/// The shell's man page and its completions.

#include <ZT/directive.h>

#include <ostream>
#include <string>

namespace ztsh {

/// Writes the page of a kind, see `zt_pages::Write`, with the words that
/// `dispatcher` knows.
void WritePage(std::ostream& out, const std::string& kind,
               ZtDispatcher& dispatcher);

} // namespace ztsh

#endif
