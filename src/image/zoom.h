#ifndef ZT_IMAGE_ZOOM_H
#define ZT_IMAGE_ZOOM_H

/// \file
/// Scaling to the nearest pixel, and which pixel is nearest.

#include <ZT/image_sgi.h>

namespace zt_image {

/// Gives the source position whose pixel stands at `position` after scaling
/// `source_size` positions to `size`, in single precision and at most the last.
///
/// Requires: both sizes at least 1.
int nearest_position(int source_size, int size, int position);

/// Which source column each column comes from, kept between calls.
class ColumnMap
{
public:
    constexpr ColumnMap() = default;

    /// Gives the source column of each of `width` columns.
    ///
    /// Owner:   this map, until the next call; its memory is never released.
    /// Returns: null for lack of memory.
    const int* columns(int source_width, int width);

    /// Gives how often the map had to be computed: not for widths that are
    /// those of the call before.
    int times_built() const { return built; }

private:
    int* entries = nullptr;
    int capacity = 0;
    int from = 0;
    int to = 0;
    int built = 0;
};

/// Scales as `fastzoom` does.
///
/// Returns: false for lack of memory; nothing has changed then.
bool zoom_nearest(const ZtPixel* source, ZtPixel* destination, int ax, int ay,
                  int bx, int by);

} // namespace zt_image

#endif
