#include <KVO/KvoTime.h>

#include <iostream>

// Cuts a film: times are whole ticks of 1/6000 second, so frames of film
// and of video meet without rounding.
int main()
{
    constexpr int film = 24;
    constexpr int video = 30;
    KvoTime in(0, 1, 0, 12, film);
    KvoTime out("0:1:30:20", film);
    KvoTime length = out - in;

    int hours = 0;
    int minutes = 0;
    int seconds = 0;
    int frames = 0;
    length.Timecode(&hours, &minutes, &seconds, &frames, film);
    std::cout << "on film " << seconds << " s " << frames << " frames\n";
    length.Timecode(&hours, &minutes, &seconds, &frames, video);
    std::cout << "on video " << seconds << " s " << frames << " frames\n";
    std::cout << "that is " << length.Time(KvoTime::milliseconds) << " ms or "
              << length.Ticks() << " ticks\n";

    // Written times are times of the day: two hours before midnight.
    KvoTime early = KvoTime() - KvoTime(KvoTime::hours, 2);
    early.Write(std::cout);
    std::cout << "\n";
}
