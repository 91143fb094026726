#include <ZT/shuttle.h>

#include <chrono>
#include <iostream>
#include <thread>

// Plays between two times, back and forth. A shuttle has no timer of its own:
// it is asked once a picture, and tells a listener when it turns round.
class Turns : public ZtShuttleListener
{
public:
    void ShuttleChanged(ZtShuttle*) override { ++count; }

    int count = 0;
};

int main()
{
    Turns turns;
    ZtShuttle shuttle;
    shuttle.listener = &turns;
    shuttle.SetTime(KvoTime(0, 0, 10, 0), ZtShuttle::in_point, 0);
    shuttle.SetTime(KvoTime(0, 0, 10, 3), ZtShuttle::out_point, 0);
    shuttle.SetRepeatMode(ZtShuttle::Swing, 0);
    shuttle.SetState(ZtShuttle::Play, 0);

    bool inside = true;
    while (turns.count < 3) {
        KvoTime now = shuttle.Time();
        inside = inside && now >= KvoTime(0, 0, 10, 0) &&
                 now <= KvoTime(0, 0, 10, 3);
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    shuttle.SetState(ZtShuttle::Stopped, 0);
    std::cout << "turned " << turns.count << " times and "
              << (inside ? "never left the range\n" : "left the range\n");
}
