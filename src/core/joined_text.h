#ifndef ZT_CORE_JOINED_TEXT_H
#define ZT_CORE_JOINED_TEXT_H

/// \file
/// Several pieces of text put into one, without ever throwing.

#include <algorithm>
#include <initializer_list>
#include <memory>
#include <new>
#include <string_view>

namespace zt_core {
/// Joins the pieces into a NUL-terminated text; null when there is no memory.
inline std::unique_ptr<char[]>
joined_text(std::initializer_list<std::string_view> pieces)
{
    std::size_t length = 0;
    for (const std::string_view piece : pieces)
        length += piece.size();
    std::unique_ptr<char[]> text(new (std::nothrow) char[length + 1]);
    char* end = text.get();
    if (!end)
        return text;
    for (const std::string_view piece : pieces)
        end = std::copy(piece.begin(), piece.end(), end);
    *end = '\0';
    return text;
}
} // namespace zt_core

#endif
