// Reads any bytes as a raw video frame, and stops where the library's reader
// and the plain one of the tests part.

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>

#include "image/picture_difference.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data,
                                      std::size_t size)
{
    const std::string file(reinterpret_cast<const char*>(data), size);
    const std::string difference = YuvDifferenceOn(file);
    if (!difference.empty()) {
        std::fprintf(stderr, "%s", difference.c_str());
        std::abort();
    }
    return 0;
}
