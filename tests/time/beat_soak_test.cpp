#include <atomic>
#include <cstdlib>
#include <memory>
#include <random>
#include <signal.h>
#include <string>
#include <thread>
#include <unistd.h>
#include <vector>

#include <gtest/gtest.h>

#include "ZT/error.h"
#include "ZT/timer.h"
#include "platform/clock.h"

// The real alarm against a busy program: random blocks that swallow beats, a
// main thread that allocates all the time, another thread that sleeps, one that
// fires signals at the process, and requests whose every one is accounted for.
//
// ZT_SOAK_SECONDS sets another length.
namespace {

constexpr double default_seconds = 3;
constexpr std::int64_t million = 1000000;

// Each request number goes through the queue as three requests: force, start
// and stop. The stop callback then finds the number in the timer's time, to
// which a beat between the requests adds less than a spacing.
constexpr int spacing = 20000; // ticks; 3.3 seconds
constexpr int numbers = 100000;

struct Seen
{
    std::atomic<long> count = 0;
    std::atomic<long> out_of_order = 0;
    int last = -1;
};
Seen seen;

void TakeNumber(ZtTimer* timer, void*)
{
    const int number = timer->current.Ticks() / spacing;
    if (number != (seen.last + 1) % numbers)
        ++seen.out_of_order;
    seen.last = number;
    ++seen.count;
}

struct Posts
{
    std::atomic<long> fired = 0;
    std::atomic<long> out_of_order = 0;
    long last = -1;
};
Posts posts;

/// Fires once for each that was posted, in the order of posting.
void TakePost(ZtTimer* timer, void* data)
{
    const long number = reinterpret_cast<long>(data);
    if (number != posts.last + 1)
        ++posts.out_of_order;
    posts.last = number;
    ++posts.fired;
    timer->unpost(TakePost, data);
}

class Soak
{
public:
    Soak()
    {
        ZtTimerBeat::start();
        counter.post_stop(TakeNumber, nullptr);
        poster.start();
    }

    void Run(double seconds)
    {
        std::thread sleeper([this] { Sleep(); });
        std::thread stormer([this] { Storm(); });
        const std::uint64_t end =
            Now() + static_cast<std::uint64_t>(seconds * 1e9);
        while (Now() < end) {
            Request();
            Allocate();
            if (random() % 100 == 0)
                Block();
            if (Now() - looked_at > 10 * million)
                Look();
        }
        over = true;
        sleeper.join();
        stormer.join();
        while (ZtTimerBeat::defer_op_count > 0 || posts.fired < posted)
            zt_platform::Clock::current().sleep_nanoseconds(million);
        ZtTimerBeat::stop();
        signal(SIGALRM, SIG_IGN);
    }

    long requested = 0;
    long posted = 0;
    std::int64_t longest_silence = 0; ///< In milliseconds.

private:
    static std::uint64_t Now()
    {
        return zt_platform::Clock::current().steady_nanoseconds();
    }

    void Sleep() const
    {
        while (!over)
            zt_platform::Clock::current().sleep_nanoseconds(50 * million);
    }

    void Storm() const
    {
        while (!over) {
            for (int count = 0; count < 200; ++count)
                kill(getpid(), SIGALRM);
            zt_platform::Clock::current().sleep_nanoseconds(20 * million);
        }
    }

    /// Asks for something when there is sure to be room in the queue.
    void Request()
    {
        if (ZtTimerBeat::defer_op_count > 60)
            return;
        counter.force(KvoTime::FromTicks(static_cast<int>(requested % numbers) *
                                         spacing));
        counter.start();
        counter.stop();
        ++requested;
        if (posted - posts.fired < 20) {
            poster.post_trigger(TakePost, reinterpret_cast<void*>(posted),
                                KvoTime::ZERO);
            ++posted;
        }
    }

    void Allocate()
    {
        auto& place = memory[random() % memory.size()];
        place = std::make_unique<std::string>(random() % 5000, 'x');
    }

    void Block()
    {
        ZtTimerBeat::block();
        zt_platform::Clock::current().sleep_nanoseconds(random() % 6 * million);
        ZtTimerBeat::unblock();
    }

    /// Sees how long the beat has been silent.
    void Look()
    {
        looked_at = Now();
        const std::int64_t beats = ZtTimerBeat::Statistics().beats;
        if (beats != last_beats)
            last_change = looked_at;
        last_beats = beats;
        const auto silence =
            static_cast<std::int64_t>((looked_at - last_change) / million);
        longest_silence = std::max(longest_silence, silence);
    }

    ZtTimer counter;
    ZtTimer poster;
    std::minstd_rand random{77};
    std::vector<std::unique_ptr<std::string>> memory =
        std::vector<std::unique_ptr<std::string>>(300);
    std::atomic<bool> over = false;
    std::uint64_t looked_at = 0;
    std::uint64_t last_change = Now();
    std::int64_t last_beats = 0;
};

TEST(BeatSoak, IsAliveAtTheEndAndCarriesOutEveryRequestOnce)
{
    const char* const wanted = std::getenv("ZT_SOAK_SECONDS");
    Soak soak;

    soak.Run(wanted ? std::atof(wanted) : default_seconds);

    EXPECT_EQ(seen.count, soak.requested);
    EXPECT_EQ(seen.out_of_order, 0);
    EXPECT_EQ(posts.fired, soak.posted);
    EXPECT_EQ(posts.out_of_order, 0);
    EXPECT_GT(soak.requested, 100);
    EXPECT_LT(soak.longest_silence, 2000);
    RecordProperty("requests", static_cast<int>(soak.requested));
    std::printf(
        "%ld requests, %ld posts, %lld beats, longest silence %lld ms\n",
        soak.requested, soak.posted,
        static_cast<long long>(ZtTimerBeat::Statistics().beats),
        static_cast<long long>(soak.longest_silence));
}

} // namespace
