#include "sgi_peers.h"

#include <cstdint>
#include <fstream>
#include <memory>

#ifdef ZT_BENCH_LIBAV
extern "C" {
#include <libavcodec/avcodec.h>
}
#endif
#ifdef ZT_BENCH_OPENIMAGEIO
#include <OpenImageIO/imageio.h>
#endif
#ifdef ZT_BENCH_MAGICK
#include <wand/MagickWand.h>
#endif

namespace {

/// Rows from the top, as peers keep them, of red, green and blue bytes.
[[maybe_unused]] std::vector<std::uint8_t>
TopDown(const std::vector<ZtPixel>& pixels, int width, int height)
{
    std::vector<std::uint8_t> bytes;
    bytes.reserve(pixels.size() * 3);
    for (int y = height - 1; y >= 0; --y)
        for (int x = 0; x < width; ++x) {
            const ZtPixel pixel = pixels[static_cast<std::size_t>(y) *
                                             static_cast<std::size_t>(width) +
                                         static_cast<std::size_t>(x)];
            for (int shift : {0, 8, 16})
                bytes.push_back(static_cast<std::uint8_t>(pixel >> shift));
        }
    return bytes;
}

#ifdef ZT_BENCH_LIBAV
bool ReadWithLibavcodec(const char* path)
{
    std::ifstream in(path, std::ios::binary | std::ios::ate);
    const auto size = static_cast<int>(in.tellg());
    in.seekg(0);
    AVPacket* packet = av_packet_alloc();
    av_new_packet(packet, size);
    in.read(reinterpret_cast<char*>(packet->data), size);
    AVCodecContext* context =
        avcodec_alloc_context3(avcodec_find_decoder(AV_CODEC_ID_SGI));
    context->thread_count = 1;
    AVFrame* frame = av_frame_alloc();
    const bool read = avcodec_open2(context, nullptr, nullptr) == 0 &&
                      avcodec_send_packet(context, packet) == 0 &&
                      avcodec_receive_frame(context, frame) == 0;
    av_frame_free(&frame);
    avcodec_free_context(&context);
    av_packet_free(&packet);
    return read;
}

/// Frames that the encoder takes, and the encoder's own run-length packets.
SgiWriter LibavcodecWriter(const std::vector<ZtPixel>& pixels, int width,
                           int height)
{
    const std::shared_ptr<AVFrame> frame(
        av_frame_alloc(), [](AVFrame* old) { av_frame_free(&old); });
    frame->width = width;
    frame->height = height;
    frame->format = AV_PIX_FMT_RGB24;
    av_frame_get_buffer(frame.get(), 0);
    const std::vector<std::uint8_t> bytes = TopDown(pixels, width, height);
    for (int y = 0; y < height; ++y)
        std::copy_n(bytes.data() + std::size_t(y) * std::size_t(width) * 3,
                    width * 3, frame->data[0] + y * frame->linesize[0]);
    return [frame, width, height](const char* path) {
        AVCodecContext* context =
            avcodec_alloc_context3(avcodec_find_encoder(AV_CODEC_ID_SGI));
        context->width = width;
        context->height = height;
        context->pix_fmt = AV_PIX_FMT_RGB24;
        context->time_base = {1, 25};
        context->thread_count = 1;
        AVPacket* packet = av_packet_alloc();
        const bool written =
            avcodec_open2(context, nullptr, nullptr) == 0 &&
            avcodec_send_frame(context, frame.get()) == 0 &&
            avcodec_receive_packet(context, packet) == 0 &&
            std::ofstream(path, std::ios::binary)
                .write(reinterpret_cast<const char*>(packet->data),
                       packet->size)
                .good();
        av_packet_free(&packet);
        avcodec_free_context(&context);
        return written;
    };
}
#endif

#ifdef ZT_BENCH_OPENIMAGEIO
// The files have no ending that tells their kind.
bool ReadWithOpenImageIO(const char* path)
{
    auto in = OIIO::ImageInput::create("sgi");
    OIIO::ImageSpec spec;
    if (!in || !in->open(path, spec))
        return false;
    std::vector<std::uint8_t> pixels(spec.image_bytes());
    return in->read_image(0, 0, 0, spec.nchannels, OIIO::TypeDesc::UINT8,
                          pixels.data());
}
#endif

#ifdef ZT_BENCH_MAGICK
void StartMagick()
{
    static const bool started = (MagickWandGenesis(), true);
    (void)started;
}

bool ReadWithMagick(const char* path)
{
    StartMagick();
    MagickWand* wand = NewMagickWand();
    const bool read =
        MagickReadImage(wand, (std::string("sgi:") + path).c_str()) ==
        MagickTrue;
    DestroyMagickWand(wand);
    return read;
}

SgiWriter MagickWriter(const std::vector<ZtPixel>& pixels, int width,
                       int height)
{
    StartMagick();
    const std::shared_ptr<MagickWand> wand(NewMagickWand(), DestroyMagickWand);
    const std::vector<std::uint8_t> bytes = TopDown(pixels, width, height);
    MagickConstituteImage(wand.get(), static_cast<std::size_t>(width),
                          static_cast<std::size_t>(height), "RGB", CharPixel,
                          bytes.data());
    MagickSetImageDepth(wand.get(), 8);
    MagickSetImageCompression(wand.get(), RLECompression);
    return [wand](const char* path) {
        return MagickWriteImage(wand.get(),
                                (std::string("sgi:") + path).c_str()) ==
               MagickTrue;
    };
}
#endif

} // namespace

const std::vector<SgiPeer>& SgiPeers()
{
    static const std::vector<SgiPeer> peers = {
#ifdef ZT_BENCH_LIBAV
        {"libavcodec", ReadWithLibavcodec, LibavcodecWriter},
#endif
#ifdef ZT_BENCH_OPENIMAGEIO
        // It writes verbatim files only, whatever compression is asked for.
        {"OpenImageIO", ReadWithOpenImageIO, nullptr},
#endif
#ifdef ZT_BENCH_MAGICK
        {"ImageMagick", ReadWithMagick, MagickWriter},
#endif
    };
    return peers;
}
