// How fast does a picture become a frame of video, stretched and in 4:2:2?
// Peers do the same job with the nearest samples, without carrying fractions
// and without parting the fields.

#include "image/video_frame.h"

#include <memory>
#include <vector>

#include <benchmark/benchmark.h>
#ifdef ZT_BENCH_LIBYUV
#include <libyuv.h>
#endif
#ifdef ZT_BENCH_LIBAV
extern "C" {
#include <libswscale/swscale.h>
}
#endif

#include "image/literal_frame.h"
#include "platform/video_lanes.h"
#include "require.h"

namespace {

constexpr int width = zt_image::video_picture_width;
constexpr int height = zt_image::video_picture_height;

std::vector<ZtPixel> Noise()
{
    std::vector<ZtPixel> pixels(std::size_t{width} * height);
    ZtPixel noise = 1;
    for (ZtPixel& pixel : pixels)
        pixel = noise = noise * 1664525 + 1013904223;
    return pixels;
}

void Convert(benchmark::State& state, const zt_platform::VideoLanes& lanes)
{
    const std::vector<ZtPixel> pixels = Noise();
    std::vector<unsigned char> frame(zt_image::video_frame_bytes);
    zt_platform::VideoLanes::install(&lanes);
    zt_image::make_video_frame(pixels.data(), frame.data());
    Require(std::string(frame.begin(), frame.end()) ==
                literal::VideoFrame(pixels),
            "frame of video");
    for (auto _ : state) {
        zt_image::make_video_frame(pixels.data(), frame.data());
        benchmark::DoNotOptimize(frame.data());
        benchmark::ClobberMemory();
    }
    zt_platform::VideoLanes::install(nullptr);
    state.SetLabel(lanes.name());
}

void ConvertLiterally(benchmark::State& state)
{
    const std::vector<ZtPixel> pixels = Noise();
    for (auto _ : state)
        benchmark::DoNotOptimize(literal::VideoFrame(pixels));
}

BENCHMARK_CAPTURE(Convert, Fastest, zt_platform::VideoLanes::fastest())
    ->Name("frame_convert/ours")
    ->Unit(benchmark::kMicrosecond);
BENCHMARK(ConvertLiterally)
    ->Name("frame_convert/literal")
    ->Unit(benchmark::kMicrosecond);

#ifdef ZT_BENCH_LIBYUV
/// From the order of bytes that suits it best.
void ConvertWithLibyuv(benchmark::State& state)
{
    const std::vector<ZtPixel> pixels = Noise();
    std::vector<ZtPixel> stretched(zt_image::video_width * std::size_t{height});
    std::vector<unsigned char> frame(zt_image::video_frame_bytes);
    for (auto _ : state) {
        libyuv::ARGBScale(reinterpret_cast<const unsigned char*>(pixels.data()),
                          4 * width, width, height,
                          reinterpret_cast<unsigned char*>(stretched.data()),
                          4 * zt_image::video_width, zt_image::video_width,
                          height, libyuv::kFilterNone);
        libyuv::ARGBToUYVY(
            reinterpret_cast<const unsigned char*>(stretched.data()),
            4 * zt_image::video_width, frame.data(), 2 * zt_image::video_width,
            zt_image::video_width, height);
        benchmark::DoNotOptimize(frame.data());
        benchmark::ClobberMemory();
    }
}
BENCHMARK(ConvertWithLibyuv)
    ->Name("frame_convert/libyuv")
    ->Unit(benchmark::kMicrosecond);
#endif

#ifdef ZT_BENCH_LIBAV
void ConvertWithSwscale(benchmark::State& state)
{
    const std::vector<ZtPixel> pixels = Noise();
    std::vector<unsigned char> frame(zt_image::video_frame_bytes);
    const std::unique_ptr<SwsContext, decltype(&sws_freeContext)> context(
        sws_getContext(width, height, AV_PIX_FMT_ABGR, zt_image::video_width,
                       height, AV_PIX_FMT_UYVY422, SWS_POINT, nullptr, nullptr,
                       nullptr),
        sws_freeContext);
    for (auto _ : state) {
        const unsigned char* const from[] = {
            reinterpret_cast<const unsigned char*>(pixels.data())};
        const int from_stride[] = {4 * width};
        unsigned char* const to[] = {frame.data()};
        const int to_stride[] = {2 * zt_image::video_width};
        sws_scale(context.get(), from, from_stride, 0, height, to, to_stride);
        benchmark::DoNotOptimize(frame.data());
        benchmark::ClobberMemory();
    }
}
BENCHMARK(ConvertWithSwscale)
    ->Name("frame_convert/libswscale")
    ->Unit(benchmark::kMicrosecond);
#endif

} // namespace
