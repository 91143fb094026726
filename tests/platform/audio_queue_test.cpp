#include "platform/audio_queue.h"

#include <deque>
#include <numeric>
#include <random>
#include <vector>

#include <gtest/gtest.h>

#include "platform/pages.h"

namespace {
using zt_platform::AudioQueue;
using Samples = std::vector<std::int16_t>;

Samples Ramp(std::size_t count, std::int16_t first = 0)
{
    Samples samples(count);
    std::iota(samples.begin(), samples.end(), first);
    return samples;
}

long Write(AudioQueue& queue, const Samples& samples)
{
    return queue.write(samples.data(), static_cast<long>(samples.size()));
}

Samples Read(AudioQueue& queue, long count)
{
    Samples samples(static_cast<std::size_t>(count));
    samples.resize(static_cast<std::size_t>(queue.read(samples.data(), count)));
    return samples;
}

/// Pages of which there are none.
class NoPages final : public zt_platform::Pages
{
public:
    NoPages() : before(install(this)) {}
    ~NoPages() { install(before); }
    void* map(std::size_t) override { return nullptr; }
    void unmap(void*, std::size_t) override {}

private:
    Pages* before;
};
} // namespace

TEST(AudioQueue, IsEmptyAndHoldsNothingUntilItIsMade)
{
    AudioQueue queue;

    EXPECT_EQ(queue.capacity(), 0);
    EXPECT_EQ(queue.filled(), 0);
    EXPECT_EQ(queue.fillable(), 0);
    EXPECT_EQ(Write(queue, Ramp(5)), 0);
    EXPECT_TRUE(Read(queue, 5).empty());
    EXPECT_EQ(queue.drop(5), 0);
}

TEST(AudioQueue, GivesBackWhatWasWrittenInOrder)
{
    AudioQueue queue;
    ASSERT_TRUE(queue.make(100));

    EXPECT_EQ(Write(queue, Ramp(30)), 30);
    EXPECT_EQ(Write(queue, Ramp(20, 30)), 20);

    EXPECT_EQ(Read(queue, 10), Ramp(10));
    EXPECT_EQ(Read(queue, 100), Ramp(40, 10));
}

TEST(AudioQueue, FilledAndFillableAreItsCapacityTogether)
{
    AudioQueue queue;
    ASSERT_TRUE(queue.make(100));

    Write(queue, Ramp(30));
    Read(queue, 12);

    EXPECT_EQ(queue.filled(), 18);
    EXPECT_EQ(queue.fillable(), 82);
    EXPECT_EQ(queue.capacity(), 100);
}

TEST(AudioQueue, TakesNoMoreThanItsCapacity)
{
    AudioQueue queue;
    ASSERT_TRUE(queue.make(100));

    EXPECT_EQ(Write(queue, Ramp(130)), 100);
    EXPECT_EQ(Write(queue, Ramp(1)), 0);

    EXPECT_EQ(Read(queue, 200), Ramp(100));
}

TEST(AudioQueue, CountsBelowZeroAreZero)
{
    AudioQueue queue;
    ASSERT_TRUE(queue.make(10));
    std::int16_t sample = 7;
    Write(queue, {1});

    EXPECT_EQ(queue.write(&sample, -1), 0);
    EXPECT_EQ(queue.read(&sample, -1), 0);
    EXPECT_EQ(queue.drop(-1), 0);

    EXPECT_EQ(queue.filled(), 1);
}

TEST(AudioQueue, DropsTheOldest)
{
    AudioQueue queue;
    ASSERT_TRUE(queue.make(10));
    Write(queue, Ramp(10));

    EXPECT_EQ(queue.drop(4), 4);
    EXPECT_EQ(Read(queue, 3), Ramp(3, 4));
    EXPECT_EQ(queue.drop(100), 3);

    EXPECT_EQ(queue.filled(), 0);
}

TEST(AudioQueue, WhatIsDiscardedIsGoneAndLeavesItsWholeCapacity)
{
    AudioQueue queue;
    ASSERT_TRUE(queue.make(10));
    Write(queue, Ramp(10));

    queue.discard();

    EXPECT_EQ(queue.filled(), 0);
    EXPECT_EQ(queue.fillable(), 10);
    EXPECT_EQ(Write(queue, Ramp(10, 50)), 10);
    EXPECT_EQ(Read(queue, 10), Ramp(10, 50));
}

TEST(AudioQueue, MayBeMadeAnewSmallerOrLarger)
{
    AudioQueue queue;
    ASSERT_TRUE(queue.make(10));
    Write(queue, Ramp(5));

    ASSERT_TRUE(queue.make(1000));
    EXPECT_EQ(queue.filled(), 0);
    EXPECT_EQ(Write(queue, Ramp(1001)), 1000);
    ASSERT_TRUE(queue.make(3));

    EXPECT_EQ(Write(queue, Ramp(5)), 3);
}

TEST(AudioQueue, RefusesCapacitiesThatItCannotHave)
{
    AudioQueue queue;

    EXPECT_FALSE(queue.make(0));
    EXPECT_FALSE(queue.make(-1));
    EXPECT_FALSE(queue.make(AudioQueue::most_capacity + 1));
}

TEST(AudioQueue, HoldsNothingWithoutMemory)
{
    AudioQueue queue;
    {
        const NoPages pages;
        EXPECT_FALSE(queue.make(10));
    }

    EXPECT_EQ(Write(queue, Ramp(5)), 0);
    EXPECT_EQ(queue.filled(), 0);
    EXPECT_TRUE(queue.make(10));
}

TEST(AudioQueue, GoesOnWhenItsCountersWrapAround)
{
    constexpr long block = 1L << 24;
    AudioQueue queue;
    ASSERT_TRUE(queue.make(block));
    const Samples ramp = Ramp(block);

    for (std::int64_t sum = 0; sum < (std::int64_t{1} << 32) + 3 * block;
         sum += block) {
        ASSERT_EQ(Write(queue, ramp), block) << sum;
        ASSERT_EQ(queue.drop(block), block) << sum;
    }

    Write(queue, Ramp(10, 7));
    EXPECT_EQ(Read(queue, 10), Ramp(10, 7));
}

TEST(AudioQueue, IsADequeOverThousandsOfOperations)
{
    constexpr long capacity = 257;
    AudioQueue queue;
    ASSERT_TRUE(queue.make(capacity));
    std::deque<std::int16_t> model;
    std::mt19937 random(1);
    std::int16_t next = 0;

    for (int step = 0; step < 20000; ++step) {
        const long count = static_cast<long>(random() % 200);
        const unsigned what = random() % 8;
        if (what < 4) {
            const Samples samples = Ramp(static_cast<std::size_t>(count), next);
            const long taken = Write(queue, samples);
            ASSERT_EQ(taken, std::min(count, capacity - static_cast<long>(
                                                            model.size())));
            model.insert(model.end(), samples.begin(), samples.begin() + taken);
            next = static_cast<std::int16_t>(next + taken);
        } else if (what < 7) {
            const Samples got = Read(queue, count);
            ASSERT_EQ(got.size(),
                      std::min(static_cast<std::size_t>(count), model.size()));
            ASSERT_TRUE(std::equal(got.begin(), got.end(), model.begin()));
            model.erase(model.begin(),
                        model.begin() + static_cast<long>(got.size()));
        } else if (count < 20) {
            queue.discard();
            model.clear();
        }
        ASSERT_EQ(queue.filled(), static_cast<long>(model.size()));
        ASSERT_EQ(queue.fillable(), capacity - queue.filled());
    }
}
