#ifndef ZT_CORE_FORMAT_TEXT_H
#define ZT_CORE_FORMAT_TEXT_H

/// \file
/// A `printf` format and its arguments turned into text of any length, the
/// ordinary length without allocating.

#include <cstdarg>
#include <cstddef>
#include <memory>
#include <string_view>

namespace zt_core {
/// The formatted text, for as long as this object lives.
class FormattedText
{
public:
    /// Formats, behind `prefix`; the caller ends `arguments` as usual. A null
    /// format is the empty one. A format that the system refuses comes out as
    /// it stands.
    ///
    /// Requires: `prefix` has at most 100 characters and no NUL.
    FormattedText(std::string_view prefix, const char* format,
                  va_list arguments) __attribute__((format(printf, 3, 0)));

    FormattedText(const FormattedText&) = delete;
    FormattedText& operator=(const FormattedText&) = delete;

    /// Gives the text, never null; cut to 1023 characters when there is no
    /// memory for more.
    const char* Text() const { return text; }

    /// Gives the same with its length.
    std::string_view View() const { return {text, length}; }

private:
    void let_the_system(std::size_t prefix, const char* format,
                        va_list arguments)
        __attribute__((format(printf, 3, 0)));

    char local[1024];
    std::unique_ptr<char[]> longer;
    const char* text;
    std::size_t length;
};
} // namespace zt_core

#endif
