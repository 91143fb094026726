#include "geometry/wire_frame.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
#include <random>
#include <sstream>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

constexpr float infinity = std::numeric_limits<float>::infinity();
constexpr float nan_number = std::numeric_limits<float>::quiet_NaN();
constexpr ZtPixel black = 0x000000FF;
constexpr ZtPixel ink = 0x112233FF;

/// The picture as a text: rows from the top, parted by slashes.
std::string Drawing(const ZtImageSGI& image)
{
    std::string text;
    for (int row = image.height - 1; row >= 0; --row) {
        for (int column = 0; column < image.width; ++column) {
            ZtPixel pixel = image.pixels[row * image.width + column];
            text += pixel == 0 ? '.' : pixel == ink ? '#' : '?';
        }
        text += row > 0 ? "/" : "";
    }
    return text;
}

std::string Line(int width, int height, Pixel from, Pixel to)
{
    ZtImageSGI image(width, height, nullptr);
    DrawLine(image, from, to, ink);
    return Drawing(image);
}

/// A segment after it was cut: "x y z w, x y z w", or "-".
std::string Cut(Homogeneous from, Homogeneous to)
{
    if (!ClipToCube(from, to))
        return "-";
    std::ostringstream text;
    text << from.x << " " << from.y << " " << from.z << " " << from.w << ", "
         << to.x << " " << to.y << " " << to.z << " " << to.w;
    return text.str();
}

Shape Segment(const KvoVec3& from, const KvoVec3& to)
{
    return {{from, to}, {{0, 1, {}}}};
}

} // namespace

TEST(DrawLine, DrawsEveryDirectionOverKnownPixels)
{
    EXPECT_EQ(Line(5, 3, {0, 1}, {4, 1}), "...../#####/.....");
    EXPECT_EQ(Line(3, 3, {1, 0}, {1, 2}), ".#./.#./.#.");
    EXPECT_EQ(Line(3, 3, {0, 0}, {2, 2}), "..#/.#./#..");
    EXPECT_EQ(Line(3, 3, {0, 2}, {2, 0}), "#../.#./..#");
    EXPECT_EQ(Line(6, 2, {0, 0}, {5, 1}), "...###/###...");
    EXPECT_EQ(Line(2, 6, {0, 0}, {1, 5}), ".#/.#/.#/#./#./#.");
    EXPECT_EQ(Line(1, 1, {0, 0}, {0, 0}), "#");
}

TEST(DrawLine, IsTheSameFromEitherEnd)
{
    for (int column = 0; column < 9; ++column)
        for (int row = 0; row < 9; ++row)
            EXPECT_EQ(Line(9, 9, {4, 3}, {column, row}),
                      Line(9, 9, {column, row}, {4, 3}));
}

TEST(DrawLine, LeavesNoGapsAndNoCorners)
{
    for (int column = 0; column < 17; ++column)
        for (int row = 0; row < 11; ++row) {
            std::string line = Line(17, 11, {8, 5}, {column, row});
            EXPECT_EQ(std::count(line.begin(), line.end(), '#'),
                      std::max(std::abs(column - 8), std::abs(row - 5)) + 1);
        }
}

TEST(DrawLine, DrawsNothingForAnEndOutside)
{
    const std::string empty = "../..";
    constexpr int most = std::numeric_limits<int>::max();

    EXPECT_EQ(Line(2, 2, {0, 0}, {2, 0}), empty);
    EXPECT_EQ(Line(2, 2, {0, 0}, {0, 2}), empty);
    EXPECT_EQ(Line(2, 2, {-1, 0}, {1, 1}), empty);
    EXPECT_EQ(Line(2, 2, {0, -1}, {1, 1}), empty);
    EXPECT_EQ(Line(2, 2, {-most, most}, {most, -most}), empty);
}

TEST(PixelOf, DividesTheCubeIntoPixels)
{
    EXPECT_EQ(PixelOf({-1, -1, 0, 1}, 10, 20), (Pixel{0, 0}));
    EXPECT_EQ(PixelOf({1, 1, 0, 1}, 10, 20), (Pixel{9, 19}));
    EXPECT_EQ(PixelOf({0, 0, 0, 1}, 10, 20), (Pixel{5, 10}));
    EXPECT_EQ(PixelOf({-0.001, -0.001, 0, 1}, 10, 20), (Pixel{4, 9}));
    EXPECT_EQ(PixelOf({1, -1, 0, 2}, 8, 8), (Pixel{6, 2}));
    EXPECT_EQ(PixelOf({0.99, 0.99, 0, 1}, 1, 1), (Pixel{0, 0}));
}

TEST(PixelOf, OutsideOfTheCubeGivesTheNearest)
{
    EXPECT_EQ(PixelOf({-5, 5, 0, 1}, 10, 20), (Pixel{0, 19}));
    EXPECT_EQ(PixelOf({1e300, -1e300, 0, 1e-30}, 10, 20), (Pixel{9, 0}));
}

TEST(ClipToCube, LeavesWhatIsInsideAsItIs)
{
    EXPECT_EQ(Cut({-1, -1, -1, 1}, {1, 1, 1, 1}), "-1 -1 -1 1, 1 1 1 1");
    EXPECT_EQ(Cut({0.1, 0.2, 0.3, 1}, {3, 2, 1, 4}), "0.1 0.2 0.3 1, 3 2 1 4");
}

TEST(ClipToCube, CutsAtEveryFace)
{
    EXPECT_EQ(Cut({0, 0, 0, 1}, {2, 0, 0, 1}), "0 0 0 1, 1 0 0 1");
    EXPECT_EQ(Cut({0, 0, 0, 1}, {-2, 0, 0, 1}), "0 0 0 1, -1 0 0 1");
    EXPECT_EQ(Cut({0, 4, 0, 1}, {0, 0, 0, 1}), "0 1 0 1, 0 0 0 1");
    EXPECT_EQ(Cut({0, -4, 0, 1}, {0, 0, 0, 1}), "0 -1 0 1, 0 0 0 1");
    EXPECT_EQ(Cut({0, 0, 0, 1}, {0, 0, 2, 1}), "0 0 0 1, 0 0 1 1");
    EXPECT_EQ(Cut({0, 0, 0, 1}, {0, 0, -2, 1}), "0 0 0 1, 0 0 -1 1");
    EXPECT_EQ(Cut({-4, 0, 0, 1}, {4, 0, 0, 1}), "-1 0 0 1, 1 0 0 1");
}

TEST(ClipToCube, DropsWhatIsOutside)
{
    EXPECT_EQ(Cut({2, 0, 0, 1}, {3, 0, 0, 1}), "-");
    EXPECT_EQ(Cut({-3, 0, 0, 1}, {0, 3, 0, 1}), "-"); // past a corner
    EXPECT_EQ(Cut({0, 0, -3, 1}, {0, 0, -2, 1}), "-");
    EXPECT_EQ(Cut({0, 0, 0, -1}, {0, 0, 0, -2}), "-"); // behind the eye
    EXPECT_EQ(Cut({0, 0, 0, 0}, {0, 0, 0, 0}), "-");   // nowhere
}

TEST(ClipToCube, CutsBeforeTheDivisionWhatReachesBehindTheEye)
{
    // In front, z = -5, w = 5; behind, z = 3, w = -3; the near plane is at 1.
    KvoMat lens = KvoMat().InitPerspective(1.5707964f, 1, 1, 9);
    Homogeneous front = Multiply(KvoVec3(0, 0, -5), lens);
    Homogeneous back = Multiply(KvoVec3(0, 0.4f, 3), lens);

    ASSERT_TRUE(ClipToCube(front, back));

    EXPECT_NEAR(front.w, 5, 1e-6);
    EXPECT_NEAR(back.z, -back.w, 1e-6);
    EXPECT_NEAR(back.w, 1, 1e-6);
    EXPECT_NEAR(back.y, 0.2, 1e-6);
}

TEST(ClipToCube, DropsWhatIsNotFinite)
{
    const Homogeneous inside = {0, 0, 0, 1};
    for (double wrong :
         {static_cast<double>(infinity), -static_cast<double>(infinity),
          static_cast<double>(nan_number)}) {
        EXPECT_EQ(Cut(inside, {wrong, 0, 0, 1}), "-");
        EXPECT_EQ(Cut({0, wrong, 0, 1}, inside), "-");
        EXPECT_EQ(Cut(inside, {0, 0, wrong, 1}), "-");
        EXPECT_EQ(Cut({0, 0, 0, wrong}, inside), "-");
    }
}

// Whatever floats a matrix may give, what is left is inside and has a pixel.
TEST(ClipToCube, LeavesOnlyWhatLiesInTheCube)
{
    std::mt19937 random(7);
    auto any_float = [&] {
        float number =
            std::bit_cast<float>(static_cast<std::uint32_t>(random()));
        bool plain = random() % 2;
        return plain ? static_cast<float>(random() % 9) - 4 : number;
    };
    int left = 0;
    for (int i = 0; i < 100000; ++i) {
        Homogeneous from = {any_float(), any_float(), any_float(), any_float()};
        Homogeneous to = {any_float(), any_float(), any_float(), any_float()};
        if (!ClipToCube(from, to))
            continue;
        ++left;
        for (const Homogeneous& end : {from, to}) {
            ASSERT_GT(end.w, 0);
            Pixel pixel = PixelOf(end, 640, 480);
            ASSERT_TRUE(pixel.column >= 0 && pixel.column < 640);
            ASSERT_TRUE(pixel.row >= 0 && pixel.row < 480);
        }
    }
    EXPECT_GT(left, 1000);
}

TEST(DrawShape, DrawsThroughTheMatrix)
{
    ZtImageSGI image(5, 5, nullptr);
    Shape shape = Segment(KvoVec3(-1, 0, 0), KvoVec3(1, 0, 0));

    EXPECT_EQ(DrawShape(image, shape, KvoMat().InitZrot(90), ink), 0u);
    EXPECT_EQ(Drawing(image), "..#../..#../..#../..#../..#..");

    ZtImageSGI cut(5, 1, nullptr);
    DrawShape(cut, shape, KvoMat().InitTrans(1, 0, 0), ink);
    EXPECT_EQ(Drawing(cut), "..###");
}

TEST(DrawShape, EdgesKeepTheirOwnColour)
{
    ZtImageSGI image(2, 1, nullptr);
    Shape shape = Segment(KvoVec3(-1, 0, 0), KvoVec3(1, 0, 0));
    shape.edges[0].colour = ink;

    DrawShape(image, shape, KvoMat(), black);

    EXPECT_EQ(Drawing(image), "##");
}

TEST(DrawShape, CountsEdgesWithoutAPlace)
{
    ZtImageSGI image(4, 4, nullptr);
    Shape shape = {{KvoVec3(0, 0, 0), KvoVec3(infinity, 0, 0),
                    KvoVec3(0, nan_number, 0), KvoVec3(1, 0, 0)},
                   {{0, 1, {}}, {2, 3, {}}, {0, 3, {}}}};

    EXPECT_EQ(DrawShape(image, shape, KvoMat(), ink), 2u);
    EXPECT_EQ(Drawing(image), "..../..##/..../....");

    KvoMat up = KvoMat().InitLookat(0, 0, 0, 0, 1, 0, 0); // divides by zero
    EXPECT_EQ(DrawShape(image, *KnownShape("cube"), up, ink), 12u);
    KvoMat wide = KvoMat().InitScale(3e38f); // beyond what floats hold
    EXPECT_EQ(DrawShape(image, Segment(KvoVec3(4), KvoVec3(0)), wide, ink), 1u);
}

TEST(DrawShape, AMatrixOfZerosShowsNothing)
{
    ZtImageSGI image(3, 1, nullptr);

    EXPECT_EQ(DrawShape(image, *KnownShape("cube"), KvoMat() * 0.0f, ink), 0u);

    EXPECT_EQ(Drawing(image), "...");
}

TEST(KnownShape, KnowsFive)
{
    struct
    {
        const char* name;
        std::size_t points, edges;
    } const known[] = {{"cube", 8, 12},
                       {"pyramid", 5, 8},
                       {"axes", 12, 9},
                       {"grid", 44, 22},
                       {"sphere", 114, 240}};
    for (const auto& [name, points, edges] : known) {
        auto shape = KnownShape(name);
        ASSERT_TRUE(shape) << name;
        EXPECT_EQ(shape->points.size(), points) << name;
        EXPECT_EQ(shape->edges.size(), edges) << name;
        for (const Edge& edge : shape->edges) {
            EXPECT_LT(edge.from, points) << name;
            EXPECT_LT(edge.to, points) << name;
            EXPECT_NE(edge.from, edge.to) << name;
        }
        for (const KvoVec3& point : shape->points)
            for (float coordinate : {point.x, point.y, point.z})
                EXPECT_LE(std::fabs(coordinate), 1.000001f) << name;
    }
    EXPECT_FALSE(KnownShape("teapot"));
    EXPECT_FALSE(KnownShape("Cube"));
}

TEST(KnownShape, TheEdgesOfACubeAreTwoLong)
{
    const auto cube = KnownShape("cube");
    for (const Edge& edge : cube->edges)
        EXPECT_EQ((cube->points[edge.from] - cube->points[edge.to]).Mag(), 2);
}

TEST(KnownShape, TheSphereHasRadiusOneAndEvenEdges)
{
    const auto sphere = KnownShape("sphere");
    std::vector<int> ends(sphere->points.size());
    for (const KvoVec3& point : sphere->points)
        EXPECT_NEAR(point.Mag(), 1, 1e-6);
    for (const Edge& edge : sphere->edges) {
        ++ends[edge.from];
        ++ends[edge.to];
        EXPECT_LT((sphere->points[edge.from] - sphere->points[edge.to]).Mag(),
                  0.4f);
    }
    EXPECT_EQ(std::count(ends.begin(), ends.end(), 4), 112);
    EXPECT_EQ(std::count(ends.begin(), ends.end(), 16), 2);
}

TEST(KnownShape, TheAxesAreRedGreenAndBlue)
{
    const auto axes = KnownShape("axes");

    EXPECT_TRUE(axes->points[1] == KvoVec3(1, 0, 0));
    EXPECT_TRUE(axes->points[5] == KvoVec3(0, 1, 0));
    EXPECT_TRUE(axes->points[9] == KvoVec3(0, 0, 1));
    EXPECT_EQ(axes->edges[0].colour, 0xFF4040FFu);
    EXPECT_EQ(axes->edges[3].colour, 0x40E040FFu);
    EXPECT_EQ(axes->edges[6].colour, 0x5080FFFFu);
}

TEST(Transform, MovesEveryPoint)
{
    Shape shape = Segment(KvoVec3(1, 2, 3), KvoVec3(0, 0, 0));

    Transform(shape, KvoMat().InitTrans(1, 1, 1));

    EXPECT_TRUE(shape.points[0] == KvoVec3(2, 3, 4));
    EXPECT_TRUE(shape.points[1] == KvoVec3(1, 1, 1));
}

TEST(Transform, OfNoPointsDoesNothing)
{
    Shape shape;

    Transform(shape, KvoMat());

    EXPECT_TRUE(shape.points.empty());
}

TEST(ReadColour, ReadsSixHexadecimalDigits)
{
    EXPECT_EQ(ReadColour("ff8000"), 0xFF8000FFu);
    EXPECT_EQ(ReadColour("00FF0a"), 0x00FF0AFFu);
    for (const char* wrong : {"", "fff", "ff80000", "gg0000", "#ff8000",
                              "-f8000", "0xff80", "ff 000", "ff8000ff"})
        EXPECT_FALSE(ReadColour(wrong)) << wrong;
}
