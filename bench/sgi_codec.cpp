// How fast are picture files read and written, against copying the pixels?

#include <ZT/image_sgi.h>

#include <benchmark/benchmark.h>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

namespace {

constexpr int width = 2048;
constexpr int height = 1536;
constexpr std::size_t pixel_count = std::size_t{width} * height;

/// A picture about as compressible as a photo: soft gradients with grain, and
/// some areas that are flat.
std::vector<ZtPixel> Photo()
{
    std::vector<ZtPixel> pixels;
    std::uint32_t random = 1;
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x) {
            random = random * 1664525 + 1013904223;
            ZtPixel grain = random >> 28;
            bool flat = y > height * 3 / 4 && x / 128 % 2;
            ZtPixel value =
                flat ? 0x40
                     : static_cast<ZtPixel>(x / 16 + y / 16) % 240 + grain;
            pixels.push_back(0xFF000000 | value << 16 | (255 - value) << 8 |
                             (value ^ 0x55));
        }
    return pixels;
}

/// The files that are read, in a folder that goes at the end.
class Files
{
public:
    Files()
        : folder(std::filesystem::temp_directory_path() / "zt_bench_sgi_codec"),
          photo(Photo())
    {
        std::filesystem::create_directory(folder);
        longstoimage(photo.data(), width, height, 3, Path("packed").c_str());
        WriteVerbatim();
        std::ofstream(Path("frame"), std::ios::binary)
            << std::string(699840, '\x60');
        std::ofstream pix(Path("pix"), std::ios::binary);
        pix << std::string("\x08\0\x06\0\0\0\0\0\0\x18", 10);
        for (std::size_t i = 0; i < pixel_count; i += 4)
            pix << '\x04' << "\x10\x20" << static_cast<char>(i >> 8);
    }

    ~Files() { std::filesystem::remove_all(folder); }
    Files(const Files&) = delete;
    Files& operator=(const Files&) = delete;

    std::string Path(const char* name) const { return folder / name; }

private:
    void WriteVerbatim() const
    {
        std::string bytes("\x01\xDA\0\1\0\3\x08\0\x06\0\0\3", 12);
        bytes.resize(512);
        for (int shift : {0, 8, 16})
            for (ZtPixel pixel : photo)
                bytes += static_cast<char>(pixel >> shift);
        std::ofstream(Path("plain"), std::ios::binary) << bytes;
    }

    std::filesystem::path folder;

public:
    const std::vector<ZtPixel> photo;
};

const Files& TheFiles()
{
    static const Files files;
    return files;
}

void CountPixels(benchmark::State& state, std::size_t count)
{
    state.SetItemsProcessed(state.iterations() *
                            static_cast<std::int64_t>(count));
}

void CopyPixels(benchmark::State& state)
{
    const std::vector<ZtPixel>& photo = TheFiles().photo;
    std::vector<ZtPixel> copy(photo.size());
    for (auto _ : state) {
        std::memcpy(copy.data(), photo.data(), pixel_count * sizeof(ZtPixel));
        benchmark::ClobberMemory();
    }
    CountPixels(state, pixel_count);
}

void CopyPixelsToNewMemory(benchmark::State& state)
{
    const std::vector<ZtPixel>& photo = TheFiles().photo;
    for (auto _ : state) {
        void* copy = std::malloc(pixel_count * sizeof(ZtPixel));
        std::memcpy(copy, photo.data(), pixel_count * sizeof(ZtPixel));
        benchmark::DoNotOptimize(copy);
        std::free(copy);
    }
    CountPixels(state, pixel_count);
}

void Load(benchmark::State& state, const char* name, int type,
          std::size_t count)
{
    std::string path = TheFiles().Path(name);
    for (auto _ : state) {
        ZtImageSGI image(path.c_str(), type);
        benchmark::DoNotOptimize(image.pixels);
    }
    CountPixels(state, count);
}

void Write(benchmark::State& state)
{
    std::string path = TheFiles().Path("written");
    int channels = static_cast<int>(state.range(0));
    for (auto _ : state)
        longstoimage(TheFiles().photo.data(), width, height, channels,
                     path.c_str());
    CountPixels(state, pixel_count);
}

BENCHMARK(CopyPixels);
BENCHMARK(CopyPixelsToNewMemory);
BENCHMARK_CAPTURE(Load, RunLength, "packed", 0, pixel_count);
BENCHMARK_CAPTURE(Load, Verbatim, "plain", 0, pixel_count);
BENCHMARK_CAPTURE(Load, VideoFrame, "frame", 1, 720 * 486);
BENCHMARK_CAPTURE(Load, Pix, "pix", 2, pixel_count);
BENCHMARK(Write)->Arg(1)->Arg(3)->Arg(4);

} // namespace
