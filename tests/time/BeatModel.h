#ifndef ZT_TESTS_BEATMODEL_H
#define ZT_TESTS_BEATMODEL_H

#include <cstdint>
#include <vector>

/// Timers and their beat once more, written down step by step from what they
/// promise, with plain numbers and containers and no signal. A test drives it
/// beside the real ones and compares.
class BeatModel
{
public:
    static constexpr int timer_count = 6;
    static constexpr int queue_limit = 100;
    static constexpr int endless = 3, stops_at_end = 0;

    enum State : int { Running = 0, Ended = 1, Stopped = 2 };
    enum Code : int {
        ResetCallbacks,
        Add,
        Post,
        Unpost,
        Reverse,
        Start,
        Restart,
        Stop,
        Force
    };

    struct Record
    {
        bool repeats;
        int callback;
        int data;
        bool fired;
        std::int64_t interval;
        std::int64_t last_fired;
        std::int32_t time;
    };

    struct Timer
    {
        int state = Stopped;
        int end_mode = endless;
        bool counting_up = true;
        std::int32_t start = 0, end = 0, current = 0;
        std::int32_t clock_at_start = 0, position_at_start = 0;
        std::vector<Record> callbacks;
        std::vector<Record> stop_callbacks;
    };

    struct Request
    {
        Code code;
        int timer; ///< -1 once the timer is gone.
        int callback = 0;
        int data = 0;
        std::int32_t time = 0;
        Record record = {};
    };

    struct Call
    {
        int timer;
        int callback;
        int data;
        bool operator==(const Call&) const = default;
    };

    /// What a callback does; it asks the model as a host asks timers.
    class Reactions
    {
    public:
        virtual void Called(BeatModel& model, Call call) = 0;

    protected:
        ~Reactions() = default;
    };

    explicit BeatModel(Reactions& its_reactions) : reactions(its_reactions) {}

    void Make(int timer, std::int32_t start, std::int32_t end);

    /// Returns: whether the timer was in a slot.
    bool Destroy(int timer);

    void Ask(const Request& request);
    void AskToReverse(int timer);
    void PostStop(int timer, int callback, int data);

    /// One beat, so many milliseconds after the start.
    void Beat(std::int64_t milliseconds);

    Timer timers[timer_count];
    int slots[timer_count] = {-1, -1, -1, -1, -1, -1};
    std::vector<Request> queue;
    std::vector<Call> calls; ///< In the latest beat.
    std::int32_t clock = 0;

private:
    void Advance(Timer& timer) const;
    void Serve(int timer, std::int64_t milliseconds);
    void Execute(const Request& request);
    void CallBack(int timer, const Record& record);

    Reactions& reactions;
};

#endif
