#include <ZT/image_sgi.h>

#include <cmath>
#include <cstdio>
#include <vector>

// Draws a picture and writes it as an SGI image file. The codec's functions
// take pixels as 32-bit numbers, 0xAABBGGRR, the bottom row first.
int main(int argc, char** argv)
{
    const char* name = argc > 1 ? argv[1] : "rings.rgb";
    constexpr int width = 160;
    constexpr int height = 120;

    std::vector<ZtPixel> pixels;
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            double away = std::hypot(x - 80, y - 40);
            auto wave = static_cast<ZtPixel>(127.5 + 127 * std::cos(away / 4));
            auto light = static_cast<ZtPixel>(255 - away);
            pixels.push_back(0xff000000u | light << 16 | wave << 8 | 60u);
        }
    }
    if (!longstoimage(pixels.data(), width, height, 3, name)) {
        std::fprintf(stderr, "cannot write %s\n", name);
        return 1;
    }

    int read_width = 0;
    int read_height = 0;
    sizeofimage(name, read_width, read_height);
    std::printf("%s is %d x %d\n", name, read_width, read_height);
}
