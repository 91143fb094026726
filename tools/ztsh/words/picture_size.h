#ifndef ZTSH_WORDS_PICTURE_SIZE_H
#define ZTSH_WORDS_PICTURE_SIZE_H

/// \file
/// The size of a picture as scripts give it.

#include "pictures/terminal_picture.h"

namespace ztsh {

/// Reads a width and a height for the command `word`.
///
/// Requires: two texts.
/// Returns:  false with `size` as it was.
/// Reports:  an error if these are no numbers, or too small, or too large.
bool TakePictureSize(const char* word, const char* width, const char* height,
                     PictureSize& size);

} // namespace ztsh

#endif
