#include "platform/audio_file.h"

#include "platform/lazy_library.h"

#include <dlfcn.h>

#include <gtest/gtest.h>

#include "sound/aiff_bytes.h"
#include "support/FaultyFiles.h"
#include "support/TempDir.h"

namespace {

using zt_platform::AudioFiles;
using zt_platform::AudioFormat;
using zt_platform::LazyLibrary;

/// Tells whether the process has the library of sound files loaded.
bool LibraryIsThere()
{
    void* handle = dlopen("libsndfile.so.1", RTLD_NOW | RTLD_NOLOAD);
    if (handle)
        dlclose(handle);
    return handle != nullptr;
}

// Stands first: later tests have loaded it.
TEST(audio_file, TheLibraryIsLoadedAtTheFirstFileAndStays)
{
    const TempDir directory;
    const std::string path = directory.Write("a", PlainAifc());
    AudioFormat about;
    EXPECT_FALSE(LibraryIsThere());

    void* file = AudioFiles::current().open(path.c_str(), about);
    ASSERT_TRUE(file);
    AudioFiles::current().close(file);

    EXPECT_TRUE(LibraryIsThere());
}

TEST(audio_file, AFileSaysWhatItIsAndIsReadInPieces)
{
    const TempDir directory;
    const std::string path = directory.Write("a", PlainAifc());
    AudioFormat about;
    AudioFiles& files = AudioFiles::current();

    void* file = files.open(path.c_str(), about);
    ASSERT_TRUE(file);
    short samples[5] = {};
    EXPECT_EQ(files.read(file, samples, 3), 3u);
    EXPECT_EQ(files.read(file, samples + 3, 2), 1u);
    EXPECT_EQ(files.read(file, samples + 4, 1), 0u);
    files.close(file);

    EXPECT_EQ(about.channels, 1);
    EXPECT_EQ(about.rate, 8000);
    EXPECT_EQ(about.width, 2);
    EXPECT_EQ(about.frames, 4u);
    EXPECT_EQ(about.bytes, PlainAifc().size());
    EXPECT_EQ(samples[0], 258);
    EXPECT_EQ(samples[3], 1800);
    EXPECT_EQ(samples[4], 0);
}

TEST(audio_file, WhatIsNoSoundIsNull)
{
    const TempDir directory;
    AudioFormat about;
    AudioFiles& files = AudioFiles::current();
    FaultyFiles counted;

    EXPECT_FALSE(files.open(nullptr, about));
    EXPECT_FALSE(files.open(directory.Path("none").c_str(), about));
    EXPECT_FALSE(files.open(directory.Write("a", "no").c_str(), about));
    EXPECT_EQ(counted.open_count, 0);
}

/// Knows one file only.
class OneFile final : public AudioFiles
{
public:
    void* open(const char*, AudioFormat&) override { return this; }
    std::uint64_t read(void*, short*, std::uint64_t) override { return 0; }
    void close(void*) override {}
};

TEST(audio_file, AnInstalledReaderIsUsedUntilItIsTakenAway)
{
    OneFile one;
    AudioFiles* system = &AudioFiles::current();

    EXPECT_EQ(AudioFiles::install(&one), nullptr);
    EXPECT_EQ(&AudioFiles::current(), &one);
    EXPECT_EQ(AudioFiles::install(nullptr), &one);

    EXPECT_EQ(&AudioFiles::current(), system);
}

TEST(lazy_library, FunctionsAreFoundByName)
{
    LazyLibrary mathematics("libm.so.6");
    using Cosine = double (*)(double);

    const auto cosine = mathematics.find<Cosine>("cos");

    ASSERT_TRUE(cosine);
    EXPECT_EQ(cosine(0), 1.0);
    EXPECT_FALSE(mathematics.find<Cosine>("no_such_function"));
}

TEST(lazy_library, AMissingLibraryHasNoFunctions)
{
    LazyLibrary missing("libno_such_library.so.9");

    EXPECT_FALSE(missing.find<void (*)()>("cos"));
    EXPECT_FALSE(missing.find<void (*)()>("cos"));
}

} // namespace
