#ifndef KVO_KVOTIME_H
#define KVO_KVOTIME_H

/// \file
/// The one time value of the library: a span or a position on a timeline, as a
/// whole number of ticks of 1/6000 second.
///
/// Surprising: a plain number converts to a time as *frames*, not ticks or
/// seconds, so `time + 5` adds five frames. Ticks are named by `FromTicks`, and
/// other units by `KvoTime(KvoTime::seconds, 2.5f)`.
///
/// One frame is 6000 / fps ticks in integers: 250, 240, 200 and 100 at 24, 25,
/// 30 and 60 frames a second. At a rate that does not divide 6000 a frame is
/// the truncated number and timecode loses the remainder, by design
/// (KvoTime.AFrameIsATruncatedNumberOfTicks). A rate that leaves no ticks to a
/// frame (above 6000, or 0 when the default is 0 as well) makes every number of
/// frames 0 ticks and every remainder 0 frames.

#include <KVO/KvoCommon.h>

#include <cstdint>
#include <iosfwd>
#include <type_traits>

#if defined(__cpp_impl_three_way_comparison) &&                                \
    __cpp_impl_three_way_comparison >= 201907L
#include <compare>
#define KVO_KVOTIME_THREE_WAY 1
#endif

/// A signed count of ticks; below zero is a span or a position before zero.
///
/// A plain value of four bytes. Sums, differences and products are computed
/// modulo 2^32. Conversions from floating point truncate toward zero, saturate
/// at the ends of the range and take not-a-number as 0.
///
/// Units:   `fps` is in frames a second, anywhere; 0 is `default_fps` as it
///          stands at the moment of the call.
/// Reports: nothing, from any operation.
/// Context: whatever touches no stream may run inside the beat.
class ZT_API KvoTime
{
public:
    /// The units of floating-point amounts.
    enum Unit : int {
        ticks = 0,
        milliseconds = 1,
        seconds = 2,
        minutes = 3,
        hours = 4
    };

    /// How many ticks each unit has.
    static constexpr int ticks_per_millisecond = 6;
    static constexpr int ticks_per_second = 6000;
    static constexpr int ticks_per_minute = 360000;
    static constexpr int ticks_per_hour = 21600000;

    /// Makes a time of 0 ticks.
    constexpr KvoTime() : tick_count(0) {}

    /// Makes a time from timecode hh:mm:ss:ff.
    ///
    /// Units: no field has a range: 90 seconds, 100 frames or a negative field
    ///        are simply added in.
    constexpr KvoTime(int hh, int mm, int ss, int ff, int fps = 0)
        : tick_count(sum_of_fields(hh, mm, ss, ff, fps))
    {}

    /// Makes a time of `frames` frames.
    constexpr KvoTime(int frames, int fps = 0)
        : tick_count(product(frames, frame_ticks(fps)))
    {}

    /// Makes a time of `frames` frames, from an integer of any other type.
    template <class Integer, std::enable_if_t<std::is_integral_v<Integer> &&
                                                  !std::is_same_v<Integer, int>,
                                              int> = 0>
    constexpr KvoTime(Integer frames, int fps = 0)
        : tick_count(
              product(static_cast<std::int32_t>(frames), frame_ticks(fps)))
    {}

    /// Makes a time of `frames` frames and fractions of a frame, computed in
    /// double precision.
    KvoTime(double frames, int fps = 0);

    /// Makes a time of `frames` frames and fractions of a frame, computed in
    /// single precision.
    KvoTime(float frames, int fps = 0);

    /// Makes a time of `amount` units.
    ///
    /// Milliseconds are multiplied in double precision, the longer units in
    /// single precision with a rounding for each step. A unit that does not
    /// exist gives 0.
    KvoTime(Unit unit, float amount);

    /// Makes a time of `amount` units from a number of any other type, which
    /// is narrowed to single precision first.
    template <class Number, std::enable_if_t<std::is_arithmetic_v<Number> &&
                                                 !std::is_same_v<Number, float>,
                                             int> = 0>
    KvoTime(Unit unit, Number amount)
        : KvoTime(unit, static_cast<float>(amount))
    {}

    /// A unit alone is no time.
    KvoTime(Unit unit) = delete;

    /// Makes a time from the text hh:mm:ss:ff.
    ///
    /// Each field is a decimal number, which blanks and a sign may precede; the
    /// colon follows its number directly. Fields from the first one on that
    /// does not fit are 0, and so are all fields of a null text. A number
    /// beyond the range of int is taken as its nearest end.
    KvoTime(const char* text, int fps = 0);

    /// Makes a time of `count` ticks.
    static constexpr KvoTime FromTicks(std::int32_t count)
    {
        KvoTime time;
        time.tick_count = count;
        return time;
    }

    /// Gives the number of ticks.
    constexpr std::int32_t Ticks() const { return tick_count; }

    /// Splits `count` ticks into timecode.
    ///
    /// Every part has the sign of the time: one second before zero is
    /// 0, 0, -1, 0. Hours are not reduced to a day. Ticks that make no whole
    /// frame are dropped.
    ///
    /// Requires: four places to store the parts.
    /// Units:    `fps` is used as given; 0 gives 0 frames.
    /// Returns:  the hours, which are stored modulo 2^32.
    static constexpr long get_timecode_parts(long count, int* hh, int* mm,
                                             int* ss, int* ff, int fps)
    {
        const long whole_hours = count / ticks_per_hour;
        const auto in_hour =
            static_cast<std::int32_t>(count - whole_hours * ticks_per_hour);
        const std::int32_t whole_minutes = in_hour / ticks_per_minute;
        const std::int32_t in_minute =
            in_hour - whole_minutes * ticks_per_minute;
        const std::int32_t whole_seconds = in_minute / ticks_per_second;
        *hh = static_cast<int>(whole_hours);
        *mm = whole_minutes;
        *ss = whole_seconds;
        *ff = whole_frames(in_minute - whole_seconds * ticks_per_second, fps);
        return whole_hours;
    }

    /// Splits this time as `get_timecode_parts` does.
    constexpr long Timecode(int* hh, int* mm, int* ss, int* ff,
                            int fps = 0) const
    {
        return get_timecode_parts(tick_count, hh, mm, ss, ff, resolved(fps));
    }

    /// Replaces this time as the constructor of the same fields makes it.
    constexpr void SetTimecode(int hh, int mm, int ss, int ff, int fps = 0)
    {
        tick_count = sum_of_fields(hh, mm, ss, ff, fps);
    }

    /// Replaces this time as the constructor from `amount` units makes it,
    /// except that milliseconds are multiplied in single precision; a unit that
    /// does not exist leaves it unchanged.
    void SetTime(Unit unit, float amount);

    /// Gives this time in `unit`, divided in single precision.
    ///
    /// Returns: 0 for a unit that does not exist.
    float Time(Unit unit) const;

    /// Gives this time brought into one day, 0 <= time < 24 hours, by whole
    /// days.
    constexpr KvoTime Wrap() const
    {
        // Five days at most cross the whole range, and a time of the day takes
        // two comparisons.
        constexpr std::int32_t day = 24 * ticks_per_hour;
        std::int32_t wrapped = tick_count;
        while (wrapped >= day)
            wrapped -= day;
        while (wrapped < 0)
            wrapped += day;
        return FromTicks(wrapped);
    }

    /// Writes the wrapped time as timecode at `default_fps`, every field with
    /// two digits or more: 01:00:00:02. Nothing follows it.
    ///
    /// Base, fill, adjustment and locale of the stream have no part in it and
    /// are left alone; a field width is used up, as by any output.
    ///
    /// By design: a time of a day or more, or below zero, does not read back
    ///            (KvoTime.WriteWrapsIntoOneDay).
    void Write(std::ostream& out) const;

    /// Reads a time text at `default_fps`, up to and including a newline, a ";"
    /// or the end of input. Blanks separate; ":" and "." are interchangeable.
    ///
    /// One word alone is a number of frames, which may have a fraction when it
    /// is quoted. Otherwise the last words are, from the end, frames, seconds,
    /// minutes and hours, as far as they go: 3:4 is 3 seconds and 4 frames, and
    /// so is 3.4. What is no number reads as 0; a number beyond the range of
    /// int is taken as its nearest end. No words leave the time unchanged.
    ///
    /// By design: the word before a field is taken for its separator unread, so
    ///            that 1 2 3 is 1 second and 3 frames
    ///            (KvoTime.ReadSkipsTheWordBeforeAField).
    void Read(std::istream& in);

    /// Writes the ticks as four bytes in this machine's order; nothing to a
    /// stream that has failed. When not all four can be written the stream's
    /// fail and bad bits are set.
    void WriteBinary(std::ostream& out) const;

    /// Reads four bytes in this machine's order; the time stays unchanged when
    /// there are fewer.
    void ReadBinary(std::istream& in);

    /// Adds `other`, modulo 2 to the power 32 ticks.
    constexpr KvoTime& operator+=(KvoTime other)
    {
        return *this = *this + other;
    }

    /// Takes `other` away, modulo 2 to the power 32 ticks.
    constexpr KvoTime& operator-=(KvoTime other)
    {
        return *this = *this - other;
    }

    friend constexpr KvoTime operator+(KvoTime a, KvoTime b)
    {
        return from_bits(a.bits() + b.bits());
    }

    friend constexpr KvoTime operator-(KvoTime a, KvoTime b)
    {
        return from_bits(a.bits() - b.bits());
    }

    friend constexpr KvoTime operator-(KvoTime a)
    {
        return from_bits(0u - a.bits());
    }

    friend constexpr KvoTime operator*(KvoTime a, int factor)
    {
        return FromTicks(product(a.tick_count, factor));
    }

    /// Divides, truncating toward zero.
    ///
    /// Returns: 0 for a divisor of 0.
    friend constexpr KvoTime operator/(KvoTime a, int divisor)
    {
        // Negation instead of a division by -1, which has no result for the
        // most negative time.
        if (divisor == -1)
            return -a;
        return FromTicks(divisor ? a.tick_count / divisor : 0);
    }

    /// A factor or divisor with a fraction would lose it without a word.
    template <class Real>
    friend std::enable_if_t<std::is_floating_point_v<Real>, KvoTime>
    operator*(KvoTime, Real) = delete;

    template <class Real>
    friend std::enable_if_t<std::is_floating_point_v<Real>, KvoTime>
    operator/(KvoTime, Real) = delete;

    friend constexpr bool operator==(KvoTime a, KvoTime b)
    {
        return a.tick_count == b.tick_count;
    }

#ifdef KVO_KVOTIME_THREE_WAY
    friend constexpr std::strong_ordering operator<=>(KvoTime a, KvoTime b)
    {
        return a.tick_count <=> b.tick_count;
    }
#else
    friend constexpr bool operator!=(KvoTime a, KvoTime b)
    {
        return a.tick_count != b.tick_count;
    }

    friend constexpr bool operator<(KvoTime a, KvoTime b)
    {
        return a.tick_count < b.tick_count;
    }

    friend constexpr bool operator<=(KvoTime a, KvoTime b)
    {
        return a.tick_count <= b.tick_count;
    }

    friend constexpr bool operator>(KvoTime a, KvoTime b)
    {
        return a.tick_count > b.tick_count;
    }

    friend constexpr bool operator>=(KvoTime a, KvoTime b)
    {
        return a.tick_count >= b.tick_count;
    }
#endif

    /// The rate that stands for a rate of 0; initially 30. The host may set it.
    static std::int32_t default_fps;

    /// A switch for callers that choose between the text and the binary form
    /// when they stream times; initially 0 (text). Nothing here reads it.
    static std::int32_t binaryIO;

    static const KvoTime ZERO;    ///< 0 ticks.
    static const KvoTime FOREVER; ///< 48 hours exactly.

    std::int32_t tick_count; ///< In 1/6000 second.

private:
    static constexpr int resolved(int fps)
    {
        return fps ? fps : default_fps;
    }

    /// Gives the ticks of one frame, 0 where there is no such frame.
    static constexpr std::int32_t frame_ticks(int fps)
    {
        const int rate = resolved(fps);
        return rate ? ticks_per_second / rate : 0;
    }

    static constexpr std::int32_t product(std::int32_t a, std::int32_t b)
    {
        return static_cast<std::int32_t>(static_cast<std::uint32_t>(a) *
                                         static_cast<std::uint32_t>(b));
    }

    static constexpr std::int32_t sum_of_fields(int hh, int mm, int ss, int ff,
                                                int fps)
    {
        return (FromTicks(product(hh, ticks_per_hour)) +
                FromTicks(product(mm, ticks_per_minute)) +
                FromTicks(product(ss, ticks_per_second)) +
                FromTicks(product(ff, frame_ticks(fps))))
            .tick_count;
    }

    /// For every rate in use, 2^32 by the ticks of its frame, rounded up.
    struct FrameReciprocals
    {
        static constexpr int rates = 128;

        constexpr FrameReciprocals()
        {
            for (int rate = 1; rate < rates; ++rate)
                by_rate[rate] = static_cast<std::uint32_t>(
                    (1LL << 32) / (ticks_per_second / rate) + 1);
        }

        std::uint32_t by_rate[rates] = {};
    };
    static const FrameReciprocals frame_reciprocals;

    /// Gives the whole frames in `count` ticks of less than a second, 0 where
    /// there is no such frame.
    ///
    /// A division by the frame becomes a multiplication at the rates in use: it
    /// is exact, for the error of the reciprocal times a count below 6000 is
    /// too small to reach the next frame.
    static constexpr int whole_frames(std::int32_t count, int fps)
    {
        if (fps > 0 && fps < FrameReciprocals::rates)
            return static_cast<int>(std::int64_t{count} *
                                    frame_reciprocals.by_rate[fps] /
                                    (1LL << 32));
        const std::int32_t frame = fps ? ticks_per_second / fps : 0;
        return frame ? count / frame : 0;
    }

    constexpr std::uint32_t bits() const
    {
        return static_cast<std::uint32_t>(tick_count);
    }

    static constexpr KvoTime from_bits(std::uint32_t bits)
    {
        return FromTicks(static_cast<std::int32_t>(bits));
    }
};

inline constexpr KvoTime::FrameReciprocals KvoTime::frame_reciprocals = {};
inline constexpr KvoTime KvoTime::ZERO = KvoTime::FromTicks(0);
inline constexpr KvoTime KvoTime::FOREVER =
    KvoTime::FromTicks(48 * KvoTime::ticks_per_hour);

#undef KVO_KVOTIME_THREE_WAY

#endif
