#ifndef ZTSH_PICTURES_PICTURE_DRAWING_H
#define ZTSH_PICTURES_PICTURE_DRAWING_H

/// \file
/// Pictures put into pictures, and frames drawn around what is in them. Places
/// are counted from the lower left corner; what lies outside is left out.

#include <ZT/image_sgi.h>

namespace ztsh {

/// A part of a picture, in pixels.
struct Part
{
    int x = 0; ///< The left column.
    int y = 0; ///< The lowest row.
    int width = 0;
    int height = 0;
};

/// Replaces pixels of `image` by those of `pasted`, all channels, with the
/// lower left corner of that at (x, y).
///
/// Requires: two pictures, not one.
void Paste(ZtImageSGI& image, const ZtImageSGI& pasted, int x, int y);

/// Draws the border of a part, two pixels thick, inside of it.
void DrawFrame(ZtImageSGI& image, const Part& part, ZtPixel colour);

} // namespace ztsh

#endif
