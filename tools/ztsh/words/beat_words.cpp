#include "words/beat_words.h"

#include "time/beat_report.h"
#include "words/time_arguments.h"

#include <iostream>
#include <string>

namespace ztsh {

namespace {

const std::vector<Word> words = {
    {"Beat", "[start|stop|stats]",
     "Starts the beat, which drives the clocks 250 times a second; lets it "
     "run\n"
     "out; or shows how many beats there were, how late they came and how\n"
     "often one took longer than its period. Without an argument says whether\n"
     "it runs.",
     0, 1},
};

bool beat_runs()
{
    return ZtTimerBeat::reload_flag != 0;
}

void write_statistics()
{
    // No beat changes them while they are copied.
    ZtTimerBeat::block();
    ZtTimerBeatStatistics statistics = ZtTimerBeat::Statistics();
    ZtTimerBeat::unblock();
    WriteBeatReport(std::cout, statistics);
}

} // namespace

BeatWords::BeatWords(Runner& script_runner)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner)
{}

void BeatWords::Do(KvoStatement& statement, int selector)
{
    const char* argument = statement.ArgText(1);
    std::string action = argument ? argument : "";
    if (InSequence(runner, words[0].name))
        return;
    if (action.empty())
        std::cout << (beat_runs() ? "running" : "stopped") << "\n";
    else if (action == "stats")
        write_statistics();
    else if (action == "stop")
        ZtTimerBeat::stop();
    else if (action != "start")
        Expected(selector);
    else if (!beat_runs())
        // One that runs would be started anew, and its clock with it.
        ZtTimerBeat::start();
}

} // namespace ztsh
