// Reads any bytes as a sound file, uses what comes of it in every way, and
// stops where what was saved does not load as what it was.

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>

#include "sound/sound_difference.h"

/// The libraries that read sound files lose memory over broken ones.
// NOLINTNEXTLINE(bugprone-reserved-identifier)
extern "C" const char* __lsan_default_suppressions()
{
    return "leak:libvorbis\nleak:libsndfile\nleak:libFLAC\nleak:libopus\n"
           "leak:libogg\nleak:libmpg123\n";
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data,
                                      std::size_t size)
{
    const std::string file(reinterpret_cast<const char*>(data), size);
    const std::string difference = SoundDifferenceOn(file);
    if (!difference.empty()) {
        std::fprintf(stderr, "%s", difference.c_str());
        std::abort();
    }
    return 0;
}
