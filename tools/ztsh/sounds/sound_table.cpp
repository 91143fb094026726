#include "sounds/sound_table.h"

#include <ZT/error.h>

#include <cstdio>
#include <utility>

namespace ztsh {

HeldSound* SoundTable::Find(const std::string& name) const
{
    auto found = sounds.find(name);
    return found == sounds.end() ? nullptr : found->second.get();
}

HeldSound* SoundTable::FindFor(const char* word, const std::string& name) const
{
    HeldSound* held = Find(name);
    if (held)
        return held;
    std::string known;
    for (const auto& entry : sounds)
        known += (known.empty() ? "are: " : ", ") + entry.first;
    ZtError("%s: no sound is named %s; there %s\n", word, name.c_str(),
            known.empty() ? "are none" : known.c_str());
    return nullptr;
}

void SoundTable::Put(const std::string& name, std::unique_ptr<HeldSound> sound)
{
    sounds[name] = std::move(sound);
}

void SoundTable::Remove(const std::string& name)
{
    sounds.erase(name);
}

std::string LineOf(const std::string& name, const HeldSound& held)
{
    const KvoSound& sound = held.sound;
    const double seconds = sound.rate > 0 ? static_cast<double>(sound.frames) /
                                                static_cast<double>(sound.rate)
                                          : 0.0;
    char length[64];
    std::snprintf(length, sizeof length, "%.10g", seconds);
    return name + ": " + std::to_string(sound.frames) + " frames at " +
           std::to_string(sound.rate) + " hz, " +
           (sound.channels == 1 ? "mono" : "stereo") + ", " + length +
           " seconds, from " + held.origin;
}

} // namespace ztsh
