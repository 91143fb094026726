#ifndef ZT_CORE_NUMBER_TEXT_H
#define ZT_CORE_NUMBER_TEXT_H

/// \file
/// Numbers to text and back for the rooms of the library: the one place where
/// an argument, a property or a time text becomes a number.
///
/// Nothing here depends on the locale of the process: the decimal sign is
/// always a point, and thousands are never grouped.

#include <string>

namespace zt_core {
/// Reads a decimal integer as `atoi` does.
///
/// Returns: the number; 0 for null and for text that begins with none. A
///          number beyond the range of long is taken as its nearest end; what
///          is beyond the range of int keeps its low 32 bits.
int text_to_int(const char* text);

/// Reads a floating number as `atof` does; callers that need single precision
/// narrow the result.
///
/// Returns: the number; 0 for null and for text that begins with none; an
///          infinity when it is too large.
double text_to_float(const char* text);

/// Writes an integer in decimal.
std::string int_to_text(int value);

/// Writes a number as a stream with its defaults does: six significant digits,
/// no trailing zeros (2.5, 1e+06, 123457).
std::string float_to_text(double value);
} // namespace zt_core

#endif
