#include "words/clock_words.h"

#include "sequence/block.h"
#include "time/live_line.h"
#include "time/time_text.h"
#include "words/time_arguments.h"

#include <ZT/error.h>

#include <cstring>
#include <iostream>
#include <sstream>

namespace ztsh {

namespace {

constexpr int most_words = 1000;
constexpr int name_position = 1;
constexpr int action_position = 2;
constexpr int action_words = 3; ///< Command, name and action.

constexpr const char* word = "Clock";

const std::vector<Word> words = {
    {word, "[NAME [ACTION ...]]",
     "Makes and drives the clock NAME, one of six at most, and shows it; "
     "shows\n"
     "all without NAME. What is asked of it happens at the next beat.\n"
     "  from TIME to TIME   makes it, standing at the first one\n"
     "  endless             makes one that counts up from 0\n"
     "  start stop restart  runs it on, stops it, runs it from its start\n"
     "  reverse             exchanges its two times, if it stands still\n"
     "  force TIME          sets its time\n"
     "  at TIME do ...      runs a statement once it reaches TIME\n"
     "  every TIME do ...   runs one again and again while it runs\n"
     "  onstop do ...       runs one when it is told to stop\n"
     "  rearm               lets what it ran at a time be run once more\n"
     "  into NAME           puts its time into a variable\n"
     "  watch               shows its time until it stops or a key is hit\n"
     "  free                forgets it\n"
     "Statements run after the beat, between two others. do begin ... end "
     "runs\n"
     "several.",
     0, most_words},
};

/// What is asked of a timer without saying more.
struct Request
{
    const char* name;
    void (ZtTimer::*ask)();
};

constexpr Request requests[] = {
    {"start", &ZtTimer::start},           {"stop", &ZtTimer::stop},
    {"restart", &ZtTimer::restart},       {"reverse", &ZtTimer::reverse},
    {"rearm", &ZtTimer::reset_callbacks},
};

const Request* request_of(const KvoStatement& statement)
{
    for (const Request& request : requests)
        if (statement.Count() == action_words &&
            std::strcmp(statement.ArgText(action_position), request.name) == 0)
            return &request;
    return nullptr;
}

bool is(const char* text, const char* other)
{
    return std::strcmp(text, other) == 0;
}

std::string names_of(const ClockTable& clocks)
{
    std::string names;
    for (const auto& entry : clocks.All())
        names += (names.empty() ? "are: " : ", ") + entry.first;
    return names.empty() ? "are none" : names;
}

/// Tells whether the beat's queue has room for a request.
///
/// Reports: an error if it has not: the library drops the request silently.
bool takes_request()
{
    if (ZtTimerBeat::defer_op_count < ZtTimerBeat::defer_op_limit)
        return true;
    ZtError("Clock: %d requests wait for the beat, there is no room for this "
            "one\n",
            ZtTimerBeat::defer_op_limit);
    return false;
}

bool stands_still(const ZtTimer& timer)
{
    return timer.state == ZtTimer::Stopped;
}

std::string line_of(const std::string& name, Clock& clock)
{
    const ZtTimer& timer = clock.Timer();
    std::string range = "endless";
    if (timer.end_mode != ZtTimer::Endless)
        range = TimeText(timer.start_time) + " to " + TimeText(timer.end);
    return name + ": " + TimeText(timer.current) +
           (stands_still(timer) ? " stopped, " : " running, ") + range;
}

/// Keeps words from having their variables replaced once more: those that were
/// meant are replaced already.
void make_literal(KvoStatement& statement)
{
    for (int i = 0; KvoToken* token = statement.Find(i); ++i) {
        if (!std::strchr(token->Text(), '$'))
            continue;
        std::string escaped;
        for (const char* character = token->Text(); *character; ++character) {
            escaped += '\\';
            escaped += *character;
        }
        std::istringstream in(escaped);
        token->Read(in);
    }
}

} // namespace

ClockWords::ClockWords(Runner& script_runner, ClockTable& clock_table)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      clocks(clock_table)
{}

void ClockWords::Do(KvoStatement& statement, int)
{
    // A block belongs to its word also when the word is wrong.
    Statements block;
    if (OpensBlock(statement)) {
        runner.KeepPlace();
        BlockRead read = ReadBlock(*runner.Source(), true, block);
        if (read == BlockRead::NoEnd)
            ZtError("Clock: expected end, nothing will be run\n");
        if (read != BlockRead::Whole)
            return;
    }
    if (!InSequence(runner, word) && !act(statement, block))
        TellNotUnderstood(word);
}

/// Returns: false for what the word does not understand; as do all below.
bool ClockWords::act(KvoStatement& statement, const Statements& block)
{
    const char* name = statement.ArgText(name_position);
    const char* action = statement.ArgText(action_position);
    if (!name) {
        list();
        return true;
    }
    if (action && (is(action, "from") || is(action, "endless")))
        return make(statement);
    Clock* clock = clocks.Find(name);
    if (!clock) {
        ZtError("Clock: no clock is named %s; there %s\n", name,
                names_of(clocks).c_str());
        return true;
    }
    if (!action) {
        std::cout << line_of(name, *clock) << "\n";
        return true;
    }
    return look(name, *clock, statement) || ask(name, *clock, statement) ||
           react(*clock, statement, block);
}

bool ClockWords::make(const KvoStatement& statement)
{
    const char* name = statement.ArgText(name_position);
    int next = action_position;
    bool endless = TakeWord(statement, "endless", next);
    KvoTime start;
    KvoTime end;
    if (!endless) {
        ++next;
        if (!TakeTime(word, statement, next, start))
            return true;
        if (!TakeWord(statement, "to", next))
            return false;
        if (!TakeTime(word, statement, next, end))
            return true;
    }
    if (next != statement.Count())
        return false;
    if (!takes_request())
        return true;
    Clock* made = endless ? clocks.Make(name) : clocks.Make(name, start, end);
    if (!made)
        ZtError("Clock: the beat drives no more than %d clocks\n",
                ZtTimerBeat::timer_limit);
    return true;
}

/// What needs no beat.
bool ClockWords::look(const char* name, Clock& clock,
                      const KvoStatement& statement)
{
    int next = action_position;
    if (TakeWord(statement, "into", next))
        return TakeInto(runner, statement, next, clock.Timer().current);
    if (statement.Count() != action_words)
        return false;
    if (TakeWord(statement, "free", next))
        clocks.Remove(name);
    else if (TakeWord(statement, "watch", next))
        watch(name);
    else
        return false;
    return true;
}

/// What the beat is asked for.
bool ClockWords::ask(const char* name, Clock& clock,
                     const KvoStatement& statement)
{
    int next = action_position;
    if (TakeWord(statement, "force", next)) {
        KvoTime time;
        if (!TakeTime(word, statement, next, time))
            return true;
        if (next != statement.Count())
            return false;
        if (takes_request())
            clock.Timer().force(time);
        return true;
    }
    const Request* request = request_of(statement);
    if (!request)
        return false;
    if (request->ask == &ZtTimer::reverse && !stands_still(clock.Timer()))
        ZtError("Clock: %s runs, only a clock that stands still is reversed\n",
                name);
    else if (takes_request())
        (clock.Timer().*request->ask)();
    return true;
}

/// What has statements run.
bool ClockWords::react(Clock& clock, const KvoStatement& statement,
                       const Statements& block)
{
    int next = action_position;
    bool on_stop = TakeWord(statement, "onstop", next);
    bool every = !on_stop && TakeWord(statement, "every", next);
    bool at = !on_stop && !every && TakeWord(statement, "at", next);
    KvoTime time;
    if ((every || at) && !TakeTime(word, statement, next, time))
        return true;
    Statements reaction;
    if (!(on_stop || every || at) ||
        !take_reaction(statement, next, block, reaction))
        return false;
    long milliseconds = time.Ticks() / KvoTime::ticks_per_millisecond;
    if (every && milliseconds < 1)
        ZtError("Clock: every takes a time of a millisecond or more\n");
    else if (on_stop)
        clock.OnStop(std::move(reaction));
    else if (!takes_request())
        return true;
    else if (every)
        clock.Every(milliseconds, std::move(reaction));
    else
        clock.At(time, std::move(reaction));
    return true;
}

/// Takes the statement behind "do" and the block that it opens; of a block of
/// its own only what stands inside.
bool ClockWords::take_reaction(const KvoStatement& statement, int next,
                               const Statements& block, Statements& reaction)
{
    if (!TakeWord(statement, "do", next) || next == statement.Count())
        return false;
    KvoStatement first(statement);
    for (int i = 0; i < next; ++i)
        first.EatArg(0);
    if (first.Matches("begin", 0)) {
        reaction = block;
        return true;
    }
    make_literal(first);
    reaction.push_back({first, runner.Where()});
    if (OpensBlock(first)) {
        reaction.insert(reaction.end(), block.begin(), block.end());
        reaction.push_back({KvoStatement("end"), runner.Where()});
    }
    return true;
}

void ClockWords::list()
{
    for (const auto& [name, clock] : clocks.All())
        std::cout << line_of(name, *clock) << "\n";
}

void ClockWords::watch(const std::string& name)
{
    // A statement that runs meanwhile may forget the clock.
    auto line = [&] {
        Clock* clock = clocks.Find(name);
        return clock ? line_of(name, *clock) : name + ": forgotten";
    };
    auto ended = [&] {
        Clock* clock = clocks.Find(name);
        return !clock || clock->AtRest();
    };
    ShowLive(line, ended, runner);
}

} // namespace ztsh
