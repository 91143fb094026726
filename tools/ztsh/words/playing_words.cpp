#include "words/playing_words.h"

#include "system/terminal.h"
#include "time/live_line.h"
#include "time/time_text.h"
#include "words/time_arguments.h"

#include <ZT/error.h>
#include <ZT/sound.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <iostream>
#include <optional>

namespace ztsh {

namespace {

enum Selector : int { PlayWord, Scrub, Record, Audio };

constexpr int most_words = 1000;
constexpr int input_descriptor = 0;
constexpr int output_descriptor = 1;

const std::vector<Word> words = {
    {"Play", "SOUND [on CLOCK at TIME]",
     "Plays a sound and waits for its end, which Ctrl-C or a key bring about;\n"
     "or has it played once the clock CLOCK reaches TIME, backward on a clock\n"
     "that counts down.",
     1, most_words},
    {"Scrub", "SOUND POSITION POSITION ... [each TIME]",
     "Plays what lies between positions in a mono sound, 0 to 1, forth or "
     "back,\n"
     "one after the other every 100 ms or every TIME.",
     3, most_words},
    {"Record", "on CLOCK at TIME | into SOUND | rate HZ | mono | stereo",
     "Records from when CLOCK reaches TIME until it stops, at most 2500000\n"
     "samples; then, into makes a sound of it.",
     1, most_words},
    {"Audio",
     "[devices | volume NUMBER | speed NUMBER | monitor on|off|NUMBER]",
     "Shows the sound device and its settings, or the devices of the machine,\n"
     "or sets how loud it plays, 0 to 1, how many times as fast, or whether "
     "and\n"
     "how loud the input is heard. The environment variable ZT_AUDIO chooses\n"
     "the device: portaudio, null, file:OUT or file:OUT,IN.",
     0, 2},
};

const char* name_of(int selector)
{
    return words[static_cast<std::size_t>(selector)].name;
}

/// Runs the beat while it lives, if nobody does.
class BeatRuns
{
public:
    BeatRuns() : starts(ZtTimerBeat::reload_flag == 0)
    {
        if (starts)
            ZtTimerBeat::start();
    }

    ~BeatRuns()
    {
        if (starts)
            ZtTimerBeat::stop();
    }

    BeatRuns(const BeatRuns&) = delete;
    BeatRuns& operator=(const BeatRuns&) = delete;

private:
    const bool starts;
};

/// Tells whether the beat can drive one more timer.
///
/// Reports: an error from the command `word` if it cannot.
bool has_free_timer(const ClockTable& clocks, const char* word)
{
    if (clocks.All().size() < ZtTimerBeat::timer_limit)
        return true;
    ZtError("%s: it takes a timer, and all %d are clocks\n", word,
            ZtTimerBeat::timer_limit);
    return false;
}

/// Positions for the beat to go through, one an interval.
class ScrubSteps
{
public:
    /// Requires: `all_positions`, one at least, outlive it.
    explicit ScrubSteps(const std::vector<float>& all_positions)
        : position(all_positions.front()), positions(all_positions)
    {}

    /// Context: for the beat to call.
    static void Step(ZtTimer*, void* data)
    {
        auto* const steps = static_cast<ScrubSteps*>(data);
        if (steps->next < steps->positions.size())
            steps->position = steps->positions[steps->next++];
        else
            steps->are_over = true;
    }

    float position;
    volatile bool are_over = false;

private:
    const std::vector<float>& positions;
    std::size_t next = 1;
};

// Long enough that another beat has carried out what was asked for.
constexpr std::chrono::milliseconds one_look(20);

KvoTime length_of(const KvoSound& sound)
{
    const double seconds = sound.rate > 0 ? static_cast<double>(sound.frames) /
                                                static_cast<double>(sound.rate)
                                          : 0;
    return {KvoTime::seconds, seconds};
}

/// Draws where a sound stands.
std::string position_line(const std::string& name, KvoTime at, KvoTime length)
{
    constexpr int bar = 30;
    const int ticks = std::clamp(at.Ticks(), 0, length.Ticks());
    const auto full = static_cast<std::size_t>(
        length.Ticks() > 0 ? std::int64_t{bar} * ticks / length.Ticks() : bar);
    return name + ": [" + std::string(full, '#') +
           std::string(bar - full, '.') + "] " +
           TimeText(KvoTime::FromTicks(ticks)) + " of " + TimeText(length);
}

/// Gives a number with two decimals at most, whatever the locale.
std::string short_number(double number)
{
    const long hundredths = std::lround(number * 100);
    std::string text = std::to_string(hundredths / 100);
    if (hundredths % 100 != 0) {
        std::string digits = std::to_string(100 + hundredths % 100).substr(1);
        if (digits.back() == '0')
            digits.pop_back();
        text += "." + digits;
    }
    return text;
}

void tell_settings()
{
    std::cout << "device: " << ZtSoundControl::DeviceInUse() << "\n"
              << "volume: " << short_number(ZtSoundControl::JackVolume())
              << "\n"
              << "speed: " << short_number(ZtSoundControl::play_speed) << "\n"
              << "monitor: " << (ZtSoundControl::Monitor() ? "on" : "off")
              << ", " << short_number(ZtSoundControl::MonitorVolume()) << "\n";
}

void list_devices()
{
    for (int index = 0; const char* name = ZtSoundControl::DeviceName(index);
         ++index)
        std::cout << name << "\n";
}

} // namespace

PlayingWords::PlayingWords(Runner& script_runner, SoundTable& sound_table,
                           ClockTable& clock_table, PlayedSounds& played_sounds)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      sounds(sound_table), clocks(clock_table), played(played_sounds)
{}

void PlayingWords::Do(KvoStatement& statement, int selector)
{
    if (InSequence(runner, name_of(selector)))
        return;
    const bool understood = selector == PlayWord ? play(statement)
                            : selector == Scrub  ? scrub(statement)
                            : selector == Record ? record(statement)
                                                 : audio(statement);
    if (!understood)
        Expected(selector);
}

/// Takes "on CLOCK at TIME", the last words of a statement.
///
/// Returns: false for other words. Without such a clock, or for a wrong time,
///          which is reported, `clock` is null.
bool PlayingWords::take_clock(const char* word, const KvoStatement& statement,
                              int& next, Clock*& clock, KvoTime& time)
{
    clock = nullptr;
    if (!TakeWord(statement, "on", next))
        return false;
    const char* const name = statement.ArgText(next++);
    if (!name || !TakeWord(statement, "at", next))
        return false;
    if (!TakeTime(word, statement, next, time))
        return true;
    if (next != statement.Count())
        return false;
    clock = clocks.Find(name);
    if (!clock)
        ZtError("%s: no clock is named %s\n", word, name);
    return true;
}

/// Returns: false for what the word does not understand; as do all below.
bool PlayingWords::play(const KvoStatement& statement)
{
    const char* const word = name_of(PlayWord);
    const char* const name = statement.ArgText(1);
    int next = 2;
    if (next == statement.Count()) {
        if (const HeldSound* const held = sounds.FindFor(word, name))
            play_now(name, held->sound);
        return true;
    }
    Clock* clock = nullptr;
    KvoTime time;
    if (!take_clock(word, statement, next, clock, time))
        return false;
    const HeldSound* const held = clock ? sounds.FindFor(word, name) : nullptr;
    if (held)
        ZtSoundControl::Play(played.Copy(held->sound), &clock->Timer(), time);
    return true;
}

/// Follows a clock of its own, so that there is a position to show and an end
/// that can be asked for.
void PlayingWords::play_now(const std::string& name, const KvoSound& sound)
{
    if (!has_free_timer(clocks, name_of(PlayWord)))
        return;
    KvoSound* const copy = played.Copy(sound);
    {
        const BeatRuns beat;
        Clock clock;
        ZtSoundControl::Play(copy, &clock.Timer(), KvoTime());
        clock.Timer().restart();
        wait_for_end(name, *copy, clock);
    }
    ZtSoundControl::Uses(copy); // lets go of it; a file is whole by then
}

void PlayingWords::wait_for_end(const std::string& name, const KvoSound& sound,
                                Clock& clock)
{
    // A statement that runs meanwhile may stop the beat.
    const auto has_ended = [&] {
        return !ZtSoundControl::Playing(&sound) ||
               ZtTimerBeat::reload_flag == 0;
    };
    if (IsTerminal(input_descriptor) && CanRedraw(output_descriptor)) {
        const KvoTime length = length_of(sound);
        const auto line = [&] {
            const float at = clock.Timer().current.Time(KvoTime::seconds) *
                             ZtSoundControl::play_speed;
            return position_line(
                name, has_ended() ? length : KvoTime(KvoTime::seconds, at),
                length);
        };
        ShowLive(line, has_ended, runner);
        return;
    }
    while (!has_ended() && wait_a_moment()) {
    }
}

/// Returns: false if the wait is to be given up.
bool PlayingWords::wait_a_moment()
{
    WaitEnds ends;
    ends.deadline = std::chrono::steady_clock::now() + one_look;
    return WaitFor(ends, runner) != Waited::Over;
}

bool PlayingWords::scrub(const KvoStatement& statement)
{
    const char* const word = name_of(Scrub);
    std::vector<float> positions;
    int next = 2;
    double position = 0;
    for (; next < statement.Count() &&
           ReadReal(statement.ArgText(next), 0, 1, position);
         ++next)
        positions.push_back(static_cast<float>(position));
    KvoTime each(KvoTime::milliseconds, 100);
    if (TakeWord(statement, "each", next) &&
        !TakeTime(word, statement, next, each))
        return true;
    if (next != statement.Count() || positions.size() < 2)
        return false;
    const HeldSound* const held = sounds.FindFor(word, statement.ArgText(1));
    const long interval = each.Ticks() / KvoTime::ticks_per_millisecond;
    if (held && interval < 1)
        ZtError("%s: each takes a time of a millisecond or more\n", word);
    else if (held)
        scrub_along(held->sound, positions, interval);
    return true;
}

void PlayingWords::scrub_along(const KvoSound& sound,
                               const std::vector<float>& positions,
                               long interval)
{
    if (!has_free_timer(clocks, name_of(Scrub)))
        return;
    KvoSound* const copy = played.Copy(sound);
    {
        const BeatRuns beat;
        ScrubSteps steps(positions);
        Clock clock;
        // First, so that each position is there before it is looked at.
        clock.Timer().post_repeat(ScrubSteps::Step, &steps, interval);
        ZtSoundControl::PlayDrag(copy, &clock.Timer(), interval,
                                 &steps.position);
        clock.Timer().restart();
        while (!steps.are_over && ZtSoundControl::Uses(copy) &&
               ZtTimerBeat::reload_flag != 0 && wait_a_moment()) {
        }
    }
    ZtSoundControl::Uses(copy);
}

bool PlayingWords::record(const KvoStatement& statement)
{
    const char* const word = name_of(Record);
    constexpr int of_two = 3;
    int next = 1;
    if (TakeWord(statement, "into", next)) {
        if (statement.Count() != of_two)
            return false;
        keep_recording(statement.ArgText(next));
        return true;
    }
    if (TakeWord(statement, "rate", next)) {
        constexpr long highest_rate = 1000000;
        long rate = 0;
        if (statement.Count() != of_two ||
            !ReadNumber(statement.ArgText(next), 1, highest_rate, rate))
            return false;
        ZtSoundControl::RecordSetFrequency(static_cast<int>(rate));
        return true;
    }
    const bool stereo = TakeWord(statement, "stereo", next);
    if (stereo || TakeWord(statement, "mono", next)) {
        if (next == statement.Count())
            ZtSoundControl::RecordSetStereo(stereo);
        return next == statement.Count();
    }
    Clock* clock = nullptr;
    KvoTime time;
    if (!take_clock(word, statement, next, clock, time))
        return false;
    if (clock)
        ZtSoundControl::Record(&clock->Timer(), time);
    return true;
}

/// Of a stereo recording the library counts the samples as frames; the silence
/// behind it is nobody's.
void PlayingWords::keep_recording(const std::string& name)
{
    std::unique_ptr<KvoSound> result(ZtSoundControl::RecordResult());
    if (!result) {
        ZtError("Record: nothing was recorded, or it is not over\n");
        return;
    }
    if (result->channels == 2)
        result.reset(result->Extract(0L, result->frames / 2 - 1));
    auto held = std::make_unique<HeldSound>();
    if (result)
        held->sound = *result;
    held->origin = "recorded";
    sounds.Put(name, std::move(held));
}

bool PlayingWords::audio(const KvoStatement& statement)
{
    constexpr int with_a_value = 3;
    int next = 1;
    if (statement.Count() == next) {
        tell_settings();
        return true;
    }
    if (TakeWord(statement, "devices", next)) {
        if (next == statement.Count())
            list_devices();
        return next == statement.Count();
    }
    if (statement.Count() != with_a_value)
        return false;
    constexpr double highest_speed = 1000;
    double number = 0;
    if (TakeWord(statement, "monitor", next))
        return monitor(statement.ArgText(next));
    if (TakeWord(statement, "volume", next)) {
        if (!ReadReal(statement.ArgText(next), 0, 1, number))
            return false;
        ZtSoundControl::JackVolume(static_cast<float>(number));
        return true;
    }
    if (!TakeWord(statement, "speed", next) ||
        !ReadReal(statement.ArgText(next), 0, highest_speed, number))
        return false;
    ZtSoundControl::PlaySpeed(static_cast<float>(number));
    return true;
}

bool PlayingWords::monitor(const char* argument)
{
    double number = 0;
    const bool on = std::strcmp(argument, "on") == 0;
    if (on || std::strcmp(argument, "off") == 0)
        ZtSoundControl::Monitor(on);
    else if (ReadReal(argument, 0, 1, number))
        ZtSoundControl::MonitorVolume(static_cast<float>(number));
    else
        return false;
    return true;
}

} // namespace ztsh
