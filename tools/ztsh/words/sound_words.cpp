#include "words/sound_words.h"

#include "exit_code.h"
#include "sounds/sound_plot.h"
#include "words/picture_size.h"
#include "words/time_arguments.h"

#include <ZT/error.h>

#include <algorithm>
#include <iostream>
#include <utility>

namespace ztsh {

namespace {

enum Selector : int { SoundWord, Waveform, Spectrum };

constexpr int most_words = 1000;
constexpr int name_position = 1;
constexpr int action_position = 2;
constexpr const char* word = "Sound";

const std::vector<Word> words = {
    {word, "[NAME [= SOURCE] [ACTION ...] | NAME free]",
     "Makes the sound NAME, behind = anew, changes it, forgets it, or says "
     "what\n"
     "it is; lists all without NAME. A SOURCE is one of\n"
     "  load FILE                  any sound file\n"
     "  noise TIME silence TIME    at 44100 hz, mono\n"
     "  leader TIME pad TIME       silence between clicks, at 8000 hz\n"
     "  copy OTHER                 another sound\n"
     "Several actions may follow each other:\n"
     "  mono left right            makes it mono, of both channels or of one\n"
     "  stereo, pair OTHER         makes it stereo, OTHER as the right "
     "channel\n"
     "  join OTHER                 puts OTHER behind it\n"
     "  match OTHER                gives it the rate and channels of OTHER\n"
     "  resample RATE, speed NUMBER, double\n"
     "                             converts its rate, plays it faster, puts a\n"
     "                             sample between each two\n"
     "  trim TIME to TIME          keeps a part; snip as well, with silence\n"
     "  snip TIME to TIME          past the end\n"
     "  insert OTHER at TIME       lays OTHER over it\n"
     "  reverse                    turns it round\n"
     "  preemphasis NUMBER, lopass HZ, hipass HZ, bandpass CENTRE WIDTH\n"
     "                             filters it\n"
     "  window SHAPE [at TIME wide TIME]\n"
     "                             multiplies it, or a part, by a "
     "rectangular,\n"
     "                             hamming, hanning, triangular or blackman\n"
     "                             window\n"
     "  extract TIME to TIME into OTHER\n"
     "                             makes a sound of a part\n"
     "  save FILE                  writes it as an AIFF-C file\n"
     "  stats volume peaks         tells rate and length, loudness, extremes",
     0, most_words},
    {"Waveform", "SOUND PICTURE [WIDTH HEIGHT]",
     "Draws how a sound runs into a new picture, 640 x 240 unless a size is\n"
     "given: the left channel above the right one.",
     2, 4},
    {"Spectrum", "SOUND PICTURE [WIDTH HEIGHT]",
     "Draws how loud each frequency of a sound is into a new picture: up to\n"
     "half its rate at the right, from -96 decibels to a full sine at the top.",
     2, 4},
};

void tell_volume(const std::string& name, const KvoSound& sound)
{
    std::cout << name << ": volume " << sound.Volume() << "\n";
}

void tell_peaks(const std::string& name, KvoSound& sound)
{
    sound.ComputeMinMax();
    std::cout << name << ": peaks " << sound.min << " to " << sound.max << "\n";
}

} // namespace

SoundWords::SoundWords(Runner& script_runner, SoundTable& sound_table,
                       PictureTable& picture_table)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      sounds(sound_table), pictures(picture_table)
{}

void SoundWords::Do(KvoStatement& statement, int selector)
{
    const char* name = words[static_cast<std::size_t>(selector)].name;
    if (InSequence(runner, name))
        return;
    if (selector == SoundWord)
        sound(statement);
    else
        plot(statement, selector);
}

void SoundWords::sound(const KvoStatement& statement)
{
    const char* name = statement.ArgText(name_position);
    if (!name) {
        list();
        return;
    }
    if (look(name, statement))
        return;
    std::vector<SoundStep> steps;
    int next = action_position;
    const bool makes = TakeWord(statement, "=", next);
    while (next < statement.Count() || (makes && steps.empty())) {
        steps.emplace_back();
        if (!TakeSoundStep(word, statement, next,
                           makes && steps.size() == 1 ? SoundStepKind::Makes
                                                      : SoundStepKind::Uses,
                           steps.back()))
            return;
    }
    if (makes) {
        std::unique_ptr<HeldSound> made = make(steps.front());
        if (!made)
            return;
        sounds.Put(name, std::move(made));
        steps.erase(steps.begin());
    }
    for (const SoundStep& step : steps)
        if (!take(name, step))
            return;
}

/// Does what only looks at a sound or forgets it.
///
/// Returns: false if the statement asks for something else.
bool SoundWords::look(const std::string& name, const KvoStatement& statement)
{
    int next = action_position;
    const bool shows = statement.Count() == action_position;
    const bool forgets = !shows && TakeWord(statement, "free", next) &&
                         next == statement.Count();
    if (!shows && !forgets)
        return false;
    const HeldSound* held = sounds.FindFor(word, name);
    if (held && shows)
        std::cout << LineOf(name, *held) << "\n";
    else if (held)
        sounds.Remove(name);
    return true;
}

/// Returns: null, with a report, if there is nothing to hold.
std::unique_ptr<HeldSound> SoundWords::make(const SoundStep& step)
{
    std::unique_ptr<HeldSound> made;
    const long before = runner.outcome.Reports();
    switch (step.action) {
    case SoundAction::Load:
        made.reset(new HeldSound{KvoSound(step.text.c_str()), step.text});
        if (!made->sound.samples) {
            if (runner.outcome.Reports() == before)
                ZtError("%s: %s has no frames\n", word, step.text.c_str());
            made.reset();
        }
        return made;
    case SoundAction::Copy:
        if (const HeldSound* other = sounds.FindFor(word, step.text))
            made = std::make_unique<HeldSound>(*other);
        return made;
    case SoundAction::Leader:
        made.reset(new HeldSound{KvoSound(step.first, step.second), "leader"});
        return made;
    default:
        const bool is_noise = step.action == SoundAction::Noise;
        made.reset(new HeldSound{KvoSound(step.first, is_noise ? 1 : 0),
                                 is_noise ? "noise" : "silence"});
        return made;
    }
}

/// Takes one step with the sound `name`.
///
/// Returns: false, with a report, if the rest makes no sense any more.
bool SoundWords::take(const std::string& name, const SoundStep& step)
{
    HeldSound* held = sounds.FindFor(word, name);
    if (!held)
        return false;
    KvoSound& used = held->sound;
    switch (step.action) {
    case SoundAction::Save:
        save(used, step);
        return true;
    case SoundAction::Extract:
        extract(name, used, step);
        return true;
    case SoundAction::Stats:
        used.Stats();
        return true;
    case SoundAction::Volume:
        tell_volume(name, used);
        return true;
    case SoundAction::Peaks:
        tell_peaks(name, used);
        return true;
    default:
        return change(used, step);
    }
}

bool SoundWords::change(KvoSound& used, const SoundStep& step)
{
    if (!NeedsOther(step.action)) {
        ChangeSound(used, step, nullptr);
        return true;
    }
    const HeldSound* other = sounds.FindFor(word, step.text);
    if (!other)
        return false;
    if (step.action == SoundAction::Pair && other->sound.channels != 1) {
        ZtError("%s: %s is not mono\n", word, step.text.c_str());
        return false;
    }
    // A copy, since inserting converts what is inserted.
    KvoSound copy(other->sound);
    ChangeSound(used, step, &copy);
    return true;
}

void SoundWords::save(const KvoSound& used, const SoundStep& step)
{
    const long before = runner.outcome.Reports();
    used.Save(step.text.c_str());
    if (runner.outcome.Reports() != before)
        runner.outcome.Note(ExitCannotWrite);
}

void SoundWords::extract(const std::string& name, const KvoSound& used,
                         const SoundStep& step)
{
    const std::unique_ptr<KvoSound> part(used.Extract(step.first, step.second));
    if (part)
        sounds.Put(step.text,
                   std::unique_ptr<HeldSound>(new HeldSound{*part, name}));
    else
        ZtError("%s: %s has nothing there\n", word, name.c_str());
}

void SoundWords::plot(KvoStatement& statement, int selector)
{
    const char* plot_word = words[static_cast<std::size_t>(selector)].name;
    const char* name = statement.ArgText(1);
    const char* picture_name = statement.ArgText(2);
    const char* width = statement.ArgText(3);
    const char* height = statement.ArgText(4);
    if (width && !height) {
        Expected(selector);
        return;
    }
    PictureSize size = {640, 240};
    if (width && !TakePictureSize(plot_word, width, height, size))
        return;
    const HeldSound* held = sounds.FindFor(plot_word, name);
    if (!held)
        return;
    if (!held->sound.samples) {
        ZtError("%s: %s has no frames\n", plot_word, name);
        return;
    }
    ZtImageSGI image(size.width, size.height, nullptr);
    if (!image.pixels) {
        ZtError("%s: not enough memory for %d x %d pixels\n", plot_word,
                size.width, size.height);
        return;
    }
    constexpr ZtPixel black = 0x000000FF;
    std::fill_n(image.pixels, static_cast<long>(size.width) * size.height,
                black);
    if (selector == Waveform)
        DrawWaveform(held->sound, image);
    else
        DrawSpectrum(held->sound, image);
    pictures.Put(picture_name,
                 std::make_shared<Picture>(
                     Picture{image, std::string(plot_word) + " " + name}));
}

void SoundWords::list()
{
    for (const auto& [name, held] : sounds.All())
        std::cout << LineOf(name, *held) << "\n";
}

} // namespace ztsh
