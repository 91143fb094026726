#ifndef ZT_COMMAND_FOLD_CASE_H
#define ZT_COMMAND_FOLD_CASE_H

/// \file
/// Comparison of command words without regard to case, the same whatever the
/// locale: only the 26 letters of ASCII have a case.

namespace zt_command {
/// Gives the small letter for a capital one, everything else as it is.
inline unsigned folded(char character)
{
    const unsigned code = static_cast<unsigned char>(character);
    return code - 'A' < 26u ? code + ('a' - 'A') : code;
}

/// Compares two texts, a null one being the empty text.
///
/// Returns: below 0, 0 or above 0 as the first difference between the folded
///          bytes, taken as unsigned, says.
inline int compare_folded(const char* one, const char* other)
{
    one = one ? one : "";
    other = other ? other : "";
    for (;; ++one, ++other) {
        if (*one != *other) {
            const int difference = static_cast<int>(folded(*one)) -
                                   static_cast<int>(folded(*other));
            if (difference != 0)
                return difference;
        } else if (*one == '\0') {
            return 0;
        }
    }
}
} // namespace zt_command

#endif
