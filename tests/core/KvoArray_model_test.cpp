#include "KVO/KvoObjArr.h"

#include <algorithm>
#include <memory>
#include <random>
#include <vector>

#include <gtest/gtest.h>

namespace {

/// What an array's block must look like: a capacity by the rules alone.
struct BlockModel
{
    long long size = 0;
    long long capacity = 0;

    void Bump(long long delta)
    {
        long long wanted = size + delta < 0 ? 0 : size + delta;
        if (wanted == size)
            return;
        if (3 * capacity < 4 * wanted) {
            if (capacity < wanted)
                capacity = wanted * 5 / 4;
        } else {
            capacity = wanted;
        }
        size = wanted;
    }

    void Set(long long wanted)
    {
        capacity = wanted < 1 ? 0 : wanted;
        size = capacity;
    }
};

class ArrayModel
{
public:
    explicit ArrayModel(unsigned seed) : dice(seed) {}

    void Step()
    {
        switch (Roll(8)) {
        case 0:
            Resize();
            break;
        case 1:
            Write(Roll(200));
            break;
        case 2:
            Append();
            break;
        case 3:
            array.Allocate(array.size + Roll(50));
            block.capacity = array.capacity;
            break;
        case 4:
            Join();
            break;
        default:
            Bump(Roll(16) - 8);
        }
    }

    void Check() const
    {
        ASSERT_EQ(array.size, static_cast<int>(model.size()));
        ASSERT_EQ(array.size, block.size);
        ASSERT_EQ(array.capacity, block.capacity);
        ASSERT_EQ(array.data == nullptr, array.capacity == 0);
        const KvoIntArray& reading = array;
        for (int i = 0; i < array.size; ++i)
            ASSERT_EQ(reading[i], model[static_cast<std::size_t>(i)]);
    }

private:
    int Roll(unsigned sides) { return static_cast<int>(dice() % sides); }

    void Resize()
    {
        int size = Roll(60) - 5;
        array.SetSize(size);
        model.resize(size < 1 ? 0 : static_cast<std::size_t>(size));
        block.Set(size);
    }

    void Bump(int delta)
    {
        array.BumpSize(delta);
        block.Bump(delta);
        model.resize(static_cast<std::size_t>(block.size));
    }

    void Write(int index)
    {
        if (index >= block.size) {
            block.Bump(index - block.size + 1);
            model.resize(static_cast<std::size_t>(block.size));
        }
        array[index] = model[static_cast<std::size_t>(index)] = Roll(1000);
    }

    void Append()
    {
        for (int rest = Roll(100); rest > 0; --rest)
            Write(array.size);
    }

    void Join()
    {
        KvoIntArray other(array);
        other.BumpSize(-other.size / 2);
        array += other;
        model.insert(model.end(), model.begin(),
                     model.begin() + static_cast<long>(other.size));
        if (other.size > 0)
            block.Set(array.size);
        if (array.size > 500)
            Bump(-450);
    }

    std::mt19937 dice;
    KvoIntArray array;
    std::vector<int> model;
    BlockModel block;
};

} // namespace

TEST(KvoArrayModel, BehavesAsAVectorWithTheStatedCapacities)
{
    for (unsigned seed = 1; seed <= 4; ++seed) {
        ArrayModel run(seed);
        for (int step = 0; step < 5000; ++step) {
            run.Step();
            ASSERT_NO_FATAL_FAILURE(run.Check())
                << "seed " << seed << " step " << step;
        }
    }
}

TEST(KvoArrayModel, ObjectsStandWhereAVectorHasThem)
{
    std::mt19937 dice(5);
    std::vector<std::unique_ptr<KvoObject>> objects;
    for (int i = 0; i < 20; ++i)
        objects.push_back(std::make_unique<KvoObject>());
    KvoObjArray array;
    std::vector<KvoObject*> model;

    for (int step = 0; step < 20000; ++step) {
        KvoObject* object = objects[dice() % objects.size()].get();
        const int size = static_cast<int>(model.size());
        const int index = static_cast<int>(dice() % 60) - 5;
        if (dice() % 2) {
            array.Insert(object, index);
            model.insert(model.begin() + std::min(std::max(index, 0), size),
                         object);
        } else if (index >= 0 && index < size) {
            ASSERT_EQ(array.Remove(index),
                      model[static_cast<std::size_t>(index)]);
            model.erase(model.begin() + index);
        } else if (index < 0 && size > 0) {
            ASSERT_EQ(array.Pop(), model.back());
            model.pop_back();
        } else {
            ASSERT_EQ(array.Remove(index), nullptr);
        }
        if (model.size() > 100) {
            array.SetSize(10);
            model.resize(10);
        }

        ASSERT_EQ(array.size, static_cast<int>(model.size()));
        auto found = std::find(model.begin(), model.end(), object);
        ASSERT_EQ(array.Find(object),
                  found == model.end()
                      ? -1
                      : static_cast<int>(found - model.begin()));
        for (int i = 0; i < array.size; ++i)
            ASSERT_EQ(array[i], model[static_cast<std::size_t>(i)]);
    }
}
