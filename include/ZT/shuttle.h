#ifndef ZT_SHUTTLE_H
#define ZT_SHUTTLE_H

/// \file
/// A play-back transport: plays forward or backward between an in and an out
/// point, once, in a loop, swinging back and forth, or running on for ever.
///
/// Surprising: a shuttle has no timer of its own. Its time is computed from the
/// clock on the wall when `Time` is asked, and only then is the end of the
/// range noticed; between two calls nothing happens.

#include <KVO/KvoTime.h>
#include <ZT/swatch.h>

class ZtShuttle;

/// Is told when a shuttle has changed.
class ZT_API ZtShuttleListener
{
public:
    /// Called after a change of `shuttle` that was made with `notify`, and when
    /// the end of the range changed its state.
    virtual void ShuttleChanged(ZtShuttle* shuttle) = 0;

    virtual ~ZtShuttleListener();
};

/// Moves a current time between an in and an out point.
///
/// A subclass hooks into the start and the end of play with the three
/// notifications. It may delay the start by an override of `Go` that does not
/// call this class's; it calls that later, or `CancelGo`.
///
/// Play starts where the current time lies if that is inside the range,
/// otherwise at the range's start. If the out point lies before the in point
/// the range runs through midnight.
///
/// Units:     `notify` is 0 or not 0: whether to tell the listener.
/// Reports:   nothing.
/// Context:   one thread, and not inside the beat.
/// By design: positions are computed in frames at the default rate, with the
///            fraction played as a float, and so may be some ticks off; at a
///            default rate that does not divide 6000 they are scaled by the
///            truncated frame (ZtShuttle.TenSecondsAtSevenFramesASecond). When
///            the clock on the wall is set back behind the start of play that
///            counts as the end of the range
///            (ZtShuttle.AClockSetBackEndsTheRange).
class ZT_API ZtShuttle
{
public:
    /// What the transport does.
    enum StateType : int {
        FastReverse = 0, ///< Plays backward at 1.25 times the base speed.
        Reverse = 1,     ///< Plays backward at the base speed.
        Stopped = 2,     ///< Does not play.
        Play = 3,        ///< Plays forward at the base speed.
        FastForward = 4  ///< Plays forward at 1.25 times the base speed.
    };

    /// What it does at the end of the range.
    enum RepeatType : int {
        Once = 0,      ///< Stops there.
        Loop = 1,      ///< Plays on from the start in the same state.
        Swing = 2,     ///< Turns round and plays back.
        Continuous = 3 ///< Knows no end: time runs on from the start.
    };

    /// Places in `times`; what lies between them is the client's own.
    static constexpr int in_point = 0;
    static constexpr int current_time = 2;
    static constexpr int out_point = 4;

    /// Makes a stopped shuttle at speed 1, with all times 0 and no listener.
    ZtShuttle();

    /// Gives the current time, after bringing it up to date if playing.
    virtual KvoTime Time();

    /// Starts to play if a go is pending: marks the stopwatch, then calls
    /// `PlayNotify`.
    virtual void Go();

    /// Abandons a pending go and calls `PostPlayNotify`.
    ///
    /// By design: the state stays as it was, and `SetState(Stopped, ...)`
    ///            leaves a go pending; to abandon a start, call this and then
    ///            set `Stopped` (ZtShuttle.CancelGoLeavesTheState).
    virtual void CancelGo();

    /// Called before a start, with the signed speed, the current time, and the
    /// point where play will end: the out point, or the in point when the speed
    /// is below 0. Does nothing.
    virtual void PrePlayNotify(float play_speed, KvoTime play_from,
                               KvoTime play_to);

    /// Called when play begins. Does nothing.
    virtual void PlayNotify();

    /// Called when play has ended, and when a pending go is abandoned. Does
    /// nothing.
    virtual void PostPlayNotify();

    virtual ~ZtShuttle();

    /// Sets one of the marked times, brought into one day.
    ///
    /// Units: `index` 0 is the in point, 2 the current time, 4 the out point,
    ///        1 and 3 are the client's. Any other index is ignored, and so is
    ///        every call while playing; neither tells the listener.
    void SetTime(KvoTime time, int index, int notify);

    /// Sets the base speed, which takes effect at the next change of state.
    ///
    /// Units: 1 plays a second in a second; below 0 turns directions round.
    void SetSpeed(float new_speed, int notify);

    /// Sets what happens at the end of the range, at once.
    void SetRepeatMode(RepeatType mode, int notify);

    /// Ends what was played and starts what `new_state` says. The present state
    /// again does nothing, and does not tell the listener.
    ///
    /// A stop that finds the end of the range passed handles it first, with the
    /// listener being told of it; what a loop or a swing starts by this is
    /// ended at once, so that a stop always stops.
    void SetState(StateType new_state, int notify);

    /// The steps that the operations above are made of. Prepares play by the
    /// speed and the marked times, and calls `Go`; nothing while playing.
    void start_playback();

    /// Ends play and fixes the final position; nothing unless playing.
    void stop_playback();

    /// Computes the current time from the stopwatch.
    void set_active_time();

    /// Does what the repeat mode says about the end of the range. A call from
    /// within another, for whatever shuttle, does nothing.
    ///
    /// By design: `Once` tells the listener before the final time is stored
    ///            (ZtShuttle.OnceTellsTheListenerBeforeTheFinalTime).
    void handle_out_of_range();

    /// Tells the listener, if there is one.
    void change_notify();

    ZtStopWatch stopwatch;   ///< Since `Go`; its rate is the absolute speed.
    KvoTime offset;          ///< How far into the range play began.
    KvoTime from;            ///< Where the range starts, in direction of play.
    KvoTime to;              ///< Where it ends.
    KvoTime length;          ///< From one to the other; 0 at speed 0.
    float speed;             ///< Of play; below 0 is backward.
    std::int32_t wraps;      ///< 1 when the range runs through midnight.
    KvoTime times[5];        ///< The marked times.
    StateType state;         ///< What the transport does.
    float base_speed;        ///< As set by `SetSpeed`.
    RepeatType repeat_mode;  ///< As set by `SetRepeatMode`.
    std::int32_t playing;    ///< 1 while playing.
    std::int32_t go_pending; ///< 1 from a start until `Go` or `CancelGo`.
    ZtShuttleListener* listener; ///< The client's own; null for none.

private:
    void set_forward_range();
    void set_backward_range();
    void end_restarted_play();
    float fraction_played();
    void jump_to(int index);
};

#endif
