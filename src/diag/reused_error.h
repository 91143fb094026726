#ifndef ZT_DIAG_REUSED_ERROR_H
#define ZT_DIAG_REUSED_ERROR_H

/// \file
/// The errors that this library makes itself. Nearly all of the time that an
/// error takes goes into the making of its stream, so one that was deleted is
/// kept, whole, and is the next one that is made.

#include <initializer_list>
#include <string_view>

class ZtErr;

namespace zt_diag {

/// Makes an error of this text, the pieces one after the other: anew, or of the
/// error that was kept. It is counted, and deleted with `delete`.
///
/// An error is kept only while nobody has changed its stream in any way but by
/// writing text; a stream that has grown large is not kept either.
///
/// Owner:   the caller.
/// Returns: null when there is no memory for it and all of its text; that one
///          is counted too.
ZtErr* make_error(int code, int level, int system_error,
                  std::initializer_list<std::string_view> pieces);

/// Stands in for the text of an error that could not be kept.
inline constinit char no_text[1] = "";

} // namespace zt_diag

#endif
