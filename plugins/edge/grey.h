#ifndef PLUGINS_EDGE_GREY_H
#define PLUGINS_EDGE_GREY_H

/// \file
/// Grey pictures of whole numbers, and the sums over their windows.

#include <ZT/image_sgi.h>

#include <cstddef>
#include <cstdint>
#include <vector>

namespace edge {

/// A picture of grey values, bottom row first.
struct Grey
{
    const std::int32_t* Row(int y) const
    {
        return values.data() +
               static_cast<std::size_t>(y) * static_cast<std::size_t>(width);
    }

    int width = 0;
    int height = 0;
    std::vector<std::int32_t> values;
};

/// Gives the grey of a picture: (79 red + 156 green + 21 blue) / 256, cut to a
/// whole number, the luminance that grey picture files are written with.
///
/// Units: 0 to 255.
Grey GreyOf(const ZtImageSGI& image);

/// Gives a picture of half the size, where each value is the sum of four. An
/// odd last column or row is left out.
///
/// Sums, not means, so that nothing is rounded; scores do not depend on the
/// unit of the values.
Grey Halved(const Grey& grey);

/// The sums of the values of any window, and of their squares, from two tables
/// that are made once.
///
/// All of it is whole numbers, so that a window of equal values is told from
/// every other one without doubt.
class WindowSums
{
public:
    explicit WindowSums(const Grey& grey);

    /// Gives the size of the window times the sum of the squared differences
    /// from its mean; 0 only if all its values are equal.
    ///
    /// Requires: a window inside the picture, of at most 2^17 pixels of the
    ///           original picture.
    std::int64_t Spread(int x, int y, int width, int height) const;

private:
    using Table = std::vector<std::int64_t>;

    std::int64_t sum(const Table& table, int x, int y, int width,
                     int height) const;

    std::size_t stride; ///< Both tables have a row and a column of zeros first.
    Table sums;
    Table squares;
};

} // namespace edge

#endif
