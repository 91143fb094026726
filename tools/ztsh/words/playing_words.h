#ifndef ZTSH_WORDS_PLAYING_WORDS_H
#define ZTSH_WORDS_PLAYING_WORDS_H

/// \file
/// The words for the sound device.

#include "script/runner.h"
#include "sounds/played_sounds.h"
#include "sounds/sound_table.h"
#include "time/clock_table.h"
#include "words/word_director.h"

namespace ztsh {

/// Play, Scrub, Record and Audio: sounds by name, played at once or on clocks.
class PlayingWords : public WordDirector
{
public:
    /// Requires: all of them outlive the director, and `played_sounds` the
    ///           clocks.
    PlayingWords(Runner& script_runner, SoundTable& sound_table,
                 ClockTable& clock_table, PlayedSounds& played_sounds);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    bool play(const KvoStatement& statement);
    void play_now(const std::string& name, const KvoSound& sound);
    void wait_for_end(const std::string& name, const KvoSound& sound,
                      Clock& clock);
    bool wait_a_moment();
    bool scrub(const KvoStatement& statement);
    void scrub_along(const KvoSound& sound, const std::vector<float>& positions,
                     long interval);
    bool record(const KvoStatement& statement);
    void keep_recording(const std::string& name);
    bool take_clock(const char* word, const KvoStatement& statement, int& next,
                    Clock*& clock, KvoTime& time);
    bool audio(const KvoStatement& statement);
    bool monitor(const char* argument);

    Runner& runner;
    SoundTable& sounds;
    ClockTable& clocks;
    PlayedSounds& played;
};

} // namespace ztsh

#endif
