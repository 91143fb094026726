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
            texts.push_back("name" + std::to_string(i * 7919 % 1000003));
        std::shuffle(texts.begin(), texts.end(), dice);
        for (const std::string& text : texts)
            objects.push_back(std::make_unique<KvoNamedObject>(text.c_str()));
        std::shuffle(texts.begin(), texts.end(), dice);
    }

    std::vector<std::string> texts;
    std::vector<std::unique_ptr<KvoNamedObject>> objects;
};

template <typename List>
void Search(benchmark::State& state)
{
    Names names(static_cast<std::size_t>(state.range(0)));
    List list;
    for (auto& object : names.objects)
        list.Insert(object.get());
    std::size_t i = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(list.Search(names.texts[i].data()));
        i = i + 1 == names.texts.size() ? 0 : i + 1;
    }
}

void SearchStdMap(benchmark::State& state)
{
    Names names(static_cast<std::size_t>(state.range(0)));
    std::map<std::string, KvoObject*> map;
    for (auto& object : names.objects)
        map.emplace(object->name, object.get());
    std::size_t i = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(map.find(names.texts[i]));
        i = i + 1 == names.texts.size() ? 0 : i + 1;
    }
}

template <typename List>
void Insert(benchmark::State& state)
{
    Names names(static_cast<std::size_t>(state.range(0)));
    for (auto _ : state) {
        List list;
        for (auto& object : names.objects)
            list.Insert(object.get());
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

template <typename List>
void WalkBlind(benchmark::State& state)
{
    Names names(static_cast<std::size_t>(state.range(0)));
    List list;
    for (auto& object : names.objects)
        list.Insert(object.get());
    for (auto _ : state)
        for (KvoObject* object = list.Head(); object; object = list.Next())
            benchmark::DoNotOptimize(object);
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void WalkBlindStdMap(benchmark::State& state)
{
    Names names(static_cast<std::size_t>(state.range(0)));
    std::map<std::string, KvoObject*> map;
    for (auto& object : names.objects)
        map.emplace(object->name, object.get());
    for (auto _ : state)
        for (auto& [name, object] : map)
            benchmark::DoNotOptimize(object);
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

template <typename List>
void Walk(benchmark::State& state)
{
    Names names(static_cast<std::size_t>(state.range(0)));
    List list;
    for (auto& object : names.objects)
        list.Insert(object.get());
    for (auto _ : state) {
        int sum = 0;
        for (KvoObject* object = list.Head(); object; object = list.Next())
            sum += object->modified;
        benchmark::DoNotOptimize(sum);
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void WalkStdMap(benchmark::State& state)
{
    Names names(static_cast<std::size_t>(state.range(0)));
    std::map<std::string, KvoObject*> map;
    for (auto& object : names.objects)
        map.emplace(object->name, object.get());
    for (auto _ : state) {
        int sum = 0;
        for (auto& [name, object] : map)
            sum += object->modified;
        benchmark::DoNotOptimize(sum);
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

BENCHMARK(Search<KvoSkipList>)->Arg(200)->Arg(10000)->Arg(100000);
BENCHMARK(Search<LiteralList>)->Arg(200)->Arg(10000)->Arg(100000);
BENCHMARK(SearchStdMap)->Arg(200)->Arg(10000)->Arg(100000);
BENCHMARK(Insert<KvoSkipList>)->Arg(200)->Arg(10000)->Arg(100000);
BENCHMARK(Insert<LiteralList>)->Arg(200)->Arg(10000)->Arg(100000);
BENCHMARK(Walk<KvoSkipList>)->Arg(200)->Arg(100000);
BENCHMARK(Walk<LiteralList>)->Arg(200)->Arg(100000);
BENCHMARK(WalkStdMap)->Arg(200)->Arg(100000);
BENCHMARK(WalkBlind<KvoSkipList>)->Arg(200)->Arg(100000);
BENCHMARK(WalkBlind<LiteralList>)->Arg(200)->Arg(100000);
BENCHMARK(WalkBlindStdMap)->Arg(200)->Arg(100000);

} // namespace
