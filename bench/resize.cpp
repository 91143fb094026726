// How fast are pictures scaled? Counted are the pixels of the larger side.

#include <ZT/image_sgi.h>

#include <algorithm>
#include <benchmark/benchmark.h>
#include <cstdlib>

namespace {

ZtPixel* Noise(std::size_t count)
{
    ZtPixel* pixels =
        static_cast<ZtPixel*>(std::malloc(count * sizeof(ZtPixel)));
    ZtPixel noise = 1;
    for (std::size_t i = 0; i < count; ++i)
        pixels[i] = noise = noise * 1664525 + 1013904223;
    return pixels;
}

void Scale(benchmark::State& state, void (ZtImageSGI::*scale)(int, int))
{
    int width = static_cast<int>(state.range(0));
    int height = static_cast<int>(state.range(1));
    int new_width = static_cast<int>(state.range(2));
    int new_height = static_cast<int>(state.range(3));
    const ZtImageSGI source(width, height,
                            Noise(static_cast<std::size_t>(width) *
                                  static_cast<std::size_t>(height)));
    for (auto _ : state) {
        state.PauseTiming();
        ZtImageSGI image(source);
        state.ResumeTiming();
        (image.*scale)(new_width, new_height);
    }
    state.SetItemsProcessed(
        state.iterations() *
        std::max<std::int64_t>(std::int64_t{width} * height,
                               std::int64_t{new_width} * new_height));
}

void Sizes(benchmark::internal::Benchmark* bench)
{
    bench->Unit(benchmark::kMicrosecond)
        ->Args({2048, 1536, 1024, 768})
        ->Args({2048, 1536, 1366, 1025})
        ->Args({2048, 1536, 160, 121})
        ->Args({720, 486, 648, 486})
        ->Args({640, 480, 1600, 1200})
        ->Args({1024, 768, 2048, 1536});
}

BENCHMARK_CAPTURE(Scale, Nearest, &ZtImageSGI::Resize)->Apply(Sizes);
BENCHMARK_CAPTURE(Scale, Best, &ZtImageSGI::ResizeBest)->Apply(Sizes);

} // namespace
