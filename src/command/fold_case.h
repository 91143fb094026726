#ifndef ZT_COMMAND_FOLD_CASE_H
#define ZT_COMMAND_FOLD_CASE_H

/// \file
/// Comparison of command words without regard to case, the same whatever the
/// locale: only the 26 letters of ASCII have a case.

namespace zt_command {
/// Gives the small letter for a capital one, everything else as it is.
inline int folded(char character)
{
    const int code = static_cast<unsigned char>(character);
    return code >= 'A' && code <= 'Z' ? code - 'A' + 'a' : code;
}

/// Compares two texts, a null one being the empty text.
///
/// Returns: below 0, 0 or above 0 as the first difference between the folded
///          bytes, taken as unsigned, says.
inline int compare_folded(const char* one, const char* other)
{
    one = one ? one : "";
    other = other ? other : "";
    while (*one && folded(*one) == folded(*other)) {
        ++one;
        ++other;
    }
    return folded(*one) - folded(*other);
}
} // namespace zt_command

#endif
