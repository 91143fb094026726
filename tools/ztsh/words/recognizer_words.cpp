#include "words/recognizer_words.h"

#include "geometry/shape.h"
#include "pictures/picture_drawing.h"
#include "pictures/picture_files.h"
#include "words/time_arguments.h"

#include <ZT/error.h>

#include <algorithm>
#include <cmath>
#include <iostream>
#include <utility>

namespace ztsh {

namespace {

enum Selector : int {
    RecognizerWord,
    Target,
    Targets,
    Recognize,
    DrawResults,
    Recognizers,
    FreeRecognizer
};

constexpr int not_configured = -1;

const std::vector<Word> words = {
    {"Recognizer", "NAME PLUG",
     "Fetches a recognizer of the plug PLUG, which a plug-in has brought, and\n"
     "calls it NAME.",
     2, 2},
    {"Target", "RECOGNIZER NAME FILE",
     "Has a recognizer look for the picture in FILE and call it NAME. The\n"
     "picture is reduced to 160 x 121 pixels, whatever its proportions.",
     3, 3},
    {"Targets", "RECOGNIZER", "Lists what a recognizer looks for.", 1, 1},
    {"Recognize", "RECOGNIZER PICTURE [THRESHOLD]",
     "Looks for all targets in a picture and lists what was found: where its\n"
     "lower left corner is, from the lower left, its size and its score. Only\n"
     "scores of at least THRESHOLD, 0 to 1, count; without one it stays as "
     "it\n"
     "was.",
     2, 3},
    {"DrawResults", "RECOGNIZER PICTURE [RRGGBB]",
     "Draws a frame around everything that was found last, red unless a\n"
     "colour is given.",
     2, 3},
    {"Recognizers", "", "Lists the recognizers.", 0, 0},
    {"FreeRecognizer", "NAME", "Forgets a recognizer and its targets.", 1, 1},
};

const char* name_of(int selector)
{
    return words[static_cast<std::size_t>(selector)].name;
}

/// Gives a score with three decimals, whatever the locale. What no score can
/// be, for plug-ins are free to say anything, is the nearest that can.
std::string score_text(double score)
{
    const double possible = score >= 0 ? std::min(score, 1.0) : 0;
    const long thousandths = std::lround(possible * 1000);
    std::string digits = std::to_string(thousandths % 1000);
    digits.insert(0, 3 - digits.size(), '0');
    return std::to_string(thousandths / 1000) + "." + digits;
}

void write_result(const char* picture, const RecognizerResult& result)
{
    std::cout << picture << ": " << result.name << " at " << result.x << " "
              << result.y << ", " << result.width << " x " << result.height
              << " pixels, score " << score_text(result.score) << "\n";
}

/// Gives the results, without what is none.
std::vector<const RecognizerResult*> results_of(const KvoRecognizer& recognizer)
{
    std::vector<const RecognizerResult*> results;
    for (KvoList::Link* link = recognizer.results.head; link; link = link->next)
        if (const auto* result = RecognizerResult::From(link->item))
            results.push_back(result);
    return results;
}

} // namespace

RecognizerWords::RecognizerWords(Runner& script_runner,
                                 PictureTable& picture_table,
                                 KvoRecognizerCatalog& recognizer_catalog)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      pictures(picture_table), catalog(recognizer_catalog)
{}

void RecognizerWords::Do(KvoStatement& statement, int selector)
{
    const char* first = statement.ArgText(1);
    switch (selector) {
    case RecognizerWord:
        fetch(first, statement.ArgText(2));
        break;
    case Target:
        add_target(statement);
        break;
    case Targets:
        list_targets(first);
        break;
    case Recognize:
        recognize(statement);
        break;
    case DrawResults:
        draw_results(statement);
        break;
    case Recognizers:
        list();
        break;
    case FreeRecognizer:
        if (!InSequence(runner, name_of(selector)) && find(selector, first))
            recognizers.erase(first);
        break;
    default:
        break;
    }
}

/// Finds a recognizer and reports if there is none.
HeldRecognizer* RecognizerWords::find(int selector, const char* name)
{
    auto found = recognizers.find(name);
    if (found != recognizers.end())
        return found->second.get();
    std::string known;
    for (const auto& entry : recognizers)
        known += (known.empty() ? "are: " : ", ") + entry.first;
    ZtError("%s: no recognizer is named %s; there %s\n", name_of(selector),
            name, known.empty() ? "are none" : known.c_str());
    return nullptr;
}

/// Tells whether there is a picture and reports if there is none.
bool RecognizerWords::has_picture(int selector, const char* name) const
{
    if (pictures.Find(name))
        return true;
    ZtError("%s: no picture is named %s\n", name_of(selector), name);
    return false;
}

void RecognizerWords::fetch(const std::string& name, const std::string& plug)
{
    if (InSequence(runner, name_of(RecognizerWord)))
        return;
    std::string why;
    auto fetched = FetchPictureRecognizer(catalog, plug, why);
    if (fetched)
        recognizers[name] =
            std::make_unique<HeldRecognizer>(std::move(fetched), plug);
    else
        ZtError("%s: cannot fetch %s: %s\n", name_of(RecognizerWord),
                plug.c_str(), why.c_str());
}

void RecognizerWords::add_target(const KvoStatement& statement)
{
    if (InSequence(runner, name_of(Target)))
        return;
    HeldRecognizer* held = find(Target, statement.ArgText(1));
    if (!held)
        return;
    const char* file = statement.ArgText(3);
    std::string why;
    // The library says nothing of what it cannot load, and may wait for ever
    // for what is no ordinary file.
    if (!LoadPicture(file, Auto, why)) {
        ZtError("%s: cannot load %s: %s\n", name_of(Target), file, why.c_str());
        return;
    }
    auto target = std::make_unique<KvoRecognizerTarget>(statement.ArgText(2));
    target->LoadPicture(nullptr, file);
    if (target->picture)
        held->Add(std::move(target));
    else
        ZtError("%s: %s has no pixels\n", name_of(Target), file);
}

void RecognizerWords::list_targets(const char* name)
{
    HeldRecognizer* held = find(Targets, name);
    if (!held)
        return;
    const KvoList& targets = held->Get().targets;
    for (KvoList::Link* link = targets.head; link; link = link->next) {
        auto* target = static_cast<KvoRecognizerTarget*>(link->item);
        std::cout << target->name << ": " << target->picture_name
                  << (target->configured == not_configured ? ", not configured"
                                                           : ", configured")
                  << "\n";
    }
}

void RecognizerWords::recognize(const KvoStatement& statement)
{
    HeldRecognizer* held = find(Recognize, statement.ArgText(1));
    const char* name = statement.ArgText(2);
    if (!held || !has_picture(Recognize, name))
        return;
    PictureRecognizer& recognizer = held->Get();
    const char* threshold = statement.ArgText(3);
    if (threshold && !ReadReal(threshold, 0, 1, recognizer.threshold)) {
        ZtError("%s: expected a threshold of 0 to 1, not %s\n",
                name_of(Recognize), threshold);
        return;
    }
    if (!recognizer.Configure())
        ZtWarning("%s: cannot look for every target; see Targets %s\n",
                  name_of(Recognize), statement.ArgText(1));
    recognizer.Recognize(pictures.Find(name)->image);
    const auto results = results_of(recognizer);
    for (const RecognizerResult* result : results)
        write_result(name, *result);
    if (results.empty())
        std::cout << name << ": nothing found\n";
}

void RecognizerWords::draw_results(const KvoStatement& statement)
{
    HeldRecognizer* held = find(DrawResults, statement.ArgText(1));
    const char* name = statement.ArgText(2);
    if (!held || !has_picture(DrawResults, name))
        return;
    const char* colour_text = statement.ArgText(3);
    const auto colour = ReadColour(colour_text ? colour_text : "ff0000");
    if (!colour) {
        ZtError("%s: expected a colour as in ff8000, not %s\n",
                name_of(DrawResults), colour_text);
        return;
    }
    Picture* picture = pictures.FindToChange(name);
    if (!picture) {
        ZtError("%s: not enough memory\n", name_of(DrawResults));
        return;
    }
    for (const RecognizerResult* result : results_of(held->Get()))
        DrawFrame(picture->image,
                  {result->x, result->y, result->width, result->height},
                  *colour);
}

void RecognizerWords::list()
{
    for (const auto& [name, held] : recognizers) {
        const int targets = held->Get().targets.count;
        std::cout << name << ": " << held->Plug() << ", " << targets
                  << (targets == 1 ? " target\n" : " targets\n");
    }
}

} // namespace ztsh
