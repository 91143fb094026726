#include "platform/audio_file.h"

#include "platform/files.h"
#include "platform/lazy_library.h"

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstring>
#include <new>
#include <sndfile.h>
#include <strings.h>

namespace zt_platform {

namespace {

constinit LazyLibrary library("libsndfile.so.1");

/// The functions of the library, all of them or none.
struct Functions
{
    decltype(&sf_open) open;
    decltype(&sf_open_virtual) open_virtual;
    decltype(&sf_readf_short) read_short;
    decltype(&sf_readf_float) read_float;
    decltype(&sf_close) close;
    bool found;
};

constinit Functions functions = {};

bool find_functions()
{
    if (!functions.found) {
        Functions& f = functions;
        f.open = library.find<decltype(f.open)>("sf_open");
        f.open_virtual =
            library.find<decltype(f.open_virtual)>("sf_open_virtual");
        f.read_short = library.find<decltype(f.read_short)>("sf_readf_short");
        f.read_float = library.find<decltype(f.read_float)>("sf_readf_float");
        f.close = library.find<decltype(f.close)>("sf_close");
        f.found =
            f.open && f.open_virtual && f.read_short && f.read_float && f.close;
    }
    return functions.found;
}

/// One file that is being read. The library reads through it, so that
/// interruptions and odd kinds of files are dealt with in one place.
struct OpenFile
{
    explicit OpenFile(const char* path)
        : input(path), position(0), file(nullptr), channels(0),
          is_floating(false)
    {}

    InputFile input;
    std::uint64_t position;
    SNDFILE* file;
    int channels;
    bool is_floating; ///< Whether its samples are floating-point numbers.
};

OpenFile& file_of(void* user)
{
    return *static_cast<OpenFile*>(user);
}

sf_count_t length(void* user)
{
    return static_cast<sf_count_t>(file_of(user).input.size());
}

sf_count_t tell(void* user)
{
    return static_cast<sf_count_t>(file_of(user).position);
}

sf_count_t seek(sf_count_t offset, int whence, void* user)
{
    const sf_count_t from = whence == SEEK_SET   ? 0
                            : whence == SEEK_CUR ? tell(user)
                                                 : length(user);
    // Places before the beginning stay as they were, as in any file.
    if (offset >= -from && offset <= LLONG_MAX - from)
        file_of(user).position = static_cast<std::uint64_t>(from + offset);
    else
        return -1;
    return tell(user);
}

sf_count_t read_bytes(void* to, sf_count_t count, void* user)
{
    OpenFile& open = file_of(user);
    const std::size_t got = open.input.read_at(
        open.position, to,
        static_cast<std::size_t>(std::max<sf_count_t>(count, 0)));
    open.position += got;
    return static_cast<sf_count_t>(got);
}

sf_count_t write_bytes(const void*, sf_count_t, void*)
{
    return 0;
}

/// Tells whether only its name says what kind of file this is: no header.
bool is_known_by_name(const char* path)
{
    const char* dot = std::strrchr(path, '.');
    return dot &&
           (strcasecmp(dot, ".vox") == 0 || strcasecmp(dot, ".gsm") == 0);
}

SNDFILE* open_file(OpenFile& open, const char* path, SF_INFO& about)
{
    SF_VIRTUAL_IO calls = {length, seek, read_bytes, write_bytes, tell};
    SNDFILE* file = functions.open_virtual(&calls, SFM_READ, &about, &open);
    if (!file && is_known_by_name(path)) {
        about = {};
        file = functions.open(path, SFM_READ, &about);
    }
    return file;
}

bool is_floating(int format)
{
    switch (format & SF_FORMAT_SUBMASK) {
    case SF_FORMAT_FLOAT:
    case SF_FORMAT_DOUBLE:
    case SF_FORMAT_VORBIS:
    case SF_FORMAT_OPUS:
    case SF_FORMAT_MPEG_LAYER_I:
    case SF_FORMAT_MPEG_LAYER_II:
    case SF_FORMAT_MPEG_LAYER_III:
        return true;
    default:
        return false;
    }
}

/// Gives the code for the width of samples; the compressed kinds count as what
/// they stand for.
int width_of(int format)
{
    switch (format & SF_FORMAT_SUBMASK) {
    case SF_FORMAT_PCM_S8:
    case SF_FORMAT_PCM_U8:
    case SF_FORMAT_DPCM_8:
        return 1;
    case SF_FORMAT_PCM_24:
    case SF_FORMAT_PCM_32:
    case SF_FORMAT_FLOAT:
    case SF_FORMAT_DOUBLE:
    case SF_FORMAT_DWVW_24:
    case SF_FORMAT_ALAC_20:
    case SF_FORMAT_ALAC_24:
    case SF_FORMAT_ALAC_32:
        return 4;
    default:
        return 2;
    }
}

short sample_of(float value)
{
    const float scaled = value * 32768.0f;
    if (scaled >= 32767.0f)
        return SHRT_MAX;
    if (scaled <= -32768.0f)
        return SHRT_MIN;
    return scaled == scaled ? static_cast<short>(scaled) : short{0};
}

std::uint64_t read_floating(OpenFile& open, short* to, std::uint64_t frames)
{
    constexpr std::size_t values_at_once = 8192;
    float values[values_at_once];
    const std::uint64_t channels = static_cast<std::uint64_t>(open.channels);
    std::uint64_t done = 0;
    while (done < frames) {
        const std::uint64_t wanted =
            std::min(frames - done, values_at_once / channels);
        const sf_count_t got = functions.read_float(
            open.file, values, static_cast<sf_count_t>(wanted));
        if (got <= 0)
            break;
        const std::uint64_t count = static_cast<std::uint64_t>(got) * channels;
        for (std::uint64_t i = 0; i < count; ++i)
            to[done * channels + i] = sample_of(values[i]);
        done += static_cast<std::uint64_t>(got);
    }
    return done;
}

class SndfileAudioFiles final : public AudioFiles
{
public:
    void* open(const char* path, AudioFormat& about) override
    {
        if (!path || !find_functions())
            return nullptr;
        OpenFile* open = new (std::nothrow) OpenFile(path);
        SF_INFO info = {};
        if (open && open->input.size() > 0)
            open->file = open_file(*open, path, info);
        if (!open || !open->file) {
            delete open;
            return nullptr;
        }
        open->channels = info.channels;
        open->is_floating = is_floating(info.format);
        about.frames =
            static_cast<std::uint64_t>(std::max<sf_count_t>(info.frames, 0));
        about.channels = info.channels;
        about.rate = info.samplerate;
        about.width = width_of(info.format);
        about.bytes = open->input.size();
        return open;
    }

    std::uint64_t read(void* file, short* to, std::uint64_t frames) override
    {
        OpenFile& open = file_of(file);
        if (open.is_floating)
            return read_floating(open, to, frames);
        const sf_count_t got = functions.read_short(
            open.file, to, static_cast<sf_count_t>(frames));
        return static_cast<std::uint64_t>(std::max<sf_count_t>(got, 0));
    }

    void close(void* file) override
    {
        OpenFile& open = file_of(file);
        functions.close(open.file);
        delete &open;
    }
};

constinit SndfileAudioFiles sndfile_files;
constinit AudioFiles* installed = nullptr;

} // namespace

AudioFiles& AudioFiles::current()
{
    return installed ? *installed : sndfile_files;
}

AudioFiles* AudioFiles::install(AudioFiles* other)
{
    AudioFiles* before = installed;
    installed = other;
    return before;
}

} // namespace zt_platform
