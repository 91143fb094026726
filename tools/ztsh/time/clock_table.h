#ifndef ZTSH_TIME_CLOCK_TABLE_H
#define ZTSH_TIME_CLOCK_TABLE_H

/// \file
/// The library's timers by the names that scripts give them, called clocks
/// since the word `Timer` is the stopwatch of the common words, with the
/// statements that they make due.
///
/// A timer's callbacks run inside the alarm signal. There nothing is run: the
/// callback marks the statements as due, in two lock-free stores, and whoever
/// runs statements looks for the marks.

#include "script/due_statements.h"

#include <ZT/timer.h>

#include <atomic>
#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace ztsh {

/// Statements, and the mark that they are due.
class Reaction
{
public:
    explicit Reaction(Statements its_statements);

    /// Marks the reaction `data` as due, unless it is due already.
    ///
    /// Context: for the beat to call.
    static void Mark(ZtTimer* timer, void* data);

    /// Tells whether any reaction was marked since `ForgetMarked`.
    static bool AnyMarked() { return marked; }
    static void ForgetMarked() { marked = false; }

    /// Takes the mark back.
    ///
    /// Returns: its number, the lower the earlier; 0 if there was none.
    std::uint64_t TakeMark();

    /// Gives the statements; they last at least as long as this.
    std::weak_ptr<const Statements> Do() const { return statements; }

private:
    static std::atomic<std::uint64_t> marks; ///< Given out so far.
    static std::atomic<bool> marked;

    std::atomic<std::uint64_t> mark = 0; ///< 0 while it is not due.
    std::shared_ptr<const Statements> statements;
};

/// A timer with its statements.
///
/// Requests are those of the timer: the beat carries them out at its next tick.
class Clock
{
public:
    /// Makes an endless one that counts up from 0.
    Clock();

    /// Makes one from `start` to `end`; 3 ticks as the end make it endless.
    Clock(KvoTime start, KvoTime end);

    ~Clock();
    Clock(const Clock&) = delete;
    Clock& operator=(const Clock&) = delete;

    ZtTimer& Timer() { return *timer; }

    /// Tells whether it stands still and will go on doing so: no request waits
    /// for the beat.
    bool AtRest() const;

    /// Has statements run once the running clock reaches `time`.
    void At(KvoTime time, Statements statements);

    /// Has statements run every `milliseconds` of the beat while it runs. As
    /// long as they wait to be run, or run, further times count as one.
    void Every(long milliseconds, Statements statements);

    /// Has statements run when it is asked to stop.
    void OnStop(Statements statements);

    const std::vector<std::unique_ptr<Reaction>>& Reactions() const
    {
        return reactions;
    }

private:
    void* add(Statements statements);

    std::vector<std::unique_ptr<Reaction>> reactions;
    std::optional<ZtTimer> timer; ///< Gone before the reactions that it marks.
};

/// Clocks by name.
class ClockTable : public DueStatements
{
public:
    /// Gives the clock `name`, null if there is none.
    ///
    /// Owner: this table.
    Clock* Find(const std::string& name);

    /// Makes an endless clock `name`; one of that name is forgotten.
    ///
    /// Owner:   this table.
    /// Returns: null if the beat drives no further timer.
    Clock* Make(const std::string& name);

    /// Makes a clock `name` from `start` to `end`, otherwise as above.
    Clock* Make(const std::string& name, KvoTime start, KvoTime end);

    /// Forgets a clock, with its statements that wait to be run.
    void Remove(const std::string& name);

    /// Gives all clocks in the order of their names.
    const std::map<std::string, std::unique_ptr<Clock>>& All() const
    {
        return clocks;
    }

    bool Any() const override;
    std::vector<std::weak_ptr<const Statements>> Take() override;

private:
    bool make_room(const std::string& name);

    std::map<std::string, std::unique_ptr<Clock>> clocks;
};

} // namespace ztsh

#endif
