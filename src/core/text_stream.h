#ifndef ZT_CORE_TEXT_STREAM_H
#define ZT_CORE_TEXT_STREAM_H

/// \file
/// A text in memory read as a stream, without copying it.

#include <cstring>
#include <istream>
#include <streambuf>

namespace zt_core {
/// Reads a text that somebody else keeps.
class TextStream : public std::istream
{
public:
    /// Reads `text` up to its NUL; null is the empty text.
    ///
    /// Owner: the caller, who keeps the text while this stream is in use.
    explicit TextStream(const char* text) : std::istream(nullptr), buffer(text)
    {
        rdbuf(&buffer);
    }

private:
    class Buffer : public std::streambuf
    {
    public:
        explicit Buffer(const char* text)
        {
            // Nothing is ever written through these pointers: putting back a
            // character that differs is refused by the base.
            char* const begin = const_cast<char*>(text ? text : "");
            setg(begin, begin, begin + std::strlen(begin));
        }
    };

    Buffer buffer;
};
} // namespace zt_core

#endif
