// How fast are sounds saved, loaded, converted and measured, against the
// operations written down literally and against other libraries? Noise that
// rises and falls, sixty seconds of it in files and three in memory, which stay
// in the processor's cache: a minute of it measures the memory. A fresh copy
// for each run.

#include <KVO/KvoSound.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <filesystem>
#include <functional>
#include <malloc.h>
#include <memory>
#include <numeric>
#include <string>
#include <unistd.h>
#include <vector>

#include <benchmark/benchmark.h>
#ifdef ZT_BENCH_SNDFILE
#include <sndfile.h>
#endif

#include "require.h"
#include "sound_peers.h"

namespace {

using Buffer = std::unique_ptr<short[]>;

constexpr long rate = 44100;
constexpr long new_rate = 48000;
constexpr long file_frames = 60 * rate;
constexpr long memory_frames = 3 * rate;

std::vector<short> Noise(long frames, int channels)
{
    std::vector<short> samples(static_cast<std::size_t>(frames * channels));
    unsigned noise = 1;
    for (std::size_t i = 0; i < samples.size(); ++i) {
        noise = noise * 1664525 + 1013904223;
        const float loudness =
            0.3f + 0.3f * std::sin(static_cast<float>(i % 1000000) / 30000.0f);
        samples[i] = static_cast<short>(
            static_cast<float>(static_cast<short>(noise >> 16)) * loudness);
    }
    return samples;
}

KvoSound SoundOf(const std::vector<short>& samples, int channels)
{
    short* buffer = new short[samples.size()];
    std::copy(samples.begin(), samples.end(), buffer);
    return KvoSound(rate, channels,
                    static_cast<long>(samples.size()) / channels, buffer);
}

std::vector<short> SamplesOf(const KvoSound& sound)
{
    return {sound.samples, sound.samples + sound.frames * sound.channels};
}

// --- the operations, literally -----------------------------------------------

void LoPassLiterally(short* x, std::size_t count, std::size_t step,
                     long frequency)
{
    const float w = static_cast<float>(2.0 * 3.14159265358979323846 *
                                       static_cast<double>(frequency) / rate);
    const float g =
        static_cast<float>(std::exp(-static_cast<double>(w) / rate));
    for (std::size_t i = count; i-- > step;)
        x[i] = static_cast<short>(
            static_cast<int>(static_cast<float>(x[i]) * w) +
            static_cast<int>(static_cast<float>(x[i - step]) * g));
}

std::size_t ResampleLiterally(Buffer& x, std::size_t frames, std::size_t step)
{
    const long grid = std::lcm(rate, new_rate);
    const long up = grid / rate;
    const long down = grid / new_rate;
    const long count = static_cast<long>(frames) * up / down;
    LoPassLiterally(x.get(), frames * step, step, new_rate / 2);
    Buffer out(new short[static_cast<std::size_t>(count) * step]);
    for (long k = 0; k < count; ++k) {
        const long j = k * down / up;
        if (step == 2) {
            out[2 * k] = x[2 * j];
            out[2 * k + 1] = x[2 * j + 1];
            continue;
        }
        const long next = std::min(j + 1, static_cast<long>(frames) - 1);
        const float rise = static_cast<float>(x[next] - x[j]) *
                           static_cast<float>(k * down - j * up) /
                           static_cast<float>(up);
        out[k] = static_cast<short>(x[j] + static_cast<int>(rise));
    }
    x = std::move(out);
    return static_cast<std::size_t>(count);
}

void MonoLiterally(Buffer& x, std::size_t frames)
{
    Buffer out(new short[frames]);
    for (std::size_t i = 0; i < frames; ++i)
        out[i] = static_cast<short>((x[2 * i] + x[2 * i + 1]) / 2);
    x = std::move(out);
}

float VolumeLiterally(const short* x, std::size_t count)
{
    float sum = 0;
    for (std::size_t i = 0; i < count; ++i) {
        const float value = static_cast<float>(x[i]) / 32768.0f;
        sum += value * value;
    }
    return std::sqrt(sum / static_cast<float>(count));
}

struct Range
{
    float min;
    float max;
};

Range MinMaxLiterally(const short* x, std::size_t count)
{
    Range range = {static_cast<float>(x[0]), static_cast<float>(x[0])};
    for (std::size_t i = 0; i < count; ++i) {
        if (static_cast<float>(x[i]) < range.min)
            range.min = static_cast<float>(x[i]);
        if (static_cast<float>(x[i]) > range.max)
            range.max = static_cast<float>(x[i]);
    }
    return range;
}

// --- running them
// ----------------------------------------------------------------

/// Runs an operation on a fresh copy of a sound each time, from the same
/// memory for ours and for the literal one.
template <class Operation>
void RunOnCopies(benchmark::State& state, const KvoSound& sound,
                 const Operation& operation)
{
    for (auto _ : state) {
        state.PauseTiming();
        auto copy = std::make_unique<KvoSound>(sound);
        state.ResumeTiming();
        operation(*copy);
        benchmark::ClobberMemory();
        state.PauseTiming();
        copy.reset();
        state.ResumeTiming();
    }
}

/// Lets a literal operation work on the buffer of a sound.
template <class Literal>
auto OnBuffer(const Literal& literal)
{
    return [literal](KvoSound& sound) {
        Buffer buffer(sound.samples);
        literal(buffer);
        sound.samples = buffer.release();
    };
}

/// Makes sure that ours and the literal operation give the same samples.
void Compare(const std::vector<short>& samples, int channels,
             const std::function<void(KvoSound&)>& ours,
             const std::function<std::size_t(Buffer&)>& literal,
             const char* what)
{
    KvoSound sound = SoundOf(samples, channels);
    Buffer copy(new short[samples.size()]);
    std::copy(samples.begin(), samples.end(), copy.get());
    ours(sound);
    const std::size_t count = literal(copy);
    Require(SamplesOf(sound) ==
                std::vector<short>(copy.get(), copy.get() + count),
            what);
}

using benchmark::RegisterBenchmark;

template <class Run>
void Register(const std::string& name, const Run& run)
{
    RegisterBenchmark(name.c_str(), run)->Unit(benchmark::kMicrosecond);
}

void RegisterResample(const std::string& row, int channels, long frames)
{
    const std::vector<short> samples = Noise(frames, channels);
    const auto step = static_cast<std::size_t>(channels);
    const auto count = static_cast<std::size_t>(frames);
    auto ours = [](KvoSound& sound) { sound.Resample(new_rate); };
    auto literal = [=](Buffer& x) {
        return ResampleLiterally(x, count, step) * step;
    };
    Compare(samples, channels, ours, literal, "resampled sound");
    const auto sound = std::make_shared<KvoSound>(SoundOf(samples, channels));
    const bool is_curve = row.starts_with("curve/");
    const std::string size = is_curve ? "/" + std::to_string(frames) : "";
    Register(row + "/ours" + size, [=](benchmark::State& state) {
        RunOnCopies(state, *sound, ours);
    });
    Register(row + "/literal" + size, [=](benchmark::State& state) {
        RunOnCopies(state, *sound, OnBuffer(literal));
    });
    for (const ResamplePeer& peer : ResamplePeers())
        Register(row + "/" + peer.name + size, [=](benchmark::State& state) {
            std::vector<short> out(samples.size() * 2);
            for (auto _ : state) {
                if (!peer.run(samples.data(), frames, channels, out.data()))
                    state.SkipWithError("the peer failed");
                benchmark::ClobberMemory();
            }
        });
}

void RegisterEdits()
{
    const std::vector<short> mono = Noise(memory_frames, 1);
    const std::vector<short> stereo = Noise(memory_frames, 2);
    const auto mono_sound = std::make_shared<KvoSound>(SoundOf(mono, 1));
    const auto stereo_sound = std::make_shared<KvoSound>(SoundOf(stereo, 2));
    auto ours_low = [](KvoSound& sound) { sound.LoPass(4000); };
    auto literal_low = [count = mono.size()](Buffer& x) {
        LoPassLiterally(x.get(), count, 1, 4000);
        return count;
    };
    Compare(mono, 1, ours_low, literal_low, "low pass");
    Register("sound_lopass/ours", [=](benchmark::State& state) {
        RunOnCopies(state, *mono_sound, ours_low);
    });
    Register("sound_lopass/literal", [=](benchmark::State& state) {
        RunOnCopies(state, *mono_sound, OnBuffer(literal_low));
    });

    auto ours_mono = [](KvoSound& sound) { sound.Mono(0); };
    auto literal_mono = [frames = stereo.size() / 2](Buffer& x) {
        MonoLiterally(x, frames);
        return frames;
    };
    Compare(stereo, 2, ours_mono, literal_mono, "mono sound");
    Register("sound_mono/ours", [=](benchmark::State& state) {
        RunOnCopies(state, *stereo_sound, ours_mono);
    });
    Register("sound_mono/literal", [=](benchmark::State& state) {
        RunOnCopies(state, *stereo_sound, OnBuffer(literal_mono));
    });
}

void RegisterMeasures()
{
    // A copy, since only the library asks for large pages.
    const auto sound =
        std::make_shared<KvoSound>(SoundOf(Noise(memory_frames, 2), 2));
    *sound = KvoSound(*sound);
    const auto count = static_cast<std::size_t>(2 * sound->frames);
    const float volume = VolumeLiterally(sound->samples, count);
    const Range range = MinMaxLiterally(sound->samples, count);
    sound->ComputeMinMax();
    Require(sound->Volume() == volume, "volume");
    Require(sound->min == range.min && sound->max == range.max, "range");
    Register("sound_volume/ours", [=](benchmark::State& state) {
        for (auto _ : state)
            benchmark::DoNotOptimize(sound->Volume());
    });
    Register("sound_volume/literal", [=](benchmark::State& state) {
        for (auto _ : state)
            benchmark::DoNotOptimize(VolumeLiterally(sound->samples, count));
    });
    Register("sound_minmax/ours", [=](benchmark::State& state) {
        for (auto _ : state) {
            sound->ComputeMinMax();
            benchmark::ClobberMemory();
        }
    });
    Register("sound_minmax/literal", [=](benchmark::State& state) {
        for (auto _ : state)
            benchmark::DoNotOptimize(MinMaxLiterally(sound->samples, count));
    });
}

// --- files
// -----------------------------------------------------------------------

/// A folder that goes at the end.
class Folder
{
public:
    Folder()
        : path(std::filesystem::temp_directory_path() /
               ("zt_bench_sound." + std::to_string(getpid())))
    {
        std::filesystem::create_directory(path);
    }
    ~Folder() { std::filesystem::remove_all(path); }
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;

    std::string Path(const char* name) const { return path / name; }

private:
    std::filesystem::path path;
};

#ifdef ZT_BENCH_SNDFILE
/// Writes a sound with the library of that name, in one call.
bool SaveByPeer(const KvoSound& sound, const std::string& path)
{
    SF_INFO info = {};
    info.samplerate = static_cast<int>(sound.rate);
    info.channels = sound.channels;
    info.format = SF_FORMAT_AIFF | SF_FORMAT_PCM_16 | SF_ENDIAN_BIG;
    SNDFILE* file = sf_open(path.c_str(), SFM_WRITE, &info);
    const bool whole = file && sf_writef_short(file, sound.samples,
                                               sound.frames) == sound.frames;
    return sf_close(file) == 0 && whole;
}

/// Reads one into a buffer of its own, as `KvoSound` has one.
Buffer LoadByPeer(const std::string& path, std::size_t& count)
{
    SF_INFO info = {};
    SNDFILE* file = sf_open(path.c_str(), SFM_READ, &info);
    count = static_cast<std::size_t>(info.frames * info.channels);
    Buffer buffer(new short[count]);
    if (sf_readf_short(file, buffer.get(), info.frames) != info.frames)
        count = 0;
    sf_close(file);
    return buffer;
}
#endif

void RegisterFiles(const Folder& folder)
{
    const auto sound =
        std::make_shared<KvoSound>(SoundOf(Noise(file_frames, 2), 2));
    const std::string ours = folder.Path("ours.aifc");
    const std::string ours_new = folder.Path("ours_new.aifc");
    sound->Save(ours.c_str());
    Require(SamplesOf(KvoSound(ours.c_str())) == SamplesOf(*sound),
            "saved sound");
    // A new file each time: none that is there is replaced.
    Register("sound_save/ours", [=](benchmark::State& state) {
        for (auto _ : state) {
            state.PauseTiming();
            std::filesystem::remove(ours_new);
            state.ResumeTiming();
            sound->Save(ours_new.c_str());
        }
    });
    Register("sound_load/ours", [=](benchmark::State& state) {
        for (auto _ : state) {
            const auto loaded = std::make_unique<KvoSound>(ours.c_str());
            benchmark::DoNotOptimize(loaded->samples);
        }
    });
#ifdef ZT_BENCH_SNDFILE
    const std::string theirs = folder.Path("theirs.aiff");
    std::size_t count = 0;
    const Buffer read = LoadByPeer(ours, count);
    Require(std::vector<short>(read.get(), read.get() + count) ==
                SamplesOf(*sound),
            "sound read by libsndfile");
    Register("sound_save/libsndfile", [=](benchmark::State& state) {
        for (auto _ : state) {
            state.PauseTiming();
            std::filesystem::remove(theirs);
            state.ResumeTiming();
            if (!SaveByPeer(*sound, theirs))
                state.SkipWithError("the peer failed");
        }
    });
    Register("sound_load/libsndfile", [=](benchmark::State& state) {
        for (auto _ : state) {
            std::size_t samples = 0;
            const Buffer loaded = LoadByPeer(ours, samples);
            benchmark::DoNotOptimize(loaded.get());
        }
    });
#endif
}

} // namespace

int main(int argc, char** argv)
{
    // Memory that was freed is kept, or page faults are what is measured.
    mallopt(M_MMAP_THRESHOLD, 1 << 30);
    mallopt(M_TRIM_THRESHOLD, 1 << 30);
    const Folder folder;
    RegisterFiles(folder);
    RegisterResample("sound_resample_mono", 1, memory_frames);
    RegisterResample("sound_resample_stereo", 2, memory_frames);
    RegisterEdits();
    RegisterMeasures();
    for (long frames = 1000; frames <= 10000000; frames *= 10)
        RegisterResample("curve/sound_resample", 1, frames);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    benchmark::RunSpecifiedBenchmarks();
}
