#include "words/picture_size.h"

#include "words/word_director.h"

#include <ZT/error.h>

namespace ztsh {

bool TakePictureSize(const char* word, const char* width, const char* height,
                     PictureSize& size)
{
    constexpr long most_side = 65535;
    constexpr long most_pixels = 1L << 28;
    long across = 0;
    long up = 0;
    if (!ReadNumber(width, 1, most_side, across) ||
        !ReadNumber(height, 1, most_side, up) || across * up > most_pixels) {
        ZtError("%s: expected a width and a height of 1 to %ld pixels, "
                "together at most %ld, not %s and %s\n",
                word, most_side, most_pixels, width, height);
        return false;
    }
    size = {static_cast<int>(across), static_cast<int>(up)};
    return true;
}

} // namespace ztsh
