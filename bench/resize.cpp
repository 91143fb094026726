// How fast are pictures scaled, against the literal way, and against peers that
// scale to the nearest pixel or by area? Each makes a new picture.

#include <ZT/image_sgi.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>
#ifdef ZT_BENCH_LIBYUV
#include <libyuv/scale_argb.h>
#endif
#ifdef ZT_BENCH_LIBAV
extern "C" {
#include <libswscale/swscale.h>
}
#endif
#ifdef ZT_BENCH_STB
#define STB_IMAGE_RESIZE_IMPLEMENTATION
#define STB_IMAGE_RESIZE_STATIC
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wall"
#pragma GCC diagnostic ignored "-Wextra"
#pragma GCC diagnostic ignored "-Wconversion"
#pragma GCC diagnostic ignored "-Wsign-conversion"
#pragma GCC diagnostic ignored "-Wshadow"
#pragma GCC diagnostic ignored "-Wpedantic"
#pragma GCC diagnostic ignored "-Wunused-function"
#include <stb/stb_image_resize.h>
#pragma GCC diagnostic pop
#endif

#include "image/literal_codec.h"
#include "require.h"

namespace {

struct Sizes
{
    int width, height, new_width, new_height;

    std::size_t Pixels() const
    {
        return static_cast<std::size_t>(width) *
               static_cast<std::size_t>(height);
    }
    std::size_t NewPixels() const
    {
        return static_cast<std::size_t>(new_width) *
               static_cast<std::size_t>(new_height);
    }
};

using Picture = std::unique_ptr<ZtPixel[], decltype(&std::free)>;

Picture NewPicture(std::size_t count)
{
    return {static_cast<ZtPixel*>(std::malloc(count * sizeof(ZtPixel))),
            std::free};
}

Picture Noise(std::size_t count)
{
    Picture pixels = NewPicture(count);
    ZtPixel noise = 1;
    for (std::size_t i = 0; i < count; ++i)
        pixels[i] = noise = noise * 1664525 + 1013904223;
    return pixels;
}

enum class Filter { Nearest, Area };

literal::Pixels ScaledLiterally(const literal::Pixels& source, Filter filter,
                                const Sizes& sizes)
{
    const auto scale =
        filter == Filter::Nearest ? &literal::Zoom : &literal::Fant;
    return scale(source, sizes.width, sizes.height, sizes.new_width,
                 sizes.new_height);
}

using Scale = void (ZtImageSGI::*)(int, int);

/// Makes sure that ours and the literal form give the same picture.
void RequireSamePicture(const ZtImageSGI& source, Scale scale, Filter filter,
                        const Sizes& sizes)
{
    const literal::Pixels expected = ScaledLiterally(
        {source.pixels, source.pixels + sizes.Pixels()}, filter, sizes);
    ZtImageSGI image(source);
    (image.*scale)(sizes.new_width, sizes.new_height);
    Require(image.width == sizes.new_width &&
                image.height == sizes.new_height &&
                expected.size() == sizes.NewPixels() &&
                std::memcmp(image.pixels, expected.data(),
                            expected.size() * sizeof(ZtPixel)) == 0,
            filter == Filter::Nearest ? "Resize" : "ResizeBest");
}

void ScaleOurs(benchmark::State& state, Filter filter, Sizes sizes)
{
    const Scale scale = filter == Filter::Nearest ? &ZtImageSGI::Resize
                                                  : &ZtImageSGI::ResizeBest;
    const ZtImageSGI source(sizes.width, sizes.height,
                            Noise(sizes.Pixels()).release());
    RequireSamePicture(source, scale, filter, sizes);
    for (auto _ : state) {
        state.PauseTiming();
        ZtImageSGI image(source);
        state.ResumeTiming();
        (image.*scale)(sizes.new_width, sizes.new_height);
        state.PauseTiming();
        image = ZtImageSGI(1, 1, NewPicture(1).release());
        state.ResumeTiming();
    }
}

void ScaleLiterally(benchmark::State& state, Filter filter, Sizes sizes)
{
    const Picture noise = Noise(sizes.Pixels());
    const literal::Pixels source(noise.get(), noise.get() + sizes.Pixels());
    for (auto _ : state)
        benchmark::DoNotOptimize(ScaledLiterally(source, filter, sizes));
}

template <typename ScaleByPeer>
void ScalePeer(benchmark::State& state, Sizes sizes, ScaleByPeer scale)
{
    const Picture original = Noise(sizes.Pixels());
    for (auto _ : state) {
        // Each run starts from a fresh copy, as ours does.
        state.PauseTiming();
        const Picture source = NewPicture(sizes.Pixels());
        std::memcpy(source.get(), original.get(),
                    sizes.Pixels() * sizeof(ZtPixel));
        state.ResumeTiming();
        Picture result = NewPicture(sizes.NewPixels());
        scale(reinterpret_cast<const std::uint8_t*>(source.get()),
              reinterpret_cast<std::uint8_t*>(result.get()), sizes);
        benchmark::DoNotOptimize(result.get());
    }
}

#ifdef ZT_BENCH_LIBYUV
template <libyuv::FilterMode Mode>
void ScaleWithLibyuv(const std::uint8_t* from, std::uint8_t* to,
                     const Sizes& sizes)
{
    libyuv::ARGBScale(from, sizes.width * 4, sizes.width, sizes.height, to,
                      sizes.new_width * 4, sizes.new_width, sizes.new_height,
                      Mode);
}
#endif

#ifdef ZT_BENCH_LIBAV
/// The context is made beforehand: it is the peer's own table of weights, which
/// it keeps from picture to picture.
auto SwscaleScaler(const Sizes& sizes, int flags)
{
    const std::shared_ptr<SwsContext> context(
        sws_getContext(sizes.width, sizes.height, AV_PIX_FMT_RGBA,
                       sizes.new_width, sizes.new_height, AV_PIX_FMT_RGBA,
                       flags, nullptr, nullptr, nullptr),
        sws_freeContext);
    return [context](const std::uint8_t* from, std::uint8_t* to,
                     const Sizes& size) {
        const std::uint8_t* const planes[] = {from, nullptr, nullptr, nullptr};
        const int strides[] = {size.width * 4, 0, 0, 0};
        std::uint8_t* const results[] = {to, nullptr, nullptr, nullptr};
        const int result_strides[] = {size.new_width * 4, 0, 0, 0};
        sws_scale(context.get(), planes, strides, 0, size.height, results,
                  result_strides);
    };
}
#endif

#ifdef ZT_BENCH_STB
void ScaleWithStb(const std::uint8_t* from, std::uint8_t* to,
                  const Sizes& sizes)
{
    stbir_resize_uint8_generic(from, sizes.width, sizes.height, 0, to,
                               sizes.new_width, sizes.new_height, 0, 4, -1, 0,
                               STBIR_EDGE_CLAMP, STBIR_FILTER_BOX,
                               STBIR_COLORSPACE_LINEAR, nullptr);
}
#endif

void RegisterPeers(const std::string& row, Filter filter, const Sizes& sizes)
{
    [[maybe_unused]] const auto add = [&](const char* name, auto scale) {
        benchmark::RegisterBenchmark((row + "/" + name).c_str(),
                                     [sizes, scale](benchmark::State& state) {
                                         ScalePeer(state, sizes, scale);
                                     })
            ->Unit(benchmark::kMicrosecond);
    };
#ifdef ZT_BENCH_LIBYUV
    if (filter == Filter::Nearest)
        add("libyuv", ScaleWithLibyuv<libyuv::kFilterNone>);
#endif
#ifdef ZT_BENCH_LIBAV
    add("libswscale",
        SwscaleScaler(sizes, filter == Filter::Nearest ? SWS_POINT : SWS_AREA));
#endif
#ifdef ZT_BENCH_STB
    if (filter == Filter::Area)
        add("stb", ScaleWithStb);
#endif
}

[[maybe_unused]] const bool registered = [] {
    const struct
    {
        const char* row;
        Filter filter;
        Sizes sizes;
    } rows[] = {
        {"resize_down", Filter::Nearest, {2048, 1536, 1000, 750}},
        {"resize_up", Filter::Nearest, {1000, 750, 2048, 1536}},
        {"resize_best_2048", Filter::Area, {2048, 1536, 1000, 750}},
        {"resize_best_648", Filter::Area, {648, 486, 160, 121}},
    };
    for (const auto& row : rows) {
        const std::string name = row.row;
        benchmark::RegisterBenchmark((name + "/ours").c_str(), ScaleOurs,
                                     row.filter, row.sizes)
            ->Unit(benchmark::kMicrosecond);
        benchmark::RegisterBenchmark((name + "/literal").c_str(),
                                     ScaleLiterally, row.filter, row.sizes)
            ->Unit(benchmark::kMicrosecond);
        RegisterPeers(name, row.filter, row.sizes);
    }
    return true;
}();

} // namespace
