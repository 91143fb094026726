#ifndef ZT_IMAGE_FANT_H
#define ZT_IMAGE_FANT_H

/// \file
/// Scaling by averaging areas, after Fant: each pixel of a line becomes the
/// mean of the stretch of source line that it covers, the source being taken
/// as joined up by straight lines.
///
/// The walk along a line depends on nothing but the two lengths, so it is made
/// once for all lines; what is left is sums of weighted pixels, the same for
/// every line, done for many lines side by side. Each sum is made in double
/// precision and in the order of the walk: the results are those of a walk
/// along one line at a time, bit by bit.

#include <ZT/image_sgi.h>

#include <cstddef>

namespace zt_image {

/// What one pixel of a scaled line is made of: the source pixels from `first`
/// on. Of the first `head` is left; `count` of them are used up, the first
/// and then whole ones; of the one after these `tail` is taken.
struct FantSpan
{
    std::size_t first;
    std::size_t count;
    double head;
    double tail;
};

/// The walk along a line of `in` pixels that makes one of `out`.
class FantWalk
{
public:
    /// Requires: both lengths at least 1.
    FantWalk(int in, int out);
    ~FantWalk();
    FantWalk(const FantWalk&) = delete;
    FantWalk& operator=(const FantWalk&) = delete;

    /// Tells whether there was memory for the walk.
    bool made() const { return spans != nullptr; }

    std::size_t in_length() const { return in; }
    std::size_t out_length() const { return out; }
    double scale() const { return out_per_in; }
    const FantSpan& span(std::size_t position) const { return spans[position]; }

    /// Gives how many source pixels are looked at, some of them behind the
    /// last: it stands for all after it.
    std::size_t reach() const { return last_position + 1; }

private:
    std::size_t in;
    std::size_t out;
    double out_per_in;
    std::size_t last_position;
    FantSpan* spans;
};

/// Scales a picture, first across, then down. Only the three low bytes of the
/// pixels are averaged, the high byte becomes 0.
///
/// Requires: sizes of at least 1; room for the new size at `destination`.
/// Returns:  false for lack of memory.
bool zoom_fant(const ZtPixel* source, int width, int height,
               ZtPixel* destination, int new_width, int new_height);

} // namespace zt_image

#endif
