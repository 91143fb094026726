#include "core/format_text.h"

#include <charconv>
#include <cstdio>
#include <cstring>
#include <new>
#include <system_error>

namespace {

/// Composes what nearly every format asks for: %d, %i, %u, their long forms,
/// %s, %c and %%, with no flag, width or precision. That takes a fifth of what
/// the system takes, which has to be ready for everything.
class PlainText
{
public:
    PlainText(char* begin, char* end) : next(begin), last(end - 1) {}

    /// Returns: the end of the text, where a NUL stands; null if the format
    ///          asks for more or the room is too small: the system then does
    ///          all of it.
    char* compose(const char* format, va_list arguments);

private:
    bool put(char character)
    {
        if (next == last)
            return false;
        *next++ = character;
        return true;
    }

    // A NUL would end the text.
    bool put_if_any(char character)
    {
        return character != '\0' && put(character);
    }

    bool put(const char* text)
    {
        if (!text)
            return false;
        // Most texts are shorter than the time that two calls take.
        for (int i = 0; i < 16; ++i, ++text) {
            if (*text == '\0')
                return true;
            if (!put(*text))
                return false;
        }
        const std::size_t length = std::strlen(text);
        if (length > static_cast<std::size_t>(last - next))
            return false;
        std::memcpy(next, text, length);
        next += length;
        return true;
    }

    template <class Number>
    bool put_number(Number number)
    {
        const auto result = std::to_chars(next, last, number);
        next = result.ptr;
        return result.ec == std::errc();
    }

    char* next;
    char* const last; ///< Where a NUL fits still.
};

char* PlainText::compose(const char* format, va_list arguments)
{
    bool fits = true;
    for (; fits && *format != '\0'; ++format) {
        if (*format != '%') {
            fits = put(*format);
            continue;
        }
        const bool is_long = *++format == 'l';
        if (is_long)
            ++format;
        if (*format == 'd' || *format == 'i')
            fits = is_long ? put_number(va_arg(arguments, long))
                           : put_number(va_arg(arguments, int));
        else if (*format == 'u')
            fits = is_long ? put_number(va_arg(arguments, unsigned long))
                           : put_number(va_arg(arguments, unsigned));
        else if (*format == 's' && !is_long)
            fits = put(va_arg(arguments, const char*));
        else if (*format == 'c' && !is_long)
            fits = put_if_any(static_cast<char>(va_arg(arguments, int)));
        else if (*format == '%' && !is_long)
            fits = put('%');
        else
            return nullptr;
    }
    *next = '\0';
    return fits ? next : nullptr;
}

} // namespace

zt_core::FormattedText::FormattedText(std::string_view prefix,
                                      const char* format, va_list arguments)
    : text(local)
{
    if (!format)
        format = "";
    prefix.copy(local, prefix.size());
    char* const begin = local + prefix.size();
    va_list again;
    va_copy(again, arguments);
    const char* end =
        PlainText(begin, local + sizeof local).compose(format, again);
    va_end(again);
    if (!end) {
        let_the_system(prefix.size(), format, arguments);
        end = text + std::strlen(text);
    }
    length = static_cast<std::size_t>(end - text);
}

void zt_core::FormattedText::let_the_system(std::size_t prefix,
                                            const char* format,
                                            va_list arguments)
{
    va_list again;
    va_copy(again, arguments);
    const int needed = std::vsnprintf(local + prefix, sizeof local - prefix,
                                      format, arguments);
    const std::size_t bytes =
        prefix + 1 +
        (needed < 0 ? std::strlen(format) : static_cast<std::size_t>(needed));
    std::size_t room = sizeof local;
    if (bytes > room)
        longer.reset(new (std::nothrow) char[bytes]);
    if (longer) {
        std::memcpy(longer.get(), local, prefix);
        text = longer.get();
        room = bytes;
    }
    char* const begin = (longer ? longer.get() : local) + prefix;
    if (needed < 0)
        std::snprintf(begin, room - prefix, "%s", format);
    else if (longer)
        std::vsnprintf(begin, room - prefix, format, again);
    va_end(again);
}
