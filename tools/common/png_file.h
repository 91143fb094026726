#ifndef ZT_TOOLS_COMMON_PNG_FILE_H
#define ZT_TOOLS_COMMON_PNG_FILE_H

/// \file
/// Pictures as PNG files, for other programs to look at.

#include <ZT/image_sgi.h>

#include <string>

namespace zt_tools {

/// Writes `image` as a PNG file of 8 bits a channel: with alpha if any pixel
/// is not opaque, else without. An older file is replaced only when the new
/// one is complete.
///
/// Returns: the empty text, or why there is no such file now.
std::string WritePng(const ZtImageSGI& image, const std::string& name);

} // namespace zt_tools

#endif
