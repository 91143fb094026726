#include "plugins/grey_pictures.h"

#include <algorithm>
#include <cmath>
#include <random>
#include <utility>

using edge::Grey;

namespace {

std::int32_t clamped(double value)
{
    return static_cast<std::int32_t>(std::clamp(value, 0.0, 255.0));
}

std::int32_t& at(Grey& picture, int x, int y)
{
    return picture.values[static_cast<std::size_t>(y) *
                              static_cast<std::size_t>(picture.width) +
                          static_cast<std::size_t>(x)];
}

// std distributions differ from library to library; the generator does not.
int number_below(std::mt19937& random, int end)
{
    return static_cast<int>(random() % static_cast<unsigned>(end));
}

} // namespace

Grey GreyPicture(int width, int height, std::vector<std::int32_t> values)
{
    Grey grey;
    grey.width = width;
    grey.height = height;
    grey.values = std::move(values);
    return grey;
}

Grey Plain(int width, int height, int value)
{
    return GreyPicture(
        width, height,
        std::vector<std::int32_t>(static_cast<std::size_t>(width) *
                                      static_cast<std::size_t>(height),
                                  value));
}

Grey Noise(int width, int height, unsigned seed)
{
    std::mt19937 random(seed);
    Grey grey = Plain(width, height, 0);
    for (std::int32_t& value : grey.values)
        value = number_below(random, 256);
    return grey;
}

Grey Blobs(int width, int height, unsigned seed)
{
    std::mt19937 random(seed);
    std::vector<double> sums(static_cast<std::size_t>(width) *
                             static_cast<std::size_t>(height));
    const int blobs = 6 + width * height / 1500;
    for (int blob = 0; blob < blobs; ++blob) {
        const int x = number_below(random, width);
        const int y = number_below(random, height);
        const double radius = 4 + number_below(random, 16);
        const double grey = number_below(random, 255) - 127;
        const int reach = 3 * static_cast<int>(radius);
        for (int v = std::max(0, y - reach); v < std::min(height, y + reach);
             ++v)
            for (int u = std::max(0, x - reach); u < std::min(width, x + reach);
                 ++u)
                sums[static_cast<std::size_t>(v * width + u)] +=
                    grey * std::exp(-((u - x) * (u - x) + (v - y) * (v - y)) /
                                    (2 * radius * radius));
    }
    Grey picture = Plain(width, height, 0);
    std::transform(sums.begin(), sums.end(), picture.values.begin(),
                   [](double sum) { return clamped(127.5 + sum); });
    return picture;
}

Grey Scaled(const Grey& picture, int width, int height)
{
    ZtImageSGI image = ImageOf(picture);
    image.Resize(width, height);
    return edge::GreyOf(image);
}

void Paste(Grey& frame, const Grey& picture, int x, int y, double gain,
           double offset)
{
    for (int v = 0; v < picture.height; ++v)
        for (int u = 0; u < picture.width; ++u)
            if (x + u >= 0 && x + u < frame.width && y + v >= 0 &&
                y + v < frame.height)
                at(frame, x + u, y + v) =
                    clamped(picture.Row(v)[u] * gain + offset);
}

void AddNoise(Grey& frame, int most, unsigned seed)
{
    std::mt19937 random(seed);
    for (std::int32_t& value : frame.values)
        value = clamped(value + number_below(random, 2 * most + 1) - most);
}

ZtImageSGI ImageOf(const Grey& grey)
{
    ZtImageSGI image(grey.width, grey.height, nullptr);
    for (std::size_t i = 0; i < grey.values.size(); ++i) {
        const auto value = static_cast<ZtPixel>(grey.values[i]);
        image.pixels[i] = value << 24 | value << 16 | value << 8 | 0xFF;
    }
    return image;
}
