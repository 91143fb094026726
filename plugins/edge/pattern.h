#ifndef PLUGINS_EDGE_PATTERN_H
#define PLUGINS_EDGE_PATTERN_H

/// \file
/// A picture to look for, prepared for comparison, and the comparison.

#include "edge/grey.h"

#include <utility>
#include <vector>

namespace edge {

/// A picture of some size, less its mean.
struct Pattern
{
    int width = 0;
    int height = 0;
    std::vector<double> values; ///< Their sum is 0.
    double spread = 0.0;        ///< Size times sum of squares; 0 for a picture
                                ///< of one grey, which nothing resembles.
};

/// Scales `grey` to a pattern; each value is the mean of the area that it
/// covers.
///
/// Requires: sizes of at least 1, of `grey` too.
Pattern PatternOf(const Grey& grey, int width, int height);

/// A picture to look in, with the sums over its windows.
struct Level
{
    explicit Level(Grey picture) : grey(std::move(picture)), sums(grey) {}

    Grey grey;
    WindowSums sums;
};

/// Tells how much the window of the pattern's size at (x, y) resembles the
/// pattern: their normalised cross-correlation, which does not depend on
/// brightness and contrast.
///
/// Requires: a window inside the picture.
/// Returns:  1 if equal but for those two, 0 if unrelated, -1 for the
///           negative; 0 if either is of one grey only.
double Score(const Level& level, const Pattern& pattern, int x, int y);

} // namespace edge

#endif
