#ifndef ZTSH_SOUNDS_SOUND_TABLE_H
#define ZTSH_SOUNDS_SOUND_TABLE_H

/// \file
/// The sounds that scripts hold by name.

#include <KVO/KvoSound.h>

#include <map>
#include <memory>
#include <string>

namespace ztsh {

/// A sound and where it came from.
struct HeldSound
{
    KvoSound sound;
    std::string origin; ///< As `Sound NAME` tells it.
};

/// Sounds by name.
class SoundTable
{
public:
    /// Gives the sound `name`, null if there is none.
    ///
    /// Owner: this table, until the name is put or removed.
    HeldSound* Find(const std::string& name) const;

    /// Does the same for the command `word`.
    ///
    /// Reports: an error with the names that there are, if there is none.
    HeldSound* FindFor(const char* word, const std::string& name) const;

    /// Puts a sound in the table, in the place of one of the same name.
    void Put(const std::string& name, std::unique_ptr<HeldSound> sound);

    /// Takes the sound `name` out, if there is one.
    void Remove(const std::string& name);

    /// Gives the names in order, each with its sound.
    const std::map<std::string, std::unique_ptr<HeldSound>>& All() const
    {
        return sounds;
    }

private:
    std::map<std::string, std::unique_ptr<HeldSound>> sounds;
};

/// Says in one line what a sound is and where it came from.
std::string LineOf(const std::string& name, const HeldSound& held);

} // namespace ztsh

#endif
