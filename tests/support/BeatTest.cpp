#include "support/BeatTest.h"

#include <algorithm>

namespace {
constexpr std::size_t most_entries = 4096;
BeatLog::Entry entries[most_entries];
std::size_t entry_count = 0;
constexpr std::uint64_t steady_at_start = 1000000000;

std::int64_t milliseconds_of(FakeClock& clock)
{
    return static_cast<std::int64_t>(
        (clock.steady_nanoseconds() - steady_at_start) / 1000000);
}
} // namespace

FakeClock* BeatLog::clock = nullptr;

void BeatLog::Clear()
{
    entry_count = 0;
}

void BeatLog::Add(ZtTimer* timer, void* data)
{
    if (entry_count < most_entries)
        entries[entry_count] = {timer, data,
                                clock ? milliseconds_of(*clock) : 0,
                                timer ? timer->current.Ticks() : 0};
    ++entry_count;
}

std::vector<BeatLog::Entry> BeatLog::Entries()
{
    EXPECT_LE(entry_count, most_entries);
    return {entries, entries + std::min(entry_count, most_entries)};
}

std::string BeatLog::Texts()
{
    std::string texts;
    for (const Entry& entry : Entries())
        texts += static_cast<const char*>(entry.data);
    return texts;
}

std::vector<std::int64_t> BeatLog::Moments(const std::string& text)
{
    std::vector<std::int64_t> moments;
    for (const Entry& entry : Entries())
        if (text == static_cast<const char*>(entry.data))
            moments.push_back(entry.milliseconds);
    return moments;
}

void Note(ZtTimer* timer, void* data)
{
    BeatLog::Add(timer, data);
}

BeatErrorTrap::~BeatErrorTrap()
{
    Release();
    for (int place = 0; place < count && place < limit; ++place)
        delete errors[place];
}

void BeatErrorTrap::Handle(ZtErr* error)
{
    if (count < limit)
        errors[count] = error;
    ++count;
}

std::string BeatErrorTrap::Text() const
{
    std::string text;
    for (int place = 0; place < count && place < limit; ++place)
        text += errors[place]->Message();
    return text;
}

BeatTest::BeatTest() : alarm(clock)
{
    BeatLog::Clear();
    BeatLog::clock = &clock;
}

BeatTest::~BeatTest()
{
    ZtTimerBeat::unblock();
    // One last beat empties the queue and leaves no alarm owed.
    ZtTimerBeat::stop();
    ZtTimerBeat::reload(1);
    alarm.Step();
    ZtTimerBeat::sample_rate = 4000;
    BeatLog::clock = nullptr;
}

void BeatTest::Beats(int count)
{
    for (int beat = 0; beat < count; ++beat)
        ASSERT_TRUE(alarm.Step()) << "beat " << beat;
}

std::int64_t BeatTest::Milliseconds()
{
    return milliseconds_of(clock);
}
