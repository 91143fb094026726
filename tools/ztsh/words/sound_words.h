#ifndef ZTSH_WORDS_SOUND_WORDS_H
#define ZTSH_WORDS_SOUND_WORDS_H

/// \file
/// The words for sounds, which scripts hold by name.

#include "pictures/picture_table.h"
#include "script/runner.h"
#include "sounds/sound_steps.h"
#include "sounds/sound_table.h"
#include "words/word_director.h"

#include <memory>
#include <vector>

namespace ztsh {

/// Sound: makes, edits, saves and shows sounds. Waveform and Spectrum draw
/// them into pictures.
class SoundWords : public WordDirector
{
public:
    /// Requires: runner and tables outlive the director.
    SoundWords(Runner& script_runner, SoundTable& sound_table,
               PictureTable& picture_table);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    void sound(const KvoStatement& statement);
    bool look(const std::string& name, const KvoStatement& statement);
    std::unique_ptr<HeldSound> make(const SoundStep& step);
    bool take(const std::string& name, const SoundStep& step);
    bool change(KvoSound& sound, const SoundStep& step);
    void save(const KvoSound& sound, const SoundStep& step);
    void extract(const std::string& name, const KvoSound& sound,
                 const SoundStep& step);
    void plot(KvoStatement& statement, int selector);
    void list();

    Runner& runner;
    SoundTable& sounds;
    PictureTable& pictures;
};

} // namespace ztsh

#endif
