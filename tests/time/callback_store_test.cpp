#include "time/callback_store.h"

#include <algorithm>
#include <cstdint>
#include <set>
#include <vector>

#include <gtest/gtest.h>

#include "diag/signal_report.h"
#include "platform/pages.h"

namespace {

/// Has no pages while it lives.
class NoPages : public zt_platform::Pages
{
public:
    NoPages() { install(this); }
    ~NoPages() { install(nullptr); }
    void* map(std::size_t) override
    {
        ++asked;
        return nullptr;
    }
    void unmap(void*, std::size_t) override {}
    int asked = 0;
};

/// Takes what the store has left without asking for pages.
std::vector<void*> TakeTheRest()
{
    const NoPages no_pages;
    std::vector<void*> taken;
    while (void* const place = zt_time::take_callback_place())
        taken.push_back(place);
    return taken;
}

void GiveBack(const std::vector<void*>& places)
{
    for (void* const place : places)
        zt_time::give_callback_place_back(place);
}

TEST(CallbackStore, PlacesAreApartAndAligned)
{
    std::vector<void*> taken;
    for (int count = 0; count < 5000; ++count)
        taken.push_back(zt_time::take_callback_place());

    std::set<std::uintptr_t> addresses;
    for (void* const place : taken)
        addresses.insert(reinterpret_cast<std::uintptr_t>(place));
    ASSERT_EQ(addresses.size(), taken.size());
    std::uintptr_t before = 0;
    for (const std::uintptr_t address : addresses) {
        EXPECT_EQ(address % alignof(ZtTimerCallbackInfo), 0u);
        ASSERT_GE(address - before, sizeof(ZtTimerCallbackInfo));
        before = address;
    }
    GiveBack(taken);
}

TEST(CallbackStore, TheLatestFreedPlaceIsTheNextOne)
{
    void* const first = zt_time::take_callback_place();
    void* const second = zt_time::take_callback_place();

    zt_time::give_callback_place_back(first);

    EXPECT_EQ(zt_time::take_callback_place(), first);
    GiveBack({first, second});
}

TEST(CallbackStore, GivingNothingBackDoesNothing)
{
    zt_time::give_callback_place_back(nullptr);
    zt_time::free_callback(nullptr);

    void* const place = zt_time::take_callback_place();

    EXPECT_NE(place, nullptr);
    zt_time::give_callback_place_back(place);
}

TEST(CallbackStore, FreedInTheBeatAPlaceKeepsWhatStandsInItUntilTheEnd)
{
    auto* const next = new ZtTimerCallbackInfo;
    auto* const record = new ZtTimerCallbackInfo;
    record->callback = [](ZtTimer*, void*) {};
    record->next = next;
    {
        const zt_diag::SignalScope beat;
        zt_time::free_callback(record);
        void* const other = zt_time::take_callback_place();

        EXPECT_NE(other, record);
        EXPECT_EQ(record->next, next);
        EXPECT_EQ(record->callback, nullptr);
        zt_time::give_callback_place_back(other);
        zt_time::reuse_freed_callback_places();
    }

    const std::vector<void*> rest = TakeTheRest();
    EXPECT_EQ(std::count(rest.begin(), rest.end(), record), 1);
    GiveBack(rest);
    delete next;
}

TEST(CallbackStore, WithoutPagesThereIsNoPlaceAndNewGivesNull)
{
    const std::vector<void*> rest = TakeTheRest();
    NoPages no_pages;

    EXPECT_EQ(zt_time::take_callback_place(), nullptr);
    EXPECT_EQ(new ZtTimerCallbackInfo, nullptr);
    EXPECT_EQ(no_pages.asked, 2);
    GiveBack(rest);
}

TEST(CallbackStore, WithoutPagesAPostIsDroppedWithoutAWord)
{
    ZtTimer timer;
    ZtTimerBeat::execute_ops();
    const std::vector<void*> rest = TakeTheRest();
    {
        const NoPages no_pages;
        timer.post_trigger([](ZtTimer*, void*) {}, nullptr, KvoTime::ZERO);
        timer.post_repeat([](ZtTimer*, void*) {}, nullptr, 5);
        timer.post_stop([](ZtTimer*, void*) {}, nullptr);
    }
    EXPECT_EQ(ZtTimerBeat::defer_op_count, 0);
    EXPECT_EQ(timer.stop_callbacks, nullptr);

    GiveBack(rest);
    timer.post_stop([](ZtTimer*, void*) {}, nullptr);

    EXPECT_NE(timer.stop_callbacks, nullptr);
}

TEST(CallbackStore, AppendKeepsTheOrderAndTakesNothingTwice)
{
    ZtTimerCallbackInfo* list = nullptr;
    auto* const first = new ZtTimerCallbackInfo;
    auto* const second = new ZtTimerCallbackInfo;
    first->next = first;

    for (ZtTimerCallbackInfo* record : {first, second, first, second})
        zt_time::append_callback(list, record);
    zt_time::append_callback(list, nullptr);

    EXPECT_EQ(list, first);
    EXPECT_EQ(first->next, second);
    EXPECT_EQ(second->next, nullptr);
    zt_time::free_callbacks(list);
    EXPECT_EQ(list, nullptr);
}

} // namespace
