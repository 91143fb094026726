#ifndef ZT_PLATFORM_NUMBER_H
#define ZT_PLATFORM_NUMBER_H

/// \file
/// Numbers read from text the same way whatever locale the process has chosen.

namespace zt_platform {
/// Reads as `strtol` in base 10 does in the classic locale: blanks, a sign,
/// digits, then anything.
///
/// Requires: `text` is not null.
/// Returns:  the number, 0 without digits, the nearest end of the range of
///           long when it is too large.
long parse_long(const char* text);

/// Reads as `strtod` does in the classic locale: the decimal sign is a point;
/// hexadecimal numbers, infinity and nan are understood.
///
/// Requires: `text` is not null.
/// Returns:  the number, 0 without digits, an infinity when it is too large.
double parse_double(const char* text);
} // namespace zt_platform

#endif
