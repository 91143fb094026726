#include "skip_support.h"

#include "platform/random.h"

#include <bit>
#include <iterator>
#include <map>
#include <memory>
#include <random>

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

/// A list and a `Model`, `std::map` or `std::multimap`, of the same records,
/// with the cursor that the promises state.
template <class Model>
class SkipRun
{
public:
    SkipRun(unsigned seed, ZtSkipList::UniqueState state)
        : noted(seed), dice(seed), list(ZtSkipList::CompareInt, state)
    {
        for (int i = 0; i < 60; ++i)
            records.push_back(Record{i % 20 * 2});
    }

    void Step()
    {
        const int draws = noted.draws;
        const int key = static_cast<int>(dice() % 44) - 2;
        switch (dice() % 10) {
        case 0:
        case 1:
        case 2:
        case 3:
            Insert(&records[dice() % records.size()]);
            return;
        case 4:
        case 5:
            Remove(key);
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
        default:
            if (dice() % 20 == 0) {
                Copy();
                return;
            }
            if (dice() % 100 == 0)
                Clear();
        }
        ASSERT_EQ(noted.draws, draws);
    }

    void Check()
    {
        ASSERT_EQ(ItemsOf(list), ItemsOfModel());
        ASSERT_GE(list.levels, 1);
        ASSERT_LE(list.levels, ZtSkipList::max_levels);
    }

    int insertions = 0;

private:
    using Node = typename Model::iterator;

    Items ItemsOfModel() const
    {
        Items items;
        for (auto& entry : model)
            items.push_back(entry.second);
        return items;
    }

    void Insert(Record* record)
    {
        const int draws = noted.draws;
        const int levels = list.levels;
        const std::size_t held = model.size();
        Node place = model.lower_bound(record->key);
        place = model.emplace_hint(place, record->key, record);
        if (model.size() == held) {
            ASSERT_EQ(list.Insert(record), 0);
            ASSERT_EQ(noted.draws, draws);
            CheckCursorBefore(place);
            return;
        }
        ++insertions;
        ASSERT_EQ(list.Insert(record), 1);
        CheckCursorOn(place);
        ASSERT_EQ(noted.draws, draws + 1);
        int height = std::countr_one(static_cast<unsigned long>(noted.last));
        height = std::min(height < 2 ? 0 : height - 1, levels);
        ASSERT_EQ(list.current->level, height);
        ASSERT_EQ(list.levels, std::max(levels, height + 1));
    }

    void Remove(int key)
    {
        Node place = model.lower_bound(key);
        if (place == model.end() || place->first != key) {
            ASSERT_EQ(list.Remove(&key), nullptr);
        } else {
            ASSERT_EQ(list.Remove(&key), place->second);
            place = model.erase(place);
        }
        CheckCursorBefore(place);
    }

    void Search(int key)
    {
        const Node place = model.lower_bound(key);
        void* found = list.Search(&key);
        const bool equal = place != model.end() && place->first == key;
        ASSERT_EQ(found, equal ? place->second : nullptr);
        if (place == model.end())
            ASSERT_EQ(list.current, nullptr);
        else
            CheckCursorOn(place);
    }

    void SearchAlmost(int key)
    {
        const Node place = model.lower_bound(key);
        const bool equal = place != model.end() && place->first == key;
        Record* expected = equal                    ? place->second
                           : place == model.begin() ? nullptr
                                                    : std::prev(place)->second;
        const ZtSkipList& reading = list;
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
        void* item = list.Head();
        for (auto& entry : model) {
            ASSERT_EQ(item, entry.second);
            void* peeked = list.Peek();
            item = list.Next();
            ASSERT_EQ(peeked, item);
        }
        ASSERT_EQ(item, nullptr);
        ASSERT_EQ(list.current, nullptr);
    }

    // A copy inserts in order, and so does this one.
    void Copy()
    {
        const int draws = noted.draws;
        ZtSkipList copy(list);
        ASSERT_EQ(noted.draws, draws + list.count);
        const Model former = model;
        model.clear();
        for (auto& entry : former)
            model.emplace_hint(model.lower_bound(entry.first), entry);
        ASSERT_EQ(ItemsOf(copy), ItemsOfModel());

        copy = list;
        ASSERT_EQ(noted.draws, draws + 2 * list.count);
        ASSERT_EQ(ItemsOf(copy), ItemsOfModel());
        // Turned round twice more, the runs stand as in the copy.
        list = ZtSkipList(copy);
    }

    void Clear()
    {
        list.Clear();
        model.clear();
        ASSERT_EQ(list.current, nullptr);
    }

    void CheckCursorOn(Node place)
    {
        ASSERT_NE(list.current, nullptr);
        ASSERT_EQ(list.current->item, place->second);
    }

    void CheckCursorBefore(Node place)
    {
        if (place == model.begin())
            ASSERT_EQ(list.current, &list.header);
        else
            CheckCursorOn(std::prev(place));
    }

    NotedRandom noted;
    std::mt19937 dice;
    std::vector<Record> records;
    ZtSkipList list;
    Model model;
};

template <class Model>
void CompareWithModel(ZtSkipList::UniqueState state)
{
    for (unsigned seed = 1; seed <= 4; ++seed) {
        SkipRun<Model> run(seed, state);
        for (int step = 0; step < 5000; ++step) {
            ASSERT_NO_FATAL_FAILURE(run.Step())
                << "seed " << seed << " step " << step;
            ASSERT_NO_FATAL_FAILURE(run.Check())
                << "seed " << seed << " step " << step;
        }
        EXPECT_GT(run.insertions, 300);
    }
}

} // namespace

TEST(ZtSkipListModel, BehavesAsAMultimapWithACursor)
{
    CompareWithModel<std::multimap<int, Record*>>(ZtSkipList::NotUnique);
}

TEST(ZtSkipListModel, BehavesAsAMapWithACursorWhenUnique)
{
    CompareWithModel<std::map<int, Record*>>(ZtSkipList::Unique);
}
