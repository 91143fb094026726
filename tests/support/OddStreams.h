#ifndef ZT_TESTS_ODDSTREAMS_H
#define ZT_TESTS_ODDSTREAMS_H

#include <algorithm>
#include <cstddef>
#include <istream>
#include <memory>
#include <stdexcept>
#include <streambuf>
#include <string>
#include <utility>

/// Hands its text out with nothing in view: each character is a call of its
/// own, as with unbuffered devices. Takes characters back if told to.
class OneByOneBuffer : public std::streambuf
{
public:
    explicit OneByOneBuffer(std::string bytes, bool takes_characters_back)
        : text(std::move(bytes)), forgiving(takes_characters_back)
    {}

protected:
    int_type underflow() override
    {
        return next < text.size() ? traits_type::to_int_type(text[next])
                                  : traits_type::eof();
    }
    int_type uflow() override
    {
        const int_type character = underflow();
        if (next < text.size())
            ++next;
        return character;
    }
    int_type pbackfail(int_type character) override
    {
        if (!forgiving || next == 0)
            return traits_type::eof();
        --next;
        return traits_type::not_eof(character);
    }

private:
    std::string text;
    bool forgiving;
    std::size_t next = 0;
};

/// Shows its text in chunks whose sizes go down from `largest_chunk` to 1 and
/// round again. Throws once it comes to the character `throws_at`.
class ChunkBuffer : public std::streambuf
{
public:
    explicit ChunkBuffer(std::string bytes, std::size_t largest_chunk,
                         std::size_t throws_at = std::string::npos)
        : text(std::move(bytes)), largest(largest_chunk), fault(throws_at)
    {}

protected:
    int_type underflow() override
    {
        if (next >= fault)
            throw std::runtime_error("the device is gone");
        if (next == text.size())
            return traits_type::eof();
        size = size > 1 ? size - 1 : largest;
        const std::size_t bytes = std::min(size, text.size() - next);
        // A block of its own: what lies outside of it is nobody's business.
        chunk = std::make_unique<char[]>(bytes);
        text.copy(chunk.get(), bytes, next);
        next += bytes;
        setg(chunk.get(), chunk.get(), chunk.get() + bytes);
        return traits_type::to_int_type(*gptr());
    }

private:
    std::string text;
    std::size_t largest;
    std::size_t fault;
    std::size_t size = 0;
    std::size_t next = 0;
    std::unique_ptr<char[]> chunk;
};

/// A stream that owns its buffer.
template <typename Buffer>
class StreamOf : public std::istream
{
public:
    template <typename... Arguments>
    explicit StreamOf(Arguments&&... arguments)
        : std::istream(nullptr), buffer(std::forward<Arguments>(arguments)...)
    {
        rdbuf(&buffer);
    }

private:
    Buffer buffer;
};

/// Takes everything that is left, whatever the state.
inline std::string RestOf(std::istream& in)
{
    in.exceptions(std::ios::goodbit);
    in.clear();
    std::string rest;
    try {
        for (char c; in.get(c);)
            rest.push_back(c);
    } catch (...) {
        rest += "(thrown)";
    }
    return rest;
}

#endif
