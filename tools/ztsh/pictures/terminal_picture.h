#ifndef ZTSH_PICTURES_TERMINAL_PICTURE_H
#define ZTSH_PICTURES_TERMINAL_PICTURE_H

/// \file
/// Pictures in a terminal: each character cell shows two pixels, one above the
/// other, as an upper half block in true colour.

#include <ZT/image_sgi.h>

#include <ostream>

namespace ztsh {

/// A size in pixels.
struct PictureSize
{
    int width;
    int height;
};

/// Gives the largest size of the same shape as `picture` that fits into
/// `columns` by `rows` cells.
///
/// Requires: every number at least 1.
/// Returns:  at least 1 by 1.
PictureSize FitIntoCells(PictureSize picture, int columns, int rows);

/// Writes `image` as half blocks, top row first, a line for each two rows.
///
/// Pixels that are not opaque stand before black. With an odd height the lower
/// half of the last line is left as the terminal has it.
void WriteHalfBlocks(const ZtImageSGI& image, std::ostream& out);

} // namespace ztsh

#endif
