#ifndef ZT_CORE_WRITE_TEXT_H
#define ZT_CORE_WRITE_TEXT_H

/// \file
/// Writing of text as it stands: no width, no fill, and no throwing, whatever
/// the stream's owner has set.

#include <ostream>
#include <string_view>

namespace zt_core {
/// Writes the characters of `text`.
///
/// A stream that its owner told to throw does not throw from here; its state
/// bits say what happened.
inline void write_text(std::ostream& out, std::string_view text)
{
    try {
        out.write(text.data(), static_cast<std::streamsize>(text.size()));
    } catch (...) {
        // The state bits tell.
    }
}

/// Writes one character in the same way.
inline void write_character(std::ostream& out, char character)
{
    try {
        out.put(character);
    } catch (...) {
        // The state bits tell.
    }
}
} // namespace zt_core

#endif
