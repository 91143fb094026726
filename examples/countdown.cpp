#include <KVO/KvoTime.h>
#include <ZT/timer.h>

#include <atomic>
#include <chrono>
#include <iostream>
#include <thread>

// Counts down a tenth of a second. Callbacks run inside the alarm signal, so
// they only set flags; the program looks at them when it comes by.
namespace {

std::atomic<bool> rung = false;
std::atomic<int> ticks = 0;

void Tick(ZtTimer*, void*)
{
    ++ticks;
}

void Ring(ZtTimer*, void*)
{
    rung = true;
}

} // namespace

int main()
{
    ZtTimerBeat::start();
    ZtTimer timer(KvoTime(KvoTime::milliseconds, 100), KvoTime());
    timer.post_repeat(Tick, nullptr, 20);
    timer.post_trigger(Ring, nullptr, KvoTime());
    timer.start();

    // This sleep goes on after a beat; a plain `usleep` would end.
    while (!rung)
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    ZtTimerBeat::stop();

    std::cout << (ticks > 0 ? "ticked, " : "never ticked, ") << "rang at ";
    timer.current.Write(std::cout);
    std::cout << "\n";
}
