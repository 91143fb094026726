#include "words/wait_words.h"

#include "words/time_arguments.h"

#include <ZT/error.h>

#include <chrono>

namespace ztsh {

namespace {

constexpr int most_words = 1000;
constexpr const char* word = "Wait";

const std::vector<Word> words = {
    {word, "TIME | until NAME stops",
     "Waits for a time, as Time takes it, or until the clock NAME stands\n"
     "still. What clocks have to run is run meanwhile. Ctrl-C ends the wait.",
     1, most_words},
};

} // namespace

WaitWords::WaitWords(Runner& script_runner, ClockTable& clock_table)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      clocks(clock_table)
{}

void WaitWords::Do(KvoStatement& statement, int selector)
{
    int next = 1;
    constexpr int until_words = 4;
    if (TakeWord(statement, "until", next)) {
        const char* name = statement.ArgText(next++);
        if (!name || !TakeWord(statement, "stops", next) ||
            statement.Count() != until_words)
            Expected(selector);
        else
            wait_until_rest(name);
        return;
    }
    KvoTime time;
    if (!TakeTime(word, statement, next, time))
        return;
    if (next != statement.Count())
        Expected(selector);
    else
        wait_for(time);
}

void WaitWords::wait_for(KvoTime time)
{
    constexpr std::int64_t nanoseconds_a_millisecond = 1000000;
    std::chrono::nanoseconds length(std::int64_t{time.Ticks()} *
                                    nanoseconds_a_millisecond /
                                    KvoTime::ticks_per_millisecond);
    WaitEnds ends;
    ends.deadline = std::chrono::steady_clock::now() + length;
    WaitFor(ends, runner);
}

void WaitWords::wait_until_rest(const std::string& name)
{
    if (InSequence(runner, word))
        return;
    if (!clocks.Find(name)) {
        ZtError("Wait: no clock is named %s\n", name.c_str());
        return;
    }
    // A statement that runs meanwhile may forget the clock or stop the beat.
    auto rests = [&] {
        const Clock* clock = clocks.Find(name);
        return !clock || clock->AtRest();
    };
    WaitEnds ends;
    ends.happened = [&] { return rests() || ZtTimerBeat::reload_flag == 0; };
    if (WaitFor(ends, runner) == Waited::Happened && !rests())
        ZtError("Wait: the beat does not run, so %s never stops\n",
                name.c_str());
}

} // namespace ztsh
