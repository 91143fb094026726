#include <cstdlib>
#include <signal.h>
#include <sys/time.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "ZT/timer.h"

// What is left of the beat when a process ends. Stands alone, since no beat may
// have been started before.
namespace {

/// Ends the process with 7 if no alarm is armed and none would be heard.
void EndBySilence()
{
    itimerval left = {};
    getitimer(ITIMER_REAL, &left);
    struct sigaction now = {};
    sigaction(SIGALRM, nullptr, &now);
    const bool silent = left.it_value.tv_sec == 0 &&
                        left.it_value.tv_usec == 0 && now.sa_handler == SIG_IGN;
    _exit(silent ? 7 : 8);
}

// What was to be done at the exit before the beat was started is done after the
// beat was silenced.
TEST(BeatExitDeath, AtTheExitTheAlarmIsDisarmedAndIgnored)
{
    EXPECT_EXIT(
        {
            std::atexit(EndBySilence);
            ZtTimerBeat::sample_rate = 60000000;
            ZtTimerBeat::start();
            std::exit(0);
        },
        testing::ExitedWithCode(7), "");
}

} // namespace
