#include "pictures/terminal_picture.h"

#include <algorithm>

namespace ztsh {

namespace {

struct Colour
{
    unsigned red, green, blue;

    bool operator==(const Colour&) const = default;
};

Colour colour_at(const ZtImageSGI& image, int column, int row_from_top)
{
    std::size_t row = static_cast<std::size_t>(image.height - 1 - row_from_top);
    ZtPixel pixel = image.pixels[row * static_cast<std::size_t>(image.width) +
                                 static_cast<std::size_t>(column)];
    unsigned alpha = pixel & 0xFF;
    auto before_black = [alpha](ZtPixel channel) {
        return (channel & 0xFF) * alpha / 255;
    };
    return {before_black(pixel >> 24), before_black(pixel >> 16),
            before_black(pixel >> 8)};
}

void set_colour(std::ostream& out, int code, Colour colour)
{
    out << "\033[" << code << ";2;" << colour.red << ';' << colour.green << ';'
        << colour.blue << 'm';
}

} // namespace

PictureSize FitIntoCells(PictureSize picture, int columns, int rows)
{
    double across = static_cast<double>(columns) / picture.width;
    double down = static_cast<double>(2 * rows) / picture.height;
    double scale = std::min(across, down);
    return {std::clamp(static_cast<int>(picture.width * scale), 1, columns),
            std::clamp(static_cast<int>(picture.height * scale), 1, 2 * rows)};
}

void WriteHalfBlocks(const ZtImageSGI& image, std::ostream& out)
{
    constexpr int foreground = 38;
    constexpr int background = 48;
    for (int row = 0; row < image.height; row += 2) {
        bool has_lower = row + 1 < image.height;
        for (int column = 0; column < image.width; ++column) {
            Colour upper = colour_at(image, column, row);
            if (column == 0 || upper != colour_at(image, column - 1, row))
                set_colour(out, foreground, upper);
            if (has_lower) {
                Colour lower = colour_at(image, column, row + 1);
                if (column == 0 ||
                    lower != colour_at(image, column - 1, row + 1))
                    set_colour(out, background, lower);
            }
            out << "\u2580";
        }
        out << "\033[0m\n";
    }
}

} // namespace ztsh
