#include <ZT/image_sgi.h>

#include <cstdio>

// Makes a small picture of a large one: thumbnail FROM TO. A picture that
// failed to load has no pixels; nothing is thrown and nothing is printed.
int main(int argc, char** argv)
{
    if (argc != 3) {
        std::fprintf(stderr, "usage: thumbnail FROM TO\n");
        return 2;
    }
    constexpr int by_extension = 3;
    ZtImageSGI picture(argv[1], by_extension);
    if (!picture.pixels) {
        std::fprintf(stderr, "cannot load %s\n", argv[1]);
        return 1;
    }
    std::printf("%d x %d", picture.width, picture.height);
    picture.Resize(picture.width / 4, picture.height / 4);
    picture.Store(argv[2]);
    std::printf(" became %d x %d\n", picture.width, picture.height);
}
