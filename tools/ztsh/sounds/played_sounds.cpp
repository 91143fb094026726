#include "sounds/played_sounds.h"

#include <ZT/sound.h>

namespace ztsh {

KvoSound* PlayedSounds::Copy(const KvoSound& sound)
{
    std::erase_if(copies, [](const std::unique_ptr<KvoSound>& copy) {
        return !ZtSoundControl::Uses(copy.get());
    });
    copies.push_back(std::make_unique<KvoSound>(sound));
    return copies.back().get();
}

} // namespace ztsh
