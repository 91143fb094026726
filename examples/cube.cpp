#include <KVO/KvoVec.h>
#include <ZT/image_sgi.h>

#include <cstdio>
#include <vector>

// Looks at a cube through a camera and draws its edges: points are rows on the
// left, so transformations read from left to right.
namespace {

constexpr int size = 160;

void Draw(std::vector<ZtPixel>& pixels, KvoVec3 from, KvoVec3 to)
{
    for (int step = 0; step <= 400; ++step) {
        KvoVec3 at = from + (to - from) * (static_cast<float>(step) / 400);
        int x = static_cast<int>((at.x + 1) * size / 2);
        int y = static_cast<int>((at.y + 1) * size / 2);
        if (x >= 0 && x < size && y >= 0 && y < size)
            pixels[static_cast<std::size_t>(y * size + x)] = 0xff40c0ffu;
    }
}

} // namespace

int main(int argc, char** argv)
{
    const char* name = argc > 1 ? argv[1] : "cube.rgb";
    KvoMat turn = KvoMat().InitYrot(30).Xrot(25, 1);
    KvoMat camera = turn * KvoMat().InitTrans(0, 0, -5) *
                    KvoMat().InitPerspective(0.7f, 1, 1, 10);

    std::vector<ZtPixel> pixels(size * size, 0xff402010u);
    for (int corner = 0; corner < 8; ++corner) {
        for (int axis = 1; axis < 8; axis *= 2) {
            int other = corner ^ axis;
            if (other < corner)
                continue;
            KvoVec3 ends[2];
            for (int i = 0; i < 2; ++i) {
                int which = i == 0 ? corner : other;
                KvoVec3 end(which & 1 ? 1.0f : -1.0f, which & 2 ? 1.0f : -1.0f,
                            which & 4 ? 1.0f : -1.0f);
                ends[i] = end * camera;
            }
            Draw(pixels, ends[0], ends[1]);
        }
    }
    if (!longstoimage(pixels.data(), size, size, 3, name))
        return 1;
    std::printf("%s shows a cube\n", name);
}
