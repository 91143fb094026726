#include "words/shuttle_words.h"

#include "time/live_line.h"
#include "time/time_text.h"
#include "words/time_arguments.h"

#include <ZT/error.h>

#include <charconv>
#include <cmath>
#include <cstdio>
#include <iostream>

namespace ztsh {

namespace {

constexpr int most_words = 1000;
constexpr int name_position = 1;
constexpr int action_position = 2;
constexpr const char* word = "Shuttle";

const std::vector<Word> words = {
    {word, "[NAME [ACTION ...]]",
     "Sets and plays the shuttle NAME, and shows it; shows all without NAME.\n"
     "Several actions may follow each other.\n"
     "  in TIME out TIME      sets the range, through midnight if out is less\n"
     "  at TIME               sets where it is; none of these while it plays\n"
     "  speed NUMBER          sets the speed, for the next change of state\n"
     "  repeat once|loop|swing|continuous\n"
     "                        sets what happens at the end\n"
     "  play fastforward      plays forward, at 1 or 1.25 times its speed\n"
     "  reverse fastreverse   plays backward\n"
     "  stop                  stops\n"
     "These stand alone:\n"
     "  into NAME             puts its time into a variable\n"
     "  watch                 shows it until it stops or a key is hit\n"
     "  free                  forgets it",
     0, most_words},
};

/// By the numbers of the states and the modes.
constexpr const char* state_names[] = {"fastreverse", "reverse", "stop", "play",
                                       "fastforward"};
constexpr const char* mode_names[] = {"once", "loop", "swing", "continuous"};

/// What can be set, by the places of the marked times where they are times.
struct TimeName
{
    const char* name;
    int index;
};

constexpr TimeName time_names[] = {{"in", ZtShuttle::in_point},
                                   {"at", ZtShuttle::current_time},
                                   {"out", ZtShuttle::out_point}};

/// Takes one of some names.
///
/// Returns: its place among them, -1 if it is none of them.
template <std::size_t count>
int take_one_of(const char* const (&names)[count],
                const KvoStatement& statement, int& next)
{
    for (std::size_t i = 0; i < count; ++i)
        if (TakeWord(statement, names[i], next))
            return static_cast<int>(i);
    return -1;
}

bool take_speed(const KvoStatement& statement, int& next, float& speed)
{
    const char* text = statement.ArgText(next);
    if (!text)
        return false;
    std::string_view digits(text);
    float read = 0;
    auto [stop, fault] =
        std::from_chars(digits.data(), digits.data() + digits.size(), read,
                        std::chars_format::fixed);
    constexpr float most = 1000;
    if (fault != std::errc() || stop != digits.data() + digits.size() ||
        !(std::fabs(read) <= most))
        return false;
    speed = read;
    ++next;
    return true;
}

std::string line_of(const std::string& name, ZtShuttle& shuttle)
{
    // Asked first: the end of the range is noticed by this.
    std::string time = TimeText(shuttle.Time());
    char speed[32];
    std::snprintf(speed, sizeof speed, "%g",
                  static_cast<double>(shuttle.base_speed));
    return name + ": " + time + " " + state_names[shuttle.state] + ", in " +
           TimeText(shuttle.times[ZtShuttle::in_point]) + ", out " +
           TimeText(shuttle.times[ZtShuttle::out_point]) + ", speed " + speed +
           ", " + mode_names[shuttle.repeat_mode];
}

} // namespace

/// One thing to do with a shuttle.
struct ShuttleWords::Step
{
    enum class Kind { Time, Speed, Mode, State };

    Kind kind = Kind::State;
    int which = 0; ///< The marked time, the mode or the state.
    KvoTime time;
    float speed = 0;
};

ShuttleWords::ShuttleWords(Runner& script_runner)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner)
{}

void ShuttleWords::Do(KvoStatement& statement, int)
{
    if (InSequence(runner, word))
        return;
    const char* name = statement.ArgText(name_position);
    if (!name) {
        list();
        return;
    }
    if (look(name, statement))
        return;
    std::vector<Step> steps;
    bool told = false;
    int next = action_position;
    while (next < statement.Count()) {
        steps.emplace_back();
        if (!read_step(statement, next, steps.back(), told)) {
            if (!told)
                TellNotUnderstood(word);
            return;
        }
    }
    take(name, steps);
}

/// Does what only looks at a shuttle or forgets it.
///
/// Returns: false if the statement asks for something else.
bool ShuttleWords::look(const std::string& name, const KvoStatement& statement)
{
    int next = action_position;
    bool shows = statement.Count() == action_position;
    bool forgets = !shows && TakeWord(statement, "free", next);
    bool watches = !shows && TakeWord(statement, "watch", next);
    bool stores = !shows && TakeWord(statement, "into", next);
    if (!(shows || forgets || watches || stores))
        return false;
    if (!stores && next != statement.Count())
        return false;
    ZtShuttle* shuttle = find(name);
    if (!shuttle)
        return true;
    if (shows)
        std::cout << line_of(name, *shuttle) << "\n";
    else if (forgets)
        shuttles.erase(name);
    else if (watches)
        watch(name);
    else if (!TakeInto(runner, statement, next, shuttle->Time()))
        TellNotUnderstood(word);
    return true;
}

/// Reads one step from position `next` on, which then stands behind it.
///
/// Returns: false if there is none; `told` is true if that was reported.
bool ShuttleWords::read_step(const KvoStatement& statement, int& next,
                             Step& step, bool& told)
{
    for (const TimeName& known : time_names)
        if (TakeWord(statement, known.name, next)) {
            step.kind = Step::Kind::Time;
            step.which = known.index;
            told = !TakeTime(word, statement, next, step.time);
            return !told;
        }
    if (TakeWord(statement, "speed", next)) {
        step.kind = Step::Kind::Speed;
        return take_speed(statement, next, step.speed);
    }
    bool is_mode = TakeWord(statement, "repeat", next);
    step.kind = is_mode ? Step::Kind::Mode : Step::Kind::State;
    step.which = is_mode ? take_one_of(mode_names, statement, next)
                         : take_one_of(state_names, statement, next);
    return step.which >= 0;
}

/// Takes all steps; the first one makes the shuttle, unless it is there.
void ShuttleWords::take(const std::string& name, const std::vector<Step>& steps)
{
    std::unique_ptr<ZtShuttle>& kept = shuttles[name];
    if (!kept)
        kept = std::make_unique<ZtShuttle>();
    ZtShuttle& shuttle = *kept;
    constexpr int tells = 0;
    for (const Step& step : steps) {
        // So that one that has come to its end is seen to stand still.
        shuttle.Time();
        if (step.kind == Step::Kind::Time && shuttle.playing)
            ZtError("Shuttle: %s plays, its times can be set when it stands "
                    "still\n",
                    name.c_str());
        else if (step.kind == Step::Kind::Time)
            shuttle.SetTime(step.time, step.which, tells);
        else if (step.kind == Step::Kind::Speed)
            shuttle.SetSpeed(step.speed, tells);
        else if (step.kind == Step::Kind::Mode)
            shuttle.SetRepeatMode(
                static_cast<ZtShuttle::RepeatType>(step.which), tells);
        else
            shuttle.SetState(static_cast<ZtShuttle::StateType>(step.which),
                             tells);
    }
}

/// Reports: an error if there is no such shuttle.
ZtShuttle* ShuttleWords::find(const std::string& name)
{
    auto found = shuttles.find(name);
    if (found != shuttles.end())
        return found->second.get();
    std::string known;
    for (const auto& entry : shuttles)
        known += (known.empty() ? "are: " : ", ") + entry.first;
    ZtError("Shuttle: no shuttle is named %s; there %s\n", name.c_str(),
            known.empty() ? "are none" : known.c_str());
    return nullptr;
}

void ShuttleWords::watch(const std::string& name)
{
    // A statement that runs meanwhile may forget the shuttle.
    auto line = [&] {
        auto found = shuttles.find(name);
        return found == shuttles.end() ? name + ": forgotten"
                                       : line_of(name, *found->second);
    };
    auto ended = [&] {
        auto found = shuttles.find(name);
        return found == shuttles.end() ||
               found->second->state == ZtShuttle::Stopped;
    };
    ShowLive(line, ended, runner);
}

void ShuttleWords::list()
{
    for (const auto& [name, shuttle] : shuttles)
        std::cout << line_of(name, *shuttle) << "\n";
}

} // namespace ztsh
