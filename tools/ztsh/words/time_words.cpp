#include "words/time_words.h"

#include "time/time_text.h"

#include <ZT/error.h>

#include <iostream>

namespace ztsh {

namespace {

enum Selector : int { Time, Rate };

constexpr int most_words = 1000;

const std::vector<Word> words = {
    {"Time", "TIME [at FPS] [as UNIT [at FPS]] [into NAME]",
     "Writes a time. TIME is a timecode (its last field is frames), a number\n"
     "of frames, or a number and a unit; such are combined with + and -, and\n"
     "with * and / by whole numbers. UNIT is timecode, frames, ticks, ms, s,\n"
     "min or h. Without FPS the rate is that of Rate; one that is given once\n"
     "holds for reading and writing. With into it sets a variable instead.",
     1, most_words},
    {"Rate", "[FPS]",
     "Sets the frame rate that holds where none is given, or writes it.", 0, 1},
};

} // namespace

/// What a statement asks for.
struct TimeWords::Order
{
    int read_rate = 0; ///< 0 for the default.
    int write_rate = 0;
    TimeUnit unit = TimeUnit::Timecode;
    const char* variable = nullptr;
};

TimeWords::TimeWords(Runner& script_runner)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner)
{}

void TimeWords::Do(KvoStatement& statement, int selector)
{
    if (selector == Time)
        time(statement);
    else
        rate(statement.ArgText(1));
}

void TimeWords::time(const KvoStatement& statement)
{
    Order order;
    if (!read_order(statement, order))
        return;
    KvoTime time;
    TimeReader expression(statement, 1, order.read_rate);
    if (!expression.Read(time)) {
        ZtError("Time: %s\n", expression.Why().c_str());
        return;
    }
    std::string text = TimeText(time, order.unit, order.write_rate);
    if (order.variable)
        runner.variables.Set(order.variable, text);
    else
        std::cout << text << "\n";
}

/// Reads what stands behind the expression. That is done first, for the rate
/// stands there.
///
/// Reports: an error if anything is wrong.
bool TimeWords::read_order(const KvoStatement& statement, Order& order)
{
    // The same words are the expression at any rate, and at the highest one
    // what is too long for a time is too long at all of them.
    KvoTime ignored;
    TimeReader expression(statement, 1, KvoTime::ticks_per_second);
    if (!expression.Read(ignored)) {
        ZtError("Time: %s\n", expression.Why().c_str());
        return false;
    }
    int next = expression.Next();
    auto take = [&](const char* word) {
        const char* text = statement.ArgText(next);
        bool there = text && std::string(text) == word;
        next += there ? 1 : 0;
        return there;
    };
    auto take_rate = [&](int& fps) {
        return !take("at") || ReadRate(statement.ArgText(next++), fps);
    };
    bool right = take_rate(order.read_rate);
    if (right && take("as")) {
        const char* name = statement.ArgText(next++);
        right = name && UnitOf(name, order.unit) && take_rate(order.write_rate);
    }
    if (order.read_rate == 0)
        order.read_rate = order.write_rate;
    if (order.write_rate == 0)
        order.write_rate = order.read_rate;
    if (right && take("into")) {
        order.variable = statement.ArgText(next++);
        right = order.variable && Variables::IsName(order.variable);
    }
    if (!right || next != statement.Count()) {
        Expected(Time);
        return false;
    }
    return true;
}

void TimeWords::rate(const char* fps)
{
    int rate = 0;
    if (!fps)
        std::cout << KvoTime::default_fps << "\n";
    else if (ReadRate(fps, rate))
        KvoTime::default_fps = rate;
    else
        ZtError("Rate: %s is no rate from 1 to %d frames a second\n", fps,
                KvoTime::ticks_per_second);
}

} // namespace ztsh
