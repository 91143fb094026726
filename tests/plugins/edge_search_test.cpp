#include "edge/search.h"

#include <cstdlib>

#include <gtest/gtest.h>

#include "plugins/grey_pictures.h"

namespace {

using edge::Frame;
using edge::Grey;
using edge::Hit;
using edge::Search;

constexpr double threshold = 0.75;

std::vector<Hit> Found(const Grey& frame, const Grey& thumbnail,
                       double least = threshold)
{
    return Search(Frame(frame), thumbnail, least);
}

/// A thumbnail as targets have them.
Grey Thumbnail(unsigned seed)
{
    return Blobs(160, 121, seed);
}

/// Something to hide thumbnails in.
Grey Background(int width, int height)
{
    return Blobs(width, height, 77);
}

void ExpectAt(const Hit& hit, int x, int y, int width, int height,
              int tolerance = 0)
{
    EXPECT_NEAR(hit.x, x, tolerance);
    EXPECT_NEAR(hit.y, y, tolerance);
    EXPECT_NEAR(hit.width, width, tolerance);
    EXPECT_NEAR(hit.height, height, tolerance);
}

TEST(edge_search, FindsAThumbnailAtItsPlace)
{
    Grey thumbnail = Thumbnail(1);
    for (auto [x, y] : {std::pair{100, 60}, {33, 47}, {181, 91}, {102, 55}}) {
        Grey frame = Background(400, 300);
        Paste(frame, thumbnail, x, y);

        std::vector<Hit> hits = Found(frame, thumbnail);

        ASSERT_EQ(hits.size(), 1U) << x << ", " << y;
        ExpectAt(hits[0], x, y, 160, 121);
        EXPECT_NEAR(hits[0].score, 1.0, 1e-9);
    }
}

TEST(edge_search, FindsNothingWhereTheThumbnailIsNot)
{
    EXPECT_TRUE(Found(Background(400, 300), Thumbnail(1)).empty());
    EXPECT_TRUE(Found(Noise(400, 300, 1), Thumbnail(1)).empty());
    EXPECT_TRUE(Found(Background(400, 300), Noise(160, 121, 2)).empty());
    EXPECT_TRUE(Found(Plain(400, 300, 90), Thumbnail(1)).empty());
}

TEST(edge_search, FindsAThumbnailAtEveryBorder)
{
    Grey thumbnail = Thumbnail(2);
    // Odd sizes: every reduction loses a column and a row.
    const int width = 335;
    const int height = 263;
    for (int x : {0, width - 160})
        for (int y : {0, height - 121}) {
            Grey frame = Background(width, height);
            Paste(frame, thumbnail, x, y);

            std::vector<Hit> hits = Found(frame, thumbnail);

            ASSERT_EQ(hits.size(), 1U) << x << ", " << y;
            ExpectAt(hits[0], x, y, 160, 121);
        }
}

TEST(edge_search, FindsAThumbnailThatIsCutOffALittle)
{
    Grey thumbnail = Thumbnail(2);
    Grey frame = Background(400, 300);
    Paste(frame, thumbnail, -8, 100);

    std::vector<Hit> hits = Found(frame, thumbnail);

    ASSERT_EQ(hits.size(), 1U);
    ExpectAt(hits[0], 0, 100, 152, 121, 8);
}

TEST(edge_search, FindsAThumbnailThatIsTheWholeFrame)
{
    Grey thumbnail = Thumbnail(3);

    std::vector<Hit> hits = Found(thumbnail, thumbnail);

    ASSERT_EQ(hits.size(), 1U);
    ExpectAt(hits[0], 0, 0, 160, 121);
    EXPECT_NEAR(hits[0].score, 1.0, 1e-9);
}

TEST(edge_search, FindsAThumbnailThatFillsFramesOfAnySize)
{
    // Of many of these sizes a reduction drops a column or a row that the
    // reduced thumbnail still has.
    Grey thumbnail = Thumbnail(3);
    for (auto [width, height] : {std::pair{80, 61},
                                 {95, 72},
                                 {113, 86},
                                 {135, 102},
                                 {190, 144},
                                 {226, 171},
                                 {269, 203},
                                 {320, 242}}) {
        std::vector<Hit> hits =
            Found(Scaled(thumbnail, width, height), thumbnail);

        ASSERT_GE(hits.size(), 1U) << width;
        ExpectAt(hits[0], 0, 0, width, height, 1);
    }
}

TEST(edge_search, FindsAThumbnailUnderNoise)
{
    Grey thumbnail = Thumbnail(4);
    Grey frame = Background(400, 300);
    Paste(frame, thumbnail, 141, 87);
    AddNoise(frame, 40, 9);

    std::vector<Hit> hits = Found(frame, thumbnail);

    ASSERT_EQ(hits.size(), 1U);
    // Sizes go in steps of 2%.
    ExpectAt(hits[0], 141, 87, 160, 121, 4);
    EXPECT_LT(hits[0].score, 0.97);
}

TEST(edge_search, FindsAThumbnailOfOtherBrightnessAndContrast)
{
    Grey thumbnail = Thumbnail(5);
    for (auto [gain, offset] :
         {std::pair{0.5, 100.0}, {0.25, 0.0}, {1.5, -40.0}}) {
        Grey frame = Background(400, 300);
        Paste(frame, thumbnail, 90, 130, gain, offset);

        std::vector<Hit> hits = Found(frame, thumbnail);

        ASSERT_EQ(hits.size(), 1U) << gain;
        ExpectAt(hits[0], 90, 130, 160, 121, 1);
        EXPECT_GT(hits[0].score, 0.95);
    }
}

TEST(edge_search, DoesNotFindTheNegative)
{
    Grey thumbnail = Thumbnail(5);
    Grey frame = Background(400, 300);
    Paste(frame, thumbnail, 90, 130, -1.0, 255.0);

    for (const Hit& hit : Found(frame, thumbnail))
        EXPECT_GT(std::abs(hit.x - 90) + std::abs(hit.y - 130), 20);
}

TEST(edge_search, FindsAThumbnailOfAnySizeFromHalfToTwice)
{
    Grey thumbnail = Thumbnail(6);
    for (auto [width, height] : {std::pair{80, 61},
                                 {89, 67},
                                 {113, 86},
                                 {136, 103},
                                 {177, 134},
                                 {226, 171},
                                 {269, 203},
                                 {320, 242}}) {
        Grey frame = Background(450, 350);
        Paste(frame, Scaled(thumbnail, width, height), 71, 53);

        std::vector<Hit> hits = Found(frame, thumbnail);

        ASSERT_GE(hits.size(), 1U) << width;
        // Sizes go in steps of 2%.
        ExpectAt(hits[0], 71, 53, width, height, 4);
        EXPECT_GT(hits[0].score, 0.95);
    }
}

TEST(edge_search, FindsHardEdgesOfAnySize)
{
    // Squares of 8 pixels, which resemble themselves only nearly in place.
    Grey thumbnail = Scaled(Noise(20, 15, 30), 160, 121);
    for (auto [width, height] : {std::pair{87, 66},
                                 {95, 72},
                                 {113, 86},
                                 {132, 100},
                                 {147, 111},
                                 {174, 132},
                                 {197, 149},
                                 {226, 171},
                                 {290, 219}}) {
        Grey frame = Background(450, 350);
        Paste(frame, Scaled(thumbnail, width, height), 83, 39);

        std::vector<Hit> hits = Found(frame, thumbnail);

        ASSERT_EQ(hits.size(), 1U) << width;
        ExpectAt(hits[0], 83, 39, width, height, 4);
    }
}

TEST(edge_search, FindsThreeCopiesOfThreeSizesTheBestFirst)
{
    Grey thumbnail = Thumbnail(7);
    Grey frame = Background(500, 400);
    Paste(frame, thumbnail, 20, 30);
    Paste(frame, Scaled(thumbnail, 80, 61), 300, 40);
    Paste(frame, Scaled(thumbnail, 226, 171), 200, 190);

    std::vector<Hit> hits = Found(frame, thumbnail);

    ASSERT_EQ(hits.size(), 3U);
    ExpectAt(hits[0], 20, 30, 160, 121);
    EXPECT_GE(hits[0].score, hits[1].score);
    EXPECT_GE(hits[1].score, hits[2].score);
    const Hit& small = hits[1].width < hits[2].width ? hits[1] : hits[2];
    const Hit& large = hits[1].width < hits[2].width ? hits[2] : hits[1];
    ExpectAt(small, 300, 40, 80, 61, 2);
    ExpectAt(large, 200, 190, 226, 171, 3);
}

TEST(edge_search, FindsEightCopies)
{
    Grey thumbnail = Thumbnail(8);
    Grey frame = Background(700, 300);
    for (int i = 0; i < 8; ++i)
        Paste(frame, thumbnail, 3 + 171 * (i % 4), 7 + 137 * (i / 4));

    std::vector<Hit> hits = Found(frame, thumbnail, 0.95);

    EXPECT_EQ(hits.size(), 8U);
}

TEST(edge_search, OfCopiesThatOverlapMuchOnlyTheBestIsGiven)
{
    Grey thumbnail = Thumbnail(9);
    Grey frame = Background(400, 300);
    Paste(frame, thumbnail, 100, 80);
    Paste(frame, thumbnail, 140, 80);

    std::vector<Hit> hits = Found(frame, thumbnail, 0.3);

    ASSERT_GE(hits.size(), 1U);
    ExpectAt(hits[0], 140, 80, 160, 121);
    for (std::size_t i = 1; i < hits.size(); ++i)
        EXPECT_FALSE(std::abs(hits[i].x - 140) < 40 &&
                     std::abs(hits[i].y - 80) < 30 && hits[i].width > 140 &&
                     hits[i].width < 180);
}

/// A thumbnail that repeats itself after so many columns.
Grey Repeating(int columns)
{
    Grey thumbnail = Plain(160, 121, 0);
    Grey part = Blobs(columns, 121, 31);
    for (int x = 0; x < 160; x += columns)
        Paste(thumbnail, part, x, 0);
    return thumbnail;
}

TEST(edge_search, OverlapsOfMoreThanThreeTenthsCountAsOne)
{
    Grey close = Repeating(70);
    Grey apart = Repeating(100);
    Grey close_frame = Background(420, 300);
    Grey apart_frame = Background(420, 300);
    for (int i = 0; i < 2; ++i) {
        Paste(close_frame, close, 60 + 70 * i, 90);
        Paste(apart_frame, apart, 60 + 100 * i, 90);
    }

    // 90 of 230 columns are shared, and 60 of 260.
    EXPECT_EQ(Found(close_frame, close, 0.98).size(), 1U);
    EXPECT_EQ(Found(apart_frame, apart, 0.98).size(), 2U);
}

TEST(edge_search, FindsFineGrainedThumbnails)
{
    // Nothing of this is left on the coarse levels but a trace.
    Grey thumbnail = Noise(160, 121, 10);
    Grey frame = Noise(400, 300, 11);
    Paste(frame, thumbnail, 133, 91);

    std::vector<Hit> hits = Found(frame, thumbnail);

    ASSERT_EQ(hits.size(), 1U);
    ExpectAt(hits[0], 133, 91, 160, 121);
}

TEST(edge_search, GivesTheSameBitsEachTime)
{
    Grey thumbnail = Thumbnail(12);
    Grey frame = Background(400, 300);
    Paste(frame, Scaled(thumbnail, 130, 98), 50, 60);
    AddNoise(frame, 40, 13);

    std::vector<Hit> first = Found(frame, thumbnail, 0.3);
    std::vector<Hit> second = Found(frame, thumbnail, 0.3);

    ASSERT_EQ(first.size(), second.size());
    for (std::size_t i = 0; i < first.size(); ++i) {
        ExpectAt(second[i], first[i].x, first[i].y, first[i].width,
                 first[i].height);
        EXPECT_EQ(first[i].score, second[i].score);
    }
}

TEST(edge_search, NeverGivesLessThanTheThreshold)
{
    Grey thumbnail = Thumbnail(14);
    Grey frame = Background(400, 300);
    Paste(frame, thumbnail, 50, 60);
    AddNoise(frame, 100, 15);
    const double score = Found(frame, thumbnail, 0.1).at(0).score;

    EXPECT_LT(score, 0.95);
    EXPECT_EQ(Found(frame, thumbnail, score - 0.01).size(), 1U);
    EXPECT_TRUE(Found(frame, thumbnail, score + 0.01).empty());
    for (const Hit& hit : Found(frame, thumbnail, 0.3))
        EXPECT_GE(hit.score, 0.3);
}

TEST(edge_search, AThumbnailOfOneGreyIsNowhere)
{
    Grey frame = Background(400, 300);
    Paste(frame, Plain(160, 121, 50), 30, 40);

    EXPECT_TRUE(Found(frame, Plain(160, 121, 50), 0.0).empty());
}

TEST(edge_search, AFrameThatIsTooSmallShowsNothing)
{
    Grey thumbnail = Thumbnail(16);

    for (auto [width, height] :
         {std::pair{1, 1}, {79, 400}, {400, 60}, {2, 2}, {80, 60}})
        EXPECT_TRUE(
            Found(Scaled(thumbnail, width, height), thumbnail, 0.0).empty())
            << width << " x " << height;
    EXPECT_EQ(Found(Scaled(thumbnail, 80, 61), thumbnail).size(), 1U);
}

TEST(edge_search, SizesThatDoNotFitAreLeftOut)
{
    Grey thumbnail = Thumbnail(17);
    // High enough for all sizes, wide enough for half of them.
    Grey frame = Background(171, 300);
    Paste(frame, Scaled(thumbnail, 113, 86), 31, 190);

    std::vector<Hit> hits = Found(frame, thumbnail);

    ASSERT_EQ(hits.size(), 1U);
    ExpectAt(hits[0], 31, 190, 113, 86, 2);
}

TEST(edge_search, NothingIsFoundInNothing)
{
    EXPECT_TRUE(Found(Grey(), Thumbnail(1), 0.0).empty());
    EXPECT_TRUE(Found(Background(400, 300), Grey(), 0.0).empty());
    EXPECT_TRUE(Found(Grey(), Grey(), 0.0).empty());
}

TEST(edge_search, TinyThumbnailsWorkToo)
{
    Grey frame = Noise(40, 30, 18);
    Grey thumbnail = Noise(6, 5, 19);
    Paste(frame, thumbnail, 13, 17);

    std::vector<Hit> hits = Found(frame, thumbnail, 0.9);

    ASSERT_GE(hits.size(), 1U);
    ExpectAt(hits[0], 13, 17, 6, 5);
    EXPECT_TRUE(Found(frame, Plain(1, 1, 9), 0.0).empty());
}

} // namespace
