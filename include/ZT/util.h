#ifndef ZT_UTIL_H
#define ZT_UTIL_H

/// \file
/// Strings and small numbers: owned copies, temporary strings, formatting and
/// quoting, integers with size suffixes, a hash, divisors and multiples.
///
/// A temporary string is freed by the library, not by its user: it lives
/// through 99 further temporary strings, and the 100th further one frees it.
/// Nearly every accessor that computes a text returns one, so a text that is
/// to be kept must be copied. None of this may be used by two threads at once,
/// nor in a signal handler.

#include <ZT/common.h>
#include <ZT/signals.h>

/// Copies `text` into a string of its own with room for `extra` more
/// characters.
///
/// A null `text` gives an empty string.
///
/// Units:   `extra` in bytes; below 0 counts as 0.
/// Owner:   the caller, who frees it with `delete[]`.
/// Returns: the copy; null only when there is no memory.
ZT_API char* ZtNewString(const char* text, int extra = 0);

/// Copies `text` into a temporary string with room for `extra` more
/// characters.
///
/// `text` may itself be a temporary string, also the one that is freed here.
///
/// Units:   `extra` in bytes; below 0 counts as 0.
/// Owner:   the library; the result lives through 99 further temporary
///          strings.
/// Returns: the copy. When there is no memory an empty text without room, or
///          null if `extra` bytes were asked for.
ZT_API char* ZtNewTempString(const char* text, int extra = 0);

/// Formats like `printf` into a temporary string of any length.
///
/// A format that the system refuses comes out as it stands. Null is the empty
/// format.
///
/// Owner:   the library; the result lives through 99 further temporary
///          strings.
/// Returns: the text, never null; cut to 1023 characters when there is no
///          memory for more.
ZT_API char* ZtFmt(const char* format, ...)
    __attribute__((format(printf, 1, 2)));

/// Wraps `text` in `open` and `close` if it needs quoting.
///
/// It needs it when `specials` is null, when `text` holds one of the
/// `specials`, or when `text` is empty or null.
///
/// Owner:   `text` itself when nothing is needed; otherwise a temporary
///          string, which lives through 99 further ones.
/// Returns: the text, quoted or as it was, never null.
ZT_API const char* ZtQuote(const char* text, char open, char close,
                           const char* specials);

/// Reads an integer that may carry size suffixes.
///
/// Decimal, 0x hexadecimal and 0 octal are understood. Each K or k that
/// follows shifts the value left by 10, each M or m by 20; the first other
/// character ends the reading, and what follows is ignored. Shifted bits fall
/// out at the top.
///
/// Units:   4k is 4096; numbers beyond the range of int are its nearest end.
/// Returns: the value, counting from 1 when there is no digit: a lone K is
///          1024, the empty text and null are 1.
ZT_API int ZtScanInteger(const char* text);

/// Removes `argv[index]` by moving each later entry one place down, and
/// decreases `argc` by one.
///
/// The place that becomes free at the end is set to null. An index outside the
/// vector changes nothing.
///
/// Owner: the removed text stays with whoever made it.
ZT_API void ZtEatArg(int& argc, char** argv, int index);

/// Hashes the bytes of `text`: from 0, each byte turns the hash into hash * 33
/// + byte, modulo 2^32.
///
/// Returns: the hash; 0 for the empty text and for null.
ZT_API std::uint32_t ZtHash(const char* text);

/// Finds the greatest common divisor by repeated remainders.
///
/// Returns:   the divisor with the sign that the remainders give it; `a` when
///            `b` is 0.
/// By design: no absolute value is taken
///            (ZtGCD.KeepsTheSignThatTheRemaindersGive).
ZT_API int ZtGCD(int a, int b);

/// The same for long operands.
ZT_API long ZtGCD(long a, long b);

/// Finds the least common multiple: the product, divided by the greatest
/// common divisor.
///
/// Returns:   the multiple; 0 when both operands are 0.
/// By design: the product is formed first, in the width of the operands, and
///            wraps around when it is too large
///            (ZtLCM.FormsTheProductFirstAndWraps).
ZT_API int ZtLCM(int a, int b);

/// The same for long operands.
ZT_API long ZtLCM(long a, long b);

#endif
