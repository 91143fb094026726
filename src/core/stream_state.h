#ifndef ZT_CORE_STREAM_STATE_H
#define ZT_CORE_STREAM_STATE_H

/// \file
/// What a string stream is like apart from its text, to tell whether anybody
/// has changed it.
///
/// A stream that is as it was made can be used again, which is ten times
/// cheaper than another one. Much of what its user may change cannot be seen
/// from outside (callbacks, words of the user's own, the mode of the buffer),
/// so this looks at the members behind it. Where it does not know their names
/// it says that every stream was changed.

#include <cstddef>
#include <cstring>
#include <locale>
#include <sstream>

namespace zt_core {
/// The state of one string stream at the time of its making.
class StreamState
{
public:
    /// Notes the state of a stream that only text was written to yet.
    explicit StreamState(const std::ostringstream& fresh);

    /// Tells whether the stream is in this state, whatever its text, and keeps
    /// at most `most_bytes` of memory for it.
    bool is_that_of(const std::ostringstream& stream,
                    std::size_t most_bytes) const;

    /// Tells whether a stream that is made now would have the same locale.
    bool is_of_this_locale() const { return is(std::locale(), locale); }

private:
    bool shows_no_change(const std::ostringstream& stream) const;

    // A locale is a handle: the same bytes are the same locale, and that is
    // nearly always so. The comparison itself is a call.
    static bool is(const std::locale& one, const std::locale& other)
    {
        return std::memcmp(static_cast<const void*>(&one),
                           static_cast<const void*>(&other), sizeof one) == 0 ||
               one == other;
    }

    std::ios::fmtflags flags;
    std::streamsize precision;
    char fill;
    std::locale locale;
};

inline StreamState::StreamState(const std::ostringstream& fresh)
    : flags(fresh.flags()), precision(fresh.precision()), fill(fresh.fill()),
      locale(fresh.getloc())
{}

// What every library lets be seen.
inline bool StreamState::shows_no_change(const std::ostringstream& stream) const
{
    const std::ios& base = stream;
    return base.flags() == flags && base.precision() == precision &&
           base.width() == 0 && base.fill() == fill && !base.tie() &&
           base.exceptions() == std::ios::goodbit &&
           base.rdstate() == std::ios::goodbit &&
           base.rdbuf() == stream.rdbuf();
}

#if defined(__GLIBCXX__)

/// Knows the members that a stream shares with the classes derived from it.
class StreamMembers : private std::ostringstream
{
    friend class StreamState;

    static bool has_callbacks_or_words(const std::ios& stream)
    {
        const auto& words = stream.*(&StreamMembers::_M_local_word);
        bool any = stream.*(&StreamMembers::_M_callbacks) ||
                   stream.*(&StreamMembers::_M_word) != words;
        for (const auto& word : words)
            any |= word._M_pword || word._M_iword != 0;
        return any;
    }

    static const std::locale& locale(const std::ios& stream)
    {
        return stream.*(&StreamMembers::_M_ios_locale);
    }
};

/// Knows those of its buffer.
class StreamBufferMembers : private std::stringbuf
{
    friend class StreamState;

    static bool is_for_output_only(const std::stringbuf& buffer)
    {
        return buffer.*(&StreamBufferMembers::_M_mode) == std::ios::out;
    }

    static std::size_t bytes(const std::stringbuf& buffer)
    {
        return (buffer.*(&StreamBufferMembers::_M_string)).capacity();
    }

    static const std::locale& locale(const std::stringbuf& buffer)
    {
        return buffer.*(&StreamBufferMembers::_M_buf_locale);
    }
};

inline bool StreamState::is_that_of(const std::ostringstream& stream,
                                    std::size_t most_bytes) const
{
    const std::stringbuf& buffer = *stream.rdbuf();
    return shows_no_change(stream) &&
           !StreamMembers::has_callbacks_or_words(stream) &&
           is(StreamMembers::locale(stream), locale) &&
           is(StreamBufferMembers::locale(buffer), locale) &&
           StreamBufferMembers::is_for_output_only(buffer) &&
           StreamBufferMembers::bytes(buffer) <= most_bytes;
}

#else

inline bool StreamState::is_that_of(const std::ostringstream&,
                                    std::size_t) const
{
    return false;
}

#endif
} // namespace zt_core

#endif
