#include "sounds/sound_steps.h"

#include "words/time_arguments.h"
#include "words/word_director.h"

#include <ZT/error.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <string_view>

namespace ztsh {

namespace {

constexpr long highest_number = 1000000;
constexpr float largest_factor = 1000;

/// A step and what stands behind its name, a letter each: f a file or a name,
/// t a time, h a whole number from 0 and r one from 1, x a decimal number, w a
/// window; > @ i p the words to, at, into and pad.
struct StepName
{
    const char* name;
    SoundAction action;
    SoundStepKind kind;
    const char* arguments;
};

constexpr auto makes = SoundStepKind::Makes;
constexpr auto uses = SoundStepKind::Uses;

constexpr StepName step_names[] = {
    {"load", SoundAction::Load, makes, "f"},
    {"noise", SoundAction::Noise, makes, "t"},
    {"silence", SoundAction::Silence, makes, "t"},
    {"leader", SoundAction::Leader, makes, "tpt"},
    {"copy", SoundAction::Copy, makes, "f"},
    {"mono", SoundAction::Mono, uses, ""},
    {"left", SoundAction::Left, uses, ""},
    {"right", SoundAction::Right, uses, ""},
    {"stereo", SoundAction::Stereo, uses, ""},
    {"pair", SoundAction::Pair, uses, "f"},
    {"join", SoundAction::Join, uses, "f"},
    {"match", SoundAction::Match, uses, "f"},
    {"resample", SoundAction::Resample, uses, "r"},
    {"speed", SoundAction::Speed, uses, "x"},
    {"double", SoundAction::Double, uses, ""},
    {"trim", SoundAction::Trim, uses, "t>t"},
    {"snip", SoundAction::Snip, uses, "t>t"},
    {"insert", SoundAction::Insert, uses, "f@t"},
    {"reverse", SoundAction::Reverse, uses, ""},
    {"preemphasis", SoundAction::PreEmphasis, uses, "x"},
    {"lopass", SoundAction::LoPass, uses, "h"},
    {"hipass", SoundAction::HiPass, uses, "h"},
    {"bandpass", SoundAction::BandPass, uses, "hh"},
    {"window", SoundAction::Window, uses, "w"},
    {"extract", SoundAction::Extract, uses, "t>tif"},
    {"save", SoundAction::Save, uses, "f"},
    {"stats", SoundAction::Stats, uses, ""},
    {"volume", SoundAction::Volume, uses, ""},
    {"peaks", SoundAction::Peaks, uses, ""},
};

struct WindowName
{
    const char* name;
    KvoSound::WindowType type;
};

constexpr WindowName window_names[] = {
    {"rectangular", KvoSound::Rectangular},
    {"hamming", KvoSound::Hamming},
    {"hanning", KvoSound::Hanning},
    {"triangular", KvoSound::Triangular},
    {"blackman", KvoSound::Blackman},
};

bool read_factor(const char* text, float& factor)
{
    const std::string_view digits(text);
    float read = 0;
    const auto [stop, fault] =
        std::from_chars(digits.data(), digits.data() + digits.size(), read,
                        std::chars_format::fixed);
    if (fault != std::errc() || stop != digits.data() + digits.size() ||
        !(std::fabs(read) <= largest_factor))
        return false;
    factor = read;
    return true;
}

/// The arguments of one step on their way into it.
class StepReader
{
public:
    StepReader(const char* command_word, const KvoStatement& sound_statement,
               int first, SoundStep& filled_step)
        : word(command_word), statement(sound_statement), next(first),
          step(filled_step)
    {}

    int Next() const { return next; }

    bool Take(char letter)
    {
        switch (letter) {
        case 't':
            return TakeTime(word, statement, next,
                            times++ == 0 ? step.first : step.second);
        case 'f':
            return take_text();
        case 'h':
            return take_number(0);
        case 'r':
            return take_number(1);
        case 'x':
            return take_factor();
        case 'w':
            return take_window();
        case '>':
            return take_word("to");
        case '@':
            return take_word("at");
        case 'i':
            return take_word("into");
        default:
            return take_word("pad");
        }
    }

private:
    bool missing(const std::string& what)
    {
        const char* text = statement.ArgText(next);
        ZtError("%s: expected %s, not %s\n", word, what.c_str(),
                text ? text : "the end");
        return false;
    }

    bool take_word(const char* text)
    {
        return TakeWord(statement, text, next) ||
               missing(std::string("the word ") + text);
    }

    bool take_text()
    {
        const char* text = statement.ArgText(next);
        if (!text)
            return missing("a name");
        step.text = text;
        ++next;
        return true;
    }

    bool take_number(long least)
    {
        const char* text = statement.ArgText(next);
        long& number = numbers == 0 ? step.number : step.other_number;
        if (!text || !ReadNumber(text, least, highest_number, number))
            return missing("a number of " + std::to_string(least) + " to " +
                           std::to_string(highest_number));
        ++numbers;
        ++next;
        return true;
    }

    bool take_factor()
    {
        const char* text = statement.ArgText(next);
        if (!text || !read_factor(text, step.factor))
            return missing("a number of -1000 to 1000");
        ++next;
        return true;
    }

    bool take_window()
    {
        const WindowName* found = nullptr;
        for (const WindowName& known : window_names)
            if (!found && TakeWord(statement, known.name, next))
                found = &known;
        if (!found)
            return missing("rectangular, hamming, hanning, triangular or "
                           "blackman");
        step.window = found->type;
        step.is_part = TakeWord(statement, "at", next);
        return !step.is_part || (Take('t') && take_word("wide") && Take('t'));
    }

    const char* word;
    const KvoStatement& statement;
    int next;
    SoundStep& step;
    int times = 0;
    int numbers = 0;
};

void apply_window(KvoSound& sound, const SoundStep& step)
{
    const KvoTime whole =
        sound.rate > 0 ? KvoTime::FromTicks(static_cast<int>(std::min(
                             sound.frames * 6000 / sound.rate, 2147483647L)))
                       : KvoTime::ZERO;
    if (step.is_part)
        sound.Window(step.first, step.second, step.window);
    else
        sound.Window(whole / 2, whole, step.window);
}

} // namespace

bool TakeSoundStep(const char* word, const KvoStatement& statement, int& next,
                   SoundStepKind kind, SoundStep& step)
{
    for (const StepName& known : step_names) {
        if (known.kind != kind || !TakeWord(statement, known.name, next))
            continue;
        step.action = known.action;
        StepReader reader(word, statement, next, step);
        for (const char* letter = known.arguments; *letter; ++letter)
            if (!reader.Take(*letter))
                return false;
        next = reader.Next();
        return true;
    }
    TellNotUnderstood(word);
    return false;
}

bool NeedsOther(SoundAction action)
{
    return action == SoundAction::Pair || action == SoundAction::Join ||
           action == SoundAction::Match || action == SoundAction::Insert ||
           action == SoundAction::Copy;
}

void ChangeSound(KvoSound& sound, const SoundStep& step, KvoSound* other)
{
    switch (step.action) {
    case SoundAction::Mono:
        return sound.Mono(0);
    case SoundAction::Left:
        return sound.Mono(1);
    case SoundAction::Right:
        return sound.Mono(2);
    case SoundAction::Stereo:
        return sound.Stereo(nullptr);
    case SoundAction::Pair:
        return sound.Stereo(other);
    case SoundAction::Join:
        sound = sound + *other;
        return;
    case SoundAction::Match:
        return sound.Match(*other);
    case SoundAction::Resample:
        return sound.Resample(step.number);
    case SoundAction::Speed:
        return sound.Speed(step.factor);
    case SoundAction::Double:
        return sound.Whack();
    case SoundAction::Trim:
        return sound.Trim(step.first, step.second);
    case SoundAction::Snip:
        return sound.Snip(step.first, step.second);
    case SoundAction::Insert:
        return sound.Insert(other, step.first);
    case SoundAction::Reverse:
        return sound.Reverse();
    case SoundAction::PreEmphasis:
        return sound.PreEmphasis(step.factor);
    case SoundAction::LoPass:
        return sound.LoPass(step.number);
    case SoundAction::HiPass:
        return sound.HiPass(step.number);
    case SoundAction::BandPass:
        return sound.BandPass(step.number, step.other_number);
    case SoundAction::Window:
        return apply_window(sound, step);
    default:
        return;
    }
}

} // namespace ztsh
