#include "common/png_file.h"

#include "common/files.h"
#include "common/opaque.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <vector>

#include <png.h>

namespace zt_tools {

namespace {

/// The picture's bytes in PNG's order: top row first, red, green, blue and
/// with `channels` 4 alpha.
std::vector<png_byte> bytes_of(const ZtImageSGI& image, int channels)
{
    std::size_t width = static_cast<std::size_t>(image.width);
    std::vector<png_byte> bytes;
    bytes.reserve(width * static_cast<std::size_t>(image.height) *
                  static_cast<std::size_t>(channels));
    for (int row = image.height - 1; row >= 0; --row) {
        const ZtPixel* pixels =
            image.pixels + width * static_cast<std::size_t>(row);
        for (std::size_t column = 0; column < width; ++column)
            for (int channel = 0; channel < channels; ++channel)
                bytes.push_back(static_cast<png_byte>(pixels[column] >>
                                                      (24 - 8 * channel)));
    }
    return bytes;
}

/// Writes the bytes to an open file.
std::string write_to(std::FILE* file, const ZtImageSGI& image)
{
    int channels = IsOpaque(image) ? 3 : 4;
    std::vector<png_byte> bytes = bytes_of(image, channels);
    png_image header = {};
    header.version = PNG_IMAGE_VERSION;
    header.width = static_cast<png_uint_32>(image.width);
    header.height = static_cast<png_uint_32>(image.height);
    header.format = channels == 3 ? PNG_FORMAT_RGB : PNG_FORMAT_RGBA;
    int written =
        png_image_write_to_stdio(&header, file, 0, bytes.data(), 0, nullptr);
    return written ? std::string() : std::string(header.message);
}

} // namespace

std::string WritePng(const ZtImageSGI& image, const std::string& name)
{
    if (!image.pixels || image.width < 1 || image.height < 1)
        return "the picture has no pixels";
    std::string why = WhyNotWritable(name);
    if (!why.empty())
        return why;

    FileInMaking making(name);
    std::FILE* file = std::fopen(making.Name().c_str(), "wbe");
    if (!file)
        return std::strerror(errno);
    why = write_to(file, image);
    if (std::fclose(file) != 0 && why.empty())
        why = std::strerror(errno);
    return why.empty() ? making.PutInPlace() : why;
}

} // namespace zt_tools
