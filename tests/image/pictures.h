#ifndef ZT_TESTS_IMAGE_PICTURES_H
#define ZT_TESTS_IMAGE_PICTURES_H

#include <ZT/image_sgi.h>

#include <cstddef>
#include <optional>
#include <random>
#include <string>
#include <vector>

/// Pixels that compare and print themselves.
using PixelList = std::vector<ZtPixel>;

/// Copies pixels into a list and frees them; nothing for null.
std::optional<PixelList> Taken(ZtPixel* pixels, std::size_t count);

/// Reads an SGI image file, its size from `sizeofimage`.
std::optional<PixelList> LoadSgi(const std::string& path);

/// Copies the pixels of an image; nothing for an empty one.
std::optional<PixelList> PixelsOf(const ZtImageSGI& image);

/// Makes a buffer from `malloc` that holds these pixels.
ZtPixel* NewPixels(const PixelList& pixels);

/// What a random picture is made of.
enum class Texture { Noise, Runs, FewColors, Ramp };

/// Makes a picture; the same generator state makes the same one.
PixelList RandomPicture(std::mt19937& random, int width, int height,
                        Texture texture);

/// Gives the texture that stands for a number, in turn.
Texture TextureNumber(int number);

/// Tells whether this process has the file at `path` open.
bool IsOpen(const std::string& path);

#endif
