// How fast is a raw video frame turned into pixels?

#include <ZT/image_sgi.h>

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <string>
#include <unistd.h>

#include <benchmark/benchmark.h>
#ifdef ZT_BENCH_LIBAV
extern "C" {
#include <libswscale/swscale.h>
}
#endif

#include "image/literal_codec.h"
#include "require.h"

namespace {

constexpr int width = 720, height = 486;
constexpr std::size_t frame_bytes = std::size_t{width} * height * 2;

/// A frame of noise within the legal levels, in a file that goes at the end.
class Frame
{
public:
    Frame()
        : path(std::filesystem::temp_directory_path() /
               ("zt_bench_video_in." + std::to_string(getpid())))
    {
        std::string bytes;
        unsigned random = 1;
        while (bytes.size() < frame_bytes) {
            random = random * 1664525 + 1013904223;
            bytes += static_cast<char>(16 + (random >> 16) % 220);
        }
        std::ofstream(path, std::ios::binary) << bytes;
    }
    ~Frame() { std::filesystem::remove(path); }
    Frame(const Frame&) = delete;
    Frame& operator=(const Frame&) = delete;

    const std::string path;
};

const std::string& FramePath()
{
    static const Frame frame;
    return frame.path;
}

std::string Bytes()
{
    std::ifstream in(FramePath(), std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

void Read(benchmark::State& state)
{
    const literal::Picture there = literal::ReadYuv(Bytes());
    const ZtImageSGI here(FramePath().c_str(), 1);
    Require(here.pixels && literal::Pixels(here.pixels,
                                           here.pixels + there.pixels.size()) ==
                               literal::Reversed(there.pixels),
            "raw video");
    for (auto _ : state) {
        const ZtImageSGI image(FramePath().c_str(), 1);
        benchmark::DoNotOptimize(image.pixels);
    }
}

void ReadLiterally(benchmark::State& state)
{
    for (auto _ : state)
        benchmark::DoNotOptimize(
            literal::Reversed(literal::ReadYuv(Bytes()).pixels));
}

#ifdef ZT_BENCH_LIBAV
// Both fields into their lines of one picture.
void ReadWithSwscale(benchmark::State& state)
{
    const std::unique_ptr<SwsContext, decltype(&sws_freeContext)> context(
        sws_getContext(width, height / 2, AV_PIX_FMT_UYVY422, width, height / 2,
                       AV_PIX_FMT_RGBA, SWS_POINT, nullptr, nullptr, nullptr),
        sws_freeContext);
    for (auto _ : state) {
        std::string bytes(frame_bytes, '\0');
        std::ifstream(FramePath(), std::ios::binary)
            .read(bytes.data(), frame_bytes);
        auto* pixels = static_cast<std::uint8_t*>(
            std::malloc(std::size_t{width} * height * 4));
        for (int field = 0; field < 2; ++field) {
            const std::uint8_t* const from[] = {
                reinterpret_cast<const std::uint8_t*>(bytes.data()) +
                    frame_bytes / 2 * static_cast<std::size_t>(field),
                nullptr, nullptr, nullptr};
            const int from_stride[] = {width * 2, 0, 0, 0};
            std::uint8_t* const to[] = {pixels + width * 4 * field, nullptr,
                                        nullptr, nullptr};
            const int to_stride[] = {width * 8, 0, 0, 0};
            sws_scale(context.get(), from, from_stride, 0, height / 2, to,
                      to_stride);
        }
        benchmark::DoNotOptimize(pixels);
        std::free(pixels);
    }
}
BENCHMARK(ReadWithSwscale)
    ->Name("yuv_read/libswscale")
    ->Unit(benchmark::kMicrosecond);
#endif

BENCHMARK(Read)->Name("yuv_read/ours")->Unit(benchmark::kMicrosecond);
BENCHMARK(ReadLiterally)
    ->Name("yuv_read/literal")
    ->Unit(benchmark::kMicrosecond);

} // namespace
