// How fast are picture files read and written, against the literal codec, other
// programs' codecs and copying the pixels?

#include <ZT/image_sgi.h>

#include <chrono>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <string>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

#include <benchmark/benchmark.h>

#include "image/literal_codec.h"
#include "require.h"
#include "sample_pictures.h"
#include "sgi_peers.h"

namespace {

constexpr int width = 2048;
constexpr int height = 1536;

/// The files that are read, in a folder that goes at the end.
class Files
{
public:
    Files()
        : folder(std::filesystem::temp_directory_path() /
                 ("zt_bench_sgi_codec." + std::to_string(getpid()))),
          owner(getpid())
    {
        std::filesystem::create_directory(folder);
    }

    // Not by the children, which end before their parent.
    ~Files()
    {
        if (getpid() == owner)
            std::filesystem::remove_all(folder);
    }
    Files(const Files&) = delete;
    Files& operator=(const Files&) = delete;

    std::string Path(const std::string& name) const { return folder / name; }

    /// Gives a run-length file of this kind, written once.
    std::string Packed(Kind kind, int channels, int columns = width,
                       int rows = height) const
    {
        const std::string path =
            Path(std::to_string(static_cast<int>(kind)) + "_" +
                 std::to_string(channels) + "_" + std::to_string(columns));
        if (!std::filesystem::exists(path))
            longstoimage(SamplePicture(kind, columns, rows).data(), columns,
                         rows, channels, path.c_str());
        return path;
    }

    std::string Verbatim() const
    {
        const std::string path = Path("plain");
        if (std::filesystem::exists(path))
            return path;
        std::string bytes("\x01\xDA\0\1\0\3\x08\0\x06\0\0\3", 12);
        bytes.resize(512);
        const std::vector<ZtPixel> photo =
            SamplePicture(Kind::Photo, width, height);
        for (int shift : {0, 8, 16})
            for (ZtPixel pixel : photo)
                bytes += static_cast<char>(pixel >> shift);
        std::ofstream(path, std::ios::binary) << bytes;
        return path;
    }

private:
    std::filesystem::path folder;
    pid_t owner;
};

const Files& TheFiles()
{
    static const Files files;
    return files;
}

std::string Bytes(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

void RequireSamePixels(const std::string& path)
{
    const literal::Picture there = literal::ReadSgi(Bytes(path));
    ZtPixel* here = longimagedata(path.c_str());
    Require(here && there.read &&
                std::memcmp(here, there.pixels.data(),
                            there.pixels.size() * sizeof(ZtPixel)) == 0,
            "reading SGI files");
    std::free(here);
}

void Read(benchmark::State& state, const std::string& path)
{
    RequireSamePixels(path);
    for (auto _ : state) {
        ZtPixel* pixels = longimagedata(path.c_str());
        benchmark::DoNotOptimize(pixels);
        std::free(pixels);
    }
}

void ReadLiterally(benchmark::State& state, const std::string& path)
{
    for (auto _ : state) {
        literal::Picture picture = literal::ReadSgi(Bytes(path));
        benchmark::DoNotOptimize(picture.pixels.data());
    }
}

void LoadObject(benchmark::State& state, const std::string& path)
{
    for (auto _ : state) {
        ZtImageSGI image(path.c_str(), 0);
        benchmark::DoNotOptimize(image.pixels);
    }
}

void CopyPixels(benchmark::State& state)
{
    const std::vector<ZtPixel> photo =
        SamplePicture(Kind::Photo, width, height);
    std::vector<ZtPixel> copy(photo.size());
    for (auto _ : state) {
        std::memcpy(copy.data(), photo.data(), photo.size() * sizeof(ZtPixel));
        benchmark::ClobberMemory();
    }
}

void Peer(benchmark::State& state, bool (*read)(const char*),
          const std::string& path)
{
    for (auto _ : state)
        if (!read(path.c_str())) {
            state.SkipWithError("the peer does not read this file");
            break;
        }
}

/// Times one call in a process of its own, whose pages are all fresh.
template <typename Work>
void InFreshProcesses(benchmark::State& state, Work work)
{
    for (auto _ : state) {
        int ends[2];
        Require(pipe(ends) == 0, "pipe");
        const pid_t child = fork();
        if (child == 0) {
            const auto start = std::chrono::steady_clock::now();
            work();
            const std::chrono::duration<double> spent =
                std::chrono::steady_clock::now() - start;
            const double seconds = spent.count();
            _exit(write(ends[1], &seconds, sizeof seconds) == sizeof seconds
                      ? 0
                      : 1);
        }
        double seconds = 0;
        Require(read(ends[0], &seconds, sizeof seconds) == sizeof seconds,
                "child");
        waitpid(child, nullptr, 0);
        close(ends[0]);
        close(ends[1]);
        state.SetIterationTime(seconds);
    }
}

void FirstLoad(benchmark::State& state, const std::string& path)
{
    InFreshProcesses(state, [&path] {
        benchmark::DoNotOptimize(longimagedata(path.c_str()));
    });
}

void FirstLoadLiterally(benchmark::State& state, const std::string& path)
{
    InFreshProcesses(state, [&path] {
        benchmark::DoNotOptimize(literal::ReadSgi(Bytes(path)));
    });
}

void Write(benchmark::State& state)
{
    const std::vector<ZtPixel> photo =
        SamplePicture(Kind::Photo, width, height);
    const std::string path = TheFiles().Path("written");
    for (auto _ : state)
        longstoimage(photo.data(), width, height, 3, path.c_str());
    Require(Bytes(path) == literal::WriteSgi(photo, width, height, 3),
            "writing SGI files");
}

void WriteLiterally(benchmark::State& state)
{
    const std::vector<ZtPixel> photo =
        SamplePicture(Kind::Photo, width, height);
    const std::string path = TheFiles().Path("written_literally");
    for (auto _ : state)
        std::ofstream(path, std::ios::binary)
            << literal::WriteSgi(photo, width, height, 3);
}

void WritePeer(benchmark::State& state, const SgiPeer& peer)
{
    const std::vector<ZtPixel> photo =
        SamplePicture(Kind::Photo, width, height);
    const std::string path = TheFiles().Path("written_by_peer.sgi");
    SgiWriter writer = peer.make_writer(photo, width, height);
    for (auto _ : state)
        if (!writer(path.c_str())) {
            state.SkipWithError("the peer does not write this file");
            break;
        }
}

void RegisterRead(const std::string& row, const std::string& path, bool limit)
{
    using benchmark::RegisterBenchmark;
    const auto unit = benchmark::kMicrosecond;
    RegisterBenchmark((row + "/ours").c_str(), Read, path)->Unit(unit);
    RegisterBenchmark((row + "/literal").c_str(), ReadLiterally, path)
        ->Unit(unit);
    for (const SgiPeer& peer : SgiPeers())
        RegisterBenchmark((row + "/" + peer.name).c_str(), Peer, peer.read,
                          path)
            ->Unit(unit);
    if (limit)
        RegisterBenchmark((row + "/limit").c_str(), CopyPixels)->Unit(unit);
}

void RegisterCurve()
{
    for (int side = 16; side <= 8192; side *= 2) {
        const std::string path = TheFiles().Packed(Kind::Photo, 3, side, side);
        const std::string size = std::to_string(side * side);
        benchmark::RegisterBenchmark(("curve/sgi_read/ours/" + size).c_str(),
                                     Read, path);
        if (side <= 2048)
            benchmark::RegisterBenchmark(
                ("curve/sgi_read/literal/" + size).c_str(), ReadLiterally,
                path);
    }
}

[[maybe_unused]] const bool registered = [] {
    using benchmark::RegisterBenchmark;
    const auto unit = benchmark::kMicrosecond;
    const std::map<Kind, std::string> kinds = {{Kind::Photo, "photo"},
                                               {Kind::Rendered, "rendered"},
                                               {Kind::Flat, "flat"}};
    for (const auto& [kind, name] : kinds)
        for (int channels : {3, 4})
            RegisterRead(
                "sgi_read_" + name + (channels == 3 ? "_rgb" : "_rgba"),
                TheFiles().Packed(kind, channels), kind == Kind::Photo);
    RegisterRead("sgi_read_verbatim", TheFiles().Verbatim(), false);

    const std::string photo = TheFiles().Packed(Kind::Photo, 3);
    RegisterBenchmark("sgi_first_load/ours", FirstLoad, photo)
        ->UseManualTime()
        ->Unit(unit);
    RegisterBenchmark("sgi_first_load/literal", FirstLoadLiterally, photo)
        ->UseManualTime()
        ->Unit(unit);
    RegisterBenchmark("object_load/ours", LoadObject, photo)->Unit(unit);
    RegisterBenchmark("object_load/codec", Read, photo)->Unit(unit);
    RegisterBenchmark("sgi_write/ours", Write)->Unit(unit);
    RegisterBenchmark("sgi_write/literal", WriteLiterally)->Unit(unit);
    for (const SgiPeer& peer : SgiPeers())
        if (peer.make_writer)
            RegisterBenchmark(("sgi_write/" + peer.name).c_str(), WritePeer,
                              peer)
                ->Unit(unit);
    RegisterCurve();
    return true;
}();

} // namespace
