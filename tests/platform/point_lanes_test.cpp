#include "platform/point_lanes.h"

#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>

namespace {

using zt_platform::PointLanes;
using Floats = std::vector<float>;

constexpr float infinity = std::numeric_limits<float>::infinity();

/// Each test runs with the plain lanes and with the fastest.
class PointLanesTest : public testing::TestWithParam<const PointLanes*>
{
protected:
    const PointLanes& lanes = *GetParam();
    std::mt19937 random{58};

    /// Gives any number, often a small whole one.
    float Number()
    {
        const unsigned pick = static_cast<unsigned>(random());
        if (pick % 2 == 0)
            return static_cast<float>(static_cast<int>(pick / 2 % 5) - 2);
        return std::uniform_real_distribution<float>(-3, 3)(random);
    }

    Floats Numbers(std::size_t count)
    {
        Floats numbers(count);
        for (float& number : numbers)
            number = Number();
        return numbers;
    }
};

INSTANTIATE_TEST_SUITE_P(Plain, PointLanesTest,
                         testing::Values(&PointLanes::plain()));
INSTANTIATE_TEST_SUITE_P(Fastest, PointLanesTest,
                         testing::Values(&PointLanes::fastest()));

/// One point by the formula, one element after the other.
Floats Expected(const float* point, const Floats& matrix)
{
    Floats product(4);
    for (std::size_t j = 0; j < 4; ++j)
        product[j] = point[0] * matrix[j] + point[1] * matrix[4 + j] +
                     point[2] * matrix[8 + j] + point[3] * matrix[12 + j];
    const float w = product[3];
    if (w != 0 && w != 1)
        product = {product[0] / w, product[1] / w, product[2] / w, 1};
    return product;
}

/// Says whether the bits are the same; one NaN is as good as another.
bool Same(const float* a, const float* b, std::size_t count)
{
    for (std::size_t i = 0; i < count; ++i)
        if (std::memcmp(a + i, b + i, sizeof(float)) != 0 &&
            !(std::isnan(a[i]) && std::isnan(b[i])))
            return false;
    return true;
}

const Floats identity = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};

TEST_P(PointLanesTest, ProductsHaveTheBitsOfTheFormulaForEveryCount)
{
    for (std::size_t count = 0; count < 300; ++count) {
        const Floats matrix = Numbers(16);
        const Floats points = Numbers(4 * count);
        Floats products(4 * count + 1, 77);

        lanes.transform(points.data(), products.data(), count, matrix.data());

        for (std::size_t i = 0; i < count; ++i)
            ASSERT_TRUE(Same(&products[4 * i],
                             Expected(&points[4 * i], matrix).data(), 4));
        ASSERT_EQ(products[4 * count], 77);
    }
}

TEST_P(PointLanesTest, DividesByTheLastElementUnlessItIsZeroOrOne)
{
    const Floats points = {2, 4, 6, 2, 2, 4,     6, 0, 2, 4,
                           6, 1, 2, 4, 6, -0.0f, 2, 4, 6, -1};
    Floats products(points.size());

    lanes.transform(points.data(), products.data(), 5, identity.data());

    EXPECT_EQ(products, (Floats{1, 2, 3, 1, 2, 4, 6,  0,  2,  4,
                                6, 1, 2, 4, 6, 0, -2, -4, -6, 1}));
}

TEST_P(PointLanesTest, ALastElementThatIsNoNumberBecomesOne)
{
    Floats matrix(16);
    matrix[15] = 1;
    const Floats points = {1, 2,         3, infinity, 1, 2,   3, NAN, 1, 2,
                           3, -infinity, 1, 2,        3, NAN, 1, 2,   3, NAN};
    Floats products(points.size());

    lanes.transform(points.data(), products.data(), 5, matrix.data());

    for (std::size_t i = 3; i < products.size(); i += 4)
        EXPECT_EQ(products[i], 1);
}

TEST_P(PointLanesTest, PointsMayBeReplacedByTheirProducts)
{
    const Floats matrix = Numbers(16);
    const Floats points = Numbers(4 * 203);
    Floats separate(points.size());
    Floats replaced = points;

    lanes.transform(points.data(), separate.data(), 203, matrix.data());
    lanes.transform(replaced.data(), replaced.data(), 203, matrix.data());

    EXPECT_TRUE(Same(replaced.data(), separate.data(), separate.size()));
}

TEST_P(PointLanesTest, ArraysNeedNoAlignment)
{
    const Floats matrix = Numbers(17);
    const Floats points = Numbers(4 * 20 + 1);
    Floats products(4 * 20 + 1);
    const Floats behind_first(matrix.begin() + 1, matrix.end());

    lanes.transform(&points[1], &products[1], 20, &matrix[1]);

    for (std::size_t i = 0; i < 20; ++i)
        ASSERT_TRUE(Same(&products[4 * i + 1],
                         Expected(&points[4 * i + 1], behind_first).data(), 4));
}

/// Three of the four elements of a point with a 1 behind it.
Floats Expected3(const float* point, const Floats& matrix)
{
    const float four[] = {point[0], point[1], point[2], 1};
    Floats product = Expected(four, matrix);
    product.pop_back();
    return product;
}

TEST_P(PointLanesTest, ProductsOfThreeHaveTheBitsOfTheFormulaForEveryCount)
{
    for (std::size_t count = 0; count < 300; ++count) {
        const Floats matrix = Numbers(16);
        const Floats points = Numbers(3 * count);
        Floats products(3 * count + 1, 77);

        lanes.transform3(points.data(), products.data(), count, matrix.data());

        for (std::size_t i = 0; i < count; ++i)
            ASSERT_TRUE(Same(&products[3 * i],
                             Expected3(&points[3 * i], matrix).data(), 3))
                << i << " of " << count;
        ASSERT_EQ(products[3 * count], 77);
    }
}

TEST_P(PointLanesTest, ProductsOfThreeAreDividedUnlessTheirLastIsZeroOrOne)
{
    // The last element of a product is z.
    const Floats by_z = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 1, 0, 0, 0, 0};
    Floats points;
    Floats want;
    for (float z :
         {2.0f, 0.0f, 1.0f, -0.0f, -1.0f, 8.0f, 0.0f, 4.0f, 0.0f, 2.0f, 1.0f}) {
        points.insert(points.end(), {2, 4, z});
        want.insert(want.end(), {z == 0 ? 2 : 2 / z, z == 0 ? 4 : 4 / z,
                                 z == 0 ? 0 : z / z});
    }
    Floats products(points.size());

    lanes.transform3(points.data(), products.data(), 11, by_z.data());

    EXPECT_TRUE(Same(products.data(), want.data(), want.size()));
}

TEST_P(PointLanesTest, ProductsOfThreeAreThoseOfTheFormulaForAnyBits)
{
    for (int round = 0; round < 2000; ++round) {
        Floats matrix(16);
        Floats points(3 * 17);
        for (Floats* numbers : {&matrix, &points})
            for (float& number : *numbers) {
                const std::uint32_t bits = static_cast<std::uint32_t>(random());
                std::memcpy(&number, &bits, sizeof number);
                if (random() % 4 != 0)
                    number = Number();
            }
        Floats products(points.size());

        lanes.transform3(points.data(), products.data(), 17, matrix.data());

        for (std::size_t i = 0; i < 17; ++i)
            ASSERT_TRUE(Same(&products[3 * i],
                             Expected3(&points[3 * i], matrix).data(), 3));
    }
}

TEST_P(PointLanesTest, PointsOfThreeMayBeReplacedAndNeedNoAlignment)
{
    const Floats matrix = Numbers(17);
    const Floats points = Numbers(3 * 203 + 1);
    Floats separate(points.size());
    Floats replaced = points;

    lanes.transform3(&points[1], &separate[1], 203, &matrix[1]);
    lanes.transform3(&replaced[1], &replaced[1], 203, &matrix[1]);

    EXPECT_TRUE(Same(&replaced[1], &separate[1], separate.size() - 1));
}

TEST(PointLanes, TheFastestAreInUseUntilOthersAreInstalled)
{
    EXPECT_EQ(&PointLanes::current(), &PointLanes::fastest());

    PointLanes::install(&PointLanes::plain());
    EXPECT_EQ(&PointLanes::current(), &PointLanes::plain());

    PointLanes::install(nullptr);
    EXPECT_EQ(&PointLanes::current(), &PointLanes::fastest());
    EXPECT_EQ(std::string(PointLanes::plain().name()), "plain");
}

} // namespace
