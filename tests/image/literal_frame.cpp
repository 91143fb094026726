#include "image/literal_frame.h"

namespace literal {

namespace {

int Red(std::uint32_t pixel)
{
    return static_cast<int>(pixel >> 24 & 0xFF);
}

int Green(std::uint32_t pixel)
{
    return static_cast<int>(pixel >> 16 & 0xFF);
}

int Blue(std::uint32_t pixel)
{
    return static_cast<int>(pixel >> 8 & 0xFF);
}

} // namespace

std::string VideoFrame(const std::vector<std::uint32_t>& pixels)
{
    std::string frame(486 * 1440, '\0');
    int luma_before = 0;
    int u_before = 0;
    int v_before = 0;
    int half_u_before = 0;
    int half_v_before = 0;
    for (int row = 485; row >= 0; --row) {
        const int line = row % 2 == 0 ? 242 - row / 2 : 485 - (row >> 1);
        std::uint32_t samples[720];
        for (int i = 0; i < 720; ++i)
            samples[i] = pixels[static_cast<std::size_t>(
                static_cast<int>(row * 648 + i * 0.9))];
        for (int i = 0; i < 720; i += 2) {
            const std::uint32_t p0 = samples[i];
            const std::uint32_t p1 = samples[i + 1];
            const int y0 = 16829 * Red(p0) + 33039 * Green(p0) +
                           6416 * Blue(p0) + (luma_before & 0xFFFF);
            const int y1 = 16829 * Red(p1) + 33039 * Green(p1) +
                           6416 * Blue(p1) + (y0 & 0xFFFF);
            const int half_u =
                -2426 * Red(p1) - 4765 * Green(p1) + 7191 * Blue(p1);
            const int half_v =
                7193 * Red(p1) - 6023 * Green(p1) - 1170 * Blue(p1);
            const int u =
                half_u_before +
                (-4853 * Red(p0) - 9530 * Green(p0) + 14838 * Blue(p0)) +
                half_u + (u_before & 0xFFFF);
            const int v =
                half_v_before +
                (14386 * Red(p0) - 12046 * Green(p0) - 2340 * Blue(p0)) +
                half_v + (v_before & 0xFFFF);
            half_u_before = half_u;
            half_v_before = half_v;
            luma_before = y1;
            u_before = u;
            v_before = v;
            const std::size_t at =
                static_cast<std::size_t>(line * 1440 + i * 2);
            frame[at] = static_cast<char>((u >> 16) + 128);
            frame[at + 1] = static_cast<char>((y0 >> 16) + 16);
            frame[at + 2] = static_cast<char>((v >> 16) + 128);
            frame[at + 3] = static_cast<char>((y1 >> 16) + 16);
        }
    }
    return frame;
}

} // namespace literal
