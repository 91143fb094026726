#ifndef ZTSH_TIME_LIVE_LINE_H
#define ZTSH_TIME_LIVE_LINE_H

/// \file
/// A line that changes while somebody watches.

#include "script/idle.h"

#include <functional>
#include <string>

namespace ztsh {

/// Shows a line on standard output, drawn anew 25 times a second, until it has
/// `ended`, a key is hit or the wait is given up.
///
/// It is written once where there is nobody to hit a key, that is without a
/// terminal on standard input and one that can redraw on standard output.
void ShowLive(const std::function<std::string()>& line,
              const std::function<bool()>& ended, Idle& idle);

} // namespace ztsh

#endif
