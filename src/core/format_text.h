#ifndef ZT_CORE_FORMAT_TEXT_H
#define ZT_CORE_FORMAT_TEXT_H

/// \file
/// A `printf` format and its arguments turned into text of any length, the
/// ordinary length without allocating.

#include <cstdarg>
#include <memory>

namespace zt_core {
/// The formatted text, for as long as this object lives.
class FormattedText
{
public:
    /// Formats; the caller ends `arguments` as usual. A null format is the
    /// empty one. A format that the system refuses comes out as it stands.
    FormattedText(const char* format, va_list arguments)
        __attribute__((format(printf, 2, 0)));

    FormattedText(const FormattedText&) = delete;
    FormattedText& operator=(const FormattedText&) = delete;

    /// Gives the text, never null; cut to 1023 characters when there is no
    /// memory for more.
    const char* Text() const { return text; }

private:
    char local[1024];
    std::unique_ptr<char[]> longer;
    const char* text;
};
} // namespace zt_core

#endif
