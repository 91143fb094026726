#include "sound/sound_difference.h"

#include <KVO/KvoSound.h>

#include <cstdio>
#include <cstdlib>
#include <unistd.h>

#include "sound/aiff_bytes.h"
#include "sound/sounds.h"
#include "support/ErrorTrap.h"
#include "support/MemoryFile.h"

namespace {

/// Enough for every operation to meet its edges, and few enough to be fast.
constexpr long most_frames = 20000;

std::string ContradictionIn(const KvoSound& sound)
{
    if (sound.frames < 0)
        return "frames below zero\n";
    if (sound.samples && sound.channels != 1 && sound.channels != 2)
        return "a buffer of " + std::to_string(sound.channels) + " channels\n";
    if (sound.samples && sound.frames == 0)
        return "a buffer of no frames\n";
    if (sound.samples && sound.width != 1 && sound.width != 2 &&
        sound.width != 4)
        return "a width of " + std::to_string(sound.width) + "\n";
    return "";
}

/// Saves a sound and reads the file with a reader that shares nothing with us.
std::string DifferenceWhenSaved(const KvoSound& sound)
{
    char name[] = "/tmp/zt_sound_XXXXXX";
    const int handle = mkstemp(name);
    if (handle < 0)
        return "there is no file to save to\n";
    close(handle);
    sound.Save(name);
    std::string bytes;
    if (std::FILE* in = std::fopen(name, "rb")) {
        char block[4096];
        while (const std::size_t got = std::fread(block, 1, sizeof block, in))
            bytes.append(block, got);
        std::fclose(in);
    }
    std::remove(name);
    const auto file = ReadAifc(bytes);
    if (!file)
        return "what was saved is no sound file\n";
    const Samples samples = SamplesOf(sound);
    if (file->samples.size() != samples.size())
        return "samples were lost\n";
    const int shift = 16 - file->bits;
    for (std::size_t i = 0; i < samples.size(); ++i) {
        const int expected =
            shift >= 0 ? samples[i] >> shift : samples[i] * (1 << -shift);
        if (file->samples[i] != expected)
            return "a sample was saved as another one\n";
    }
    return "";
}

/// Works on a sound as scripts do; checkers of memory look on.
void UseInEveryWay(KvoSound sound)
{
    KvoSound other = MonoSound({1, 2, 3});
    sound.ComputeMinMax();
    (void)sound.Volume();
    sound.LoPass(100);
    sound.HiPass(100);
    sound.BandPass(100, 100);
    sound.PreEmphasis(0.5f);
    sound.Reverse();
    sound.Insert(&other, KvoTime::FromTicks(1));
    delete sound.Extract(1, 100);
    sound.Trim(KvoTime::FromTicks(0), KvoTime::FromTicks(60));
    sound.Window(KvoTime::FromTicks(10), KvoTime::FromTicks(10),
                 KvoSound::Hamming);
    sound.Stereo(nullptr);
    if (sound.rate > 100)
        sound.Speed(1.5f);
    sound.Mono(0);
    sound.Whack();
}

} // namespace

std::string SoundDifferenceOn(const std::string& file)
{
    const ErrorTrap reports;
    const MemoryFile memory(file);
    const KvoSound sound("a");
    const std::string contradiction = ContradictionIn(sound);
    if (!contradiction.empty() || !sound.samples || sound.frames > most_frames)
        return contradiction;
    UseInEveryWay(sound);
    zt_platform::Files* fake = zt_platform::Files::install(nullptr);
    const std::string difference = DifferenceWhenSaved(sound);
    zt_platform::Files::install(fake);
    return difference;
}
