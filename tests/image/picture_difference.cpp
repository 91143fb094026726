#include "image/picture_difference.h"

#include "image/literal_codec.h"
#include "image/picture.h"
#include "platform/pixel_lanes.h"
#include "support/MemoryFile.h"

#include <cstdlib>
#include <memory>

namespace {

using zt_image::ChannelOrder;
using zt_image::Picture;
using zt_platform::PixelLanes;

/// Gives what is different about a picture, or the empty text.
std::string Compare(const Picture& picture, const literal::Picture& expected,
                    const literal::Pixels& pixels)
{
    std::unique_ptr<ZtPixel, void (*)(void*)> owned(picture.pixels, std::free);
    if (!picture.pixels || !expected.read)
        return !picture.pixels == !expected.read ? "" : "only one refuses it";
    if (picture.width != expected.width || picture.height != expected.height)
        return "the sizes differ";
    for (std::size_t i = 0; i < pixels.size(); ++i)
        if (picture.pixels[i] != pixels[i])
            return "pixel " + std::to_string(i) + " differs";
    return "";
}

template <class Read>
std::string DifferenceOn(const std::string& file,
                         const literal::Picture& expected, const Read& read)
{
    MemoryFile memory(file);
    std::string difference;
    for (const PixelLanes* lanes :
         {&PixelLanes::plain(), &PixelLanes::fastest()}) {
        PixelLanes::install(lanes);
        for (ChannelOrder order : {ChannelOrder::Codec, ChannelOrder::Object}) {
            std::string here =
                Compare(read(order), expected,
                        order == ChannelOrder::Codec
                            ? expected.pixels
                            : literal::Reversed(expected.pixels));
            if (!here.empty())
                difference += here + " with " + lanes->name() + " lanes\n";
        }
    }
    PixelLanes::install(nullptr);
    return difference;
}

/// Two bytes of a file as a number.
std::size_t Number(const std::string& file, std::size_t at)
{
    auto byte = [&](std::size_t i) -> std::size_t {
        return i < file.size() ? static_cast<unsigned char>(file[i]) : 0;
    };
    return byte(at) * 256 + byte(at + 1);
}

/// Pictures above this are not compared: the plain readers take their time.
constexpr std::size_t most_pixels = 1 << 14;

} // namespace

std::string SgiDifferenceOn(const std::string& file)
{
    if (Number(file, 6) * Number(file, 8) > most_pixels)
        return "";
    ZtSetOverlongRowHandler([] {});
    std::string difference =
        DifferenceOn(file, literal::ReadSgi(file), [](ChannelOrder order) {
            return zt_image::read_sgi("any", order);
        });
    ZtSetOverlongRowHandler(nullptr);
    return difference;
}

std::string PixDifferenceOn(const std::string& file)
{
    if (Number(file, 0) * Number(file, 2) > most_pixels)
        return "";
    return DifferenceOn(file, literal::ReadPix(file), [](ChannelOrder order) {
        QuarnHeader header;
        return zt_image::read_pix("any", header, order);
    });
}

std::string YuvDifferenceOn(const std::string& file)
{
    literal::Picture expected = literal::ReadYuv(file);
    MemoryFile memory(file);
    std::string codec = Compare(zt_image::read_yuv("any", ChannelOrder::Codec),
                                expected, expected.pixels);
    std::string object =
        Compare(zt_image::read_yuv("any", ChannelOrder::Object), expected,
                literal::Reversed(expected.pixels));
    return codec + object;
}
