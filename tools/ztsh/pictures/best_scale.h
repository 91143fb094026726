#ifndef ZTSH_PICTURES_BEST_SCALE_H
#define ZTSH_PICTURES_BEST_SCALE_H

/// \file
/// Scaling by area averages with all four channels.

#include <ZT/image_sgi.h>

namespace ztsh {

/// Scales `image` by averaging areas, red included.
///
/// `ZtImageSGI::ResizeBest` averages three of the four channels and clears
/// red. So it runs twice, the second time on a copy whose red stands where
/// alpha was, and the two results are put together. Its averages may come out
/// one too low; a picture that was opaque is opaque all the same.
///
/// Units:   sizes in pixels, at least 1.
/// Returns: whether there was memory enough; if not the picture is as before.
bool ScaleBest(ZtImageSGI& image, int width, int height);

} // namespace ztsh

#endif
