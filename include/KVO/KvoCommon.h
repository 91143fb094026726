#ifndef KVO_KVOCOMMON_H
#define KVO_KVOCOMMON_H

/// \file
/// What every header of the library starts from: the export mark and the two
/// string makers of the core object layer.
///
/// The `Kvo` functions behave exactly as their `Zt` namesakes in ZT/util.h;
/// hosts that are written against the core layer alone need only these.

#include <cstddef>
#include <iosfwd>

/// Marks what the shared library shows to hosts and plug-ins; everything else
/// stays hidden inside it.
#define ZT_API __attribute__((visibility("default")))

/// Copies `text` into a string of its own with room for `extra` more
/// characters.
///
/// A null `text` gives an empty string.
///
/// Units:   `extra` in bytes; below 0 counts as 0.
/// Owner:   the caller, who frees it with `delete[]`.
/// Returns: the copy; null only when there is no memory.
ZT_API char* KvoNewString(const char* text, int extra = 0);

/// Wraps `text` in `open` and `close` if it needs quoting.
///
/// It needs it when `specials` is null, when `text` holds one of the
/// `specials`, or when `text` is empty or null.
///
/// Owner:   `text` itself when nothing is needed; otherwise a temporary
///          string that lives through 99 further ones.
/// Returns: the text, quoted or as it was, never null.
ZT_API const char* KvoQuote(const char* text, char open, char close,
                            const char* specials);

#endif
