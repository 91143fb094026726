#include "edge/pattern.h"

#include <cmath>
#include <random>

#include <gtest/gtest.h>

#include "plugins/grey_pictures.h"

namespace {

using edge::Grey;
using edge::Level;
using edge::Pattern;
using edge::PatternOf;
using edge::Score;

TEST(edge_pattern, OfItsOwnSizeIsThePictureLessItsMean)
{
    Grey grey = GreyPicture(3, 2, {1, 2, 3, 4, 5, 9});

    Pattern pattern = PatternOf(grey, 3, 2);

    EXPECT_EQ(pattern.width, 3);
    EXPECT_EQ(pattern.height, 2);
    EXPECT_EQ(pattern.values, (std::vector<double>{-3, -2, -1, 0, 1, 5}));
    EXPECT_EQ(pattern.spread, 6 * 40.0);
}

TEST(edge_pattern, AReducedValueIsTheMeanOfTheAreaItCovers)
{
    Grey row = GreyPicture(3, 1, {0, 30, 90});
    Grey column = GreyPicture(1, 3, {0, 30, 90});

    Pattern across = PatternOf(row, 2, 1);
    Pattern down = PatternOf(column, 1, 2);

    // The means are 10 and 70: half of the middle value goes to either side.
    EXPECT_EQ(across.values, (std::vector<double>{-30, 30}));
    EXPECT_EQ(down.values, (std::vector<double>{-30, 30}));
}

TEST(edge_pattern, AnEnlargedValueIsRepeated)
{
    Grey grey = GreyPicture(2, 1, {10, 20});

    Pattern pattern = PatternOf(grey, 4, 2);

    EXPECT_EQ(pattern.values,
              (std::vector<double>{-5, -5, 5, 5, -5, -5, 5, 5}));
}

TEST(edge_pattern, OneGreyHasNoSpreadAtAnySize)
{
    Grey grey = Plain(160, 121, 173);

    for (auto [width, height] :
         {std::pair{160, 121}, {80, 61}, {20, 15}, {7, 3}, {271, 205}})
        EXPECT_EQ(PatternOf(grey, width, height).spread, 0.0)
            << width << " x " << height;
}

TEST(edge_pattern, OnePixelOfAnotherGreyIsSpreadEnough)
{
    Grey grey = Plain(160, 121, 173);
    grey.values[9999] = 174;

    EXPECT_GT(PatternOf(grey, 160, 121).spread, 0.0);
    EXPECT_GT(PatternOf(grey, 20, 15).spread, 0.0);
}

/// The correlation straight from its definition.
double Correlation(const Grey& frame, const Grey& wanted, int x, int y)
{
    const double count = static_cast<double>(wanted.values.size());
    double frame_mean = 0;
    double wanted_mean = 0;
    for (int v = 0; v < wanted.height; ++v)
        for (int u = 0; u < wanted.width; ++u) {
            frame_mean += frame.Row(y + v)[x + u] / count;
            wanted_mean += wanted.Row(v)[u] / count;
        }
    double product = 0;
    double frame_squares = 0;
    double wanted_squares = 0;
    for (int v = 0; v < wanted.height; ++v)
        for (int u = 0; u < wanted.width; ++u) {
            const double f = frame.Row(y + v)[x + u] - frame_mean;
            const double w = wanted.Row(v)[u] - wanted_mean;
            product += f * w;
            frame_squares += f * f;
            wanted_squares += w * w;
        }
    return product / std::sqrt(frame_squares * wanted_squares);
}

TEST(edge_pattern, TheScoreIsTheNormalisedCrossCorrelation)
{
    std::mt19937 random(5);
    Grey frame = Noise(60, 50, 2);
    Level level(frame);
    for (int i = 0; i < 1000; ++i) {
        const int width = 2 + static_cast<int>(random() % 20);
        const int height = 2 + static_cast<int>(random() % 20);
        const int x = static_cast<int>(random() % unsigned(61 - width));
        const int y = static_cast<int>(random() % unsigned(51 - height));
        Grey wanted = Noise(width, height, static_cast<unsigned>(i));

        double score = Score(level, PatternOf(wanted, width, height), x, y);

        EXPECT_NEAR(score, Correlation(frame, wanted, x, y), 1e-9);
    }
}

TEST(edge_pattern, BrightnessAndContrastDoNotCount)
{
    Grey wanted = Noise(21, 13, 3);
    Pattern pattern = PatternOf(wanted, 21, 13);
    Grey frame = Noise(40, 30, 4);
    Paste(frame, wanted, 5, 6);
    Grey dim = frame;
    for (std::int32_t& value : dim.values)
        value = 7 * value + 1000;
    Grey negative = frame;
    for (std::int32_t& value : negative.values)
        value = 255 - value;

    EXPECT_NEAR(Score(Level(frame), pattern, 5, 6), 1.0, 1e-12);
    EXPECT_NEAR(Score(Level(dim), pattern, 5, 6), 1.0, 1e-12);
    EXPECT_NEAR(Score(Level(negative), pattern, 5, 6), -1.0, 1e-12);
    EXPECT_LT(std::fabs(Score(Level(frame), pattern, 6, 6)), 0.3);
}

TEST(edge_pattern, OneGreyScoresZeroOnEitherSide)
{
    Pattern noise = PatternOf(Noise(8, 8, 1), 8, 8);
    Pattern plain = PatternOf(Plain(8, 8, 40), 8, 8);
    Level plain_level(Plain(20, 20, 200));
    Level noise_level(Noise(20, 20, 2));

    EXPECT_EQ(Score(plain_level, noise, 3, 3), 0.0);
    EXPECT_EQ(Score(noise_level, plain, 3, 3), 0.0);
    EXPECT_EQ(Score(plain_level, plain, 3, 3), 0.0);
}

} // namespace
