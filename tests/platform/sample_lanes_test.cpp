#include "platform/sample_lanes.h"

#include <algorithm>
#include <cmath>
#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "sound/literal.h"

namespace {

using literal::Samples;
using zt_platform::SampleLanes;

constexpr short untouched = 0x1234;

/// Each test runs with the plain lanes and with all faster ones.
class SampleLanesTest : public testing::TestWithParam<const SampleLanes*>
{
protected:
    const SampleLanes& lanes = *GetParam();
    std::mt19937 random{26};

    Samples RandomSamples(std::size_t count, unsigned shift = 0)
    {
        Samples samples(count);
        for (short& sample : samples)
            sample = static_cast<short>(static_cast<short>(random()) >> shift);
        return samples;
    }
};

/// Gives all that this processor can do, the plain ones first.
std::vector<const SampleLanes*> All()
{
    std::vector<const SampleLanes*> all;
    while (const SampleLanes* lanes = SampleLanes::numbered(all.size()))
        all.push_back(lanes);
    return all;
}

INSTANTIATE_TEST_SUITE_P(All, SampleLanesTest, testing::ValuesIn(All()),
                         [](const auto& lanes) {
                             return std::string(lanes.param->name());
                         });

TEST_P(SampleLanesTest, SamplesAreWeighedInPlaceAndElsewhere)
{
    for (int i = 0; i < 1500; ++i) {
        const std::size_t step = 1 + random() % 2;
        const std::size_t count = random() % 120;
        const Samples from = RandomSamples(count + step);
        const float most = i % 3 ? 2.0f : SampleLanes::largest_factor;
        const float now =
            most * static_cast<float>(random() % 2001) / 1000 - most;
        const float before =
            most * static_cast<float>(random() % 2001) / 1000 - most;
        Samples expected = from;
        literal::Weigh(expected, step, 1, now, before);
        Samples elsewhere(count + 1, untouched);
        Samples in_place = from;

        lanes.weigh(from.data() + step, from.data(), elsewhere.data(), count,
                    now, before);
        lanes.weigh(in_place.data() + step, in_place.data(),
                    in_place.data() + step, count, now, before);

        ASSERT_EQ(in_place, expected);
        ASSERT_EQ(elsewhere.back(), untouched);
        elsewhere.pop_back();
        ASSERT_EQ(elsewhere,
                  Samples(expected.begin() + static_cast<std::ptrdiff_t>(step),
                          expected.end()));
    }
}

TEST_P(SampleLanesTest, TheLargestFactorsWrapAround)
{
    const Samples from(40, -32768);
    Samples to(39);

    lanes.weigh(from.data() + 1, from.data(), to.data(), 39, 32768.0f,
                32768.0f);

    EXPECT_EQ(to, Samples(39, 0));
}

TEST_P(SampleLanesTest, PairsAreAveragedTowardZero)
{
    for (std::size_t count = 0; count < 120; ++count) {
        Samples pairs = RandomSamples(2 * count);
        if (count > 20)
            std::fill(pairs.begin(), pairs.begin() + 8, short{-32768});
        Samples averages(count + 1, untouched);

        lanes.average(pairs.data(), averages.data(), count);

        Samples expected = literal::Mono(pairs);
        expected.push_back(untouched);
        ASSERT_EQ(averages, expected);
    }
}

TEST_P(SampleLanesTest, TheEndsOfTheRangeAreFoundWhereverTheyAre)
{
    for (std::size_t count = 1; count < 200; ++count)
        for (int i = 0; i < 10; ++i) {
            Samples samples = RandomSamples(count, 3);
            samples[random() % count] = 20000;
            samples[random() % count] = -20000;

            const SampleLanes::Range range = lanes.range(samples.data(), count);

            ASSERT_EQ(range.least,
                      *std::min_element(samples.begin(), samples.end()));
            ASSERT_EQ(range.largest,
                      *std::max_element(samples.begin(), samples.end()));
        }
}

float LiteralSum(const Samples& samples, float sum)
{
    for (short sample : samples) {
        const float value = static_cast<float>(sample) / 32768.0f;
        sum += value * value;
    }
    return sum;
}

TEST_P(SampleLanesTest, SquaresAreSummedUpToTheSameBits)
{
    for (int i = 0; i < 3000; ++i) {
        // Sums of every size, so that every unit is met; with the samples'
        // sizes ties are common in some and impossible in others.
        const Samples samples =
            RandomSamples(random() % 300, static_cast<unsigned>(i % 16));
        const float sum =
            i % 5 == 0
                ? 0.0f
                : std::ldexp(1.0f + static_cast<float>(random() % 8388608) /
                                        8388608.0f,
                             static_cast<int>(random() % 62) - 30);

        ASSERT_EQ(lanes.sum_of_squares(samples.data(), samples.size(), sum),
                  LiteralSum(samples, sum))
            << i;
    }
}

TEST_P(SampleLanesTest, SquaresThatLieBetweenTwoUnitsAreSummedUpInOrder)
{
    for (int shift = 0; shift < 15; ++shift)
        for (int odd : {1, 3, 5, 7}) {
            const auto sample = static_cast<short>(odd << shift);
            Samples samples(333, sample);
            samples[100] = 1;
            for (int exponent = -20; exponent < 30; ++exponent) {
                const float sum = std::ldexp(1.0000001f, exponent);

                ASSERT_EQ(
                    lanes.sum_of_squares(samples.data(), samples.size(), sum),
                    LiteralSum(samples, sum));
            }
        }
}

TEST_P(SampleLanesTest, ALongSumCrossesExponentsToTheSameBits)
{
    for (unsigned shift : {0u, 4u, 8u, 12u, 15u}) {
        const Samples samples = RandomSamples(300000, shift);

        EXPECT_EQ(lanes.sum_of_squares(samples.data(), samples.size(), 0),
                  LiteralSum(samples, 0));
    }
}

TEST_P(SampleLanesTest, LongRunsOfStepsRepeatThemselves)
{
    for (auto [step, grid] :
         {std::pair(147L, 160L), std::pair(80L, 441L), std::pair(1L, 1L),
          std::pair(1L, 512L), std::pair(511L, 513L), std::pair(160L, 147L),
          std::pair(4095L, 4096L), std::pair(4096L, 4097L)}) {
        const SampleLanes::Steps steps = {grid / 3, step, grid};
        const std::size_t count = 20000;
        const auto last = static_cast<std::size_t>(
            (steps.rest + static_cast<std::int64_t>(count - 1) * step) / grid);
        const Samples samples = RandomSamples(2 * last + 4);
        Samples between(count);
        Samples plain_between(count);
        Samples repeated(2 * count);
        Samples plain_repeated(2 * count);

        lanes.interpolate(samples.data(), between.data(), count, steps);
        lanes.repeat(samples.data(), repeated.data(), count, steps);
        SampleLanes::plain().interpolate(samples.data(), plain_between.data(),
                                         count, steps);
        SampleLanes::plain().repeat(samples.data(), plain_repeated.data(),
                                    count, steps);

        EXPECT_EQ(between, plain_between) << step << "/" << grid;
        EXPECT_EQ(repeated, plain_repeated) << step << "/" << grid;
    }
}

SampleLanes::Steps RandomSteps(std::mt19937& random)
{
    static const std::int64_t grids[] = {1,   2,     147,       160,
                                         441, 96000, 2147483647};
    SampleLanes::Steps steps;
    steps.grid = grids[random() % 7];
    const auto grid = static_cast<std::uint64_t>(steps.grid);
    steps.rest = static_cast<std::int64_t>(random() % grid);
    const std::uint64_t steepest = random() % 3 ? grid : 9 * grid;
    steps.step = static_cast<std::int64_t>(
        1 + (random() % steepest + steepest) % steepest);
    return steps;
}

TEST_P(SampleLanesTest, PlacesBetweenSamplesAreOnStraightLines)
{
    for (int i = 0; i < 3000; ++i) {
        const SampleLanes::Steps steps = RandomSteps(random);
        const std::size_t count = 1 + random() % 90;
        const auto last = static_cast<std::size_t>(
            (steps.rest + static_cast<std::int64_t>(count - 1) * steps.step) /
            steps.grid);
        const Samples samples = RandomSamples(last + 2);
        Samples expected;
        for (std::size_t k = 0; k < count; ++k) {
            const std::int64_t place =
                steps.rest + static_cast<std::int64_t>(k) * steps.step;
            const short* here = samples.data() + place / steps.grid;
            const float rise = static_cast<float>(here[1] - here[0]) *
                               static_cast<float>(place % steps.grid) /
                               static_cast<float>(steps.grid);
            expected.push_back(
                literal::Low(here[0] + literal::Truncated(rise)));
        }
        expected.push_back(untouched);
        Samples to(count + 1, untouched);

        lanes.interpolate(samples.data(), to.data(), count, steps);

        ASSERT_EQ(to, expected) << steps.step << "/" << steps.grid;
    }
}

TEST_P(SampleLanesTest, FramesAreRepeated)
{
    for (int i = 0; i < 2000; ++i) {
        const SampleLanes::Steps steps = RandomSteps(random);
        const std::size_t count = 1 + random() % 90;
        const auto last = static_cast<std::size_t>(
            (steps.rest + static_cast<std::int64_t>(count - 1) * steps.step) /
            steps.grid);
        const Samples frames = RandomSamples(2 * (last + 1));
        Samples expected;
        for (std::size_t k = 0; k < count; ++k) {
            const auto j = static_cast<std::size_t>(
                (steps.rest + static_cast<std::int64_t>(k) * steps.step) /
                steps.grid);
            expected.push_back(frames[2 * j]);
            expected.push_back(frames[2 * j + 1]);
        }
        expected.push_back(untouched);
        Samples to(2 * count + 1, untouched);

        lanes.repeat(frames.data(), to.data(), count, steps);

        ASSERT_EQ(to, expected);
    }
}

TEST_P(SampleLanesTest, BytesAreWrittenTheMostSignificantFirst)
{
    for (std::size_t count = 0; count < 100; ++count) {
        const Samples samples = RandomSamples(count);
        std::vector<unsigned char> bytes(2 * count + 1, 0xA5);

        lanes.to_big_bytes(samples.data(), bytes.data(), count);

        for (std::size_t i = 0; i < count; ++i)
            ASSERT_EQ(static_cast<short>(bytes[2 * i] << 8 | bytes[2 * i + 1]),
                      samples[i]);
        ASSERT_EQ(bytes.back(), 0xA5);
    }
}

TEST(SampleLanes, ThePlainOnesStandFirstAndTheFastestLast)
{
    EXPECT_EQ(All().front(), &SampleLanes::plain());
    EXPECT_EQ(All().back(), &SampleLanes::fastest());
    EXPECT_EQ(SampleLanes::numbered(1000), nullptr);
}

TEST(SampleLanes, TheFastestAreUsedUnlessOthersAreInstalled)
{
    EXPECT_EQ(&SampleLanes::current(), &SampleLanes::fastest());

    SampleLanes::install(&SampleLanes::plain());
    EXPECT_EQ(&SampleLanes::current(), &SampleLanes::plain());
    EXPECT_STREQ(SampleLanes::current().name(), "plain");

    SampleLanes::install(nullptr);
    EXPECT_EQ(&SampleLanes::current(), &SampleLanes::fastest());
}

} // namespace
