#include <cstdlib>
#include <memory>
#include <random>

#include "BeatModel.h"
#include "support/BeatTest.h"

// Six timers and their model through hundreds of thousands of beats: random
// requests between the beats, callbacks that ask for more inside them, timers
// that come and go, late beats, and a queue that overflows now and then.
//
// ZT_MODEL_BEATS sets another number of beats.
namespace {

constexpr long default_beats = 300000;
constexpr int data_count = 64;
constexpr std::size_t longest_list = 12;
constexpr std::size_t most_stop_callbacks = 3;

int names[data_count]; // what the data pointers point to

void CalledA(ZtTimer* timer, void* data);
void CalledB(ZtTimer* timer, void* data);
constexpr ZtTimerCallback callbacks[] = {CalledA, CalledB};

/// The real timers and what their callbacks did, without allocating.
struct Real
{
    static constexpr int most_calls = 4096;
    alignas(
        ZtTimer) unsigned char rooms[BeatModel::timer_count][sizeof(ZtTimer)];
    BeatModel::Call calls[most_calls];
    int call_count = 0;

    ZtTimer* timer(int index)
    {
        return std::launder(reinterpret_cast<ZtTimer*>(rooms[index]));
    }

    int index_of(const ZtTimer* wanted)
    {
        return static_cast<int>(
            (reinterpret_cast<const unsigned char*>(wanted) - rooms[0]) /
            static_cast<std::ptrdiff_t>(sizeof(ZtTimer)));
    }
};
Real real;

/// What a callback asks for: the same of the real timers and of the model.
struct Reaction
{
    enum Kind {
        Nothing,
        PostRepeat,
        PostTrigger,
        UnpostItself,
        StopItself,
        RestartItself,
        ForceItself,
        StartAnother,
        ResetItself,
        ReverseAnother,
        StartAndStop
    } kind;
    int data;
    std::int32_t ticks;
    long interval;
};

Reaction ReactionTo(const BeatModel::Call& call)
{
    constexpr Reaction::Kind kinds[] = {
        Reaction::PostRepeat,     Reaction::PostTrigger,
        Reaction::UnpostItself,   Reaction::StopItself,
        Reaction::RestartItself,  Reaction::ForceItself,
        Reaction::StartAnother,   Reaction::ResetItself,
        Reaction::ReverseAnother, Reaction::StartAndStop};
    constexpr int kind_count = sizeof kinds / sizeof kinds[0];
    const int kind = call.data % (2 * kind_count);
    return {kind < kind_count ? kinds[kind] : Reaction::Nothing,
            (call.data * 7 + call.timer + 3) % data_count,
            (call.data - 20) * 100, 5L + call.data * 3};
}

void Ask(ZtTimer* timer, const Reaction& reaction, int callback, int data)
{
    const auto another = [timer] {
        return real.timer((real.index_of(timer) + 1) % BeatModel::timer_count);
    };
    std::size_t length = 0;
    for (const ZtTimerCallbackInfo* record = timer->callbacks; record;
         record = record->next)
        ++length;
    switch (reaction.kind) {
    case Reaction::Nothing:
        break;
    case Reaction::PostRepeat:
        if (length < longest_list)
            timer->post_repeat(callbacks[1 - callback], &names[reaction.data],
                               reaction.interval);
        break;
    case Reaction::PostTrigger:
        if (length < longest_list)
            timer->post_trigger(callbacks[callback], &names[reaction.data],
                                timer->current +
                                    KvoTime::FromTicks(reaction.ticks));
        break;
    case Reaction::UnpostItself:
        timer->unpost(callbacks[callback], &names[data]);
        break;
    case Reaction::StopItself:
        timer->stop();
        break;
    case Reaction::RestartItself:
        timer->restart();
        break;
    case Reaction::ForceItself:
        timer->force(KvoTime::FromTicks(reaction.ticks));
        break;
    case Reaction::StartAnother:
        another()->start();
        break;
    case Reaction::ResetItself:
        timer->reset_callbacks();
        break;
    case Reaction::ReverseAnother:
        another()->reverse();
        break;
    case Reaction::StartAndStop:
        timer->start();
        timer->stop();
        break;
    }
}

void Called(int callback, ZtTimer* timer, void* data)
{
    const int name = *static_cast<int*>(data);
    const BeatModel::Call call = {real.index_of(timer), callback, name};
    if (real.call_count < Real::most_calls)
        real.calls[real.call_count] = call;
    ++real.call_count;
    Ask(timer, ReactionTo(call), callback, name);
}

void CalledA(ZtTimer* timer, void* data)
{
    Called(0, timer, data);
}

void CalledB(ZtTimer* timer, void* data)
{
    Called(1, timer, data);
}

class ModelReactions final : public BeatModel::Reactions
{
public:
    void Called(BeatModel& model, BeatModel::Call call) override
    {
        const Reaction reaction = ReactionTo(call);
        const int another = (call.timer + 1) % BeatModel::timer_count;
        const BeatModel::Timer& timer = model.timers[call.timer];
        const bool room = timer.callbacks.size() < longest_list;
        BeatModel::Request post = {BeatModel::Post, call.timer};
        switch (reaction.kind) {
        case Reaction::Nothing:
            break;
        case Reaction::PostRepeat:
            post.record = {true,  1 - call.callback, reaction.data,
                           false, reaction.interval, 0,
                           0};
            if (room)
                model.Ask(post);
            break;
        case Reaction::PostTrigger:
            post.record = {false,
                           call.callback,
                           reaction.data,
                           false,
                           0,
                           0,
                           timer.current + reaction.ticks};
            if (room)
                model.Ask(post);
            break;
        case Reaction::UnpostItself:
            model.Ask(
                {BeatModel::Unpost, call.timer, call.callback, call.data});
            break;
        case Reaction::StopItself:
            model.Ask({BeatModel::Stop, call.timer});
            break;
        case Reaction::RestartItself:
            model.Ask({BeatModel::Restart, call.timer});
            break;
        case Reaction::ForceItself:
            model.Ask({BeatModel::Force, call.timer, 0, 0, reaction.ticks});
            break;
        case Reaction::StartAnother:
            model.Ask({BeatModel::Start, another});
            break;
        case Reaction::ResetItself:
            model.Ask({BeatModel::ResetCallbacks, call.timer});
            break;
        case Reaction::ReverseAnother:
            model.AskToReverse(another);
            break;
        case Reaction::StartAndStop:
            model.Ask({BeatModel::Start, call.timer});
            model.Ask({BeatModel::Stop, call.timer});
            break;
        }
    }
};

/// Deletes and counts the reports of timers that were in no slot.
class ReportCount : public ZtErrHandler
{
public:
    void Handle(ZtErr* error) override
    {
        ++count;
        delete error;
    }
    int count = 0;
};

class BeatAgainstModel : public BeatTest
{
protected:
    BeatAgainstModel() : model(reactions), random(20241)
    {
        for (int name = 0; name < data_count; ++name)
            names[name] = name;
        ZtTimerBeat::start();
        ZtTimerBeat::global_start_tm = KvoTime::ZERO;
        for (int timer = 0; timer < BeatModel::timer_count; ++timer)
            Make(timer);
    }

    ~BeatAgainstModel() override
    {
        for (int timer = 0; timer < BeatModel::timer_count; ++timer)
            real.timer(timer)->~ZtTimer();
    }

    int Below(int limit)
    {
        return static_cast<int>(random() % static_cast<unsigned>(limit));
    }

    void Make(int timer)
    {
        const int start = Below(20000) - 10000;
        const int end = Below(8) ? start + Below(20000) - 10000 : 3;
        new (real.rooms[timer])
            ZtTimer(KvoTime::FromTicks(start), KvoTime::FromTicks(end));
        model.Make(timer, start, end);
    }

    void DestroyAndMake(int timer)
    {
        real.timer(timer)->~ZtTimer();
        expected_reports += !model.Destroy(timer);
        Make(timer);
    }

    void Post(int timer)
    {
        const int callback = Below(2), data = Below(data_count);
        if (model.timers[timer].callbacks.size() >= longest_list)
            return;
        BeatModel::Request request = {BeatModel::Post, timer};
        if (Below(2)) {
            const long interval = 1 + Below(200);
            real.timer(timer)->post_repeat(callbacks[callback], &names[data],
                                           interval);
            request.record = {true, callback, data, false, interval, 0, 0};
        } else {
            const int ticks = Below(30000) - 15000;
            real.timer(timer)->post_trigger(callbacks[callback], &names[data],
                                            KvoTime::FromTicks(ticks));
            request.record = {false, callback, data, false, 0, 0, ticks};
        }
        model.Ask(request);
    }

    void Unpost(int timer)
    {
        const auto& records = model.timers[timer].callbacks;
        int callback = Below(2), data = Below(data_count);
        if (!records.empty() && Below(4)) {
            const auto& record = records[static_cast<std::size_t>(
                Below(static_cast<int>(records.size())))];
            callback = record.callback;
            data = record.data;
        }
        real.timer(timer)->unpost(callbacks[callback], &names[data]);
        model.Ask({BeatModel::Unpost, timer, callback, data});
    }

    void Force(int timer)
    {
        const int ticks = Below(20000) - 10000;
        real.timer(timer)->force(KvoTime::FromTicks(ticks));
        model.Ask({BeatModel::Force, timer, 0, 0, ticks});
    }

    void PostStop(int timer)
    {
        if (model.timers[timer].stop_callbacks.size() >= most_stop_callbacks)
            return;
        const int callback = Below(2), data = Below(data_count);
        real.timer(timer)->post_stop(callbacks[callback], &names[data]);
        model.PostStop(timer, callback, data);
    }

    /// One random request of each.
    void Ask()
    {
        const int timer = Below(BeatModel::timer_count);
        ZtTimer* const its = real.timer(timer);
        switch (Below(16)) {
        case 0:
        case 1:
        case 2:
            return Post(timer);
        case 3:
        case 4:
            return Unpost(timer);
        case 5:
        case 6:
        case 7:
            its->start();
            return model.Ask({BeatModel::Start, timer});
        case 8:
        case 9:
            its->restart();
            return model.Ask({BeatModel::Restart, timer});
        case 10:
            its->stop();
            return model.Ask({BeatModel::Stop, timer});
        case 11:
            return Force(timer);
        case 12:
            its->reverse();
            return model.AskToReverse(timer);
        case 13:
            its->reset_callbacks();
            return model.Ask({BeatModel::ResetCallbacks, timer});
        case 14:
            return PostStop(timer);
        default:
            // With the queue full the new timer would get no slot.
            if (Below(20) == 0 && model.queue.size() < 50)
                DestroyAndMake(timer);
        }
    }

    bool CallsAgree() const
    {
        return real.call_count == static_cast<int>(model.calls.size()) &&
               real.call_count <= Real::most_calls &&
               std::equal(model.calls.begin(), model.calls.end(), real.calls);
    }

    static bool Agree(const ZtTimer& timer, const BeatModel::Timer& expected)
    {
        return timer.state == expected.state &&
               timer.end_mode == expected.end_mode &&
               (timer.counting_up != 0) == expected.counting_up &&
               timer.start_time.Ticks() == expected.start &&
               timer.end.Ticks() == expected.end &&
               timer.current.Ticks() == expected.current &&
               timer.clock_at_start.Ticks() == expected.clock_at_start &&
               timer.position_at_start.Ticks() == expected.position_at_start;
    }

    static bool ListsAgree(const ZtTimer& timer,
                           const BeatModel::Timer& expected)
    {
        const ZtTimerCallbackInfo* record = timer.callbacks;
        for (const BeatModel::Record& wanted : expected.callbacks) {
            if (!record || record->callback != callbacks[wanted.callback] ||
                record->data != &names[wanted.data] ||
                (record->kind != 0) != wanted.repeats ||
                (record->fired != 0) != wanted.fired ||
                (wanted.repeats && record->last_fired != wanted.last_fired))
                return false;
            record = record->next;
        }
        return record == nullptr;
    }

    bool AllAgree(bool with_lists)
    {
        if (!CallsAgree())
            return false;
        for (int index = 0; index < BeatModel::timer_count; ++index) {
            const ZtTimer* const timer = real.timer(index);
            const int slot = model.slots[index];
            if (!Agree(*timer, model.timers[index]) ||
                ZtTimerBeat::timers[index] !=
                    (slot < 0 ? nullptr : real.timer(slot)))
                return false;
            if (with_lists && !ListsAgree(*timer, model.timers[index]))
                return false;
        }
        return true;
    }

    void Beat()
    {
        if (Below(50) == 0)
            clock.AdvanceMicroseconds(Below(300) * 1000);
        real.call_count = 0;
        ASSERT_TRUE(alarm.Step());
        model.Beat(Milliseconds());
        total_calls += real.call_count;
    }

    ModelReactions reactions;
    BeatModel model;
    std::mt19937 random;
    ReportCount reports;
    int expected_reports = 0;
    std::int64_t total_calls = 0;
};

TEST_F(BeatAgainstModel, NothingIsLostDoubledOrMisordered)
{
    const char* const wanted = std::getenv("ZT_MODEL_BEATS");
    const long beats = wanted ? std::atol(wanted) : default_beats;

    for (long beat = 0; beat < beats; ++beat) {
        int requests = Below(4);
        if (Below(1000) == 0)
            requests = 150;
        while (requests-- > 0)
            Ask();
        Beat();
        ASSERT_TRUE(AllAgree(beat % 16 == 0)) << "beat " << beat;
    }

    EXPECT_EQ(reports.count, expected_reports);
    EXPECT_GT(total_calls, beats);
    EXPECT_GE(ZtTimerBeat::Statistics().beats, beats);
}

} // namespace
