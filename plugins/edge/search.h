#ifndef PLUGINS_EDGE_SEARCH_H
#define PLUGINS_EDGE_SEARCH_H

/// \file
/// The search for a thumbnail in a frame, at any place and any size from half
/// to twice the thumbnail's.
///
/// Coarse to fine: frame and thumbnail are reduced until the thumbnail is
/// about 20 by 15 values, and every place is tried at nine sizes. The best
/// places of each size are then followed to the next finer level, where places
/// and sizes around them are tried until none is better, up to the full
/// resolution. The size is a power of two in steps of 1/32 octave, about 2%.

#include "edge/grey.h"
#include "edge/pattern.h"

#include <vector>

namespace edge {

/// A place where a thumbnail was found.
struct Hit
{
    int x = 0;      ///< The left column.
    int y = 0;      ///< The lowest row.
    int width = 0;  ///< Pixels of the frame.
    int height = 0; ///< Pixels of the frame.
    double score = 0.0;
};

/// A picture and what it becomes when it is halved again and again.
class Frame
{
public:
    explicit Frame(Grey picture);

    /// Gives the picture reduced to 1 / 2^`level` of its size.
    const Level& At(int level) const
    {
        return levels[static_cast<std::size_t>(level)];
    }

    int LevelCount() const { return static_cast<int>(levels.size()); }

private:
    std::vector<Level> levels;
};

/// Finds the places where `frame` shows `thumbnail`, the best first. Of places
/// that overlap by more than 3 tenths of what they cover together only the
/// best is given.
///
/// Units:   `threshold` is the least score, 0 to 1.
/// Returns: none for a thumbnail of one grey, or one that does not fit into
///          the frame at any size.
std::vector<Hit> Search(const Frame& frame, const Grey& thumbnail,
                        double threshold);

} // namespace edge

#endif
