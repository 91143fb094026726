#include "ZT/shuttle.h"

#include <cmath>
#include <cstdint>

#include "core/truncate.h"

// Positions are worked out in 64 bits and brought into one day at the very end,
// so that a shuttle that runs on for days never leaves the range of a time.

namespace {
constexpr KvoTime day = KvoTime::FromTicks(24 * KvoTime::ticks_per_hour);
constexpr KvoTime minute = KvoTime::FromTicks(KvoTime::ticks_per_minute);
constexpr float fast = 1.25f;

/// Whether some shuttle is at the end of its range just now.
bool handling_end_of_range = false;

/// Sets the flag for as long as it lives.
class EndOfRange
{
public:
    EndOfRange() { handling_end_of_range = true; }
    ~EndOfRange() { handling_end_of_range = false; }
    EndOfRange(const EndOfRange&) = delete;
    EndOfRange& operator=(const EndOfRange&) = delete;
};

bool plays_forward(ZtShuttle::StateType state)
{
    return state == ZtShuttle::Play || state == ZtShuttle::FastForward;
}

bool plays_backward(ZtShuttle::StateType state)
{
    return state == ZtShuttle::Reverse || state == ZtShuttle::FastReverse;
}

/// Gives the marked time that play in `state` comes from. A state that does
/// not play stays where it is.
int start_of(ZtShuttle::StateType state)
{
    if (plays_forward(state))
        return ZtShuttle::in_point;
    return plays_backward(state) ? ZtShuttle::out_point
                                 : ZtShuttle::current_time;
}

/// Gives the marked time that play in `state` comes to.
int end_of(ZtShuttle::StateType state)
{
    if (plays_forward(state))
        return ZtShuttle::out_point;
    return plays_backward(state) ? ZtShuttle::in_point
                                 : ZtShuttle::current_time;
}

/// Gives the state that plays the other way at the same rate.
ZtShuttle::StateType turned_round(ZtShuttle::StateType state)
{
    switch (state) {
    case ZtShuttle::FastReverse:
        return ZtShuttle::FastForward;
    case ZtShuttle::Reverse:
        return ZtShuttle::Play;
    case ZtShuttle::Play:
        return ZtShuttle::Reverse;
    case ZtShuttle::FastForward:
        return ZtShuttle::FastReverse;
    case ZtShuttle::Stopped:
        break;
    }
    return ZtShuttle::Stopped;
}

/// Converts ticks to frames and fractions of a frame at the default rate.
double in_frames(std::int64_t ticks)
{
    return static_cast<double>(ticks) * KvoTime::default_fps / 6000.0;
}

/// Converts frames back as `KvoTime(double)` does, and wraps the time into one
/// day however many days it is.
KvoTime wrapped_time(double frames)
{
    const double ticks = std::fmod(frames * KvoTime(1).Ticks(),
                                   static_cast<double>(day.Ticks()));
    return KvoTime::FromTicks(zt_core::truncate_to<std::int32_t>(ticks)).Wrap();
}
} // namespace

ZtShuttleListener::~ZtShuttleListener() = default;

ZtShuttle::ZtShuttle()
    : stopwatch(1.0), speed(1.0f), wraps(0), state(Stopped), base_speed(1.0f),
      repeat_mode(Once), playing(0), go_pending(0), listener(nullptr)
{}

ZtShuttle::~ZtShuttle() = default;

KvoTime ZtShuttle::Time()
{
    if (playing)
        set_active_time();
    return times[current_time];
}

void ZtShuttle::Go()
{
    if (!go_pending)
        return;
    stopwatch.Mark();
    PlayNotify();
    playing = 1;
    go_pending = 0;
}

void ZtShuttle::CancelGo()
{
    if (!go_pending)
        return;
    PostPlayNotify();
    go_pending = 0;
}

void ZtShuttle::PrePlayNotify(float, KvoTime, KvoTime) {}

void ZtShuttle::PlayNotify() {}

void ZtShuttle::PostPlayNotify() {}

void ZtShuttle::SetTime(KvoTime time, int index, int notify)
{
    if (playing || index < 0 || index > out_point)
        return;
    times[index] = time.Wrap();
    if (notify)
        change_notify();
}

void ZtShuttle::SetSpeed(float new_speed, int notify)
{
    base_speed = new_speed;
    if (notify)
        change_notify();
}

void ZtShuttle::SetRepeatMode(RepeatType mode, int notify)
{
    repeat_mode = mode;
    if (notify)
        change_notify();
}

void ZtShuttle::SetState(StateType new_state, int notify)
{
    if (new_state == state)
        return;
    if (state != Stopped) {
        stop_playback();
        end_restarted_play();
    }
    if (plays_forward(new_state) || plays_backward(new_state)) {
        const bool is_fast =
            new_state == FastForward || new_state == FastReverse;
        const float play_speed = is_fast ? base_speed * fast : base_speed;
        from = times[start_of(new_state)];
        to = times[end_of(new_state)];
        speed = plays_forward(new_state) ? play_speed : -play_speed;
        start_playback();
    }
    state = new_state;
    if (notify)
        change_notify();
}

void ZtShuttle::start_playback()
{
    if (playing)
        return;
    offset = KvoTime::ZERO;
    if (speed > 0)
        set_forward_range();
    else if (speed < 0)
        set_backward_range();
    else
        length = KvoTime::ZERO;
    stopwatch.rate = std::fabs(speed);
    PrePlayNotify(speed, times[current_time],
                  speed < 0 ? times[in_point] : times[out_point]);
    if (!go_pending) {
        go_pending = 1;
        Go();
    }
}

void ZtShuttle::set_forward_range()
{
    const KvoTime position = times[current_time];
    wraps = to < from;
    if (from < to) {
        length = to - from;
        if (from < position && position <= to)
            offset = position - from;
    } else if (wraps) {
        length = to - (from - day);
        if (from < position)
            offset = position - from;
        else if (position <= to)
            offset = (day - from) + position;
    } else {
        length = KvoTime::ZERO;
    }
}

void ZtShuttle::set_backward_range()
{
    const KvoTime position = times[current_time];
    wraps = from < to;
    if (to < from) {
        length = from - to;
        if (to < position && position <= from)
            offset = from - position;
    } else if (wraps) {
        length = from - (to - day);
        if (position < from)
            offset = from - position;
        else if (to <= position)
            offset = from + (day - position);
    } else {
        length = KvoTime::ZERO;
    }
}

void ZtShuttle::stop_playback()
{
    if (!playing)
        return;
    playing = 0;
    PostPlayNotify();
    set_active_time();
}

// The end of a loop or a swing that is noticed only by stopping starts play
// again; whoever asked for the stop must not be left with a playing shuttle.
void ZtShuttle::end_restarted_play()
{
    if (!playing)
        return;
    playing = 0;
    PostPlayNotify();
}

void ZtShuttle::set_active_time()
{
    const auto fraction = static_cast<double>(fraction_played());
    if (repeat_mode != Continuous && (fraction < 0 || fraction > 1)) {
        handle_out_of_range();
        return;
    }
    std::int64_t first = from.Ticks();
    std::int64_t last = to.Ticks();
    if (repeat_mode == Continuous) {
        last = first + (speed > 0 ? minute : -minute).Ticks();
    } else if (wraps && to < from) {
        while (first > last)
            first -= day.Ticks();
    } else if (wraps) {
        while (last > first)
            last -= day.Ticks();
    }
    // The start of the range is exact at every rate, also where frames and
    // ticks do not convert both ways.
    times[current_time] =
        fraction == 0
            ? from.Wrap()
            : wrapped_time(in_frames(first) +
                           fraction * (in_frames(last) - in_frames(first)));
}

// The seconds are taken in single precision, as a time made from seconds is.
float ZtShuttle::fraction_played()
{
    const auto seconds = static_cast<float>(stopwatch.Split());
    const auto elapsed = zt_core::truncate_to<std::int64_t>(seconds * 6000.0f);
    const double position = static_cast<double>(elapsed) + offset.Ticks();
    const KvoTime whole = repeat_mode == Continuous ? minute : length;
    const double whole_frames = in_frames(whole.Ticks());
    if (whole_frames == 0)
        return 0.0f;
    return static_cast<float>(position * KvoTime::default_fps / 6000.0 /
                              whole_frames);
}

void ZtShuttle::handle_out_of_range()
{
    if (handling_end_of_range)
        return;
    const EndOfRange scope;
    const StateType before = state;
    switch (repeat_mode) {
    case Once:
        SetState(Stopped, 1);
        jump_to(end_of(before));
        break;
    case Loop:
        SetState(Stopped, 0);
        jump_to(start_of(before));
        SetState(before, 1);
        break;
    case Swing:
        SetState(Stopped, 0);
        jump_to(end_of(before));
        SetState(turned_round(before), 1);
        break;
    case Continuous:
        break;
    }
}

void ZtShuttle::jump_to(int index)
{
    times[current_time] = times[index];
}

void ZtShuttle::change_notify()
{
    if (listener)
        listener->ShuttleChanged(this);
}
