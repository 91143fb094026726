#ifndef ZT_TESTS_BEATTEST_H
#define ZT_TESTS_BEATTEST_H

#include <cstddef>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ZT/error.h"
#include "ZT/timer.h"
#include "support/FakeAlarm.h"
#include "support/FakeClock.h"

/// What happened inside the beat, kept without allocating.
class BeatLog
{
public:
    struct Entry
    {
        ZtTimer* timer;
        void* data;
        std::int64_t milliseconds; ///< Of the fake clock, since it was made.
        int ticks;                 ///< Where the timer stood.
    };

    static void Clear();
    static void Add(ZtTimer* timer, void* data);

    /// Gives the entries, oldest first. Not for use inside the beat.
    static std::vector<Entry> Entries();

    /// Gives the data of the entries, which are texts, one after the other.
    static std::string Texts();

    /// Gives the milliseconds of the entries whose data is this text.
    static std::vector<std::int64_t> Moments(const std::string& text);

    static FakeClock* clock; ///< Whose milliseconds are noted, or null.
};

/// A callback that notes when and for what it was called.
void Note(ZtTimer* timer, void* data);

/// A data pointer for `Note` with a text to recognise it by.
inline void* Named(const char* text)
{
    return const_cast<char*>(text);
}

/// A handler that keeps errors without allocating, as one may inside the beat.
class BeatErrorTrap : public ZtErrHandler
{
public:
    BeatErrorTrap() = default;
    ~BeatErrorTrap() override;
    void Handle(ZtErr* error) override;

    /// Gives the texts of the errors kept, one after the other.
    std::string Text() const;

    static constexpr int limit = 128;
    ZtErr* errors[limit] = {};
    int count = 0;
};

/// A beat by a fake clock, at its defaults before and after each test.
class BeatTest : public testing::Test
{
protected:
    BeatTest();
    ~BeatTest() override;

    /// Steps so many beats; fails the test if the beat has stopped before.
    void Beats(int count);

    /// Gives the milliseconds that the clock has gone since the test began.
    std::int64_t Milliseconds();

    FakeClock clock;
    FakeAlarm alarm;
};

#endif
