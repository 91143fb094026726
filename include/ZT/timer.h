#ifndef ZT_TIMER_H
#define ZT_TIMER_H

/// \file
/// Timers, and the one beat of the process that drives them all.
///
/// Surprising: an operation on a timer is a request. It is queued, and the beat
/// carries it out at the end of its next tick, so that `force` followed by a
/// look at `current` still shows the old time. Only destroying a timer and
/// `post_stop` act at once. The beat runs in the alarm signal, and so do all
/// callbacks: they may read fields and call the operations of timers, and
/// nothing else that allocates, locks, reports or touches a stream.
///
/// The beat belongs to the thread that called `ZtTimerBeat::start`; everything
/// here is used from that thread. It interrupts it 250 times a second: waiting
/// in the host (`sleep`, `poll`, `select`) is cut short, so wait in a loop for
/// a moment, not once for a time. Stop the beat before `exec`; after `fork` it
/// runs in the parent only. A host that hooks SIGALRM itself stops the beat.

#include <KVO/KvoTime.h>
#include <ZT/signals.h>

#include <cstddef>
#include <cstdint>
#include <sys/time.h>

struct sigcontext;
class ZtTimer;

/// What a timer calls: the timer, and the data that was posted along.
///
/// Context: inside the beat; may destroy timers that do not live on the heap.
using ZtTimerCallback = void (*)(ZtTimer*, void*);

/// One callback that was posted on a timer.
///
/// Records come from a store of the beat's own, which never goes back to the
/// heap, so `new` and `delete` of one are allowed inside the beat.
struct ZT_API ZtTimerCallbackInfo final
{
    /// When it is called: at a time, or again and again.
    enum Kind : int { Trigger = 0, Repeat = 1 };

    /// Gives room for a record, null when there is no memory.
    static void* operator new(std::size_t bytes) noexcept;
    static void operator delete(void* record) noexcept;

    int kind = Trigger;                 ///< Of no meaning in a stop record.
    ZtTimerCallback callback = nullptr; ///< What is called.
    int fired = 0;               ///< Trigger: 1 once it has fired in this run.
    long interval = 0;           ///< Repeat: milliseconds of the beat's clock.
    std::int64_t last_fired = 0; ///< Repeat: the beat's milliseconds at its
                                 ///< latest call; -1 calls it at the next beat.
    KvoTime time;                ///< Trigger: when it fires. Stop: when posted.
    void* data = nullptr;        ///< The client's, handed to the callback.
    ZtTimerCallbackInfo* next = nullptr; ///< Null at the tail.
};

/// One request that waits for the beat.
struct ZT_API ZtTimerDeferOp
{
    /// What is asked for; another code is carried out as nothing.
    enum Code : int {
        ResetCallbacks = 0,
        Add = 1,
        PostCallback = 2,
        UnpostCallback = 3,
        Reverse = 4,
        Start = 5,
        Restart = 6,
        Stop = 7,
        Force = 8,
        Destroy = 9
    };

    int op = ResetCallbacks;             ///< A `Code`.
    ZtTimer* timer = nullptr;            ///< Null once the timer is gone.
    ZtTimerCallback callback = nullptr;  ///< Unpost: whose record goes.
    KvoTime time;                        ///< Force: the time to set.
    void* data = nullptr;                ///< Unpost: whose record goes.
    ZtTimerCallbackInfo* info = nullptr; ///< Post: the record to link in.
};

/// A clock that runs between two times, forwards or backwards, and calls back.
///
/// Six timers can be driven at a time. A seventh is reported at the next beat;
/// it can be used like others but its time stands still. Fields are for
/// reading: only the beat writes them.
///
/// Context: every operation but making and destroying one may be called inside
///          the beat. A hundred requests fit between two beats; what comes on
///          top is dropped without a word.
class ZT_API ZtTimer
{
public:
    /// What it is doing.
    enum State : int {
        Running = 0,
        Ended = 1, ///< Reached its end in this beat; only the beat sees it.
        Stopped = 2
    };

    /// What its end is to it.
    enum EndMode : int { StopsAtEnd = 0, Endless = 3 };

    /// Makes an endless timer that counts up from 0 and stands still, and asks
    /// the beat to drive it.
    ///
    /// Reports: at the next beat, an error "Too many timers in ZtTimerBeat.\n"
    ///          if six are driven already.
    ZtTimer();

    /// Makes a timer from `start_at` to `end_at` that stands still, and asks
    /// the beat to drive it. It counts up if the start lies before the end.
    ///
    /// Reports:   as the other constructor.
    /// By design: an end of exactly 3 or -3 ticks makes it endless
    ///            (ZtTimerTest.AnEndOfThreeTicksEitherWayMeansEndless), and
    ///            equal start and end make it count down
    ///            (ZtTimerTest.EqualStartAndEndCountDown).
    ZtTimer(KvoTime start_at, KvoTime end_at);

    ZtTimer(const ZtTimer&) = delete;
    ZtTimer& operator=(const ZtTimer&) = delete;

    /// Takes the timer away from the beat at once, withdraws what is queued
    /// for it and frees its records. No stop callback is called.
    ///
    /// Reports: an error "Failed to find timer in ZtTimerBeat.\n" if the beat
    ///          does not drive it, be it that no beat has run since it was
    ///          made.
    ~ZtTimer();

    /// Asks that every trigger may fire once more. Repeats are not touched.
    void reset_callbacks();

    /// Asks for `callback` to be called every `interval` of the beat's clock
    /// while the timer runs: first at the first beat whose milliseconds reach
    /// `interval`, then on the multiples of `interval`.
    ///
    /// Units: `interval` in milliseconds; below 1 is at every beat.
    /// Owner: `data` stays the caller's.
    void post_repeat(ZtTimerCallback callback, void* data, long interval);

    /// Asks for `callback` to be called once when the running timer reaches
    /// `time`, or at its first beat if that lies behind it.
    ///
    /// A trigger that has fired stays so over stop and restart, until
    /// `reset_callbacks` or until a timer reaches its end.
    ///
    /// Owner: `data` stays the caller's.
    void post_trigger(ZtTimerCallback callback, void* data, KvoTime time);

    /// Adds `callback` at once to those that are called, in order, when a
    /// request stops the running timer; not when it reaches its end. One that
    /// is added by a stop callback waits for the next stop.
    ///
    /// Owner: `data` stays the caller's. The record cannot be removed.
    void post_stop(ZtTimerCallback callback, void* data);

    /// Asks that the first trigger or repeat with this very callback and data
    /// be removed. Without one nothing happens.
    void unpost(ZtTimerCallback callback, void* data);

    /// Asks that start and end be exchanged, if the timer stands still now.
    ///
    /// By design: it is the state at the time of asking that counts, so after
    ///            `start` in the same beat a timer is turned round while it
    ///            runs (ZtTimerTest.ReverseLooksAtTheStateWhenItIsAsked).
    void reverse();

    /// Asks that the timer run on from its current time; nothing if it runs.
    void start();

    /// Asks that the timer run from its start time, also if it runs.
    void restart();

    /// Asks that the timer stop; if it runs by then the stop callbacks are
    /// called.
    void stop();

    /// Asks that the current time be set; a running timer goes on from there.
    void force(KvoTime time);

    static int tmr_count; ///< How many timers were ever made.

    int id;                    ///< The value of `tmr_count` when it was made.
    volatile int state;        ///< A `State`.
    int end_mode;              ///< An `EndMode`.
    int counting_up;           ///< 1 or 0.
    KvoTime start_time;        ///< Where it starts.
    KvoTime end;               ///< Where it ends.
    KvoTime current;           ///< Where it stands.
    KvoTime clock_at_start;    ///< The beat's clock when it started.
    KvoTime position_at_start; ///< Where it stood then.
    ZtTimerCallbackInfo* callbacks;      ///< Triggers and repeats, in order.
    ZtTimerCallbackInfo* stop_callbacks; ///< In order.
};

/// What the beat has measured since its latest `load`.
///
/// Lateness is the time from the moment for which the alarm was set to the
/// moment at which the beat began.
struct ZT_API ZtTimerBeatStatistics
{
    /// Buckets of lateness: each microsecond up to 16 has its own, then every
    /// doubling is cut into eight.
    static constexpr int bucket_count = 240;

    /// Gives the least lateness that falls into a bucket.
    ///
    /// Units:   microseconds.
    /// Returns: 0 for a bucket that does not exist.
    static std::int64_t BucketStart(int bucket);

    /// Gives the lateness that the part `fraction` of the beats did not exceed.
    ///
    /// Units:   `fraction` from 0 to 1; the result in microseconds, up to an
    ///          eighth too long, at most `latest`.
    /// Returns: 0 if there was no beat.
    std::int64_t Quantile(double fraction) const;

    std::int64_t beats;    ///< How many ran.
    std::int64_t overruns; ///< How many took a whole period or longer.
    std::int64_t latest;   ///< The greatest lateness, in microseconds.
    std::int64_t lateness[bucket_count]; ///< How many beats in each bucket.
};

/// The beat of the process: a one-shot alarm that, every `sample_rate`
/// microseconds, advances the clock and the running timers, calls what is due,
/// and then carries out what was asked for since the beat before.
///
/// Nothing in the beat allocates, locks or touches a stream. Beats may come
/// late or get lost on a busy machine; a timer's time follows the real time all
/// the same, for only callbacks wait for beats. `tmr_…` queue a request and are
/// for timers, `…_op` carry one out.
class ZT_API ZtTimerBeat
{
public:
    ZtTimerBeat() = delete;

    static constexpr int timer_limit = 6;      ///< Timers that it drives.
    static constexpr int defer_op_limit = 100; ///< Requests that wait.

    /// Sets the clock to the time of day, installs the handler and arms the
    /// alarm for one beat. The calling thread becomes the beat's.
    ///
    /// Context: not in a callback.
    static void load();

    /// Installs the handler again and arms the alarm for one beat.
    ///
    /// Units:   `microseconds` from now; below 1 counts as 1.
    /// Context: may run inside the beat.
    static void reload(int microseconds);

    /// Starts the beat, blocked or not, and lets the alarm through to the
    /// calling thread.
    ///
    /// A beat that runs is started anew: its clock begins again.
    ///
    /// Context: not in a callback. After a callback was left by `longjmp` it
    ///          must be called for the beat to go on.
    static void start();

    /// Lets the beat run out: one that is in progress or armed is the last.
    ///
    /// Context: may run inside the beat.
    static void stop();

    /// Keeps the beat away by ignoring the alarm, until `unblock`.
    ///
    /// By design: blocks do not nest, one `unblock` ends them all
    ///            (ZtTimerBeatTest.BlockDoesNotNest).
    static void block();

    /// Ends a block. A beat that fell due meanwhile runs at once.
    static void unblock();

    /// Finds the first driven timer of this id.
    ///
    /// Returns: null if there is none.
    static ZtTimer* list_find(int id);

    /// Puts a copy of a request at the end of the queue; drops it without a
    /// word when the queue is full.
    static void q_op(ZtTimerDeferOp* request);

    /// Carries out the queue in order, with what is queued meanwhile, and
    /// empties it. Inside itself it does nothing: the outer one goes on.
    static void execute_ops();

    /// Carries out one request, with the beat blocked.
    static void execute_op(ZtTimerDeferOp* request);

    /// One beat. The alarm calls it; so may ordinary code, from which the alarm
    /// is held back meanwhile. None of the arguments is looked at.
    static void fire(int signal, int code, sigcontext* context);

    /// Gives what was measured since `load`.
    static const ZtTimerBeatStatistics& Statistics();

    /// Queue the request of the operation of that name of the timer.
    static void tmr_reset_callbacks(ZtTimer* timer);
    static void tmr_add(ZtTimer* timer);
    /// Owner: takes the record over, which was made with `new`.
    static void tmr_post_callback(ZtTimer* timer, ZtTimerCallbackInfo* info);
    static void tmr_unpost_callback(ZtTimer* timer, ZtTimerCallback callback,
                                    void* data);
    static void tmr_reverse(ZtTimer* timer);
    static void tmr_start(ZtTimer* timer);
    static void tmr_restart(ZtTimer* timer);
    static void tmr_stop(ZtTimer* timer);
    static void tmr_force(ZtTimer* timer, KvoTime time);
    /// Acts at once, for the timer's memory is about to go.
    static void tmr_destroy(ZtTimer* timer);

    /// Clears the fired flag of every trigger.
    static void reset_callbacks_op(ZtTimer* timer);

    /// Puts the timer into the first empty slot.
    ///
    /// Reports: an error "Too many timers in ZtTimerBeat.\n" if there is none.
    static void add_timer_op(ZtTimer* timer);

    /// Appends the record to the timer's list.
    static void post_callback_op(ZtTimer* timer, ZtTimerCallbackInfo* info);

    /// Removes and frees the first record of this callback and data.
    static void unpost_callback_op(ZtTimer* timer, ZtTimerCallback callback,
                                   void* data);

    /// Exchanges start and end and finds the direction anew.
    static void reverse_op(ZtTimer* timer);

    /// Starts the timer from its current time, if it does not run.
    static void start_op(ZtTimer* timer);

    /// Starts the timer from its start time.
    static void restart_op(ZtTimer* timer);

    /// Stops the timer and calls its stop callbacks, if it runs.
    static void stop_op(ZtTimer* timer);

    /// Sets the current time; a running timer goes on from there.
    static void force_op(ZtTimer* timer, KvoTime time);

    /// Empties every slot that holds the timer.
    ///
    /// Reports: an error "Failed to find timer in ZtTimerBeat.\n" if none does.
    static void destroy_op(ZtTimer* timer);

    static ZtTimer* timers[timer_limit];             ///< Null is an empty slot.
    static ZtTimerDeferOp defer_ops[defer_op_limit]; ///< The queue.
    static volatile int defer_op_count;              ///< Requests in it.
    static volatile int danger;        ///< 1 while timers are walked, else 0.
    static volatile int blocked_count; ///< Above 0 the beat is kept away.
    static ZtSignalHandler sigfunc;    ///< What `unblock` puts back.
    static volatile int reload_flag;   ///< Not 0: each beat arms the next.
    static int sample_rate;  ///< The period in microseconds; 4000 at first.
    static itimerval itimer; ///< The setting that armed the alarm last.
    static timeval start_timeval;             ///< The wall clock at `load`.
    static struct timezone start_timezone;    ///< All 0.
    static timeval current_timeval;           ///< The same at the latest beat.
    static struct timezone current_timezone;  ///< All 0.
    static timeval bstart_timeval;            ///< Not used.
    static struct timezone bstart_timezone;   ///< Not used.
    static timeval bcurrent_timeval;          ///< Not used.
    static struct timezone bcurrent_timezone; ///< Not used.
    static KvoTime global_tm;       ///< The time of day at `load`, and what has
                                    ///< passed since.
    static KvoTime global_start_tm; ///< The value of `global_tm` at `load`.
};

/// Writes "Itimer ", the seconds and microseconds that the alarm has left, and
/// a newline to standard error.
///
/// Context: must not run inside the beat.
ZT_API void checktimer();

#endif
