// How fast are objects found by name and walked in order, against the literal
// list of one allocation a node and against std::map?

#include "KVO/KvoSkipList.h"

#include <algorithm>
#include <bit>
#include <cstdlib>
#include <map>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>

#include "require.h"

namespace {

constexpr int max_levels = KvoSkipList::max_levels;

/// The skip list as one would first write it.
class LiteralList
{
public:
    ~LiteralList()
    {
        for (Node* node = header.forward[0]; node;) {
            Node* next = node->forward[0];
            std::free(node);
            node = next;
        }
    }

    void Insert(KvoObject* object)
    {
        Node* update[max_levels];
        walk(object->Key(), update);
        const auto bits = static_cast<unsigned long>(::random());
        int level = std::max(std::countr_one(bits) - 1, 0);
        if (level >= levels && levels < max_levels) {
            update[levels] = &header;
            level = levels++;
        }
        auto* node = static_cast<Node*>(
            std::malloc(sizeof(Node) +
                        sizeof(Node*) * static_cast<std::size_t>(level + 1)));
        node->object = object;
        node->forward = reinterpret_cast<Node**>(node + 1);
        for (int i = 0; i <= level; ++i) {
            node->forward[i] = update[i]->forward[i];
            update[i]->forward[i] = node;
        }
    }

    void RemoveKey(void* key)
    {
        Node* update[max_levels];
        walk(key, update);
        Node* node = update[0]->forward[0];
        if (!node || node->object->Compare(key) != 0)
            return;
        for (int i = 0; i < levels && update[i]->forward[i] == node; ++i)
            update[i]->forward[i] = node->forward[i];
        std::free(node);
    }

    KvoObject* Search(void* key)
    {
        Node* update[max_levels];
        walk(key, update);
        current = update[0]->forward[0];
        return current && current->object->Compare(key) == 0 ? current->object
                                                             : nullptr;
    }

    KvoObject* Head()
    {
        current = header.forward[0];
        return current ? current->object : nullptr;
    }

    KvoObject* Next()
    {
        if (current)
            current = current->forward[0];
        return current ? current->object : nullptr;
    }

private:
    struct Node
    {
        KvoObject* object;
        Node** forward;
    };

    void walk(void* key, Node** update)
    {
        Node* node = &header;
        Node* stopped = nullptr;
        for (int i = levels - 1; i >= 0; --i) {
            Node* next = node->forward[i];
            while (next && next != stopped && next->object->Compare(key) < 0) {
                node = next;
                next = node->forward[i];
            }
            stopped = next;
            update[i] = node;
        }
    }

    Node* header_forward[max_levels] = {};
    Node header = {nullptr, header_forward};
    Node* current = nullptr;
    int levels = 1;
};

/// Names in a random order, with their objects.
class Names
{
public:
    explicit Names(std::size_t count)
    {
        std::mt19937 dice(1);
        for (std::size_t i = 0; i < count; ++i)
            texts.push_back("name" + std::to_string(i * 7919 % 10000019));
        std::shuffle(texts.begin(), texts.end(), dice);
        for (const std::string& text : texts)
            objects.push_back(std::make_unique<KvoNamedObject>(text.c_str()));
        std::shuffle(texts.begin(), texts.end(), dice);
    }

    std::vector<std::string> texts;
    std::vector<std::unique_ptr<KvoNamedObject>> objects;
};

/// The names of a size, made once: a million of them take their time.
Names& NamesOf(std::int64_t count)
{
    static std::map<std::int64_t, std::unique_ptr<Names>> kept;
    std::unique_ptr<Names>& names = kept[count];
    if (!names)
        names = std::make_unique<Names>(static_cast<std::size_t>(count));
    return *names;
}

template <typename List>
List& Filled(std::int64_t count)
{
    static std::map<std::int64_t, std::unique_ptr<List>> kept;
    std::unique_ptr<List>& list = kept[count];
    if (!list) {
        list = std::make_unique<List>();
        for (auto& object : NamesOf(count).objects)
            list->Insert(object.get());
    }
    return *list;
}

std::map<std::string, KvoObject*>& FilledMap(std::int64_t count)
{
    static std::map<std::int64_t, std::map<std::string, KvoObject*>> kept;
    std::map<std::string, KvoObject*>& map = kept[count];
    if (map.empty())
        for (auto& object : NamesOf(count).objects)
            map.emplace(object->name, object.get());
    return map;
}

void RequireSameOrder(std::int64_t count)
{
    KvoSkipList& ours = Filled<KvoSkipList>(count);
    auto& literal = Filled<LiteralList>(count);
    KvoObject* there = literal.Head();
    for (KvoObject* here = ours.Head(); here; here = ours.Next()) {
        Require(here == there, "skip list");
        there = literal.Next();
    }
    Require(!there, "skip list");
}

template <typename List>
void Hit(benchmark::State& state)
{
    RequireSameOrder(state.range(0));
    Names& names = NamesOf(state.range(0));
    List& list = Filled<List>(state.range(0));
    std::size_t i = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(list.Search(names.texts[i].data()));
        i = i + 1 == names.texts.size() ? 0 : i + 1;
    }
}

void HitStdMap(benchmark::State& state)
{
    Names& names = NamesOf(state.range(0));
    auto& map = FilledMap(state.range(0));
    std::size_t i = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(map.find(names.texts[i]));
        i = i + 1 == names.texts.size() ? 0 : i + 1;
    }
}

template <typename List>
void Miss(benchmark::State& state)
{
    std::vector<std::string> absent = NamesOf(state.range(0)).texts;
    for (std::string& text : absent)
        text += '-';
    List& list = Filled<List>(state.range(0));
    std::size_t i = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(list.Search(absent[i].data()));
        i = i + 1 == absent.size() ? 0 : i + 1;
    }
}

template <typename List>
void Insert(benchmark::State& state)
{
    Names& names = NamesOf(state.range(0));
    for (auto _ : state) {
        List list;
        for (auto& object : names.objects)
            list.Insert(object.get());
        state.PauseTiming();
        benchmark::DoNotOptimize(list.Head());
        state.ResumeTiming();
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

template <typename List>
void Remove(benchmark::State& state)
{
    Names& names = NamesOf(state.range(0));
    for (auto _ : state) {
        state.PauseTiming();
        List list;
        for (auto& object : names.objects)
            list.Insert(object.get());
        state.ResumeTiming();
        for (std::string& text : names.texts)
            list.RemoveKey(text.data());
        state.PauseTiming();
        Require(!list.Head(), "skip list");
        state.ResumeTiming();
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

template <typename List>
void Walk(benchmark::State& state)
{
    List& list = Filled<List>(state.range(0));
    for (auto _ : state)
        for (KvoObject* object = list.Head(); object; object = list.Next())
            benchmark::DoNotOptimize(object);
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void WalkStdMap(benchmark::State& state)
{
    auto& map = FilledMap(state.range(0));
    for (auto _ : state)
        for (auto& [name, object] : map)
            benchmark::DoNotOptimize(object);
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void Register(const std::string& size, std::int64_t count)
{
    using benchmark::RegisterBenchmark;
    using Benchmark = void (*)(benchmark::State&);
    const struct
    {
        const char* question;
        Benchmark ours, literal, map;
    } rows[] = {
        {"insert", Insert<KvoSkipList>, Insert<LiteralList>, nullptr},
        {"hit", Hit<KvoSkipList>, Hit<LiteralList>, HitStdMap},
        {"miss", Miss<KvoSkipList>, Miss<LiteralList>, nullptr},
        {"remove", Remove<KvoSkipList>, Remove<LiteralList>, nullptr},
        {"walk", Walk<KvoSkipList>, Walk<LiteralList>, WalkStdMap},
    };
    for (const auto& row : rows) {
        const std::string name =
            std::string("skip_") + row.question + "_" + size + "/";
        RegisterBenchmark((name + "ours").c_str(), row.ours)->Arg(count);
        RegisterBenchmark((name + "literal").c_str(), row.literal)->Arg(count);
        if (row.map)
            RegisterBenchmark((name + "std::map").c_str(), row.map)->Arg(count);
    }
}

[[maybe_unused]] const bool registered = [] {
    Register("1e3", 1000);
    Register("1e5", 100000);
    Register("1e6", 1000000);
    return true;
}();

BENCHMARK(Hit<KvoSkipList>)
    ->Name("curve/skip_hit/ours")
    ->RangeMultiplier(4)
    ->Range(16, 1 << 20);
BENCHMARK(Hit<LiteralList>)
    ->Name("curve/skip_hit/literal")
    ->RangeMultiplier(4)
    ->Range(16, 1 << 20);
BENCHMARK(HitStdMap)
    ->Name("curve/skip_hit/std::map")
    ->RangeMultiplier(4)
    ->Range(16, 1 << 20);

} // namespace
