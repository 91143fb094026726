#ifndef ZT_TESTS_FAKERANDOM_H
#define ZT_TESTS_FAKERANDOM_H

#include "platform/random.h"

#include <deque>

/// A sequence of random numbers of the test's choice; in use while it lives.
class FakeRandom final : public zt_platform::Random
{
public:
    FakeRandom() : before(install(this)) {}
    ~FakeRandom() { install(before); }
    FakeRandom(const FakeRandom&) = delete;
    FakeRandom& operator=(const FakeRandom&) = delete;

    /// Gives the next number, 0 when they are used up.
    long draw() override
    {
        ++draws;
        if (numbers.empty())
            return 0;
        const long number = numbers.front();
        numbers.pop_front();
        return number;
    }

    void seed_from_time() override { ++seeds; }
    void seed(unsigned number) override { last_seed = number; }

    std::deque<long> numbers;
    int draws = 0;
    int seeds = 0;
    unsigned last_seed = 0xFFFFFFFF;

private:
    zt_platform::Random* before;
};

#endif
