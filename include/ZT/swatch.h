#ifndef ZT_SWATCH_H
#define ZT_SWATCH_H

/// \file
/// Two meters of elapsed time: one in scaled seconds by the clock on the wall,
/// one in the ticks of a fast counter.
///
/// The clock on the wall may be set back while a stopwatch runs; its reading
/// is then negative, which nothing here hides.

#include <ZT/object.h>

#include <cstddef>
#include <cstdint>
#include <sys/time.h>

/// Measures seconds since its last mark, multiplied by a rate.
class ZT_API ZtStopWatch : public KvoObject
{
public:
    /// Marks the present moment.
    ///
    /// Units: `watch_rate` multiplies every reading; 1 reads plain seconds.
    explicit ZtStopWatch(double watch_rate);

    ~ZtStopWatch() override;

    /// Reads the watch and marks the present moment anew.
    ///
    /// Units:   seconds times `rate`, to the microsecond.
    /// Returns: the reading from the mark before.
    double Mark();

    /// Reads the watch and lets it run on from the same mark.
    ///
    /// Units: seconds times `rate`, to the microsecond.
    double Split();

    timeval start; ///< The wall clock at the last mark.
    double rate;   ///< What every reading is multiplied by.
};

/// Keeps the value that a fast, free-running 32-bit counter had when the
/// object was made; readings and differences are the user's own.
class ZT_API ZtMicroWatch : public KvoObject
{
public:
    /// What stands for a pointer to the counter: `*iotimer` reads it, and it
    /// is null until the counter is in use.
    class Counter
    {
    public:
        constexpr Counter() : running(false) {}

        /// Reads the counter.
        ///
        /// Units:   ticks, `microRes` of them to the microsecond; wraps
        ///          around after 4.29 seconds.
        /// Returns: the value; 0 while it is null.
        ZT_API std::uint32_t operator*() const;

        /// Tells whether it counts.
        explicit operator bool() const { return running; }

        friend bool operator==(const Counter& counter, std::nullptr_t)
        {
            return !counter.running;
        }
        friend bool operator==(std::nullptr_t, const Counter& counter)
        {
            return !counter.running;
        }
        friend bool operator!=(const Counter& counter, std::nullptr_t)
        {
            return counter.running;
        }
        friend bool operator!=(std::nullptr_t, const Counter& counter)
        {
            return counter.running;
        }

    private:
        friend class ZtMicroWatch;
        bool running;
    };

    /// Takes the counter's value; the first watch puts the counter in use.
    ZtMicroWatch();

    ~ZtMicroWatch() override;

    /// Puts the counter in use: sets `iotimer` and `microRes`.
    static void InitCycleTimer();

    std::uint32_t start; ///< The counter's value at construction.

    static Counter iotimer;        ///< The counter; null at first.
    static std::uint32_t microRes; ///< Ticks per microsecond; 0 at first.
};

#endif
