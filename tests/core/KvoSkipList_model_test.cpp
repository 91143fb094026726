#include "KvoSkipList_support.h"

#include "platform/random.h"

#include <bit>
#include <cmath>
#include <map>
#include <memory>
#include <random>
#include <stdlib.h>

namespace {

/// Random numbers of which the last one drawn can be looked at.
class NotedRandom final : public zt_platform::Random
{
public:
    explicit NotedRandom(unsigned seed) : dice(seed), before(install(this)) {}
    ~NotedRandom() { install(before); }
    NotedRandom(const NotedRandom&) = delete;
    NotedRandom& operator=(const NotedRandom&) = delete;

    // Every fourth number has low bits set in excess, for tall nodes.
    long draw() override
    {
        ++draws;
        last = static_cast<long>(dice() & 0x7fffffff);
        if (draws % 4 == 0)
            last |= 0xff;
        return last;
    }

    void seed_from_time() override {}
    void seed(unsigned) override {}

    int draws = 0;
    long last = 0;

private:
    std::mt19937 dice;
    zt_platform::Random* before;
};

/// A multimap of the same objects, with the cursor that the promises state.
class SkipListRun
{
public:
    explicit SkipListRun(unsigned seed) : noted(seed), dice(seed)
    {
        for (int i = 0; i < 60; ++i)
            numbers.push_back(std::make_unique<Number>(i % 20 * 2));
    }

    void Step()
    {
        const int draws = noted.draws;
        Number* number = numbers[dice() % numbers.size()].get();
        int key = static_cast<int>(dice() % 44) - 2;
        switch (dice() % 12) {
        case 0:
        case 1:
        case 2:
            Insert(number);
            return;
        case 3:
            InsertUnique(number);
            return;
        case 4:
            Remove(number);
            break;
        case 5:
            RemoveKey(key);
            break;
        case 6:
            Search(key);
            break;
        case 7:
            SearchAlmost(key);
            break;
        case 8:
            Walk();
            break;
        case 9:
            if (dice() % 10 == 0)
                Split(key);
            break;
        case 10:
            if (dice() % 20 == 0)
                Copy();
            break;
        default:
            if (dice() % 200 == 0)
                Clear();
        }
        ASSERT_EQ(noted.draws, draws);
    }

    void Check()
    {
        Objects expected;
        for (auto& entry : model)
            expected.push_back(entry.second);
        ASSERT_EQ(ObjectsOf(list), expected);
        ASSERT_GE(list.levels, 1);
        ASSERT_LE(list.levels, KvoSkipList::max_levels);
    }

    int insertions = 0;

private:
    using Model = std::multimap<int, Number*>;
    using Place = Model::iterator;

    void Insert(Number* number)
    {
        const int draws = noted.draws;
        const int levels = list.levels;
        list.Insert(number);
        CheckInserted(number, draws, levels);
    }

    void InsertUnique(Number* number)
    {
        const int draws = noted.draws;
        const int levels = list.levels;
        if (model.count(number->key)) {
            ASSERT_EQ(list.InsertUnique(number), 0);
            ASSERT_EQ(noted.draws, draws);
            CheckCursorBefore(model.lower_bound(number->key));
            return;
        }
        ASSERT_EQ(list.InsertUnique(number), 1);
        CheckInserted(number, draws, levels);
    }

    void CheckInserted(Number* number, int draws, int levels)
    {
        ++insertions;
        CheckCursorOn(model.emplace(number->key, number));
        ASSERT_EQ(noted.draws, draws + 1);
        int height = std::countr_one(static_cast<unsigned long>(noted.last));
        height = height < 2 ? 0 : height - 1;
        if (height >= levels)
            height = levels < KvoSkipList::max_levels ? levels : levels - 1;
        ASSERT_EQ(list.current->level, height);
        ASSERT_EQ(list.levels, std::max(levels, height + 1));
    }

    void Remove(Number* number)
    {
        auto [place, end] = model.equal_range(number->key);
        while (place != end && place->second != number)
            ++place;
        if (place == end) {
            ASSERT_EQ(list.Remove(number), nullptr);
            return;
        }
        ASSERT_EQ(list.Remove(number), number);
        CheckCursorBefore(model.erase(place));
    }

    void RemoveKey(int key)
    {
        auto place = model.find(key);
        if (place == model.end()) {
            ASSERT_EQ(list.RemoveKey(&key), nullptr);
            return;
        }
        place = model.lower_bound(key);
        ASSERT_EQ(list.RemoveKey(&key), place->second);
        CheckCursorBefore(model.erase(place));
    }

    void Search(int key)
    {
        auto place = model.lower_bound(key);
        KvoObject* found = list.Search(&key);
        if (place != model.end() && place->first == key) {
            ASSERT_EQ(found, place->second);
            CheckCursorOn(place);
        } else {
            ASSERT_EQ(found, nullptr);
            CheckCursorBefore(place);
        }
    }

    void SearchAlmost(int key)
    {
        auto place = model.lower_bound(key);
        const bool equal = place != model.end() && place->first == key;
        KvoObject* expected = equal ? place->second
                              : place == model.begin()
                                  ? nullptr
                                  : std::prev(place)->second;
        const KvoSkipList& reading = list;
        switch (dice() % 3) {
        case 0:
            ASSERT_EQ(list.SearchAlmost(&key), expected);
            break;
        case 1:
            ASSERT_EQ(list[&key], expected);
            break;
        default:
            ASSERT_EQ(reading[&key], expected);
        }
        if (equal)
            CheckCursorOn(place);
        else
            CheckCursorBefore(place);
    }

    void Walk()
    {
        ASSERT_EQ(list.Tail(),
                  model.empty() ? nullptr : std::prev(model.end())->second);
        KvoObject* object = list.Head();
        for (auto& entry : model) {
            ASSERT_EQ(object, entry.second);
            KvoObject* peeked = list.Peek();
            object = list.Next();
            ASSERT_EQ(peeked, object);
        }
        ASSERT_EQ(object, nullptr);
        ASSERT_EQ(list.current, nullptr);
    }

    void Split(int key)
    {
        std::unique_ptr<KvoSkipList> rest(list.Split(&key));
        ASSERT_EQ(rest->current, nullptr);
        Objects expected;
        auto place = model.lower_bound(key);
        CheckCursorBefore(place);
        while (place != model.end()) {
            expected.push_back(place->second);
            place = model.erase(place);
        }
        ASSERT_EQ(ObjectsOf(*rest), expected);
    }

    void Copy()
    {
        KvoSkipList copy(list);
        ASSERT_EQ(copy.current, nullptr);
        ASSERT_EQ(HeightsOf(copy), HeightsOf(list));
        list = copy;
        ASSERT_EQ(list.current, nullptr);
    }

    void Clear()
    {
        list.Clear();
        model.clear();
        ASSERT_EQ(list.current, nullptr);
    }

    void CheckCursorOn(Place place)
    {
        ASSERT_NE(list.current, nullptr);
        ASSERT_EQ(list.current->object, place->second);
    }

    void CheckCursorBefore(Place place)
    {
        if (place == model.begin())
            ASSERT_EQ(list.current, list.header);
        else
            CheckCursorOn(std::prev(place));
    }

    NotedRandom noted;
    std::mt19937 dice;
    std::vector<std::unique_ptr<Number>> numbers;
    KvoSkipList list;
    Model model;
};

} // namespace

TEST(KvoSkipListModel, BehavesAsAMultimapWithACursor)
{
    for (unsigned seed = 1; seed <= 6; ++seed) {
        SkipListRun run(seed);
        for (int step = 0; step < 5000; ++step) {
            ASSERT_NO_FATAL_FAILURE(run.Step())
                << "seed " << seed << " step " << step;
            ASSERT_NO_FATAL_FAILURE(run.Check())
                << "seed " << seed << " step " << step;
        }
        EXPECT_GT(run.insertions, 1000);
    }
}

// Three quarters of the nodes stand on the lowest level only; h levels higher
// are h in 2 to the power h + 2 of them. Six standard deviations are allowed.
TEST(KvoSkipListModel, HeightsAreDistributedAsTheDiceSay)
{
    constexpr int count = 200000;
    std::vector<std::unique_ptr<Number>> numbers;
    KvoSkipList list;
    srandom(2024);
    for (int i = count; i > 0; --i) {
        numbers.push_back(std::make_unique<Number>(i));
        list.Insert(numbers.back().get());
    }

    std::map<int, int> heights;
    for (int height : HeightsOf(list))
        ++heights[height];

    for (int height = 0; height <= 10; ++height) {
        const double share =
            height == 0 ? 0.75 : std::ldexp(1.0, -(height + 2));
        const double spread = std::sqrt(count * share * (1 - share));
        EXPECT_NEAR(heights[height], count * share, 6 * spread) << height;
    }
}
