#include <ZT/image_sgi.h>

#include <ZT/filepath.h>

#include "image/fant.h"
#include "image/picture.h"
#include "image/zoom.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <utility>

namespace {

using zt_image::ChannelOrder;
using zt_image::Picture;

enum FileType : int {
    NoFile = -1,
    SgiImage = 0,
    VideoFrame = 1,
    PixFile = 2,
    ByName = 3
};

bool is_one_of(const char* text, const char* first, const char* second)
{
    return std::strcmp(text, first) == 0 || std::strcmp(text, second) == 0;
}

/// Chooses the type of a file by its extension, in lower case only.
///
/// Returns: the type; that of no file at all for lack of memory.
int type_of_name(const char* name)
{
    try {
        ZtFilePath path(name);
        const char* extension = path.Extension();
        if (is_one_of(extension, "sgi", "rgb"))
            return SgiImage;
        if (is_one_of(extension, "yuv", "qtl"))
            return VideoFrame;
        return PixFile;
    } catch (...) {
        return NoFile;
    }
}

Picture load(const char* name, int type)
{
    if (type == ByName)
        type = type_of_name(name);
    QuarnHeader header;
    switch (type) {
    case SgiImage:
        return zt_image::read_sgi(name, ChannelOrder::Object);
    case VideoFrame:
        return zt_image::read_yuv(name, ChannelOrder::Object);
    case PixFile:
        return zt_image::read_pix(name, header, ChannelOrder::Object);
    default:
        return {};
    }
}

/// Tells whether the picture has pixels to scale.
bool has_area(const ZtImageSGI& image)
{
    return image.pixels && image.width > 0 && image.height > 0;
}

/// Makes a copy of the pixels, null for lack of memory.
ZtPixel* copy_pixels(const ZtImageSGI& image)
{
    std::size_t width = static_cast<std::size_t>(std::max(image.width, 0));
    std::size_t height = static_cast<std::size_t>(std::max(image.height, 0));
    ZtPixel* copy = zt_image::new_pixels(width, height);
    if (copy)
        std::memcpy(copy, image.pixels, width * height * sizeof(ZtPixel));
    return copy;
}

/// Makes zeroed pixels for a picture of this size, null for lack of memory.
ZtPixel* cleared_pixels(int width, int height)
{
    return zt_image::new_zeroed_pixels(static_cast<std::size_t>(width),
                                       static_cast<std::size_t>(height));
}

using Scaler = bool (*)(const ZtImageSGI& image, ZtPixel* scaled, int width,
                        int height);

bool scale_nearest(const ZtImageSGI& image, ZtPixel* scaled, int width,
                   int height)
{
    return zt_image::zoom_nearest(image.pixels, scaled, image.width,
                                  image.height, width, height);
}

bool scale_fant(const ZtImageSGI& image, ZtPixel* scaled, int width, int height)
{
    return zt_image::zoom_fant(image.pixels, image.width, image.height, scaled,
                               width, height);
}

/// Replaces the pixels by scaled ones; without memory nothing changes. There
/// is nothing to scale in a picture without area, so it becomes all zeros.
void scale(ZtImageSGI& image, int width, int height, Scaler scaler)
{
    width = std::max(width, 1);
    height = std::max(height, 1);
    ZtPixel* scaled = nullptr;
    if (!has_area(image)) {
        scaled = cleared_pixels(width, height);
    } else {
        scaled = zt_image::new_pixels(static_cast<std::size_t>(width),
                                      static_cast<std::size_t>(height));
        if (scaled && !scaler(image, scaled, width, height)) {
            std::free(scaled);
            scaled = nullptr;
        }
    }
    if (!scaled)
        return;
    std::free(image.pixels);
    image.pixels = scaled;
    image.width = width;
    image.height = height;
}

} // namespace

ZtImageSGI::ZtImageSGI(int image_width, int image_height, ZtPixel* image_pixels)
    : width(image_width), height(image_height), pixels(image_pixels)
{
    if (!pixels && width >= 0 && height >= 0)
        pixels = cleared_pixels(width, height);
    if (!pixels)
        width = height = 0;
}

ZtImageSGI::ZtImageSGI(const char* name, int type)
{
    Picture picture = load(name, type);
    width = picture.width;
    height = picture.height;
    pixels = picture.pixels;
}

ZtImageSGI::ZtImageSGI(const ZtImageSGI& other)
    : width(other.width), height(other.height),
      pixels(other.pixels ? copy_pixels(other) : nullptr)
{
    if (!pixels)
        width = height = 0;
}

ZtImageSGI& ZtImageSGI::operator=(const ZtImageSGI& other)
{
    ZtImageSGI copy(other);
    if (!copy.pixels && other.pixels)
        return *this;
    std::swap(width, copy.width);
    std::swap(height, copy.height);
    std::swap(pixels, copy.pixels);
    return *this;
}

ZtImageSGI::~ZtImageSGI()
{
    std::free(pixels);
}

void ZtImageSGI::Store(const char* name)
{
    zt_image::write_sgi(pixels, width, height, 3, name, ChannelOrder::Object);
}

void ZtImageSGI::Resize(int new_width, int new_height)
{
    if (pixels)
        scale(*this, new_width, new_height, scale_nearest);
}

void ZtImageSGI::ResizeBest(int new_width, int new_height)
{
    scale(*this, new_width, new_height, scale_fant);
}
