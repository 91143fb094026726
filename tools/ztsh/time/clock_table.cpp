#include "time/clock_table.h"

#include <ZT/error.h>

#include <algorithm>
#include <utility>

namespace ztsh {

namespace {

/// Drops every report while it lives.
class Silence : public ZtErrHandler
{
public:
    void Handle(ZtErr* error) override { delete error; }
};

bool is_driven(const ZtTimer& timer)
{
    const auto& slots = ZtTimerBeat::timers;
    return std::find(std::begin(slots), std::end(slots), &timer) !=
           std::end(slots);
}

} // namespace

static_assert(std::atomic<std::uint64_t>::is_always_lock_free &&
                  std::atomic<bool>::is_always_lock_free,
              "the beat marks reactions");

constinit std::atomic<std::uint64_t> Reaction::marks = 0;
constinit std::atomic<bool> Reaction::marked = false;

Reaction::Reaction(Statements its_statements)
    : statements(std::make_shared<const Statements>(std::move(its_statements)))
{}

void Reaction::Mark(ZtTimer*, void* data)
{
    auto* reaction = static_cast<Reaction*>(data);
    if (reaction->mark == 0)
        reaction->mark = ++marks;
    marked = true;
}

std::uint64_t Reaction::TakeMark()
{
    return mark.exchange(0);
}

Clock::Clock()
{
    timer.emplace();
}

Clock::Clock(KvoTime start, KvoTime end)
{
    timer.emplace(start, end);
}

Clock::~Clock()
{
    std::optional<Silence> silence;
    // A timer that no beat has seen yet is nothing to report.
    if (!is_driven(*timer))
        silence.emplace();
    timer.reset();
}

bool Clock::AtRest() const
{
    // In this order: the beat may carry the last request out in between.
    bool requested = ZtTimerBeat::defer_op_count > 0;
    return !requested && timer->state == ZtTimer::Stopped;
}

void Clock::At(KvoTime time, Statements statements)
{
    timer->post_trigger(Reaction::Mark, add(std::move(statements)), time);
}

void Clock::Every(long milliseconds, Statements statements)
{
    timer->post_repeat(Reaction::Mark, add(std::move(statements)),
                       milliseconds);
}

void Clock::OnStop(Statements statements)
{
    timer->post_stop(Reaction::Mark, add(std::move(statements)));
}

void* Clock::add(Statements statements)
{
    reactions.push_back(std::make_unique<Reaction>(std::move(statements)));
    return reactions.back().get();
}

Clock* ClockTable::Find(const std::string& name)
{
    auto found = clocks.find(name);
    return found == clocks.end() ? nullptr : found->second.get();
}

Clock* ClockTable::Make(const std::string& name)
{
    if (!make_room(name))
        return nullptr;
    return (clocks[name] = std::make_unique<Clock>()).get();
}

Clock* ClockTable::Make(const std::string& name, KvoTime start, KvoTime end)
{
    if (!make_room(name))
        return nullptr;
    return (clocks[name] = std::make_unique<Clock>(start, end)).get();
}

void ClockTable::Remove(const std::string& name)
{
    clocks.erase(name);
}

bool ClockTable::Any() const
{
    return Reaction::AnyMarked();
}

std::vector<std::weak_ptr<const Statements>> ClockTable::Take()
{
    struct Taken
    {
        std::uint64_t mark;
        std::weak_ptr<const Statements> statements;
    };
    std::vector<Taken> taken;
    // Cleared first: a mark that is made from here on may be taken now or
    // found by the next look, but it is not lost.
    Reaction::ForgetMarked();
    for (const auto& entry : clocks)
        for (const auto& reaction : entry.second->Reactions())
            if (std::uint64_t mark = reaction->TakeMark())
                taken.push_back({mark, reaction->Do()});
    std::sort(taken.begin(), taken.end(),
              [](const Taken& a, const Taken& b) { return a.mark < b.mark; });
    std::vector<std::weak_ptr<const Statements>> statements;
    statements.reserve(taken.size());
    for (Taken& each : taken)
        statements.push_back(std::move(each.statements));
    return statements;
}

/// The one that is to be replaced goes before its successor comes, since a beat
/// may be between the two.
bool ClockTable::make_room(const std::string& name)
{
    constexpr std::size_t most = ZtTimerBeat::timer_limit;
    if (clocks.size() - clocks.count(name) >= most)
        return false;
    clocks.erase(name);
    return true;
}

} // namespace ztsh
