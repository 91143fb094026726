#ifndef ZTSH_SHELL_H
#define ZTSH_SHELL_H

/// \file
/// The shell as a whole: a runner with all the words.

#include "geometry/geometry.h"
#include "options.h"
#include "pictures/picture_table.h"
#include "plugins/plugin_table.h"
#include "script/runner.h"
#include "time/clock_table.h"
#include "words/beat_words.h"
#include "words/clock_words.h"
#include "words/common_words.h"
#include "words/frame_store_words.h"
#include "words/geometry_words.h"
#include "words/language_words.h"
#include "words/picture_words.h"
#include "words/playing_words.h"
#include "words/plugin_words.h"
#include "words/preference_words.h"
#include "words/recognizer_words.h"
#include "words/sequence_words.h"
#include "words/shuttle_words.h"
#include "words/sound_words.h"
#include "words/time_words.h"
#include "words/wait_words.h"
#include "words/wire_words.h"

namespace ztsh {

/// A host of the library: it owns the dispatcher, registers the directors,
/// reads statements and delegates them.
class Shell
{
public:
    explicit Shell(const Settings& settings);

    /// Runs what the command line asks for.
    ///
    /// Returns: the exit code.
    int Run(const Options& options);

private:
    void run_prompt();

    Runner runner;
    PictureTable pictures;
    SoundTable sounds;
    PlayedSounds played;
    Geometry geometry;
    ClockTable clocks;
    /// Whatever uses plug-ins stands behind it and goes before it.
    PluginTable plugins{runner.dispatcher};
    CommonWords common;
    LanguageWords language;
    PictureWords picture_words;
    FrameStoreWords frame_store;
    PreferenceWords preferences;
    SequenceWords sequences;
    TimeWords times;
    BeatWords beat;
    ClockWords clock_words;
    WaitWords wait;
    ShuttleWords shuttles;
    GeometryWords geometry_words;
    WireWords wire_words;
    SoundWords sound_words{runner, sounds, pictures};
    PlayingWords playing{runner, sounds, clocks, played};
    PluginWords plugin_words{runner, plugins};
    RecognizerWords recognizer_words{runner, pictures, plugins.recognizers};
};

} // namespace ztsh

#endif
