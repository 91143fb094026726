#ifndef ZT_TESTS_IMAGE_LITERAL_CODEC_H
#define ZT_TESTS_IMAGE_LITERAL_CODEC_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

/// The picture formats and the two scalers once more, each step as plain as it
/// can be said and with no care for speed: what the library must agree with,
/// bit by bit.
namespace literal {

using Pixels = std::vector<std::uint32_t>;

struct Picture
{
    bool read = false;
    bool ends_the_process = false; ///< An overlong row out of order.
    int width = 0;
    int height = 0;
    Pixels pixels; ///< Codec order.
};

/// Reads an SGI image file of at most four channels.
Picture ReadSgi(const std::string& file);

/// Writes one.
std::string WriteSgi(const Pixels& pixels, int width, int height, int channels);

/// Compresses a row of channel values.
std::string CompressRow(const std::string& values);

/// Reads a raw video frame.
Picture ReadYuv(const std::string& file);

/// Reads a pix file.
Picture ReadPix(const std::string& file);

/// Scales to the nearest pixel.
Pixels Zoom(const Pixels& source, int ax, int ay, int bx, int by);

/// Scales one line by averaging.
Pixels FantLine(const Pixels& source, int out_length);

/// Scales a picture by averaging, first across, then down.
Pixels Fant(const Pixels& source, int width, int height, int new_width,
            int new_height);

/// Reverses the bytes of every pixel.
Pixels Reversed(const Pixels& pixels);

} // namespace literal

#endif
