#ifndef ZT_TESTS_SHELL_PNG_READING_H
#define ZT_TESTS_SHELL_PNG_READING_H

#include <cstdint>
#include <string>
#include <vector>

/// A picture as a PNG file holds it: top row first.
struct ReadPicture
{
    int width = 0;
    int height = 0;
    bool has_alpha = false;
    std::vector<std::uint32_t> pixels; ///< 0xRRGGBBAA.

    /// Gives the pixel at a place, (0, 0) being at the top left.
    std::uint32_t At(int column, int row_from_top) const;
};

/// Reads a PNG file with libpng; fails the test if that cannot.
ReadPicture ReadPng(const std::string& name);

#endif
