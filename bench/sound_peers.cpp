#include "sound_peers.h"

#ifdef ZT_BENCH_SAMPLERATE
#include <samplerate.h>
#endif
#ifdef ZT_BENCH_SOXR
#include <soxr.h>
#endif
#ifdef ZT_BENCH_LIBAV
extern "C" {
#include <libavutil/channel_layout.h>
#include <libavutil/opt.h>
#include <libswresample/swresample.h>
}
#endif

namespace {

constexpr int in_rate = 44100;
constexpr int out_rate = 48000;

#ifdef ZT_BENCH_SAMPLERATE
/// Works in floating point, so its own conversions belong to it.
bool RunSamplerate(const short* in, long frames, int channels, short* out)
{
    const auto count = static_cast<std::size_t>(frames * channels);
    std::vector<float> values(count);
    std::vector<float> converted(2 * count);
    src_short_to_float_array(in, values.data(), static_cast<int>(count));
    SRC_DATA data = {};
    data.data_in = values.data();
    data.data_out = converted.data();
    data.input_frames = frames;
    data.output_frames = 2 * frames;
    data.src_ratio = static_cast<double>(out_rate) / in_rate;
    if (src_simple(&data, SRC_LINEAR, channels) != 0)
        return false;
    src_float_to_short_array(
        converted.data(), out,
        static_cast<int>(data.output_frames_gen * channels));
    return data.output_frames_gen > frames;
}
#endif

#ifdef ZT_BENCH_SOXR
bool RunSoxr(const short* in, long frames, int channels, short* out)
{
    const soxr_io_spec_t samples = soxr_io_spec(SOXR_INT16_I, SOXR_INT16_I);
    const soxr_quality_spec_t quick = soxr_quality_spec(SOXR_QQ, 0);
    std::size_t made = 0;
    const soxr_error_t fault = soxr_oneshot(
        in_rate, out_rate, static_cast<unsigned>(channels), in,
        static_cast<std::size_t>(frames), nullptr, out,
        static_cast<std::size_t>(2 * frames), &made, &samples, &quick, nullptr);
    return !fault && made > static_cast<std::size_t>(frames);
}
#endif

#ifdef ZT_BENCH_LIBAV
bool RunSwresample(const short* in, long frames, int channels, short* out)
{
    AVChannelLayout layout;
    av_channel_layout_default(&layout, channels);
    SwrContext* context = nullptr;
    swr_alloc_set_opts2(&context, &layout, AV_SAMPLE_FMT_S16, out_rate, &layout,
                        AV_SAMPLE_FMT_S16, in_rate, 0, nullptr);
    // Two samples make one, which is a straight line between them.
    av_opt_set_int(context, "filter_size", 2, 0);
    av_opt_set_int(context, "linear_interp", 1, 0);
    int made = -1;
    if (swr_init(context) >= 0) {
        const auto* from = reinterpret_cast<const unsigned char*>(in);
        auto* to = reinterpret_cast<unsigned char*>(out);
        made = swr_convert(context, &to, static_cast<int>(2 * frames), &from,
                           static_cast<int>(frames));
    }
    swr_free(&context);
    return made > frames;
}
#endif

} // namespace

std::vector<ResamplePeer> ResamplePeers()
{
    return {
#ifdef ZT_BENCH_SAMPLERATE
        {"libsamplerate", RunSamplerate},
#endif
#ifdef ZT_BENCH_SOXR
        {"soxr", RunSoxr},
#endif
#ifdef ZT_BENCH_LIBAV
        {"libswresample", RunSwresample},
#endif
    };
}
