#include "pictures/best_scale.h"

#include "common/opaque.h"

namespace ztsh {

bool ScaleBest(ZtImageSGI& image, int width, int height)
{
    constexpr int red_shift = 24;
    ZtPixel alpha = zt_tools::IsOpaque(image) ? zt_tools::opaque_alpha : 0;
    ZtImageSGI reds(image);
    if (!reds.pixels)
        return false;
    std::size_t before = static_cast<std::size_t>(reds.width) *
                         static_cast<std::size_t>(reds.height);
    for (std::size_t i = 0; i < before; ++i)
        reds.pixels[i] >>= red_shift;
    reds.ResizeBest(width, height);
    if (reds.width != width || reds.height != height)
        return false;
    image.ResizeBest(width, height);
    if (image.width != width || image.height != height)
        return false;

    std::size_t after =
        static_cast<std::size_t>(width) * static_cast<std::size_t>(height);
    for (std::size_t i = 0; i < after; ++i)
        image.pixels[i] |= reds.pixels[i] << red_shift | alpha;
    return true;
}

} // namespace ztsh
