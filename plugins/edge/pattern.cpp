#include "edge/pattern.h"

#include <algorithm>
#include <cmath>

namespace edge {

namespace {

std::size_t index(int number)
{
    return static_cast<std::size_t>(number);
}

/// How a line of one length becomes one of another: each new value is the mean
/// of the stretch of old values that it covers, cut off ones by their part.
class LineScaler
{
public:
    LineScaler(int old_length, int new_length)
        : from(old_length), to(new_length)
    {}

    /// Scales the line of `old_values`, one every `old_step`, into
    /// `new_values`, one every `new_step`.
    void Scale(const double* old_values, int old_step, double* new_values,
               int new_step) const
    {
        for (int i = 0; i < to; ++i)
            new_values[index(i) * index(new_step)] =
                mean(old_values, old_step, i);
    }

private:
    /// The stretch in units of 1/to of an old value, so that it is whole.
    double mean(const double* old_values, int old_step, int i) const
    {
        const long begin = static_cast<long>(i) * from;
        const long end = begin + from;
        double sum = 0.0;
        for (long at = begin / to; at * to < end; ++at) {
            const long covered =
                std::min(end, (at + 1) * to) - std::max(begin, at * to);
            sum += static_cast<double>(covered) *
                   old_values[static_cast<std::size_t>(at) * index(old_step)];
        }
        return sum / static_cast<double>(from);
    }

    int from;
    int to;
};

} // namespace

Pattern PatternOf(const Grey& grey, int width, int height)
{
    const std::vector<double> whole(grey.values.begin(), grey.values.end());
    std::vector<double> across(index(width) * index(grey.height));
    const LineScaler columns(grey.width, width);
    for (int y = 0; y < grey.height; ++y)
        columns.Scale(&whole[index(y) * index(grey.width)], 1,
                      &across[index(y) * index(width)], 1);

    Pattern pattern;
    pattern.width = width;
    pattern.height = height;
    pattern.values.resize(index(width) * index(height));
    const LineScaler rows(grey.height, height);
    for (int x = 0; x < width; ++x)
        rows.Scale(&across[index(x)], width, &pattern.values[index(x)], width);

    double sum = 0.0;
    for (double value : pattern.values)
        sum += value;
    const auto count = static_cast<double>(pattern.values.size());
    double squares = 0.0;
    for (double& value : pattern.values) {
        value -= sum / count;
        squares += value * value;
    }
    // Less than this is what is left of one grey by rounding.
    constexpr double least = 1e-12;
    pattern.spread = squares < least * count ? 0.0 : squares * count;
    return pattern;
}

double Score(const Level& level, const Pattern& pattern, int x, int y)
{
    const std::int64_t spread =
        level.sums.Spread(x, y, pattern.width, pattern.height);
    if (spread == 0 || pattern.spread == 0.0)
        return 0.0;
    // Four sums beside each other, always added up in the same order: the
    // processor may keep them in one register, and the bits are the same
    // everywhere.
    double sums[4] = {0.0, 0.0, 0.0, 0.0};
    const double* wanted = pattern.values.data();
    for (int row = 0; row < pattern.height; ++row) {
        const std::int32_t* found = level.grey.Row(y + row) + x;
        int column = 0;
        for (; column + 4 <= pattern.width; column += 4, wanted += 4)
            for (int lane = 0; lane < 4; ++lane)
                sums[lane] += found[column + lane] * wanted[lane];
        for (; column < pattern.width; ++column, ++wanted)
            sums[0] += found[column] * *wanted;
    }
    const auto count = static_cast<double>(pattern.values.size());
    const double product = (sums[0] + sums[1]) + (sums[2] + sums[3]);
    return count * product /
           (std::sqrt(static_cast<double>(spread)) * std::sqrt(pattern.spread));
}

} // namespace edge
