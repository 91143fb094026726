#include "KVO/KvoList.h"

#include <algorithm>
#include <iterator>
#include <list>
#include <random>
#include <vector>

#include <gtest/gtest.h>

namespace {

int pieces[12];

/// A std::list with a cursor that moves as a KvoList's promises say.
class Model
{
public:
    using Place = std::list<void*>::iterator;

    Model() : cursor(items.end()) {}

    Place At(int index)
    {
        return index < 0 || index >= Count() ? items.end()
                                             : std::next(items.begin(), index);
    }

    Place Find(void* item)
    {
        return std::find(items.begin(), items.end(), item);
    }

    void InsertBefore(Place next, void* item)
    {
        cursor = items.insert(next, item);
    }

    void* Remove(Place place)
    {
        if (place == items.end())
            return nullptr;
        void* item = *place;
        const bool first = place == items.begin();
        Place next = items.erase(place);
        cursor = first || items.empty() ? next : std::prev(next);
        return item;
    }

    void* UnderCursor() const
    {
        return cursor == items.end() ? nullptr : *cursor;
    }

    int Count() const { return static_cast<int>(items.size()); }

    std::list<void*> items;
    std::list<void*>::const_iterator cursor; ///< The end where it is null.
};

class ListRun
{
public:
    explicit ListRun(unsigned seed) : dice(seed) {}

    void Step()
    {
        const int index = Roll(30) - 3;
        void* item = &pieces[Roll(12)];
        void* other = &pieces[Roll(12)];
        switch (Roll(16)) {
        case 0:
            list.Push(item);
            model.InsertBefore(model.items.begin(), item);
            break;
        case 1:
            list.PushTail(item);
            model.InsertBefore(model.items.end(), item);
            break;
        case 2:
            ASSERT_EQ(list.Pop(), model.Remove(model.items.begin()));
            break;
        case 3:
            ASSERT_EQ(list.PopTail(), model.Remove(model.At(Last())));
            break;
        case 4:
            list.Insert(item, other);
            InsertBeforeItem(item, other);
            break;
        case 5:
        case 6:
            list.Insert(item, index);
            model.InsertBefore(
                index < 0 ? model.items.begin() : model.At(index), item);
            break;
        case 7:
            list.Remove(item);
            model.Remove(model.Find(item));
            break;
        case 8:
            ASSERT_EQ(list.Remove(index), model.Remove(model.At(index)));
            break;
        default:
            StepFurther(index, item);
        }
    }

    void Check()
    {
        ASSERT_EQ(list.count, model.Count());
        const KvoList::Link* before = nullptr;
        const KvoList::Link* link = list.head;
        for (auto place = model.items.begin(); place != model.items.end();
             ++place) {
            ASSERT_NE(link, nullptr);
            ASSERT_EQ(link->item, *place);
            ASSERT_EQ(link->prev, before);
            ASSERT_EQ(link == list.current, place == model.cursor);
            before = link;
            link = link->next;
        }
        ASSERT_EQ(link, nullptr);
        ASSERT_EQ(list.tail, before);
        ASSERT_EQ(list.current == nullptr, model.cursor == model.items.end());
    }

private:
    int Roll(unsigned sides) { return static_cast<int>(dice() % sides); }
    int Last() const { return model.Count() - 1; }

    void StepFurther(int index, void* item)
    {
        switch (Roll(8)) {
        case 0:
            list.Float(item);
            model.Remove(model.Find(item));
            model.InsertBefore(model.items.begin(), item);
            break;
        case 1:
            list.Float(index);
            item = model.Remove(model.At(index));
            model.InsertBefore(model.items.begin(), item);
            break;
        case 2:
            list.Sink(item);
            model.Remove(model.Find(item));
            model.InsertBefore(model.items.end(), item);
            break;
        case 3:
            list.Sink(index);
            item = model.Remove(model.At(index));
            model.InsertBefore(model.items.end(), item);
            break;
        case 4:
            ASSERT_EQ(list[index], model.At(index) == model.items.end()
                                       ? nullptr
                                       : *model.At(index));
            model.cursor = model.At(index);
            break;
        case 5:
            Walk();
            break;
        case 6:
            Unlink(index);
            break;
        default:
            Replace();
        }
    }

    void InsertBeforeItem(void* item, void* before)
    {
        auto place = model.Find(before);
        if (place == model.items.end())
            place = model.items.begin();
        model.InsertBefore(place, item);
    }

    void Walk()
    {
        if (Roll(2)) {
            void* first = list.Head();
            model.cursor = model.items.begin();
            ASSERT_EQ(first, model.UnderCursor());
        } else {
            void* last = list.Tail();
            model.cursor = model.At(Last());
            ASSERT_EQ(last, model.UnderCursor());
        }
        for (int steps = Roll(5); steps > 0; --steps) {
            const bool back = Roll(2) != 0;
            void* item = back ? list.Prev() : list.Next();
            if (model.cursor == model.items.begin() && back)
                model.cursor = model.items.end();
            else if (model.cursor != model.items.end())
                std::advance(model.cursor, back ? -1 : 1);
            ASSERT_EQ(item, model.UnderCursor());
        }
    }

    // Walks an iterator up to a link and unlinks it, or not when the walk ends
    // before.
    void Unlink(int index)
    {
        const bool back = Roll(2) != 0;
        KvoListIter walk(list,
                         back ? KvoListIter::Backward : KvoListIter::Forward);
        for (int i = 0; i <= index; ++i)
            walk();
        walk.DeleteLast();
        if (index < 0 || index >= model.Count())
            return;
        auto place = model.At(back ? Last() - index : index);
        const auto kept = model.cursor;
        const bool moves = place == model.items.begin() ||
                           std::next(place) == model.items.end() ||
                           place == kept;
        model.Remove(place);
        if (!moves)
            model.cursor = kept;
        std::vector<void*> rest;
        for (auto item : model.items)
            rest.push_back(item);
        if (back)
            std::reverse(rest.begin(), rest.end());
        rest.erase(rest.begin(), rest.begin() + index);
        for (void* item : rest)
            ASSERT_EQ(walk(), item);
        ASSERT_EQ(walk(), nullptr);
    }

    void Replace()
    {
        if (model.Count() < 40)
            return;
        KvoList copy(list);
        list.Clear();
        list = copy;
        model.cursor = model.At(Last());
        for (int i = 0; i < 35; ++i)
            ASSERT_EQ(list.Pop(), model.Remove(model.items.begin()));
    }

    std::mt19937 dice;
    KvoList list;
    Model model;
};

} // namespace

TEST(KvoListModel, BehavesAsAStdListWithACursor)
{
    for (unsigned seed = 1; seed <= 6; ++seed) {
        ListRun run(seed);
        for (int step = 0; step < 5000; ++step) {
            ASSERT_NO_FATAL_FAILURE(run.Step())
                << "seed " << seed << " step " << step;
            ASSERT_NO_FATAL_FAILURE(run.Check())
                << "seed " << seed << " step " << step;
        }
    }
}
