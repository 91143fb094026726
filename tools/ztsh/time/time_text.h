#ifndef ZTSH_TIME_TIME_TEXT_H
#define ZTSH_TIME_TIME_TEXT_H

/// \file
/// Times as they are written in statements and read by people.
///
/// A time is a timecode (1:12, -1:00:00:00), of which the last field is the
/// frames, or a number with its unit (2.5 seconds); a number alone is frames.
/// Times are added and subtracted, multiplied and divided by whole numbers.

#include <KVO/KvoStatement.h>
#include <KVO/KvoTime.h>

#include <string>

namespace ztsh {

/// What a time is written in.
enum class TimeUnit {
    Timecode,
    Frames,
    Ticks,
    Milliseconds,
    Seconds,
    Minutes,
    Hours
};

/// Finds the unit of a name: singular, plural, or short as in ms, s, min, h.
///
/// Returns: false, with `unit` as it was, if there is none.
bool UnitOf(const std::string& name, TimeUnit& unit);

/// Reads a frame rate.
///
/// Units:   `fps` in frames a second, a whole number from 1 to 6000.
/// Returns: false, with `fps` as it was, if `text` is anything else; null is.
bool ReadRate(const char* text, int& fps);

/// The words of a statement, on their way to a time.
class TimeReader
{
public:
    /// Reads from the word at position `first` on; timecode and frames are at
    /// `frame_rate` frames a second, 0 for the default.
    ///
    /// Requires: `time_statement` outlives this.
    TimeReader(const KvoStatement& time_statement, int first,
               int frame_rate = 0);

    /// Reads the longest expression that the words begin with; `*` and `/` go
    /// before `+` and `-`.
    ///
    /// Returns: false if it is wrong; `Why` then says what is.
    bool Read(KvoTime& time);

    /// Gives the position of the first word behind the expression.
    int Next() const { return next; }

    /// Says in half a sentence why nothing was read.
    const std::string& Why() const { return why; }

private:
    bool product(std::int64_t& ticks);
    bool amount(std::int64_t& ticks);
    bool timecode(const std::string& text, std::int64_t& ticks);
    bool number(const std::string& text, std::int64_t& ticks);
    bool factor(long& whole);
    bool take(const char* sign);
    bool fits(std::int64_t ticks);
    bool fail(const std::string& reason);

    const KvoStatement& statement;
    int next;
    int fps;
    std::string why;
};

/// Writes a time in `unit`, at `fps` frames a second, 0 for the default.
///
/// Timecode has two digits or more a field and a minus in front for times
/// before zero; it is not wrapped into a day, and what makes no whole frame is
/// dropped. Other units have up to ten digits.
///
/// Requires: a rate that `ReadRate` accepts, here or as the default.
std::string TimeText(KvoTime time, TimeUnit unit = TimeUnit::Timecode,
                     int fps = 0);

} // namespace ztsh

#endif
