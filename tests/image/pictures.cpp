#include "image/pictures.h"

#include <cstdlib>
#include <cstring>
#include <filesystem>

std::optional<PixelList> Taken(ZtPixel* pixels, std::size_t count)
{
    if (!pixels)
        return std::nullopt;
    PixelList list(pixels, pixels + count);
    std::free(pixels);
    return list;
}

std::optional<PixelList> LoadSgi(const std::string& path)
{
    int width = 0;
    int height = 0;
    if (!sizeofimage(path.c_str(), width, height))
        return std::nullopt;
    return Taken(longimagedata(path.c_str()),
                 static_cast<std::size_t>(width) *
                     static_cast<std::size_t>(height));
}

std::optional<PixelList> PixelsOf(const ZtImageSGI& image)
{
    if (!image.pixels)
        return std::nullopt;
    return PixelList(image.pixels,
                     image.pixels + static_cast<std::size_t>(image.width) *
                                        static_cast<std::size_t>(image.height));
}

ZtPixel* NewPixels(const PixelList& pixels)
{
    std::size_t bytes = pixels.size() * sizeof(ZtPixel);
    void* copy = std::malloc(bytes);
    return static_cast<ZtPixel*>(std::memcpy(copy, pixels.data(), bytes));
}

PixelList RandomPicture(std::mt19937& random, int width, int height,
                        Texture texture)
{
    auto word = [&random] { return static_cast<ZtPixel>(random()); };
    PixelList pixels;
    ZtPixel pixel = word();
    for (int i = 0; i < width * height; ++i) {
        if (texture == Texture::Noise ||
            (texture == Texture::Runs && random() % 9 == 0))
            pixel = word();
        if (texture == Texture::FewColors)
            pixel = (word() & 0x01010101) * 0x7F;
        if (texture == Texture::Ramp)
            pixel += 0x01020301;
        pixels.push_back(pixel);
    }
    return pixels;
}

Texture TextureNumber(int number)
{
    static constexpr Texture textures[] = {Texture::Noise, Texture::Runs,
                                           Texture::FewColors, Texture::Ramp};
    return textures[number % 4];
}

bool IsOpen(const std::string& path)
{
    std::error_code gone; // The listing's own handle is, when it is looked at.
    for (const auto& entry :
         std::filesystem::directory_iterator("/proc/self/fd"))
        if (std::filesystem::read_symlink(entry.path(), gone) == path)
            return true;
    return false;
}
