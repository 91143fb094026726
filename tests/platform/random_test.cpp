#include "platform/random.h"

#include "support/FakeRandom.h"

#include <ctime>
#include <stdlib.h>

#include <gtest/gtest.h>

namespace {

using zt_platform::Random;

long calls_of_random = 0;
unsigned last_seed = 0;

} // namespace

// Replaces the system's functions in this program, as a host may.
extern "C" long random() noexcept
{
    return ++calls_of_random;
}

extern "C" void srandom(unsigned seed) noexcept
{
    last_seed = seed;
}

TEST(Random, DrawsFromTheFunctionThatAHostMayReplace)
{
    calls_of_random = 40;

    EXPECT_EQ(Random::current().draw(), 41);
    EXPECT_EQ(Random::current().draw(), 42);
}

TEST(Random, SeedsWithTheSecondsOfTheWallClock)
{
    const auto before = static_cast<unsigned>(std::time(nullptr));

    Random::current().seed_from_time();

    const auto after = static_cast<unsigned>(std::time(nullptr));
    EXPECT_GE(last_seed, before);
    EXPECT_LE(last_seed, after);
}

TEST(Random, SeedsWithANumber)
{
    Random::current().seed(7);

    EXPECT_EQ(last_seed, 7u);
}

TEST(Random, InstalledCallsAreUsedUntilTheyAreTakenAway)
{
    Random* system = &Random::current();
    {
        FakeRandom dice;
        dice.numbers = {5};
        EXPECT_EQ(&Random::current(), &dice);
        EXPECT_EQ(Random::current().draw(), 5);
    }

    EXPECT_EQ(&Random::current(), system);
    EXPECT_EQ(Random::install(nullptr), nullptr);
}
